// SPDX-License-Identifier: Apache-2.0
//
// Writing wire data that is no message, and messages as fields of it.
#include <gtest/gtest.h>

#include "messages/lte_messages.h"
#include "tests/messages/support.h"

namespace probeview {
namespace {

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

}  // namespace
}  // namespace probeview
