// SPDX-License-Identifier: Apache-2.0
#include "tools/batch.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <limits>
#include <sstream>

#include "tools/store_session.h"

namespace probeview {
namespace {

using ::testing::ElementsAre;
using ::testing::Optional;

TEST(BatchInput, HandsOutLinesOfAnyBytesWithoutBlankOnesAndComments) {
  std::istringstream stream(std::string("one\n\n# no\n  \t\r\ntwo\0\xff\r\n #three\nlast", 34));
  BatchInput input(stream);
  std::vector<std::string> lines;
  while (input.next()) lines.emplace_back(input.line());
  EXPECT_THAT(lines, ElementsAre("one", std::string("two\0\xff\r", 6), " #three", "last"));
}

TEST(BatchInput, ALineThatIsTooLongIsReadPastAndTheNextIsWhole) {
  std::istringstream stream("12345\n123456\n1234567\n12\n");
  BatchInput input(stream, 5);
  ASSERT_TRUE(input.next());
  EXPECT_EQ(input.line(), "12345");
  EXPECT_FALSE(input.tooLong());
  for (int count = 0; count < 2; ++count) {
    ASSERT_TRUE(input.next());
    EXPECT_TRUE(input.tooLong());
    EXPECT_EQ(input.line(), "");
  }
  ASSERT_TRUE(input.next());
  EXPECT_EQ(input.line(), "12");
  EXPECT_FALSE(input.next());
}

TEST(BatchOutput, AnErrorIsOneObjectWhateverItSays) {
  std::ostringstream stream;
  BatchOutput(stream).error("a \"b\"\n\xff");
  EXPECT_EQ(stream.str(), "{\"error\":\"a \\\"b\\\"\\n\xEF\xBF\xBD\"}\n");
}

TEST(BatchWords, AreSplitAtBlanksAndNoMoreThanAreOfUse) {
  EXPECT_THAT(splitWords(" a\tbc  d\r"), ElementsAre("a", "bc", "d"));
  EXPECT_THAT(splitWords(""), ElementsAre());
  EXPECT_EQ(splitWords(std::string(1000, ' ') + "a b c d e f g h i j k").size(), mostWords);
}

TEST(StoreCommands, BlanksBeforeTheCommandDoNoHarmAndThoseAfterPageAreTheKeys) {
  StoreSession session;
  const std::string plain = session.answer("page LTE NAS");
  EXPECT_TRUE(plain.starts_with("{\"page\":\"LTE NAS\"")) << plain;
  EXPECT_EQ(session.answer("  \t page LTE NAS"), plain);
  EXPECT_TRUE(session.answer(" page  LTE NAS ").starts_with("{\"page\":\" LTE NAS \""));
  EXPECT_EQ(session.answer("\t reset"), "{}");
}

TEST(BatchHex, EitherCaseAndADashForNothing) {
  EXPECT_THAT(parseHex("00fFaB"), Optional(ElementsAre(0x00, 0xff, 0xab)));
  EXPECT_THAT(parseHex("-"), Optional(ElementsAre()));
  for (const char* bad : {"", "0", "0x00", "zz", "000", "--", "0-"}) EXPECT_EQ(parseHex(bad), std::nullopt) << bad;
}

}  // namespace
}  // namespace probeview
