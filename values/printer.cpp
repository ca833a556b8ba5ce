// SPDX-License-Identifier: Apache-2.0
#include "values/printer.h"

#include <charconv>
#include <cmath>
#include <cstdint>

namespace probeview {

namespace {

constexpr std::string_view replacementCharacter = "\xEF\xBF\xBD";

template <typename Real>
void printReal(Real number, std::string& out) {
  // No radio quantity is infinite; should one ever be, it must not print as a plausible number.
  if (!std::isfinite(number)) {
    out += std::isnan(number) ? "nan" : number < 0 ? "-inf" : "inf";
    return;
  }
  // The largest double has 309 digits before the point, the smallest 1074 after it.
  char digits[1100];
  const auto [end, error] = std::to_chars(digits, digits + sizeof digits, number, std::chars_format::fixed);
  const std::string_view text(digits, static_cast<std::size_t>(end - digits));
  out += text;
  if (text.find('.') == std::string_view::npos) out += ".0";
}

template <typename Integer>
void printInteger(Integer number, std::string& out) {
  char digits[24];
  const auto [end, error] = std::to_chars(digits, digits + sizeof digits, number);
  out.append(digits, end);
}

struct Utf8Step {
  std::size_t length;
  bool valid;
};

// The well-formed sequence at the beginning of the text, or the longest beginning of one (Unicode 15, table 3-7).
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

bool isPlainAscii(std::string_view text) noexcept {
  unsigned char all = 0;
  for (const char character : text) all = static_cast<unsigned char>(all | static_cast<unsigned char>(character));
  return all < 0x80;
}

bool needsEscape(char character) noexcept {
  const auto code = static_cast<unsigned char>(character);
  return code < 32 || code == 127 || code >= 0x80 || character == '"' || character == '\\';
}

void appendEscaped(char character, std::string& out) {
  switch (character) {
    case '\\':
      out += "\\\\";
      return;
    case '"':
      out += "\\\"";
      return;
    case '\n':
      out += "\\n";
      return;
    case '\r':
      out += "\\r";
      return;
    case '\t':
      out += "\\t";
      return;
    case '\0':
      out += "\\0";
      return;
    default:
      break;
  }
  out += "\\u{";
  char digits[4];
  const auto [end, error] = std::to_chars(digits, digits + sizeof digits, static_cast<unsigned>(character), 16);
  out.append(digits, end);
  out += '}';
}

void appendQuoted(std::string_view text, std::string& out) {
  out += '"';
  std::size_t begin = 0;
  for (std::size_t index = 0; index < text.size();) {
    if (!needsEscape(text[index])) {
      ++index;
      continue;
    }
    out.append(text, begin, index - begin);
    if (static_cast<unsigned char>(text[index]) >= 0x80) {
      const Utf8Step step = nextSequence(text.substr(index));
      out += step.valid ? text.substr(index, step.length) : replacementCharacter;
      index += step.length;
    } else {
      appendEscaped(text[index], out);
      ++index;
    }
    begin = index;
  }
  out.append(text, begin);
  out += '"';
}

}  // namespace

void printNumber(double number, std::string& out) { printReal(number, out); }
void printNumber(float number, std::string& out) { printReal(number, out); }
void printNumber(std::int64_t number, std::string& out) { printInteger(number, out); }
void printNumber(std::uint64_t number, std::string& out) { printInteger(number, out); }

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

void appendHex(std::string_view bytes, std::string& out) {
  constexpr std::string_view digits = "0123456789abcdef";
  for (const char character : bytes) {
    const auto byte = static_cast<unsigned char>(character);
    out += digits[byte >> 4];
    out += digits[byte & 15];
  }
}

void print(const Value& value, std::string& out) {
  switch (value.kind()) {
    case ValueKind::Int32:
      return printInteger(value.rawInt32(), out);
    case ValueKind::UInt32:
      return printInteger(value.rawUInt32(), out);
    case ValueKind::Int64:
      return printInteger(value.rawInt64(), out);
    case ValueKind::UInt64:
      return printInteger(value.rawUInt64(), out);
    case ValueKind::Bool:
      out += value.rawBool() ? '1' : '0';
      return;
    case ValueKind::Float:
      return printReal(value.rawFloat(), out);
    case ValueKind::Double:
      return printReal(value.rawDouble(), out);
    case ValueKind::Text:
      return appendQuoted(value.rawText(), out);
    case ValueKind::Bytes:
      out += '<';
      appendHex(value.rawText(), out);
      out += '>';
      return;
    case ValueKind::List:
      return print(*value.list(), out);
    case ValueKind::Dictionary:
      return print(*value.dictionary(), out);
  }
}

void print(const List& list, std::string& out) {
  out += '[';
  bool first = true;
  for (const Value& value : list) {
    if (!first) out += ", ";
    first = false;
    print(value, out);
  }
  out += ']';
}

void print(const Dictionary& dictionary, std::string& out) {
  out += '[';
  bool first = true;
  for (const Dictionary::Entry& entry : dictionary) {
    if (!first) out += ", ";
    first = false;
    appendQuoted(entry.key.text(), out);
    out += ": ";
    print(entry.value, out);
  }
  out += ']';
}

std::string printed(const Value& value) {
  std::string out;
  print(value, out);
  return out;
}

std::string printed(const List& list) {
  std::string out;
  print(list, out);
  return out;
}

std::string printed(const Dictionary& dictionary) {
  std::string out;
  print(dictionary, out);
  return out;
}

std::string bareText(const Value& value) {
  std::string out;
  if (value.kind() == ValueKind::Text) {
    appendValidUtf8(value.rawText(), out);
  } else {
    print(value, out);
  }
  return out;
}

}  // namespace probeview
