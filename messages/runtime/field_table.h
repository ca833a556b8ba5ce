// SPDX-License-Identifier: Apache-2.0
//
// How a message class is written: as the table of its fields, one row each, in the order number, key of the dictionary
// form, property and its capitalized form, type, and what the field means. A row makes the member, the accessors and
// the field's descriptor. A number used twice in one class or a type that does not exist does not compile, nor does a
// row whose names disagree: key, property and the accessors are the same letters.
//
//   class KCellularLteTxPower final : public PBCodable {
//     PB_MESSAGE(KCellularLteTxPower, "Uplink transmit power, per subframe.", "\"UMTS Tx Power\"")
//     PB_FIELD(1, "timestamp",     timestamp,    Timestamp,    uint64, timestamp, "Time of the values");
//     PB_LIST (2, "tx_power_info", txPowerInfos, TxPowerInfos, txPowerInfo, TxPowerInfo,
//              repeated<message<TxPowerInfo>>, "One entry per subframe");
//   };
//
// and, in one source file, PB_DEFINE(KCellularLteTxPower), or, for a class whose decoding drops some numbers,
// PB_DEFINE(KCellularLteTxPower, rule) with a constexpr DropRule. The accessors that the rows make:
//
//   PB_FIELD   a number or truth value: timestamp(), setTimestamp(value), hasTimestamp(), setHasTimestamp(present).
//              A field that is not present reads as 0; its last value is back when it is made present again.
//   PB_OBJECT  bytes, a text or a single nested message: guti(), setGuti(value), hasGuti(); setGuti(nullptr) takes it
//              away, and setGuti({}), which may mean that or an empty value, does not compile. Absent bytes and texts
//              read as empty, an absent message as null.
//   PB_LIST    nested messages: txPowerInfos() to walk through them, setTxPowerInfos(list), clearTxPowerInfos(),
//              addTxPowerInfo(handle or message), addTxPowerInfo() for a new one, txPowerInfosCount(),
//              txPowerInfoAtIndex(index). Handles share, messages are copied.
//   PB_VALUES  repeated numbers: csTxPwrs(), csTxPwrsCount(), clearCsTxPwrs(), addCsTxPwr(value),
//              csTxPwrAtIndex(index), setCsTxPwrs(values, count).
//   An index that is too large throws std::out_of_range, "idx (7) is out of range (3)".
//
// What a field means stands behind its type: for numbers the quantity, a name of the namespace `quantities` of where
// the table stands, then for all a text, which leaves unit, range and clause to the quantity, then, where they apply,
// the mark `personal` and a ViewerNote. What a class means is its text and the pages that show it. Tables that are not
// published leave all that out.
#pragma once

#include <array>
#include <new>
#include <span>

#include "messages/runtime/codable.h"
#include "messages/runtime/decode_in_order.h"
#include "messages/runtime/dictionary.h"
#include "messages/runtime/encode.h"
#include "messages/runtime/field_meaning.h"

namespace probeview {

template <unsigned Number>
struct FieldNumber {};

namespace detail {

// What {} may be as well as a null pointer. Without it {} would be one: no class can be made of {} as directly.
enum class EmptyBraces {};

// The key as it is printed, with all around it, is one constant, so that it is printed by copying; the name lies in it.
consteval std::string_view nameIn(std::string_view printedKey) {
  if (printedKey.size() < Key::longestFramed) throw "a key is copied with what stands behind it";
  const std::string_view name = printedKey.substr(1, printedKey.find("\": ") - 1);
  for (const char character : name) {
    const bool isLetter = (character >= 'a' && character <= 'z') || (character >= 'A' && character <= 'Z');
    if (!isLetter && !(character >= '0' && character <= '9') && character != '_') throw "a key is an identifier";
  }
  return name;
}

constexpr char lowerCase(char letter) {
  return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
}

// Whether the accessors' name is the property's with its first letter in upper case.
constexpr bool isCapitalized(std::string_view property, std::string_view accessor) {
  return property.substr(1) == accessor.substr(1) && property[0] == lowerCase(accessor[0]) &&
         property[0] != accessor[0];
}

// Whether key and property are the same letters. A list's property may be the plural, of its key and of its element's
// name.
constexpr bool isNamedAfter(std::string_view property, std::string_view key, bool isList) {
  std::size_t at = 0;
  for (const char letter : key) {
    if (letter == '_') continue;
    if (at == property.size() || lowerCase(property[at++]) != lowerCase(letter)) return false;
  }
  return at == property.size() || (isList && property.substr(at) == "s");
}

template <typename Message, unsigned Number>
inline constexpr bool hasField = requires {
  Message::pbField(FieldNumber<Number>{});
};

template <typename Message>
consteval std::size_t countFields() {
  return []<std::size_t... Numbers>(std::index_sequence<Numbers...>) {
    return (std::size_t{0} + ... + std::size_t{hasField<Message, Numbers>});
  }
  (std::make_index_sequence<fieldNumberLimit>{});
}

// The rule of a class that decodes all that it knows.
constexpr bool dropNothing(std::uint32_t, std::string_view, LineSink*) { return false; }

// All rows of the class, ordered by number whatever their order in the class, and the row that ends them.
template <typename Message, DropRule* drops>
consteval auto collectFields() {
  std::array<FieldDescriptor, countFields<Message>() + 1> rows;
  std::size_t count = 0;
  const auto collect = [&]<std::size_t Number>() {
    if constexpr (hasField<Message, Number>) rows[count++] = Message::pbField(FieldNumber<Number>{});
  };
  [&]<std::size_t... Numbers>(std::index_sequence<Numbers...>) { (collect.template operator()<Numbers>(), ...); }
  (std::make_index_sequence<fieldNumberLimit>{});
  for (FieldDescriptor& row : rows) {
    row.isDecoded = row.key != 0 && !drops(row.number, {}, nullptr);
  }
  return rows;
}

template <typename Message, DropRule* drops>
inline constexpr auto fieldRows = collectFields<Message, drops>();

// In the order of the rows. Those of a table that is not published are empty.
template <typename Message>
consteval auto collectMeanings() {
  std::array<FieldMeaning, countFields<Message>()> meanings;
  std::size_t count = 0;
  const auto collect = [&]<std::size_t Number>() {
    if constexpr (hasField<Message, Number>) {
      if constexpr (requires { Message::pbMeaning(FieldNumber<Number>{}); }) {
        meanings[count] = Message::pbMeaning(FieldNumber<Number>{});
      }
      ++count;
    }
  };
  [&]<std::size_t... Numbers>(std::index_sequence<Numbers...>) { (collect.template operator()<Numbers>(), ...); }
  (std::make_index_sequence<fieldNumberLimit>{});
  return meanings;
}

template <typename Message>
inline constexpr auto fieldMeanings = collectMeanings<Message>();

template <typename Message, DropRule* drops = dropNothing>
consteval MessageDescriptor describeMessage(std::string_view name) {
  constexpr const auto& rows = fieldRows<Message, drops>;
  constexpr std::size_t count = rows.size() - 1;
  MessageDescriptor descriptor{};
  descriptor.name = name;
  descriptor.rows = rows.data();
  descriptor.rowCount = count;
  descriptor.rowOfNumber.fill(count);
  descriptor.scalarBound = EncoderOf<rows>::roomFrom(0);
  descriptor.isFlat = true;
  for (std::size_t index = 0; index < count; ++index) {
    const FieldDescriptor& row = rows[index];
    descriptor.rowOfNumber[row.number] = static_cast<std::uint8_t>(index);
    if (!isScalar(row.kind)) descriptor.isFlat = false;
  }
  descriptor.size = sizeof(Message);
  descriptor.decodeRecord = DecoderOf<Message, rows>::decodeRecord;
  descriptor.decodeElements = DecoderOf<Message, rows>::decodeElements;
  descriptor.encodeFields = EncoderOf<rows>::encodeFields;
  descriptor.dictionary = DictionaryOf<rows>::make;
  descriptor.makeElement = [](void* memory, Block& block) -> PBCodable* { return Message::make(memory, block); };
  descriptor.make = []() -> std::unique_ptr<PBCodable> { return std::make_unique<Message>(); };
  descriptor.renew = [](PBCodable& message) { Message::renew(static_cast<Message&>(message)); };
  descriptor.drops = drops;
  descriptor.meaning = Message::pbMeaning();
  descriptor.meanings = fieldMeanings<Message>.data();
  return descriptor;
}

}  // namespace detail

// Macros, because a row must make names: of a member, of its accessors and of its descriptor.

#define PB_MESSAGE(Class, ...)                                                                               \
 public:                                                                                                     \
  Class() noexcept = default;                                                                                \
  Class(const Class& other) : PBCodable() { copyFrom(other); }                                               \
  Class(Class&& other) noexcept : PBCodable() { moveFrom(other); }                                           \
  Class& operator=(const Class& other) {                                                                     \
    assignFrom(other);                                                                                       \
    return *this;                                                                                            \
  }                                                                                                          \
  static const ::probeview::MessageDescriptor pbDescriptor;                                                  \
  static constexpr ::probeview::MessageMeaning pbMeaning() { return {__VA_ARGS__}; }                         \
  const ::probeview::MessageDescriptor& descriptor() const noexcept override;                                \
  std::unique_ptr<Class> copyWithZone() const { return std::make_unique<Class>(*this); }                     \
  void copyTo(Class& target) const { PBCodable::copyTo(target); }                                            \
  void mergeFrom(const Class& other) { PBCodable::mergeFrom(other); }                                        \
  friend bool operator==(const Class& left, const Class& right) noexcept { return left.isEqual(right); }     \
  static Class* make(void* memory, ::probeview::Block& block) noexcept { return new (memory) Class(block); } \
  static void renew(Class& message) noexcept {                                                               \
    message.~Class();                                                                                        \
    new (&message) Class;                                                                                    \
  }                                                                                                          \
                                                                                                             \
 private:                                                                                                    \
  explicit Class(::probeview::Block& block) noexcept : PBCodable(block) {}                                   \
  using Self = Class;

#define PB_DEFINE(Class, ...)                                                         \
  constinit const ::probeview::MessageDescriptor Class::pbDescriptor =                \
      ::probeview::detail::describeMessage<Class __VA_OPT__(, ) __VA_ARGS__>(#Class); \
  const ::probeview::MessageDescriptor& Class::descriptor() const noexcept { return pbDescriptor; }

#define PB_NAMES(key, property, Property, isList)                                                            \
  static_assert(::probeview::detail::isNamedAfter(#property, key, isList), key " and " #property " differ"); \
  static_assert(::probeview::detail::isCapitalized(#property, #Property), #property " and " #Property " differ");

#define PB_ELEMENT_NAMES(property, single, Single)                                                                 \
  static_assert(::probeview::detail::isNamedAfter(#property, #single, true), #single " and " #property " differ"); \
  static_assert(::probeview::detail::isCapitalized(#single, #Single), #single " and " #Single " differ");

#define PB_MEANING(number, ...)                                                                       \
  __VA_OPT__(static constexpr ::probeview::FieldMeaning pbMeaning(::probeview::FieldNumber<number>) { \
    return ::probeview::FieldMeaning(__VA_ARGS__);                                                    \
  })

// As long as what is copied at once (Key::framed()).
#define PB_PADDING "                                "

#define PB_ROW(number, key, property, type)                                                                     \
  static constexpr ::probeview::FieldDescriptor pbField(::probeview::FieldNumber<number>) {                     \
    return type::describe(number, ::probeview::detail::nameIn("\"" key "\": " PB_PADDING), &Self::_##property); \
  }                                                                                                             \
                                                                                                                \
 private:                                                                                                       \
  type::Stored _##property {}

#define PB_FIELD(number, key, property, Property, type, ...)                                       \
 public:                                                                                           \
  type::Stored property() const noexcept { return hasBit(number) ? _##property : type::Stored{}; } \
  void set##Property(type::Stored value) noexcept {                                                \
    _##property = value;                                                                           \
    setBit(number);                                                                                \
  }                                                                                                \
  bool has##Property() const noexcept { return hasBit(number); }                                   \
  void setHas##Property(bool present) noexcept { setBit(number, present); }                        \
  PB_NAMES(key, property, Property, false)                                                         \
  PB_MEANING(number __VA_OPT__(, quantities::) __VA_ARGS__)                                        \
  PB_ROW(number, key, property, type)

#define PB_OBJECT(number, key, property, Property, type, ...)              \
 public:                                                                   \
  type::Value property() const noexcept { return type::get(_##property); } \
  void set##Property(type::Value value) {                                  \
    noteOwnedMemory();                                                     \
    type::set(_##property, std::move(value), block());                     \
  }                                                                        \
  void set##Property(std::nullptr_t) noexcept { _##property.clear(); }     \
  void set##Property(::probeview::detail::EmptyBraces) = delete;           \
  bool has##Property() const noexcept { return _##property.isPresent(); }  \
  PB_NAMES(key, property, Property, false)                                 \
  PB_MEANING(number __VA_OPT__(, ) __VA_ARGS__)                            \
  PB_ROW(number, key, property, type)

#define PB_LIST(number, key, property, Property, single, Single, type, ...)                               \
 public:                                                                                                  \
  type::View property() const noexcept { return {_##property.elements(), _##property.count()}; }          \
  void set##Property(type::View elements) { type::set(_##property, *this, elements); }                    \
  void set##Property(std::span<const type::Handle> elements) { type::set(_##property, *this, elements); } \
  void clear##Property() noexcept { _##property.clear(); }                                                \
  void add##Single(type::Handle element) { type::add(_##property, *this, std::move(element)); }           \
  type::Element& add##Single() {                                                                          \
    auto element = type::Handle::make();                                                                  \
    type::Element& added = *element;                                                                      \
    add##Single(std::move(element));                                                                      \
    return added;                                                                                         \
  }                                                                                                       \
  std::size_t property##Count() const noexcept { return _##property.count(); }                            \
  type::Handle single##AtIndex(std::size_t index) const { return type::at(_##property, index); }          \
  PB_NAMES(key, property, Property, true)                                                                 \
  PB_ELEMENT_NAMES(property, single, Single)                                                              \
  PB_MEANING(number __VA_OPT__(, ) __VA_ARGS__)                                                           \
  PB_ROW(number, key, property, type)

#define PB_VALUES(number, key, property, Property, single, Single, type, ...)                           \
 public:                                                                                                \
  const type::Number* property() const noexcept { return _##property.data(); }                          \
  std::size_t property##Count() const noexcept { return _##property.count(); }                          \
  void clear##Property() noexcept { _##property.clear(); }                                              \
  void add##Single(type::Number value) {                                                                \
    noteOwnedMemory();                                                                                  \
    _##property.add(value);                                                                             \
  }                                                                                                     \
  type::Number single##AtIndex(std::size_t index) const { return _##property.at(index); }               \
  void set##Property(std::span<const type::Number> values) {                                            \
    noteOwnedMemory();                                                                                  \
    _##property.set(values);                                                                            \
  }                                                                                                     \
  void set##Property(const type::Number* values, std::size_t count) { set##Property({values, count}); } \
  PB_NAMES(key, property, Property, true)                                                               \
  PB_ELEMENT_NAMES(property, single, Single)                                                            \
  PB_MEANING(number __VA_OPT__(, quantities::) __VA_ARGS__)                                             \
  PB_ROW(number, key, property, type)

}  // namespace probeview
