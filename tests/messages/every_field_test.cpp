// SPDX-License-Identifier: Apache-2.0
//
// A walk over every field of every message, through its accessors. What each must be called, its number and its kind
// stand in every_field.inc, apart from the tables that the messages are made of.
#include <gtest/gtest.h>

#include <functional>
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
#include "tests/support/second_opinion.h"

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

// Below, what depends on a message's type does no more than call its functions; what they answer is checked by
// functions that are compiled once. There are dozens of classes and hundreds of fields, and each would be compiled with
// all of GoogleTest.

void expectSame(std::int64_t expected, std::int64_t found) { EXPECT_EQ(found, expected); }
void expectSame(std::uint64_t expected, std::uint64_t found) { EXPECT_EQ(found, expected); }
void expectThat(bool holds, const char* what) { EXPECT_TRUE(holds) << what; }
void expectOutOfRange(const std::function<void()>& access) { EXPECT_THROW(access(), std::out_of_range); }

void checkForms(const PBCodable& message, unsigned number, std::string_view key, FieldKind kind, const Bytes& wire,
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
}

struct Decoded {
  bool decodes;
  bool isSame;
  bool isQuiet;
};

void checkDecoded(const Decoded& decoded, bool dropped) {
  EXPECT_TRUE(decoded.decodes);
  EXPECT_EQ(decoded.isSame, !dropped);
  EXPECT_EQ(decoded.isQuiet, !dropped);
}

// Whatever the field is: the message, in which it alone is present, goes through everything that a message can do.
template <typename Message>
void checkMessage(const Message& message, unsigned number, std::string_view key, FieldKind kind, const Bytes& wire,
                  const Value& value) {
  checkForms(message, number, key, kind, wire, value);

  Message decoded;
  LineLog log;
  const bool decodes = decode(decoded, wire, &log);
  checkDecoded({.decodes = decodes, .isSame = decoded == message, .isQuiet = log.lines.empty()}, isDropped(number));

  const Message empty;
  const Message copy = message;
  expectThat(copy == message, "a copy is equal");
  expectThat(*message.copyWithZone() == message, "a copy that shares nothing is equal");
  Message target;
  message.copyTo(target);
  expectThat(target == message, "what it is copied to is equal");
  Message merged;
  merged.mergeFrom(message);
  expectThat(merged == message, "an empty message that it is merged into is equal");
  expectThat(message != empty && empty != message, "it differs from an empty one, both ways");
  expectSame(message.hash(), copy.hash());
  expectSame(message.hash(), merged.hash());
}

Value shownAs(std::int32_t value, const EnumerationTable& names) {
  return Value::text(names.name(value).empty() ? "(unknown: " + std::to_string(value) + ")"
                                               : std::string(names.name(value)));
}

template <typename Message, typename Number>
void checkScalar(unsigned number, std::string_view key, FieldKind kind, Number (Message::*get)() const,
                 void (Message::*set)(Number), bool (Message::*has)() const, void (Message::*setHas)(bool),
                 const EnumerationTable* names = nullptr) {
  SCOPED_TRACE(std::string(key));
  Message message;
  expectThat(!(message.*has)(), "absent at first");
  expectThat((message.*get)() == Number{}, "absent reads as 0");
  for (const Number value : {Number{0}, Number{1}, static_cast<Number>(77), std::numeric_limits<Number>::max(),
                             std::numeric_limits<Number>::min()}) {
    (message.*set)(value);
    expectThat((message.*has)(), "present when set");
    const auto signedValue = static_cast<std::int64_t>(value);
    expectSame(signedValue, static_cast<std::int64_t>((message.*get)()));
    const Value shownValue = names == nullptr ? Value(value) : shownAs(static_cast<std::int32_t>(value), *names);
    checkMessage(message, number, key, kind, varintField(number, onTheWire(kind, signedValue)), shownValue);
    expectSame(static_cast<std::uint64_t>(signedValue) * 0x9E3779B1U, message.hash());
    Message other;
    (other.*set)(value == Number{0} ? Number{1} : Number{0});
    expectThat(other != message, "another value makes another message");
    other.mergeFrom(message);
    expectThat(other == message, "what is merged in replaces");
  }
  (message.*set)(Number{1});
  (message.*setHas)(false);
  expectThat(!(message.*has)(), "absent when made absent");
  expectThat((message.*get)() == Number{0}, "made absent reads as 0");
  expectThat(message == Message(), "made absent leaves an empty message");
  (message.*setHas)(true);
  expectThat((message.*get)() == Number{1}, "made present again, its value is back");
}

template <typename Message>
void checkBytes(unsigned number, std::string_view key, std::span<const std::uint8_t> (Message::*get)() const,
                void (Message::*set)(std::span<const std::uint8_t>), void (Message::*setNull)(std::nullptr_t),
                bool (Message::*has)() const) {
  SCOPED_TRACE(std::string(key));
  Message message;
  expectThat(!(message.*has)(), "absent");
  expectThat((message.*get)().empty(), "absent reads as empty");
  for (const std::size_t size : {0U, 1U, 3U, 200U}) {
    const Bytes content(size, 0x62);
    (message.*set)(content);
    expectThat((message.*has)(), "present when set");
    expectThat(hexOf((message.*get)()) == hexOf(content), "what was set is there");
    checkMessage(message, number, key, FieldKind::Bytes, recordField(number, content), Value::bytes(content));
  }
  (message.*setNull)(nullptr);
  expectThat(!(message.*has)(), "absent");
  expectThat(message == Message(), "taken away leaves an empty message");
}

template <typename Message>
void checkText(unsigned number, std::string_view key, std::string_view (Message::*get)() const,
               void (Message::*set)(std::string_view), void (Message::*setNull)(std::nullptr_t),
               bool (Message::*has)() const) {
  SCOPED_TRACE(std::string(key));
  Message message;
  expectThat(!(message.*has)(), "absent");
  for (const std::string_view text : {"", "internet", "gr\xC3\xBC\xC3\x9F dich", "\xC3("}) {
    (message.*set)(text);
    expectThat((message.*has)(), "present when set");
    expectThat((message.*get)() == text, "what was set is there");
    checkMessage(message, number, key, FieldKind::Text, recordField(number, Bytes(text.begin(), text.end())),
                 Value::text(text));
  }
  (message.*setNull)(nullptr);
  expectThat(message == Message(), "taken away leaves an empty message");
}

// A message of the class with its first field set.
template <typename Message>
Message sample() {
  Message message;
  const FieldDescriptor& first = message.descriptor().fields().front();
  const Bytes wire =
      first.kind == FieldKind::Bytes ? recordField(first.number, {1, 2, 3}) : varintField(first.number, 6);
  expectThat(decode(message, wire) && message.hasField(first), "a first field can be decoded");
  return message;
}

template <typename Message, typename Element>
void checkNested(unsigned number, std::string_view key, Shared<Element> (Message::*get)() const,
                 void (Message::*set)(Shared<Element>), void (Message::*setNull)(std::nullptr_t),
                 bool (Message::*has)() const) {
  SCOPED_TRACE(std::string(key));
  Message message;
  expectThat(!(message.*has)(), "absent");
  expectThat(!(message.*get)(), "absent reads as null");
  const Element element = sample<Element>();
  (message.*set)(element);
  expectThat((message.*has)(), "present when set");
  expectThat(*(message.*get)() == element, "what was set is there");
  checkMessage(message, number, key, FieldKind::Message, recordField(number, encoded(element)),
               element.dictionaryRepresentation());
  const Shared<Element> handle = Shared<Element>::make();
  (message.*set)(handle);
  expectThat((message.*get)() == handle, "the handle is shared");
  (message.*setNull)(nullptr);
  expectThat(message == Message(), "taken away leaves an empty message");
}

template <typename Message, typename Element>
void checkList(unsigned number, std::string_view key, MessageView<Element> (Message::*get)() const,
               void (Message::*set)(MessageView<Element>), void (Message::*clear)(),
               void (Message::*add)(Shared<Element>), Element& (Message::*addNew)(),
               std::size_t (Message::*count)() const, Shared<Element> (Message::*at)(std::size_t) const) {
  SCOPED_TRACE(std::string(key));
  Message message;
  expectSame(std::uint64_t{0}, (message.*count)());
  const Element element = sample<Element>();
  (message.*add)(element);
  checkMessage(message, number, key, FieldKind::RepeatedMessage, recordField(number, encoded(element)),
               List{element.dictionaryRepresentation()});
  (message.*addNew)() = element;
  (message.*addNew)();
  expectSame(std::uint64_t{3}, (message.*count)());
  expectThat(*(message.*at)(1) == element, "what was added is there");
  expectThat((message.*get)()[2] == Element(), "a new element is empty");
  expectOutOfRange([&] { (message.*at)(3); });
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
  expectThat(other == message, "a list that was set is equal");
  other.mergeFrom(message);
  expectSame(std::uint64_t{6}, (other.*count)());
  (message.*clear)();
  expectThat(message == Message(), "taken away leaves an empty message");
}

template <typename Message, typename Number>
void checkValues(unsigned number, std::string_view key, const Number* (Message::*get)() const,
                 std::size_t (Message::*count)() const, void (Message::*clear)(), void (Message::*add)(Number),
                 Number (Message::*at)(std::size_t) const, void (Message::*set)(const Number*, std::size_t)) {
  SCOPED_TRACE(std::string(key));
  constexpr FieldKind kind = std::is_signed_v<Number> ? FieldKind::RepeatedSInt32 : FieldKind::RepeatedUInt32;
  constexpr FieldKind single = std::is_signed_v<Number> ? FieldKind::SInt32 : FieldKind::UInt32;
  Message message;
  expectSame(std::uint64_t{0}, (message.*count)());
  const std::vector<Number> numbers = {1, 300, std::numeric_limits<Number>::max(), std::numeric_limits<Number>::min()};
  Bytes packed;
  List list;
  for (const Number value : numbers) {
    (message.*add)(value);
    appendVarint(packed, onTheWire(single, static_cast<std::int64_t>(value)));
    list.append(value);
  }
  expectThat((message.*get)()[1] == numbers[1] && (message.*at)(3) == numbers[3], "what was added is there");
  checkMessage(message, number, key, kind, recordField(number, packed), list);
  Message other;
  (other.*set)(numbers.data(), numbers.size());
  expectThat(other == message, "numbers that were set are equal");
  other.mergeFrom(message);
  expectSame(std::uint64_t{8}, (other.*count)());
  (message.*clear)();
  expectThat(message == Message(), "taken away leaves an empty message");
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

// One test for each row of every_field.inc, registered by hand: TEST() would make a class of each. Macros, because the
// rows name accessors.
struct Row {
  const char* name;
  void (*check)();
};

constexpr Row rows[] = {
#define ROW(Class, property, ...) {#Class "_" #property, [] { __VA_ARGS__; }},
#define SCALAR(Class, number, key, property, Property, Type, Kind)                                    \
  ROW(Class, property,                                                                                \
      checkScalar<Class, Type>(number, key, FieldKind::Kind, &Class::property, &Class::set##Property, \
                               &Class::has##Property, &Class::setHas##Property))
#define NAMED(Class, number, key, property, Property, Names)                                                         \
  ROW(Class, property, const EnumerationTable* names = Class::pbDescriptor.field(number)->enumeration;               \
      checkNames(names, #Names);                                                                                     \
      checkScalar<Class, std::int32_t>(number, key, FieldKind::Enumeration, &Class::property, &Class::set##Property, \
                                       &Class::has##Property, &Class::setHas##Property, names))
#define BYTES(Class, number, key, property, Property)                                                \
  ROW(Class, property,                                                                               \
      checkBytes<Class>(number, key, &Class::property, &Class::set##Property, &Class::set##Property, \
                        &Class::has##Property))
#define TEXT(Class, number, key, property, Property)                                                \
  ROW(Class, property,                                                                              \
      checkText<Class>(number, key, &Class::property, &Class::set##Property, &Class::set##Property, \
                       &Class::has##Property))
#define NESTED(Class, number, key, property, Property, Element)                                                \
  ROW(Class, property,                                                                                         \
      checkNested<Class, Element>(number, key, &Class::property, &Class::set##Property, &Class::set##Property, \
                                  &Class::has##Property))
#define LIST(Class, number, key, property, Property, single, Single, Element)                                  \
  ROW(Class, property,                                                                                         \
      checkList<Class, Element>(number, key, &Class::property, &Class::set##Property, &Class::clear##Property, \
                                &Class::add##Single, &Class::add##Single, &Class::property##Count,             \
                                &Class::single##AtIndex))
#define VALUES(Class, number, key, property, Property, single, Single, Type)                                    \
  ROW(Class, property,                                                                                          \
      checkValues<Class, Type>(number, key, &Class::property, &Class::property##Count, &Class::clear##Property, \
                               &Class::add##Single, &Class::single##AtIndex, &Class::set##Property))
#include "tests/messages/every_field.inc"
#undef ROW
#undef SCALAR
#undef NAMED
#undef BYTES
#undef TEXT
#undef NESTED
#undef LIST
#undef VALUES
};

class RowTest final : public testing::Test {
 public:
  explicit RowTest(const Row& row) : row_(row) {}
  void TestBody() override { row_.check(); }

 private:
  const Row& row_;
};

[[maybe_unused]] const bool rowsAreTests = [] {
  for (const Row& row : rows) {
    testing::RegisterTest("EveryField", row.name, nullptr, nullptr, __FILE__, __LINE__,
                          [&row]() -> testing::Test* { return new RowTest(row); });
  }
  return true;
}();

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
  EXPECT_EQ(messageClasses().size(), counts.size());
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

TEST(MetricIdentifiers, AreThoseOfTheSecondOpinion) {
  for (const SecondOpinion::Metric& said : secondOpinion().metrics) {
    const MetricIdentifier* const metric = metricNamed(said.constant);
    ASSERT_NE(metric, nullptr) << said.constant;
    EXPECT_EQ(metric->id, said.id) << said.constant;
    EXPECT_EQ(metric->message, messageClass(said.message)) << said.constant;
    EXPECT_TRUE(metric->isHandled) << said.constant;
  }
  for (const SecondOpinion::Metric& said : secondOpinion().leftAlone) {
    EXPECT_EQ(metricNamed(said.constant)->id, said.id) << said.constant;
    EXPECT_FALSE(metricNamed(said.constant)->isHandled) << said.constant;
  }
  EXPECT_EQ(metricIdentifiers().size(), secondOpinion().metrics.size() + secondOpinion().leftAlone.size());
}

TEST(MetricIdentifiers, AMetricIsReferredToByItsNameOrItsNumber) {
  for (const std::string_view reference : {"K_LTE_RRC_STATE", "0x3C4E04", "3952132"}) {
    EXPECT_EQ(metricReferredTo(reference), metricWithId(0x3C4E04)) << reference;
    EXPECT_EQ(identifierNamed(reference), 0x3C4E04) << reference;
  }
  // The number of a trigger, which is no metric's.
  EXPECT_EQ(metricReferredTo("0x7F0013"), nullptr);
  EXPECT_EQ(identifierNamed("0x7F0013"), 0x7F0013);
  EXPECT_EQ(metricReferredTo("K_NOTHING"), nullptr);
  EXPECT_EQ(identifierNamed("K_NOTHING"), std::nullopt);
}

TEST(MetricIdentifiers, AreFoundByNumberAndNameAndHandledWhereThereIsAMessage) {
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    EXPECT_EQ(metric.isHandled, metric.message != nullptr) << metric.name;
    EXPECT_EQ(metricWithId(metric.id), &metric);
    EXPECT_EQ(metricNamed(metric.name), &metric);
  }
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
