// SPDX-License-Identifier: Apache-2.0
//
// Which bytes of a text are UTF-8 (Unicode 15, table 3-7).
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace probeview {

// What stands for each ill-formed sequence: U+FFFD.
inline constexpr std::string_view replacementCharacter = "\xEF\xBF\xBD";

struct Utf8Step {
  std::size_t length;
  bool valid;
};

// The well-formed sequence at the beginning of the text, which is not empty, or the longest beginning of one.
Utf8Step nextSequence(std::string_view text) noexcept;

// Appends the text with each ill-formed sequence replaced.
void appendValidUtf8(std::string_view text, std::string& out);
bool isValidUtf8(std::string_view text) noexcept;

}  // namespace probeview
