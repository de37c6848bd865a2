// The cost of a captured sample while nothing is pending: it is paid for every sample of every recording.
#include "Allocations.h"
#include "EmptyDelegate.h"
#include "support/Figures.h"

#include <LumoraKit/recording/LMRLocalVideoRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>

namespace {

using lumora::MediaType;

void showSamples(benchmark::State& state, const std::shared_ptr<lumora::MovieFileOutputDelegate>& receiver) {
  lumora::fakes::FakeMovieFileOutput output;
  lumora::fakes::FakeCaptureConnection connection(MediaType::Video);
  const lumora::fakes::FakeSampleBuffer sample(1);
  lumora::MovieFileOutputDelegate* delegate = receiver.get();
  const auto before = allocationsOfThisThread();
  for ([[maybe_unused]] auto round : state) {
    benchmark::DoNotOptimize(delegate); // a virtual call, whatever the compiler knows
    delegate->captureOutput_didOutputSampleBuffer_fromConnection(output, sample, connection);
  }
  state.counters["allocations"] = static_cast<double>(allocationsOfThisThread() - before);
  state.counters["reads"] = sample.reads();
}

void emptyCall(benchmark::State& state) {
  showSamples(state, makeEmptyDelegate());
}

void idleRecorder(benchmark::State& state) {
  const lumora::fakes::FakePlatform platform;
  showSamples(state, LMRLocalVideoRecorder::recorderWithCaptureSession(platform.mediaCapture->makeSession()));
}

BENCHMARK(emptyCall)->Repetitions(7)->ReportAggregatesOnly();
BENCHMARK(idleRecorder)->Repetitions(7)->ReportAggregatesOnly();

} // namespace

int main(int argc, char** argv) {
  using namespace lumora::bench;
  const auto figures = runBenchmarks(argc, argv);
  if (allocationsOfThisThread() == 0) {
    std::fputs("allocations are not counted\n", stderr);
    return EXIT_FAILURE;
  }
  const double ratio = figures.at("idleRecorder") / figures.at("emptyCall");
  const bool isQuick = report("idle sample callback against an empty virtual call", ratio, Bar::AtMost, 3);
  const bool allocatesNothing =
      report("allocations of the idle sample callback", figures.at("idleRecorder:allocations"), Bar::AtMost, 0, "");
  const bool readsNothing =
      report("reads of the sample by the idle callback", figures.at("idleRecorder:reads"), Bar::AtMost, 0, "");
  return isQuick && allocatesNothing && readsNothing ? EXIT_SUCCESS : EXIT_FAILURE;
}
