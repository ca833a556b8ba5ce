// SPDX-License-Identifier: Apache-2.0
#include "tools/probectl.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <nlohmann/json.hpp>

#include "messages/metric_identifiers.h"
#include "messages/registry.h"
#include "tests/tools/run_probectl.h"
#include "ui/varnet_view_items.h"
#include "values/plain_text.h"

namespace probeview {
namespace {

TEST(Probectl, ShowsTheOneVersion) {
  const Outcome outcome = probectl({"--version"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_EQ(outcome.output, "probectl " PROBEVIEW_VERSION "\n");
}

TEST(Probectl, HelpStatesTheExitStatuses) {
  const Outcome outcome = probectl({"--help"});
  EXPECT_EQ(outcome.status, 0);
  EXPECT_THAT(outcome.output, ::testing::HasSubstr("Exit status: 0 done; 1"));
  EXPECT_EQ(outcome.errors, "");
}

TEST(Probectl, ACommandLineThatIsNotUnderstoodEndsWithStatusTwo) {
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{}, {"no-such-subcommand"}, {"--no-such-option"}, {"--socket"}}) {
    const Outcome outcome = probectl(arguments);
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(outcome.output, "");
    EXPECT_NE(outcome.errors, "");
  }
}

TEST(Probectl, ASubcommandThatThereIsNoneOfIsNamedWithThoseThatAreNear) {
  EXPECT_EQ(probectl({"stauts"}).errors,
            "probectl: there is no subcommand \"stauts\"; did you mean status? 'probectl --help' lists all\n");
  EXPECT_EQ(probectl({"--socket", "x", "wacth", "--json"}).errors,
            "probectl: there is no subcommand \"wacth\"; did you mean watch? 'probectl --help' lists all\n");
  EXPECT_EQ(probectl({"config", "puhs"}).errors,
            "probectl: there is no subcommand \"puhs\"; did you mean push? 'probectl config --help' lists all\n");
  EXPECT_EQ(probectl({"\x1b[2J"}).errors,
            "probectl: there is no subcommand \"\\u{1b}[2J\"; 'probectl --help' lists all\n");
  EXPECT_EQ(probectl({"stauts"}).status, 2);
}

TEST(Probectl, AClassOrMetricThatThereIsNoneOfIsNamedWithThoseThatAreNear) {
  EXPECT_EQ(probectl({"decode", "KCellularLteRrcStat", "-"}).errors,
            "probectl: \"KCellularLteRrcStat\" is no message class, no metric and no metric's identifier; did you mean "
            "KCellularLteRrcState?\n");
  EXPECT_THAT(probectl({"decode", "K_GSM_NCEL_MEAS", "-"}).errors,
              ::testing::HasSubstr("did you mean K_GSM_NCELL_MEAS"));
}

TEST(Probectl, MetricsListsAndExplainsEveryMetric) {
  const Outcome all = probectl({"metrics"});
  EXPECT_EQ(all.status, 0);
  const Outcome json = probectl({"metrics", "--json"});
  std::istringstream lines(json.output);
  std::string line;
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    EXPECT_THAT(all.output, ::testing::HasSubstr(std::string(metric.name) + "  " + hexText(metric.id) + "  "));
    ASSERT_TRUE(std::getline(lines, line)) << metric.name;
    const auto object = nlohmann::json::parse(line);
    EXPECT_EQ(object.at("metric"), metric.name);
    EXPECT_EQ(object.at("id"), metric.id);
    EXPECT_NE(object.at("meaning"), "");
    if (metric.message == nullptr) continue;
    ASSERT_EQ(object.at("fields").size(), metric.message->fields().size());
    for (const auto& field : object.at("fields")) EXPECT_NE(field.at("meaning"), "") << metric.name;
  }
  EXPECT_FALSE(std::getline(lines, line));
}

TEST(Probectl, MetricsExplainsTheFieldsOfThoseThatAreNamed) {
  const Outcome outcome = probectl({"metrics", "0x3C4E04"});
  EXPECT_THAT(outcome.output,
              ::testing::StartsWith("K_LTE_RRC_STATE  0x3C4E04  KCellularLteRrcState\n  State of the RRC"));
  EXPECT_THAT(outcome.output, ::testing::HasSubstr("\n  pages: \"LTE RRC State\"\n"));
  EXPECT_THAT(outcome.output, ::testing::HasSubstr("\n  prev_state_dur_ms  uint32 "));
  // A nested message's fields stand below it.
  EXPECT_THAT(probectl({"metrics", "K_LTE_TX_POWER"}).output,
              ::testing::ContainsRegex("  tx_power_info .*\n    [a-z]"));
  EXPECT_THAT(probectl({"metrics", "K_LTE_RLF"}).output, ::testing::HasSubstr("it has no message class"));
  const Outcome unknown = probectl({"metrics", "K_LTE_RFL"});
  EXPECT_EQ(unknown.status, 2);
  EXPECT_THAT(unknown.errors, ::testing::HasSubstr("did you mean K_LTE_RLF"));
}

TEST(Probectl, NamesAreOneALine) {
  EXPECT_EQ(std::ranges::count(probectl({"names", "metrics"}).output, '\n'), std::ssize(metricIdentifiers()));
  EXPECT_EQ(std::ranges::count(probectl({"names", "classes"}).output, '\n'), std::ssize(messageClasses()));
  EXPECT_EQ(std::ranges::count(probectl({"names", "pages"}).output, '\n'), std::ssize(navigablePageKeys()));
  EXPECT_EQ(probectl({"names", "pets"}).status, 2);
}

}  // namespace
}  // namespace probeview
