#pragma once

#include <LumoraKit/LumoraKit.h>

#include <string>
#include <string_view>

/// \file
/// Values as people read them.

namespace lumora::client {

/// A text that is safe and visible on a terminal: control characters as escapes ("\n", "\x1b"), broken UTF-8 as U+FFFD.
std::string printable(std::string_view text);
/// The same between quotation marks.
std::string inQuotes(std::string_view text);
/// How many columns of a terminal it takes.
std::size_t width(std::string_view text);

/// Any value on one line: strings as printable(), "yes" and "no", dates in local time, data by their size, lists of
/// plain values with commas.
std::string plainText(const Value& value);
/// A number of bytes: "42.1 kB". What is no number as plainText().
std::string byteText(const Value& value);
/// A number of seconds: "1:05". What is no number as plainText().
std::string durationText(const Value& value);

} // namespace lumora::client
