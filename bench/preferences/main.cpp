#include "support/Figures.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/FilePreferences.h>

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <filesystem>
#include <string>

#include <sys/wait.h>
#include <unistd.h>

namespace lumora::bench {
namespace {

constexpr int processes = 8;
constexpr int updates = 200;
constexpr const char* domain = "org.vantor.lumora.bench";

// Each update is a key of its own: one that is lost is missing at the end.
std::string key(int process, int update) {
  std::string key = std::to_string(process);
  key += '-';
  key += std::to_string(update);
  return key;
}

void updateInChild(const std::filesystem::path& folder, int process) {
  if (fork() == 0) {
    backend::FilePreferences preferences(folder);
    for (int update = 0; update < updates; ++update) {
      preferences.setValue(domain, key(process, update), update);
    }
    _exit(EXIT_SUCCESS);
  }
}

int keptUpdates(const std::filesystem::path& folder) {
  backend::FilePreferences preferences(folder);
  int kept = 0;
  for (int process = 0; process < processes; ++process) {
    for (int update = 0; update < updates; ++update) {
      kept += preferences.value(domain, key(process, update)) == Value(update) ? 1 : 0;
    }
  }
  return kept;
}

void contendedUpdates(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    const tests::TemporaryFolder folder;
    for (int process = 0; process < processes; ++process) {
      updateInChild(folder.path(), process);
    }
    while (wait(nullptr) > 0) {
    }
    state.PauseTiming();
    state.counters["kept"] = keptUpdates(folder.path());
    state.ResumeTiming();
  }
}

} // namespace
} // namespace lumora::bench

BENCHMARK(lumora::bench::contendedUpdates)->Name("updates")->UseRealTime()->Iterations(1);

int main(int argc, char** argv) {
  using namespace lumora::bench;
  auto figures = runBenchmarks(argc, argv);
  const bool reached = report("preferences kept of 1,600 updates by 8 processes", figures["updates:kept"], Bar::AtLeast,
                              processes * updates, "");
  return reached ? EXIT_SUCCESS : EXIT_FAILURE;
}
