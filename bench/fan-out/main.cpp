// How long a request to a recorder of several sources takes to reach the last of them.

#include "support/Figures.h"

#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/FakeRecorders.h>

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <latch>
#include <memory>
#include <string>
#include <utility>

namespace lumora::bench {
namespace {

constexpr int sourceCount = 16;

/// A recorder whose sources keep their threads until the request has reached all of them, as blocking ones do.
std::shared_ptr<LMRMultipleSourceRecorder> recorderWithBlockingSources(const std::shared_ptr<std::latch>& reached) {
  LMRMultipleSourceRecorder::Recorders sources;
  for (int i = 0; i < sourceCount; ++i) {
    const auto source = fakes::FakeLocalRecorder::make();
    source->setAnswer([reached](LMRSourceRecorder&, const std::string&) { reached->arrive_and_wait(); });
    sources.push_back(source);
  }
  return LMRMultipleSourceRecorder::recorderWithSourceRecorders(std::move(sources));
}

void fanOut(benchmark::State& state) {
  const auto reached = std::make_shared<std::latch>(sourceCount);
  const auto recorder = recorderWithBlockingSources(reached);
  for ([[maybe_unused]] auto iteration : state) {
    recorder->start();
    reached->wait();
  }
}

} // namespace
} // namespace lumora::bench

// Each repetition is one request, so that the median is that of requests.
BENCHMARK(lumora::bench::fanOut)
    ->Name("start")
    ->UseRealTime()
    ->Unit(benchmark::kMicrosecond)
    ->Iterations(1)
    ->Repetitions(501)
    ->ReportAggregatesOnly();

int main(int argc, char** argv) {
  using namespace lumora::bench;
  const lumora::fakes::FakePlatform platform;
  auto figures = runBenchmarks(argc, argv);
  const bool reached =
      report("fan-out of a start to 16 local sources, median", figures["start"] * 1000, Bar::AtMost, 2, "ms");
  return reached ? EXIT_SUCCESS : EXIT_FAILURE;
}
