#include "Reader.h"

#include <csignal>
#include <cstdlib>
#include <filesystem>

namespace lumora::tests {
namespace {

constexpr const char* launcherProgram = "/usr/libexec/at-spi-bus-launcher";
constexpr const char* readerProgram = LUMORA_SOURCE_DIR "/tests/integration/login-accessibility-qt/read-controls";

std::vector<std::string> split(const std::string& line, char separator) {
  std::vector<std::string> fields(1);
  for (const char character : line) {
    if (character == separator) {
      fields.emplace_back();
    } else {
      fields.back() += character;
    }
  }
  return fields;
}

} // namespace

std::optional<std::string> AccessibilityBus::obstacle() {
  if (!std::filesystem::exists(launcherProgram)) {
    return "there is no " + std::string(launcherProgram) + " (package at-spi2-core)";
  }
  const auto trial = ChildProgram::start({"/usr/bin/python3", "-c",
                                          "import gi; gi.require_version('Atspi', '2.0'); "
                                          "from gi.repository import Atspi; print('there')"});
  if (!trial || trial->readLine() != "there") {
    return "Python has no Atspi (packages python3-gi and gir1.2-atspi-2.0)";
  }
  return TestBus::obstacle();
}

bool AccessibilityBus::start() {
  if (!bus_.start()) {
    return false;
  }
  ::setenv("DBUS_SESSION_BUS_ADDRESS", bus_.address().c_str(), 1);
  ::setenv("XDG_RUNTIME_DIR", folder_.path().c_str(), 1);
  // It ends its own child when it is asked to end.
  launcher_ = ChildProgram::start(
      {"setpriv", "--pdeathsig", "TERM", launcherProgram, "--launch-immediately", "--a11y=1", "--screen-reader=1"});
  return launcher_ && bus_.waitForService("org.a11y.Bus");
}

AccessibilityBus::~AccessibilityBus() {
  if (launcher_) {
    launcher_->signal(SIGTERM);
    launcher_->wait();
  }
}

Reader::Reader() : program_(ChildProgram::start({readerProgram})) {
  listener_ = std::thread([this] { listen(); });
}

Reader::~Reader() {
  program_->signal(SIGKILL);
  listener_.join();
}

void Reader::listen() {
  for (std::string line = program_->readLine(); !line.empty(); line = program_->readLine()) {
    const std::lock_guard lock(mutex_);
    note(split(line, '\t'));
  }
}

void Reader::note(const std::vector<std::string>& fields) {
  const std::string& kind = fields.front();
  if (kind == "control" && fields.size() == 6) {
    controls_.push_back({fields[1], fields[2], fields[3], fields[4], split(fields[5], ' ')});
  } else if (kind == "event" && fields.size() == 6) {
    events_.push_back({fields[1], fields[2], fields[3], fields[4], fields[5]});
  }
  isReady_ = isReady_ || kind == "ready";
  isComplete_ = isComplete_ || kind == "end";
}

bool Reader::isReady() const {
  const std::lock_guard lock(mutex_);
  return isReady_;
}

void Reader::ask() {
  {
    const std::lock_guard lock(mutex_);
    isComplete_ = false;
    controls_.clear();
  }
  program_->writeLine("read");
}

std::optional<std::vector<Control>> Reader::controls() const {
  const std::lock_guard lock(mutex_);
  return isComplete_ ? std::optional(controls_) : std::nullopt;
}

std::vector<Event> Reader::events() const {
  const std::lock_guard lock(mutex_);
  return events_;
}

} // namespace lumora::tests
