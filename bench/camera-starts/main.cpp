// 64 remote cameras started at once, against one, on a server that answers 200 ms late.

#include "support/CameraStudio.h"
#include "support/Figures.h"

#include <LumoraKit/actions/LMRAction.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <memory>
#include <string>
#include <vector>

namespace lumora::bench {
namespace {

class Studio : CameraStudio {
public:
  /// Starts the first cameras at once and waits for the last one; how many starts failed.
  std::size_t start(std::size_t count) const {
    return run(count, [](const std::string& camera) { return Array{Array{"start", camera}, Array{"delay", 0}}; });
  }
  std::size_t cancel(std::size_t count) const {
    return run(count, [](const std::string& camera) { return Array(1, Value(Array{"cancel", camera})); });
  }

private:
  /// Runs one action for each of the first cameras, all at once.
  template <class Arguments> std::size_t run(std::size_t count, const Arguments& argumentsFor) const {
    std::vector<std::shared_ptr<LMRAction>> actions;
    for (std::size_t index = 0; index < count; ++index) {
      actions.push_back(
          LMRAction::actionWithCommand_arguments_session(std::nullopt, argumentsFor(nameOf(index)), session()));
      actions.back()->start();
    }
    std::size_t failed = 0;
    for (const auto& action : actions) {
      Platform::current().mainThread->serveUntil([&] { return !action->isRunning(); });
      failed += action->error() ? std::size_t{1} : 0;
    }
    return failed;
  }
};

void startCameras(benchmark::State& state) {
  static const Studio studio;
  const auto count = static_cast<std::size_t>(state.range(0));
  for ([[maybe_unused]] auto iteration : state) {
    const std::size_t failed = studio.start(count);
    state.PauseTiming();
    if (failed + studio.cancel(count) > 0) {
      state.SkipWithError("a camera could not be started or cancelled");
      break;
    }
    state.ResumeTiming();
  }
}

} // namespace
} // namespace lumora::bench

BENCHMARK(lumora::bench::startCameras)
    ->Name("starts")
    ->Arg(1)
    ->Arg(lumora::bench::CameraStudio::cameraCount)
    ->UseRealTime()
    ->Unit(benchmark::kMillisecond)
    ->Iterations(1)
    ->Repetitions(9);

int main(int argc, char** argv) {
  using namespace lumora::bench;
  auto figures = runBenchmarks(argc, argv);
  const bool reached = report("64 camera starts at once, against one, 200 ms latency",
                              figures["starts/64"] / figures["starts/1"], Bar::AtMost, 1.5);
  return reached ? EXIT_SUCCESS : EXIT_FAILURE;
}
