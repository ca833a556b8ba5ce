// SPDX-License-Identifier: Apache-2.0
#include "values/near_matches.h"

#include <algorithm>

namespace probeview {

namespace {

constexpr std::size_t mostMatches = 3;
constexpr std::size_t longestWord = 64;

char lowered(char character) {
  return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a') : character;
}

}  // namespace

std::size_t editDistance(std::string_view left, std::string_view right) {
  // Row by row of the table of distances between the beginnings of both; an exchange looks two rows back.
  std::vector<std::size_t> beforeLast(right.size() + 1);
  std::vector<std::size_t> last(right.size() + 1);
  std::vector<std::size_t> row(right.size() + 1);
  for (std::size_t column = 0; column <= right.size(); ++column) row[column] = column;
  for (std::size_t line = 1; line <= left.size(); ++line) {
    beforeLast.swap(last);
    last.swap(row);
    row[0] = line;
    for (std::size_t column = 1; column <= right.size(); ++column) {
      const char here = lowered(left[line - 1]);
      const char there = lowered(right[column - 1]);
      row[column] = std::min({last[column] + 1, row[column - 1] + 1, last[column - 1] + (here == there ? 0u : 1u)});
      const bool areExchanged =
          line > 1 && column > 1 && here == lowered(right[column - 2]) && there == lowered(left[line - 2]);
      if (areExchanged) row[column] = std::min(row[column], beforeLast[column - 2] + 1);
    }
  }
  return row[right.size()];
}

std::vector<std::string_view> nearMatches(std::string_view word, std::span<const std::string_view> names) {
  if (word.empty() || word.size() > longestWord) return {};
  // Nearer names take the place of those before.
  std::size_t nearest = std::clamp<std::size_t>(word.size() / 3, 1, 4);
  std::vector<std::string_view> matches;
  for (const std::string_view name : names) {
    const std::size_t distance = editDistance(word, name);
    if (distance > nearest) continue;
    if (distance < nearest) matches.clear();
    nearest = distance;
    if (matches.size() < mostMatches) matches.push_back(name);
  }
  return matches;
}

std::string didYouMean(std::string_view word, std::span<const std::string_view> names) {
  const std::vector<std::string_view> matches = nearMatches(word, names);
  std::string text;
  for (std::size_t index = 0; index < matches.size(); ++index) {
    text += index == 0 ? "; did you mean " : index + 1 == matches.size() ? " or " : ", ";
    text += matches[index];
  }
  return text.empty() ? text : text + "?";
}

}  // namespace probeview
