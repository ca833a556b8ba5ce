// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/encode.h"

#include <cstring>

namespace probeview {

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
  wire::writeWord(out, bytes | (0x8080808080808080U & ((std::uint64_t{1} << 8 * (size - 1)) - 1)));
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

std::uint8_t* writeLongValue(std::uint8_t* out, std::uint64_t value) noexcept {
  return value < std::uint64_t{1} << 56 ? writeUpToEightBytes(out, value) : wire::writeVarint(out, value);
}

void PBCodable::writeTo(PBDataWriter& writer) const {
  const MessageDescriptor& fields = descriptor();
  writer.commit(fields.encodeFields(*this, writer.reserve(fields.scalarBound), writer));
}

std::uint8_t* encodeBytes(std::span<const std::uint8_t> bytes, std::uint32_t key, std::uint8_t* out, std::size_t room,
                          PBDataWriter& writer) {
  out = writeKey(writer.reserve(out, recordHeadBound + bytes.size() + room), key);
  out = wire::writeVarint(out, bytes.size());
  std::memcpy(out, bytes.data(), bytes.size());
  return out + bytes.size();
}

namespace {

// A nested message: its key, its length, its fields.
[[gnu::always_inline]] inline std::uint8_t* encodeRecord(const PBCodable& element, const FieldDescriptor& row,
                                                         std::uint8_t* out, PBDataWriter& writer) {
  const MessageDescriptor& descriptor = *row.element;
  out = writeKey(writer.reserve(out, recordHeadBound + descriptor.scalarBound), row.key);
  const std::size_t offset = writer.offsetOf(out);
  return writer.closeRecord(descriptor.encodeFields(element, out + 1, writer), offset);
}

// Repeated numbers, each as the varint that is made of it.
template <typename Number, typename VarintOf>
std::uint8_t* encodePacked(std::span<const Number> numbers, std::uint32_t key, std::uint8_t* out, std::size_t room,
                           PBDataWriter& writer, const VarintOf& varintOf) {
  // A number takes five bytes at most; the length is filled in when it is known.
  out = writeKey(writer.reserve(out, recordHeadBound + 5 * numbers.size()), key);
  const std::size_t offset = writer.offsetOf(out);
  ++out;
  for (const Number number : numbers) out = wire::writeVarint(out, varintOf(number));
  return writer.reserve(writer.closeRecord(out, offset), room);
}

}  // namespace

std::uint8_t* encodeElement(const PBCodable& element, const FieldDescriptor& row, std::uint8_t* out, std::size_t room,
                            PBDataWriter& writer) {
  return writer.reserve(encodeRecord(element, row, out, writer), room);
}

std::uint8_t* encodeElements(const PBMessageList& list, const FieldDescriptor& row, std::uint8_t* out, std::size_t room,
                             PBDataWriter& writer) {
  const ElementPointer* const end = list.elements() + list.count();
  for (const ElementPointer* element = list.elements(); element != end; ++element) {
    out = encodeRecord(*element->get(), row, out, writer);
  }
  return writer.reserve(out, room);
}

std::uint8_t* encodeNumbers(const PBRepeatedUInt32& list, std::uint32_t key, std::uint8_t* out, std::size_t room,
                            PBDataWriter& writer) {
  return encodePacked(list.values(), key, out, room, writer, [](std::uint32_t number) { return number; });
}

std::uint8_t* encodeNumbers(const PBRepeatedInt32& list, std::uint32_t key, std::uint8_t* out, std::size_t room,
                            PBDataWriter& writer) {
  return encodePacked(list.values(), key, out, room, writer, wire::zigZag);
}

}  // namespace probeview
