#pragma once

#include <LumoraKit/platform/Value.h>

#include <concepts>
#include <limits>
#include <string>
#include <string_view>

/// \file
/// Reads entries of dictionaries that were kept on disk. Each is false when there is no such entry of that type; what
/// it should have read is then unspecified.

namespace lumora {

inline bool readEntry(const Dictionary& dictionary, std::string_view key, std::string& text) {
  const auto found = dictionary.string(key);
  text = found.value_or("");
  return found.has_value();
}

inline bool readEntry(const Dictionary& dictionary, std::string_view key, Dictionary& entries) {
  const Dictionary* const found = dictionary.dictionary(key);
  entries = found ? *found : Dictionary();
  return found != nullptr;
}

inline bool readEntry(const Dictionary& dictionary, std::string_view key, bool& flag) {
  const Value* const value = dictionary.find(key);
  const auto found = value ? value->boolean() : std::nullopt;
  flag = found.value_or(false);
  return found.has_value();
}

inline bool readEntry(const Dictionary& dictionary, std::string_view key, Date& date) {
  const Value* const value = dictionary.find(key);
  const auto found = value ? value->date() : std::nullopt;
  date = found.value_or(Date());
  return found.has_value();
}

/// A number that fits.
template <std::unsigned_integral Number>
bool readEntry(const Dictionary& dictionary, std::string_view key, Number& number) {
  const Value* const value = dictionary.find(key);
  const auto found = value ? value->unsignedInteger() : std::nullopt;
  if (!found || *found > std::numeric_limits<Number>::max()) {
    return false;
  }
  number = static_cast<Number>(*found);
  return true;
}

} // namespace lumora
