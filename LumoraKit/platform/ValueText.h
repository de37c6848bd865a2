#pragma once

#include <LumoraKit/platform/Value.h>

#include <optional>
#include <string>
#include <string_view>

/// \file
/// Texts of the single values in a property list, both ways. A reader gets a text without white space around it and
/// gives nothing for what it does not understand whole. Not for applications.

namespace lumora::value_text {

/// Decimal, or hexadecimal after 0x, with an optional sign; -2^63 to 2^64-1.
LUMORA_INTERNAL std::optional<Value> readInteger(std::string_view text);

/// Decimal with an optional sign, fraction and exponent, or "nan", "inf" and "infinity" in any case. Nothing for a
/// number whose size no double can hold.
LUMORA_INTERNAL std::optional<double> readReal(std::string_view text);
/// The shortest text that reads as the same number; "nan", "+infinity", "-infinity".
LUMORA_INTERNAL std::string realText(double number);

/// "2010-01-20T15:04:05Z" (RFC 3339, years 0001 to 9999, UTC only, no leap second).
LUMORA_INTERNAL std::optional<Date> readDate(std::string_view text);
/// Nothing outside the years 0001 to 9999. `separator` stands between day and time, `zone` at the end.
LUMORA_INTERNAL std::optional<std::string> dateText(Date date, std::string_view separator, std::string_view zone);

/// Base64 (RFC 4648 section 4, padded) with white space anywhere.
LUMORA_INTERNAL std::optional<Data> readBase64(std::string_view text);
/// Appends the Base64 of `size` bytes in one line.
LUMORA_INTERNAL void appendBase64(std::string& text, const std::uint8_t* bytes, std::size_t size);

} // namespace lumora::value_text
