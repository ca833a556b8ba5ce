// SPDX-License-Identifier: Apache-2.0
#include "values/printer.h"

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <utility>

namespace probeview {

namespace {

constexpr std::string_view replacementCharacter = "\xEF\xBF\xBD";

// Writes to the end of a text through a plain pointer, which is what makes printing fast. While the writer lives the
// text is longer than what was written; the writer cuts it to its length when it ends.
class Writer {
 public:
  explicit Writer(std::string& out) : out_(out) { seat(out.size(), 256); }
  ~Writer() { out_.resize(static_cast<std::size_t>(position_ - out_.data())); }
  Writer(const Writer&) = delete;
  Writer& operator=(const Writer&) = delete;

  // Room for that many characters more; advanceTo() says how many were used.
  [[gnu::always_inline]] char* room(std::size_t count) {
    if (static_cast<std::size_t>(limit_ - position_) < count) [[unlikely]]
      grow(count);
    return position_;
  }
  void advanceTo(char* position) { position_ = position; }

  void put(char character) { advanceTo(append(room(1), character)); }
  void put(std::string_view text) { advanceTo(append(room(text.size()), text)); }

  static char* append(char* to, char character) {
    *to = character;
    return to + 1;
  }
  static char* append(char* to, std::string_view text) {
    if (!text.empty()) std::memcpy(to, text.data(), text.size());
    return to + text.size();
  }
  // The same for keys, names and digits, most of which are short: copied as two pieces that overlap, without a call.
  static char* appendShort(char* to, std::string_view text) {
    const std::size_t size = text.size();
    if (size - 8 <= 8) {
      copyBothEnds<8>(to, text);
    } else if (size - 16 <= 16) {
      copyBothEnds<16>(to, text);
    } else if (size - 32 <= 32) {
      copyBothEnds<32>(to, text);
    } else if (size - 4 <= 4) {
      copyBothEnds<4>(to, text);
    } else {
      return append(to, text);
    }
    return to + size;
  }

 private:
  template <std::size_t Piece>
  static void copyBothEnds(char* to, std::string_view text) {
    std::memcpy(to, text.data(), Piece);
    std::memcpy(to + text.size() - Piece, text.data() + text.size() - Piece, Piece);
  }
  [[gnu::noinline]] void grow(std::size_t count) {
    const auto used = static_cast<std::size_t>(position_ - out_.data());
    seat(used, std::max(count, used) + 256);
  }
  void seat(std::size_t used, std::size_t more) {
    out_.resize(used + more);
    position_ = out_.data() + used;
    limit_ = out_.data() + out_.size();
  }

  std::string& out_;
  char* position_ = nullptr;
  char* limit_ = nullptr;
};

template <typename Real>
void printReal(Real number, Writer& out) {
  // No radio quantity is infinite; should one ever be, it must not print as a plausible number.
  if (!std::isfinite(number)) {
    out.put(std::string_view(std::isnan(number) ? "nan" : number < 0 ? "-inf" : "inf"));
    return;
  }
  // The largest double has 309 digits before the point, the smallest 1074 after it.
  constexpr std::size_t longest = 1100;
  char* const begin = out.room(longest);
  char* end = std::to_chars(begin, begin + longest, number, std::chars_format::fixed).ptr;
  if (std::find(begin, end, '.') == end) end = Writer::append(end, ".0");
  out.advanceTo(end);
}

// "00" to "99", one after the other.
constexpr auto digitPairs = [] {
  std::array<char, 200> pairs{};
  for (std::size_t number = 0; number < 100; ++number) {
    pairs[2 * number] = static_cast<char>('0' + number / 10);
    pairs[2 * number + 1] = static_cast<char>('0' + number % 10);
  }
  return pairs;
}();

constexpr std::size_t longestInteger = 20;

inline void writePair(char* to, std::uint32_t below100) { std::memcpy(to, digitPairs.data() + 2 * below100, 2); }

constexpr std::array<std::uint32_t, 10> powersOfTen = {1,       10,        100,        1'000,       10'000,
                                                       100'000, 1'000'000, 10'000'000, 100'000'000, 1'000'000'000};

// How many decimal digits the number has, which is not 0.
inline std::size_t digitCount(std::uint32_t number) {
  // 1233 / 4096 is the logarithm of 2, so this is one too few or just right.
  const auto estimate = static_cast<std::uint32_t>(std::bit_width(number)) * 1233 / 4096;
  return estimate + (number >= powersOfTen[estimate] ? 1 : 0);
}

inline char* writeInteger(char* to, std::uint32_t number) {
  if (number < 10) {
    *to = static_cast<char>('0' + number);
    return to + 1;
  }
  char* const end = to + (number < 100 ? 2 : digitCount(number));
  for (char* position = end - 2; number >= 100; position -= 2) {
    writePair(position, number % 100);
    number /= 100;
  }
  if (number >= 10) {
    writePair(to, number);
  } else {
    *to = static_cast<char>('0' + number);
  }
  return end;
}

// What is longer, a time most often, is written in parts of eight digits: to divide 32 bits is cheaper.
[[gnu::noinline]] char* writeLongInteger(char* to, std::uint64_t number) {
  constexpr std::uint64_t part = 100'000'000;
  if (number <= UINT32_MAX) return writeInteger(to, static_cast<std::uint32_t>(number));
  to = writeLongInteger(to, number / part);
  const auto eight = static_cast<std::uint32_t>(number % part);
  const std::uint32_t upper = eight / 10000;
  const std::uint32_t lower = eight % 10000;
  writePair(to, upper / 100);
  writePair(to + 2, upper % 100);
  writePair(to + 4, lower / 100);
  writePair(to + 6, lower % 100);
  return to + 8;
}

// Twenty characters must be free.
inline char* writeInteger(char* to, std::uint64_t number) {
  return number <= UINT32_MAX ? writeInteger(to, static_cast<std::uint32_t>(number)) : writeLongInteger(to, number);
}

inline char* writeInteger(char* to, std::int64_t number) {
  if (number >= 0) return writeInteger(to, static_cast<std::uint64_t>(number));
  *to = '-';
  // Negated as an unsigned number, so that the least one has its magnitude too.
  return writeInteger(to + 1, 0 - static_cast<std::uint64_t>(number));
}

template <typename Integer>
inline void printInteger(Integer number, Writer& out) {
  out.advanceTo(writeInteger(out.room(longestInteger + 1), number));
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

void putEscaped(char character, Writer& out) {
  switch (character) {
    case '\\':
      return out.put(std::string_view("\\\\"));
    case '"':
      return out.put(std::string_view("\\\""));
    case '\n':
      return out.put(std::string_view("\\n"));
    case '\r':
      return out.put(std::string_view("\\r"));
    case '\t':
      return out.put(std::string_view("\\t"));
    case '\0':
      return out.put(std::string_view("\\0"));
    default:
      break;
  }
  char* const begin = Writer::append(out.room(8), "\\u{");
  char* const end = std::to_chars(begin, begin + 2, static_cast<unsigned>(character), 16).ptr;
  out.advanceTo(Writer::append(end, '}'));
}

// A text that needs no escape.
inline void putUnescaped(std::string_view text, Writer& out) {
  char* to = Writer::append(out.room(text.size() + 2), '"');
  out.advanceTo(Writer::append(Writer::appendShort(to, text), '"'));
}

void putQuoted(std::string_view text, Writer& out) {
  std::size_t begin = 0;
  std::size_t index = findEscape(text, 0);
  if (index == text.size()) return putUnescaped(text, out);
  out.put('"');
  while (index < text.size()) {
    out.put(text.substr(begin, index - begin));
    if (static_cast<unsigned char>(text[index]) >= 0x80) {
      const Utf8Step step = nextSequence(text.substr(index));
      out.put(step.valid ? text.substr(index, step.length) : replacementCharacter);
      index += step.length;
    } else {
      putEscaped(text[index], out);
      ++index;
    }
    begin = index;
    index = findEscape(text, index);
  }
  out.put(text.substr(begin));
  out.put('"');
}

// Sixteen bytes at once: the compilers make one vector instruction of each operation, or several where there is none.
using Bytes = std::uint8_t __attribute__((vector_size(16)));

// The hexadecimal digits of numbers below 16.
inline Bytes hexDigits(Bytes numbers) {
  constexpr std::uint8_t fromTenOn = 'a' - '0' - 10;
  return numbers + '0' + (reinterpret_cast<Bytes>(numbers > 9) & fromTenOn);
}

void putHex(std::string_view bytes, Writer& out) {
  char* to = out.room(2 * bytes.size());
  for (; bytes.size() >= sizeof(Bytes); bytes.remove_prefix(sizeof(Bytes))) {
    Bytes sixteen;
    std::memcpy(&sixteen, bytes.data(), sizeof sixteen);
    const Bytes high = hexDigits(sixteen >> 4);
    const Bytes low = hexDigits(sixteen & 15);
    const std::array digits = {
        __builtin_shufflevector(high, low, 0, 16, 1, 17, 2, 18, 3, 19, 4, 20, 5, 21, 6, 22, 7, 23),
        __builtin_shufflevector(high, low, 8, 24, 9, 25, 10, 26, 11, 27, 12, 28, 13, 29, 14, 30, 15, 31)};
    std::memcpy(to, &digits, sizeof digits);
    to += sizeof digits;
  }
  for (const char character : bytes) {
    constexpr std::string_view digits = "0123456789abcdef";
    const auto byte = static_cast<unsigned char>(character);
    *to++ = digits[byte >> 4];
    *to++ = digits[byte & 15];
  }
  out.advanceTo(to);
}

void put(const List& list, Writer& out);
void put(const Dictionary& dictionary, Writer& out);

[[gnu::always_inline]] inline void putInPlace(const Value& value, Writer& out) {
  // What most values are.
  if (value.kind() == ValueKind::UInt32) return printInteger(value.rawUInt32(), out);
  switch (value.kind()) {
    case ValueKind::Int32:
      return printInteger(std::int64_t{value.rawInt32()}, out);
    case ValueKind::UInt32:
      return printInteger(value.rawUInt32(), out);
    case ValueKind::Int64:
      return printInteger(value.rawInt64(), out);
    case ValueKind::UInt64:
      return printInteger(value.rawUInt64(), out);
    case ValueKind::Bool:
      return out.put(value.rawBool() ? '1' : '0');
    case ValueKind::Float:
      return printReal(value.rawFloat(), out);
    case ValueKind::Double:
      return printReal(value.rawDouble(), out);
    case ValueKind::Text:
      return value.isIdentifier() ? putUnescaped(value.rawText(), out) : putQuoted(value.rawText(), out);
    case ValueKind::Bytes:
      out.put('<');
      putHex(value.rawText(), out);
      return out.put('>');
    case ValueKind::List:
      return put(*value.list(), out);
    case ValueKind::Dictionary:
      return put(*value.dictionary(), out);
  }
}

void put(const Value& value, Writer& out) { putInPlace(value, out); }

// What stands between two elements: nothing before the first.
class Separator {
 public:
  static constexpr std::size_t longest = 2;
  char* append(char* to) {
    Writer::append(to, ", ");
    return to + std::exchange(size_, longest);
  }

 private:
  std::size_t size_ = 0;
};

void put(const List& list, Writer& out) {
  out.put('[');
  Separator separator;
  for (const Value& value : list) {
    out.advanceTo(separator.append(out.room(Separator::longest)));
    putInPlace(value, out);
  }
  out.put(']');
}

void put(const Dictionary& dictionary, Writer& out) {
  out.put('[');
  Separator separator;
  for (const Dictionary::Entry& entry : dictionary) {
    const std::string_view key = entry.key.text();
    char* const to = separator.append(out.room(Separator::longest + key.size() + 4));
    if (entry.key.isFramed()) {
      out.advanceTo(Writer::appendShort(to, std::string_view(key.data() - 1, key.size() + 4)));
    } else {
      out.advanceTo(to);
      putQuoted(key, out);
      out.put(std::string_view(": "));
    }
    putInPlace(entry.value, out);
  }
  out.put(']');
}

template <typename Content>
void printTo(const Content& content, std::string& out) {
  Writer writer(out);
  put(content, writer);
}

template <typename Real>
void printRealTo(Real number, std::string& out) {
  Writer writer(out);
  printReal(number, writer);
}

template <typename Integer>
void printIntegerTo(Integer number, std::string& out) {
  Writer writer(out);
  printInteger(number, writer);
}

}  // namespace

void printNumber(double number, std::string& out) { printRealTo(number, out); }
void printNumber(float number, std::string& out) { printRealTo(number, out); }
void printNumber(std::int64_t number, std::string& out) { printIntegerTo(number, out); }
void printNumber(std::uint64_t number, std::string& out) { printIntegerTo(number, out); }

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
  Writer writer(out);
  putHex(bytes, writer);
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
