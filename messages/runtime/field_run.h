// SPDX-License-Identifier: Apache-2.0
//
// How one scalar is read and written, and the straight-line code that reads and writes the fields of a message class in
// the order of its rows. That code is made from the rows, so that keys, kinds and places are constants in it; it takes
// half the instructions of a loop over the rows. A loop remains for what is not in the order of the rows, and the work
// on bytes, lists and nested messages stays out of line. Internal to the runtime.
#pragma once

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <span>
#include <utility>

#include "messages/runtime/codable.h"
#include "messages/runtime/data_writer.h"
#include "messages/runtime/wire_format.h"
#include "values/line_sink.h"

namespace probeview {

// What the decoding of one payload shares between the records nested in it.
struct Decoding {
  PBCodable& root;
  LineSink* log;
  const std::uint8_t* tail;  // the last few bytes of the payload, which are read with care
};

struct FieldRun {
  // Rows: the rows of the message's class, with the one that ends them. Scalars: their short form.

  // Decodes fields for as long as they come in the order of the rows; fields may be absent. Stops, before the key, at
  // whatever else there is, at a number that the record cuts off, and at the tail. The position is null when decoding
  // has failed.
  template <const auto& Rows, const auto& Scalars>
  static DecodingProgress decode(PBCodable& message, const std::uint8_t* position, const std::uint8_t* limit,
                                 Decoding& decoding);
  // Writes all fields; there is room for the scalars, and for the slack.
  template <const auto& Rows>
  static std::uint8_t* encode(const PBCodable& message, std::uint8_t* out, PBDataWriter& writer);
  // The bytes that must be free to write all scalars of the rows from the given one on.
  template <const auto& Rows>
  static constexpr std::uint16_t roomFrom(std::size_t index) {
    std::size_t room = wordSlack;
    for (; index < Rows.size() - 1; ++index) room += scalarBound(Rows[index]);
    return static_cast<std::uint16_t>(room);
  }

  // One occurrence of a field that is no scalar, behind its key. Returns the position behind it, null when that failed.
  static const std::uint8_t* decodeBytes(PBByteField& field, const std::uint8_t* position, const std::uint8_t* limit,
                                         Decoding& decoding);
  static const std::uint8_t* decodeElement(PBMessageField& field, const FieldDescriptor& row,
                                           const std::uint8_t* position, const std::uint8_t* limit, Decoding& decoding);
  // Also the further elements that follow at once.
  static const std::uint8_t* decodeElements(PBMessageList& list, const FieldDescriptor& row,
                                            const std::uint8_t* position, const std::uint8_t* limit,
                                            Decoding& decoding);
  // Repeated numbers: all in one record if the key says so, else one.
  static const std::uint8_t* decodeNumbers(PBRepeatedUInt32& list, std::uint64_t key, const std::uint8_t* position,
                                           const std::uint8_t* limit, Decoding& decoding);
  static const std::uint8_t* decodeNumbers(PBRepeatedInt32& list, std::uint64_t key, const std::uint8_t* position,
                                           const std::uint8_t* limit, Decoding& decoding);

  // A field that is present and no scalar, with its key. Returns the position behind it, which may have moved and has
  // the given room behind it.
  static std::uint8_t* encodeBytes(std::span<const std::uint8_t> bytes, std::uint32_t key, std::uint8_t* out,
                                   std::size_t room, PBDataWriter& writer);
  static std::uint8_t* encodeElement(const PBCodable& element, const FieldDescriptor& row, std::uint8_t* out,
                                     std::size_t room, PBDataWriter& writer);
  static std::uint8_t* encodeElements(const PBMessageList& list, const FieldDescriptor& row, std::uint8_t* out,
                                      std::size_t room, PBDataWriter& writer);
  static std::uint8_t* encodeNumbers(const PBRepeatedUInt32& list, std::uint32_t key, std::uint8_t* out,
                                     std::size_t room, PBDataWriter& writer);
  static std::uint8_t* encodeNumbers(const PBRepeatedInt32& list, std::uint32_t key, std::uint8_t* out,
                                     std::size_t room, PBDataWriter& writer);

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

  // The bytes of a key of one byte or two, the first one in the low bits.
  static constexpr std::uint16_t keyBytes(std::uint32_t key) noexcept {
    return static_cast<std::uint16_t>(key < 0x80 ? key : (key & 0x7F) | 0x80 | key >> 7 << 8);
  }

  // The key, and the value behind it.
  template <std::uint32_t Key, bool IsMostlyLong>
  [[gnu::always_inline]] static std::uint8_t* write(std::uint8_t* out, std::uint64_t value) noexcept {
    constexpr std::size_t keySize = wire::varintSize(Key);
    if constexpr (!IsMostlyLong) {
      if (value < 0x80) [[likely]] {
        writeWord(out, keyBytes(Key) | static_cast<std::uint32_t>(value) << 8 * keySize);
        return out + keySize + 1;
      }
      if (value < 0x4000) [[likely]] {
        // The upper seven bits move up by one.
        const auto twoBytes = static_cast<std::uint32_t>(value + (value & 0x3F80) + 0x80);
        writeWord(out, keyBytes(Key) | twoBytes << 8 * keySize);
        return out + keySize + 2;
      }
    }
    writeWord(out, keyBytes(Key));
    return writeLongValue(out + keySize, value);
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
  // Whether the key stands at the position; two bytes must be readable.
  template <std::uint32_t Key>
  [[gnu::always_inline]] static bool isKey(const std::uint8_t* position) noexcept {
    if constexpr (Key < 0x80) return position[0] == Key;
    return static_cast<std::uint32_t>(position[0] | position[1] << 8) == keyBytes(Key);
  }

  template <const auto& Rows, std::size_t Index>
  [[gnu::always_inline]] static const std::uint8_t* decodeObject(PBCodable& message, const std::uint8_t* position,
                                                                 const std::uint8_t* limit, Decoding& decoding);
  template <const auto& Rows, std::size_t Index>
  [[gnu::always_inline]] static std::uint8_t* encodeObject(const PBCodable& message, std::uint8_t* out,
                                                           std::size_t room, PBDataWriter& writer);
  // How many bytes the scalar takes at most, with its key; 0 if it is none.
  static constexpr std::size_t scalarBound(const FieldDescriptor& row) noexcept {
    const std::size_t keySize = wire::varintSize(row.key);
    switch (row.kind) {
      case FieldKind::UInt64:
      case FieldKind::Int32:  // negative numbers take ten bytes
      case FieldKind::Enumeration:
        return keySize + 10;
      case FieldKind::UInt32:
      case FieldKind::SInt32:
        return keySize + 5;
      case FieldKind::Bool:
        return keySize + 1;
      case FieldKind::Bytes:
      case FieldKind::Text:
      case FieldKind::Message:
      case FieldKind::RepeatedMessage:
      case FieldKind::RepeatedUInt32:
      case FieldKind::RepeatedSInt32:
        return 0;
    }
    return 0;
  }
  [[gnu::always_inline]] static wire::Varint readEight(const std::uint8_t* position,
                                                       const std::uint8_t* tail) noexcept {
    if (tail - position < static_cast<std::ptrdiff_t>(8 - decodingTailSize)) return {nullptr, 0};
    return wire::readUpToEightBytes(position);
  }
  // Out of line: seldom needed, and there are many places that need it.
  static wire::Varint readLongValue(const std::uint8_t* position, const std::uint8_t* tail) noexcept;
  static std::uint8_t* writeLongValue(std::uint8_t* out, std::uint64_t value) noexcept;
};

template <const auto& Rows, const auto& Scalars>
DecodingProgress FieldRun::decode(PBCodable& message, const std::uint8_t* position, const std::uint8_t* limit,
                                  Decoding& decoding) {
  const std::uint8_t* const tail = decoding.tail;
  const std::uint8_t* const stop = std::min(limit, tail);
  constexpr std::size_t rowCount = Rows.size() - 1;
  std::uint64_t hasBits = 0;
  std::size_t expected = rowCount;
  // One field; false when this is as far as it goes.
  const auto decodeNext = [&]<std::size_t Index>() __attribute__((always_inline)) {
    constexpr const FieldDescriptor& row = Rows[Index];
    if constexpr (row.expectedKey == neverExpected) {
      return true;
    } else {
      constexpr std::size_t keySize = wire::varintSize(row.key);
      if (!isKey<row.key>(position)) return true;
      if constexpr (isScalar(row.kind)) {
        const wire::Varint varint = readValue<row.kind == FieldKind::UInt64>(position + keySize, tail);
        // A value that ends before the stop is whole; nothing else is to be asked of most.
        if (varint.next == nullptr || (varint.next >= stop && varint.next > limit)) {
          expected = Index;
          return false;
        }
        store(message, row.kind, row.member, varint.value);
        hasBits |= std::uint64_t{1} << row.number;
        position = varint.next;
      } else {
        if (keySize > 1 && position + keySize > limit) return false;
        message._has |= std::exchange(hasBits, 0);
        position = decodeObject<Rows, Index>(message, position + keySize, limit, decoding);
        if (position == nullptr) return false;
      }
      if (position < stop) return true;
      expected = Index + 1;
      return false;
    }
  };
  if (position < stop) {
    [&]<std::size_t... Indices>(std::index_sequence<Indices...>) __attribute__((always_inline)) {
      static_cast<void>((decodeNext.template operator()<Indices>() && ...));
    }
    (std::make_index_sequence<rowCount>{});
    message._has |= hasBits;
  } else {
    expected = 0;
  }
  return {position, Scalars.data() + expected};
}

template <const auto& Rows, std::size_t Index>
inline const std::uint8_t* FieldRun::decodeObject(PBCodable& message, const std::uint8_t* position,
                                                  const std::uint8_t* limit, Decoding& decoding) {
  constexpr const FieldDescriptor& row = Rows[Index];
  if constexpr (row.kind == FieldKind::Bytes || row.kind == FieldKind::Text) {
    return decodeBytes(message.*row.member.bytes, position, limit, decoding);
  } else if constexpr (row.kind == FieldKind::Message) {
    return decodeElement(message.*row.member.message, row, position, limit, decoding);
  } else if constexpr (row.kind == FieldKind::RepeatedMessage) {
    return decodeElements(message.*row.member.messages, row, position, limit, decoding);
  } else if constexpr (row.kind == FieldKind::RepeatedUInt32) {
    return decodeNumbers(message.*row.member.unsigned32List, row.key, position, limit, decoding);
  } else {
    return decodeNumbers(message.*row.member.signed32List, row.key, position, limit, decoding);
  }
}

template <const auto& Rows>
std::uint8_t* FieldRun::encode(const PBCodable& message, std::uint8_t* out, PBDataWriter& writer) {
  const std::uint64_t has = message._has;  // stays in a register, whatever bytes are written
  const auto encodeNext = [&]<std::size_t Index>() __attribute__((always_inline)) {
    constexpr const FieldDescriptor& row = Rows[Index];
    if constexpr (isScalar(row.kind)) {
      if ((has & std::uint64_t{1} << row.number) != 0) {
        out = write<row.key, row.kind == FieldKind::UInt64>(out, load(message, row.kind, row.member));
      }
    } else {
      constexpr std::size_t room = roomFrom<Rows>(Index);
      out = encodeObject<Rows, Index>(message, out, room, writer);
    }
  };
  [&]<std::size_t... Indices>(std::index_sequence<Indices...>) __attribute__((always_inline)) {
    (encodeNext.template operator()<Indices>(), ...);
  }
  (std::make_index_sequence<Rows.size() - 1>{});
  return out;
}

template <const auto& Rows, std::size_t Index>
inline std::uint8_t* FieldRun::encodeObject(const PBCodable& message, std::uint8_t* out, std::size_t room,
                                            PBDataWriter& writer) {
  constexpr const FieldDescriptor& row = Rows[Index];
  if constexpr (row.kind == FieldKind::Bytes || row.kind == FieldKind::Text) {
    const PBByteField& field = message.*row.member.bytes;
    return field.isPresent() ? encodeBytes(field.bytes(), row.key, out, room, writer) : out;
  } else if constexpr (row.kind == FieldKind::Message) {
    const PBCodable* const element = (message.*row.member.message).element();
    return element != nullptr ? encodeElement(*element, row, out, room, writer) : out;
  } else if constexpr (row.kind == FieldKind::RepeatedMessage) {
    const PBMessageList& list = message.*row.member.messages;
    return list.count() != 0 ? encodeElements(list, row, out, room, writer) : out;
  } else if constexpr (row.kind == FieldKind::RepeatedUInt32) {
    const PBRepeatedUInt32& list = message.*row.member.unsigned32List;
    return list.count() != 0 ? encodeNumbers(list, row.key, out, room, writer) : out;
  } else {
    const PBRepeatedInt32& list = message.*row.member.signed32List;
    return list.count() != 0 ? encodeNumbers(list, row.key, out, room, writer) : out;
  }
}

}  // namespace probeview
