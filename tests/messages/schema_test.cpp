// SPDX-License-Identifier: Apache-2.0
//
// The published schema says what the field tables say.
#include <google/protobuf/descriptor.h>
#include <gtest/gtest.h>

#include <fstream>
#include <set>
#include <sstream>

#include "messages/registry.h"
#include "schema/field_text.h"
#include "schema/pages.h"

namespace probeview {
namespace {

using google::protobuf::DescriptorPool;
using PeerField = google::protobuf::FieldDescriptor;

std::string contentOf(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  std::ostringstream content;
  content << file.rdbuf();
  return content.str();
}

TEST(Schema, ThePagesThatAreCommittedAreCurrent) {
  for (const Page& page : schemaPages()) {
    // Tests run in the root of the repository.
    EXPECT_TRUE(contentOf(page.path) == page.content) << page.path << " is out of date: run build/dev/bin/metrics_page";
  }
}

// The words that the pages make of a row and its quantity.
TEST(Schema, SaysUnitRangeConversionAndClauseOfAField) {
  const auto meaning = [](std::string_view message, std::string_view field) {
    const MessageDescriptor* descriptor = messageClass(message);
    return meaningText(*descriptor, *descriptor->fieldNamed(field));
  };
  EXPECT_EQ(meaning("EgwErrcNbrEutraMeas", "nbr_rsrp"),
            "Reported RSRP, 0 to 97 for -140 to -44 dBm, dBm = number - 140 (3GPP TS 36.133, 9.1.4)");
  EXPECT_EQ(meaning("EgwErrcNbrEutraMeas", "nbr_rsrq"),
            "Reported RSRQ, 0 to 34 for -19.5 to -3 dB, dB = number / 2 - 19.5 (3GPP TS 36.133, 9.1.7)");
  EXPECT_EQ(meaning("EgwErrcNbrUtraMeas", "rscp"),
            "Reported RSCP, -5 to 91 for -121 to -25 dBm, dBm = number - 116 (3GPP TS 25.133, 9.1.1.3)");
  // Unsigned here.
  EXPECT_EQ(meaning("UmtsNcellMeas", "cpich_rscp"),
            "Reported RSCP, 0 to 91 for -116 to -25 dBm, dBm = number - 116 (3GPP TS 25.133, 9.1.1.3)");
  EXPECT_EQ(meaning("NbrEutra", "dl_bw"),
            "Downlink bandwidth, index 0 to 5 for 1.4, 3, 5, 10, 15, 20 MHz (3GPP TS 36.101, 5.6)");
  EXPECT_EQ(meaning("KCellularLteSelReselCellInfo", "mo_data_ac_barring_factor"),
            "ac-BarringFactor for data, index 0 to 15 for 0 to 0.95 (3GPP TS 36.331, 6.3.1)");
  EXPECT_EQ(meaning("KCellularLteSelReselCellInfo", "QRxLevMin"),
            "q-RxLevMin, -70 to -22 for -140 to -44 dBm, dBm = number * 2 (3GPP TS 36.304, 5.2.3.2)");
  EXPECT_EQ(meaning("KCellularGsmIdleConfig", "penalty_t"),
            "PENALTY_TIME (31: no time, CELL_RESELECT_OFFSET is taken away), 0 to 30 for 20 to 620 s, "
            "s = number * 20 + 20 (3GPP TS 45.008, 6.4)");
  EXPECT_EQ(meaning("KCellularLteScellInfo", "cell_id"), "E-UTRAN cell identity, 28 bits (3GPP TS 23.003, 19.6)");
  EXPECT_EQ(meaning("KCellularLteScellInfo", "num_mnc_digits"),
            "Digits of the mobile network code, 2 or 3 (3GPP TS 23.003, 2.2)");
  EXPECT_EQ(meaning("KCellularMmContext", "tmsi"), "TMSI, personal data, 32 bits (3GPP TS 23.003, 2.4)");
  EXPECT_EQ(meaning("KCellularLteRrcState", "prev_state_dur_ms"), "Time spent in the state before, ms");
}

TEST(Schema, SaysWhatTheViewerMakesOfAField) {
  const auto viewer = [](std::string_view message, std::string_view field) {
    const MessageDescriptor* descriptor = messageClass(message);
    return viewerText(*descriptor, *descriptor->fieldNamed(field));
  };
  EXPECT_EQ(viewer("EgwErrcNbrEutraMeas", "nbr_rsrp"), "in dBm");
  EXPECT_EQ(viewer("LteCellMeasResult", "rsrq"), "on the page in dB");
  EXPECT_EQ(viewer("SecondaryComponentCarrier", "rsrp"), "on the page in dBm, toward zero");
  EXPECT_EQ(viewer("SecondaryComponentCarrier", "rsrq"), "on the page in dB");
  EXPECT_EQ(viewer("SecondaryComponentCarrier", "dl_bandwidth"), "on the page in MHz; another index stays");
  EXPECT_EQ(viewer("KCellularLteScellInfo", "dl_bw"), "in MHz, toward zero");
  EXPECT_EQ(viewer("RsrpRsrqSinr", "sinr0"), "in the samples in dB");
  EXPECT_EQ(viewer("KCellularGsmIdleConfig", "cr_offset"),
            "never there: the field number is that of a metric and decoding drops it");
  EXPECT_EQ(viewer("RxInfo", "rsrp_range"), "");
}

PeerField::Type peerType(FieldKind kind) {
  switch (kind) {
    case FieldKind::UInt64:
      return PeerField::TYPE_UINT64;
    case FieldKind::UInt32:
    case FieldKind::RepeatedUInt32:
      return PeerField::TYPE_UINT32;
    case FieldKind::Int32:
      return PeerField::TYPE_INT32;
    case FieldKind::Enumeration:
      return PeerField::TYPE_ENUM;
    case FieldKind::SInt32:
    case FieldKind::RepeatedSInt32:
      return PeerField::TYPE_SINT32;
    case FieldKind::Bool:
      return PeerField::TYPE_BOOL;
    case FieldKind::Bytes:
      return PeerField::TYPE_BYTES;
    case FieldKind::Text:
      return PeerField::TYPE_STRING;
    case FieldKind::Message:
    case FieldKind::RepeatedMessage:
      return PeerField::TYPE_MESSAGE;
  }
  return PeerField::TYPE_GROUP;
}

TEST(Schema, EqualsTheFieldTables) {
  for (const MessageDescriptor* ours : messageClasses()) {
    SCOPED_TRACE(std::string(ours->name));
    const auto* theirs =
        DescriptorPool::generated_pool()->FindMessageTypeByName("cellular_metrics." + std::string(ours->name));
    ASSERT_NE(theirs, nullptr);
    ASSERT_EQ(theirs->field_count(), ours->rowCount);
    for (const FieldDescriptor& field : ours->fields()) {
      SCOPED_TRACE(std::string(field.name));
      const PeerField* peer = theirs->FindFieldByNumber(field.number);
      ASSERT_NE(peer, nullptr);
      EXPECT_EQ(peer->name(), field.name);
      EXPECT_EQ(peer->type(), peerType(field.kind));
      EXPECT_EQ(peer->is_repeated(), isRepeated(field.kind));
      EXPECT_EQ(peer->has_presence(), !isRepeated(field.kind));
      EXPECT_EQ(peer->is_packed(), field.kind == FieldKind::RepeatedUInt32 || field.kind == FieldKind::RepeatedSInt32);
      if (field.element != nullptr) {
        EXPECT_EQ(peer->message_type()->name(), field.element->name);
      }
      if (field.enumeration == nullptr) continue;
      const auto* names = peer->enum_type();
      const bool hasNoZero = field.enumeration->name(0).empty();
      EXPECT_EQ(names->value_count(), static_cast<int>(field.enumeration->entries().size()) + (hasNoZero ? 1 : 0));
      for (const EnumerationEntry& entry : field.enumeration->entries()) {
        ASSERT_NE(names->FindValueByNumber(entry.value), nullptr);
        EXPECT_EQ(names->FindValueByNumber(entry.value)->name(), entry.name);
      }
      if (hasNoZero) {
        EXPECT_EQ(names->FindValueByNumber(0)->name(), unnamedZero(names->name()));
      }
    }
  }
}

}  // namespace
}  // namespace probeview
