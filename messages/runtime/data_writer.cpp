// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/data_writer.h"

#include <algorithm>
#include <cstring>
#include <utility>

#include "messages/runtime/codable.h"

namespace probeview {

std::vector<std::uint8_t> PBDataWriter::takeBytes() {
  buffer_.resize(size_);
  size_ = 0;
  return std::exchange(buffer_, {});
}

void PBDataWriter::grow(std::size_t count) {
  buffer_.resize(std::max({std::size_t{256}, 2 * buffer_.size(), size_ + count}));
}

std::uint8_t* PBDataWriter::closeLongRecord(std::uint8_t* position, std::size_t offset) {
  const std::size_t length = offsetOf(position) - offset - 1;
  // What has been written moves up for the rest of its length.
  const std::size_t extra = wire::varintSize(length) - 1;
  position = reserve(position, extra);
  std::uint8_t* record = buffer_.data() + offset;
  std::memmove(record + 1 + extra, record + 1, length);
  wire::writeVarint(record, length);
  return position + extra;
}

namespace {

void writeVarintField(PBDataWriter& writer, std::uint64_t value, std::uint32_t fieldNumber) {
  std::uint8_t* out = writer.reserve(2 * wire::longestVarint);
  if (fieldNumber != PBDataWriterNoField) {
    out = wire::writeVarint(out, std::uint64_t{fieldNumber} << 3 | static_cast<unsigned>(wire::WireType::Varint));
  }
  writer.commit(wire::writeVarint(out, value));
}

}  // namespace

void PBDataWriterWriteUint64Field(PBDataWriter& writer, std::uint64_t value, std::uint32_t fieldNumber) {
  writeVarintField(writer, value, fieldNumber);
}

void PBDataWriterWriteUint32Field(PBDataWriter& writer, std::uint32_t value, std::uint32_t fieldNumber) {
  writeVarintField(writer, value, fieldNumber);
}

void PBDataWriterWriteInt32Field(PBDataWriter& writer, std::int32_t value, std::uint32_t fieldNumber) {
  writeVarintField(writer, static_cast<std::uint64_t>(std::int64_t{value}), fieldNumber);
}

void PBDataWriterWriteSint32Field(PBDataWriter& writer, std::int32_t value, std::uint32_t fieldNumber) {
  writeVarintField(writer, wire::zigZag(value), fieldNumber);
}

void PBDataWriterWriteBOOLField(PBDataWriter& writer, bool value, std::uint32_t fieldNumber) {
  writeVarintField(writer, value ? 1 : 0, fieldNumber);
}

void PBDataWriterWriteDataField(PBDataWriter& writer, std::span<const std::uint8_t> value, std::uint32_t fieldNumber) {
  std::uint8_t* out = writer.reserve(2 * wire::longestVarint + value.size());
  if (fieldNumber != PBDataWriterNoField) {
    out = wire::writeVarint(out,
                            std::uint64_t{fieldNumber} << 3 | static_cast<unsigned>(wire::WireType::LengthDelimited));
  }
  out = wire::writeVarint(out, value.size());
  if (!value.empty()) std::memcpy(out, value.data(), value.size());
  writer.commit(out + value.size());
}

void PBDataWriterWriteStringField(PBDataWriter& writer, std::string_view value, std::uint32_t fieldNumber) {
  PBDataWriterWriteDataField(writer, {reinterpret_cast<const std::uint8_t*>(value.data()), value.size()}, fieldNumber);
}

void PBDataWriterWriteSubmessage(PBDataWriter& writer, const PBCodable& message, std::uint32_t fieldNumber) {
  PBWriterMark mark;
  PBDataWriterPlaceMark(writer, mark, fieldNumber);
  message.writeTo(writer);
  PBDataWriterRecallMark(writer, mark);
}

void PBDataWriterPlaceMark(PBDataWriter& writer, PBWriterMark& mark, std::uint32_t fieldNumber) {
  std::uint8_t* out = writer.reserve(wire::longestVarint + 1);
  if (fieldNumber != PBDataWriterNoField) {
    out = wire::writeVarint(out,
                            std::uint64_t{fieldNumber} << 3 | static_cast<unsigned>(wire::WireType::LengthDelimited));
  }
  writer.commit(out);
  mark.offset = writer.size();
  writer.commit(out + 1);
}

void PBDataWriterRecallMark(PBDataWriter& writer, const PBWriterMark& mark) {
  writer.commit(writer.closeRecord(writer.reserve(0), mark.offset));
}

}  // namespace probeview
