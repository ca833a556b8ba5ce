// SPDX-License-Identifier: Apache-2.0
#include "service/configuration.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <random>

#include "messages/metric_identifiers.h"
#include "tests/support/golden.h"

namespace probeview {
namespace {

using std::chrono::milliseconds;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::Pair;

Configuration parse(std::string_view text) {
  ConfigurationResult result = parseConfiguration(text);
  EXPECT_EQ(result.error, "");
  return result.configuration.value_or(Configuration{});
}

ConfigurationResult refusal(std::string_view text) {
  ConfigurationResult result = parseConfiguration(text);
  EXPECT_FALSE(result.configuration.has_value());
  return result;
}

TEST(Configuration, TheShippedFileListsEveryHandledMetricAndTheTriggerOfTheSimFiles) {
  const Configuration configuration = parse(contentOf("resources/kiv_test_lte.deviceconfig"));
  std::size_t handled = 0;
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    EXPECT_EQ(configuration.plan.metrics.contains(metric.id), metric.isHandled) << metric.name;
    handled += metric.isHandled ? 1 : 0;
  }
  EXPECT_EQ(configuration.plan.metrics.size(), handled);
  EXPECT_THAT(configuration.triggers, ElementsAre(Pair(0x7F0013, ElementsAre(K_SIM_FILE_INFO))));
  EXPECT_THAT(configuration.notes, IsEmpty());
}

TEST(Configuration, AMetricIsNamedByNameOrIdentifierAndWantedOnChangeOrWithAPeriod) {
  const Configuration configuration = parse(
      "[metrics]\n"
      "K_LTE_RRC_STATE = \"on change\"\n"
      "0x3C40C2 = 5000\n"
      "\"0x3cd302\" = 1\n"
      "3993359 = 86400000 # 0x3CEF0F is nobody's\n"
      "3986191 = 86400000\n");
  EXPECT_THAT(configuration.plan.metrics,
              ElementsAre(Pair(K_LTE_SCELL_INFO, milliseconds(5000)), Pair(K_LTE_RRC_STATE, std::nullopt),
                          Pair(K_LTE_TX_POWER, milliseconds(1)), Pair(K_LTE_INTRARAT_MEAS, milliseconds(86400000))));
}

TEST(Configuration, ATriggerIsAnsweredByMetricsNamedByNameOrIdentifier) {
  const Configuration configuration = parse(
      "[triggers]\n"
      "0x7F0013 = [\"K_SIM_FILE_INFO\", 0x3C4E04, \"0x3CD509\", \"K_SIM_FILE_INFO\"]\n"
      "8 = []\n");
  EXPECT_THAT(configuration.triggers,
              ElementsAre(Pair(8, IsEmpty()),
                          Pair(0x7F0013, ElementsAre(K_SIM_FILE_INFO, K_LTE_RRC_STATE, K_CELLULAR_MM_INFO))));
}

TEST(Configuration, AnEmptyFileIsValidAndWantsNothing) {
  for (const char* text : {"", "\n\n", "# nothing\n", "[metrics]\n[triggers]\n"}) {
    const Configuration configuration = parse(text);
    EXPECT_THAT(configuration.plan.metrics, IsEmpty());
    EXPECT_THAT(configuration.triggers, IsEmpty());
    EXPECT_THAT(configuration.notes, IsEmpty());
  }
}

TEST(Configuration, AnUnknownMetricIsNotedWithItsLineAndIgnored) {
  const Configuration configuration = parse(
      "[metrics]\n"
      "K_LTE_RRC_STATE = 1000\n"
      "K_NR_RRC_STATE = 1000\n"
      "0x3CFFFF = \"on change\"\n"
      "[triggers]\n"
      "1 = [\"K_NR_RRC_STATE\", 0x3CFFFE]\n");
  EXPECT_EQ(configuration.plan.metrics.size(), 1u);
  EXPECT_THAT(configuration.triggers, ElementsAre(Pair(1, IsEmpty())));
  EXPECT_THAT(configuration.notes,
              testing::UnorderedElementsAre("line 3: the metric \"K_NR_RRC_STATE\" is not known, ignored",
                                            "line 4: the metric \"0x3CFFFF\" is not known, ignored",
                                            "line 6: the metric \"K_NR_RRC_STATE\" is not known, ignored",
                                            "line 6: the metric 0x3CFFFE is not known, ignored"));
}

TEST(Configuration, ASectionThatNobodyKnowsIsNotedAndIgnoredBesideOneThatIsKnown) {
  const Configuration configuration = parse("[metrics]\nK_LTE_RRC_STATE = 1000\n[limits]\na = 1\n");
  EXPECT_EQ(configuration.plan.metrics.size(), 1u);
  ASSERT_EQ(configuration.notes.size(), 1u);
  EXPECT_THAT(configuration.notes[0], HasSubstr("line 3: \"limits\" is neither [metrics] nor [triggers], ignored"));
}

TEST(Configuration, ATextOfUnknownSectionsAloneIsRefusedAndTheKnownOnesAreNamed) {
  const ConfigurationResult result = refusal("\n[metric]\nK_LTE_RRC_STATE = 1000\n");
  EXPECT_EQ(result.line, 2u);
  EXPECT_EQ(result.error,
            "line 2, column 2: there is neither [metrics] nor [triggers] here, only \"metric\"; did you mean metrics?");
  EXPECT_EQ(refusal("a = 1\n[b]\n").error,
            "line 1, column 1: there is neither [metrics] nor [triggers] here, only \"a\" and others");
  // Nothing at all wants nothing.
  EXPECT_THAT(parse("# nothing\n").plan.metrics, IsEmpty());
  EXPECT_THAT(parse("[metrics]\n").plan.metrics, IsEmpty());
}

TEST(Configuration, ASyntaxErrorIsRefusedWithLineAndColumn) {
  const ConfigurationResult result = refusal("[metrics]\nK_LTE_RRC_STATE = \n");
  EXPECT_EQ(result.line, 2u);
  EXPECT_GT(result.column, 10u);
  EXPECT_THAT(result.error, testing::StartsWith("line 2, column "));
}

TEST(Configuration, ASectionWhoseNameBeginsWithNoLetterIsRefusedLikeAnyOtherSyntaxError) {
  for (const char* text : {"[%]\n", "[[%]]\n", "[\xC3\xA4]\n", "[]\n", "[=\n"}) {
    EXPECT_EQ(refusal(text).line, 1u) << text;
    EXPECT_GT(refusal(text).column, 1u) << text;
  }
}

TEST(Configuration, CharactersOutsideAsciiAreWelcomeInCommentsAndRefusedInNames) {
  const Configuration configuration =
      parse("\xEF\xBB\xBF# Gr\u00fc\u00dfe \ufefe\n[metrics]\nK_LTE_RRC_STATE = 5 # \u3000\n");
  EXPECT_EQ(configuration.plan.metrics.size(), 1u);
  for (const char* text : {"\n\u00e9 = 1\n", "\n\ufefe\n", "\n\u2e4f = 1", "\n[\u0499]\n", "\nx = \u00e9\n"}) {
    EXPECT_EQ(refusal(text).line, 2u) << text;
  }
}

TEST(Configuration, WhatIsNotUtf8IsRefusedWithItsPlace) {
  const ConfigurationResult result = refusal("# \u00e9\n# \u00e9\xff\n");
  EXPECT_EQ(result.error, "line 2, column 4: this is not UTF-8");
  for (const char* text : {"\xc3", "\xef", "\xef\xbf", "\xef\x41", "\xef\xbf\x41", "\xef\xbf\xc3"}) {
    EXPECT_EQ(refusal(std::string("#") + text).error, "line 1, column 2: this is not UTF-8");
  }
}

TEST(Configuration, WhatCannotBeMeantIsRefusedWithLineAndColumn) {
  const struct {
    const char* text;
    std::uint32_t line;
    std::uint32_t column;
    const char* error;
  } cases[] = {
      {"[metrics]\nK_LTE_RRC_STATE = 0\n", 2, 19,
       "the period of \"K_LTE_RRC_STATE\" is 0; a period is a number of milliseconds, 1 to 86400000, or \"on change\""},
      {"[metrics]\nK_LTE_RRC_STATE = -1\n", 2, 19, "is -1; a period is"},
      {"[metrics]\nK_LTE_RRC_STATE = 86400001\n", 2, 19, "is 86400001; a period is"},
      {"[metrics]\nK_LTE_RRC_STATE = \"often\"\n", 2, 19, "is \"often\"; a period is"},
      {"[metrics]\nK_LTE_RRC_STATE = 1.5\n", 2, 19, "is of another kind; a period is"},
      {"[metrics]\nK_LTE_RRC_STATE = true\n", 2, 19, "is of another kind; a period is"},
      {"[metrics]\n\nK_LTE_RRC_STATE = 1\n0x3C4E04 = 2\n", 4, 1,
       "0x3C4E04 is the metric K_LTE_RRC_STATE, which has a period already"},
      {"[metrics]\nK_LTE_RRC_STATE = 1\nK_LTE_RRC_STATE = 2\n", 3, 1, ""},
      {"metrics = 5\n", 1, 11, "metrics is to be a section: [metrics]"},
      {"[triggers]\nSIM = [\"K_SIM_FILE_INFO\"]\n", 2, 1,
       "a trigger is named by its number, such as 0x7F0013, not "
       "\"SIM\""},
      {"[triggers]\n1 = \"K_SIM_FILE_INFO\"\n", 2, 5, "a trigger takes a list of metrics"},
      {"[triggers]\n1 = [1.5]\n", 2, 6, "a metric is a name"},
      {"[triggers]\n1 = []\n0x1 = []\n", 3, 1, "the trigger 0x1 is there twice"},
  };
  for (const auto& each : cases) {
    SCOPED_TRACE(each.text);
    const ConfigurationResult result = refusal(each.text);
    EXPECT_EQ(result.line, each.line);
    if (each.error[0] != '\0') {
      EXPECT_EQ(result.column, each.column);
    }
    EXPECT_THAT(result.error, HasSubstr(each.error));
    EXPECT_THAT(result.error, testing::StartsWith("line " + std::to_string(result.line) + ", column "));
  }
}

TEST(Configuration, AnErrorIsOneLineWhateverTheFileHolds) {
  for (const std::string& text : {std::string("[metrics]\n\"a\\nb\\u001b\" = \"x\\ny\"\n"), std::string("\x01\n"),
                                  std::string("[metrics]\nx = \"\xff\"\n"), std::string("a = \"\x1b[2J\"")}) {
    const std::string error = refusal(text).error;
    for (const char character : error) EXPECT_GE(static_cast<unsigned char>(character), 32) << error;
  }
}

TEST(Configuration, TablesNestedToDeathAreRefused) {
  std::string dotted = "a";
  for (int depth = 0; depth < 60'000; ++depth) dotted += ".a";
  EXPECT_THAT(refusal(dotted + " = 1\n").error, HasSubstr("more than 4000 dots"));
  EXPECT_TRUE(parseConfiguration(dotted.substr(0, 8001) + " = 1\n[metrics]\n").configuration.has_value())
      << "4000 dots";
  EXPECT_THAT(refusal(dotted.substr(0, 8003) + " = 1\n").error, HasSubstr("more than 4000 dots"));
  refusal("a = " + std::string(100'000, '['));
  refusal("a = " + std::string(100'000, '{'));
}

TEST(Configuration, AHundredNotesAreKeptAndOfOneMoreOnlyTheNumber) {
  std::string text = "[metrics]\n";
  for (int count = 0; count < 100; ++count) text += "K_" + std::to_string(count) + " = 1\n";
  Configuration configuration = parse(text);
  ASSERT_EQ(configuration.notes.size(), 100u);
  EXPECT_EQ(configuration.notes.back(), "line 101: the metric \"K_99\" is not known, ignored");
  configuration = parse(text + "K_100 = 1\n");
  ASSERT_EQ(configuration.notes.size(), 101u);
  EXPECT_EQ(configuration.notes.back(), "and 1 more like these");
}

TEST(Configuration, AReasonThatQuotesTheFileIsCutShort) {
  // The same metric twice, the second time by a number of many digits.
  const auto twice = [](std::size_t zeros) {
    return "[metrics]\nK_LTE_RRC_STATE = 1\n0x" + std::string(zeros, '0') + "3C4E04 = 2\n";
  };
  const std::string what = " is the metric K_LTE_RRC_STATE, which has a period already";
  const std::size_t atLimit = 500 - what.size() - std::string("0x3C4E04").size();
  EXPECT_TRUE(refusal(twice(atLimit)).error.ends_with(what));
  EXPECT_TRUE(refusal(twice(atLimit + 1)).error.ends_with("alread…"));
  EXPECT_LT(refusal(twice(100'000)).error.size(), 600u);
  EXPECT_LT(refusal("[" + std::string(50'000, 'a') + "]\n[" + std::string(50'000, 'a') + "]\n").error.size(), 600u);
}

TEST(Configuration, RandomBytesAreSurvived) {
  std::mt19937 random(20240305);
  const std::string whole = contentOf("resources/kiv_test_lte.deviceconfig");
  ASSERT_FALSE(whole.empty());
  for (int round = 0; round < 2000; ++round) {
    std::string text = whole;
    for (int change = 0; change < 3; ++change) text[random() % text.size()] = static_cast<char>(random());
    const ConfigurationResult result = parseConfiguration(text);
    EXPECT_NE(result.configuration.has_value(), !result.error.empty());
  }
  for (int round = 0; round < 500; ++round) {
    std::string text(64, '\0');
    for (char& each : text) each = static_cast<char>(random());
    const ConfigurationResult result = parseConfiguration(text);
    EXPECT_NE(result.configuration.has_value(), !result.error.empty());
  }
}

}  // namespace
}  // namespace probeview
