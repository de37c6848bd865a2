#pragma once

#include "support/ValuePrinter.h"

#include <LumoraKit/platform/PropertyList.h>

#include <string>
#include <string_view>

/// \file
/// Documents for the property-list tests.

namespace lumora::tests {

/// A document with this content of its <plist>. The content begins at byte 21 of line 1.
inline std::string documentOf(std::string_view content) {
  return "<plist version=\"1.0\">" + std::string(content) + "</plist>";
}

/// The text in UTF-16, with a byte order mark, big or little end first.
inline std::string inUTF16(std::u16string_view text, bool bigEndian) {
  const std::u16string marked = u'\ufeff' + std::u16string(text);
  std::string bytes;
  for (const char16_t unit : marked) {
    const char high = static_cast<char>(unit >> 8);
    const char low = static_cast<char>(unit & 0xff);
    bytes += bigEndian ? high : low;
    bytes += bigEndian ? low : high;
  }
  return bytes;
}

inline std::string repeated(std::string_view text, std::size_t count) {
  std::string result;
  result.reserve(text.size() * count);
  while (count-- > 0) {
    result += text;
  }
  return result;
}

/// Arrays in arrays, so many of them.
inline std::string nestedArrays(std::size_t depth) {
  return documentOf(repeated("<array>", depth) + repeated("</array>", depth));
}

} // namespace lumora::tests
