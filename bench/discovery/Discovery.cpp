#include "CrowdedNetwork.h"
#include "support/Figures.h"
#include "support/TemporaryFolder.h"
#include "support/TestBus.h"

#include <LumoraKit/platform/KTServiceComboBox.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/testing/FakePlatform.h>
#include <LumoraKit/testing/FakeViews.h>

#include <benchmark/benchmark.h>

#include <cstdlib>
#include <iostream>
#include <memory>
#include <string>

// Five hundred services come and go while the user types. The daemon is a stand-in on a bus of the bench's own; the way
// from its signals to the combo box's list is the real one.

namespace lumora::bench {
namespace {

constexpr int services = 500;
constexpr double mostSeconds = 1;
constexpr std::chrono::seconds limit{60};

CrowdedNetwork* network = nullptr;

struct Typist : KTServiceComboBoxDelegate {
  void comboBoxSelectionDidChange(const std::shared_ptr<KTServiceComboBox>& /*comboBox*/) override {}
  void controlTextDidChange(const std::shared_ptr<TextField>& /*field*/) override { ++keystrokes; }

  int keystrokes = 0;
};

/// A combo box in which a letter is typed whenever its list has changed.
struct Panel {
  explicit Panel(const Platform& machine) {
    auto own = Platform::current();
    own.serviceDiscovery = machine.serviceDiscovery;
    Platform::install(own);
  }

  bool waitUntilListed(std::size_t count) {
    std::size_t listed = field->items().size();
    return Platform::current().mainThread->serveUntil(
        [&] {
          if (field->items().size() != listed) {
            listed = field->items().size();
            field->show(text += static_cast<char>('a' + text.size() % 26));
            comboBox->userChangedText();
          }
          return listed == count;
        },
        limit);
  }

  fakes::FakePlatform platform;
  std::shared_ptr<fakes::FakeComboBox> field =
      std::make_shared<fakes::FakeComboBox>("field", std::make_shared<fakes::OrderList>());
  std::shared_ptr<KTServiceComboBox> comboBox = std::make_shared<KTServiceComboBox>(field);
  std::shared_ptr<Typist> typist = std::make_shared<Typist>();
  std::string text;
};

void comeAndGo(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    state.PauseTiming();
    Panel panel(Platform::current());
    const int searches = network->searches();
    panel.comboBox->startBrowsing(panel.typist);
    Platform::current().mainThread->serveUntil([&] { return network->searches() > searches; }, limit);
    state.ResumeTiming();
    network->come(services);
    const bool came = panel.waitUntilListed(services);
    network->go(services);
    const bool went = panel.waitUntilListed(0);
    state.counters["listed"] = came && went ? services : 0;
    const bool isTextWhole = panel.field->stringValue() == panel.text;
    state.counters["kept"] = isTextWhole && panel.text.size() == static_cast<std::size_t>(panel.typist->keystrokes)
                                 ? panel.typist->keystrokes
                                 : 0;
  }
}

} // namespace
} // namespace lumora::bench

BENCHMARK(lumora::bench::comeAndGo)->Name("comeAndGo")->UseRealTime()->Iterations(5)->Unit(benchmark::kMillisecond);

int main(int argc, char** argv) {
  using namespace lumora::bench;
  if (const auto obstacle = lumora::tests::TestBus::obstacle()) {
    std::cerr << "bench-discovery needs a bus: " << *obstacle << '\n';
    return EXIT_FAILURE;
  }
  const lumora::tests::TemporaryFolder folder;
  lumora::tests::TestBus bus(folder.path());
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", bus.address().c_str(), 1);
  if (!bus.start()) {
    return EXIT_FAILURE;
  }
  CrowdedNetwork crowd(bus.address());
  network = &crowd;
  auto figures = runBenchmarks(argc, argv);
  bool reached =
      report("discovered services that were listed", figures["comeAndGo:listed"], Bar::AtLeast, services, "");
  reached &= report("letters typed meanwhile and kept", figures["comeAndGo:kept"], Bar::AtLeast, 2 * services, "");
  reached &= report("seconds for 500 services to come and go", figures["comeAndGo"], Bar::AtMost, mostSeconds, "s");
  return reached ? EXIT_SUCCESS : EXIT_FAILURE;
}
