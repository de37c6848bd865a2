#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace lumora::client {

/// The candidate that was most probably meant: the one with the fewest letters added, lost, changed or swapped. Empty
/// when none is near.
std::string nearestWord(std::string_view word, const std::vector<std::string_view>& candidates);

/// "; the nearest is "start"" or nothing, for the end of a sentence.
std::string nearestHint(std::string_view word, const std::vector<std::string_view>& candidates);

} // namespace lumora::client
