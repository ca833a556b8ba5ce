// SPDX-License-Identifier: Apache-2.0
//
// Numbers and names as they stand on command lines, in files and in messages for people. Independent of the process's
// locale.
#pragma once

#include <charconv>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>

namespace probeview {

// The whole text as one number, in the form that std::from_chars takes; absent when it is anything else.
template <typename Number, typename... Format>
std::optional<Number> parseNumber(std::string_view text, Format... format) {
  Number number{};
  const char* const end = text.data() + text.size();
  const auto [stop, error] = std::from_chars(text.data(), end, number, format...);
  if (error != std::errc() || stop != end) return std::nullopt;
  return number;
}

// A 64-bit number: decimal with an optional minus, or 0x with up to 64 bits, where the topmost is the sign.
std::optional<std::int64_t> parseInteger64(std::string_view text);

// "0x7F0013"; a negative number as its two's complement. parseInteger64() reads it back.
std::string hexText(std::int64_t number);

// The first bytes of a text, at most so many; of UTF-8 no character is cut in two.
std::string_view beginningOf(std::string_view text, std::size_t longest);

// A text that came from elsewhere (a peer, a file, a phone) as it may stand in a line for people: whatever goes to a
// terminal or a log goes through here. What would end the line, steer a terminal or turn the direction of writing
// stands as its escape, as in printed values ("\n", "\u{1b}", "\u{9b}"); an ill-formed sequence is U+FFFD; all else
// stays as it is. To do it twice changes nothing more.
std::string onOneLine(std::string_view text);
void appendOnOneLine(std::string_view text, std::string& out);

// A piece of such a text as it may stand in an error: quoted, and cut behind so many bytes.
std::string quotedExcerpt(std::string_view text, std::size_t longest = 60);

// The character at the beginning of well-formed UTF-8, which is not empty, and the bytes that it takes.
struct Utf8Character {
  char32_t code;
  std::size_t size;
};
Utf8Character firstCharacter(std::string_view text);

// Whether a character would end a line, steer a terminal or turn the direction of writing: U+0000 to U+001F, U+007F to
// U+009F, U+2028 to U+202E, U+2066 to U+2069.
constexpr bool isSteering(char32_t code) {
  return code < 0x20 || (code >= 0x7F && code < 0xA0) || (code >= 0x2028 && code <= 0x202E) ||
         (code >= 0x2066 && code <= 0x2069);
}

}  // namespace probeview
