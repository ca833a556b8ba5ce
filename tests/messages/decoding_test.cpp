// SPDX-License-Identifier: Apache-2.0
//
// How payloads are read, sentence by sentence. Wire bytes stand with their meaning beside them.
#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <string>

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/metric_utility.h"
#include "messages/nas_messages.h"
#include "messages/registry.h"
#include "messages/umts_messages.h"
#include "tests/messages/support.h"

namespace probeview {
namespace {

// What is no metric's message, such as a frame, is defined without a rule of what to drop.
class AnyNumbers final : public PBCodable {
  PB_MESSAGE(AnyNumbers)
  PB_FIELD(18, "before", before, Before, uint32);
  PB_FIELD(19, "metric", metric, Metric, uint32);
  PB_FIELD(20, "after", after, After, uint32);
};
PB_DEFINE(AnyNumbers)

using Lines = std::vector<std::string>;

// A varint of ten bytes whose last one still asks for another.
constexpr std::string_view overlong = "ffffffffffffffffffff";

TEST(Decoding, AnEmptyPayloadIsAMessageWithoutFields) {
  for (const MessageDescriptor* descriptor : messageClasses()) {
    const auto message = descriptor->make();
    EXPECT_TRUE(decode(*message, "")) << descriptor->name;
    EXPECT_TRUE(message->dictionaryRepresentation().empty()) << descriptor->name;
    EXPECT_EQ(message->hash(), 0U) << descriptor->name;
    for (const FieldDescriptor& field : descriptor->fields()) EXPECT_FALSE(message->hasField(field)) << field.name;
  }
}

TEST(Decoding, FieldsComeInAnyOrderAndTheLastScalarStays) {
  KCellularLteRrcState message;
  ASSERT_TRUE(decode(message, "20 07  10 01  08 05  10 03"));  // duration 7, state 1, timestamp 5, state 3
  EXPECT_EQ(shown(message), R"(["timestamp": 5, "state": "KLTE_RRC_STATE_CONNECTED", "prev_state_dur_ms": 7])");
}

TEST(Decoding, EncodingADecodedMessageOrdersTheFieldsAndDropsWhatIsUnknown) {
  KCellularLteRrcState message;
  // field 40 (unknown, fixed 32 bits), duration 7, field 19 (a metric), state 1, field 7 (unknown, bytes), timestamp 5
  ASSERT_TRUE(decode(message, "c502 01020304  20 07  9801 09  10 01  3a 02 0102  08 05"));
  EXPECT_EQ(encodedHex(message), "080510012007");
}

TEST(Decoding, AnEndGroupKeyEndsDecodingAndTheRestIsIgnored) {
  KCellularLteRrcState message;
  EXPECT_TRUE(decode(message, "08 05  0c  10 01"));
  EXPECT_EQ(shown(message), R"(["timestamp": 5])");
  KCellularLteRrcState unknown;
  EXPECT_TRUE(decode(unknown, "08 05  f407  10 01"));  // field 126: the wire type is looked at first
  EXPECT_EQ(shown(unknown), R"(["timestamp": 5])");
  KCellularLteRrcState metric;
  LineLog log;
  EXPECT_TRUE(decode(metric, "9c01 05  10 01", &log));  // field 19
  EXPECT_EQ(log.lines, Lines{});
  EXPECT_EQ(shown(metric), "[]");
}

TEST(Decoding, AfterAnEarlyEndGroupInANestedRecordDecodingGoesOnAtItsEnd) {
  KCellularLteTxPower message;
  // element: pucch 1, end of group, subframe 3; then timestamp 5
  ASSERT_TRUE(decode(message, "12 05  08 02  0c  18 03  08 05"));
  EXPECT_EQ(shown(message), R"(["timestamp": 5, "tx_power_info": [["pucch_tx_power": 1]]])");
}

TEST(Decoding, AUint32SentAsTenBytesKeepsItsLow32Bits) {
  KCellularLteRrcState message;
  ASSERT_TRUE(decode(message, "20 fffffffffffffffff001"));
  EXPECT_EQ(message.prevStateDurMs(), 0xFFFFFFFFU);
  ASSERT_TRUE(decode(message, "20 8180808010"));  // 2^32 + 1
  EXPECT_EQ(message.prevStateDurMs(), 1U);
}

TEST(Decoding, BitsPastThe64thAreDropped) {
  KCellularLteRrcState message;
  ASSERT_TRUE(decode(message, "08 8080808080808080807e"));  // bits 64 to 69 set, bit 63 not
  EXPECT_EQ(message.timestamp(), 0U);
  ASSERT_TRUE(decode(message, "08 ffffffffffffffffff7f"));
  EXPECT_EQ(message.timestamp(), std::numeric_limits<std::uint64_t>::max());
}

TEST(Decoding, AnOverlongVarintReadsAsZeroAndTheByteAfterItIsTheNextKey) {
  KCellularLteRrcState message;
  message.setPrevStateDurMs(9);
  ASSERT_TRUE(decode(message, "20" + std::string(overlong) + "10 03"));
  EXPECT_TRUE(message.hasPrevStateDurMs());
  EXPECT_EQ(message.prevStateDurMs(), 0U);
  EXPECT_EQ(message.state(), 3);
}

TEST(Decoding, AnOverlongKeyCountsAsTheUnknownFieldZero) {
  KCellularLteRrcState message;
  ASSERT_TRUE(decode(message, std::string(overlong) + "07 10 03"));  // skips the varint 7
  EXPECT_EQ(shown(message), R"(["state": "KLTE_RRC_STATE_CONNECTED"])");
}

TEST(Decoding, AnOverlongLengthReadsAsZeroToo) {
  KCellularMmCommonInfo bytes;
  ASSERT_TRUE(decode(bytes, "12" + std::string(overlong) + "08 05"));
  EXPECT_TRUE(bytes.hasImsi());
  EXPECT_EQ(shown(bytes), R"(["timestamp": 5, "imsi": <>])");
  KCellularLteTxPower nested;
  ASSERT_TRUE(decode(nested, "12" + std::string(overlong) + "08 05"));
  EXPECT_EQ(shown(nested), R"(["timestamp": 5, "tx_power_info": [[]]])");
  KCellularGsmCsRfMeasurement packed;
  ASSERT_TRUE(decode(packed, "2a" + std::string(overlong) + "08 05"));
  EXPECT_EQ(shown(packed), R"(["timestamp": 5])");
  KCellularLteRrcState unknown;
  ASSERT_TRUE(decode(unknown, "3a" + std::string(overlong) + "08 05"));
  EXPECT_EQ(shown(unknown), R"(["timestamp": 5])");
  KCellularLteRrcState metric;
  LineLog log;
  ASSERT_TRUE(decode(metric, "9801" + std::string(overlong) + "08 05", &log));
  EXPECT_EQ(log.lines, (Lines{"valid metricId tag", "Unknown tag: 13:0"}));
  EXPECT_EQ(metric.timestamp(), 5U);
}

TEST(Decoding, ATruncatedScalarIsPresentAsZeroAndDecodingFails) {
  KCellularLteRrcState message;
  message.setPrevStateDurMs(9);
  EXPECT_FALSE(decode(message, "10 03  20 80"));
  EXPECT_EQ(shown(message), R"(["state": "KLTE_RRC_STATE_CONNECTED", "prev_state_dur_ms": 0])");
  KCellularLteRrcState bare;
  EXPECT_FALSE(decode(bare, "20"));
  EXPECT_EQ(shown(bare), R"(["prev_state_dur_ms": 0])");
  KCellularLteTxPower nested;
  EXPECT_FALSE(decode(nested, "12 02 08 80 08 05"));  // the element ends inside the number, the payload does not
  EXPECT_EQ(shown(nested), R"(["tx_power_info": [["pucch_tx_power": 0]]])");
  KCellularLteServingCellMeasurement truth;
  EXPECT_FALSE(decode(truth, "10 80"));
  EXPECT_EQ(shown(truth), R"(["is_connected_mode": 0])");
}

TEST(Decoding, ATruncatedKeyFailsAndKeepsWhatWasThere) {
  KCellularLteRrcState message;
  EXPECT_FALSE(decode(message, "08 05 a0"));
  EXPECT_EQ(shown(message), R"(["timestamp": 5])");
}

TEST(Decoding, ATruncatedBytesFieldStaysAsItWas) {
  KCellularMmCommonInfo absent;
  EXPECT_FALSE(decode(absent, "12 03 0102"));
  EXPECT_FALSE(absent.hasImsi());
  KCellularMmCommonInfo present;
  ASSERT_TRUE(decode(present, "12 02 aabb"));
  EXPECT_FALSE(decode(present, "12 03 0102"));
  EXPECT_EQ(shown(present), R"(["imsi": <aabb>])");
  EXPECT_FALSE(decode(present, "12 80"));  // cut inside the length
  EXPECT_EQ(shown(present), R"(["imsi": <aabb>])");
  KCellularLteRsrpRsrqSinr text;
  text.setCallId("before");
  EXPECT_FALSE(decode(text, "1a 05 6162"));
  EXPECT_EQ(text.callId(), "before");
}

TEST(Decoding, ALengthPastTheEnclosingRecordFails) {
  KCellularMmCommonInfo message;
  // element of 3 bytes, whose bytes field claims 5 of the 7 that follow
  EXPECT_FALSE(decode(message, "1a 03 0a 05 01 02 03 04 05 06"));
  EXPECT_EQ(shown(message), R"(["eplmn_list": [[]]])");
  KCellularMmCommonInfo huge;
  EXPECT_FALSE(decode(huge, "12 ffffffffffffffff7f 00"));
  EXPECT_FALSE(huge.hasImsi());
}

TEST(Decoding, ANestedMessageIsAttachedBeforeItIsDecoded) {
  KCellularLteTxPower cut;
  EXPECT_FALSE(decode(cut, "08 05 12 7f 08 02"));
  EXPECT_EQ(cut.txPowerInfosCount(), 1U);
  EXPECT_EQ(shown(cut), R"(["timestamp": 5, "tx_power_info": [[]]])");
  KCellularEmmContext single;
  EXPECT_FALSE(decode(single, "32 7f"));
  EXPECT_TRUE(single.hasGuti());
  KCellularLteTxPower partial;
  EXPECT_FALSE(decode(partial, "12 04 08 02 18 80 08 05"));
  EXPECT_EQ(shown(partial), R"(["tx_power_info": [["pucch_tx_power": 1, "subframe_index": 0]]])");
}

TEST(Decoding, ASecondSingleNestedMessageReplacesTheFirst) {
  KCellularEmmContext message;
  ASSERT_TRUE(decode(message, "32 02 08 01  32 02 10 02"));  // mmegi 1; mmec 2
  EXPECT_EQ(shown(message), R"(["guti": ["mmec": 2]])");
}

TEST(Decoding, APackedAndAnUnpackedOccurrenceBothAppend) {
  KCellularGsmCsRfMeasurement message;
  ASSERT_TRUE(decode(message, "2a 03 02 04 06  28 01  2a 01 0a  28 03"));
  EXPECT_EQ(shown(message), R"(["cs_tx_pwr": [1, 2, 3, -1, 5, -2]])");
  KCellularLteSelReselCellInfo bands;
  ASSERT_TRUE(decode(bands, "10 07  12 02 0102"));
  EXPECT_EQ(shown(bands), R"(["multi_band_info": [7, 1, 2]])");
}

TEST(Decoding, ATruncatedLastElementOfARepeatedScalarIsAddedAsZeroAndFails) {
  KCellularGsmCsRfMeasurement packed;
  EXPECT_FALSE(decode(packed, "2a 02 02 80 08 05"));
  EXPECT_EQ(shown(packed), R"(["cs_tx_pwr": [1, 0]])");
  KCellularGsmCsRfMeasurement single;
  EXPECT_FALSE(decode(single, "28 02 28 80"));
  EXPECT_EQ(shown(single), R"(["cs_tx_pwr": [1, 0]])");
  KCellularLteSelReselCellInfo cut;
  EXPECT_FALSE(decode(cut, "10"));
  EXPECT_EQ(shown(cut), R"(["multi_band_info": [0]])");
}

TEST(Decoding, APackedRecordPastTheEndFailsAndAddsNothing) {
  KCellularGsmCsRfMeasurement message;
  EXPECT_FALSE(decode(message, "2a 03 02 04"));
  EXPECT_EQ(message.csTxPwrsCount(), 0U);
}

TEST(Decoding, AnEmptyPackedRecordAddsNothing) {
  KCellularGsmCsRfMeasurement message;
  EXPECT_TRUE(decode(message, "2a 00"));
  EXPECT_EQ(message, KCellularGsmCsRfMeasurement());
}

TEST(Decoding, TheWireTypeOfAKnownFieldIsNotLookedAt) {
  KCellularLteRrcState scalar;
  ASSERT_TRUE(decode(scalar, "12 03  25 07  0b 05"));  // state as bytes, duration as 32 bits, timestamp as group
  EXPECT_EQ(shown(scalar), R"(["timestamp": 5, "state": "KLTE_RRC_STATE_CONNECTED", "prev_state_dur_ms": 7])");
  KCellularMmCommonInfo object;
  ASSERT_TRUE(decode(object, "10 02 aabb"));  // bytes as a varint
  EXPECT_EQ(shown(object), R"(["imsi": <aabb>])");
  KCellularLteTxPower nested;
  ASSERT_TRUE(decode(nested, "10 02 08 02"));
  EXPECT_EQ(shown(nested), R"(["tx_power_info": [["pucch_tx_power": 1]]])");
  KCellularGsmCsRfMeasurement fixed;
  ASSERT_TRUE(decode(fixed, "2d 02"));  // a repeated scalar as 32 bits: one number
  EXPECT_EQ(shown(fixed), R"(["cs_tx_pwr": [1]])");
}

TEST(Decoding, OnlySixteenBitsOfAFieldNumberCount) {
  KCellularLteRrcState message;
  ASSERT_TRUE(decode(message, "9080 20 03"));  // field 65536 + 2
  EXPECT_EQ(shown(message), R"(["state": "KLTE_RRC_STATE_CONNECTED"])");
  KCellularLteRrcState metric;
  LineLog log;
  ASSERT_TRUE(decode(metric, "988120 07", &log));  // field 65536 + 19
  EXPECT_EQ(log.lines, (Lines{"valid metricId tag", "Unknown tag: 13:7"}));
  KCellularLteRrcState zero;
  ASSERT_TRUE(decode(zero, "8080 20 03"));  // field 65536: unknown, skipped
  EXPECT_EQ(shown(zero), "[]");
  KCellularLteRrcState most;
  ASSERT_TRUE(decode(most, "90 80 80 80 80 80 80 80 80 01 03"));  // bit 63 of the key: field 2 all the same
  EXPECT_EQ(most.state(), 3);
}

TEST(Decoding, AFieldWithTheNumberOfAMetricIsLoggedAndDropped) {
  for (const KBBMetricUtility::Row& row : KBBMetricUtility::rows()) {
    PBDataWriter writer;
    PBDataWriterWriteUint64Field(writer, 0x1FFFFFFFF, row.metricId);
    PBDataWriterWriteUint32Field(writer, 5, 1);
    KCellularLteRrcState message;
    LineLog log;
    ASSERT_TRUE(decode(message, writer.bytes(), &log));
    char line[40];
    std::snprintf(line, sizeof line, "Unknown tag: %x:4294967295", row.metricId);
    EXPECT_EQ(log.lines, (Lines{"valid metricId tag", line}));
    EXPECT_EQ(shown(message), R"(["timestamp": 5])");
  }
}

TEST(Decoding, AClassWithoutARuleOfWhatToDropDecodesAndSkipsNumbersOfMetricsToo) {
  AnyNumbers inOrder;
  LineLog log;
  ASSERT_TRUE(decode(inOrder, "900101 980107 a00102", &log));
  EXPECT_EQ(shown(inOrder), R"(["before": 1, "metric": 7, "after": 2])");
  AnyNumbers reversed;
  ASSERT_TRUE(decode(reversed, "a00102 980107 900101", &log));
  EXPECT_EQ(reversed, inOrder);
  AnyNumbers stranger;
  ASSERT_TRUE(decode(stranger, "f2b01a 02 ffff 900101", &log));  // field 0xD30E: bytes, which are skipped as such
  EXPECT_EQ(shown(stranger), R"(["before": 1])");
  EXPECT_TRUE(log.lines.empty());
}

TEST(Decoding, AMetricFieldIsReadAsAVarintWhateverItsWireType) {
  KCellularLteRrcState message;
  LineLog log;
  ASSERT_TRUE(decode(message, "9a01 02 08 05", &log));  // field 19 as bytes: 2 is its value, no length
  EXPECT_EQ(log.lines, (Lines{"valid metricId tag", "Unknown tag: 13:2"}));
  EXPECT_EQ(shown(message), R"(["timestamp": 5])");
}

TEST(Decoding, ATruncatedMetricFieldIsLoggedAsZeroAndFails) {
  KCellularLteRrcState message;
  LineLog log;
  EXPECT_FALSE(decode(message, "9801 80", &log));
  EXPECT_EQ(log.lines, (Lines{"valid metricId tag", "Unknown tag: 13:0"}));
}

TEST(Decoding, Field19IsWrittenButNeverRead) {
  KCellularGsmIdleConfig idle;
  idle.setC2Valid(1);
  idle.setCrOffset(7);
  idle.setTmpOffset(2);
  EXPECT_EQ(encodedHex(idle),
            "900101"
            "980107"
            "a00102");
  KCellularGsmIdleConfig idleBack;
  LineLog log;
  ASSERT_TRUE(decode(idleBack, encoded(idle), &log));
  EXPECT_EQ(shown(idleBack), R"(["c2_valid": 1, "tmp_offset": 2])");
  EXPECT_EQ(log.lines, (Lines{"valid metricId tag", "Unknown tag: 13:7"}));
  KCellularLteSelReselCellInfo cell;
  cell.setThreshServingLowP(1);
  cell.setThreshServingLowQ(9);
  KCellularLteSelReselCellInfo cellBack;
  ASSERT_TRUE(decode(cellBack, encoded(cell)));
  EXPECT_EQ(shown(cellBack), R"(["Thresh_serving_lowP": 1])");
}

TEST(Decoding, UnknownFieldsOfEveryWireTypeAreSkipped) {
  KCellularLteRrcState message;
  // field 6 as varint, as 64 bits, as bytes, as 32 bits
  ASSERT_TRUE(decode(message, "30 ff01  31 0102030405060708  32 02 0102  35 01020304  08 05"));
  EXPECT_EQ(shown(message), R"(["timestamp": 5])");
}

TEST(Decoding, AGroupOrAnImpossibleWireTypeCannotBeSkipped) {
  for (const std::string_view key : {"33", "36", "37"}) {
    KCellularLteRrcState message;
    EXPECT_FALSE(decode(message, "08 05" + std::string(key) + "34 10 03")) << key;
    EXPECT_EQ(shown(message), R"(["timestamp": 5])");
  }
}

TEST(Decoding, AnUnknownFieldThatIsCutFails) {
  for (const std::string_view cut : {"30", "30 80", "31 01020304050607", "32", "32 03 0102", "35 010203"}) {
    KCellularLteRrcState message;
    EXPECT_FALSE(decode(message, "08 05" + std::string(cut))) << cut;
    EXPECT_EQ(message.timestamp(), 5U);
  }
}

TEST(Decoding, AnUnknownFieldInANestedRecordMayNotReachPastIt) {
  KCellularLteTxPower message;
  EXPECT_FALSE(decode(message, "12 02 35 01 020304 08 05"));
}

TEST(Decoding, AKeyOfAllOnesIsAnUnknownFieldWhereverItStands) {
  // Field 65535 with a wire type that cannot be skipped, behind the last field and in the place of one never read.
  TxPowerInfo info;
  EXPECT_FALSE(decode(info, "18 7f  ffffffff0f  01"));
  EXPECT_EQ(info.subframeIndex(), 127U);
  KCellularGsmIdleConfig config;
  EXPECT_FALSE(decode(config, "9001 01  ffffffff0f  05"));
  EXPECT_FALSE(config.hasCrOffset());
}

TEST(Decoding, APayloadWithoutAnAddressIsEmpty) {
  KCellularLteRrcState message;
  EXPECT_TRUE(decode(message, std::span<const std::uint8_t>()));
}

TEST(Decoding, ABoolTestsAll64Bits) {
  KCellularLteServingCellMeasurement message;
  ASSERT_TRUE(decode(message, "10 8080808010"));  // 2^32
  EXPECT_TRUE(message.isConnectedMode());
  ASSERT_TRUE(decode(message, "10 80808080808080808001"));  // 2^63
  EXPECT_TRUE(message.isConnectedMode());
  ASSERT_TRUE(decode(message, "10 00"));
  EXPECT_FALSE(message.isConnectedMode());
  EXPECT_EQ(encodedHex(message), "1000");
}

TEST(Decoding, SignedFieldsAreZigZag) {
  TxPowerInfo message;
  ASSERT_TRUE(decode(message, "08 01  10 ffffffff0f"));
  EXPECT_EQ(message.pucchTxPower(), -1);
  EXPECT_EQ(message.puschTxPower(), std::numeric_limits<std::int32_t>::min());
  ASSERT_TRUE(decode(message, "08 feffffff0f  10 feffffffff01"));  // the low 32 bits before ZigZag
  EXPECT_EQ(message.pucchTxPower(), std::numeric_limits<std::int32_t>::max());
  EXPECT_EQ(message.puschTxPower(), std::numeric_limits<std::int32_t>::max());
}

TEST(Decoding, NegativeEnumerationsAreSignExtendedToTenBytes) {
  KCellularLteRrcState message;
  message.setState(-2);
  EXPECT_EQ(encodedHex(message), "10feffffffffffffffff01");
  KCellularLteRrcState back;
  ASSERT_TRUE(decode(back, encoded(message)));
  EXPECT_EQ(back.state(), -2);
  EXPECT_EQ(shown(back), R"x(["state": "(unknown: -2)"])x");
  ASSERT_TRUE(decode(back, "10 feffffff0f"));  // five bytes are enough to read one
  EXPECT_EQ(back.state(), -2);
}

TEST(Decoding, AValueOnePastTheLastNameOfATableIsUnknown) {
  KCellularWcdmaRrcConnectionState message;
  ASSERT_TRUE(decode(message, "10 0b"));
  EXPECT_EQ(shown(message), R"x(["state": "(unknown: 11)"])x");
}

TEST(Decoding, TextThatIsNotUtf8KeepsItsBytesAndShowsReplacements) {
  KCellularLteRsrpRsrqSinr message;
  ASSERT_TRUE(decode(message, "1a 02 c328"));
  EXPECT_EQ(message.callId(), "\xC3(");
  EXPECT_EQ(encodedHex(message), "1a02c328");
  EXPECT_EQ(shown(message), "[\"call_id\": \"\xEF\xBF\xBD(\"]");
}

TEST(Decoding, DecodingAgainIntoTheSameMessageReplacesScalarsAndAppendsToLists) {
  KCellularLteTxPower message;
  ASSERT_TRUE(decode(message, "08 05 12 02 08 02"));
  ASSERT_TRUE(decode(message, "08 06 12 02 08 04"));
  EXPECT_EQ(shown(message), R"(["timestamp": 6, "tx_power_info": [["pucch_tx_power": 1], ["pucch_tx_power": 2]]])");
}

TEST(Decoding, AReaderInErrorReadsNothing) {
  const Bytes payload = bytesOf("80");
  PBDataReader reader(payload);
  EXPECT_EQ(reader.readVarint(), 0U);
  EXPECT_TRUE(reader.hasError());
  KCellularLteRrcState message;
  EXPECT_FALSE(message.readFrom(reader));
}

TEST(Decoding, AMessageNeedsNoLogToDropAMetricField) {
  KCellularLteRrcState message;
  EXPECT_TRUE(decode(message, "9801 09 08 05"));
  EXPECT_EQ(message.timestamp(), 5U);
}

TEST(Decoding, AnAbsentAverageHasNoKeyAndEachSampleIsADictionary) {
  KCellularLteRsrpRsrqSinr message;
  ASSERT_TRUE(decode(message, "7a 02 20 01  7a 02 20 03"));
  EXPECT_EQ(shown(message), R"(["inst_values": [["rsrp0": -1], ["rsrp0": -2]]])");
}

TEST(Decoding, TheGapsInTheNumberingAreSkipped) {
  KCellularWcdmaSelReselCellInfo reselection;
  // fields 14 to 20 as varints (19 goes the way of a metric's number), then the priority of the cell
  ASSERT_TRUE(decode(reselection, "7001 7801 800101 880101 900101 980101 a00101 a80107"));
  EXPECT_EQ(shown(reselection), R"(["s_cell_prio": 7])");
  KCellularGsmScellInfo cell;
  ASSERT_TRUE(decode(cell, "1001 1801 6001 2001"));  // fields 2, 3, 12, then mcc
  EXPECT_EQ(shown(cell), R"(["mcc": 1])");
  RoutingAreaId area;
  ASSERT_TRUE(decode(area, "1001 1802"));  // field 2, then lac
  EXPECT_EQ(shown(area), R"(["lac": 2])");
}

TEST(Decoding, NoTransmitPowersWriteNothingAndSeveralOnePackedRecord) {
  KCellularGsmCsRfMeasurement message;
  EXPECT_EQ(encodedHex(message), "");
  const std::int32_t powers[] = {33, 31, -1};
  message.setCsTxPwrs(powers, 3);
  EXPECT_EQ(encodedHex(message), "2a03423e01");
}

TEST(Decoding, TheBearerCountIsAFieldOfItsOwn) {
  KCellularActivatedBearerContexts message;
  ASSERT_TRUE(decode(message, "10 05 1a 00"));
  EXPECT_EQ(message.bearerContextCount(), 5U);
  EXPECT_EQ(message.bearerContextsCount(), 1U);
}

TEST(Decoding, AnIndexOutOfRangeIsSaidWithIndexAndCount) {
  KCellularGsmCsRfMeasurement numbers;
  numbers.addCsTxPwr(1);
  numbers.addCsTxPwr(2);
  numbers.addCsTxPwr(3);
  EXPECT_EQ(numbers.csTxPwrAtIndex(2), 3);
  try {
    numbers.csTxPwrAtIndex(7);
    FAIL() << "no exception";
  } catch (const std::out_of_range& error) {
    EXPECT_STREQ(error.what(), "idx (7) is out of range (3)");
  }
  EXPECT_THROW(numbers.csTxPwrAtIndex(3), std::out_of_range);
  EXPECT_THROW(KCellularLteTxPower().txPowerInfoAtIndex(0), std::out_of_range);
}

TEST(Decoding, ManyElementsNeedNoMoreMemoryThanTheyAreLong) {
  PBDataWriter writer;
  for (int index = 0; index < 50000; ++index) PBDataWriterWriteDataField(writer, {}, 2);
  KCellularLteTxPower message;
  ASSERT_TRUE(decode(message, writer.bytes()));
  EXPECT_EQ(message.txPowerInfosCount(), 50000U);
  EXPECT_EQ(encoded(message), Bytes(writer.bytes().begin(), writer.bytes().end()));
}

TEST(Decoding, WhatWasDecodedOutlivesThePayload) {
  Bytes payload = bytesOf("12 07 08 01 12 03 aabbcc");
  KCellularSimCardFiles files;
  ASSERT_TRUE(decode(files, payload));
  std::fill(payload.begin(), payload.end(), std::uint8_t{0});
  payload = {};
  EXPECT_EQ(shown(files), R"(["ef_list": [["ef_id": 1, "content": <aabbcc>]]])");
}

TEST(Decoding, ScalarsAreReadTheSameHoweverLongThePayloadIs) {
  for (std::size_t unknown = 230; unknown < 270; ++unknown) {
    PBDataWriter writer;
    PBDataWriterWriteUint64Field(writer, 5, 1);
    PBDataWriterWriteDataField(writer, Bytes(unknown, 0x08), 40);
    PBDataWriterWriteUint32Field(writer, 300, 4);
    const std::span<const std::uint8_t> payload = writer.bytes();
    KCellularLteRrcState message;
    PBDataReader reader(payload);
    ASSERT_TRUE(message.readFrom(reader)) << unknown;
    EXPECT_EQ(reader.position(), payload.size());
    EXPECT_EQ(shown(message), R"(["timestamp": 5, "prev_state_dur_ms": 300])");
    KCellularLteRrcState cut;
    EXPECT_FALSE(decode(cut, payload.first(payload.size() - 1))) << unknown;
    EXPECT_EQ(shown(cut), R"(["timestamp": 5, "prev_state_dur_ms": 0])");
  }
}

}  // namespace
}  // namespace probeview
