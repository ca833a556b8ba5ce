// SPDX-License-Identifier: Apache-2.0
//
// Scalar fields between a message and the varints that stand for them on the wire. Internal to the runtime.
#pragma once

#include <cstddef>
#include <cstdint>

#include "messages/runtime/codable.h"
#include "messages/runtime/field_descriptor.h"
#include "messages/runtime/wire_format.h"

namespace probeview {

// A scalar from its varint.
[[gnu::always_inline]] inline void storeScalar(PBCodable& message, const FieldDescriptor& row,
                                               std::uint64_t value) noexcept {
  if (row.kind == FieldKind::UInt32) [[likely]] {
    message.*row.member.unsigned32 = static_cast<std::uint32_t>(value);
  } else if (row.kind == FieldKind::SInt32) [[likely]] {
    message.*row.member.signed32 = wire::unZigZag(static_cast<std::uint32_t>(value));
  } else if (row.kind == FieldKind::UInt64) {
    message.*row.member.unsigned64 = value;
  } else if (row.kind == FieldKind::Bool) {
    message.*row.member.truth = value != 0;
  } else {
    message.*row.member.signed32 = static_cast<std::int32_t>(value);
  }
}

// What a scalar's varint is to be.
[[gnu::always_inline]] inline std::uint64_t loadScalar(const PBCodable& message, const FieldDescriptor& row) noexcept {
  if (row.kind == FieldKind::UInt32) return message.*row.member.unsigned32;
  if (row.kind == FieldKind::SInt32) return wire::zigZag(message.*row.member.signed32);
  if (row.kind == FieldKind::Bool) return message.*row.member.truth ? 1 : 0;
  if (row.kind == FieldKind::UInt64) return message.*row.member.unsigned64;
  // Signed numbers that are not ZigZag are extended to 64 bits.
  return static_cast<std::uint64_t>(std::int64_t{message.*row.member.signed32});
}

// How many bytes the scalar takes at most, with its key; 0 if it is none.
constexpr std::size_t scalarBound(const FieldDescriptor& row) noexcept {
  const std::size_t keySize = wire::varintSize(row.key);
  switch (row.kind) {
    case FieldKind::UInt64:
    case FieldKind::Int32:  // negative numbers take ten bytes
    case FieldKind::Enumeration:
      return keySize + 10;
    case FieldKind::UInt32:
    case FieldKind::SInt32:
      return keySize + 5;
    case FieldKind::Bool:
      return keySize + 1;
    case FieldKind::Bytes:
    case FieldKind::Text:
    case FieldKind::Message:
    case FieldKind::RepeatedMessage:
    case FieldKind::RepeatedUInt32:
    case FieldKind::RepeatedSInt32:
      return 0;
  }
  return 0;
}

}  // namespace probeview
