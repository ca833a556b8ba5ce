// SPDX-License-Identifier: Apache-2.0
//
// What probectl makes of a service that answers nonsense, and of texts that try to steer the terminal.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <nlohmann/json.hpp>
#include <sstream>

#include "messages/metric_identifiers.h"
#include "tests/support/frames.h"
#include "tests/support/harmless.h"
#include "tests/support/output_of.h"
#include "tests/tools/hostile_service.h"
#include "tests/tools/run_probectl.h"
#include "tools/status_command.h"

namespace probeview {
namespace {

using ::testing::HasSubstr;

std::string report(const Dictionary& reply) {
  std::ostringstream output;
  showReport(reply, output);
  return output.str();
}

std::vector<Value> oddValues() {
  std::vector<Value> values{
      std::numeric_limits<std::int64_t>::min(),
      std::numeric_limits<std::int64_t>::max(),
      std::numeric_limits<std::uint64_t>::max(),
      std::int64_t{-1},
      std::int32_t{-5},
      std::numeric_limits<double>::quiet_NaN(),
      std::numeric_limits<double>::infinity(),
      -1e308,
      1e308,
      std::numeric_limits<float>::quiet_NaN(),
      true,
      Value::text(hostileText()),
      Value::text(std::string(100'000, 'x')),
      Value::bytes(std::vector<std::uint8_t>{0xFF}),
      List{},
      Dictionary{},
  };
  List endless;
  for (int count = 0; count < 5000; ++count) endless.append(Dictionary{});
  values.emplace_back(std::move(endless));
  return values;
}

TEST(HostileReplies, AnOddValueUnderAnyKeyOfTheReportIsShownAsAQuestionMarkOrAsALine) {
  const Dictionary source{{"origin", Value::text("o")},     {"records", std::uint64_t{1}},
                          {"records_per_second", 1.0},      {"withheld", std::uint64_t{0}},
                          {"metrics", std::uint64_t{3}},    {"last_record_age_ms", std::int64_t{2000}},
                          {"failure", Value::text("why")},  {"state", Value::text("failed")},
                          {"rows_read", std::uint64_t{12}}, {"rows_skipped", std::uint64_t{2}}};
  const Dictionary client{{"number", std::uint64_t{1}}, {"name", Value::text("n")},    {"process", std::int64_t{2}},
                          {"user", std::int64_t{0}},    {"listening", true},           {"observes", true},
                          {"configured", true},         {"records", std::uint64_t{1}}, {"records_per_second", 0.5},
                          {"queued", std::uint64_t{0}}, {"lost", std::uint64_t{0}}};
  const Dictionary whole{{"service", Value::text("radixd")}, {"uptime_ms", std::int64_t{61000}},
                         {"base_configuration", true},       {"configured_metrics", std::uint64_t{2}},
                         {"sources", List{source}},          {"clients", List{client}}};
  EXPECT_EQ(
      report(whole),
      "radixd, up for 1 min 1 s\nconfigured: 2 metrics, with a base configuration\nsources:\n"
      "  o: failed, 12 rows read, 2 skipped, 1 records, 1.0/s, 0 withheld, can fill 3 metrics, last record 2.0 s old; "
      "why\nclients:\n"
      "  1 'n' (process 2, user 0): listens, observes, own configuration, 1 records, 0.5/s, 0 queued, 0 lost\n");
  const auto expectLines = [](const Dictionary& odd) {
    const std::string shown = report(odd);
    EXPECT_TRUE(areHarmless(shown)) << shown;
    EXPECT_LT(shown.size(), 200'000u);
  };
  for (const Value& odd : oddValues()) {
    for (const auto& entry : whole) {
      Dictionary reply = whole;
      reply.set(entry.key, odd);
      expectLines(reply);
    }
    for (const auto& entry : source) {
      Dictionary changed = source;
      changed.set(entry.key, odd);
      Dictionary reply = whole;
      reply.set("sources", List{changed});
      expectLines(reply);
    }
    for (const auto& entry : client) {
      Dictionary changed = client;
      changed.set(entry.key, odd);
      Dictionary reply = whole;
      reply.set("clients", List{changed, odd});
      expectLines(reply);
    }
  }
  EXPECT_THAT(report({}), HasSubstr("?, up for ?\n"));
}

TEST(HostileReplies, RatesAndTimesThatCannotBeMeantAreUnknown) {
  const auto rateShown = [](Value rate) {
    return report(
        {{"sources", List{Dictionary{{"origin", Value::text("o")}, {"records_per_second", std::move(rate)}}}}});
  };
  EXPECT_THAT(rateShown(2.25), HasSubstr("2.3/s"));
  for (const double odd : {std::nan(""), 1e308, -1.0, std::numeric_limits<double>::infinity()}) {
    EXPECT_THAT(rateShown(odd), HasSubstr(" ?/s,")) << odd;
  }
  for (const std::int64_t end : {std::numeric_limits<std::int64_t>::min(), std::numeric_limits<std::int64_t>::max()}) {
    const std::string shown = report({{"uptime_ms", end}, {"sources", List{Dictionary{{"last_record_age_ms", end}}}}});
    EXPECT_THAT(shown, HasSubstr("up for ?\n"));
    EXPECT_THAT(shown, Not(HasSubstr(" old")));
  }
}

TEST(HostileReplies, MoreEntriesThanAServiceHasAreCounted) {
  List many;
  for (int count = 0; count < 1003; ++count) many.append(Dictionary{});
  EXPECT_THAT(report({{"clients", std::move(many)}}), HasSubstr("\n  and 3 more\n"));
}

// Everything that a person sees of a service whose every text steers.
class HostileTexts : public ::testing::Test {
 protected:
  Outcome against(HostileService::Part part, std::vector<std::string> arguments) {
    const HostileService service(std::move(part));
    arguments.insert(arguments.begin(), {"--socket", service.path()});
    Outcome outcome = probectl(arguments);
    EXPECT_TRUE(areHarmless(outcome.output)) << outcome.output;
    EXPECT_TRUE(areHarmless(outcome.errors)) << outcome.errors;
    return outcome;
  }
  static radix::Event event(std::string origin, std::int64_t time) {
    // An access point's name with a sequence that clears the screen.
    return radix::metricEvent({.metricId = K_CELLULAR_ACTIVE_BEARER,
                               .payload = {0x1A, 0x07, 0x1A, 0x05, 0x1B, 0x5B, 0x32, 0x4A, 0xFF},
                               .time = time,
                               .origin = std::move(origin)});
  }
};

TEST_F(HostileTexts, OfARefusalReachNoTerminal) {
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{"status"}, {"query", "K_LTE_RRC_STATE"}, {"config", "clear"}}) {
    const Outcome outcome = against({.status = 3, .message = hostileText()}, arguments);
    EXPECT_EQ(outcome.status, 1);
    EXPECT_EQ(std::ranges::count(outcome.errors, '\n'), 1);
    EXPECT_THAT(outcome.errors, HasSubstr("\\u{1b}[2J"));
    EXPECT_EQ(against({.hello = radix::refusing(10, hostileText())}, arguments).status, 1);
  }
}

TEST_F(HostileTexts, OfAReportReachNoTerminal) {
  const Dictionary content{{"service", Value::text(hostileText())},
                           {"sources", List{Dictionary{{"origin", Value::text(hostileText())},
                                                       {"failure", Value::text(hostileText())},
                                                       {"records_per_second", std::nan("")}}}},
                           {"clients", List{Dictionary{{"name", Value::text(hostileText())}}}}};
  EXPECT_EQ(against({.content = content}, {"status"}).status, 0);
  const Outcome json = against({.message = hostileText(), .content = content}, {"status", "--json"});
  EXPECT_TRUE(nlohmann::json::accept(json.output)) << json.output;
  EXPECT_NE(json.errors, "");
}

TEST_F(HostileTexts, OfARecordReachNoTerminalAndItsTimeMayBeAny) {
  for (const std::int64_t time : {std::numeric_limits<std::int64_t>::min(), std::numeric_limits<std::int64_t>::max(),
                                  std::int64_t{0}, std::int64_t{-1}}) {
    const HostileService::Part part{.events = {event(hostileText(), time)}};
    EXPECT_EQ(against(part, {"watch", "--count", "1", "--personal"}).status, 0);
    const Outcome json = against(part, {"watch", "--count", "1", "--json", "--personal"});
    EXPECT_TRUE(nlohmann::json::accept(json.output)) << json.output;
    EXPECT_EQ(nlohmann::json::parse(json.output).at("time"), time);
  }
}

TEST_F(HostileTexts, OfCellsOriginsAndRepliesReachNoTerminalOrLogOfTheViewer) {
  const HostileService service(
      {.message = hostileText(),
       .content = {{"sources", List{Dictionary{{"metric_ids", List{std::int64_t{K_CELLULAR_ACTIVE_BEARER}}}}}}},
       .events = {event(hostileText(), 0)}});
  const std::string pages = outputOf(PROBECTL " --socket " + service.path() + " pages LTE Active Bearers 2>&1");
  EXPECT_TRUE(areHarmless(pages)) << pages;
  EXPECT_THAT(pages, HasSubstr("\\u{1b}[2J\ufffd\n"));
  // The pages, the console log and the system log, which is echoed.
  const std::string all = outputOf("RADIXD_SOCKET=" + service.path() + " " PROBEVIEW " --print --log - 2>&1");
  EXPECT_TRUE(areHarmless(all)) << all;
  EXPECT_THAT(all, HasSubstr(": error=0 msg=\\u{1b}[2J"));
  EXPECT_THAT(all, HasSubstr("\nprobeview › LTE › Active Bearers\n"));
}

TEST_F(HostileTexts, OfAPayloadReachNoTerminal) {
  std::string hex;
  for (const char character : "\u009b31m\u202ex") {
    if (character == 0) break;
    appendHex({&character, 1}, hex);
  }
  const std::string size = "0" + std::to_string(hex.size() / 2);
  const Outcome outcome = probectl({"decode", "BearerContext", "1a" + size + hex});
  EXPECT_EQ(outcome.output, "apn: \"\\u{9b}31m\\u{202e}x\"\n");
}

}  // namespace
}  // namespace probeview
