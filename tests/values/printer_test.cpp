// SPDX-License-Identifier: Apache-2.0
#include "values/printer.h"

#include <gtest/gtest.h>

#include <clocale>
#include <cstdint>
#include <limits>
#include <string>
#include <vector>

#include "tests/values/support.h"
#include "values/dictionary.h"
#include "values/utf8.h"
#include "values/value.h"

namespace probeview {
namespace {

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

}  // namespace
}  // namespace probeview
