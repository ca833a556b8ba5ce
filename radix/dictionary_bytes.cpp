// SPDX-License-Identifier: Apache-2.0
#include "radix/dictionary_bytes.h"

#include <bit>
#include <string_view>
#include <utility>

#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"
#include "messages/runtime/field_table.h"

namespace radix {

namespace wire {

using probeview::PBCodable;

// clang-format off

// One entry of a dictionary, or one value of a list (without a key). Lists and dictionaries inside are again one Items,
// encoded as bytes, so that a reader decides how deep it follows.
class Item final : public PBCodable {
  PB_MESSAGE(Item)
  PB_OBJECT(1, "key",     key,     Key,     string);
  PB_FIELD (2, "kind",    kind,    Kind,    uint32);  // as ItemKind
  PB_FIELD (3, "number",  number,  Number,  uint64);  // integers, truth values, the bits of reals
  PB_OBJECT(4, "content", content, Content, bytes);   // texts, bytes, lists, dictionaries
};

class Items final : public PBCodable {
  PB_MESSAGE(Items)
  PB_LIST(1, "item", items, Items, item, Item, repeated<message<Item>>);
};

// clang-format on

// The numbers of the value kinds on the wire.
enum class ItemKind : std::uint32_t {
  Int32 = 1,
  UInt32 = 2,
  Int64 = 3,
  UInt64 = 4,
  Bool = 5,
  Float = 6,
  Double = 7,
  Text = 8,
  Bytes = 9,
  List = 10,
  Dictionary = 11,
};

PB_DEFINE(Item)
PB_DEFINE(Items)

}  // namespace wire

namespace {

using probeview::Dictionary;
using probeview::Key;
using probeview::List;
using probeview::PBDataReader;
using probeview::PBDataWriter;
using probeview::Value;
using probeview::ValueKind;
using wire::ItemKind;

// Deeper than any command or reply is nested.
constexpr int deepestNesting = 16;

std::span<const std::uint8_t> bytesOf(std::string_view text) {
  return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
}

std::string_view textOf(std::span<const std::uint8_t> bytes) {
  return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

std::vector<std::uint8_t> encodeItems(const wire::Items& items) {
  PBDataWriter writer;
  items.writeTo(writer);
  return writer.takeBytes();
}

void fill(wire::Item& item, const Value& value);

std::vector<std::uint8_t> encodeList(const List& list) {
  wire::Items items;
  for (const Value& value : list) fill(items.addItem(), value);
  return encodeItems(items);
}

void setNumber(wire::Item& item, ItemKind kind, std::uint64_t number) {
  item.setKind(static_cast<std::uint32_t>(kind));
  item.setNumber(number);
}

void setContent(wire::Item& item, ItemKind kind, std::span<const std::uint8_t> content) {
  item.setKind(static_cast<std::uint32_t>(kind));
  item.setContent(content);
}

void fill(wire::Item& item, const Value& value) {
  switch (value.kind()) {
    case ValueKind::Int32:
      return setNumber(item, ItemKind::Int32, static_cast<std::uint64_t>(value.rawInt32()));
    case ValueKind::UInt32:
      return setNumber(item, ItemKind::UInt32, value.rawUInt32());
    case ValueKind::Int64:
      return setNumber(item, ItemKind::Int64, static_cast<std::uint64_t>(value.rawInt64()));
    case ValueKind::UInt64:
      return setNumber(item, ItemKind::UInt64, value.rawUInt64());
    case ValueKind::Bool:
      return setNumber(item, ItemKind::Bool, value.rawBool() ? 1 : 0);
    case ValueKind::Float:
      return setNumber(item, ItemKind::Float, std::bit_cast<std::uint32_t>(value.rawFloat()));
    case ValueKind::Double:
      return setNumber(item, ItemKind::Double, std::bit_cast<std::uint64_t>(value.rawDouble()));
    case ValueKind::Text:
      return setContent(item, ItemKind::Text, bytesOf(value.rawText()));
    case ValueKind::Bytes:
      return setContent(item, ItemKind::Bytes, *value.bytes());
    case ValueKind::List:
      return setContent(item, ItemKind::List, encodeList(*value.list()));
    case ValueKind::Dictionary:
      return setContent(item, ItemKind::Dictionary, encodeDictionary(*value.dictionary()));
  }
}

enum class Reading { Understood, Unknown, Malformed };

// Each takes so many levels below itself and no more.
bool readList(std::span<const std::uint8_t> bytes, int depth, List& list);
bool readDictionary(std::span<const std::uint8_t> bytes, int depth, Dictionary& dictionary);

Reading read(const wire::Item& item, int depth, Value& value) {
  const std::uint64_t number = item.number();
  switch (static_cast<ItemKind>(item.kind())) {
    case ItemKind::Int32:
      value = static_cast<std::int32_t>(number);
      return Reading::Understood;
    case ItemKind::UInt32:
      value = static_cast<std::uint32_t>(number);
      return Reading::Understood;
    case ItemKind::Int64:
      value = static_cast<std::int64_t>(number);
      return Reading::Understood;
    case ItemKind::UInt64:
      value = number;
      return Reading::Understood;
    case ItemKind::Bool:
      value = number != 0;
      return Reading::Understood;
    case ItemKind::Float:
      value = std::bit_cast<float>(static_cast<std::uint32_t>(number));
      return Reading::Understood;
    case ItemKind::Double:
      value = std::bit_cast<double>(number);
      return Reading::Understood;
    case ItemKind::Text:
      value = Value::text(textOf(item.content()));
      return Reading::Understood;
    case ItemKind::Bytes:
      value = Value::bytes(item.content());
      return Reading::Understood;
    case ItemKind::List: {
      List list;
      if (depth == 0 || !readList(item.content(), depth - 1, list)) return Reading::Malformed;
      value = std::move(list);
      return Reading::Understood;
    }
    case ItemKind::Dictionary: {
      Dictionary dictionary;
      if (depth == 0 || !readDictionary(item.content(), depth - 1, dictionary)) return Reading::Malformed;
      value = std::move(dictionary);
      return Reading::Understood;
    }
  }
  return Reading::Unknown;
}

// Hands over each item that is understood. False when the bytes are neither a list nor a dictionary.
template <typename Add>
bool readItems(std::span<const std::uint8_t> bytes, int depth, const Add& add) {
  wire::Items items;
  PBDataReader reader(bytes);
  if (!items.readFrom(reader)) return false;
  for (const wire::Item& item : items.items()) {
    Value value;
    const Reading reading = read(item, depth, value);
    if (reading == Reading::Malformed) return false;
    if (reading == Reading::Understood) add(item, std::move(value));
  }
  return true;
}

bool readList(std::span<const std::uint8_t> bytes, int depth, List& list) {
  return readItems(bytes, depth, [&](const wire::Item&, Value&& value) { list.append(std::move(value)); });
}

bool readDictionary(std::span<const std::uint8_t> bytes, int depth, Dictionary& dictionary) {
  return readItems(bytes, depth, [&](const wire::Item& item, Value&& value) {
    dictionary.append(Key::copy(item.key()), std::move(value));
  });
}

}  // namespace

std::vector<std::uint8_t> encodeDictionary(const Dictionary& dictionary) {
  wire::Items items;
  for (const auto& [key, value] : dictionary) {
    wire::Item& item = items.addItem();
    item.setKey(key.text());
    fill(item, value);
  }
  return encodeItems(items);
}

std::optional<Dictionary> decodeDictionary(std::span<const std::uint8_t> bytes) {
  std::optional<Dictionary> dictionary(std::in_place);
  if (!readDictionary(bytes, deepestNesting, *dictionary)) dictionary.reset();
  return dictionary;
}

}  // namespace radix
