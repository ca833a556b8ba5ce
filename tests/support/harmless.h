// SPDX-License-Identifier: Apache-2.0
//
// Texts that try to steer the terminal which shows them, and the question whether one could.
#pragma once

#include <string>
#include <string_view>

#include "values/printer.h"

namespace probeview {

// Whether the text is UTF-8 without anything that ends a line, steers a terminal or turns the direction of writing.
// Looks at the bytes by itself, as the function that it tests does not.
inline bool isHarmless(std::string_view text) {
  for (std::size_t index = 0; index < text.size(); ++index) {
    const auto byte = [&](std::size_t ahead) {
      return index + ahead < text.size() ? static_cast<unsigned char>(text[index + ahead]) : 0u;
    };
    if (byte(0) < 0x20 || byte(0) == 0x7F) return false;
    if (byte(0) == 0xC2 && byte(1) >= 0x80 && byte(1) <= 0x9F) return false;
    if (byte(0) == 0xE2 && byte(1) == 0x80 && byte(2) >= 0xA8 && byte(2) <= 0xAE) return false;
    if (byte(0) == 0xE2 && byte(1) == 0x81 && byte(2) >= 0xA6 && byte(2) <= 0xA9) return false;
  }
  return isValidUtf8(text);
}

// The same of each of several lines.
inline bool areHarmless(std::string_view lines) {
  while (!lines.empty()) {
    const std::size_t end = lines.find('\n');
    if (!isHarmless(lines.substr(0, end))) return false;
    if (end == std::string_view::npos) return true;
    lines.remove_prefix(end + 1);
  }
  return true;
}

// Clears a screen, sets a title, overwrites a line, ends one, and holds every byte there is.
inline std::string hostileText() {
  std::string text = "\x1b[2J\x1b]0;title\x07 over\rwritten\nradixd: ready\u009b31m\u202egnp.exe\u2028";
  for (int byte = 0; byte < 256; ++byte) text += static_cast<char>(byte);
  return text;
}

}  // namespace probeview
