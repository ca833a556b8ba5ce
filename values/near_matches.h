// SPDX-License-Identifier: Apache-2.0
//
// What somebody may have meant who wrote a name that nobody knows.
#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace probeview {

// The fewest characters that must be put in, taken out, replaced or exchanged with their neighbour to make one text of
// the other; upper and lower case of ASCII are the same.
std::size_t editDistance(std::string_view left, std::string_view right);

// The names that are nearest to the word, at most three, in their order: none where more of the word's characters are
// wrong than a third, or than four, and none for a word longer than any name. The views are those of the names.
std::vector<std::string_view> nearMatches(std::string_view word, std::span<const std::string_view> names);

// "; did you mean watch?" or "; did you mean K_LTE_RRC_STATE or K_UMTS_RRC_STATE?", to end a message with; empty when
// nothing is near.
std::string didYouMean(std::string_view word, std::span<const std::string_view> names);

}  // namespace probeview
