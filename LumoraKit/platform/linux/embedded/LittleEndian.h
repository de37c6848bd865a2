#pragma once

#include <concepts>
#include <cstddef>
#include <string>
#include <string_view>

namespace lumora::backend {

/// Appends a number, its least byte first.
template <std::unsigned_integral Number> void appendNumber(std::string& text, Number number) {
  for (std::size_t i = 0; i < sizeof(Number); ++i) {
    text += static_cast<char>(number >> (8 * i) & 0xffU);
  }
}

/// The number that stands there, whole.
template <std::unsigned_integral Number> Number numberAt(std::string_view text, std::size_t at) {
  Number number = 0;
  for (std::size_t i = 0; i < sizeof(Number); ++i) {
    number |= static_cast<Number>(Number{static_cast<unsigned char>(text[at + i])} << (8 * i));
  }
  return number;
}

} // namespace lumora::backend
