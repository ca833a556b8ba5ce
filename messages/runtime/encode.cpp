// SPDX-License-Identifier: Apache-2.0
#include <bit>
#include <cstring>

#include "messages/runtime/scalar_run.h"
#include "messages/runtime/table_walker.h"

namespace probeview {

// Where the next byte goes, and the row of the field that goes there.
struct TableWalker::Output {
  std::uint8_t* out;
  const ScalarRow* row;
};

namespace {

// A key of a field number below 64 takes at most two bytes, a length at most five. Keys and short values are written
// together, so some bytes more than they need must be free.
constexpr std::size_t recordHeadBound = 2 + 5 + wordSlack;

// A varint of at most eight bytes, written at once; eight bytes must be free.
inline std::uint8_t* writeUpToEightBytes(std::uint8_t* out, std::uint64_t value) noexcept {
  // Seven bits for each byte move apart together: all eight, fours, pairs. To move some bits of a number up by n is to
  // add them to it 2^n - 1 times.
  std::uint64_t bytes = value + (value & 0x00FFFFFFF0000000U) * 15;
  bytes += (bytes & 0x0FFFC0000FFFC000U) * 3;
  bytes += bytes & 0x3F803F803F803F80U;
  const std::size_t size = wire::varintSize(value);
  ScalarRun::writeWord(out, bytes | (0x8080808080808080U & ((std::uint64_t{1} << 8 * (size - 1)) - 1)));
  return out + size;
}

std::uint8_t* writeKey(std::uint8_t* out, std::uint32_t key) noexcept {
  if (key < 0x80) [[likely]] {
    *out = static_cast<std::uint8_t>(key);
    return out + 1;
  }
  out[0] = static_cast<std::uint8_t>(key | 0x80);
  out[1] = static_cast<std::uint8_t>(key >> 7);
  return out + 2;
}

}  // namespace

std::uint8_t* ScalarRun::writeLongValue(std::uint8_t* out, std::uint64_t value) noexcept {
  return value < std::uint64_t{1} << 56 ? writeUpToEightBytes(out, value) : wire::writeVarint(out, value);
}

// Writes scalars with keys of so many bytes up to the next field that is no scalar, or to the end.
template <unsigned KeySize>
[[gnu::always_inline]] inline TableWalker::Output TableWalker::encodeRun(const PBCodable& message, Output output,
                                                                         const ScalarRow* end) noexcept {
  const std::uint64_t has = message._has;
  std::uint8_t* out = output.out;
  const ScalarRow* row = output.row;
  for (; row < end; ++row) {
    if ((has & row->hasBit) == 0) [[unlikely]] {
      if (isScalar(row->kind)) continue;
      break;
    }
    out = ScalarRun::write<KeySize>(out, row->keyBytes, ScalarRun::load(message, row->kind, row->member));
  }
  return {out, row};
}

// Writes scalars up to the next field that is none, or to the last. There is room for all of them, so nothing is asked
// of the writer, and nothing is called: all that this needs stays in registers.
[[gnu::always_inline]] inline TableWalker::Output TableWalker::encodeScalars(const PBCodable& message,
                                                                             const MessageDescriptor& descriptor,
                                                                             Output output) noexcept {
  const ScalarRow* const shortEnd = descriptor.scalars + descriptor.shortRowCount;
  output = encodeRun<1>(message, output, shortEnd);
  if (output.row < shortEnd || descriptor.shortRowCount == descriptor.rowCount) return output;
  return encodeRun<2>(message, output, descriptor.scalars + descriptor.rowCount);
}

void PBCodable::writeTo(PBDataWriter& writer) const { TableWalker::encode(*this, writer); }

void TableWalker::encode(const PBCodable& message, PBDataWriter& writer) {
  const MessageDescriptor& descriptor = message.descriptor();
  std::uint8_t* out = writer.reserve(descriptor.scalarBound);
  if (descriptor.isFlat) {
    writer.commit(descriptor.encodeFront(message, out));
  } else {
    writer.commit(encodeFields(message, descriptor, out, writer));
  }
}

// Room for all scalars of the message is there already, and is there again behind whatever else is written.
std::uint8_t* TableWalker::encodeFields(const PBCodable& message, const MessageDescriptor& descriptor,
                                        std::uint8_t* out, PBDataWriter& writer) {
  const ScalarRow* const end = descriptor.scalars + descriptor.rowCount;
  Output output = {descriptor.encodeFront(message, out), descriptor.scalars + descriptor.frontCount};
  while (output.row != end) {
    const FieldDescriptor& row = descriptor.rows[output.row - descriptor.scalars];
    out = output.out;
    if (row.kind == FieldKind::Bytes || row.kind == FieldKind::Text) {
      const PBByteField& field = message.*row.member.bytes;
      if (field.isPresent()) out = encodeBytes(field.bytes(), row, out, descriptor.scalarBound, writer);
    } else if (isPresent(message, row)) {
      out = writer.reserve(encodeObject(message, row, out, writer), descriptor.scalarBound);
    }
    output = {out, output.row + 1};
    if (output.row != end) output = encodeScalars(message, descriptor, output);
  }
  return output.out;
}

// Bytes or a text, with some room behind them.
inline std::uint8_t* TableWalker::encodeBytes(std::span<const std::uint8_t> bytes, const FieldDescriptor& row,
                                              std::uint8_t* out, std::size_t room, PBDataWriter& writer) {
  out = writeKey(writer.reserve(out, recordHeadBound + bytes.size() + room), row.key);
  out = wire::writeVarint(out, bytes.size());
  std::memcpy(out, bytes.data(), bytes.size());
  return out + bytes.size();
}

// A nested message: its key, its length, its fields.
[[gnu::always_inline]] inline std::uint8_t* TableWalker::encodeElement(const PBCodable& element,
                                                                       const FieldDescriptor& row, std::uint8_t* out,
                                                                       PBDataWriter& writer) {
  const MessageDescriptor& descriptor = *row.element;
  out = writeKey(writer.reserve(out, recordHeadBound + descriptor.scalarBound), row.key);
  if (descriptor.isFlat) {
    // Everything has its room, so the record does not move while it is written.
    std::uint8_t* const start = out;
    out = descriptor.encodeFront(element, start + 1);
    const std::ptrdiff_t length = out - start - 1;
    if (length >= 0x80) return writer.closeRecord(out, writer.offsetOf(start));
    *start = static_cast<std::uint8_t>(length);
    return out;
  }
  const std::size_t offset = writer.offsetOf(out);
  return writer.closeRecord(encodeFields(element, descriptor, out + 1, writer), offset);
}

// Not inline, so that its loop has the registers to itself.
[[gnu::noinline]] std::uint8_t* TableWalker::encodeElements(const PBMessageList& list, const FieldDescriptor& row,
                                                            std::uint8_t* out, PBDataWriter& writer) {
  const ElementPointer* const end = list.elements() + list.count();
  for (const ElementPointer* element = list.elements(); element != end; ++element) {
    out = encodeElement(*element->get(), row, out, writer);
  }
  return out;
}

std::uint8_t* TableWalker::encodeObject(const PBCodable& message, const FieldDescriptor& row, std::uint8_t* out,
                                        PBDataWriter& writer) {
  const auto writePacked = [&](const auto& values, const auto& valueOf) {
    // A number takes five bytes at most; the length is filled in when it is known.
    out = writeKey(writer.reserve(out, recordHeadBound + 5 * values.size() + 1), row.key);
    const std::size_t offset = writer.offsetOf(out);
    ++out;
    for (const auto value : values) out = wire::writeVarint(out, valueOf(value));
    return writer.closeRecord(out, offset);
  };
  switch (row.kind) {
    case FieldKind::UInt64:
    case FieldKind::UInt32:
    case FieldKind::Int32:
    case FieldKind::Enumeration:
    case FieldKind::SInt32:
    case FieldKind::Bool:
      return out;  // written with the scalars
    case FieldKind::Bytes:
    case FieldKind::Text:
      return encodeBytes((message.*row.member.bytes).bytes(), row, out, 0, writer);
    case FieldKind::Message:
      return encodeElement(*(message.*row.member.message).element(), row, out, writer);
    case FieldKind::RepeatedMessage:
      return encodeElements(message.*row.member.messages, row, out, writer);
    case FieldKind::RepeatedUInt32:
      return writePacked((message.*row.member.unsigned32List).values(), [](std::uint32_t value) { return value; });
    case FieldKind::RepeatedSInt32:
      return writePacked((message.*row.member.signed32List).values(), wire::zigZag);
  }
  return out;
}

}  // namespace probeview
