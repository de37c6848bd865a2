#include "NearestWord.h"

#include <algorithm>

namespace lumora::client {

namespace {

constexpr std::size_t longestWord = 64;

// The restricted edit distance with swaps of neighbours.
std::size_t distance(std::string_view from, std::string_view to) {
  std::vector<std::vector<std::size_t>> table(from.size() + 1, std::vector<std::size_t>(to.size() + 1));
  for (std::size_t i = 0; i <= from.size(); ++i) {
    for (std::size_t j = 0; j <= to.size(); ++j) {
      if (i == 0 || j == 0) {
        table[i][j] = i + j;
        continue;
      }
      const std::size_t change = from[i - 1] == to[j - 1] ? 0 : 1;
      table[i][j] = std::min({table[i - 1][j] + 1, table[i][j - 1] + 1, table[i - 1][j - 1] + change});
      if (i > 1 && j > 1 && from[i - 1] == to[j - 2] && from[i - 2] == to[j - 1]) {
        table[i][j] = std::min(table[i][j], table[i - 2][j - 2] + 1);
      }
    }
  }
  return table[from.size()][to.size()];
}

} // namespace

std::string nearestWord(std::string_view word, const std::vector<std::string_view>& candidates) {
  if (word.size() > longestWord) {
    return {};
  }
  std::string_view best;
  // Half of a short word is another word.
  std::size_t least = std::max<std::size_t>(word.size() / 3, 1) + 1;
  for (const auto candidate : candidates) {
    if (const auto changes = distance(word, candidate); changes < least) {
      least = changes;
      best = candidate;
    }
  }
  return std::string(best);
}

std::string nearestHint(std::string_view word, const std::vector<std::string_view>& candidates) {
  const auto nearest = nearestWord(word, candidates);
  return nearest.empty() ? "" : "; the nearest is \"" + nearest + "\"";
}

} // namespace lumora::client
