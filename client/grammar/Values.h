#pragma once

#include "Command.h"

#include <cstdint>

/// \file
/// The values of options and operands, from text.

namespace lumora::client {

/// What is wrong with a value of this kind, as the end of a sentence ("is not a number"); nothing when it is right.
std::optional<std::string> fault(Kind kind, const std::vector<std::string_view>& words, const std::string& text);

std::optional<std::uint64_t> number(std::string_view text);
std::optional<double> seconds(const std::string& text);
std::optional<Date> date(const std::string& text);
/// The key and the value of "KEY=VALUE".
std::optional<std::pair<std::string, std::string>> pair(const std::string& text);

} // namespace lumora::client
