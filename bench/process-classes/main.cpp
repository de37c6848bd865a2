// Runs of a tool through KTRunTask, GLib's GSubprocess and Qt's QProcess, from a small process and from one that has
// 2 GiB of memory.

#include "support/Figures.h"

#include <LumoraKit/platform/KTRunTask.h>

#include <benchmark/benchmark.h>
#include <gio/gio.h>

#ifdef LUMORA_BENCH_QT
#include <QCoreApplication>
#include <QProcess>
#endif

#include <cstdlib>
#include <string>
#include <vector>

namespace lumora::bench {
namespace {

constexpr const char* tool = "/bin/cat";
constexpr std::size_t largeMemory = std::size_t{2} << 30U;

const std::string& input() {
  static const std::string text(1000, 'x');
  return text;
}

void expectInput(benchmark::State& state, std::size_t size) {
  if (size != input().size()) {
    state.SkipWithError("the output is not complete");
  }
}

void task(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    std::string output;
    KTRunTask(tool, {}, input(), &output, nullptr, nullptr);
    expectInput(state, output.size());
  }
}

void glib(benchmark::State& state) {
  constexpr auto flags = static_cast<GSubprocessFlags>(G_SUBPROCESS_FLAGS_STDIN_PIPE | G_SUBPROCESS_FLAGS_STDOUT_PIPE |
                                                       G_SUBPROCESS_FLAGS_STDERR_PIPE);
  for ([[maybe_unused]] auto iteration : state) {
    GSubprocess* const process = g_subprocess_new(flags, nullptr, tool, nullptr);
    GBytes* const request = g_bytes_new_static(input().data(), input().size());
    GBytes* output = nullptr;
    GBytes* error = nullptr;
    g_subprocess_communicate(process, request, nullptr, &output, &error, nullptr);
    expectInput(state, output == nullptr ? 0 : g_bytes_get_size(output));
    for (GBytes* const bytes : {request, output, error}) {
      g_bytes_unref(bytes);
    }
    g_object_unref(process);
  }
}

#ifdef LUMORA_BENCH_QT
void qt(benchmark::State& state) {
  for ([[maybe_unused]] auto iteration : state) {
    QProcess process;
    process.start(QString::fromLatin1(tool), QStringList());
    process.write(input().data(), static_cast<qint64>(input().size()));
    process.closeWriteChannel();
    process.waitForFinished();
    expectInput(state, static_cast<std::size_t>(process.readAllStandardOutput().size()));
  }
}
#endif

// Single runs by turns, in random order, and their median: what else the machine does then hurts all sides alike.
std::map<std::string, double> medians(char* program) {
  std::string interleaved = "--benchmark_enable_random_interleaving=true";
  std::string summary = "--benchmark_report_aggregates_only=true";
  std::vector<char*> arguments{program, interleaved.data(), summary.data(), nullptr};
  return runBenchmarks(3, arguments.data());
}

void compare(const std::string& parent, char* program) {
  auto seconds = medians(program);
  tell("GLib's GSubprocess against KTRunTask, " + parent, seconds["glib"] / seconds["task"]);
#ifdef LUMORA_BENCH_QT
  tell("Qt's QProcess against KTRunTask, " + parent, seconds["qt"] / seconds["task"]);
#endif
}

} // namespace
} // namespace lumora::bench

int main(int argc, char** argv) {
  using namespace lumora::bench;
  std::vector<std::pair<const char*, void (*)(benchmark::State&)>> ways{{"task", task}, {"glib", glib}};
#ifdef LUMORA_BENCH_QT
  const QCoreApplication application(argc, argv);
  ways.emplace_back("qt", qt);
#else
  static_cast<void>(argc);
#endif
  constexpr int runs = 300;
  for (const auto& [name, way] : ways) {
    benchmark::RegisterBenchmark(name, way)->Iterations(1)->UseRealTime()->Repetitions(runs);
  }
  compare("small process", argv[0]);
  const std::string memory(largeMemory, '\1');
  // The compiler may not take the memory for unused.
  benchmark::DoNotOptimize(memory.data());
  compare("process of 2 GiB", argv[0]);
  return EXIT_SUCCESS;
}
