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

constexpr std::uint32_t zigZag(std::int32_t value) noexcept {
  return static_cast<std::uint32_t>(value) << 1 ^ static_cast<std::uint32_t>(value >> 31);
}

constexpr std::int32_t unZigZag(std::uint32_t value) noexcept {
  return static_cast<std::int32_t>(value >> 1 ^ (0U - (value & 1U)));
}

// What readVarint() does for a varint of more than one byte, or for none at all.
const std::uint8_t* readLongVarint(const std::uint8_t* position, const std::uint8_t* limit,
                                   std::uint64_t& value) noexcept;

// Reads a varint of at most ten bytes and returns the position after it; null, and the value 0, when the data ends
// inside it. Bits past the 64th are dropped. A varint whose tenth byte still asks for another one reads as 0, which is
// no error: what follows is read as if nothing had happened, so that one odd number does not cost the whole record.
inline const std::uint8_t* readVarint(const std::uint8_t* position, const std::uint8_t* limit,
                                      std::uint64_t& value) noexcept {
  if (position < limit && *position < 0x80) {
    value = *position;
    return position + 1;
  }
  return readLongVarint(position, limit, value);
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
