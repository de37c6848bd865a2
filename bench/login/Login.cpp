#include "../discovery/CrowdedNetwork.h"
#include "Sheet.h"
#include "support/Figures.h"
#include "support/TemporaryFolder.h"
#include "support/TestBus.h"
#include "support/TestDesktop.h"

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <benchmark/benchmark.h>

#include <QApplication>
#include <QLineEdit>
#include <QTest>
#include <cstdlib>
#include <iostream>
#include <memory>
#include <string>

// How long the login sheet takes to its first paint, beside an empty dialog of its size; and 500 services that come and
// go in its list while the user types. On an X server with a window manager and without a screen (Xvfb), with all of
// the machine's services but the network: its daemon is a stand-in on a bus of the bench's own.

namespace lumora::bench {
namespace {

constexpr int services = 500;
constexpr std::chrono::seconds limit{60};
constexpr double mostTimesAnEmptyDialog = 2;
constexpr double mostSeconds = 1;

QMainWindow* window = nullptr;
PaintWatch* watch = nullptr;
CrowdedNetwork* network = nullptr;

void emptyDialog(benchmark::State& state) {
  auto sheet = std::make_unique<Sheet>(*window);
  const QSize size = sheet->dialog().size();
  sheet.reset();
  settle();
  for ([[maybe_unused]] auto iteration : state) {
    watch->reset();
    auto dialog = std::make_unique<QDialog>(window, Qt::Sheet | Qt::FramelessWindowHint);
    dialog->setWindowModality(Qt::WindowModal);
    dialog->setFixedSize(size);
    dialog->show();
    watch->wait();
    state.PauseTiming();
    dialog.reset();
    settle();
    state.ResumeTiming();
  }
}

void loginSheet(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    watch->reset();
    auto sheet = std::make_unique<Sheet>(*window);
    watch->wait();
    state.PauseTiming();
    sheet.reset();
    settle();
    state.ResumeTiming();
  }
}

// Types a letter whenever the list has changed.
bool waitUntilListed(const QComboBox& comboBox, int count, std::string& typed) {
  int listed = comboBox.count();
  return Platform::current().mainThread->serveUntil(
      [&] {
        if (comboBox.count() != listed) {
          listed = comboBox.count();
          const char letter = static_cast<char>('a' + typed.size() % 26);
          QTest::keyClick(comboBox.lineEdit(), letter);
          typed += letter;
        }
        return listed == count;
      },
      limit);
}

void comeAndGo(benchmark::State& state) {
  int lost = 0;
  for ([[maybe_unused]] auto iteration : state) {
    state.PauseTiming();
    const int searches = network->searches();
    auto sheet = std::make_unique<Sheet>(*window);
    std::string typed;
    Platform::current().mainThread->serveUntil([&] { return network->searches() > searches; }, limit);
    state.ResumeTiming();
    network->come(services);
    const bool came = waitUntilListed(sheet->comboBox(), services, typed);
    network->go(services);
    const bool went = waitUntilListed(sheet->comboBox(), 0, typed);
    state.PauseTiming();
    lost += sheet->comboBox().currentText().toStdString() == typed ? 0 : 1;
    state.counters["listed"] = came && went ? services : 0;
    state.counters["typed"] = static_cast<double>(typed.size());
    state.counters["lost"] = lost;
    sheet.reset();
    settle();
    state.ResumeTiming();
  }
}

bool reportAll(const std::map<std::string, double>& figures) {
  bool reached = report("the login sheet's first paint against an empty dialog's",
                        figures.at("loginSheet") / figures.at("emptyDialog"), Bar::AtMost, mostTimesAnEmptyDialog);
  reached &= report("services that came to the sheet's list and went", figures.at("comeAndGo:listed"), Bar::AtLeast,
                    services, "");
  reached &= report("texts typed meanwhile that lost a letter", figures.at("comeAndGo:lost"), Bar::AtMost, 0, "");
  reached &= report("seconds for 500 services to come to the sheet and go", figures.at("comeAndGo"), Bar::AtMost,
                    mostSeconds, "s");
  return reached;
}

} // namespace
} // namespace lumora::bench

BENCHMARK(lumora::bench::emptyDialog)
    ->Name("emptyDialog")
    ->UseRealTime()
    ->Repetitions(5)
    ->Unit(benchmark::kMillisecond);
BENCHMARK(lumora::bench::loginSheet)->Name("loginSheet")->UseRealTime()->Repetitions(5)->Unit(benchmark::kMillisecond);
BENCHMARK(lumora::bench::comeAndGo)->Name("comeAndGo")->UseRealTime()->Iterations(5)->Unit(benchmark::kMillisecond);

int main(int argc, char** argv) {
  using namespace lumora::bench;
  for (const auto& obstacle : {lumora::tests::TestBus::obstacle(), lumora::tests::TestDesktop::obstacle()}) {
    if (obstacle) {
      std::cerr << "bench-login: " << *obstacle << '\n';
      return EXIT_FAILURE;
    }
  }
  const lumora::tests::TemporaryFolder folder;
  lumora::tests::TestBus bus(folder.path());
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", bus.address().c_str(), 1);
  ::setenv("XDG_CONFIG_HOME", folder.path().c_str(), 1);
  ::setenv("QT_QPA_PLATFORM", "xcb", 1);
  ::setenv("QT_STYLE_OVERRIDE", "fusion", 1);
  lumora::tests::TestDesktop desktop;
  if (!bus.start() || !desktop.start()) {
    return EXIT_FAILURE;
  }
  const QApplication application(argc, argv);
  lumora::qt::install();
  CrowdedNetwork crowd(bus.address());
  QMainWindow parent;
  parent.resize(640, 420);
  parent.show();
  PaintWatch paints;
  window = &parent;
  watch = &paints;
  network = &crowd;
  return reportAll(runBenchmarks(argc, argv)) ? EXIT_SUCCESS : EXIT_FAILURE;
}
