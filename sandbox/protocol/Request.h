#pragma once

#include <LumoraKit/platform/Value.h>

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumora::sandbox {

/// One element of a request: a bare word, or an array of a key word and its values.
struct Element {
  std::string word;
  /// Absent for a bare word. A value is a string or an integer.
  std::optional<std::vector<Value>> values;

  bool isWord() const { return !values; }
};

/// Reads a request: an XML property list holding an array of elements. Anything else is refused as invalid input.
std::vector<Element> parseRequest(std::string_view text);

/// The element as a message names it: `the word "plist"`, `the element ("file", ...)`. Values are never shown: one of
/// them is the password.
std::string nameOf(const Element& element);

} // namespace lumora::sandbox
