// SPDX-License-Identifier: Apache-2.0
#include "values/plain_text.h"

namespace probeview {

std::optional<std::int64_t> parseInteger64(std::string_view text) {
  if (!text.starts_with("0x") && !text.starts_with("0X")) return parseNumber<std::int64_t>(text, 10);
  const auto bits = parseNumber<std::uint64_t>(text.substr(2), 16);
  return bits ? std::optional(static_cast<std::int64_t>(*bits)) : std::nullopt;
}

std::string hexText(std::int64_t number) {
  std::string digits;
  for (auto rest = static_cast<std::uint64_t>(number); rest != 0 || digits.empty(); rest >>= 4) {
    digits.insert(digits.begin(), "0123456789ABCDEF"[rest & 0xF]);
  }
  return "0x" + digits;
}

std::string_view beginningOf(std::string_view text, std::size_t longest) {
  if (text.size() <= longest) return text;
  const auto continues = [](char character) { return (static_cast<unsigned char>(character) & 0xC0) == 0x80; };
  std::size_t size = longest;
  // A character has at most three bytes after its first.
  for (int back = 0; back < 3 && size > 0 && continues(text[size]); ++back) --size;
  return text.substr(0, continues(text[size]) ? longest : size);
}

std::string onOneLine(std::string_view text) {
  std::string line;
  line.reserve(text.size());
  for (std::size_t index = 0; index < text.size(); ++index) {
    const auto next = index + 1 < text.size() ? static_cast<unsigned char>(text[index + 1]) : 0;
    if (text[index] == '\xC2' && next >= 0x80 && next < 0xA0) {
      line += '?';
      ++index;
    } else {
      line += isControlCharacter(text[index]) ? '?' : text[index];
    }
  }
  return line;
}

}  // namespace probeview
