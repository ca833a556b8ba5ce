// SPDX-License-Identifier: Apache-2.0
//
// The straight-line code that decodes the fields of a message class in the order of its rows. It is made from the rows,
// so that keys, kinds and places are constants in it; it takes half the instructions of a loop over the rows. Internal
// to the runtime.
#pragma once

#include <cstddef>
#include <cstdint>
#include <utility>

#include "messages/runtime/decode.h"
#include "messages/runtime/message_internals.h"
#include "messages/runtime/scalar.h"

namespace probeview {

template <typename Message, const auto& Rows>
struct DecoderOf {
  // Decodes a record of the class.
  static const std::uint8_t* decodeRecord(PBCodable& message, const std::uint8_t* position, const std::uint8_t* limit,
                                          Decoding& decoding) {
    return decode(message, position, limit, decoding);
  }

  // Decodes elements of a list that follow one another, each behind the same key; the first key has been read.
  static const std::uint8_t* decodeElements(PBMessageList& list, std::uint16_t keyBytes, const std::uint8_t* position,
                                            const std::uint8_t* limit, Decoding& decoding) {
    Block& block = *decoding.block;
    while (true) {
      // Attached before it is decoded: what was decoded before a fault stays.
      Message* const element = Message::make(block.allocate(sizeof(Message)), block);
      list.addLocal(element, block);
      const Record record = readRecord(position, limit);
      if (record.end == nullptr) return nullptr;
      if (decode(*element, record.begin, record.end, decoding) == nullptr) return nullptr;
      // Also when an end of group has ended the element early.
      position = record.end;
      if (keyBytes < 0x80) {
        if (position == limit || *position != keyBytes) return position;
        position += 1;
      } else {
        if (limit - position < 2 || wire::readWord<std::uint16_t>(position) != keyBytes) return position;
        position += 2;
      }
    }
  }

 private:
  [[gnu::always_inline]] static const std::uint8_t* decode(PBCodable& message, const std::uint8_t* position,
                                                           const std::uint8_t* limit, Decoding& decoding) {
    position = decodeInOrder(message, position, limit, decoding);
    if (position == limit || position == nullptr) return position;
    return decodeInAnyOrder(message, Message::pbDescriptor, position, limit, decoding);
  }

  // Decodes fields for as long as they come in the order of the rows; fields may be absent. Stops, before the key, at
  // whatever else there is, and at a number that the record cuts off.
  [[gnu::always_inline]] static const std::uint8_t* decodeInOrder(PBCodable& message, const std::uint8_t* position,
                                                                  const std::uint8_t* limit, Decoding& decoding) {
    if (position == limit) return position;
    std::uint64_t present = 0;
    // One field; false when this is as far as it goes.
    const auto decodeNext = [&]<std::size_t Index>() __attribute__((always_inline)) {
      constexpr const FieldDescriptor& row = Rows[Index];
      if (!isKey<row.key>(position)) return true;
      const std::uint8_t* const content = position + wire::varintSize(row.key);
      if constexpr (isScalar(row.kind) && row.isDecoded) {
        const wire::Varint varint = readValue<row.kind == FieldKind::UInt64>(content);
        // A value that ends before the limit is whole; nothing else is to be asked of most.
        if (varint.next == nullptr || (varint.next >= limit && varint.next != limit)) return false;
        storeScalar(message, row, varint.value);
        present |= std::uint64_t{1} << row.number;
        position = varint.next;
      } else {
        if (content > limit) return false;
        MessageInternals::presence(message) |= std::exchange(present, 0);
        position = decodeObject<Index>(message, content, limit, decoding);
      }
      return position < limit && position != nullptr;
    };
    [&]<std::size_t... Indices>(std::index_sequence<Indices...>) __attribute__((always_inline)) {
      static_cast<void>((decodeNext.template operator()<Indices>() && ...));
    }
    (std::make_index_sequence<Rows.size() - 1>{});
    MessageInternals::presence(message) |= present;
    return position;
  }

  // Whether the key stands at the position.
  template <std::uint32_t Key>
  [[gnu::always_inline]] static bool isKey(const std::uint8_t* position) noexcept {
    if constexpr (Key < 0x80) return *position == Key;
    return wire::readWord<std::uint16_t>(position) == wire::keyBytes(Key);
  }

  // The value behind a key. Null when it is longer than eight bytes.
  template <bool IsMostlyLong>
  [[gnu::always_inline]] static wire::Varint readValue(const std::uint8_t* position) noexcept {
    if (const std::uint64_t first = position[0]; first < 0x80) [[likely]]
      return {position + 1, first};
    if constexpr (!IsMostlyLong) {
      if (const std::uint64_t second = position[1]; second < 0x80) [[likely]]
        return {position + 2, position[0] + (second << 7) - 0x80};
      return readLongValue(position);
    }
    return wire::readUpToEightBytes(position);
  }

  template <std::size_t Index>
  [[gnu::always_inline]] static const std::uint8_t* decodeObject(PBCodable& message, const std::uint8_t* position,
                                                                 const std::uint8_t* limit, Decoding& decoding) {
    constexpr const FieldDescriptor& row = Rows[Index];
    if constexpr (!row.isDecoded) {
      return passOver(Message::pbDescriptor, row.key, position, limit, decoding);
    } else if constexpr (row.kind == FieldKind::Bytes || row.kind == FieldKind::Text) {
      return decodeBytes(message.*row.member.bytes, position, limit);
    } else if constexpr (row.kind == FieldKind::Message) {
      return decodeElement(message.*row.member.message, *row.element, position, limit, decoding);
    } else if constexpr (row.kind == FieldKind::RepeatedMessage) {
      return row.element->decodeElements(message.*row.member.messages, wire::keyBytes(row.key), position, limit,
                                         decoding);
    } else if constexpr (row.kind == FieldKind::RepeatedUInt32) {
      return decodeNumbers(message.*row.member.unsigned32List, row.key, position, limit, decoding);
    } else {
      return decodeNumbers(message.*row.member.signed32List, row.key, position, limit, decoding);
    }
  }
};

}  // namespace probeview
