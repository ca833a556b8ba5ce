// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>

#include <clocale>
#include <cstdint>
#include <limits>
#include <memory>
#include <string>
#include <vector>

#include "tests/support/harmless.h"
#include "values/dictionary.h"
#include "values/json.h"
#include "values/plain_text.h"
#include "values/printer.h"
#include "values/value.h"

namespace probeview {
namespace {

Value bytesOf(std::initializer_list<std::uint8_t> bytes) { return Value::bytes(std::vector<std::uint8_t>(bytes)); }

std::string json(const Value& value) {
  std::string out;
  appendJson(value, out);
  return out;
}

TEST(Value, IsAnEmptyTextByDefault) {
  EXPECT_EQ(Value().kind(), ValueKind::Text);
  EXPECT_EQ(Value().text(), "");
}

TEST(Value, TextsOfEveryLengthSurviveCopiesAndMoves) {
  for (std::size_t length : {0u, 1u, 29u, 30u, 31u, 32u, 33u, 1000u}) {
    const std::string content(length, 'x');
    Value value = Value::text(content);
    Value copy = value;
    Value moved = std::move(value);
    EXPECT_EQ(copy.text(), content);
    EXPECT_EQ(moved.text(), content);
    EXPECT_EQ(value.text(), "");  // NOLINT(bugprone-use-after-move): a moved-from value is an empty text
    copy = Value(std::int32_t{1});
    EXPECT_EQ(moved.text(), content);
  }
}

TEST(Value, SelfAssignmentKeepsTheContent) {
  Value value = Value::text(std::string(100, 'y'));
  const Value& same = value;
  value = same;
  EXPECT_EQ(value.text(), std::string(100, 'y'));
}

TEST(Value, WritingToOneCopyLeavesTheOtherAsItWas) {
  Value one = Dictionary{{"a", std::int32_t{1}}};
  Value two = one;
  two.mutableDictionary()->set("a", std::int32_t{2});
  EXPECT_EQ(printed(one), R"(["a": 1])");
  EXPECT_EQ(printed(two), R"(["a": 2])");
  Value list = List{one, two};
  Value other = list;
  other.mutableList()->append(true);
  EXPECT_EQ(list.list()->size(), 2u);
  EXPECT_EQ(other.list()->size(), 3u);
}

TEST(Value, WhatAValueHoldsLivesUntilItsLastCopyGoes) {
  auto first = std::make_unique<Value>(List{Value::text(std::string(40, 'x')), Dictionary{{"a", std::int32_t{1}}}});
  Value second = *first;
  EXPECT_EQ(second.list(), second.mutableList()) << "a container is at its own place";
  const Value inner = (*first->list())[1];
  first->mutableList()->clear();
  first.reset();
  EXPECT_EQ(printed(second), "[\"" + std::string(40, 'x') + "\", [\"a\": 1]]");
  second = Value();
  EXPECT_EQ(printed(inner), "[\"a\": 1]");
}

TEST(Value, AnEmptyContainerIsCopiedAndFilledLikeAnyOther) {
  for (const Value& empty : {Value(List()), Value(Dictionary())}) {
    Value copy = empty;
    const Value other = copy;
    EXPECT_TRUE(copy == other);
    if (List* const list = copy.mutableList()) list->append(true);
    if (Dictionary* const dictionary = copy.mutableDictionary()) dictionary->set("a", true);
    EXPECT_FALSE(copy == other);
    EXPECT_EQ(printed(other), "[]");
  }
}

TEST(List, AFillerReplacesWhatWasThereAndKeepsWhatItHadWhenItEndsEarly) {
  List list{std::int32_t{1}, std::int32_t{2}};
  try {
    List::Filler values(list, 10);
    values.append(Value::text(std::string(40, 'y')));
    throw 1;
  } catch (int) {
  }
  EXPECT_EQ(printed(list), "[\"" + std::string(40, 'y') + "\"]");
  list.append(std::int32_t{3});
  EXPECT_EQ(list.size(), 2U);
}

TEST(Value, AnIntegerIsWhatFitsIntoSigned32Bits) {
  EXPECT_EQ(Value(std::int32_t{-5}).integer32(), -5);
  EXPECT_EQ(Value(std::uint32_t{2147483647u}).integer32(), 2147483647);
  EXPECT_EQ(Value(std::uint32_t{2147483648u}).integer32(), std::nullopt);
  EXPECT_EQ(Value(std::int64_t{-2147483648LL}).integer32(), std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(Value(std::int64_t{-2147483649LL}).integer32(), std::nullopt);
  EXPECT_EQ(Value(std::uint64_t{7}).integer32(), 7);
  EXPECT_EQ(Value(std::numeric_limits<std::uint64_t>::max()).integer32(), std::nullopt);
  EXPECT_EQ(Value(true).integer32(), std::nullopt);
  EXPECT_EQ(Value(1.0).integer32(), std::nullopt);
  EXPECT_EQ(Value::text("1").integer32(), std::nullopt);
}

TEST(Value, ARealIsAnyNumberButABoolean) {
  EXPECT_EQ(Value(std::uint32_t{3}).real(), 3.0);
  EXPECT_EQ(Value(1.5f).real(), 1.5);
  EXPECT_EQ(Value(true).real(), std::nullopt);
  EXPECT_EQ(Value::text("1").real(), std::nullopt);
}

TEST(Value, OnlyASigned64BitIntegerIsAnEventInteger) {
  EXPECT_EQ(Value(std::int64_t{2}).int64(), 2);
  EXPECT_EQ(Value(std::int32_t{2}).int64(), std::nullopt);
  EXPECT_EQ(Value(std::uint64_t{2}).int64(), std::nullopt);
}

TEST(Dictionary, KeepsTheOrderOfInsertionAndReplacesInPlace) {
  Dictionary dictionary{{"b", std::int32_t{1}}, {"a", std::int32_t{2}}};
  dictionary.set("c", std::int32_t{3});
  dictionary.set("b", Value::text("new"));
  EXPECT_EQ(printed(dictionary), R"(["b": "new", "a": 2, "c": 3])");
}

TEST(Dictionary, ComparesRegardlessOfOrder) {
  EXPECT_EQ((Dictionary{{"a", true}, {"b", false}}), (Dictionary{{"b", false}, {"a", true}}));
  EXPECT_FALSE((Dictionary{{"a", true}}) == (Dictionary{{"a", std::int32_t{1}}}));
}

TEST(Key, CopiesOwnTheirText) {
  std::string source = "temporary";
  Key key = Key::copy(source);
  source = "overwritten!!";
  Key copy = key;
  key = Key::copy("other");
  EXPECT_EQ(copy.text(), "temporary");
  EXPECT_EQ(key.text(), "other");
}

TEST(Printer, RealsAreTheShortestDecimalThatReadsBackAlwaysWithAPoint) {
  EXPECT_EQ(printed(Value(1.4f)), "1.4");
  EXPECT_EQ(printed(Value(10.0)), "10.0");
  EXPECT_EQ(printed(Value(-9.5)), "-9.5");
  EXPECT_EQ(printed(Value(-0.0)), "-0.0");
  EXPECT_EQ(printed(Value(1e21)), "1000000000000000000000.0");
  EXPECT_EQ(printed(Value(0.1)), "0.1");
  EXPECT_EQ(printed(Value(std::numeric_limits<double>::denorm_min())).size(), 326u);
}

TEST(Printer, IntegersArePlainDecimalWithAsciiMinus) {
  EXPECT_EQ(printed(Value(std::numeric_limits<std::int32_t>::min())), "-2147483648");
  EXPECT_EQ(printed(Value(std::numeric_limits<std::uint64_t>::max())), "18446744073709551615");
  EXPECT_EQ(printed(Value(true)), "1");
  EXPECT_EQ(printed(Value(false)), "0");
}

TEST(Printer, AnIntegerOfEveryLengthHasItsDigits) {
  // Around every power of ten, where a digit more begins, and every two and three digits inside.
  std::uint64_t power = 1;
  for (int digits = 1; digits <= 20; ++digits, power *= 10) {
    for (const std::uint64_t number : {power - 1, power, power + 1, 9 * (power / 10) + 7, power / 7, power / 3 * 2}) {
      EXPECT_EQ(printed(Value(number)), std::to_string(number));
      const auto whole = static_cast<std::int64_t>(number);
      EXPECT_EQ(printed(Value(whole)), std::to_string(whole));
      EXPECT_EQ(printed(Value(-whole)), std::to_string(-whole));
      const auto half = static_cast<std::uint32_t>(number);
      EXPECT_EQ(printed(Value(half)), std::to_string(half));
      const auto small = static_cast<std::int32_t>(half);
      EXPECT_EQ(printed(Value(small)), std::to_string(small));
    }
  }
  for (std::uint32_t number = 0; number < 20000; ++number) {
    ASSERT_EQ(printed(Value(number)), std::to_string(number));
    ASSERT_EQ(printed(Value(std::uint64_t{number} * 1'000'003)), std::to_string(std::uint64_t{number} * 1'000'003));
  }
}

TEST(Printer, ALineOfAnyLengthIsTheSumOfItsParts) {
  static constexpr char printedKey[Key::longestFramed] = "\"rsrp_of_first_antenna\": ";
  const std::string_view framed = printedKey;
  const Key key = Key::framed(framed.substr(1, framed.size() - 4));
  const Value parts[] = {std::numeric_limits<std::uint64_t>::max(),
                         std::numeric_limits<std::int32_t>::min(),
                         std::uint32_t{7},
                         true,
                         -std::numeric_limits<double>::denorm_min(),
                         Value::text(std::string(40, 'x') + "\x01\xC3(\n"),
                         Identifier{"NOT_CAMPED"},
                         Value::bytes(std::vector<std::uint8_t>(700, 0xA5)),
                         List{},
                         List{List{List{List{Dictionary{{"key", std::uint32_t{1}}}}}}},
                         Dictionary{}};
  // Each part once at every distance from a buffer's end.
  for (std::size_t before = 0; before < 4200; before += before < 3800 ? 100 : 1) {
    const std::string text(before, 'a');
    for (const Value& part : parts) {
      Dictionary dictionary{{"before", Value::text(text)}};
      dictionary.append(key, part);
      dictionary.append(key, List{part, part});
      const std::string one = printed(part);
      ASSERT_EQ(printed(dictionary), "[\"before\": \"" + text + "\", " + std::string(framed) + one + ", " +
                                         std::string(framed) + "[" + one + ", " + one + "]]");
    }
  }
}

TEST(Printer, BytesAreHexadecimalBetweenAngles) {
  EXPECT_EQ(printed(bytesOf({0x62, 0xf2, 0x10})), "<62f210>");
  EXPECT_EQ(printed(bytesOf({})), "<>");
  std::vector<std::uint8_t> bytes;
  std::string digits;
  for (int byte = 0; byte < 256; ++byte) {
    bytes.push_back(static_cast<std::uint8_t>(byte));
    digits += {"0123456789abcdef"[byte / 16], "0123456789abcdef"[byte % 16]};
    EXPECT_EQ(printed(Value::bytes(bytes)), '<' + digits + '>');
  }
}

TEST(Printer, EmptyContainersAreABracketPair) {
  EXPECT_EQ(printed(Dictionary()), "[]");
  EXPECT_EQ(printed(List()), "[]");
  EXPECT_EQ(printed(List{std::uint32_t{1}, std::uint32_t{4}}), "[1, 4]");
}

TEST(Printer, TextInsideADictionaryIsEscapedSoThatALineStaysALine) {
  using namespace std::string_view_literals;
  EXPECT_EQ(printed(Value::text("a\\b\"c\nd\re\tf\0g\x01h\x7fi\x1fj"sv)),
            R"("a\\b\"c\nd\re\tf\0g\u{1}h\u{7f}i\u{1f}j")");
  EXPECT_EQ(printed(Value::text("gr\xC3\xBC\xC3\x9F dich \xE2\x82\xAC")), "\"gr\xC3\xBC\xC3\x9F dich \xE2\x82\xAC\"");
}

TEST(Printer, AnEscapeIsFoundAtEveryPlaceOfATextOfEveryLength) {
  for (std::size_t size = 1; size < 40; ++size) {
    for (std::size_t place = 0; place < size; ++place) {
      for (int code = 0; code < 256; ++code) {
        const char character = static_cast<char>(code);
        std::string text(size, 'a');
        text[place] = character;
        const bool isPlain = code >= 32 && code < 127 && character != '"' && character != '\\';
        const std::string shown = printed(Value::text(text));
        ASSERT_EQ(shown == '"' + text + '"', isPlain) << size << " " << place << " " << code;
        ASSERT_EQ(shown.substr(1, place), std::string(place, 'a'));
        ASSERT_TRUE(shown.ends_with(std::string(size - place - 1, 'a') + '"'));
      }
    }
  }
}

TEST(Printer, AppendsToWhatIsThere) {
  std::string out = "prefix ";
  print(Value(std::int32_t{7}), out);
  print(Value::text(std::string(5000, 'x')), out);
  EXPECT_EQ(out, "prefix 7\"" + std::string(5000, 'x') + '"');
}

TEST(Value, IsAssignedFromWhatItHolds) {
  Value value(List{List{std::int32_t{1}}, std::int32_t{2}});
  value = Value((*value.list())[0]);
  EXPECT_EQ(printed(value), "[1]");
  value = Value(Dictionary{{"inner", Dictionary{{"key", Value::text(std::string(40, 'y'))}}}});
  value = std::move(value.mutableDictionary()->find("inner")->mutableDictionary()->find("key")[0]);
  EXPECT_EQ(bareText(value), std::string(40, 'y'));
}

TEST(Printer, BareTextIsNotEscaped) {
  EXPECT_EQ(bareText(Value::text("a\"b\n")), "a\"b\n");
  EXPECT_EQ(bareText(Value(std::int32_t{-4})), "-4");
}

TEST(Printer, IllFormedUtf8ShowsAsReplacementCharacters) {
  EXPECT_EQ(printed(Value::text("\xC3(")), "\"\xEF\xBF\xBD(\"");
  EXPECT_EQ(bareText(Value::text("a\xFFz")), "a\xEF\xBF\xBDz");
  EXPECT_EQ(bareText(Value::text("\xE2\x82")), "\xEF\xBF\xBD");  // cut short: one replacement
  EXPECT_EQ(bareText(Value::text("\xED\xA0\x80")), "\xEF\xBF\xBD\xEF\xBF\xBD\xEF\xBF\xBD");  // a surrogate
  EXPECT_FALSE(isValidUtf8("\xC0\x80"));
  EXPECT_FALSE(isValidUtf8("\xF4\x90\x80\x80"));
  EXPECT_TRUE(isValidUtf8("\xF4\x8F\xBF\xBF"));
}

TEST(Printer, AFlattenedTextPrintedAgainIsEscapedAgain) {
  const std::string flat = printed(Dictionary{{"apn", Value::text("x\"y")}});
  EXPECT_EQ(flat, R"(["apn": "x\"y"])");
  EXPECT_EQ(printed(Value::text(flat)), R"("[\"apn\": \"x\\\"y\"]")");
}

TEST(Printer, ACommaDecimalLocaleChangesNothing) {
  const char* found = nullptr;
  for (const char* name : {"de_DE.UTF-8", "de_DE.utf8", "fr_FR.UTF-8", "de_DE"}) {
    found = std::setlocale(LC_ALL, name);
    if (found != nullptr) break;
  }
  EXPECT_EQ(printed(Value(-9.5)), "-9.5");
  EXPECT_EQ(json(Value(1234.5)), "1234.5");
  std::setlocale(LC_ALL, "C");
  if (found == nullptr) GTEST_SKIP() << "no comma-decimal locale is installed here";
}

TEST(Json, KeepsIntegersBytesAndTextsThatAreNotUtf8) {
  const Dictionary dictionary{{"u", std::numeric_limits<std::uint64_t>::max()},
                              {"r", 10.0},
                              {"f", 1.4f},
                              {"b", true},
                              {"y", bytesOf({0x62, 0xf2, 0x10})},
                              {"t", Value::text("\xC3(")},
                              {"l", List{std::int32_t{-1}, Value::text("q\"\n\x01")}}};
  EXPECT_EQ(json(dictionary),
            R"({"u":18446744073709551615,"r":10.0,"f":1.4,"b":true,"y":{"bytes":"62f210"},"t":{"text":"c328"},)"
            R"("l":[-1,"q\"\n\u0001"]})");
}

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
