#pragma once

#include "support/ChildProgram.h"
#include "support/TemporaryFolder.h"
#include "support/TestBus.h"

#include <memory>
#include <optional>
#include <string>

namespace lumora::tests {

/// A Wayland desktop of one test's own, which this process sees through the environment while it exists: a session bus
/// without any other service, the machine's xdg-desktop-portal on it, and behind that a desktop with a PipeWire node
/// as its screen (DesktopShell.h).
class PortalDesktop {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();

  PortalDesktop();
  PortalDesktop(const PortalDesktop&) = delete;
  PortalDesktop& operator=(const PortalDesktop&) = delete;
  ~PortalDesktop();

  /// Each true when it has come up, in this order; every one may be left out.
  bool startBus() { return bus_.start(); }
  bool startShell(const std::string& nodeName);
  bool startPortal();

  /// Gives the shell an order; what it told meanwhile is passed over.
  void order(const std::string& what);
  /// What the shell tells next. Blocks.
  std::string told() { return shell_->readLine(); }

  ChildProgram& bus() { return bus_.program(); }
  ChildProgram& portal() { return *portal_; }

private:
  const TemporaryFolder folder_;
  TestBus bus_{folder_.path()};
  std::unique_ptr<ChildProgram> shell_;
  std::unique_ptr<ChildProgram> portal_;
};

} // namespace lumora::tests
