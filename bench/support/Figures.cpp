#include "support/Figures.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>
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

namespace {

// A row of the table: figure, value, unit, bar, outcome.
void addRow(const std::string& what, double value, const std::string& unit, const std::string& bar,
            const std::string& outcome) {
  std::printf("%-72s %10.3f %-6s %s %s\n", what.c_str(), value, unit.c_str(), bar.c_str(), outcome.c_str());
  std::fflush(stdout);
  if (const char* const path = std::getenv("LUMORA_FIGURES")) {
    std::ofstream(path, std::ios::app) << what << '\t' << value << '\t' << unit << '\t' << bar << '\t' << outcome
                                       << '\n';
  }
}

} // namespace

bool report(const std::string& what, double value, Bar direction, double bar, const std::string& unit) {
  const bool reached = direction == Bar::AtMost ? value <= bar : value >= bar;
  std::ostringstream limit;
  limit << (direction == Bar::AtMost ? "at most " : "at least ") << bar;
  addRow(what, value, unit, limit.str(), reached ? "reached" : "MISSED");
  return reached;
}

void tell(const std::string& what, double value, const std::string& unit) {
  addRow(what, value, unit, "-", "told");
}

} // namespace lumora::bench
