// SPDX-License-Identifier: Apache-2.0
//
// The protocol-buffer wire format, as far as the messages use it: varints, keys, ZigZag and skipping. Everything that
// reads or writes bytes of a message does it through these functions.
#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>

namespace probeview::wire {

enum class WireType : std::uint8_t {
  Varint = 0,
  Fixed64 = 1,
  LengthDelimited = 2,
  StartGroup = 3,
  EndGroup = 4,
  Fixed32 = 5,
};

inline constexpr std::size_t longestVarint = 10;

constexpr std::uint32_t key(std::uint32_t fieldNumber, WireType type) noexcept {
  return fieldNumber << 3 | static_cast<std::uint32_t>(type);
}

// The bytes of a key of one byte or two, the first one in the low bits.
constexpr std::uint16_t keyBytes(std::uint32_t key) noexcept {
  return static_cast<std::uint16_t>(key < 0x80 ? key : (key & 0x7F) | 0x80 | key >> 7 << 8);
}

constexpr std::uint32_t zigZag(std::int32_t value) noexcept {
  return static_cast<std::uint32_t>(value) << 1 ^ static_cast<std::uint32_t>(value >> 31);
}

constexpr std::int32_t unZigZag(std::uint32_t value) noexcept {
  return static_cast<std::int32_t>(value >> 1 ^ (0U - (value & 1U)));
}

// A word from its bytes, those in the low bits first.
template <typename Word>
[[gnu::always_inline]] inline Word readWord(const std::uint8_t* position) noexcept {
  Word word = 0;
  if constexpr (std::endian::native == std::endian::little) {
    std::memcpy(&word, position, sizeof word);
  } else {
    for (std::size_t index = sizeof word; index > 0; --index) word = static_cast<Word>(word << 8 | position[index - 1]);
  }
  return word;
}

// The bytes of a word, those in the low bits first.
template <typename Word>
[[gnu::always_inline]] inline void writeWord(std::uint8_t* out, Word word) noexcept {
  if constexpr (std::endian::native == std::endian::little) {
    std::memcpy(out, &word, sizeof word);
  } else {
    for (std::size_t index = 0; index < sizeof word; ++index) out[index] = static_cast<std::uint8_t>(word >> 8 * index);
  }
}

// A varint and the position behind it; null, and the value 0, when the data ends inside it.
struct Varint {
  const std::uint8_t* next;
  std::uint64_t value;
};

// What readVarint() does for a varint of more than one byte, or for none at all.
Varint readLongVarint(const std::uint8_t* position, const std::uint8_t* limit) noexcept;

// A varint of at most eight bytes, read at once; null when it is longer. Eight bytes must be readable.
inline Varint readUpToEightBytes(const std::uint8_t* position) noexcept {
  auto bits = readWord<std::uint64_t>(position);
  // The first byte whose top bit is clear is the last one; what lies above it belongs to others.
  const std::uint64_t ends = ~bits & 0x8080808080808080U;
  if (ends == 0) return {nullptr, 0};
  bits &= (ends ^ (ends - 1)) & 0x7F7F7F7F7F7F7F7FU;
  // Seven bits of each byte move together: pairs, fours, all eight.
  bits = (bits & 0x007F007F007F007FU) | (bits & 0x7F007F007F007F00U) >> 1;
  bits = (bits & 0x00003FFF00003FFFU) | (bits & 0x3FFF00003FFF0000U) >> 2;
  bits = (bits & 0x000000000FFFFFFFU) | (bits & 0x0FFFFFFF00000000U) >> 4;
  return {position + (std::countr_zero(ends) + 1) / 8, bits};
}

// Reads a varint of at most ten bytes. Bits past the 64th are dropped. A varint whose tenth byte still asks for another
// one reads as 0, which is no error: what follows is read as if nothing had happened, so that one odd number does not
// cost the whole record.
inline Varint readVarint(const std::uint8_t* position, const std::uint8_t* limit) noexcept {
  if (position < limit && *position < 0x80) return {position + 1, *position};
  return readLongVarint(position, limit);
}

// Skips one value of the given wire type (the low three bits of a key) and returns the position after it; null when the
// data ends inside it, or when the type is one that cannot be skipped: a group, or no type at all.
const std::uint8_t* skipValue(const std::uint8_t* position, const std::uint8_t* limit, std::uint32_t type) noexcept;

// Writes the varint and returns the position after it; up to ten bytes must be free.
inline std::uint8_t* writeVarint(std::uint8_t* out, std::uint64_t value) noexcept {
  while (value >= 0x80) {
    *out++ = static_cast<std::uint8_t>(value | 0x80);
    value >>= 7;
  }
  *out++ = static_cast<std::uint8_t>(value);
  return out;
}

constexpr std::size_t varintSize(std::uint64_t value) noexcept {
  // Seven bits to a byte: (bits + 6) / 7 without a division.
  return (static_cast<std::size_t>(std::bit_width(value | 1)) * 9 + 64) / 64;
}

}  // namespace probeview::wire
