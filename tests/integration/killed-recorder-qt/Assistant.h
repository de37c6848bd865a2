#pragma once

#include "support/ChildProgram.h"

#include <memory>
#include <optional>
#include <string>

namespace lumora::tests {

/// Uses an application of another process as its user does: sees and presses controls by role and name, as a screen
/// reader tells them, and types. A name may be the beginning of one followed by an asterisk. Nothing here waits for a
/// control that is not there.
class Assistant {
public:
  /// Why there can be none on this machine; nothing when there can.
  static std::optional<std::string> obstacle();

  /// On the session's bus and screen, as the environment tells them.
  Assistant();

  /// The text of the control; nothing when it is not to be seen.
  std::optional<std::string> see(const std::string& role, const std::string& name);
  /// False when there is none that is enabled.
  bool press(const std::string& role, const std::string& name);
  /// Types the text in the place of what is there; the same.
  bool type(const std::string& role, const std::string& name, const std::string& text);
  void key(const std::string& name);

private:
  std::string ask(const std::string& line);

  const std::unique_ptr<ChildProgram> program_;
};

} // namespace lumora::tests
