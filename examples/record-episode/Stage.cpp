#include "Stage.h"

#include <LumoraKit/LumoraKit.h>

#include <csignal>
#include <cstdlib>
#include <iostream>

#include <unistd.h>

namespace stage {
namespace {

volatile std::sig_atomic_t interrupted = 0;

// A line that a terminal writes over; elsewhere it would only be noise.
void show(const std::string& line) {
  if (isatty(STDERR_FILENO) != 0) {
    std::cerr << "\r\033[K" << line << std::flush;
  }
}

void throwIfInterrupted() {
  if (interrupted != 0) {
    interrupted = 0;
    show("");
    throw Failure{"Cancelled.", 130};
  }
}

} // namespace

TemporaryHome::TemporaryHome() {
  std::string name = std::filesystem::temp_directory_path() / "record-episode-XXXXXX";
  if (mkdtemp(name.data()) == nullptr) {
    throw Failure{"No temporary folder could be made beside " + name + "."};
  }
  path_ = name;
  setenv("XDG_DATA_HOME", (path_ / "data").c_str(), 1);
  setenv("XDG_CONFIG_HOME", (path_ / "config").c_str(), 1);
}

TemporaryHome::~TemporaryHome() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

void catchInterrupts() {
  struct sigaction action {};
  action.sa_handler = [](int) { interrupted = 1; };
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    sigaction(signal, &action, nullptr);
  }
}

void waitUntil(const std::function<bool()>& condition, const std::function<std::string()>& progress,
               std::chrono::seconds limit) {
  using namespace std::chrono_literals;
  throwIfInterrupted();
  const auto deadline = std::chrono::steady_clock::now() + limit;
  while (!lumora::Platform::current().mainThread->serveUntil(condition, 100ms)) {
    show(progress());
    throwIfInterrupted();
    if (std::chrono::steady_clock::now() > deadline) {
      throw Failure{"Nothing happened for " + std::to_string(limit.count()) + " seconds: " + progress()};
    }
  }
  show("");
}

} // namespace stage
