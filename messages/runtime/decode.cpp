// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/decode.h"

#include <array>
#include <cstdio>
#include <cstring>

#include "messages/runtime/data_reader.h"
#include "messages/runtime/message_internals.h"
#include "messages/runtime/scalar.h"

namespace probeview {

namespace {

// No class of scalars alone has a longer encoding in practice: what is longer holds much that is no field.
constexpr std::size_t shortPayload = 256;

void logUnknownTag(LineSink* log, std::uint32_t number, std::uint64_t value) {
  if (log == nullptr) return;
  char text[48];
  const int length = std::snprintf(text, sizeof text, "Unknown tag: %x:%u", number, static_cast<unsigned>(value));
  log->line({text, static_cast<std::size_t>(length)});
}

// Hands over the numbers of one occurrence of a repeated scalar, packed or single. A last number inside which the data
// ends is handed over as 0 before decoding fails.
template <typename Add>
[[gnu::always_inline]] inline const std::uint8_t* handOverNumbers(std::uint64_t key, const std::uint8_t* position,
                                                                  const std::uint8_t* limit, const Add& add) {
  if ((key & 7) != static_cast<unsigned>(wire::WireType::LengthDelimited)) {
    const wire::Varint number = wire::readVarint(position, limit);
    add(static_cast<std::uint32_t>(number.value));
    return number.next;
  }
  const Record record = readRecord(position, limit);
  if (record.end == nullptr) return nullptr;
  position = record.begin;
  while (position != nullptr && position < record.end) {
    const wire::Varint number = wire::readVarint(position, record.end);
    add(static_cast<std::uint32_t>(number.value));
    position = number.next;
  }
  return position;
}

}  // namespace

bool PBCodable::readFrom(PBDataReader& reader) {
  if (reader.hasError_) return false;
  const MessageDescriptor& fields = descriptor();
  const auto size = static_cast<std::size_t>(reader.limit_ - reader.position_);
  Decoding decoding{nullptr, reader.log_};
  const std::uint8_t* begin = reader.position_;
  const std::uint8_t* end = nullptr;
  std::array<std::uint8_t, shortPayload + decodingSlack> shortCopy;
  if (fields.isFlat && size > shortPayload) {
    // Not worth a copy; the loop reads nothing behind the payload.
    end = decodeInAnyOrder(*this, fields, begin, reader.limit_, decoding);
  } else {
    std::uint8_t* copy = shortCopy.data();
    if (!fields.isFlat) {
      decoding.block = &MessageInternals::blockFor(*this);
      copy = static_cast<std::uint8_t*>(decoding.block->allocate(size + decodingSlack));
    }
    std::memcpy(copy, begin, size);
    std::memset(copy + size, 0, decodingSlack);
    begin = copy;
    end = fields.decodeRecord(*this, begin, begin + size, decoding);
  }
  reader.hasError_ = end == nullptr;
  reader.position_ = end == nullptr ? reader.limit_ : reader.position_ + (end - begin);
  return end != nullptr;
}

wire::Varint readLongValue(const std::uint8_t* position) noexcept { return wire::readUpToEightBytes(position); }

const std::uint8_t* passOver(const MessageDescriptor& descriptor, std::uint64_t key, const std::uint8_t* position,
                             const std::uint8_t* limit, const Decoding& decoding) {
  // Only 16 bits of a field number count.
  const auto number = static_cast<std::uint16_t>(key >> 3);
  if (!descriptor.drops(number, descriptor.name, decoding.log)) return wire::skipValue(position, limit, key & 7);
  const wire::Varint dropped = wire::readVarint(position, limit);
  logUnknownTag(decoding.log, number, dropped.value);
  return dropped.next;
}

const std::uint8_t* decodeBytes(PBByteField& field, const std::uint8_t* position, const std::uint8_t* limit) {
  const Record record = readRecord(position, limit);
  if (record.end != nullptr) field.setLocal({record.begin, record.end});
  return record.end;
}

const std::uint8_t* decodeElement(PBMessageField& field, const MessageDescriptor& descriptor,
                                  const std::uint8_t* position, const std::uint8_t* limit, Decoding& decoding) {
  // Attached before it is decoded: what was decoded before a fault stays.
  PBCodable* const element = MessageInternals::makeElement(descriptor, *decoding.block);
  field.setLocal(element);
  const Record record = readRecord(position, limit);
  if (record.end == nullptr) return nullptr;
  // Also when an end of group has ended the element early.
  return descriptor.decodeRecord(*element, record.begin, record.end, decoding) == nullptr ? nullptr : record.end;
}

const std::uint8_t* decodeNumbers(PBRepeatedUInt32& list, std::uint64_t key, const std::uint8_t* position,
                                  const std::uint8_t* limit, Decoding& decoding) {
  return handOverNumbers(key, position, limit, [&](std::uint32_t element) { list.add(element, *decoding.block); });
}

const std::uint8_t* decodeNumbers(PBRepeatedInt32& list, std::uint64_t key, const std::uint8_t* position,
                                  const std::uint8_t* limit, Decoding& decoding) {
  return handOverNumbers(key, position, limit,
                         [&](std::uint32_t element) { list.add(wire::unZigZag(element), *decoding.block); });
}

const std::uint8_t* decodeInAnyOrder(PBCodable& message, const MessageDescriptor& descriptor,
                                     const std::uint8_t* position, const std::uint8_t* limit, Decoding& decoding) {
  while (position != nullptr && position < limit) {
    const wire::Varint key = wire::readVarint(position, limit);
    position = key.next;
    if (position == nullptr) return nullptr;
    if ((key.value & 7) == static_cast<unsigned>(wire::WireType::EndGroup)) return position;
    const FieldDescriptor& row = descriptor.rowOf(static_cast<std::uint16_t>(key.value >> 3));
    if (!row.isDecoded) {
      position = passOver(descriptor, key.value, position, limit, decoding);
      continue;
    }
    // The key's wire type plays no part, but for the two forms of repeated numbers.
    switch (row.kind) {
      case FieldKind::UInt64:
      case FieldKind::UInt32:
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
      case FieldKind::Bool: {
        // Present even if the data ends inside it; it is 0 then.
        const wire::Varint scalar = wire::readVarint(position, limit);
        storeScalar(message, row, scalar.value);
        MessageInternals::presence(message) |= std::uint64_t{1} << row.number;
        position = scalar.next;
        break;
      }
      case FieldKind::Bytes:
      case FieldKind::Text:
        position = decodeBytes(message.*row.member.bytes, position, limit);
        break;
      case FieldKind::Message:
        position = decodeElement(message.*row.member.message, *row.element, position, limit, decoding);
        break;
      case FieldKind::RepeatedMessage:
        position = row.element->decodeElements(message.*row.member.messages, wire::keyBytes(row.key), position, limit,
                                               decoding);
        break;
      case FieldKind::RepeatedUInt32:
        position = decodeNumbers(message.*row.member.unsigned32List, key.value, position, limit, decoding);
        break;
      case FieldKind::RepeatedSInt32:
        position = decodeNumbers(message.*row.member.signed32List, key.value, position, limit, decoding);
        break;
    }
  }
  return position;
}

}  // namespace probeview
