// SPDX-License-Identifier: Apache-2.0
//
// Reading wire data that is no message, value by value.
#include <gtest/gtest.h>

#include <limits>

#include "tests/messages/support.h"

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

}  // namespace
}  // namespace probeview
