// SPDX-License-Identifier: Apache-2.0
#include <algorithm>
#include <cstdio>

#include "messages/runtime/field_run.h"
#include "messages/runtime/table_walker.h"

namespace probeview {

namespace {

void logUnknownTag(LineSink* log, std::uint32_t number, std::uint64_t value) {
  if (log == nullptr) return;
  char text[48];
  const int length = std::snprintf(text, sizeof text, "Unknown tag: %x:%u", number, static_cast<unsigned>(value));
  log->line({text, static_cast<std::size_t>(length)});
}

struct Record {
  const std::uint8_t* begin;
  const std::uint8_t* end;  // null when the record runs past the limit
};

// The length-delimited record that begins with its length at the position.
inline Record readRecord(const std::uint8_t* position, const std::uint8_t* limit) noexcept {
  const wire::Varint length = wire::readVarint(position, limit);
  if (length.next == nullptr || length.value > static_cast<std::uint64_t>(limit - length.next)) return {};
  return {length.next, length.next + length.value};
}

// What is no field of the message, or is dropped. Returns the position behind it, null when that failed. Out of line:
// seldom needed.
[[gnu::noinline]] const std::uint8_t* passOver(std::uint64_t key, const std::uint8_t* position,
                                               const std::uint8_t* limit, const MessageDescriptor& descriptor,
                                               LineSink* log) {
  const auto number = static_cast<std::uint16_t>(key >> 3);
  if (!descriptor.drops(number, descriptor.name, log)) return wire::skipValue(position, limit, key & 7);
  const wire::Varint dropped = wire::readVarint(position, limit);
  logUnknownTag(log, number, dropped.value);
  return dropped.next;
}

// Hands over the numbers of one occurrence of a repeated scalar, packed or single. A last number inside which the data
// ends is handed over as 0 before decoding fails.
template <typename Add>
const std::uint8_t* handOverNumbers(std::uint64_t key, const std::uint8_t* position, const std::uint8_t* limit,
                                    const Add& add) {
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

// The position behind the key if it is the one that stands there, in its usual form; else the same position.
inline const std::uint8_t* readKey(const std::uint8_t* position, const std::uint8_t* limit,
                                   std::uint32_t key) noexcept {
  if (key < 0x80) return position < limit && *position == key ? position + 1 : position;
  const bool isThere = limit - position >= 2 && position[0] == ((key & 0x7F) | 0x80) && position[1] == key >> 7;
  return isThere ? position + 2 : position;
}

// The block for all that the decoded message owns.
inline Block& blockOf(Decoding& decoding) { return TableWalker::blockOf(decoding.root); }

// Where the tail of the payload begins.
inline const std::uint8_t* tailOf(const std::uint8_t* begin, const std::uint8_t* end) noexcept {
  return end - begin > static_cast<std::ptrdiff_t>(decodingTailSize) ? end - decodingTailSize : begin;
}

}  // namespace

wire::Varint FieldRun::readLongValue(const std::uint8_t* position, const std::uint8_t* tail) noexcept {
  return readEight(position, tail);
}

bool PBCodable::readFrom(PBDataReader& reader) { return TableWalker::decode(*this, reader); }

bool TableWalker::decode(PBCodable& message, PBDataReader& reader) {
  if (reader.hasError_) return false;
  Decoding decoding{message, reader.log_, tailOf(reader.position_, reader.limit_)};
  const std::uint8_t* end = decodeRecord(message, message.descriptor(), reader.position_, reader.limit_, decoding);
  reader.hasError_ = end == nullptr;
  reader.position_ = end == nullptr ? reader.limit_ : end;
  return end != nullptr;
}

// Decodes a message from the position to the limit. Returns the position at which that ended, null when it failed.
[[gnu::always_inline]] inline const std::uint8_t* TableWalker::decodeRecord(PBCodable& message,
                                                                            const MessageDescriptor& descriptor,
                                                                            const std::uint8_t* position,
                                                                            const std::uint8_t* limit,
                                                                            Decoding& decoding) {
  DecodingProgress progress = descriptor.decodeInOrder(message, position, limit, decoding);
  if (progress.position == limit || progress.position == nullptr) return progress.position;
  if (progress.position >= decoding.tail) {
    progress = decodeTail(message, progress, limit);
    if (progress.position == limit) return limit;
  }
  return decodeOthers(message, descriptor, progress, limit, decoding);
}

// The last few bytes of a payload: scalars of one byte for as long as each is the field that is expected next.
DecodingProgress TableWalker::decodeTail(PBCodable& message, DecodingProgress progress,
                                         const std::uint8_t* limit) noexcept {
  const auto decodeNext = [&]<std::size_t KeySize>() {
    const ScalarRow& scalar = *progress.expected;
    if (limit - progress.position <= static_cast<std::ptrdiff_t>(KeySize)) return false;
    if (!FieldRun::isNext<KeySize>(scalar, progress.position) || progress.position[KeySize] >= 0x80) return false;
    FieldRun::store(message, scalar.kind, scalar.member, progress.position[KeySize]);
    message._has |= scalar.hasBit;
    progress = {progress.position + KeySize + 1, &scalar + 1};
    return true;
  };
  while (decodeNext.template operator()<1>() || decodeNext.template operator()<2>()) {
  }
  return progress;
}

// Decodes scalars for as long as each is the field that is expected next and has a key of so many bytes. Stops, before
// the key, at whatever else there is, at a value that the record cuts off, and at the tail.
template <std::size_t KeySize>
[[gnu::always_inline]] inline DecodingProgress TableWalker::decodeRun(PBCodable& message, DecodingProgress progress,
                                                                      const std::uint8_t* limit,
                                                                      const std::uint8_t* tail) noexcept {
  const std::uint8_t* const stop = std::min(limit, tail);
  std::uint64_t hasBits = 0;
  while (progress.position < stop && FieldRun::isNext<KeySize>(*progress.expected, progress.position)) {
    const ScalarRow& scalar = *progress.expected;
    const wire::Varint varint = FieldRun::readValue<false>(progress.position + KeySize, tail);
    if (varint.next == nullptr || varint.next > limit) break;
    FieldRun::store(message, scalar.kind, scalar.member, varint.value);
    hasBits |= scalar.hasBit;
    progress = {varint.next, &scalar + 1};
  }
  message._has |= hasBits;
  return progress;
}

// Decodes scalars for as long as each is the field that is expected next: who encodes a message writes its fields in
// order.
[[gnu::always_inline]] inline DecodingProgress TableWalker::decodeExpected(PBCodable& message,
                                                                           DecodingProgress progress,
                                                                           const std::uint8_t* limit,
                                                                           const Decoding& decoding) noexcept {
  if (progress.expected->shortKey != ScalarRow::none) {
    progress = decodeRun<1>(message, progress, limit, decoding.tail);
  }
  if (progress.expected->longKey != ScalarRow::none) {
    progress = decodeRun<2>(message, progress, limit, decoding.tail);
  }
  return progress.position < decoding.tail ? progress : decodeTail(message, progress, limit);
}

const std::uint8_t* FieldRun::decodeBytes(PBByteField& field, const std::uint8_t* position, const std::uint8_t* limit,
                                          Decoding& decoding) {
  const Record record = readRecord(position, limit);
  if (record.end != nullptr) field.set({record.begin, record.end}, blockOf(decoding));
  return record.end;
}

const std::uint8_t* FieldRun::decodeElement(PBMessageField& field, const FieldDescriptor& row,
                                            const std::uint8_t* position, const std::uint8_t* limit,
                                            Decoding& decoding) {
  // Attached before it is decoded: what was decoded before a fault stays.
  PBCodable* element = TableWalker::makeElement(*row.element, blockOf(decoding));
  field.setLocal(element);
  const Record record = readRecord(position, limit);
  if (record.end == nullptr) return nullptr;
  if (TableWalker::decodeRecord(*element, *row.element, record.begin, record.end, decoding) == nullptr) return nullptr;
  // Also when an end of group has ended the element early.
  return record.end;
}

// Elements of a list that follow one another, each behind the same key; the first key has been read.
const std::uint8_t* FieldRun::decodeElements(PBMessageList& list, const FieldDescriptor& row,
                                             const std::uint8_t* position, const std::uint8_t* limit,
                                             Decoding& decoding) {
  Block& block = blockOf(decoding);
  const MessageDescriptor& descriptor = *row.element;
  while (true) {
    PBCodable* element = TableWalker::makeElement(descriptor, block);
    list.addLocal(element, block);
    const Record record = readRecord(position, limit);
    if (record.end == nullptr) return nullptr;
    if (TableWalker::decodeRecord(*element, descriptor, record.begin, record.end, decoding) == nullptr) return nullptr;
    position = readKey(record.end, limit, row.key);
    if (position == record.end) return position;
  }
}

const std::uint8_t* FieldRun::decodeNumbers(PBRepeatedUInt32& list, std::uint64_t key, const std::uint8_t* position,
                                            const std::uint8_t* limit, Decoding& decoding) {
  return handOverNumbers(key, position, limit, [&](std::uint32_t element) { list.add(element, blockOf(decoding)); });
}

const std::uint8_t* FieldRun::decodeNumbers(PBRepeatedInt32& list, std::uint64_t key, const std::uint8_t* position,
                                            const std::uint8_t* limit, Decoding& decoding) {
  return handOverNumbers(key, position, limit,
                         [&](std::uint32_t element) { list.add(wire::unZigZag(element), blockOf(decoding)); });
}

// Decodes the rest of a record, fields in any order: goes on where decodeInOrder() or decodeTail() has stopped, and
// after each field takes those that follow it in the order of their numbers by decodeExpected().
const std::uint8_t* TableWalker::decodeOthers(PBCodable& message, const MessageDescriptor& descriptor,
                                              DecodingProgress progress, const std::uint8_t* limit,
                                              Decoding& decoding) {
  while (progress.position < limit) {
    const wire::Varint key = wire::readVarint(progress.position, limit);
    if (key.next == nullptr) return nullptr;
    const std::uint8_t* position = key.next;
    if ((key.value & 7) == static_cast<unsigned>(wire::WireType::EndGroup)) return position;
    auto index = static_cast<std::size_t>(progress.expected - descriptor.scalars);
    if (key.value != descriptor.rows[index].expectedKey) {
      // Only 16 bits of a field number count.
      const auto number = static_cast<std::uint16_t>(key.value >> 3);
      index = number < fieldNumberLimit ? descriptor.rowOfNumber[number] : descriptor.rowCount;
      // Neither what is no field is decoded nor a field whose number is dropped, which is only ever written.
      if (descriptor.rows[index].expectedKey == neverExpected) {
        progress.position = passOver(key.value, position, limit, descriptor, decoding.log);
        if (progress.position == nullptr) return nullptr;
        continue;
      }
    }
    const FieldDescriptor* const row = &descriptor.rows[index];
    // The key's wire type plays no part, but for the two forms of repeated numbers.
    switch (row->kind) {
      case FieldKind::UInt64:
      case FieldKind::UInt32:
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
      case FieldKind::Bool: {
        // Present even if the data ends inside it; it is 0 then.
        const wire::Varint scalar = wire::readVarint(position, limit);
        FieldRun::store(message, row->kind, row->member, scalar.value);
        message.setBit(row->number);
        position = scalar.next;
        break;
      }
      case FieldKind::Bytes:
      case FieldKind::Text:
        position = FieldRun::decodeBytes(message.*row->member.bytes, position, limit, decoding);
        break;
      case FieldKind::Message:
        position = FieldRun::decodeElement(message.*row->member.message, *row, position, limit, decoding);
        break;
      case FieldKind::RepeatedMessage:
        position = FieldRun::decodeElements(message.*row->member.messages, *row, position, limit, decoding);
        break;
      case FieldKind::RepeatedUInt32:
        position = FieldRun::decodeNumbers(message.*row->member.unsigned32List, key.value, position, limit, decoding);
        break;
      case FieldKind::RepeatedSInt32:
        position = FieldRun::decodeNumbers(message.*row->member.signed32List, key.value, position, limit, decoding);
        break;
    }
    if (position == nullptr) return nullptr;
    progress = {position, &descriptor.scalars[index + 1]};
    // One look, so that fields in another order cost little more than that. The key that there is not has all bits.
    const bool mayBeNext = position < limit && *position == static_cast<std::uint8_t>(progress.expected->shortKey &
                                                                                      progress.expected->longKey);
    if (mayBeNext) progress = decodeExpected(message, progress, limit, decoding);
  }
  return progress.position;
}

}  // namespace probeview
