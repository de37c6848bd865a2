#pragma once

#include <map>
#include <string>

/// \file
/// What a bench reports: figures, each with the bar that it has to reach.

namespace lumora::bench {

enum class Bar { AtMost, AtLeast };

/// Runs the registered Google Benchmark functions (with the program's arguments) and returns the real time of one
/// iteration of each in seconds, by the benchmark's name; with repetitions, their median. User counters stand under
/// "<name>:<counter>".
std::map<std::string, double> runBenchmarks(int argc, char** argv);

/// Prints one line with the figure beside its bar, and adds it to the table of `./dev bench` (a file of tab-separated
/// rows named by LUMORA_FIGURES). True when the bar is reached.
bool report(const std::string& what, double value, Bar direction, double bar, const std::string& unit = "x");

/// The same for a figure that has no bar.
void tell(const std::string& what, double value, const std::string& unit = "x");

} // namespace lumora::bench
