// SPDX-License-Identifier: Apache-2.0
//
// The subcommands that talk to the service, against a service behind a real socket.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <nlohmann/json.hpp>
#include <sstream>

#include "messages/metric_identifiers.h"
#include "messages/nas_messages.h"
#include "tests/service/harness/temporary_folder.h"
#include "tests/service/harness/test_service.h"
#include "tools/probectl.h"
#include "tools/record_text.h"
#include "values/printer.h"

namespace probeview {
namespace {

using std::chrono::milliseconds;
using ::testing::HasSubstr;
using ::testing::StartsWith;

struct Outcome {
  int status;
  std::string output;
  std::string errors;
};

class ServiceCommands : public ::testing::Test {
 protected:
  ServiceCommands() {
    world_->script().origin = "scripted";
    world_->script().metrics = {K_SIM_FILE_INFO, K_LTE_RRC_STATE, K_CELLULAR_MM_CTXT};
    world_->kill();
    world_->restart();
  }

  Outcome probectl(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), {"--socket", world_->socketPath()});
    std::istringstream in;
    std::ostringstream out;
    std::ostringstream err;
    const int status = runProbectl(arguments, in, out, err);
    return {status, out.str(), err.str()};
  }

  std::optional<MetricPlan> plan() {
    std::optional<MetricPlan> seen;
    world_->onService([&] { seen = world_->script().plan; });
    return seen;
  }

  std::unique_ptr<TestService> world_ = makeSocketService();
};

TEST_F(ServiceCommands, WatchPrintsEachRecordAsALineForAPerson) {
  world_->emit(K_LTE_RRC_STATE, {0x10, 3}, milliseconds(1709640000000));
  const Outcome outcome = probectl({"watch", "--count", "1"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_EQ(outcome.output,
            "2024-03-05 12:00:00 UTC  scripted  K_LTE_RRC_STATE  [\"state\": \"KLTE_RRC_STATE_CONNECTED\"]\n");
}

TEST_F(ServiceCommands, WatchPrintsRecordsThatComeWhileItListens) {
  world_->onService([&] {
    world_->script().onListening = [this](bool listening) {
      if (listening) world_->script().emit(K_LTE_RRC_STATE, {0x10, 1});
    };
  });
  EXPECT_THAT(probectl({"watch", "--count", "1"}).output, HasSubstr("KLTE_RRC_STATE_IDLE"));
}

TEST_F(ServiceCommands, WatchAsJsonPrintsOneObjectALineWithItsKeysInOrder) {
  world_->emit(K_LTE_RRC_STATE, {0x10, 3}, milliseconds(1709640000123));
  world_->emit(77, {1, 2}, milliseconds(5));
  const Outcome outcome = probectl({"watch", "--json", "--count", "2"});
  EXPECT_EQ(outcome.output,
            "{\"time\":1709640000123,\"origin\":\"scripted\",\"metric\":\"K_LTE_RRC_STATE\",\"id\":3952132,"
            "\"dict\":{\"state\":\"KLTE_RRC_STATE_CONNECTED\"}}\n"
            "{\"time\":5,\"origin\":\"scripted\",\"metric\":\"0x4D\",\"id\":77,\"dict\":null}\n");
}

TEST_F(ServiceCommands, PersonalFieldsShowAsAnEllipsisUnlessAskedFor) {
  // tmsi (field 5) 7, reject_cause left out.
  world_->emit(K_CELLULAR_MM_CTXT, {0x28, 7});
  EXPECT_THAT(probectl({"watch", "--count", "1"}).output, HasSubstr("[\"tmsi\": \"…\"]"));
  EXPECT_THAT(probectl({"watch", "--count", "1", "--personal"}).output, HasSubstr("[\"tmsi\": 7]"));
  EXPECT_THAT(probectl({"watch", "--count", "1", "--json"}).output, HasSubstr("{\"tmsi\":\"…\"}"));
}

TEST_F(ServiceCommands, WatchShowsThoseMetricsAloneThatAreNamed) {
  world_->emit(K_LTE_RRC_STATE, {0x10, 3});
  world_->emit(K_CELLULAR_MM_CTXT, {0x28, 7});
  const Outcome one = probectl({"watch", "--count", "1", "K_CELLULAR_MM_CTXT"});
  EXPECT_THAT(one.output, HasSubstr("K_CELLULAR_MM_CTXT"));
  EXPECT_EQ(std::count(one.output.begin(), one.output.end(), '\n'), 1);
  EXPECT_THAT(probectl({"watch", "0x3C4E04", "0x4D", "--count", "1"}).output, HasSubstr("K_LTE_RRC_STATE"));
  const Outcome unknown = probectl({"watch", "K_LTE_RCC_STATE"});
  EXPECT_EQ(unknown.status, 2);
  EXPECT_EQ(unknown.errors,
            "probectl: \"K_LTE_RCC_STATE\" is no metric and no metric's identifier; did you mean K_LTE_RRC_STATE?\n");
}

TEST_F(ServiceCommands, WatchOfChangesShowsTheFirstRecordAndThenOnlyWhatIsNotAsItWas) {
  world_->onService([&] {
    world_->script().onListening = [this](bool listening) {
      if (!listening) return;
      auto& script = world_->script();
      // timestamp, state and cause; nothing but the time changes; the state does; the cause goes.
      script.emit(K_LTE_RRC_STATE, {0x08, 1, 0x10, 1, 0x28, 1});
      script.emit(K_LTE_RRC_STATE, {0x08, 2, 0x10, 1, 0x28, 1});
      script.emit(K_LTE_RRC_STATE, {0x08, 3, 0x10, 3, 0x28, 1});
      script.emit(K_LTE_RRC_STATE, {0x08, 4, 0x10, 3});
      script.emit(77, {1});
      script.emit(77, {1});
      script.emit(77, {2});
    };
  });
  const Outcome outcome = probectl({"watch", "--changes", "--json", "--count", "5"});
  std::istringstream lines(outcome.output);
  std::vector<nlohmann::json> shown;
  for (std::string line; std::getline(lines, line);) shown.push_back(nlohmann::json::parse(line));
  ASSERT_EQ(shown.size(), 5u);
  EXPECT_EQ(shown[0].at("dict").size(), 3u);
  EXPECT_EQ(shown[1].at("dict").dump(), R"({"state":"KLTE_RRC_STATE_CONNECTED"})");
  EXPECT_FALSE(shown[1].contains("gone"));
  EXPECT_EQ(shown[2].at("dict").dump(), "{}");
  EXPECT_EQ(shown[2].at("gone").dump(), R"(["cause"])");
  EXPECT_EQ(shown[3].at("id"), 77);
  EXPECT_EQ(shown[4].at("id"), 77);
}

TEST(WatchCommand, ANumberOfRecordsThatIsNoneGetsAnErrorForPeople) {
  for (const char* count : {"0", "-1", "abc", "1.5", "99999999999999999999"}) {
    std::istringstream in;
    std::ostringstream out;
    std::ostringstream err;
    const std::vector<std::string> arguments{"watch", "--count=" + std::string(count)};
    EXPECT_EQ(runProbectl(arguments, in, out, err), 2);
    EXPECT_THAT(err.str(), HasSubstr("--count: \"" + std::string(count) +
                                     "\" is no number of records: a whole number, at least 1\n"));
  }
}

TEST(PersonalData, IsHiddenHoweverDeepItLies) {
  const auto shown = [](const MessageDescriptor& message, Dictionary dictionary) {
    hidePersonalData(dictionary, message);
    return printed(dictionary);
  };
  EXPECT_EQ(shown(KCellularMmCommonInfo::pbDescriptor,
                  {{"imsi", Value::text("001010000000001")},
                   {"eplmn_list", List{Dictionary{{"encoded_plmn", Value::text("z")}}}}}),
            "[\"imsi\": \"…\", \"eplmn_list\": [[\"encoded_plmn\": \"z\"]]]");
  EXPECT_EQ(shown(KCellularEmmContext::pbDescriptor, {{"guti", Dictionary{{"m_tmsi", std::uint32_t{5}}}}}),
            "[\"guti\": \"…\"]");
  EXPECT_EQ(shown(KCellularActivatedBearerContexts::pbDescriptor,
                  {{"bearer_contexts", List{Dictionary{{"cid", std::uint32_t{1}}, {"pdp_addr", Value::text("x")}}}}}),
            "[\"bearer_contexts\": [[\"cid\": 1, \"pdp_addr\": \"…\"]]]");
  EXPECT_EQ(shown(KCellularSimCardFiles::pbDescriptor,
                  {{"ef_list", List{Dictionary{{"ef_id", std::uint32_t{28423}}, {"content", Value::text("y")}}}}}),
            "[\"ef_list\": [[\"ef_id\": 28423, \"content\": \"…\"]]]");
}

TEST_F(ServiceCommands, QueryPrintsTheAnswerAndNotTheRecordFromBefore) {
  world_->emit(K_LTE_RRC_STATE, {0x10, 1});
  world_->onService([&] {
    world_->script().onQuery = [this](std::int64_t metric) {
      world_->script().emit(metric, {0x10, 3});
      return true;
    };
  });
  const Outcome outcome = probectl({"query", "K_LTE_RRC_STATE"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_THAT(outcome.output, HasSubstr("KLTE_RRC_STATE_CONNECTED"));
  EXPECT_EQ(std::count(outcome.output.begin(), outcome.output.end(), '\n'), 1);
  EXPECT_EQ(probectl({"query", "0x3C4E04", "--json"}).status, 0);
}

TEST_F(ServiceCommands, AQueryDoesNotKeepSourcesAwakeAndAWatchDoes) {
  int listened = 0;
  world_->onService([&] {
    world_->script().onListening = [&](bool listening) {
      if (!listening) return;
      ++listened;
      world_->script().emit(K_LTE_RRC_STATE, {0x10, 1});
    };
    world_->script().onQuery = [this](std::int64_t metric) {
      world_->script().emit(metric, {0x10, 3});
      return true;
    };
  });
  EXPECT_EQ(probectl({"query", "K_LTE_RRC_STATE"}).status, 0);
  world_->onService([&] { EXPECT_EQ(listened, 0); });
  EXPECT_EQ(probectl({"watch", "--count", "1"}).status, 0);
  world_->onService([&] { EXPECT_EQ(listened, 1); });
}

TEST_F(ServiceCommands, AQueryThatNoSourceCanFillEndsWithStatusOneAndTheReason) {
  const Outcome outcome = probectl({"query", "K_LTE_TX_POWER"});
  EXPECT_EQ(outcome.status, 1);
  EXPECT_EQ(outcome.output, "");
  EXPECT_EQ(outcome.errors, "probectl: no source can fill K_LTE_TX_POWER (0x3CD302)\n");
  EXPECT_EQ(probectl({"query", "K_NOBODY_KNOWS"}).status, 2);
  EXPECT_THAT(probectl({"query", "k_lte_txpower"}).errors, HasSubstr("; did you mean K_LTE_TX_POWER"));
  EXPECT_EQ(probectl({"query", "0x7F0013"}).errors,
            "probectl: 0x7F0013 is no metric, and no configuration says which metrics a trigger of that number stands "
            "for: push one with it under [triggers]\n");
}

TEST_F(ServiceCommands, AQueryOfATriggerPrintsTheMetricThatAnswersIt) {
  const TemporaryFolder folder;
  const std::string path = folder.path() + "/base.deviceconfig";
  std::ofstream(path) << "[triggers]\n0x7F0013 = [\"K_LTE_RRC_STATE\"]\n";
  ASSERT_EQ(probectl({"config", "push", path}).status, 0);
  world_->onService([&] {
    world_->script().onQuery = [this](std::int64_t metric) {
      world_->script().emit(metric, {0x10, 3});
      return true;
    };
  });
  const Outcome outcome = probectl({"query", "0x7F0013"});
  EXPECT_EQ(outcome.status, 0) << outcome.errors;
  EXPECT_THAT(outcome.output, HasSubstr("KLTE_RRC_STATE_CONNECTED"));
}

TEST_F(ServiceCommands, ConfigPushSetsTheBaseConfigurationAndClearTakesItAway) {
  const TemporaryFolder folder;
  const std::string path = folder.path() + "/base.deviceconfig";
  std::ofstream(path) << "[metrics]\nK_LTE_RRC_STATE = 400\n";
  EXPECT_EQ(probectl({"config", "push", path}).status, 0);
  ASSERT_TRUE(plan());
  EXPECT_EQ(plan()->metrics.at(K_LTE_RRC_STATE), milliseconds(400));
  EXPECT_EQ(probectl({"config", "clear"}).status, 0);
  EXPECT_EQ(plan(), std::nullopt);
}

TEST_F(ServiceCommands, AConfigurationThatIsRefusedOrCannotBeReadEndsWithStatusOneAndTheReason) {
  const TemporaryFolder folder;
  const std::string path = folder.path() + "/bad.deviceconfig";
  std::ofstream(path) << "[metrics\n";
  const Outcome refused = probectl({"config", "push", path});
  EXPECT_EQ(refused.status, 1);
  EXPECT_THAT(refused.errors, StartsWith("probectl: " + path + ": "));
  EXPECT_THAT(refused.errors, HasSubstr("line 1"));
  std::ofstream(path) << std::string(200000, '#');
  EXPECT_THAT(probectl({"config", "push", path}).errors,
              StartsWith("probectl: " + path + ": the configuration has more than 131072 bytes; at most "));
  std::ofstream(path) << "[metric]\nK_LTE_RRC_STATE = 5\n";
  const Outcome unknown = probectl({"config", "push", path});
  EXPECT_EQ(unknown.status, 1);
  EXPECT_THAT(unknown.errors,
              HasSubstr("neither [metrics] nor [triggers] here, only \"metric\"; did you mean metrics?\n"));
  std::ofstream(path) << "[metrics]\nK_NOBODY_KNOWS = 5\n";
  const Outcome noted = probectl({"config", "push", path});
  EXPECT_EQ(noted.status, 0);
  EXPECT_THAT(noted.errors, StartsWith("probectl: " + path + ": line 2"));
  EXPECT_EQ(probectl({"config", "push", folder.path()}).errors,
            "probectl: cannot read " + folder.path() + ": Is a directory\n");
  EXPECT_THAT(probectl({"config", "push", folder.path() + "/none"}).errors, HasSubstr("No such file"));
  EXPECT_EQ(probectl({"config"}).status, 2);
}

TEST_F(ServiceCommands, StatusShowsSourcesAndClients) {
  world_->emit(K_LTE_RRC_STATE, {0x10, 1});
  const Outcome outcome = probectl({"status"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_THAT(outcome.output, StartsWith("radixd " PROBEVIEW_VERSION ", up for "));
  EXPECT_THAT(outcome.output, HasSubstr("  scripted: running, 1 records, "));
  EXPECT_THAT(outcome.output, HasSubstr("'probectl'"));
  const auto json = nlohmann::json::parse(probectl({"status", "--json"}).output);
  EXPECT_EQ(json.at("sources").at(0).at("records"), 1);
  EXPECT_EQ(json.at("sources").at(0).at("state"), "running");
  EXPECT_GE(json.at("sources").at(0).at("last_record_age_ms"), 0);
  EXPECT_EQ(json.at("clients").at(0).at("name"), "probectl");
}

TEST_F(ServiceCommands, StatusTellsASourceThatHasEndedFromOneThatHasFailedAndWhy) {
  world_->script().intake = SourceIntake{.rowsRead = 300, .rowsSkipped = 2};
  world_->kill();
  world_->restart();
  using Phase = SourceCondition::Phase;
  world_->onService([&] { world_->script().sink->conditionChanged({.phase = Phase::Ended, .reason = {}}); });
  EXPECT_THAT(probectl({"status"}).output,
              HasSubstr("  scripted: ended, 300 rows read, 2 skipped, 0 records, 0.0/s, "));
  auto source = nlohmann::json::parse(probectl({"status", "--json"}).output).at("sources").at(0);
  EXPECT_EQ(source.at("state"), "ended");
  EXPECT_EQ(source.at("rows_read"), 300);
  EXPECT_EQ(source.at("rows_skipped"), 2);
  EXPECT_FALSE(source.contains("last_record_age_ms"));
  EXPECT_FALSE(source.contains("failure"));
  world_->onService(
      [&] { world_->script().sink->conditionChanged({.phase = Phase::Failed, .reason = "the card is gone"}); });
  EXPECT_THAT(probectl({"status"}).output, HasSubstr("  scripted: failed, "));
  EXPECT_THAT(probectl({"status"}).output, HasSubstr("; the card is gone\n"));
  source = nlohmann::json::parse(probectl({"status", "--json"}).output).at("sources").at(0);
  EXPECT_EQ(source.at("state"), "failed");
  EXPECT_EQ(source.at("failure"), "the card is gone");
}

TEST_F(ServiceCommands, WithoutAServiceEachSaysSoAndEndsWithStatusOne) {
  const std::string path = world_->socketPath();
  world_->kill();
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{"status"}, {"query", "K_LTE_RRC_STATE"}, {"config", "clear"}}) {
    const Outcome outcome = probectl(arguments);
    EXPECT_EQ(outcome.status, 1);
    EXPECT_EQ(outcome.errors, "probectl: no baseband service at " + path + "; start radixd or set RADIXD_SOCKET\n");
  }
}

}  // namespace
}  // namespace probeview
