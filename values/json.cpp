// SPDX-License-Identifier: Apache-2.0
#include "values/json.h"

#include <cmath>

#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

namespace {

void appendEscape(char32_t code, std::string& out) {
  const char bytes[] = {static_cast<char>(code >> 8), static_cast<char>(code & 0xFF)};
  out += "\\u";
  appendHex({bytes, sizeof bytes}, out);
}

}  // namespace

void appendJsonString(std::string_view text, std::string& out) {
  std::string valid;
  if (!isValidUtf8(text)) {
    appendValidUtf8(text, valid);
    text = valid;
  }
  out += '"';
  for (std::size_t index = 0; index < text.size(); ++index) {
    const char character = text[index];
    const auto byte = static_cast<unsigned char>(character);
    switch (character) {
      case '"':
        out += "\\\"";
        break;
      case '\\':
        out += "\\\\";
        break;
      case '\n':
        out += "\\n";
        break;
      case '\r':
        out += "\\r";
        break;
      case '\t':
        out += "\\t";
        break;
      default:
        // The first bytes of the characters that steer; the value is the same with the escape.
        if (byte < 32 || byte == 127 || byte == 0xC2 || byte == 0xE2) {
          const auto [code, size] = firstCharacter(text.substr(index));
          if (isSteering(code)) {
            appendEscape(code, out);
          } else {
            out += text.substr(index, size);
          }
          index += size - 1;
        } else {
          out += character;
        }
    }
  }
  out += '"';
}

void appendJson(const Value& value, std::string& out) {
  switch (value.kind()) {
    case ValueKind::Int32:
    case ValueKind::UInt32:
    case ValueKind::Int64:
    case ValueKind::UInt64:
      return print(value, out);
    case ValueKind::Bool:
      out += value.rawBool() ? "true" : "false";
      return;
    case ValueKind::Float:
    case ValueKind::Double:
      if (std::isfinite(*value.real())) return print(value, out);
      out += "null";
      return;
    case ValueKind::Text:
      if (isValidUtf8(value.rawText())) return appendJsonString(value.rawText(), out);
      out += "{\"text\":\"";
      appendHex(value.rawText(), out);
      out += "\"}";
      return;
    case ValueKind::Bytes:
      out += "{\"bytes\":\"";
      appendHex(value.rawText(), out);
      out += "\"}";
      return;
    case ValueKind::List:
      return appendJson(*value.list(), out);
    case ValueKind::Dictionary:
      return appendJson(*value.dictionary(), out);
  }
}

void appendJson(const List& list, std::string& out) {
  out += '[';
  bool first = true;
  for (const Value& value : list) {
    if (!first) out += ',';
    first = false;
    appendJson(value, out);
  }
  out += ']';
}

void appendJson(const Dictionary& dictionary, std::string& out) {
  out += '{';
  bool first = true;
  for (const Dictionary::Entry& entry : dictionary) {
    if (!first) out += ',';
    first = false;
    appendJsonString(entry.key.text(), out);
    out += ':';
    appendJson(entry.value, out);
  }
  out += '}';
}

}  // namespace probeview
