// SPDX-License-Identifier: Apache-2.0
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "messages/registry.h"
#include "tests/tools/run_probectl.h"
#include "tools/batch.h"

namespace probeview {
namespace {

using ::testing::HasSubstr;

TEST(DecodeCommand, PrintsALineForEachField) {
  const Outcome outcome = probectl({"decode", "K_LTE_RRC_STATE", "08c0843d1003180120d00f28ff01"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_EQ(outcome.output,
            "timestamp: 1000000\n"
            "state: KLTE_RRC_STATE_CONNECTED\n"
            "prev_state: KLTE_RRC_STATE_IDLE\n"
            "prev_state_dur_ms: 2000\n"
            "cause: KLTE_RRC_CAUSE_NA\n");
  EXPECT_EQ(outcome.errors, "");
}

TEST(DecodeCommand, TakesAClassAMetricOrAnIdentifier) {
  for (const char* reference : {"KCellularLteRrcState", "K_LTE_RRC_STATE", "0x3C4E04", "3952132"}) {
    EXPECT_EQ(probectl({"decode", reference, "1003"}).output, "state: KLTE_RRC_STATE_CONNECTED\n") << reference;
  }
}

TEST(DecodeCommand, AnEmptyPayloadHasNothingToShow) {
  const Outcome outcome = probectl({"decode", "KCellularLteTxPower", "-"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_EQ(outcome.output, "");
}

TEST(DecodeCommand, APayloadThatDoesNotDecodeShowsWhatCameBeforeAndEndsWithStatusOne) {
  const Outcome outcome = probectl({"decode", "KCellularLteTxPower", "0801120a"});
  EXPECT_EQ(outcome.status, 1);
  EXPECT_THAT(outcome.output, HasSubstr("timestamp: 1\n"));
  EXPECT_THAT(outcome.errors, HasSubstr("the payload does not decode as KCellularLteTxPower"));
}

TEST(DecodeCommand, WhatTheDecoderHasToSayGoesToTheErrorStream) {
  const Outcome outcome = probectl({"decode", "KCellularLteRrcState", "9801011003"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_EQ(outcome.output, "state: KLTE_RRC_STATE_CONNECTED\n");
  EXPECT_EQ(outcome.errors, "valid metricId tag\nUnknown tag: 13:1\n");
}

TEST(DecodeCommand, ATextThatWouldSteerATerminalIsShownEscaped) {
  EXPECT_EQ(probectl({"decode", "BearerContext", "1a031b5b4a"}).output, "apn: \"\\u{1b}[J\"\n");
  EXPECT_EQ(probectl({"decode", "BearerContext", "1a03610a62"}).output, "apn: \"a\\nb\"\n");
  EXPECT_EQ(probectl({"decode", "BearerContext", "1a03612262"}).output, "apn: a\"b\n");
}

TEST(DecodeCommand, TakesHexadecimalAsItIsPasted) {
  using Words = std::vector<std::string>;
  for (const Words& pasted : {Words{"10 03 18 01"},
                              {"10", "03", "18", "01"},
                              {"0x10 0x03\n0X18 0x01\n"},
                              {"0x10031801"},
                              {"100", "31801"},
                              {" 1003\r\n\t1801 "},
                              {"1003", "0x18", "01"}}) {
    Words arguments{"decode", "K_LTE_RRC_STATE"};
    arguments.insert(arguments.end(), pasted.begin(), pasted.end());
    const Outcome outcome = probectl(arguments);
    EXPECT_EQ(outcome.status, 0) << outcome.errors;
    EXPECT_EQ(outcome.output, "state: KLTE_RRC_STATE_CONNECTED\nprev_state: KLTE_RRC_STATE_IDLE\n");
  }
  for (const Words& odd : {Words{"0x1", "0x3"}, {"0x"}, {"10 0"}, {"10", "-"}, {"-", "-"}, {" "}, {"1,0"}}) {
    Words arguments{"decode", "K_LTE_RRC_STATE"};
    arguments.insert(arguments.end(), odd.begin(), odd.end());
    EXPECT_EQ(probectl(arguments).status, 2) << odd[0];
  }
}

TEST(DecodeCommand, WhatIsNotUnderstoodEndsWithStatusTwo) {
  EXPECT_EQ(probectl({"decode"}).status, 2);
  EXPECT_EQ(probectl({"decode", "K_LTE_RRC_STATE"}).status, 2);
  EXPECT_EQ(probectl({"decode", "--batch", "K_LTE_RRC_STATE", "-"}).status, 2);
  EXPECT_THAT(probectl({"decode", "K_LTE_RRC_STATE", "xyz"}).errors, HasSubstr("\"xyz\" is no payload"));
  EXPECT_EQ(probectl({"decode", "K_LTE_RRC_STATE", "xyz"}).status, 2);
  EXPECT_THAT(probectl({"decode", "K_NONE", "-"}).errors, HasSubstr("\"K_NONE\" is no message class"));
  EXPECT_EQ(probectl({"decode", "K_LTE_RLF", "-"}).status, 2);
}

TEST(DecodeCommand, BatchKnowsEveryClass) {
  std::string lines;
  for (const MessageDescriptor* messageClass : messageClasses()) lines += std::string(messageClass->name) + " -\n";
  const Outcome outcome = probectl({"decode", "--batch"}, lines);
  EXPECT_EQ(outcome.status, 0);
  std::istringstream answers(outcome.output);
  std::string answer;
  std::size_t count = 0;
  while (std::getline(answers, answer)) {
    const auto json = nlohmann::json::parse(answer);
    EXPECT_EQ(json["class"], messageClasses()[count]->name);
    EXPECT_EQ(json["ok"], true);
    EXPECT_EQ(json["dict"].size(), 0u);
    EXPECT_EQ(json["reencoded"], "");
    ++count;
  }
  EXPECT_EQ(count, messageClasses().size());
}

TEST(DecodeCommand, BatchAnswersKeysInTheirOrderAndNoOthers) {
  EXPECT_EQ(probectl({"decode", "--batch"}, "K_LTE_RRC_STATE 1003\n").output,
            R"({"class":"KCellularLteRrcState","ok":true,"dict":{"state":"KLTE_RRC_STATE_CONNECTED"},)"
            R"("reencoded":"1003","log":[]})"
            "\n");
}

TEST(DecodeCommand, BatchTakesALongPayloadAndAnyBytes) {
  // A text of a million bytes.
  std::string hex = "1ac0843d";
  for (int count = 0; count < 1'000'000; ++count) hex += "61";
  const std::string anyBytes("\x01\xff\0 x\n", 6);
  const Outcome outcome = probectl({"decode", "--batch"}, "BearerContext " + hex + "\n" + anyBytes);
  std::istringstream answers(outcome.output);
  std::string answer;
  std::getline(answers, answer);
  EXPECT_EQ(nlohmann::json::parse(answer)["reencoded"], hex);
  std::getline(answers, answer);
  EXPECT_THAT(answer, HasSubstr("{\"error\":"));
  EXPECT_TRUE(nlohmann::json::accept(answer));
}

TEST(DecodeCommand, BatchSurvivesALineWithoutEnd) {
  const std::string endless(batchLineLengthLimit + 1, 'x');
  const Outcome outcome = probectl({"decode", "--batch"}, endless + "\nK_LTE_RRC_STATE 1003\n");
  EXPECT_THAT(outcome.output,
              testing::StartsWith("{\"error\":\"the line is longer than 67108864 bytes\"}\n{\"class\":"));
}

}  // namespace
}  // namespace probeview
