#include "Desktop.h"

#include "support/MainLoop.h"

#include <chrono>
#include <cstdlib>
#include <functional>
#include <memory>
#include <thread>

#include <X11/Xlib.h>

namespace {

using DisplayPtr = std::unique_ptr<Display, int (*)(Display*)>;

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
  const auto end = std::chrono::steady_clock::now() + lumora::tests::generousLimit;
  while (!condition()) {
    if (std::chrono::steady_clock::now() > end) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  }
  return true;
}

} // namespace

std::string& missingDesktop() {
  static std::string reason;
  return reason;
}

std::unique_ptr<Desktop> Desktop::start(std::string& reason) {
  auto desktop = std::unique_ptr<Desktop>(new Desktop);
  desktop->server_ = lumora::tests::ChildProgram::start(
      {"Xvfb", "-displayfd", "1", "-screen", "0", "1280x800x24", "-nolisten", "tcp"});
  const std::string number = desktop->server_ ? desktop->server_->readLine() : "";
  if (number.empty()) {
    reason = "Xvfb is not installed, or does not start";
    return nullptr;
  }
  ::setenv("DISPLAY", (":" + number).c_str(), 1);
  const auto configuration = desktop->folder_ / "jwmrc";
  lumora::tests::writeFile(configuration, "<?xml version=\"1.0\"?>\n<JWM>\n</JWM>\n");
  desktop->manager_ = lumora::tests::ChildProgram::start({"jwm", "-f", configuration.string()});
  const DisplayPtr display(XOpenDisplay(nullptr), XCloseDisplay);
  if (!desktop->manager_ || !display || !waitFor([&] { return isManaged(*display); })) {
    reason = "jwm is not installed, or does not start";
    return nullptr;
  }
  return desktop;
}
