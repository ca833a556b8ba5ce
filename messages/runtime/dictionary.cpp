// SPDX-License-Identifier: Apache-2.0
#include <charconv>
#include <utility>

#include "messages/runtime/table_walker.h"

namespace probeview {

namespace {

Value unknownName(std::int32_t value) {
  char text[32] = "(unknown: ";
  char* end = std::to_chars(text + 10, text + sizeof text - 1, value).ptr;
  *end++ = ')';
  return Value::text({text, static_cast<std::size_t>(end - text)});
}

}  // namespace

Dictionary TableWalker::dictionary(const PBCodable& message, const MessageDescriptor& descriptor) {
  Dictionary dictionary;
  dictionary.reserve(descriptor.rowCount);
  const std::uint64_t has = message._has;
  for (const FieldDescriptor& row : descriptor.fields()) {
    if (isScalar(row.kind) && (has >> row.number & 1U) == 0) continue;
    const auto add = [&]<typename Content>(Content&& content) {
      dictionary.append(Key::framed(row.name), std::forward<Content>(content));
    };
    const auto addName = [&](std::int32_t value) {
      const std::string_view name = row.enumeration->name(value);
      if (!name.empty()) {
        add(Identifier{name});
      } else {
        add(unknownName(value));
      }
    };
    switch (row.kind) {
      case FieldKind::UInt64:
        add(message.*row.member.unsigned64);
        break;
      case FieldKind::UInt32:
        add(message.*row.member.unsigned32);
        break;
      case FieldKind::Int32:
      case FieldKind::SInt32:
        add(message.*row.member.signed32);
        break;
      case FieldKind::Enumeration:
        addName(message.*row.member.signed32);
        break;
      case FieldKind::Bool:
        add(message.*row.member.truth);
        break;
      case FieldKind::Bytes: {
        const PBByteField& field = message.*row.member.bytes;
        if (field.isPresent()) add(Value::bytes(field.bytes()));
        break;
      }
      case FieldKind::Text: {
        const PBByteField& field = message.*row.member.bytes;
        if (field.isPresent()) add(Value::text(field.text()));
        break;
      }
      case FieldKind::Message: {
        const PBCodable* element = (message.*row.member.message).element();
        if (element != nullptr) add(TableWalker::dictionary(*element, *row.element));
        break;
      }
      case FieldKind::RepeatedMessage: {
        const PBMessageList& elements = message.*row.member.messages;
        if (elements.count() == 0) break;
        List list;
        list.reserve(elements.count());
        for (std::size_t index = 0; index < elements.count(); ++index) {
          list.append(TableWalker::dictionary(elements[index], *row.element));
        }
        add(std::move(list));
        break;
      }
      case FieldKind::RepeatedUInt32: {
        const PBRepeatedUInt32& numbers = message.*row.member.unsigned32List;
        if (numbers.count() != 0) add(numbers.toList());
        break;
      }
      case FieldKind::RepeatedSInt32: {
        const PBRepeatedInt32& numbers = message.*row.member.signed32List;
        if (numbers.count() != 0) add(numbers.toList());
        break;
      }
    }
  }
  return dictionary;
}

}  // namespace probeview
