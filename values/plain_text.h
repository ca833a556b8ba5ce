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

// Whether the character would end a line or steer a terminal: 0 to 31 and 127.
constexpr bool isControlCharacter(char character) {
  const auto code = static_cast<unsigned char>(character);
  return code < 32 || code == 127;
}

// The first bytes of a text, at most so many; of UTF-8 no character is cut in two.
std::string_view beginningOf(std::string_view text, std::size_t longest);

// A text that came from elsewhere, as it may stand in a line for people: "?" in place of each control character, those
// of U+0080 to U+009F included.
std::string onOneLine(std::string_view text);

}  // namespace probeview
