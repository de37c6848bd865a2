#include "BareRun.h"
#include "Roles.h"
#include "support/Figures.h"

#include <LumoraKit/platform/KTRunTask.h>

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

namespace lumora::bench {
namespace {

constexpr double largeBytes = static_cast<double>(largeOutput + largeError);

Parent& parent(Parent::Size size) {
  static Parent small(Parent::Size::Small);
  static Parent large(Parent::Size::Large);
  return size == Parent::Size::Large ? large : small;
}

void bareRunOfTrivialTool(benchmark::State& state) {
  std::string output;
  std::string error;
  for ([[maybe_unused]] auto iteration : state) {
    bareRun(trivialTool, {"--plistin"}, trivialRequest(), output, error);
  }
}

void taskOfTrivialTool(benchmark::State& state) {
  std::string output;
  std::string error;
  for ([[maybe_unused]] auto iteration : state) {
    KTRunTask(trivialTool, {"--plistin"}, trivialRequest(), &output, &error, nullptr);
  }
}

void actionOfTrivialTool(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    runTrivialAction();
  }
}

void actionInParent(benchmark::State& state, Parent::Size size) {
  for ([[maybe_unused]] auto iteration : state) {
    state.SetIterationTime(parent(size).secondsOfAction());
  }
}

void bareRunOfLargeOutputs(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    std::string output;
    std::string error;
    bareRun(ownExecutable(), emitter(), "", output, error);
    if (output.size() != largeOutput || error.size() != largeError) {
      state.SkipWithError("outputs are not complete");
    }
  }
}

void taskOfLargeOutputs(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    std::string output;
    std::string error;
    KTRunTask(ownExecutable(), emitter(), "", &output, &error, nullptr);
    if (output.size() != largeOutput || error.size() != largeError) {
      state.SkipWithError("outputs are not complete");
    }
  }
}

// The peak of a process that does nothing else, against what it received.
double peakMemoryPerOutput() {
  std::string peak;
  if (KTRunTask(ownExecutable(), collector(), "", &peak, nullptr, nullptr) != EXIT_SUCCESS) {
    std::abort();
  }
  return std::stod(peak) / largeBytes;
}

// Single runs by turns, in random order, and their median: what else the machine does then hurts all sides alike.
void registerBenchmarks() {
  constexpr int runs = 1000;
  constexpr int largeRuns = 45;
  const auto add = [](const char* name, auto function) {
    return benchmark::RegisterBenchmark(name, function)->Iterations(1);
  };
  add("bare", bareRunOfTrivialTool)->UseRealTime()->Repetitions(runs);
  add("task", taskOfTrivialTool)->UseRealTime()->Repetitions(runs);
  add("action", actionOfTrivialTool)->UseRealTime()->Repetitions(runs);
  for (const auto& [name, size] :
       {std::pair("small-parent", Parent::Size::Small), {"large-parent", Parent::Size::Large}}) {
    add(name, [size = size](benchmark::State& state) { actionInParent(state, size); })
        ->UseManualTime()
        ->Repetitions(runs);
  }
  add("bare-large", bareRunOfLargeOutputs)->UseRealTime()->Repetitions(largeRuns);
  add("task-large", taskOfLargeOutputs)->UseRealTime()->Repetitions(largeRuns);
}

} // namespace
} // namespace lumora::bench

int main(int argc, char** argv) {
  using namespace lumora::bench;
  if (const auto status = runRole(argc, argv)) {
    return *status;
  }
  registerBenchmarks();
  std::vector<char*> arguments(argv, argv + argc);
  std::string interleaved = "--benchmark_enable_random_interleaving=true";
  std::string summary = "--benchmark_report_aggregates_only=true";
  arguments.insert(arguments.begin() + 1, {interleaved.data(), summary.data()});
  auto seconds = runBenchmarks(static_cast<int>(arguments.size()), arguments.data());
  const auto bare = seconds["bare"];
  const auto action = seconds["action"];
  bool reached = report("KTRunTask of a trivial tool against a bare spawn and poll loop", seconds["task"] / bare,
                        Bar::AtMost, 1.15);
  reached &= report("LMRAction of a trivial tool against a bare spawn and poll loop", action / bare, Bar::AtMost, 1.15);
  reached &= report("the same from a parent with 2 GiB and 200 descriptors against a small one",
                    seconds["large-parent"] / seconds["small-parent"], Bar::AtMost, 1.3);
  reached &= report("throughput of 256 MiB and 64 MiB at once against a bare reader",
                    seconds["bare-large"] / seconds["task-large"], Bar::AtLeast, 0.85);
  reached &= report("peak memory for these against the outputs", peakMemoryPerOutput(), Bar::AtMost, 2.1);
  return reached ? EXIT_SUCCESS : EXIT_FAILURE;
}
