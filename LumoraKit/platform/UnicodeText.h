#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

/// \file
/// UTF-8 (RFC 3629), read strictly. Not for applications.

namespace lumora::utf8 {

/// A character and how many bytes it has; none for bytes that are not UTF-8.
struct Character {
  std::uint32_t code = 0;
  std::size_t length = 0;
};

inline std::uint8_t byteAt(std::string_view text, std::size_t at) {
  return static_cast<std::uint8_t>(text[at]);
}

/// How many bytes a sequence has by its first one, and the smallest character that needs as many.
struct Sequence {
  std::size_t length;
  std::uint32_t smallest;
};

constexpr Sequence sequenceStartingWith(std::uint8_t first) {
  return first < 0x80             ? Sequence{1, 0}
         : (first & 0xe0) == 0xc0 ? Sequence{2, 0x80}
         : (first & 0xf0) == 0xe0 ? Sequence{3, 0x800}
         : (first & 0xf8) == 0xf0 ? Sequence{4, 0x10000}
                                  : Sequence{0, 0};
}

constexpr bool isCharacter(std::uint32_t code) {
  return code < 0xd800 || (code >= 0xe000 && code <= 0x10ffff);
}

/// The character that starts there, which is in the text.
inline Character characterAt(std::string_view text, std::size_t at) {
  const auto [length, smallest] = sequenceStartingWith(byteAt(text, at));
  if (length == 0 || text.size() - at < length) {
    return {};
  }
  std::uint32_t code = length == 1 ? byteAt(text, at) : byteAt(text, at) & (0x7fU >> length);
  for (std::size_t i = 1; i < length; ++i) {
    const std::uint8_t next = byteAt(text, at + i);
    if ((next & 0xc0) != 0x80) {
      return {};
    }
    code = code << 6 | (next & 0x3fU);
  }
  return code >= smallest && isCharacter(code) ? Character{code, length} : Character{};
}

inline bool isValid(std::string_view text) {
  for (std::size_t at = 0; at < text.size();) {
    const std::size_t length = characterAt(text, at).length;
    if (length == 0) {
      return false;
    }
    at += length;
  }
  return true;
}

} // namespace lumora::utf8
