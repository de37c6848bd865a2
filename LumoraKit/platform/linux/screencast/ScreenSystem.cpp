#include <LumoraKit/platform/linux/screencast/ScreenSystem.h>

#include <cstdlib>

namespace lumora::backend {
namespace {

std::string variable(const char* name) {
  const char* const value = std::getenv(name);
  return value ? value : "";
}

} // namespace

DesktopEnvironment DesktopEnvironment::current() {
  return {variable("XDG_SESSION_TYPE"), variable("WAYLAND_DISPLAY"), variable("DISPLAY")};
}

ScreenSystem screenSystemOf(const DesktopEnvironment& desktop) {
  if (desktop.sessionType == "wayland") {
    return ScreenSystem::Portal;
  }
  const bool isX11Session = desktop.sessionType == "x11" && !desktop.display.empty();
  if (!isX11Session && !desktop.waylandDisplay.empty()) {
    return ScreenSystem::Portal;
  }
  return desktop.display.empty() ? ScreenSystem::None : ScreenSystem::XServer;
}

} // namespace lumora::backend
