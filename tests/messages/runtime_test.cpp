// SPDX-License-Identifier: Apache-2.0
//
// The reader, the writer, the repeated containers and the table of metric numbers, by themselves.
#include <gtest/gtest.h>

#include <limits>
#include <thread>

#include "messages/lte_messages.h"
#include "messages/metric_utility.h"
#include "messages/runtime/repeated_scalar.h"
#include "tests/messages/support.h"
#include "tests/support/second_opinion.h"

namespace probeview {
namespace {

TEST(Reader, PastTheLengthAByteIsZeroAndTheErrorFlagIsSet) {
  const Bytes payload = bytesOf("07");
  PBDataReader reader(payload);
  EXPECT_EQ(reader.readByte(), 7);
  EXPECT_FALSE(reader.hasError());
  EXPECT_EQ(reader.readByte(), 0);
  EXPECT_TRUE(reader.hasError());
}

TEST(Reader, DataAndStringsAreViewsOfThePayload) {
  const Bytes payload = bytesOf("03 010203 02 6869 05 00");
  PBDataReader reader(payload);
  EXPECT_EQ(hexOf(PBReaderReadData(reader)), "010203");
  EXPECT_EQ(PBReaderReadString(reader), "hi");
  EXPECT_TRUE(PBReaderReadData(reader).empty());
  EXPECT_TRUE(reader.hasError());
}

TEST(Reader, ALengthThatIsCutYieldsNothingAndPlacesNoMark) {
  const Bytes payload = bytesOf("80");
  PBDataReader data(payload);
  EXPECT_TRUE(PBReaderReadData(data).empty());
  EXPECT_TRUE(data.hasError());
  EXPECT_FALSE(data.hasMoreData());
  PBDataReader marked(payload);
  PBReaderMark mark;
  EXPECT_FALSE(PBReaderPlaceMark(marked, mark));
  EXPECT_TRUE(marked.hasError());
  EXPECT_EQ(marked.length(), 1U);
}

TEST(Reader, AMarkLimitsAndRecallGoesOnBehindTheRecord) {
  const Bytes payload = bytesOf("03 010203 09");
  PBDataReader reader(payload);
  PBReaderMark mark;
  ASSERT_TRUE(PBReaderPlaceMark(reader, mark));
  EXPECT_EQ(reader.length(), 4U);
  EXPECT_EQ(reader.readByte(), 1);
  PBReaderRecallMark(reader, mark);
  EXPECT_EQ(reader.readByte(), 9);
  EXPECT_FALSE(reader.hasMoreData());
}

TEST(Reader, AMarkPastTheEnclosingRecordFails) {
  const Bytes payload = bytesOf("02 05 00 00000000");
  PBDataReader reader(payload);
  PBReaderMark outer;
  PBReaderMark inner;
  ASSERT_TRUE(PBReaderPlaceMark(reader, outer));
  EXPECT_FALSE(PBReaderPlaceMark(reader, inner));
  EXPECT_TRUE(reader.hasError());
}

TEST(Reader, SkipsEveryWireTypeButGroups) {
  const Bytes payload = bytesOf("8001 0102030405060708 020102 01020304 00");
  PBDataReader reader(payload);
  for (const std::uint32_t type : {0U, 1U, 2U, 5U}) EXPECT_TRUE(PBReaderSkipValueWithTag(reader, 9, type)) << type;
  EXPECT_EQ(reader.position() + 1, reader.length());
  for (const std::uint32_t type : {3U, 4U, 6U, 7U}) {
    PBDataReader fresh(payload);
    EXPECT_FALSE(PBReaderSkipValueWithTag(fresh, 9, type)) << type;
    EXPECT_TRUE(fresh.hasError());
  }
}

TEST(Reader, ReadsVarintsOfEveryLength) {
  for (int bits = 0; bits <= 64; ++bits) {
    const std::uint64_t value = bits == 64 ? std::numeric_limits<std::uint64_t>::max() : (std::uint64_t{1} << bits) - 1;
    for (std::size_t padding = 0; padding < 12; ++padding) {
      PBDataWriter writer;
      PBDataWriterWriteUint64Field(writer, value, PBDataWriterNoField);
      Bytes payload(writer.bytes().begin(), writer.bytes().end());
      EXPECT_EQ(payload.size(), wire::varintSize(value));
      const std::size_t size = payload.size();
      payload.resize(size + padding, 0xFF);
      PBDataReader reader(payload);
      EXPECT_EQ(reader.readVarint(), value);
      EXPECT_EQ(reader.position(), size);
      EXPECT_FALSE(reader.hasError());
      PBDataReader cut(std::span<const std::uint8_t>(payload).first(size - 1));
      EXPECT_EQ(cut.readVarint(), 0U);
      EXPECT_TRUE(cut.hasError());
    }
  }
}

TEST(Writer, WritesEachKindOfField) {
  PBDataWriter writer;
  PBDataWriterWriteUint64Field(writer, 300, 1);
  PBDataWriterWriteUint32Field(writer, 1, 16);
  PBDataWriterWriteInt32Field(writer, -1, 2);
  PBDataWriterWriteSint32Field(writer, -1, 3);
  PBDataWriterWriteBOOLField(writer, true, 4);
  PBDataWriterWriteDataField(writer, bytesOf("aabb"), 5);
  PBDataWriterWriteStringField(writer, "hi", 6);
  EXPECT_EQ(hexOf(writer.bytes()),
            "08ac02"
            "800101"
            "10ffffffffffffffffff01"
            "1801"
            "2001"
            "2a02aabb"
            "32026869");
}

TEST(Writer, WithTheFieldNumberAllOnesAValueStandsWithoutAKey) {
  PBDataWriter writer;
  PBWriterMark mark;
  PBDataWriterPlaceMark(writer, mark, 5);
  for (const std::int32_t value : {1, -1, 64}) PBDataWriterWriteSint32Field(writer, value, 0xFFFFFFFF);
  PBDataWriterRecallMark(writer, mark);
  EXPECT_EQ(hexOf(writer.bytes()),
            "2a040201"
            "8001");
  writer.clear();
  PBDataWriterWriteBOOLField(writer, false, PBDataWriterNoField);
  PBDataWriterWriteBOOLField(writer, true, PBDataWriterNoField);
  PBDataWriterWriteUint64Field(writer, 300, PBDataWriterNoField);
  PBDataWriterWriteInt32Field(writer, -1, PBDataWriterNoField);
  PBDataWriterWriteDataField(writer, bytesOf("aabb"), PBDataWriterNoField);
  PBDataWriterWriteStringField(writer, "hi", PBDataWriterNoField);
  EXPECT_EQ(hexOf(writer.bytes()),
            "0001ac02"
            "ffffffffffffffffff01"
            "02aabb"
            "026869");
}

TEST(Writer, WithTheFieldNumberAllOnesASubmessageAndARecordStandWithoutAKey) {
  TxPowerInfo info;
  info.setSubframeIndex(3);
  PBDataWriter writer;
  PBDataWriterWriteSubmessage(writer, info, PBDataWriterNoField);
  PBWriterMark mark;
  PBDataWriterPlaceMark(writer, mark, PBDataWriterNoField);
  PBDataWriterWriteUint32Field(writer, 5, PBDataWriterNoField);
  PBDataWriterRecallMark(writer, mark);
  PBDataWriter expected;
  PBDataWriterWriteDataField(expected, encoded(info), PBDataWriterNoField);
  PBDataWriterWriteDataField(expected, bytesOf("05"), PBDataWriterNoField);
  EXPECT_EQ(hexOf(writer.bytes()), hexOf(expected.bytes()));
}

TEST(Writer, ARecordsLengthIsFilledInHoweverLongItIs) {
  for (const std::size_t size : {0U, 127U, 128U, 16383U, 16384U}) {
    const Bytes content(size, 0x55);
    PBDataWriter writer;
    PBDataWriterWriteUint32Field(writer, 7, 1);
    PBWriterMark mark;
    PBDataWriterPlaceMark(writer, mark, 2);
    for (const std::uint8_t byte : content) PBDataWriterWriteUint32Field(writer, byte, PBDataWriterNoField);
    PBDataWriterRecallMark(writer, mark);
    PBDataWriterWriteUint32Field(writer, 8, 3);
    PBDataWriter expected;
    PBDataWriterWriteUint32Field(expected, 7, 1);
    PBDataWriterWriteDataField(expected, content, 2);
    PBDataWriterWriteUint32Field(expected, 8, 3);
    EXPECT_EQ(hexOf(writer.bytes()), hexOf(expected.bytes()));
  }
}

TEST(Writer, ASubmessageIsItsKeyItsLengthAndItsEncoding) {
  TxPowerInfo info;
  info.setSubframeIndex(3);
  PBDataWriter writer;
  PBDataWriterWriteSubmessage(writer, info, 2);
  EXPECT_EQ(hexOf(writer.bytes()), "12021803");
}

TEST(Writer, IsUsedAgain) {
  PBDataWriter writer;
  PBDataWriterWriteUint32Field(writer, 7, 1);
  writer.clear();
  PBDataWriterWriteUint32Field(writer, 8, 1);
  EXPECT_EQ(hexOf(writer.takeBytes()), "0808");
  EXPECT_EQ(writer.size(), 0U);
  PBDataWriterWriteUint32Field(writer, 9, 1);
  EXPECT_EQ(hexOf(writer.bytes()), "0809");
}

TEST(RepeatedScalar, AddsClearsSetsCopiesAndCompares) {
  PBRepeatedInt32 list;
  EXPECT_EQ(list.count(), 0U);
  for (std::int32_t value = -20; value < 20; ++value) list.add(value);
  EXPECT_EQ(list.count(), 40U);
  EXPECT_EQ(list.at(0), -20);
  const PBRepeatedInt32 copy = list;
  EXPECT_TRUE(copy.isEqual(list));
  EXPECT_EQ(copy.hash(), list.hash());
  list.add(1);
  EXPECT_FALSE(copy.isEqual(list));
  const std::int32_t values[] = {3, 2, 1};
  list.set(values);
  EXPECT_EQ(list.count(), 3U);
  EXPECT_EQ(printed(list.toList()), "[3, 2, 1]");
  list.clear();
  EXPECT_TRUE(list.isEqual(PBRepeatedInt32()));
  EXPECT_EQ(list.hash(), 0U);
  list.set(std::span(copy.data(), 0));
  EXPECT_EQ(list.count(), 0U);
}

TEST(RepeatedScalar, TheOrderOfTheNumbersCountsInTheHash) {
  PBRepeatedUInt32 one;
  PBRepeatedUInt32 other;
  one.add(1);
  one.add(2);
  other.add(2);
  other.add(1);
  EXPECT_NE(one.hash(), other.hash());
  EXPECT_FALSE(one.isEqual(other));
}

TEST(RepeatedScalar, PrintsUnsignedAndSignedNumbersAsWhatTheyAre) {
  PBRepeatedUInt32 large;
  large.add(0xFFFFFFFF);
  EXPECT_EQ(printed(large.toList()), "[4294967295]");
  PBRepeatedInt32 negative;
  negative.add(-1);
  EXPECT_EQ(printed(negative.toList()), "[-1]");
}

TEST(RepeatedScalar, AnIndexOutOfRangeIsSaidWithIndexAndCount) {
  PBRepeatedUInt32 list;
  try {
    list.at(0);
    FAIL() << "no exception";
  } catch (const std::out_of_range& error) {
    EXPECT_STREQ(error.what(), "idx (0) is out of range (0)");
  }
}

TEST(MetricUtility, KnowsTheNumbersOfItsRowsAndNoOther) {
  std::size_t known = 0;
  for (std::uint32_t number = 0; number <= 0x20000; ++number) known += KBBMetricUtility::isMetricId(number) ? 1 : 0;
  EXPECT_EQ(known, KBBMetricUtility::rows().size());
  for (const KBBMetricUtility::Row& row : KBBMetricUtility::rows()) {
    EXPECT_TRUE(KBBMetricUtility::isMetricId(row.metricId)) << row.name;
  }
}

TEST(MetricUtility, ItsRowsStandInTheirOrderWithTheirOddNames) {
  const auto& said = secondOpinion().tags;
  ASSERT_EQ(KBBMetricUtility::rows().size(), said.size());
  for (std::size_t index = 0; index < said.size(); ++index) {
    EXPECT_EQ(KBBMetricUtility::rows()[index].metricId, said[index].number);
    EXPECT_EQ(KBBMetricUtility::rows()[index].name, said[index].name);
  }
}

TEST(MetricUtility, SaysThatATagIsOneOfAMetric) {
  LineLog log;
  EXPECT_TRUE(KBBMetricUtility::isValidMetricIdTag(0xD30E, "AnyClass", &log));
  EXPECT_FALSE(KBBMetricUtility::isValidMetricIdTag(20, "AnyClass", &log));
  EXPECT_EQ(log.lines, std::vector<std::string>{"valid metricId tag"});
  EXPECT_TRUE(KBBMetricUtility::isValidMetricIdTag(19, "AnyClass"));
}

TEST(Blocks, AThreadThatEndsGivesBackWhatItKept) {
  std::thread([] {
    for (int round = 0; round < 3; ++round) {
      std::vector<KCellularLteTxPower> messages(10);
      for (KCellularLteTxPower& message : messages) EXPECT_TRUE(decode(message, "12 02 08 02"));
    }
  }).join();
}

TEST(Blocks, ADeepCopyMayGoToAnotherThread) {
  KCellularLteTxPower message;
  ASSERT_TRUE(decode(message, "12 02 08 02"));
  std::unique_ptr<KCellularLteTxPower> copy = message.copyWithZone();
  std::thread([moved = std::move(copy)]() mutable {
    EXPECT_EQ(moved->txPowerInfosCount(), 1U);
    moved.reset();
  }).join();
}

}  // namespace
}  // namespace probeview
