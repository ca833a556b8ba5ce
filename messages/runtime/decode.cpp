// SPDX-License-Identifier: Apache-2.0
#include <cstdio>

#include "messages/runtime/metric_utility.h"
#include "messages/runtime/table_walker.h"

namespace probeview {

// What the decoding of one payload shares between the records nested in it.
struct TableWalker::Decoding {
  PBCodable& root;
  LineSink* log;
  const std::uint8_t* tail;  // the last few bytes of the payload, which are read with care

  Block& block() { return blockOf(root); }
};

// How far a record has been decoded, and which field is expected next.
struct TableWalker::Progress {
  const std::uint8_t* position;
  const ScalarRow* expected;
};

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

// Hands over the numbers of one occurrence of a repeated scalar, packed or single. A last number inside which the data
// ends is handed over as 0 before decoding fails.
template <typename Add>
const std::uint8_t* decodeNumbers(std::uint64_t key, const std::uint8_t* position, const std::uint8_t* limit,
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

// A scalar from its varint. Inline, because it is most of what the loop over expected fields does.
[[gnu::always_inline]] inline void storeScalar(PBCodable& message, FieldKind kind, const FieldMember& member,
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

// Whether the key that stands at the position is that of the scalar.
template <int KeySize>
bool isNext(const ScalarRow& scalar, const std::uint8_t* position) noexcept {
  if constexpr (KeySize == 1) return position[0] == scalar.shortKey;
  return static_cast<std::uint32_t>(position[0] | position[1] << 8) == scalar.longKey;
}

// How many bytes before the payload's end the tail begins: a key of two bytes and a value of two fit before it, and
// with some more room the eight bytes in which longer values are read at once.
constexpr std::ptrdiff_t tailSize = 3;
constexpr std::ptrdiff_t roomForLongValue = 10 - tailSize;

}  // namespace

bool PBCodable::readFrom(PBDataReader& reader) { return TableWalker::decode(*this, reader); }

bool TableWalker::decode(PBCodable& message, PBDataReader& reader) {
  if (reader.hasError_) return false;
  const std::ptrdiff_t size = reader.limit_ - reader.position_;
  Decoding decoding{message, reader.log_, size > tailSize ? reader.limit_ - tailSize : reader.position_};
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
  const Progress progress = decodeExpected(message, {position, descriptor.scalars}, limit, decoding);
  if (progress.position == limit) return limit;
  return decodeOthers(message, descriptor, progress, limit, decoding);
}

// Decodes scalars for as long as each is the field that is expected next and has a key of so many bytes.
template <int KeySize>
[[gnu::always_inline]] inline TableWalker::Progress TableWalker::decodeRun(PBCodable& message, Progress progress,
                                                                           const std::uint8_t* limit,
                                                                           const std::uint8_t* tail,
                                                                           std::uint64_t& hasBits) noexcept {
  // Before the tail nothing is asked byte by byte.
  const std::uint8_t* const stop = limit < tail ? limit : tail;
  while (progress.position < stop && isNext<KeySize>(*progress.expected, progress.position)) {
    const ScalarRow& scalar = *progress.expected;
    const std::uint8_t* next = progress.position + KeySize + 1;
    std::uint64_t value = next[-1];
    if (value >= 0x80) [[unlikely]] {
      const std::uint64_t second = *next++;
      if (second < 0x80) [[likely]] {
        value += (second << 7) - 0x80;
      } else {
        if (tail - progress.position < roomForLongValue) break;
        const wire::Varint varint = wire::readUpToEightBytes(next - 2);
        if (varint.next == nullptr) break;
        next = varint.next;
        value = varint.value;
      }
    }
    if (next > limit) break;
    storeScalar(message, scalar.kind, scalar.member, value);
    hasBits |= scalar.hasBit;
    progress = {next, progress.expected + 1};
  }
  // In the tail the same, with care, for scalars of one byte.
  while (limit - progress.position > KeySize && isNext<KeySize>(*progress.expected, progress.position) &&
         progress.position[KeySize] < 0x80) {
    const ScalarRow& scalar = *progress.expected;
    storeScalar(message, scalar.kind, scalar.member, progress.position[KeySize]);
    hasBits |= scalar.hasBit;
    progress = {progress.position + KeySize + 1, progress.expected + 1};
  }
  return progress;
}

// Decodes scalars for as long as each is the field that is expected next: who encodes a message writes its fields in
// order, so this is where most of the time goes. Stops, before the key, at whatever else there is: another field, a
// field that is no scalar, a value that the record cuts off. The caller goes on from there. It calls nothing, so that
// all that it needs stays in registers.
[[gnu::always_inline]] inline TableWalker::Progress TableWalker::decodeExpected(PBCodable& message, Progress progress,
                                                                                const std::uint8_t* limit,
                                                                                const Decoding& decoding) noexcept {
  std::uint64_t hasBits = 0;
  progress = decodeRun<1>(message, progress, limit, decoding.tail, hasBits);
  if (progress.expected->longKey != ScalarRow::none)
    progress = decodeRun<2>(message, progress, limit, decoding.tail, hasBits);
  message._has |= hasBits;
  return progress;
}

// Elements of a list that follow one another, each behind the same key; the first key has been read.
const std::uint8_t* TableWalker::decodeElements(PBMessageList& list, const FieldDescriptor& row,
                                                const std::uint8_t* position, const std::uint8_t* limit,
                                                Decoding& decoding) {
  Block& block = decoding.block();
  const MessageDescriptor& descriptor = *row.element;
  while (true) {
    PBCodable* element = makeElement(descriptor, block);
    list.addLocal(element, block);
    const Record record = readRecord(position, limit);
    if (record.end == nullptr) return nullptr;
    if (decodeRecord(*element, descriptor, record.begin, record.end, decoding) == nullptr) return nullptr;
    position = readKey(record.end, limit, row.key);
    if (position == record.end) return position;
  }
}

// Goes on where decodeExpected() has stopped.
const std::uint8_t* TableWalker::decodeOthers(PBCodable& message, const MessageDescriptor& descriptor,
                                              Progress progress, const std::uint8_t* limit, Decoding& decoding) {
  while (progress.position < limit) {
    const wire::Varint key = wire::readVarint(progress.position, limit);
    if (key.next == nullptr) return nullptr;
    const std::uint8_t* position = key.next;
    if ((key.value & 7) == static_cast<unsigned>(wire::WireType::EndGroup)) return position;
    const FieldDescriptor* row = descriptor.rows + (progress.expected - descriptor.scalars);
    if (key.value != row->expectedKey) {
      // Only 16 bits of a field number count.
      const auto number = static_cast<std::uint16_t>(key.value >> 3);
      // Before the fields: one that has the number of a metric is written, but never decoded.
      if (KBBMetricUtility::isMetricId(number)) {
        KBBMetricUtility::isValidMetricIdTag(number, descriptor.name, decoding.log);
        const wire::Varint dropped = wire::readVarint(position, limit);
        logUnknownTag(decoding.log, number, dropped.value);
        if (dropped.next == nullptr) return nullptr;
        progress.position = dropped.next;
        continue;
      }
      row = descriptor.field(number);
      if (row == nullptr) {
        progress.position = wire::skipValue(position, limit, key.value & 7);
        if (progress.position == nullptr) return nullptr;
        continue;
      }
    }
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
        storeScalar(message, row->kind, row->member, scalar.value);
        message.setBit(row->number);
        position = scalar.next;
        break;
      }
      case FieldKind::Bytes:
      case FieldKind::Text: {
        const Record record = readRecord(position, limit);
        if (record.end == nullptr) return nullptr;
        (message.*row->member.bytes).set({record.begin, record.end}, decoding.block());
        position = record.end;
        break;
      }
      case FieldKind::Message: {
        // Attached before it is decoded: what was decoded before a fault stays.
        PBCodable* element = makeElement(*row->element, decoding.block());
        (message.*row->member.message).setLocal(element);
        const Record record = readRecord(position, limit);
        if (record.end == nullptr) return nullptr;
        if (decodeRecord(*element, *row->element, record.begin, record.end, decoding) == nullptr) return nullptr;
        // Also when an end of group has ended the element early.
        position = record.end;
        break;
      }
      case FieldKind::RepeatedMessage:
        position = decodeElements(message.*row->member.messages, *row, position, limit, decoding);
        break;
      case FieldKind::RepeatedUInt32:
        position = decodeNumbers(key.value, position, limit, [&](std::uint32_t element) {
          (message.*row->member.unsigned32List).add(element, decoding.block());
        });
        break;
      case FieldKind::RepeatedSInt32:
        position = decodeNumbers(key.value, position, limit, [&](std::uint32_t element) {
          (message.*row->member.signed32List).add(wire::unZigZag(element), decoding.block());
        });
        break;
    }
    if (position == nullptr) return nullptr;
    progress = {position, descriptor.scalars + (row - descriptor.rows) + 1};
    if (position < limit) progress = decodeExpected(message, progress, limit, decoding);
  }
  return progress.position;
}

}  // namespace probeview
