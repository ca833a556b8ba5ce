// SPDX-License-Identifier: Apache-2.0
#include "values/plain_text.h"

#include <algorithm>

#include "values/printer.h"

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

Utf8Character firstCharacter(std::string_view text) {
  const auto lead = static_cast<unsigned char>(text[0]);
  if (lead < 0x80) return {lead, 1};
  const std::size_t following = lead >= 0xF0 ? 3 : lead >= 0xE0 ? 2 : 1;
  char32_t code = lead & (0x3Fu >> following);
  for (std::size_t index = 1; index <= following; ++index) {
    code = code << 6 | (static_cast<unsigned char>(text[index]) & 0x3Fu);
  }
  return {code, following + 1};
}

void appendOnOneLine(std::string_view text, std::string& out) {
  // Most texts are plain.
  const auto isPlain = [](char character) { return character >= 0x20 && character < 0x7F; };
  if (std::ranges::all_of(text, isPlain)) {
    out += text;
    return;
  }
  std::string valid;
  appendValidUtf8(text, valid);
  for (std::string_view rest = valid; !rest.empty();) {
    const auto [code, size] = firstCharacter(rest);
    if (!isSteering(code)) {
      out += rest.substr(0, size);
    } else if (code < 0x80) {
      // Without the quotation marks.
      const std::string quoted = printed(Value::text(rest.substr(0, size)));
      out.append(quoted, 1, quoted.size() - 2);
    } else {
      char digits[8];
      out += "\\u{";
      out.append(digits, std::to_chars(digits, digits + sizeof digits, static_cast<std::uint32_t>(code), 16).ptr);
      out += '}';
    }
    rest.remove_prefix(size);
  }
}

std::string onOneLine(std::string_view text) {
  std::string line;
  appendOnOneLine(text, line);
  return line;
}

std::string quotedExcerpt(std::string_view text, std::size_t longest) {
  std::string out = onOneLine(printed(Value::text(text.substr(0, longest))));
  if (text.size() > longest) out += "…";
  return out;
}

}  // namespace probeview
