// SPDX-License-Identifier: Apache-2.0
//
// The dictionary form of messages: straight-line code that makes the entries of a message class in the order of its
// rows, itself made from the rows, so that keys, kinds and places are constants in it. Internal to the runtime.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <utility>

#include "messages/runtime/message_internals.h"
#include "values/dictionary.h"

namespace probeview {

// What is seldom met or long is made out of line.
List listOf(const PBMessageList& elements, const MessageDescriptor& descriptor);
Value unknownName(std::int32_t value);

template <const auto& Rows>
struct DictionaryOf {
  static Dictionary make(const PBCodable& message) {
    Dictionary dictionary;
    addAll(dictionary, message, std::make_index_sequence<Rows.size() - 1>{});
    return dictionary;
  }

 private:
  template <std::size_t... Indices>
  [[gnu::always_inline]] static void addAll(Dictionary& dictionary, const PBCodable& message,
                                            std::index_sequence<Indices...>) {
    const std::uint64_t presence = MessageInternals::presence(message);
    Dictionary::Filler entries(dictionary, sizeof...(Indices));
    (add<Indices>(entries, message, presence), ...);
  }

  template <std::size_t Index>
  [[gnu::always_inline]] static void add(Dictionary::Filler& entries, const PBCodable& message,
                                         std::uint64_t presence) {
    constexpr const FieldDescriptor& row = Rows[Index];
    const auto append = [&]<typename Content>(Content && content) __attribute__((always_inline)) {
      entries.append(Key::framed(row.name), std::forward<Content>(content));
    };
    if constexpr (isScalar(row.kind)) {
      if ((presence & std::uint64_t{1} << row.number) == 0) return;
      if constexpr (row.kind == FieldKind::UInt64) {
        append(message.*row.member.unsigned64);
      } else if constexpr (row.kind == FieldKind::UInt32) {
        append(message.*row.member.unsigned32);
      } else if constexpr (row.kind == FieldKind::Bool) {
        append(message.*row.member.truth);
      } else if constexpr (row.kind == FieldKind::Enumeration) {
        const std::int32_t value = message.*row.member.signed32;
        const std::string_view name = row.enumeration->name(value);
        if (!name.empty()) {
          append(Identifier{name});
        } else {
          append(unknownName(value));
        }
      } else {
        append(message.*row.member.signed32);
      }
    } else if constexpr (row.kind == FieldKind::Bytes) {
      const PBByteField& field = message.*row.member.bytes;
      if (field.isPresent()) append(Value::bytes(field.bytes()));
    } else if constexpr (row.kind == FieldKind::Text) {
      const PBByteField& field = message.*row.member.bytes;
      if (field.isPresent()) append(Value::text(field.text()));
    } else if constexpr (row.kind == FieldKind::Message) {
      const PBCodable* const element = (message.*row.member.message).element();
      if (element != nullptr) append(row.element->dictionary(*element));
    } else if constexpr (row.kind == FieldKind::RepeatedMessage) {
      const PBMessageList& elements = message.*row.member.messages;
      if (elements.count() != 0) append(listOf(elements, *row.element));
    } else if constexpr (row.kind == FieldKind::RepeatedUInt32) {
      const PBRepeatedUInt32& numbers = message.*row.member.unsigned32List;
      if (numbers.count() != 0) append(numbers.toList());
    } else {
      const PBRepeatedInt32& numbers = message.*row.member.signed32List;
      if (numbers.count() != 0) append(numbers.toList());
    }
  }
};

}  // namespace probeview
