#pragma once

#include <LumoraKit/platform/Value.h>

#include <optional>
#include <string>
#include <string_view>

namespace lumora {

/// Per-user preferences, one store a domain (an application's or a library's identifier). Any thread and any number
/// of processes. What cannot be read is logged and counts as absent; what cannot be written is logged and otherwise
/// lost.
class LUMORA_EXPORT Preferences {
public:
  virtual ~Preferences();

  /// The value, as any process wrote it last; nothing when absent. Reading creates nothing.
  virtual std::optional<Value> value(std::string_view domain, std::string_view key) = 0;
  /// Stores the value, or removes the key when there is none; on disk when the call returns.
  virtual void setValue(std::string_view domain, std::string_view key, const std::optional<Value>& value) = 0;
};

} // namespace lumora
