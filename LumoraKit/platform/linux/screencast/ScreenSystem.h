#pragma once

#include <LumoraKit/platform/Export.h>

#include <string>

namespace lumora::backend {

/// Who shows the screen to a program.
enum class ScreenSystem { None, XServer, Portal };

/// What a program's environment says of the desktop that it runs on; empty texts for what it does not say.
struct DesktopEnvironment {
  /// XDG_SESSION_TYPE: "wayland", "x11", "tty" and others.
  std::string sessionType;
  /// WAYLAND_DISPLAY.
  std::string waylandDisplay;
  /// DISPLAY.
  std::string display;

  /// This process's own.
  LUMORA_INTERNAL static DesktopEnvironment current();
};

/// The choice between them:
///
/// 1. In a session of the type "wayland" the portal, also when there is a DISPLAY: that X server shows the windows of
///    X programs only.
/// 2. In one of the type "x11" with a DISPLAY the X server, also when there is a compositor in one of its windows.
/// 3. In any other, which says nothing (a desktop that was started from a terminal is of the type "tty"), the portal
///    when there is a WAYLAND_DISPLAY, else the X server when there is a DISPLAY.
LUMORA_INTERNAL ScreenSystem screenSystemOf(const DesktopEnvironment& desktop);

} // namespace lumora::backend
