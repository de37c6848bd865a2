#include "support/Figures.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <vector>

namespace lumora::bench {
namespace {

class Collector final : public benchmark::ConsoleReporter {
public:
  void ReportRuns(const std::vector<Run>& runs) override {
    ConsoleReporter::ReportRuns(runs);
    for (const Run& run : runs) {
      if (run.error_occurred) {
        std::exit(EXIT_FAILURE);
      }
      if (run.run_type == Run::RT_Iteration || run.aggregate_name == "median") {
        take(run);
      }
    }
  }

  std::map<std::string, double> seconds;

private:
  void take(const Run& run) {
    const std::string name = run.run_name.function_name + (run.run_name.args.empty() ? "" : "/" + run.run_name.args);
    seconds[name] = run.GetAdjustedRealTime() / benchmark::GetTimeUnitMultiplier(run.time_unit);
    for (const auto& [counter, value] : run.counters) {
      seconds[name + ":" + counter] = value.value;
    }
  }
};

} // namespace

std::map<std::string, double> runBenchmarks(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  if (benchmark::ReportUnrecognizedArguments(argc, argv)) {
    std::exit(EXIT_FAILURE);
  }
  Collector collector;
  benchmark::RunSpecifiedBenchmarks(&collector);
  return collector.seconds;
}

bool report(const std::string& what, double value, Bar direction, double bar, const std::string& unit) {
  const bool reached = direction == Bar::AtMost ? value <= bar : value >= bar;
  const char* const word = direction == Bar::AtMost ? "at most" : "at least";
  std::printf("%-72s %10.3f %-6s (%s %g) %s\n", what.c_str(), value, unit.c_str(), word, bar,
              reached ? "reached" : "MISSED");
  std::fflush(stdout);
  if (const char* const path = std::getenv("LUMORA_FIGURES")) {
    std::ofstream(path, std::ios::app) << what << '\t' << value << '\t' << unit << '\t' << word << '\t' << bar << '\t'
                                       << (reached ? "reached" : "MISSED") << '\n';
  }
  return reached;
}

} // namespace lumora::bench
