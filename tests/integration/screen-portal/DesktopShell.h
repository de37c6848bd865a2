#pragma once

#include <string>

/// \file
/// A desktop behind the portal: what a desktop shell does for org.freedesktop.impl.portal.ScreenCast, without a screen
/// and with a tester in the place of the user.

namespace lumora::tests {

inline constexpr const char* desktopShellSwitch = "--desktop-shell";
inline constexpr const char* desktopShellName = "org.freedesktop.impl.portal.desktop.lumoratest";

/// Serves until it is killed, with one PipeWire node as its screen. Orders come on standard input, each answered with
/// "ok":
///
///     allow, refuse, cancel   how a dialog is answered: one that is open, and all that follow. Only "allow" lets a
///                             remembered answer serve in the place of a dialog.
///     wait                    dialogs stay open
///     hang                    as wait, and no other request is answered either
///     end                     the desktop ends all sessions
///
/// What happens is told on standard output: "ready", "selected types=T cursor=C persist=P", "asked" or "restored",
/// "hanging", "dialog closed", "session closed".
int runDesktopShell(const std::string& node);

} // namespace lumora::tests
