#include "PortalDesktop.h"

#include "DesktopShell.h"

#include <cstdlib>
#include <filesystem>

namespace lumora::tests {
namespace {

constexpr const char* portalProgram = "/usr/libexec/xdg-desktop-portal";
constexpr const char* addressVariable = "DBUS_SESSION_BUS_ADDRESS";

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
  if (!std::filesystem::exists(portalProgram)) {
    return "there is no xdg-desktop-portal";
  }
  return TestBus::obstacle();
}

PortalDesktop::PortalDesktop() {
  ::setenv(addressVariable, bus_.address().c_str(), 1);
  ::setenv("XDG_SESSION_TYPE", "wayland", 1);
  ::setenv("WAYLAND_DISPLAY", "wayland-test", 1);
}

PortalDesktop::~PortalDesktop() {
  for (const char* const variable : {addressVariable, "XDG_SESSION_TYPE", "WAYLAND_DISPLAY"}) {
    ::unsetenv(variable);
  }
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
  return portal_ && bus_.waitForService("org.freedesktop.portal.Desktop");
}

void PortalDesktop::order(const std::string& what) {
  shell_->writeLine(what);
  for (std::string line = told(); line != "ok" && !line.empty(); line = told()) {
  }
}

} // namespace lumora::tests
