// SPDX-License-Identifier: Apache-2.0
//
// Encoding: the straight-line code that writes the fields of a message class in the order of its rows, made from the
// rows so that keys, kinds and places are constants in it. Bytes, lists and nested messages are written out of line.
// Internal to the runtime.
//
// Functions that write return the position behind what they have written.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <utility>

#include "messages/runtime/data_writer.h"
#include "messages/runtime/message_internals.h"
#include "messages/runtime/scalar.h"
#include "messages/runtime/wire_format.h"

namespace probeview {

// How many bytes more than it needs the last scalar may write over when it is written as a word of eight bytes.
inline constexpr std::uint16_t wordSlack = 7;

// A field that is present and no scalar, with its key. The position returned may have moved and has the given room
// behind it.
std::uint8_t* encodeBytes(std::span<const std::uint8_t> bytes, std::uint32_t key, std::uint8_t* out, std::size_t room,
                          PBDataWriter& writer);
std::uint8_t* encodeElement(const PBCodable& element, const FieldDescriptor& row, std::uint8_t* out, std::size_t room,
                            PBDataWriter& writer);
std::uint8_t* encodeElements(const PBMessageList& list, const FieldDescriptor& row, std::uint8_t* out, std::size_t room,
                             PBDataWriter& writer);
std::uint8_t* encodeNumbers(const PBRepeatedUInt32& list, std::uint32_t key, std::uint8_t* out, std::size_t room,
                            PBDataWriter& writer);
std::uint8_t* encodeNumbers(const PBRepeatedInt32& list, std::uint32_t key, std::uint8_t* out, std::size_t room,
                            PBDataWriter& writer);
// A varint; out of line, as it is seldom needed and in many places.
std::uint8_t* writeLongValue(std::uint8_t* out, std::uint64_t value) noexcept;

template <const auto& Rows>
struct EncoderOf {
  // The bytes that must be free to write all scalars of the rows from the given one on.
  static constexpr std::uint16_t roomFrom(std::size_t index) noexcept {
    std::size_t room = wordSlack;
    for (; index < Rows.size() - 1; ++index) room += scalarBound(Rows[index]);
    return static_cast<std::uint16_t>(room);
  }

  // Writes all fields; there is room for the scalars, and for the slack.
  static std::uint8_t* encodeFields(const PBCodable& message, std::uint8_t* out, PBDataWriter& writer) {
    const std::uint64_t presence = MessageInternals::presence(message);  // stays in a register, whatever is written
    const auto encodeNext = [&]<std::size_t Index>() __attribute__((always_inline)) {
      constexpr const FieldDescriptor& row = Rows[Index];
      if constexpr (isScalar(row.kind)) {
        if ((presence & std::uint64_t{1} << row.number) != 0) [[likely]] {
          out = write<row.key, row.kind == FieldKind::UInt64>(out, loadScalar(message, row));
        }
      } else {
        out = encodeObject<Index>(message, out, writer);
      }
    };
    [&]<std::size_t... Indices>(std::index_sequence<Indices...>) __attribute__((always_inline)) {
      (encodeNext.template operator()<Indices>(), ...);
    }
    (std::make_index_sequence<Rows.size() - 1>{});
    return out;
  }

 private:
  // The key, and the value behind it.
  template <std::uint32_t Key, bool IsMostlyLong>
  [[gnu::always_inline]] static std::uint8_t* write(std::uint8_t* out, std::uint64_t value) noexcept {
    constexpr std::size_t keySize = wire::varintSize(Key);
    if constexpr (!IsMostlyLong) {
      if (value < 0x80) [[likely]] {
        wire::writeWord(out, wire::keyBytes(Key) | static_cast<std::uint32_t>(value) << 8 * keySize);
        return out + keySize + 1;
      }
      if (value < 0x4000) [[likely]] {
        // The upper seven bits move up by one.
        const auto twoBytes = static_cast<std::uint32_t>(value + (value & 0x3F80) + 0x80);
        wire::writeWord(out, wire::keyBytes(Key) | twoBytes << 8 * keySize);
        return out + keySize + 2;
      }
    }
    wire::writeWord(out, wire::keyBytes(Key));
    return writeLongValue(out + keySize, value);
  }

  template <std::size_t Index>
  [[gnu::always_inline]] static std::uint8_t* encodeObject(const PBCodable& message, std::uint8_t* out,
                                                           PBDataWriter& writer) {
    constexpr const FieldDescriptor& row = Rows[Index];
    constexpr std::size_t room = roomFrom(Index);
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
};

}  // namespace probeview
