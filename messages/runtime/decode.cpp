// SPDX-License-Identifier: Apache-2.0
#include <cstdio>

#include "messages/runtime/metric_utility.h"
#include "messages/runtime/table_walker.h"

namespace probeview {

// What the decoding of one payload shares between the records nested in it.
struct TableWalker::Decoding {
  PBCodable& root;
  LineSink* log;

  Block& block() { return blockOf(root); }
};

// The has-bits of the message being decoded, held in a register; what was decoded counts however decoding ends.
struct TableWalker::HasBits {
  explicit HasBits(PBCodable& decoded) noexcept : message(decoded), bits(decoded._has) {}
  HasBits(const HasBits&) = delete;
  HasBits& operator=(const HasBits&) = delete;
  ~HasBits() { message._has = bits; }

  PBCodable& message;
  std::uint64_t bits;
};

namespace {

void logUnknownTag(LineSink* log, std::uint32_t number, std::uint64_t value) {
  if (log == nullptr) return;
  char text[48];
  const int length = std::snprintf(text, sizeof text, "Unknown tag: %x:%u", number, static_cast<unsigned>(value));
  log->line({text, static_cast<std::size_t>(length)});
}

// The end of the length-delimited record that begins with its length at the position; null when the record runs past
// the limit. The position moves behind the length.
const std::uint8_t* readRecord(const std::uint8_t*& position, const std::uint8_t* limit) noexcept {
  std::uint64_t size = 0;
  const std::uint8_t* content = wire::readVarint(position, limit, size);
  if (content == nullptr || size > static_cast<std::uint64_t>(limit - content)) return nullptr;
  position = content;
  return content + size;
}

// Hands over the numbers of one occurrence of a repeated scalar, packed or single. A last number inside which the data
// ends is handed over as 0 before decoding fails.
template <typename Add>
const std::uint8_t* decodeNumbers(std::uint64_t key, const std::uint8_t* position, const std::uint8_t* limit,
                                  const Add& add) {
  std::uint64_t value = 0;
  if ((key & 7) != static_cast<unsigned>(wire::WireType::LengthDelimited)) {
    position = wire::readVarint(position, limit, value);
    add(static_cast<std::uint32_t>(value));
    return position;
  }
  const std::uint8_t* end = readRecord(position, limit);
  if (end == nullptr) return nullptr;
  while (position != nullptr && position < end) {
    position = wire::readVarint(position, end, value);
    add(static_cast<std::uint32_t>(value));
  }
  return position;
}

}  // namespace

bool TableWalker::decode(PBCodable& message, PBDataReader& reader) {
  if (reader.hasError_) return false;
  Decoding decoding{message, reader.log_};
  const std::uint8_t* end = decodeFields(message, message.descriptor(), reader.position_, reader.limit_, decoding);
  reader.hasError_ = end == nullptr;
  reader.position_ = end == nullptr ? reader.limit_ : end;
  return end != nullptr;
}

// Returns the position at which decoding ended, null when it failed.
const std::uint8_t* TableWalker::decodeFields(PBCodable& message, const MessageDescriptor& descriptor,
                                              const std::uint8_t* position, const std::uint8_t* limit,
                                              Decoding& decoding) {
  HasBits has(message);
  // Who encodes a message writes its fields in order: the next key is most likely that of the next row.
  const FieldDescriptor* expected = descriptor.rows;
  while (position < limit) {
    std::uint64_t key = 0;
    position = wire::readVarint(position, limit, key);
    if (position == nullptr) return nullptr;
    const FieldDescriptor* row = expected;
    // A payload may well hold the key that stands for a row which is never read.
    if (key != row->expectedKey || key == neverRead) {
      if ((key & 7) == static_cast<unsigned>(wire::WireType::EndGroup)) return position;
      // Only 16 bits of a field number count.
      const auto number = static_cast<std::uint16_t>(key >> 3);
      // Before the fields: one that has the number of a metric is written, but never decoded.
      if (KBBMetricUtility::isMetricId(number)) {
        KBBMetricUtility::isValidMetricIdTag(number, descriptor.name, decoding.log);
        std::uint64_t value = 0;
        position = wire::readVarint(position, limit, value);
        logUnknownTag(decoding.log, number, value);
        if (position == nullptr) return nullptr;
        continue;
      }
      row = descriptor.field(number);
      if (row == nullptr) {
        position = wire::skipValue(position, limit, key & 7);
        if (position == nullptr) return nullptr;
        continue;
      }
    }
    expected = row + 1;
    // The key's wire type plays no part, but for the two forms of repeated numbers. A scalar counts as present even if
    // the data ends inside it; it is 0 then.
    std::uint64_t value = 0;
    switch (row->kind) {
      case FieldKind::UInt64:
        position = wire::readVarint(position, limit, value);
        has.bits |= std::uint64_t{1} << row->number;
        message.*row->member.unsigned64 = value;
        break;
      case FieldKind::UInt32:
        position = wire::readVarint(position, limit, value);
        has.bits |= std::uint64_t{1} << row->number;
        message.*row->member.unsigned32 = static_cast<std::uint32_t>(value);
        break;
      case FieldKind::Int32:
      case FieldKind::Enumeration:
        position = wire::readVarint(position, limit, value);
        has.bits |= std::uint64_t{1} << row->number;
        message.*row->member.signed32 = static_cast<std::int32_t>(value);
        break;
      case FieldKind::SInt32:
        position = wire::readVarint(position, limit, value);
        has.bits |= std::uint64_t{1} << row->number;
        message.*row->member.signed32 = wire::unZigZag(static_cast<std::uint32_t>(value));
        break;
      case FieldKind::Bool:
        position = wire::readVarint(position, limit, value);
        has.bits |= std::uint64_t{1} << row->number;
        message.*row->member.truth = value != 0;
        break;
      case FieldKind::Bytes:
      case FieldKind::Text: {
        const std::uint8_t* end = readRecord(position, limit);
        if (end == nullptr) return nullptr;
        (message.*row->member.bytes).set({position, end}, decoding.block());
        position = end;
        break;
      }
      case FieldKind::Message: {
        // Attached before it is decoded: what was decoded before a fault stays.
        PBCodable* element = makeElement(*row->element, decoding.block());
        (message.*row->member.message).setLocal(element);
        const std::uint8_t* end = readRecord(position, limit);
        if (end == nullptr || decodeFields(*element, *row->element, position, end, decoding) == nullptr) return nullptr;
        position = end;
        break;
      }
      case FieldKind::RepeatedMessage: {
        PBCodable* element = makeElement(*row->element, decoding.block());
        (message.*row->member.messages).addLocal(element, decoding.block());
        const std::uint8_t* end = readRecord(position, limit);
        if (end == nullptr || decodeFields(*element, *row->element, position, end, decoding) == nullptr) return nullptr;
        position = end;
        expected = row;
        break;
      }
      case FieldKind::RepeatedUInt32:
        position = decodeNumbers(key, position, limit, [&](std::uint32_t number) {
          (message.*row->member.unsigned32List).add(number, decoding.block());
        });
        break;
      case FieldKind::RepeatedSInt32:
        position = decodeNumbers(key, position, limit, [&](std::uint32_t number) {
          (message.*row->member.signed32List).add(wire::unZigZag(number), decoding.block());
        });
        break;
    }
    if (position == nullptr) return nullptr;
  }
  return position;
}

}  // namespace probeview
