// SPDX-License-Identifier: Apache-2.0
//
// Runs of scalars, which are most of what messages hold: how one scalar is read and written, and the straight-line code
// that does it for the scalars at the front of a message class. That code is made from the class's rows, so that keys,
// kinds and places are constants in it; it takes half the instructions of a loop over the rows. The loop remains for
// scalars that come later, and for what is not in the order of the rows. Internal to the runtime.
#pragma once

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <utility>

#include "messages/runtime/codable.h"
#include "messages/runtime/wire_format.h"

namespace probeview {

struct ScalarRun {
  // Rows: the scalar rows of the message's class, with the one that ends them.

  // Decodes the scalars at the front of a message for as long as they come in the order of the rows; fields may be
  // absent. Stops, before the key, at whatever else there is, at a value that the record cuts off, and at the tail.
  template <const auto& Rows>
  static DecodingProgress decodeFront(PBCodable& message, const std::uint8_t* position, const std::uint8_t* limit,
                                      const std::uint8_t* tail) noexcept;
  // Writes the scalars at the front of a message; there is room for them and for the slack.
  template <const auto& Rows>
  static std::uint8_t* encodeFront(const PBCodable& message, std::uint8_t* out) noexcept;

  // Whether the key that stands at the position is that of the scalar.
  template <std::size_t KeySize>
  [[gnu::always_inline]] static bool isNext(const ScalarRow& scalar, const std::uint8_t* position) noexcept {
    if constexpr (KeySize == 1) return position[0] == scalar.shortKey;
    return static_cast<std::uint32_t>(position[0] | position[1] << 8) == scalar.longKey;
  }

  // The value behind a key before the tail. Null when it is longer than eight bytes or reaches into the tail.
  template <bool IsMostlyLong>
  [[gnu::always_inline]] static wire::Varint readValue(const std::uint8_t* position,
                                                       const std::uint8_t* tail) noexcept {
    if (const std::uint64_t first = position[0]; first < 0x80) [[likely]]
      return {position + 1, first};
    if constexpr (!IsMostlyLong) {
      if (const std::uint64_t second = position[1]; second < 0x80) [[likely]]
        return {position + 2, position[0] + (second << 7) - 0x80};
      return readLongValue(position, tail);
    }
    return readEight(position, tail);
  }

  // A scalar from its varint.
  [[gnu::always_inline]] static void store(PBCodable& message, FieldKind kind, const FieldMember& member,
                                           std::uint64_t value) noexcept {
    if (kind == FieldKind::UInt32) [[likely]] {
      message.*member.unsigned32 = static_cast<std::uint32_t>(value);
    } else if (kind == FieldKind::SInt32) [[likely]] {
      message.*member.signed32 = wire::unZigZag(static_cast<std::uint32_t>(value));
    } else if (kind == FieldKind::UInt64) {
      message.*member.unsigned64 = value;
    } else if (kind == FieldKind::Bool) {
      message.*member.truth = value != 0;
    } else {
      message.*member.signed32 = static_cast<std::int32_t>(value);
    }
  }

  // What a scalar's varint is to be.
  [[gnu::always_inline]] static std::uint64_t load(const PBCodable& message, FieldKind kind,
                                                   const FieldMember& member) noexcept {
    if (kind == FieldKind::UInt32) [[likely]]
      return message.*member.unsigned32;
    if (kind == FieldKind::SInt32) [[likely]]
      return wire::zigZag(message.*member.signed32);
    if (kind == FieldKind::Bool) return message.*member.truth ? 1 : 0;
    if (kind == FieldKind::UInt64) return message.*member.unsigned64;
    // Signed numbers that are not ZigZag are extended to 64 bits.
    return static_cast<std::uint64_t>(std::int64_t{message.*member.signed32});
  }

  // A key of so many bytes, and the value behind it.
  template <std::size_t KeySize>
  [[gnu::always_inline]] static std::uint8_t* write(std::uint8_t* out, std::uint32_t keyBytes,
                                                    std::uint64_t value) noexcept {
    if (value < 0x80) [[likely]] {
      writeWord(out, keyBytes | static_cast<std::uint32_t>(value) << 8 * KeySize);
      return out + KeySize + 1;
    }
    if (value < 0x4000) [[likely]] {
      // The upper seven bits move up by one.
      const auto twoBytes = static_cast<std::uint32_t>(value + (value & 0x3F80) + 0x80);
      writeWord(out, keyBytes | twoBytes << 8 * KeySize);
      return out + KeySize + 2;
    }
    writeWord(out, keyBytes);
    return writeLongValue(out + KeySize, value);
  }

  // The bytes of a word, those in the low bits first.
  template <typename Word>
  [[gnu::always_inline]] static void writeWord(std::uint8_t* out, Word word) noexcept {
    if constexpr (std::endian::native == std::endian::little) {
      std::memcpy(out, &word, sizeof word);
    } else {
      for (std::size_t index = 0; index < sizeof word; ++index) {
        out[index] = static_cast<std::uint8_t>(word >> 8 * index);
      }
    }
  }

 private:
  [[gnu::always_inline]] static wire::Varint readEight(const std::uint8_t* position,
                                                       const std::uint8_t* tail) noexcept {
    if (tail - position < static_cast<std::ptrdiff_t>(8 - decodingTailSize)) return {nullptr, 0};
    return wire::readUpToEightBytes(position);
  }
  // Out of line: seldom needed, and there are many places that need it.
  static wire::Varint readLongValue(const std::uint8_t* position, const std::uint8_t* tail) noexcept;
  static std::uint8_t* writeLongValue(std::uint8_t* out, std::uint64_t value) noexcept;
};

template <const auto& Rows>
DecodingProgress ScalarRun::decodeFront(PBCodable& message, const std::uint8_t* position, const std::uint8_t* limit,
                                        const std::uint8_t* tail) noexcept {
  const std::uint8_t* const stop = std::min(limit, tail);
  std::uint64_t hasBits = 0;
  std::size_t expected = 0;
  // One field; false when this is as far as it goes.
  const auto decodeNext = [&]<std::size_t Index>() __attribute__((always_inline)) {
    constexpr ScalarRow row = Rows[Index];
    if constexpr (isScalar(row.kind)) {
      if (!isNext<row.keySize>(row, position)) return true;
      const wire::Varint varint = readValue<row.kind == FieldKind::UInt64>(position + row.keySize, tail);
      if (varint.next == nullptr) return false;
      // A value that ends before the stop is whole; nothing else is to be asked of most.
      const bool isLast = varint.next >= stop;
      if (isLast && varint.next > limit) return false;
      store(message, row.kind, row.member, varint.value);
      hasBits |= row.hasBit;
      expected = Index + 1;
      position = varint.next;
      return !isLast;
    } else {
      return false;
    }
  };
  if (position < stop) {
    [&]<std::size_t... Indices>(std::index_sequence<Indices...>) __attribute__((always_inline)) {
      static_cast<void>((decodeNext.template operator()<Indices>() && ...));
    }
    (std::make_index_sequence<Rows.size() - 1>{});
    message._has |= hasBits;
  }
  return {position, Rows.data() + expected};
}

template <const auto& Rows>
std::uint8_t* ScalarRun::encodeFront(const PBCodable& message, std::uint8_t* out) noexcept {
  const std::uint64_t has = message._has;
  const auto encodeNext = [&]<std::size_t Index>() __attribute__((always_inline)) {
    constexpr ScalarRow row = Rows[Index];
    if constexpr (isScalar(row.kind)) {
      if ((has & row.hasBit) != 0) out = write<row.keySize>(out, row.keyBytes, load(message, row.kind, row.member));
    }
    return isScalar(row.kind);
  };
  [&]<std::size_t... Indices>(std::index_sequence<Indices...>) __attribute__((always_inline)) {
    static_cast<void>((encodeNext.template operator()<Indices>() && ...));
  }
  (std::make_index_sequence<Rows.size() - 1>{});
  return out;
}

}  // namespace probeview
