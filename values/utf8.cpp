// SPDX-License-Identifier: Apache-2.0
#include "values/utf8.h"

namespace probeview {

namespace {

bool isPlainAscii(std::string_view text) noexcept {
  unsigned char all = 0;
  for (const char character : text) all = static_cast<unsigned char>(all | static_cast<unsigned char>(character));
  return all < 0x80;
}

}  // namespace

Utf8Step nextSequence(std::string_view text) noexcept {
  const auto byte = [text](std::size_t index) { return static_cast<unsigned char>(text[index]); };
  const unsigned char lead = byte(0);
  if (lead < 0x80) return {1, true};
  std::size_t length = 0;
  unsigned char low = 0x80;
  unsigned char high = 0xBF;
  if (lead >= 0xC2 && lead <= 0xDF) {
    length = 2;
  } else if (lead >= 0xE0 && lead <= 0xEF) {
    length = 3;
    if (lead == 0xE0) low = 0xA0;
    if (lead == 0xED) high = 0x9F;
  } else if (lead >= 0xF0 && lead <= 0xF4) {
    length = 4;
    if (lead == 0xF0) low = 0x90;
    if (lead == 0xF4) high = 0x8F;
  } else {
    return {1, false};
  }
  for (std::size_t index = 1; index < length; ++index) {
    if (index >= text.size() || byte(index) < low || byte(index) > high) return {index, false};
    low = 0x80;
    high = 0xBF;
  }
  return {length, true};
}

void appendValidUtf8(std::string_view text, std::string& out) {
  if (isPlainAscii(text)) {
    out += text;
    return;
  }
  while (!text.empty()) {
    const Utf8Step step = nextSequence(text);
    out += step.valid ? text.substr(0, step.length) : replacementCharacter;
    text.remove_prefix(step.length);
  }
}

bool isValidUtf8(std::string_view text) noexcept {
  if (isPlainAscii(text)) return true;
  while (!text.empty()) {
    const Utf8Step step = nextSequence(text);
    if (!step.valid) return false;
    text.remove_prefix(step.length);
  }
  return true;
}

}  // namespace probeview
