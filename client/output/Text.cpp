#include "Text.h"

#include <glib.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <memory>

namespace lumora::client {

namespace {

std::string hexadecimal(gunichar number, std::size_t digits) {
  std::array<char, 8> text{};
  const char* const end = std::to_chars(text.begin(), text.end(), number, 16).ptr;
  const std::string significant(text.cbegin(), end);
  return std::string(digits - std::min(digits, significant.size()), '0') + significant;
}

std::string twoDigits(long number) {
  return (number < 10 ? "0" : "") + std::to_string(number);
}

std::string escaped(gunichar character) {
  switch (character) {
  case '\n':
    return "\\n";
  case '\t':
    return "\\t";
  case '\r':
    return "\\r";
  default:
    return character < 0x100 ? "\\x" + hexadecimal(character, 2) : "\\u" + hexadecimal(character, 4);
  }
}

// Controls, and the marks that turn the direction of what follows.
bool isHidden(gunichar character) {
  const bool turnsDirection =
      (character >= 0x202A && character <= 0x202E) || (character >= 0x2066 && character <= 0x2069);
  return g_unichar_iscntrl(character) != FALSE || turnsDirection || character == 0x2028 || character == 0x2029;
}

// Calls the function with each character and its bytes.
template <class Function> void forEachCharacter(std::string_view text, const Function& function) {
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;) {
    // The library takes a zero byte for the end of the text.
    const gunichar character = *at == '\0' ? 0 : g_utf8_get_char_validated(at, end - at);
    const bool isValid = character < 0x110000;
    const char* const next = at + (isValid ? g_unichar_to_utf8(character, nullptr) : 1);
    function(isValid ? character : gunichar{0xFFFD},
             isValid ? std::string_view(at, static_cast<std::size_t>(next - at)) : std::string_view("\xEF\xBF\xBD"));
    at = next;
  }
}

std::string dateText(Date date) {
  const std::unique_ptr<GDateTime, decltype(&g_date_time_unref)> moment(
      g_date_time_new_from_unix_local(date.time_since_epoch().count()), &g_date_time_unref);
  const std::unique_ptr<gchar, decltype(&g_free)> text(
      moment ? g_date_time_format(moment.get(), "%Y-%m-%d %H:%M:%S") : nullptr, &g_free);
  return text ? text.get() : Value(date).description();
}

bool isCollection(const Value& value) {
  return value.array() != nullptr || value.dictionary() != nullptr;
}

std::string arrayText(const Array& array) {
  if (std::ranges::any_of(array, isCollection)) {
    return printable(Value(array).description());
  }
  std::string text;
  for (const Value& value : array) {
    text += (text.empty() ? "" : ", ") + plainText(value);
  }
  return text;
}

} // namespace

std::string printable(std::string_view text) {
  std::string result;
  forEachCharacter(text, [&](gunichar character, std::string_view bytes) {
    if (isHidden(character)) {
      result += escaped(character);
    } else {
      result += bytes;
    }
  });
  return result;
}

std::string inQuotes(std::string_view text) {
  return "\"" + printable(text) + "\"";
}

std::size_t width(std::string_view text) {
  std::size_t columns = 0;
  forEachCharacter(text, [&](gunichar character, std::string_view) {
    if (g_unichar_iszerowidth(character) == FALSE) {
      columns += g_unichar_iswide(character) != FALSE ? 2 : 1;
    }
  });
  return columns;
}

std::string plainText(const Value& value) {
  switch (value.type()) {
  case Value::Type::Boolean:
    return value.boolean().value() ? "yes" : "no";
  case Value::Type::Date:
    return dateText(value.date().value());
  case Value::Type::Data:
    return byteText(Value(std::uint64_t{value.data()->size()})) + " of data";
  case Value::Type::Array:
    return arrayText(*value.array());
  default:
    return printable(value.description());
  }
}

std::string byteText(const Value& value) {
  constexpr double step = 1000;
  const auto bytes = value.type() == Value::Type::Boolean ? std::nullopt : value.real();
  if (!bytes || *bytes < 0) {
    return plainText(value);
  }
  double amount = *bytes;
  if (amount < step) {
    return std::to_string(std::lround(amount)) + " B";
  }
  constexpr std::array<const char*, 6> units{"kB", "MB", "GB", "TB", "PB", "EB"};
  std::size_t unit = 0;
  // What would be printed as 1000.0 is one of the next unit.
  for (amount /= step; amount >= step - 0.05 && unit + 1 < units.size(); ++unit) {
    amount /= step;
  }
  const long tenths = std::lround(amount * 10);
  return std::to_string(tenths / 10) + "." + std::to_string(tenths % 10) + " " + units.at(unit);
}

std::string durationText(const Value& value) {
  constexpr double longest = 1e9;
  const auto seconds = value.type() == Value::Type::Boolean ? std::nullopt : value.real();
  if (!seconds || !(*seconds >= 0 && *seconds < longest)) {
    return plainText(value);
  }
  const auto whole = static_cast<long>(*seconds);
  const std::string minutes =
      whole < 3600 ? std::to_string(whole / 60) : std::to_string(whole / 3600) + ":" + twoDigits(whole / 60 % 60);
  return minutes + ":" + twoDigits(whole % 60);
}

} // namespace lumora::client
