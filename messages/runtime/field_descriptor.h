// SPDX-License-Identifier: Apache-2.0
//
// What the runtime knows of a message class: one constant row per field.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <string_view>

#include "messages/runtime/byte_field.h"
#include "messages/runtime/enumeration.h"
#include "messages/runtime/field_meaning.h"
#include "messages/runtime/message_list.h"
#include "messages/runtime/repeated_scalar.h"

namespace probeview {

class LineSink;
class PBCodable;
class PBDataWriter;
struct Decoding;
struct MessageDescriptor;

enum class FieldKind : std::uint8_t {
  UInt64,
  UInt32,
  Int32,
  Enumeration,  // a signed 32-bit number with names
  SInt32,       // a signed 32-bit number, ZigZag on the wire
  Bool,
  Bytes,
  Text,  // UTF-8
  Message,
  RepeatedMessage,
  RepeatedUInt32,  // packed
  RepeatedSInt32,  // packed, each ZigZag on the wire
};

constexpr bool isScalar(FieldKind kind) noexcept { return kind <= FieldKind::Bool; }
constexpr bool isRepeated(FieldKind kind) noexcept { return kind >= FieldKind::RepeatedMessage; }

// Which member of the message holds the field; the field's kind says which of them it is.
union FieldMember {
  constexpr FieldMember() noexcept : none(nullptr) {}
  constexpr explicit FieldMember(std::uint64_t PBCodable::*member) noexcept : unsigned64(member) {}
  constexpr explicit FieldMember(std::uint32_t PBCodable::*member) noexcept : unsigned32(member) {}
  constexpr explicit FieldMember(std::int32_t PBCodable::*member) noexcept : signed32(member) {}
  constexpr explicit FieldMember(bool PBCodable::*member) noexcept : truth(member) {}
  constexpr explicit FieldMember(PBByteField PBCodable::*member) noexcept : bytes(member) {}
  constexpr explicit FieldMember(PBMessageField PBCodable::*member) noexcept : message(member) {}
  constexpr explicit FieldMember(PBMessageList PBCodable::*member) noexcept : messages(member) {}
  constexpr explicit FieldMember(PBRepeatedUInt32 PBCodable::*member) noexcept : unsigned32List(member) {}
  constexpr explicit FieldMember(PBRepeatedInt32 PBCodable::*member) noexcept : signed32List(member) {}

  std::nullptr_t none;
  std::uint64_t PBCodable::*unsigned64;
  std::uint32_t PBCodable::*unsigned32;
  std::int32_t PBCodable::*signed32;  // also enumerations
  bool PBCodable::*truth;
  PBByteField PBCodable::*bytes;  // also texts
  PBMessageField PBCodable::*message;
  PBMessageList PBCodable::*messages;
  PBRepeatedUInt32 PBCodable::*unsigned32List;
  PBRepeatedInt32 PBCodable::*signed32List;
};

struct FieldDescriptor {
  std::uint32_t key = 0;  // as it stands on the wire: number and wire type
  std::uint16_t number = 0;
  FieldKind kind = FieldKind::UInt64;
  bool isDecoded = false;  // not: what comes under this number is dropped
  FieldMember member;
  // The key in the dictionary form, such as tx_power_info. It lies in memory as it is printed: "tx_power_info": with
  // the quotation marks, the colon and the blank around it.
  std::string_view name;
  const EnumerationTable* enumeration = nullptr;  // of an enumeration
  const MessageDescriptor* element = nullptr;     // of a nested message, single or repeated
};

// Whether whatever bears that number is dropped when a message of that class is decoded; says so to the log if there is
// one.
using DropRule = bool(std::uint32_t number, std::string_view className, LineSink* log);

// A field number is below this, so that the bits of all fields fit into one word.
inline constexpr std::uint16_t fieldNumberLimit = 64;

struct MessageDescriptor {
  std::string_view name;  // such as "KCellularLteTxPower"
  // In ascending order of their numbers; one that is no field stands after the last.
  const FieldDescriptor* rows;
  std::uint16_t rowCount;
  // Where the field of that number stands in the rows; rowCount when there is none.
  std::array<std::uint8_t, fieldNumberLimit> rowOfNumber;
  std::uint16_t scalarBound;  // bytes that must be free to write all scalars of one message
  bool isFlat;                // scalars only: nothing that owns memory
  std::size_t size;           // bytes of an object
  // decode.h
  const std::uint8_t* (*decodeRecord)(PBCodable& message, const std::uint8_t* position, const std::uint8_t* limit,
                                      Decoding& decoding);
  const std::uint8_t* (*decodeElements)(PBMessageList& list, std::uint16_t keyBytes, const std::uint8_t* position,
                                        const std::uint8_t* limit, Decoding& decoding);
  // encode.h
  std::uint8_t* (*encodeFields)(const PBCodable& message, std::uint8_t* out, PBDataWriter& writer);
  // The dictionary form (dictionary.h).
  Dictionary (*dictionary)(const PBCodable& message);
  // Makes a message in memory of the given block, to which it belongs from then on.
  PBCodable* (*makeElement)(void* memory, Block& block);
  std::unique_ptr<PBCodable> (*make)();
  // Destroys the message and makes an empty one in its place.
  void (*renew)(PBCodable& message);
  DropRule* drops;
  MessageMeaning meaning;
  const FieldMeaning* meanings;  // in the order of the rows

  std::span<const FieldDescriptor> fields() const noexcept { return {rows, rowCount}; }
  const FieldMeaning& meaningOf(const FieldDescriptor& row) const noexcept { return meanings[&row - rows]; }
  // The row behind the last when there is no such field.
  const FieldDescriptor& rowOf(std::uint64_t number) const noexcept {
    return rows[number < fieldNumberLimit ? rowOfNumber[number] : rowCount];
  }
  // Null when there is no such field.
  const FieldDescriptor* field(std::uint64_t number) const noexcept {
    const FieldDescriptor& row = rowOf(number);
    return &row < rows + rowCount ? &row : nullptr;
  }
  const FieldDescriptor* fieldNamed(std::string_view fieldName) const noexcept {
    for (const FieldDescriptor& candidate : fields()) {
      if (candidate.name == fieldName) return &candidate;
    }
    return nullptr;
  }
};

}  // namespace probeview
