// A recording of 64 remote cameras, started as one, against a recording of one, on a server that answers 200 ms late.

#include "support/CameraStudio.h"
#include "support/Figures.h"

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

#include <benchmark/benchmark.h>

#include <chrono>
#include <cstddef>
#include <cstdlib>
#include <functional>
#include <memory>
#include <utility>

namespace lumora::bench {
namespace {

std::shared_ptr<LMRMultipleSourceRecorder> recorderOfTheFirst(std::size_t count, const CameraStudio& studio) {
  LMRMultipleSourceRecorder::Recorders sources;
  for (std::size_t index = 0; index < count; ++index) {
    sources.push_back(
        LMRRemoteVideoRecorder::recorderWithRemoteRecorderName_session(CameraStudio::nameOf(index), studio.session()));
  }
  return LMRMultipleSourceRecorder::recorderWithSourceRecorders(std::move(sources));
}

bool serveUntil(const std::function<bool()>& condition) {
  return Platform::current().mainThread->serveUntil(condition, std::chrono::seconds(60));
}

void startRecording(benchmark::State& state) {
  static const CameraStudio studio;
  const auto recorder = recorderOfTheFirst(static_cast<std::size_t>(state.range(0)), studio);
  for ([[maybe_unused]] auto iteration : state) {
    recorder->start();
    const bool isRecording = serveUntil([&] { return recorder->isRecording(); });
    state.PauseTiming();
    recorder->cancel();
    if (!serveUntil([&] { return recorder->isCancelled(); }) || !isRecording) {
      state.SkipWithError("the recording could not be started or cancelled");
      break;
    }
    state.ResumeTiming();
  }
}

} // namespace
} // namespace lumora::bench

BENCHMARK(lumora::bench::startRecording)
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
  const bool reached = report("start of a recording of 64 remote sources, against one, 200 ms latency",
                              figures["starts/64"] / figures["starts/1"], Bar::AtMost, 1.5);
  return reached ? EXIT_SUCCESS : EXIT_FAILURE;
}
