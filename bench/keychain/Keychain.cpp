#include "support/Figures.h"
#include "support/TestKeyring.h"

#include <LumoraKit/platform/linux/UserFolders.h>
#include <LumoraKit/platform/linux/secretservice/SecretServiceStore.h>

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <iostream>
#include <string>
#include <vector>

namespace lumora::bench {
namespace {

constexpr int items = 1000;
constexpr double mostSeconds = 0.5;
constexpr const char* service = "Lumora: bench.example.org";

backend::SecretServiceStore store() {
  return backend::SecretServiceStore(backend::userRuntimeFolder());
}

bool fill() {
  auto keychain = store();
  for (int i = 0; i < items; ++i) {
    if (const LMRErrorRef error = keychain.add(service, "user " + std::to_string(i), Secret("password"))) {
      std::cerr << error->description() << '\n';
      return false;
    }
  }
  return true;
}

void enumeration(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    std::vector<CredentialItem> found;
    store().list(service, found);
    state.counters["found"] = static_cast<double>(found.size());
  }
}

void oneSecret(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    Secret secret("");
    store().find(service, "user 500", nullptr, &secret);
  }
}

} // namespace
} // namespace lumora::bench

BENCHMARK(lumora::bench::enumeration)->Name("enumeration")->UseRealTime()->Iterations(5)->Unit(benchmark::kMillisecond);
BENCHMARK(lumora::bench::oneSecret)->Name("one")->UseRealTime()->Iterations(20)->Unit(benchmark::kMillisecond);

int main(int argc, char** argv) {
  using namespace lumora::bench;
  if (const auto obstacle = lumora::tests::TestKeyring::obstacle()) {
    std::cerr << "bench-keychain needs a keyring: " << *obstacle << '\n';
    return EXIT_FAILURE;
  }
  lumora::tests::TestKeyring keyring;
  if (!keyring.start() || !fill()) {
    return EXIT_FAILURE;
  }
  auto figures = runBenchmarks(argc, argv);
  bool reached =
      report("passwords found of 1,000 in the keychain", figures["enumeration:found"], Bar::AtLeast, items, "");
  reached &= report("seconds to list 1,000 passwords", figures["enumeration"], Bar::AtMost, mostSeconds, "s");
  reached &= report("seconds to read one of 1,000 passwords", figures["one"], Bar::AtMost, mostSeconds / 10, "s");
  return reached ? EXIT_SUCCESS : EXIT_FAILURE;
}
