#pragma once

#include "ChildProgram.h"
#include "TemporaryFolder.h"

#include <memory>
#include <optional>
#include <string>

namespace lumora::tests {

/// A desktop without a screen, for one program: an X server, and a window manager on it. This process and its children
/// see it through the environment from start() on.
class TestDesktop {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();
  /// Whether the caller has one already that answers, with X or with Wayland.
  static bool isThereOne();

  /// True when both have come up.
  bool start();

private:
  bool startManager();

  TemporaryFolder folder_;
  std::unique_ptr<ChildProgram> server_;
  std::unique_ptr<ChildProgram> manager_;
};

} // namespace lumora::tests
