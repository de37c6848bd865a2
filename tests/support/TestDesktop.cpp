#include "TestDesktop.h"

#include "MainLoop.h"

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <thread>

#include <X11/Xlib.h>

namespace fs = std::filesystem;

namespace lumora::tests {
namespace {

constexpr const char* serverProgram = "/usr/bin/Xvfb";
constexpr const char* managerProgram = "/usr/bin/jwm";

using DisplayPtr = std::unique_ptr<Display, int (*)(Display*)>;

DisplayPtr openDisplay() {
  return {XOpenDisplay(nullptr), XCloseDisplay};
}

// A window manager that is ready says so in a property of the root window.
bool isManaged(Display& display) {
  const Atom property = XInternAtom(&display, "_NET_SUPPORTING_WM_CHECK", False);
  Atom type = 0;
  int format = 0;
  unsigned long count = 0;
  unsigned long rest = 0;
  unsigned char* value = nullptr;
  XGetWindowProperty(&display, XDefaultRootWindow(&display), property, 0, 1, False, AnyPropertyType, &type, &format,
                     &count, &rest, &value);
  if (value) {
    XFree(value);
  }
  return count > 0;
}

bool waitFor(const std::function<bool()>& condition) {
  const auto end = std::chrono::steady_clock::now() + generousLimit;
  while (!condition()) {
    if (std::chrono::steady_clock::now() > end) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
  return true;
}

std::string variable(const char* name) {
  const char* const value = std::getenv(name);
  return value ? value : "";
}

} // namespace

std::optional<std::string> TestDesktop::obstacle() {
  for (const char* const program : {serverProgram, managerProgram}) {
    if (!fs::exists(program)) {
      return "there is no " + std::string(program) + " (packages xvfb and jwm)";
    }
  }
  return std::nullopt;
}

bool TestDesktop::isThereOne() {
  const std::string socket = variable("WAYLAND_DISPLAY");
  return (!socket.empty() && fs::exists(fs::path(variable("XDG_RUNTIME_DIR")) / socket)) || openDisplay() != nullptr;
}

bool TestDesktop::start() {
  server_ = ChildProgram::start({serverProgram, "-displayfd", "1", "-screen", "0", "1280x800x24", "-nolisten", "tcp"});
  const std::string number = server_ ? server_->readLine() : "";
  if (number.empty()) {
    return false;
  }
  ::setenv("DISPLAY", (":" + number).c_str(), 1);
  return startManager();
}

bool TestDesktop::startManager() {
  const auto configuration = folder_ / "jwmrc";
  writeFile(configuration, "<?xml version=\"1.0\"?>\n<JWM>\n</JWM>\n");
  manager_ = ChildProgram::start({managerProgram, "-f", configuration.string()});
  const auto display = openDisplay();
  return manager_ && display && waitFor([&] { return isManaged(*display); });
}

} // namespace lumora::tests
