#include "TestBus.h"

#include "MainLoop.h"
#include "TemporaryFolder.h"

#include <chrono>
#include <thread>
#include <utility>

namespace fs = std::filesystem;

namespace lumora::tests {
namespace {

constexpr const char* busProgram = "/usr/bin/dbus-daemon";
constexpr const char* askProgram = "/usr/bin/dbus-send";

std::string configuration(const std::string& address, const std::string& rules) {
  return R"(<!DOCTYPE busconfig PUBLIC "-//freedesktop//DTD D-BUS Bus Configuration 1.0//EN"
 "http://www.freedesktop.org/standards/dbus/1.0/busconfig.dtd">
<busconfig>
  <listen>)" +
         address + "</listen>\n  <auth>EXTERNAL</auth>" + rules + "\n</busconfig>\n";
}

} // namespace

const char* const TestBus::openRules = R"(
  <policy context="default">
    <allow user="*"/>
    <allow own="*"/>
    <allow send_destination="*" eavesdrop="false"/>
    <allow receive_sender="*"/>
  </policy>)";

std::optional<std::string> TestBus::obstacle() {
  for (const char* const program : {busProgram, askProgram}) {
    if (!fs::exists(program)) {
      return "there is no " + std::string(program) + " (package dbus)";
    }
  }
  return std::nullopt;
}

TestBus::TestBus(fs::path folder, const std::string& rules) : folder_(std::move(folder)) {
  writeFile(folder_ / "bus.conf", configuration(address(), rules));
}

std::string TestBus::address() const {
  return "unix:path=" + (folder_ / "bus").string();
}

bool TestBus::start() {
  program_ = ChildProgram::start(
      {busProgram, "--nofork", "--nopidfile", "--print-address=1", "--config-file=" + (folder_ / "bus.conf").string()});
  return program_ && !program_->readLine().empty();
}

bool TestBus::waitForService(const std::string& name) const {
  const auto limit = std::chrono::steady_clock::now() + generousLimit;
  while (std::chrono::steady_clock::now() < limit) {
    const auto probe =
        ChildProgram::start({askProgram, "--bus=" + address(), "--print-reply=literal", "--dest=org.freedesktop.DBus",
                             "/org/freedesktop/DBus", "org.freedesktop.DBus.NameHasOwner", "string:" + name});
    if (!probe || probe->readLine().find("true") != std::string::npos) {
      return probe != nullptr;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  return false;
}

} // namespace lumora::tests
