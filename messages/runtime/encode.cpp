// SPDX-License-Identifier: Apache-2.0
#include <cstring>

#include "messages/runtime/table_walker.h"

namespace probeview {

namespace {

// A key of a field number below 64 takes at most two bytes, a length at most five.
constexpr std::size_t recordHeadBound = 2 + 5;

std::uint8_t* writeKey(std::uint8_t* out, std::uint32_t key) noexcept {
  if (key < 0x80) {
    *out = static_cast<std::uint8_t>(key);
    return out + 1;
  }
  out[0] = static_cast<std::uint8_t>(key | 0x80);
  out[1] = static_cast<std::uint8_t>(key >> 7);
  return out + 2;
}

}  // namespace

void TableWalker::encode(const PBCodable& message, PBDataWriter& writer) {
  encodeFields(message, message.descriptor(), writer);
}

void TableWalker::encodeFields(const PBCodable& message, const MessageDescriptor& descriptor, PBDataWriter& writer) {
  // There is always room for all scalars of the message, so that they are written without asking.
  std::uint8_t* out = writer.reserve(descriptor.scalarBound);
  // Writes one length-delimited field. Its content may move the buffer.
  const auto writeRecord = [&](std::uint32_t key, const auto& writeContent) {
    writer.commit(out);
    writer.commit(writeKey(writer.reserve(recordHeadBound), key));
    const std::size_t start = writer.size();
    writer.commit(writer.reserve(1) + 1);
    writeContent();
    writer.closeRecord(start);
    out = writer.reserve(descriptor.scalarBound);
  };
  for (const FieldDescriptor& row : descriptor.fields()) {
    switch (row.kind) {
      case FieldKind::UInt64:
        if (!message.hasBit(row.number)) break;
        out = wire::writeVarint(writeKey(out, row.key), message.*row.member.unsigned64);
        break;
      case FieldKind::UInt32:
        if (!message.hasBit(row.number)) break;
        out = wire::writeVarint(writeKey(out, row.key), message.*row.member.unsigned32);
        break;
      case FieldKind::Int32:
      case FieldKind::Enumeration:
        if (!message.hasBit(row.number)) break;
        out = wire::writeVarint(writeKey(out, row.key),
                                static_cast<std::uint64_t>(std::int64_t{message.*row.member.signed32}));
        break;
      case FieldKind::SInt32:
        if (!message.hasBit(row.number)) break;
        out = wire::writeVarint(writeKey(out, row.key), wire::zigZag(message.*row.member.signed32));
        break;
      case FieldKind::Bool:
        if (!message.hasBit(row.number)) break;
        out = writeKey(out, row.key);
        *out++ = message.*row.member.truth ? 1 : 0;
        break;
      case FieldKind::Bytes:
      case FieldKind::Text: {
        const PBByteField& field = message.*row.member.bytes;
        if (!field.isPresent()) break;
        const std::span<const std::uint8_t> bytes = field.bytes();
        writer.commit(out);
        out = writer.reserve(recordHeadBound + bytes.size() + descriptor.scalarBound);
        out = wire::writeVarint(writeKey(out, row.key), bytes.size());
        if (!bytes.empty()) std::memcpy(out, bytes.data(), bytes.size());
        out += bytes.size();
        break;
      }
      case FieldKind::Message: {
        const PBCodable* element = (message.*row.member.message).element();
        if (element != nullptr) writeRecord(row.key, [&] { encodeFields(*element, *row.element, writer); });
        break;
      }
      case FieldKind::RepeatedMessage: {
        const PBMessageList& list = message.*row.member.messages;
        for (std::size_t index = 0; index < list.count(); ++index) {
          writeRecord(row.key, [&] { encodeFields(list[index], *row.element, writer); });
        }
        break;
      }
      case FieldKind::RepeatedUInt32: {
        const std::span<const std::uint32_t> values = (message.*row.member.unsigned32List).values();
        if (values.empty()) break;
        writeRecord(row.key, [&] {
          std::uint8_t* next = writer.reserve(5 * values.size());
          for (const std::uint32_t value : values) next = wire::writeVarint(next, value);
          writer.commit(next);
        });
        break;
      }
      case FieldKind::RepeatedSInt32: {
        const std::span<const std::int32_t> values = (message.*row.member.signed32List).values();
        if (values.empty()) break;
        writeRecord(row.key, [&] {
          std::uint8_t* next = writer.reserve(5 * values.size());
          for (const std::int32_t value : values) next = wire::writeVarint(next, wire::zigZag(value));
          writer.commit(next);
        });
        break;
      }
    }
  }
  writer.commit(out);
}

}  // namespace probeview
