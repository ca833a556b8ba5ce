// SPDX-License-Identifier: Apache-2.0
#include <bit>
#include <charconv>

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
  dictionary.reserve(descriptor.isFlat ? static_cast<std::size_t>(std::popcount(message._has)) : descriptor.rowCount);
  for (const FieldDescriptor& row : descriptor.fields()) {
    const Key key = Key::framed(row.name);
    switch (row.kind) {
      case FieldKind::UInt64:
        if (message.hasBit(row.number)) dictionary.append(key, message.*row.member.unsigned64);
        break;
      case FieldKind::UInt32:
        if (message.hasBit(row.number)) dictionary.append(key, message.*row.member.unsigned32);
        break;
      case FieldKind::Int32:
      case FieldKind::SInt32:
        if (message.hasBit(row.number)) dictionary.append(key, message.*row.member.signed32);
        break;
      case FieldKind::Enumeration:
        if (message.hasBit(row.number)) {
          const std::int32_t value = message.*row.member.signed32;
          const std::string_view name = row.enumeration->name(value);
          if (!name.empty()) {
            dictionary.append(key, Identifier{name});
          } else {
            dictionary.append(key, unknownName(value));
          }
        }
        break;
      case FieldKind::Bool:
        if (message.hasBit(row.number)) dictionary.append(key, message.*row.member.truth);
        break;
      case FieldKind::Bytes: {
        const PBByteField& field = message.*row.member.bytes;
        if (field.isPresent()) dictionary.append(key, Value::bytes(field.bytes()));
        break;
      }
      case FieldKind::Text: {
        const PBByteField& field = message.*row.member.bytes;
        if (field.isPresent()) dictionary.append(key, Value::text(field.text()));
        break;
      }
      case FieldKind::Message: {
        const PBCodable* element = (message.*row.member.message).element();
        if (element != nullptr) dictionary.append(key, TableWalker::dictionary(*element, *row.element));
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
        dictionary.append(key, std::move(list));
        break;
      }
      case FieldKind::RepeatedUInt32: {
        const PBRepeatedUInt32& numbers = message.*row.member.unsigned32List;
        if (numbers.count() != 0) dictionary.append(key, numbers.toList());
        break;
      }
      case FieldKind::RepeatedSInt32: {
        const PBRepeatedInt32& numbers = message.*row.member.signed32List;
        if (numbers.count() != 0) dictionary.append(key, numbers.toList());
        break;
      }
    }
  }
  return dictionary;
}

}  // namespace probeview
