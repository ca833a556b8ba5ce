// SPDX-License-Identifier: Apache-2.0
#include "values/printer.h"

#include <charconv>
#include <cstdint>
#include <cstring>

#include "values/digits.h"
#include "values/text_writer.h"
#include "values/utf8.h"

namespace probeview {

namespace {

// What writes here writes at a position, and returns the one behind what it wrote.

constexpr std::string_view separator = ", ";
static_assert(separator.size() <= TextWriter::spare);
static_assert(Key::longestFramed <= TextWriter::longestShort);

[[gnu::always_inline]] inline char* append(char* to, char character) {
  *to = character;
  return to + 1;
}

// A text whose size the compiler knows.
[[gnu::always_inline]] inline char* append(char* to, std::string_view text) {
  std::memcpy(to, text.data(), text.size());
  return to + text.size();
}

bool needsEscape(char character) noexcept {
  const auto code = static_cast<unsigned char>(character);
  return code < 32 || code == 127 || code >= 0x80 || character == '"' || character == '\\';
}

// Whether one of eight characters may need an escape; a false alarm is allowed, a miss is not. Each term sets the top
// bit of a byte that is below 32, above 126, a quotation mark or a backslash.
bool mayNeedEscape(std::uint64_t eight) noexcept {
  constexpr std::uint64_t ones = 0x0101010101010101;
  constexpr std::uint64_t tops = 0x8080808080808080;
  const auto zeroBytes = [](std::uint64_t bytes) { return (bytes - ones) & ~bytes; };
  return ((eight | (eight - ones * 32) | (eight + ones) | zeroBytes(eight ^ ones * '"') |
           zeroBytes(eight ^ ones * '\\')) &
          tops) != 0;
}

// Where the first character that needs an escape stands, at or after the index; the text's size when there is none.
std::size_t findEscape(std::string_view text, std::size_t index) noexcept {
  const auto mayNeedEscapeAt = [text](std::size_t begin) {
    std::uint64_t eight;
    std::memcpy(&eight, text.data() + begin, sizeof eight);
    return mayNeedEscape(eight);
  };
  for (; index + 8 <= text.size(); index += 8) {
    if (mayNeedEscapeAt(index)) break;
  }
  // The rest together with what was already looked at.
  if (index + 8 > text.size() && text.size() >= 8 && !mayNeedEscapeAt(text.size() - 8)) return text.size();
  while (index < text.size() && !needsEscape(text[index])) ++index;
  return index;
}

constexpr std::size_t longestEscape = 6;

char* putEscape(char* to, char character) {
  switch (character) {
    case '\\':
      return append(to, "\\\\");
    case '"':
      return append(to, "\\\"");
    case '\n':
      return append(to, "\\n");
    case '\r':
      return append(to, "\\r");
    case '\t':
      return append(to, "\\t");
    case '\0':
      return append(to, "\\0");
    default:
      break;
  }
  to = append(to, "\\u{");
  to = std::to_chars(to, to + 2, static_cast<unsigned>(character), 16).ptr;
  return append(to, '}');
}

// What most values take; a value that may take more asks for room itself.
constexpr std::size_t roomForValue = TextWriter::longestShort + 2;
static_assert(roomForInteger <= roomForValue);

// A text that needs no escape.
[[gnu::always_inline]] inline char* putUnescaped(char* to, std::string_view text, TextWriter& out) {
  return append(out.room<1>(out.putShort(append(to, '"'), text)), '"');
}

[[gnu::noinline]] char* putQuoted(char* to, std::string_view text, TextWriter& out) {
  std::size_t begin = 0;
  std::size_t index = findEscape(text, 0);
  if (index == text.size()) return putUnescaped(to, text, out);
  to = append(to, '"');
  while (index < text.size()) {
    to = out.room<longestEscape>(out.put(to, text.substr(begin, index - begin)));
    if (static_cast<unsigned char>(text[index]) >= 0x80) {
      const Utf8Step step = nextSequence(text.substr(index));
      to = out.put(to, step.valid ? text.substr(index, step.length) : replacementCharacter);
      index += step.length;
    } else {
      to = putEscape(to, text[index]);
      ++index;
    }
    begin = index;
    index = findEscape(text, index);
  }
  return append(out.room<1>(out.put(to, text.substr(begin))), '"');
}

char* putHex(char* to, std::string_view bytes, TextWriter& out) {
  constexpr std::size_t piece = 256;
  while (bytes.size() > piece) {
    to = writeHex(out.room<2 * piece>(to), bytes.substr(0, piece));
    bytes.remove_prefix(piece);
  }
  return writeHex(out.room<2 * piece>(to), bytes);
}

char* put(char* to, const List& list, TextWriter& out);
char* put(char* to, const Dictionary& dictionary, TextWriter& out);

// There is roomForValue.
[[gnu::always_inline]] inline char* putInPlace(char* to, const Value& value, TextWriter& out) {
  // What most values are.
  if (value.kind() == ValueKind::UInt32) return writeInteger(to, value.rawUInt32());
  switch (value.kind()) {
    case ValueKind::Int32:
      return writeInteger(to, value.rawInt32());
    case ValueKind::UInt32:
      return writeInteger(to, value.rawUInt32());
    case ValueKind::Int64:
      return writeInteger(to, value.rawInt64());
    case ValueKind::UInt64:
      return writeInteger(to, value.rawUInt64());
    case ValueKind::Bool:
      return append(to, value.rawBool() ? '1' : '0');
    case ValueKind::Float:
      return writeReal(out.room<roomForReal>(to), value.rawFloat());
    case ValueKind::Double:
      return writeReal(out.room<roomForReal>(to), value.rawDouble());
    case ValueKind::Text:
      return value.isIdentifier() ? putUnescaped(to, value.rawText(), out) : putQuoted(to, value.rawText(), out);
    case ValueKind::Bytes:
      return append(out.room<1>(putHex(append(to, '<'), value.rawText(), out)), '>');
    case ValueKind::List:
      return put(to, *value.list(), out);
    case ValueKind::Dictionary:
      return put(to, *value.dictionary(), out);
  }
  return to;
}

char* put(char* to, const Value& value, TextWriter& out) { return putInPlace(out.room<roomForValue>(to), value, out); }

// The last element has a separator behind it, like all others.
char* putEnd(char* to, bool isEmpty, TextWriter& out) {
  return append(out.room<1>(isEmpty ? to : to - separator.size()), ']');
}

char* put(char* to, const List& list, TextWriter& out) {
  to = append(out.room<1>(to), '[');
  for (const Value& value : list) {
    to = append(putInPlace(out.room<roomForValue>(to), value, out), separator);
  }
  return putEnd(to, list.empty(), out);
}

char* put(char* to, const Dictionary& dictionary, TextWriter& out) {
  to = append(out.room<1>(to), '[');
  for (const Dictionary::Entry& entry : dictionary) {
    // Asked for once: what most entries take.
    to = out.room<Key::longestFramed + roomForValue>(to);
    if (entry.key.isFramed()) [[likely]] {
      std::memcpy(to, entry.key.framedText().data(), Key::longestFramed);
      to += entry.key.framedText().size();
    } else {
      to = out.room<roomForValue>(append(putQuoted(to, entry.key.text(), out), ": "));
    }
    to = append(putInPlace(to, entry.value, out), separator);
  }
  return putEnd(to, dictionary.empty(), out);
}

template <typename Content>
void printTo(const Content& content, std::string& out) {
  TextWriter writer(out);
  writer.end(put(writer.begin(), content, writer));
}

template <typename Integer>
void printInteger(Integer number, std::string& out) {
  char digits[roomForInteger];
  out.append(digits, writeInteger(digits, number));
}

template <typename Real>
void printReal(Real number, std::string& out) {
  char digits[roomForReal];
  out.append(digits, writeReal(digits, number));
}

}  // namespace

void printNumber(double number, std::string& out) { printReal(number, out); }
void printNumber(float number, std::string& out) { printReal(number, out); }
void printNumber(std::int64_t number, std::string& out) { printInteger(number, out); }
void printNumber(std::uint64_t number, std::string& out) { printInteger(number, out); }

void appendHex(std::string_view bytes, std::string& out) {
  TextWriter writer(out);
  writer.end(putHex(writer.begin(), bytes, writer));
}

void print(const Value& value, std::string& out) { printTo(value, out); }
void print(const List& list, std::string& out) { printTo(list, out); }
void print(const Dictionary& dictionary, std::string& out) { printTo(dictionary, out); }

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
