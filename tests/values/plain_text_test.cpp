// SPDX-License-Identifier: Apache-2.0
#include "values/plain_text.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <string>
#include <vector>

#include "tests/support/harmless.h"
#include "values/json.h"
#include "values/printer.h"
#include "values/value.h"

namespace probeview {
namespace {

TEST(PlainText, AnExcerptIsQuotedHarmlessAndCut) {
  EXPECT_EQ(quotedExcerpt("two\nlines\x1b[2J\xE2\x80\xAE"), R"("two\nlines\u{1b}[2J\u{202e}")");
  EXPECT_EQ(quotedExcerpt(std::string(60, 'a')), '"' + std::string(60, 'a') + '"');
  EXPECT_EQ(quotedExcerpt(std::string(61, 'a')), '"' + std::string(60, 'a') + "\"…");
  EXPECT_EQ(quotedExcerpt("abc", 2), "\"ab\"…");
}

TEST(PlainText, AnIntegerIsDecimalHexadecimalOrNegativeInSixtyFourBits) {
  EXPECT_EQ(parseInteger64("3952132"), 3952132);
  EXPECT_EQ(parseInteger64("0x3C4E04"), 0x3C4E04);
  EXPECT_EQ(parseInteger64("0X3c4e04"), 0x3C4E04);
  EXPECT_EQ(parseInteger64("-9223372036854775808"), std::numeric_limits<std::int64_t>::min());
  EXPECT_EQ(parseInteger64("0xFFFFFFFFFFFFFFFF"), -1);
  for (const char* bad :
       {"", "-", "+1", "1 ", "0x", "0x-1", "-0x1", "1.0", "9223372036854775808", "0x10000000000000000"}) {
    EXPECT_EQ(parseInteger64(bad), std::nullopt) << bad;
  }
}

TEST(PlainText, ANumberIsTheWholeText) {
  EXPECT_EQ(parseNumber<double>("1.5"), 1.5);
  EXPECT_EQ(parseNumber<std::uint8_t>("255"), 255);
  EXPECT_EQ(parseNumber<std::uint8_t>("256"), std::nullopt);
  for (const char* bad : {"", "1.5 ", " 1.5", "1,5", "x"}) EXPECT_EQ(parseNumber<double>(bad), std::nullopt) << bad;
}

TEST(PlainText, AHexadecimalTextReadsBack) {
  EXPECT_EQ(hexText(0x7F0013), "0x7F0013");
  EXPECT_EQ(hexText(0), "0x0");
  EXPECT_EQ(hexText(-1), "0xFFFFFFFFFFFFFFFF");
  for (const std::int64_t number : {std::int64_t{0}, std::int64_t{-1}, std::int64_t{0x3C4E04},
                                    std::numeric_limits<std::int64_t>::min(), std::numeric_limits<std::int64_t>::max()})
    EXPECT_EQ(parseInteger64(hexText(number)), number);
}

TEST(PlainText, WhatWouldEndALineOrSteerATerminalIsEscapedAndNothingElseIs) {
  EXPECT_EQ(onOneLine("a\nb\r\t\x1b[31m\x7f"), "a\\nb\\r\\t\\u{1b}[31m\\u{7f}");
  EXPECT_EQ(onOneLine(std::string_view("\0x", 2)), "\\0x");
  EXPECT_EQ(onOneLine("\xC2\x85|\xC2\x9B|\xC2\x80"), "\\u{85}|\\u{9b}|\\u{80}");
  EXPECT_EQ(onOneLine("a\u202eb\u2028c\u2066d"), "a\\u{202e}b\\u{2028}c\\u{2066}d");
  EXPECT_EQ(onOneLine("Gr\u00fc\u00dfe\u00a0\u2026 \"C:\\n\" \xC2"), "Gr\u00fc\u00dfe\u00a0\u2026 \"C:\\n\" \ufffd");
  EXPECT_EQ(onOneLine(""), "");
}

TEST(PlainText, WhateverTheBytesALineIsHarmlessAndWhatWasHarmlessIsUnchanged) {
  // Every byte between others, every pair of bytes, and every character of the first plane.
  std::vector<std::string> texts;
  for (int first = 0; first < 256; ++first) {
    texts.push_back({'a', static_cast<char>(first), 'b'});
    for (int second = 0; second < 256; ++second) {
      texts.push_back({static_cast<char>(first), static_cast<char>(second)});
    }
  }
  for (std::uint32_t code = 0x80; code < 0x10000; ++code) {
    if (code >= 0xD800 && code < 0xE000) continue;
    std::string text;
    if (code >= 0x800) {
      text += static_cast<char>(0xE0 | code >> 12);
      text += static_cast<char>(0x80 | (code >> 6 & 0x3F));
    } else {
      text += static_cast<char>(0xC0 | code >> 6);
    }
    text += static_cast<char>(0x80 | (code & 0x3F));
    texts.push_back(text);
  }
  for (const std::string& text : texts) {
    const std::string line = onOneLine(text);
    ASSERT_TRUE(isHarmless(line)) << printed(Value::text(text));
    ASSERT_EQ(onOneLine(line), line);
    if (isHarmless(text)) {
      ASSERT_EQ(line, text);
    }
    // As inside a printed value, where nothing but quotation marks and backslashes has more escapes.
    if (text.find_first_of("\"\\") == std::string::npos) {
      ASSERT_EQ(onOneLine(printed(Value::text(text))), '"' + line + '"');
    }
    std::string json;
    appendJsonString(text, json);
    ASSERT_TRUE(isHarmless(json)) << json;
  }
}

TEST(PlainText, TheBeginningOfATextEndsBetweenTwoCharacters) {
  EXPECT_EQ(beginningOf("abc", 3), "abc");
  EXPECT_EQ(beginningOf("abcd", 3), "abc");
  EXPECT_EQ(beginningOf("ab\u00e9", 3), "ab");
  EXPECT_EQ(beginningOf("ab\u00e9", 4), "ab\u00e9");
  EXPECT_EQ(beginningOf("\U0001F600x", 3), "");
  EXPECT_EQ(beginningOf("\U0001F600x", 4), "\U0001F600");
  // What is no UTF-8 is cut where it must be.
  EXPECT_EQ(beginningOf("\x80\x80\x80\x80\x80\x80", 5).size(), 5U);
}

}  // namespace
}  // namespace probeview
