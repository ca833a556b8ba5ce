// SPDX-License-Identifier: Apache-2.0
//
// What the rows of the messages say beside number, key and type.
#include <gtest/gtest.h>

#include <fstream>
#include <regex>
#include <set>
#include <sstream>

#include "messages/lte_messages.h"
#include "messages/quantities.h"
#include "messages/registry.h"

namespace probeview {
namespace {

// Calls it with each field of each class.
template <typename Function>
void forEachField(Function function) {
  for (const MessageDescriptor* message : messageClasses()) {
    for (const FieldDescriptor& field : message->fields()) {
      SCOPED_TRACE(std::string(message->name) + "." + std::string(field.name));
      function(*message, field, message->meaningOf(field));
    }
  }
}

bool isNumber(FieldKind kind) {
  return (isScalar(kind) && kind != FieldKind::Bool && kind != FieldKind::Enumeration) ||
         kind == FieldKind::RepeatedUInt32 || kind == FieldKind::RepeatedSInt32;
}

bool matches(std::string_view text, const char* pattern) {
  return std::regex_search(text.begin(), text.end(), std::regex(pattern));
}

TEST(Meanings, EveryFieldAndEveryClassHasOne) {
  std::size_t fields = 0;
  forEachField([&](const MessageDescriptor&, const FieldDescriptor&, const FieldMeaning& meaning) {
    EXPECT_FALSE(meaning.text.empty());
    EXPECT_FALSE(meaning.text.ends_with('.')) << "the pages make the sentence";
    ++fields;
  });
  EXPECT_GT(fields, 300U);
  for (const MessageDescriptor* message : messageClasses()) {
    EXPECT_TRUE(message->meaning.text.ends_with('.')) << message->name;
  }
}

TEST(Meanings, NumbersNameAQuantityAndWhatIsNoNumberNamesNone) {
  forEachField([](const MessageDescriptor&, const FieldDescriptor& field, const FieldMeaning& meaning) {
    if (isNumber(field.kind)) {
      EXPECT_NE(meaning.quantity, nullptr);
    } else {
      EXPECT_TRUE(meaning.quantity == nullptr || meaning.quantity == &quantities::none);
    }
  });
}

// Keys say what a number is, too, and were there first.
TEST(Meanings, ANumberWhoseKeyTellsOfAUnitOrAMeasurementNamesItsQuantity) {
  constexpr const char* measured =
      "rsrp|rsrq|rscp|ec_?n[o0]|rxlev|rxqual|sinr|snr|rssi|_pwr|_power|bandwidth|_bw$|arfcn|psc|cell_id$|lac$|rac$|tac$"
      "|"
      "mcc$|mnc$|tmsi|bsic|prio|Thres|search|timestamp";
  constexpr const char* notMeasured = "ms_txpwr|priority_class|rx_info";
  std::size_t found = 0;
  forEachField([&](const MessageDescriptor&, const FieldDescriptor& field, const FieldMeaning& meaning) {
    if (!isNumber(field.kind)) return;
    const std::string_view unit = meaning.quantity->unit;
    EXPECT_TRUE(unit == "ms" || !matches(field.name, "_ms$"));
    EXPECT_TRUE(unit == "s" || !matches(field.name, "_s$|seconds$"));
    EXPECT_TRUE(unit == "dBm" || !matches(field.name, "_dBm$"));
    if (!matches(field.name, measured) || matches(field.name, notMeasured)) return;
    EXPECT_NE(meaning.quantity, &quantities::none);
    ++found;
  });
  EXPECT_GT(found, 120U);
}

TEST(Meanings, AUnitIsSaidByTheQuantityAlone) {
  forEachField([](const MessageDescriptor&, const FieldDescriptor& field, const FieldMeaning& meaning) {
    EXPECT_FALSE(isNumber(field.kind) && matches(meaning.text, "\\b(dBm?|ms|s|MHz|hours?|tenths|hundredths)\\b(?!-)"));
  });
}

TEST(Meanings, PersonalAreTheFieldsOfTheListOnSecurity) {
  // Tests run in the root of the repository.
  std::ifstream file("docs/security.md");
  std::stringstream page;
  page << file.rdbuf();
  const std::string text = page.str();
  const std::size_t begin = text.find("are marked `personal`");
  ASSERT_NE(begin, std::string::npos);
  const std::string list = text.substr(begin, text.find("IMEI and ICCID have no fields", begin) - begin);
  std::set<std::string> listed;
  const std::regex name("`(\\w+\\.\\w+)`");
  for (std::sregex_iterator each(list.begin(), list.end(), name), end; each != end; ++each) listed.insert((*each)[1]);
  std::set<std::string> marked;
  forEachField([&](const MessageDescriptor& message, const FieldDescriptor& field, const FieldMeaning& meaning) {
    if (meaning.isPersonal) marked.insert(std::string(message.name) + "." + std::string(field.name));
  });
  EXPECT_EQ(marked, listed);
  EXPECT_TRUE(listed.contains("KCellularMmCommonInfo.imsi"));
}

TEST(Meanings, IdentitiesAreKnownInHexadecimalToo) {
  std::set<std::string_view> keys;
  forEachField([&](const MessageDescriptor&, const FieldDescriptor& field, const FieldMeaning& meaning) {
    if (meaning.quantity != nullptr && meaning.quantity->isHexadecimal) keys.insert(field.name);
  });
  EXPECT_EQ(keys, (std::set<std::string_view>{"cell_id", "ci", "tracking_area_code", "tac", "lac", "rac", "mmegi",
                                              "mmec", "tmsi", "p_tmsi", "m_tmsi", "ef_id"}));
}

TEST(Meanings, StandInTheOrderOfTheRows) {
  const MessageDescriptor& message = RsrpRsrqSinr::pbDescriptor;
  const FieldMeaning& meaning = message.meaningOf(*message.fieldNamed("sinr1"));
  EXPECT_EQ(meaning.text, "SINR of the second antenna");
  EXPECT_EQ(meaning.quantity, &quantities::lteSampleSinr);
  EXPECT_TRUE(meaning.viewer.converts);
}

TEST(RowNames, AgreeWhenKeyPropertyAndAccessorAreTheSameLetters) {
  EXPECT_TRUE(detail::isNamedAfter("prevState", "prev_state", false));
  EXPECT_TRUE(detail::isNamedAfter("si78Broadcast", "si_7_8_broadcast", false));
  EXPECT_TRUE(detail::isNamedAfter("idleRxlevDBm", "idle_rxlev_dBm", false));
  EXPECT_FALSE(detail::isNamedAfter("prevState", "prev_staet", false));
  EXPECT_FALSE(detail::isNamedAfter("prevState", "prev", false));
  EXPECT_FALSE(detail::isNamedAfter("prev", "prev_state", false));
  EXPECT_TRUE(detail::isNamedAfter("rxInfos", "rx_info", true));
  EXPECT_TRUE(detail::isNamedAfter("instValues", "inst_values", true));
  EXPECT_FALSE(detail::isNamedAfter("callIds", "call_id", false));
  EXPECT_TRUE(detail::isCapitalized("prevState", "PrevState"));
  EXPECT_FALSE(detail::isCapitalized("prevState", "PrevStaet"));
  EXPECT_FALSE(detail::isCapitalized("prevState", "prevState"));
}

}  // namespace
}  // namespace probeview
