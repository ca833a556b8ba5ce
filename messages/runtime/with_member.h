// SPDX-License-Identifier: Apache-2.0
//
// Internal to the runtime.
#pragma once

#include "messages/runtime/codable.h"

namespace probeview {

// Calls the function with the member in which each of the messages holds the row's field. Its type is one of
// std::uint64_t, std::uint32_t, std::int32_t, bool, PBByteField, PBMessageField, PBMessageList, PBRepeatedUInt32 and
// PBRepeatedInt32.
template <typename Function, typename... Messages>
decltype(auto) withMember(const FieldDescriptor& row, const Function& function, Messages&... messages) {
  switch (row.kind) {
    case FieldKind::UInt64:
      return function((messages.*row.member.unsigned64)...);
    case FieldKind::UInt32:
      return function((messages.*row.member.unsigned32)...);
    case FieldKind::Int32:
    case FieldKind::Enumeration:
    case FieldKind::SInt32:
      return function((messages.*row.member.signed32)...);
    case FieldKind::Bool:
      return function((messages.*row.member.truth)...);
    case FieldKind::Bytes:
    case FieldKind::Text:
      return function((messages.*row.member.bytes)...);
    case FieldKind::Message:
      return function((messages.*row.member.message)...);
    case FieldKind::RepeatedMessage:
      return function((messages.*row.member.messages)...);
    case FieldKind::RepeatedUInt32:
      return function((messages.*row.member.unsigned32List)...);
    case FieldKind::RepeatedSInt32:
      break;
  }
  return function((messages.*row.member.signed32List)...);
}

}  // namespace probeview
