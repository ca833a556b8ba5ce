// SPDX-License-Identifier: Apache-2.0
//
// A walk over every field of every message, through its accessors. What each must be called, its number and its kind
// stand in every_field.inc, apart from the tables that the messages are made of.
#include <gtest/gtest.h>

#include <limits>
#include <map>
#include <memory>

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/metric_identifiers.h"
#include "messages/nas_messages.h"
#include "messages/registry.h"
#include "messages/umts_messages.h"
#include "tests/messages/support.h"

namespace probeview {
namespace {

// What the wire must hold, written here a second time and as plainly as possible.
void appendVarint(Bytes& out, std::uint64_t value) {
  for (; value >= 0x80; value >>= 7) out.push_back(static_cast<std::uint8_t>(value | 0x80));
  out.push_back(static_cast<std::uint8_t>(value));
}

Bytes varintField(unsigned number, std::uint64_t value) {
  Bytes out;
  appendVarint(out, number * 8);
  appendVarint(out, value);
  return out;
}

Bytes recordField(unsigned number, const Bytes& content) {
  Bytes out;
  appendVarint(out, number * 8 + 2);
  appendVarint(out, content.size());
  out.insert(out.end(), content.begin(), content.end());
  return out;
}

std::uint64_t onTheWire(FieldKind kind, std::int64_t value) {
  if (kind == FieldKind::SInt32) return static_cast<std::uint32_t>(value < 0 ? -2 * value - 1 : 2 * value);
  return static_cast<std::uint64_t>(value);  // negative enumerations are sign-extended to 64 bits
}

bool isDropped(unsigned number) { return number == 19; }

// Whatever the field is: the message, in which it alone is present, goes through everything that a message can do.
template <typename Message>
void checkMessage(const Message& message, unsigned number, std::string_view key, FieldKind kind, const Bytes& wire,
                  const Value& value) {
  const FieldDescriptor* field = message.descriptor().field(number);
  ASSERT_NE(field, nullptr);
  EXPECT_EQ(field->name, key);
  EXPECT_EQ(field->kind, kind);
  EXPECT_TRUE(message.hasField(*field));
  EXPECT_EQ(hexOf(encoded(message)), hexOf(wire));
  Dictionary expected;
  expected.append(Key::copy(key), value);
  EXPECT_EQ(message.dictionaryRepresentation(), expected);
  EXPECT_EQ(message.description(), std::string(message.className()) + " " + printed(expected));

  Message decoded;
  LineLog log;
  EXPECT_TRUE(decode(decoded, wire, &log));
  EXPECT_EQ(decoded == message, !isDropped(number));
  EXPECT_EQ(log.lines.empty(), !isDropped(number));

  const Message empty;
  const Message copy = message;
  EXPECT_EQ(copy, message);
  EXPECT_EQ(*message.copyWithZone(), message);
  Message target;
  message.copyTo(target);
  EXPECT_EQ(target, message);
  Message merged;
  merged.mergeFrom(message);
  EXPECT_EQ(merged, message);
  EXPECT_NE(message, empty);
  EXPECT_NE(empty, message);
  EXPECT_EQ(copy.hash(), message.hash());
  EXPECT_EQ(merged.hash(), message.hash());
}

template <typename Message, typename Number>
void checkScalar(unsigned number, std::string_view key, FieldKind kind, Number (Message::*get)() const,
                 void (Message::*set)(Number), bool (Message::*has)() const, void (Message::*setHas)(bool),
                 const EnumerationTable* names = nullptr) {
  SCOPED_TRACE(std::string(key));
  Message message;
  EXPECT_FALSE((message.*has)());
  EXPECT_EQ((message.*get)(), Number{});
  for (const Number value : {Number{0}, Number{1}, static_cast<Number>(77), std::numeric_limits<Number>::max(),
                             std::numeric_limits<Number>::min()}) {
    (message.*set)(value);
    EXPECT_TRUE((message.*has)());
    EXPECT_EQ((message.*get)(), value);
    Value shownValue = value;
    if (names != nullptr) {
      const auto named = static_cast<std::int32_t>(value);
      shownValue = Value::text(names->name(named).empty() ? "(unknown: " + std::to_string(named) + ")"
                                                          : std::string(names->name(named)));
    }
    const auto signedValue = static_cast<std::int64_t>(value);
    checkMessage(message, number, key, kind, varintField(number, onTheWire(kind, signedValue)), shownValue);
    EXPECT_EQ(message.hash(), static_cast<std::uint64_t>(signedValue) * 0x9E3779B1U);
    Message other;
    (other.*set)(value == Number{0} ? Number{1} : Number{0});
    EXPECT_NE(other, message);
    other.mergeFrom(message);
    EXPECT_EQ(other, message);
  }
  (message.*set)(Number{1});
  (message.*setHas)(false);
  EXPECT_FALSE((message.*has)());
  EXPECT_EQ((message.*get)(), Number{0});
  EXPECT_EQ(message, Message());
  (message.*setHas)(true);
  EXPECT_EQ((message.*get)(), Number{1});
}

template <typename Message>
void checkBytes(unsigned number, std::string_view key, std::span<const std::uint8_t> (Message::*get)() const,
                void (Message::*set)(std::span<const std::uint8_t>), void (Message::*setNull)(std::nullptr_t),
                bool (Message::*has)() const) {
  SCOPED_TRACE(std::string(key));
  Message message;
  EXPECT_FALSE((message.*has)());
  EXPECT_TRUE((message.*get)().empty());
  for (const std::size_t size : {0U, 1U, 3U, 200U}) {
    const Bytes content(size, 0x62);
    (message.*set)(content);
    EXPECT_TRUE((message.*has)());
    EXPECT_EQ(hexOf((message.*get)()), hexOf(content));
    checkMessage(message, number, key, FieldKind::Bytes, recordField(number, content), Value::bytes(content));
  }
  (message.*setNull)(nullptr);
  EXPECT_FALSE((message.*has)());
  EXPECT_EQ(message, Message());
}

template <typename Message>
void checkText(unsigned number, std::string_view key, std::string_view (Message::*get)() const,
               void (Message::*set)(std::string_view), void (Message::*setNull)(std::nullptr_t),
               bool (Message::*has)() const) {
  SCOPED_TRACE(std::string(key));
  Message message;
  EXPECT_FALSE((message.*has)());
  for (const std::string_view text : {"", "internet", "gr\xC3\xBC\xC3\x9F dich", "\xC3("}) {
    (message.*set)(text);
    EXPECT_TRUE((message.*has)());
    EXPECT_EQ((message.*get)(), text);
    checkMessage(message, number, key, FieldKind::Text, recordField(number, Bytes(text.begin(), text.end())),
                 Value::text(text));
  }
  (message.*setNull)(nullptr);
  EXPECT_EQ(message, Message());
}

// A message of the class with its first field set.
template <typename Message>
Message sample() {
  Message message;
  const FieldDescriptor& first = message.descriptor().fields().front();
  const Bytes wire =
      first.kind == FieldKind::Bytes ? recordField(first.number, {1, 2, 3}) : varintField(first.number, 6);
  EXPECT_TRUE(decode(message, wire));
  EXPECT_TRUE(message.hasField(first));
  return message;
}

template <typename Message, typename Element>
void checkNested(unsigned number, std::string_view key, Shared<Element> (Message::*get)() const,
                 void (Message::*set)(Shared<Element>), void (Message::*setNull)(std::nullptr_t),
                 bool (Message::*has)() const) {
  SCOPED_TRACE(std::string(key));
  Message message;
  EXPECT_FALSE((message.*has)());
  EXPECT_FALSE((message.*get)());
  const Element element = sample<Element>();
  (message.*set)(element);
  EXPECT_TRUE((message.*has)());
  EXPECT_EQ(*(message.*get)(), element);
  checkMessage(message, number, key, FieldKind::Message, recordField(number, encoded(element)),
               element.dictionaryRepresentation());
  const Shared<Element> handle = Shared<Element>::make();
  (message.*set)(handle);
  EXPECT_EQ((message.*get)(), handle);
  (message.*setNull)(nullptr);
  EXPECT_EQ(message, Message());
}

template <typename Message, typename Element>
void checkList(unsigned number, std::string_view key, MessageView<Element> (Message::*get)() const,
               void (Message::*set)(MessageView<Element>), void (Message::*clear)(),
               void (Message::*add)(Shared<Element>), Element& (Message::*addNew)(),
               std::size_t (Message::*count)() const, Shared<Element> (Message::*at)(std::size_t) const) {
  SCOPED_TRACE(std::string(key));
  Message message;
  EXPECT_EQ((message.*count)(), 0U);
  const Element element = sample<Element>();
  (message.*add)(element);
  checkMessage(message, number, key, FieldKind::RepeatedMessage, recordField(number, encoded(element)),
               List{element.dictionaryRepresentation()});
  (message.*addNew)() = element;
  (message.*addNew)();
  EXPECT_EQ((message.*count)(), 3U);
  EXPECT_EQ(*(message.*at)(1), element);
  EXPECT_EQ((message.*get)()[2], Element());
  EXPECT_THROW((message.*at)(3), std::out_of_range);
  Bytes wire;
  for (int index = 0; index < 2; ++index) {
    const Bytes record = recordField(number, encoded(element));
    wire.insert(wire.end(), record.begin(), record.end());
  }
  const Bytes last = recordField(number, {});
  wire.insert(wire.end(), last.begin(), last.end());
  checkMessage(message, number, key, FieldKind::RepeatedMessage, wire,
               List{element.dictionaryRepresentation(), element.dictionaryRepresentation(), Dictionary()});
  Message other;
  (other.*set)((message.*get)());
  EXPECT_EQ(other, message);
  other.mergeFrom(message);
  EXPECT_EQ((other.*count)(), 6U);
  (message.*clear)();
  EXPECT_EQ(message, Message());
}

template <typename Message, typename Number>
void checkValues(unsigned number, std::string_view key, const Number* (Message::*get)() const,
                 std::size_t (Message::*count)() const, void (Message::*clear)(), void (Message::*add)(Number),
                 Number (Message::*at)(std::size_t) const, void (Message::*set)(const Number*, std::size_t)) {
  SCOPED_TRACE(std::string(key));
  constexpr FieldKind kind = std::is_signed_v<Number> ? FieldKind::RepeatedSInt32 : FieldKind::RepeatedUInt32;
  constexpr FieldKind single = std::is_signed_v<Number> ? FieldKind::SInt32 : FieldKind::UInt32;
  Message message;
  EXPECT_EQ((message.*count)(), 0U);
  const std::vector<Number> numbers = {1, 300, std::numeric_limits<Number>::max(), std::numeric_limits<Number>::min()};
  Bytes packed;
  List list;
  for (const Number value : numbers) {
    (message.*add)(value);
    appendVarint(packed, onTheWire(single, static_cast<std::int64_t>(value)));
    list.append(value);
  }
  EXPECT_EQ((message.*get)()[1], numbers[1]);
  EXPECT_EQ((message.*at)(3), numbers[3]);
  checkMessage(message, number, key, kind, recordField(number, packed), list);
  Message other;
  (other.*set)(numbers.data(), numbers.size());
  EXPECT_EQ(other, message);
  other.mergeFrom(message);
  EXPECT_EQ((other.*count)(), 8U);
  (message.*clear)();
  EXPECT_EQ(message, Message());
}

// The names of values, as they must be.
const std::map<std::string, std::map<std::int32_t, std::string>>& enumerations() {
  static const auto all = [] {
    std::map<std::string, std::map<std::int32_t, std::string>> found;
    std::map<std::int32_t, std::string>* current = nullptr;
#define ENUMERATION(name) current = &found[#name];
#define VALUE(number, name) (*current)[number] = name;
#include "tests/messages/every_enumeration.inc"
#undef ENUMERATION
#undef VALUE
    return found;
  }();
  return all;
}

void checkNames(const EnumerationTable* table, const std::string& name) {
  ASSERT_NE(table, nullptr);
  const auto& expected = enumerations().at(name);
  EXPECT_EQ(table->entries().size(), expected.size());
  for (std::int32_t value = -3; value < 300; ++value) {
    const auto found = expected.find(value);
    EXPECT_EQ(table->name(value), found == expected.end() ? std::string() : found->second) << name << " " << value;
    if (found != expected.end()) {
      EXPECT_EQ(table->value(found->second), value);
    }
  }
  EXPECT_EQ(table->name(std::numeric_limits<std::int32_t>::max()), "");
  EXPECT_EQ(table->name(std::numeric_limits<std::int32_t>::min()), "");
}

// Macros, because the rows of every_field.inc name accessors.
#define SCALAR(Class, number, key, property, Property, Type, Kind)                                  \
  TEST(EveryField, Class##_##property) {                                                            \
    checkScalar<Class, Type>(number, key, FieldKind::Kind, &Class::property, &Class::set##Property, \
                             &Class::has##Property, &Class::setHas##Property);                      \
  }
#define NAMED(Class, number, key, property, Property, Names)                                                       \
  TEST(EveryField, Class##_##property) {                                                                           \
    const EnumerationTable* names = Class::pbDescriptor.field(number)->enumeration;                                \
    checkNames(names, #Names);                                                                                     \
    checkScalar<Class, std::int32_t>(number, key, FieldKind::Enumeration, &Class::property, &Class::set##Property, \
                                     &Class::has##Property, &Class::setHas##Property, names);                      \
  }
#define BYTES(Class, number, key, property, Property)                                              \
  TEST(EveryField, Class##_##property) {                                                           \
    checkBytes<Class>(number, key, &Class::property, &Class::set##Property, &Class::set##Property, \
                      &Class::has##Property);                                                      \
  }
#define TEXT(Class, number, key, property, Property)                                              \
  TEST(EveryField, Class##_##property) {                                                          \
    checkText<Class>(number, key, &Class::property, &Class::set##Property, &Class::set##Property, \
                     &Class::has##Property);                                                      \
  }
#define NESTED(Class, number, key, property, Property, Element)                                              \
  TEST(EveryField, Class##_##property) {                                                                     \
    checkNested<Class, Element>(number, key, &Class::property, &Class::set##Property, &Class::set##Property, \
                                &Class::has##Property);                                                      \
  }
#define LIST(Class, number, key, property, Property, single, Single, Element)                                \
  TEST(EveryField, Class##_##property) {                                                                     \
    checkList<Class, Element>(number, key, &Class::property, &Class::set##Property, &Class::clear##Property, \
                              &Class::add##Single, &Class::add##Single, &Class::property##Count,             \
                              &Class::single##AtIndex);                                                      \
  }
#define VALUES(Class, number, key, property, Property, single, Single, Type)                                  \
  TEST(EveryField, Class##_##property) {                                                                      \
    checkValues<Class, Type>(number, key, &Class::property, &Class::property##Count, &Class::clear##Property, \
                             &Class::add##Single, &Class::single##AtIndex, &Class::set##Property);            \
  }
#include "tests/messages/every_field.inc"
#undef SCALAR
#undef NAMED
#undef BYTES
#undef TEXT
#undef NESTED
#undef LIST
#undef VALUES

TEST(Messages, HaveExactlyTheFieldsThatAreListed) {
  std::map<std::string, std::size_t> counts;
#define SCALAR(Class, ...) ++counts[#Class];
#define NAMED(Class, ...) ++counts[#Class];
#define BYTES(Class, ...) ++counts[#Class];
#define TEXT(Class, ...) ++counts[#Class];
#define NESTED(Class, ...) ++counts[#Class];
#define LIST(Class, ...) ++counts[#Class];
#define VALUES(Class, ...) ++counts[#Class];
#include "tests/messages/every_field.inc"
  EXPECT_EQ(counts.size(), 54U);
  EXPECT_EQ(messageClasses().size(), 54U);
  for (const MessageDescriptor* descriptor : messageClasses()) {
    EXPECT_EQ(descriptor->rowCount, counts[std::string(descriptor->name)]) << descriptor->name;
    EXPECT_EQ(messageClass(descriptor->name), descriptor);
    EXPECT_EQ(descriptor->make()->className(), descriptor->name);
  }
  EXPECT_EQ(messageClass("KCellularNothing"), nullptr);
}

TEST(Enumerations, TheGapsOfTheBandsHaveNoName) {
  KCellularWcdmaCellInfo message;
  for (const std::int32_t gap : {2, 20, 39, 49, 79, 89, 92, 119, 134, 135, 141, 142, 146, 151, 169, 255, -1}) {
    message.setWcdmaBand(gap);
    EXPECT_EQ(shown(message), "[\"wcdma_band\": \"(unknown: " + std::to_string(gap) + ")\"]");
  }
  message.setWcdmaBand(168);
  EXPECT_EQ(shown(message), R"(["wcdma_band": "SYS_BAND_UMTS_BAND6"])");
  message.setWcdmaBand(KCellularWcdmaCellInfo::WcdmaBand::SYS_BAND_LTE_EUTRAN_BAND43);
  EXPECT_EQ(message.wcdmaBand(), 162);
  EXPECT_EQ(KCellularWcdmaCellInfo::WcdmaBand::table.entries().size(), 78U);
  EXPECT_EQ(KCellularWcdmaCellInfo::WcdmaBand::table.value("SYS_BAND_UMTS_BAND6"), 168);
  EXPECT_EQ(KCellularWcdmaCellInfo::WcdmaBand::table.value("SYS_BAND_UMTS_BAND"), std::nullopt);
}

TEST(Enumerations, TheRrcCausesFrom31To253HaveNoNameAnd254And255Do) {
  KCellularLteRrcState message;
  for (std::int32_t cause = 31; cause <= 253; ++cause) {
    message.setCause(cause);
    EXPECT_EQ(shown(message), "[\"cause\": \"(unknown: " + std::to_string(cause) + ")\"]");
  }
  message.setCause(254);
  EXPECT_EQ(shown(message), R"(["cause": "KLTE_RRC_CAUSE_NO_SERVICE"])");
  message.setCause(255);
  EXPECT_EQ(shown(message), R"(["cause": "KLTE_RRC_CAUSE_NA"])");
}

TEST(Enumerations, InvalidIsANameOfTheFrameTypeAndThreeIsUnknown) {
  NbrEutra message;
  message.setFrameType(2);
  EXPECT_EQ(shown(message), R"(["frame_type": "INVALID"])");
  message.setFrameType(3);
  EXPECT_EQ(shown(message), R"x(["frame_type": "(unknown: 3)"])x");
}

TEST(Enumerations, TheDuplexModeIsFddOrTddOrUnknown) {
  KCellularWcdmaSelReselCellInfo message;
  message.setDuplexMode(0);
  EXPECT_EQ(shown(message), R"(["duplex_mode": "FDD"])");
  message.setDuplexMode(1);
  EXPECT_EQ(shown(message), R"(["duplex_mode": "TDD"])");
  message.setDuplexMode(2);
  EXPECT_EQ(shown(message), R"x(["duplex_mode": "(unknown: 2)"])x");
}

TEST(Enumerations, TheGsmStateHasNamesForOneAndTwoOnly) {
  KCellularGsmScellInfo message;
  message.setState(0);
  EXPECT_EQ(shown(message), R"x(["state": "(unknown: 0)"])x");
  message.setState(2);
  EXPECT_EQ(shown(message), R"(["state": "NON_DEDICATED_STATE"])");
}

TEST(Enumerations, TheRejectCausesHaveGapsAnd111IsNamedInBothTables) {
  KCellularMmContext mm;
  for (const std::int32_t gap : {1, 18, 19, 24, 26, 31, 35, 37, 39, 41, 62, 64, 94, 102, 110, 112}) {
    mm.setRejectCause(gap);
    EXPECT_EQ(shown(mm), "[\"reject_cause\": \"(unknown: " + std::to_string(gap) + ")\"]");
  }
  KCellularEmmContext emm;
  for (const std::int32_t gap : {1, 4, 27, 34, 36, 38, 41, 94, 102, 110, 112}) {
    emm.setRejectCause(gap);
    EXPECT_EQ(shown(emm), "[\"reject_cause\": \"(unknown: " + std::to_string(gap) + ")\"]");
  }
  mm.setRejectCause(111);
  EXPECT_EQ(shown(mm), R"(["reject_cause": "KNAS_MM_REJ_CAUSE_PROTOCOL_ERROR_UNSPECIFIED"])");
  emm.setRejectCause(111);
  EXPECT_EQ(shown(emm), R"(["reject_cause": "EMM_CAUSE_PROTOCOL_ERROR_UNSPECIFIED"])");
}

TEST(MetricIdentifiers, Are31OfWhich29AreHandled) {
  EXPECT_EQ(metricIdentifiers().size(), 31U);
  std::size_t handled = 0;
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    handled += metric.isHandled ? 1 : 0;
    EXPECT_EQ(metric.isHandled, metric.message != nullptr) << metric.name;
    EXPECT_EQ(metricWithId(metric.id), &metric);
    EXPECT_EQ(metricNamed(metric.name), &metric);
  }
  EXPECT_EQ(handled, 29U);
  EXPECT_EQ(metricWithId(0), nullptr);
  EXPECT_EQ(metricWithId(K_LTE_RRC_STATE | std::int64_t{1} << 32), nullptr);
  EXPECT_EQ(metricNamed("K_NOTHING"), nullptr);
  EXPECT_EQ(metricWithId(0x3C0013)->name, "K_SIM_FILE_INFO");
  EXPECT_EQ(metricWithId(0x3C4E04)->message, &KCellularLteRrcState::pbDescriptor);
  EXPECT_EQ(metricWithId(0x3C4E25)->name, "K_LTE_RLF");
  EXPECT_FALSE(metricNamed("K_LTE_SCELL_MEAS")->isHandled);
}

}  // namespace
}  // namespace probeview
