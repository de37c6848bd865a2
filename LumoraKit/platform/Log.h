#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/Value.h>

#include <filesystem>
#include <initializer_list>
#include <optional>
#include <string>
#include <string_view>

/// \file
/// The log: one plain formatted line an event, no levels.

namespace lumora {

/// Where log lines go. The default sends them to syslog(3). Implementations are called from any thread, several at
/// once, and must not log themselves.
class LUMORA_EXPORT Log {
public:
  virtual ~Log();
  /// One line, without a line end.
  virtual void write(std::string_view line) = 0;
};

/// The text that "%@" prints: "(null)" for what is absent.
LUMORA_EXPORT std::string text(std::string_view value);
LUMORA_EXPORT std::string text(const std::string& value);
LUMORA_EXPORT std::string text(const char* value);
LUMORA_EXPORT std::string text(const std::optional<std::string>& value);
LUMORA_EXPORT std::string text(std::int64_t number);
LUMORA_EXPORT std::string text(std::uint64_t number);
LUMORA_EXPORT std::string text(int number);
LUMORA_EXPORT std::string text(unsigned number);
LUMORA_EXPORT std::string text(double number);
LUMORA_EXPORT std::string text(const Value& value);
LUMORA_EXPORT std::string text(const LMRErrorRef& error);
LUMORA_EXPORT std::string text(const std::filesystem::path& path);

/// Fills the place holders of a format ("%@", "%d", "%u", "%s", "%ld"; "%%" is a per cent sign) with texts in their
/// order. The number of place holders and texts must agree, and there is no other place holder (both asserted).
LUMORA_EXPORT std::string format(std::string_view format, std::initializer_list<std::string> arguments);

/// Writes a filled format to the platform's log: log("Error %d for %@", {text(26), text(command)}).
LUMORA_EXPORT void log(std::string_view format, std::initializer_list<std::string> arguments);

} // namespace lumora
