#pragma once

#include <LumoraKit/platform/Export.h>

#include <string_view>

namespace lumora {

/// Stops the process: one line naming the condition, the operation and the source unit goes to the log and to
/// standard error, then abort(3). In every build.
[[noreturn]] LUMORA_EXPORT void assertionFailed(std::string_view condition, std::string_view operation,
                                                std::string_view unit);

/// Checks what a caller must guarantee. `condition` is the text that names it, `operation` the public operation,
/// `unit` the class it belongs to.
inline void assertThat(bool holds, std::string_view condition, std::string_view operation, std::string_view unit) {
  if (!holds) [[unlikely]] {
    assertionFailed(condition, operation, unit);
  }
}

} // namespace lumora
