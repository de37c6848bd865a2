#include "PortalDesktop.h"

#include "DesktopShell.h"
#include "support/MainLoop.h"

#include <cstdlib>
#include <thread>

namespace lumora::tests {
namespace {

constexpr const char* busProgram = "/usr/bin/dbus-daemon";
constexpr const char* portalProgram = "/usr/libexec/xdg-desktop-portal";
constexpr const char* addressVariable = "DBUS_SESSION_BUS_ADDRESS";

// Without a folder of services: the machine's own ones are not started on it.
std::string busConfiguration(const std::string& socket) {
  return R"(<!DOCTYPE busconfig PUBLIC "-//freedesktop//DTD D-BUS Bus Configuration 1.0//EN"
 "http://www.freedesktop.org/standards/dbus/1.0/busconfig.dtd">
<busconfig>
  <listen>unix:path=)" +
         socket + R"(</listen>
  <auth>EXTERNAL</auth>
  <policy context="default">
    <allow user="*"/>
    <allow own="*"/>
    <allow send_destination="*" eavesdrop="false"/>
    <allow receive_sender="*"/>
  </policy>
</busconfig>
)";
}

// The number of the node in a list like "id 31, type PipeWire:Interface:Node/3", followed by its properties.
std::string nodeNumber(const std::string& name) {
  const auto list = ChildProgram::start({"pw-cli", "ls", "Node"});
  const std::string idWord = "id ";
  std::string number;
  for (int emptyLines = 0; list && emptyLines < 2;) {
    const std::string line = list->readLine();
    emptyLines = line.empty() ? emptyLines + 1 : 0;
    if (const auto id = line.find(idWord); id != std::string::npos && line.find(", type ") != std::string::npos) {
      number = line.substr(id + idWord.size(), line.find(',') - id - idWord.size());
    } else if (line.find("node.name = \"" + name + "\"") != std::string::npos) {
      return number;
    }
  }
  return {};
}

} // namespace

std::optional<std::string> PortalDesktop::obstacle() {
  for (const char* const program : {busProgram, portalProgram}) {
    if (!std::filesystem::exists(program)) {
      return std::string(program) + " is not installed";
    }
  }
  return std::nullopt;
}

PortalDesktop::PortalDesktop() {
  ::setenv(addressVariable, ("unix:path=" + (folder_ / "bus").string()).c_str(), 1);
  ::setenv("XDG_SESSION_TYPE", "wayland", 1);
  ::setenv("WAYLAND_DISPLAY", "wayland-test", 1);
}

PortalDesktop::~PortalDesktop() {
  for (const char* const variable : {addressVariable, "XDG_SESSION_TYPE", "WAYLAND_DISPLAY"}) {
    ::unsetenv(variable);
  }
}

bool PortalDesktop::startBus() {
  writeFile(folder_ / "bus.conf", busConfiguration((folder_ / "bus").string()));
  bus_ = ChildProgram::start(
      {busProgram, "--nofork", "--nopidfile", "--print-address=1", "--config-file=" + (folder_ / "bus.conf").string()});
  return bus_ && !bus_->readLine().empty();
}

bool PortalDesktop::startShell(const std::string& nodeName) {
  const std::string node = nodeNumber(nodeName);
  if (node.empty()) {
    return false;
  }
  writeFile(folder_ / "lumora.portal", std::string("[portal]\nDBusName=") + desktopShellName +
                                           "\nInterfaces=org.freedesktop.impl.portal.ScreenCast\nUseIn=lumora\n");
  shell_ = ChildProgram::startSelf({desktopShellSwitch, node});
  return shell_ && told() == "ready";
}

bool PortalDesktop::startPortal() {
  portal_ = ChildProgram::start(
      {"env", "XDG_CURRENT_DESKTOP=lumora", "XDG_DESKTOP_PORTAL_DIR=" + folder_.path().string(), portalProgram});
  return portal_ && waitForPortal();
}

bool PortalDesktop::waitForPortal() {
  const auto limit = std::chrono::steady_clock::now() + generousLimit;
  while (std::chrono::steady_clock::now() < limit) {
    const auto probe = ChildProgram::start(
        {"dbus-send", "--session", "--print-reply=literal", "--dest=org.freedesktop.DBus", "/org/freedesktop/DBus",
         "org.freedesktop.DBus.NameHasOwner", "string:org.freedesktop.portal.Desktop"});
    if (!probe || probe->readLine().find("true") != std::string::npos) {
      return probe != nullptr;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
  }
  return false;
}

void PortalDesktop::order(const std::string& what) {
  shell_->writeLine(what);
  for (std::string line = told(); line != "ok" && !line.empty(); line = told()) {
  }
}

} // namespace lumora::tests
