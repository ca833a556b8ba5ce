// SPDX-License-Identifier: Apache-2.0
//
// Decoding, in two tiers. Straight-line code, made for each class from its rows (decode_in_order.h), takes the fields
// for as long as they come in the order of their numbers, which is how they are written. Whatever else there is, from
// there to the end of the record, takes the one loop for all classes, decodeInAnyOrder(). Internal to the runtime.
//
// A payload is first copied to where some bytes more can be read behind it, so that hardly any look at it needs to ask
// whether it has ended; and into the message's block, if it has one, so that bytes and texts lie there already.
//
// Functions that read return the position behind what they have read, or null when decoding has failed.
#pragma once

#include <cstddef>
#include <cstdint>

#include "messages/runtime/codable.h"
#include "messages/runtime/wire_format.h"
#include "values/line_sink.h"

namespace probeview {

// What the records nested in one payload share.
struct Decoding {
  Block* block;  // of the message that is decoded; null where there is nothing but scalars
  LineSink* log;
};

// So many bytes can be read behind a payload: a key of two bytes and eight of a value, where one byte is left.
inline constexpr std::size_t decodingSlack = 9;

// Decodes a record whose fields may come in any order, or the rest of one.
const std::uint8_t* decodeInAnyOrder(PBCodable& message, const MessageDescriptor& descriptor,
                                     const std::uint8_t* position, const std::uint8_t* limit, Decoding& decoding);

// One occurrence of something that is no scalar, behind its key.

// What no row of the class decodes.
const std::uint8_t* passOver(const MessageDescriptor& descriptor, std::uint64_t key, const std::uint8_t* position,
                             const std::uint8_t* limit, const Decoding& decoding);
const std::uint8_t* decodeBytes(PBByteField& field, const std::uint8_t* position, const std::uint8_t* limit);
const std::uint8_t* decodeElement(PBMessageField& field, const MessageDescriptor& descriptor,
                                  const std::uint8_t* position, const std::uint8_t* limit, Decoding& decoding);
// Repeated numbers: all in one record if the key says so, else one.
const std::uint8_t* decodeNumbers(PBRepeatedUInt32& list, std::uint64_t key, const std::uint8_t* position,
                                  const std::uint8_t* limit, Decoding& decoding);
const std::uint8_t* decodeNumbers(PBRepeatedInt32& list, std::uint64_t key, const std::uint8_t* position,
                                  const std::uint8_t* limit, Decoding& decoding);

// A varint of at most eight bytes, null when it is longer. Out of line: seldom needed, and in many places.
wire::Varint readLongValue(const std::uint8_t* position) noexcept;

// A length-delimited record; its end is null when it runs past the limit.
struct Record {
  const std::uint8_t* begin;
  const std::uint8_t* end;
};

// The record that begins with its length at the position.
inline Record readRecord(const std::uint8_t* position, const std::uint8_t* limit) noexcept {
  const wire::Varint length = wire::readVarint(position, limit);
  if (length.next == nullptr || length.value > static_cast<std::uint64_t>(limit - length.next)) return {};
  return {length.next, length.next + length.value};
}

}  // namespace probeview
