// SPDX-License-Identifier: Apache-2.0
//
// The small parts of the service: the union of plans, the last records, rates, the log.
#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "platform/manual_loop.h"
#include "service/last_records.h"
#include "service/log.h"
#include "service/plans.h"
#include "service/rate_meter.h"
#include "tests/service/harness/scripted_source.h"

namespace probeview {
namespace {

using std::chrono::milliseconds;
using std::chrono::nanoseconds;
using std::chrono::seconds;

TEST(Plans, WithoutAnyThereIsNone) { EXPECT_EQ(unite({}, false), std::nullopt); }

TEST(Plans, TheUnionHasEachMetricAtTheShortestPeriodWithOnChangeAboveAll) {
  const MetricPlan first{{{1, milliseconds(500)}, {2, std::nullopt}, {3, milliseconds(7)}}};
  const MetricPlan second{{{1, milliseconds(200)}, {2, milliseconds(1)}, {4, std::nullopt}}};
  const std::vector<const MetricPlan*> plans{&first, &second};
  const auto all = unite(plans, false);
  ASSERT_TRUE(all);
  const decltype(MetricPlan::metrics) expected{
      {1, milliseconds(200)}, {2, std::nullopt}, {3, milliseconds(7)}, {4, std::nullopt}};
  EXPECT_EQ(all->metrics, expected);
}

TEST(Plans, SomebodyWhoObservesWantsEverythingBesideThemAndAloneNeedsNone) {
  const MetricPlan plan{{{1, milliseconds(500)}}};
  const std::vector<const MetricPlan*> plans{&plan};
  EXPECT_EQ(unite(plans, true), (MetricPlan{.metrics = plan.metrics, .observed = true}));
  EXPECT_EQ(unite({}, true), std::nullopt);
}

TEST(Plans, AnEmptyPlanIsAPlan) {
  const MetricPlan nothing;
  const std::vector<const MetricPlan*> plans{&nothing};
  const auto all = unite(plans, false);
  ASSERT_TRUE(all);
  EXPECT_TRUE(all->metrics.empty());
}

std::vector<std::int64_t> metricsOf(const LastRecords& records) {
  std::vector<std::int64_t> metrics;
  for (const auto& [arrival, record] : records.records()) metrics.push_back(record.metricId);
  return metrics;
}

TEST(LastRecords, KeepTheLastOfEachMetricInTheOrderOfArrival) {
  LastRecords records;
  const auto old = std::make_shared<const std::vector<std::uint8_t>>(1);
  const auto fresh = std::make_shared<const std::vector<std::uint8_t>>(2);
  EXPECT_EQ(records.keep({5, old}), 1U);
  EXPECT_EQ(records.keep({3, old}), 2U);
  EXPECT_EQ(records.keep({5, fresh}), 3U);
  EXPECT_EQ(metricsOf(records), (std::vector<std::int64_t>{3, 5}));
  EXPECT_EQ(records.records().rbegin()->second.frame, fresh);
}

TEST(LastRecords, KeepAsManyMetricsAsTheLimitSaysAndNotOneMore) {
  LastRecords records;
  const auto frame = std::make_shared<const std::vector<std::uint8_t>>(1);
  for (std::size_t metric = 0; metric < radix::mostMetrics; ++metric) {
    records.keep({static_cast<std::int64_t>(metric), frame});
  }
  EXPECT_EQ(records.records().size(), radix::mostMetrics);
  EXPECT_EQ(records.keep({-1, frame}), 0U);
  EXPECT_EQ(records.records().size(), radix::mostMetrics);
  records.keep({0, frame});
  EXPECT_EQ(metricsOf(records).back(), 0);
}

TEST(RateMeter, IsTheMeanOfTheLastTenWholeSeconds) {
  RateMeter meter;
  const nanoseconds start = seconds(100);
  for (int second = 0; second < 30; ++second) {
    meter.add(start + seconds(second), second < 20 ? 100 : 5);
  }
  EXPECT_DOUBLE_EQ(meter.perSecond(start + seconds(30), start), 5.0);
  EXPECT_DOUBLE_EQ(meter.perSecond(start + seconds(35), start), 2.5);
  EXPECT_DOUBLE_EQ(meter.perSecond(start + seconds(60), start), 0.0);
}

TEST(RateMeter, OfSomethingYoungerIsTheMeanOfWhatThereIs) {
  RateMeter meter;
  meter.add(seconds(100), 30);
  EXPECT_DOUBLE_EQ(meter.perSecond(seconds(100), seconds(100)), 0.0);
  EXPECT_DOUBLE_EQ(meter.perSecond(seconds(101), seconds(100)), 30.0);
  EXPECT_DOUBLE_EQ(meter.perSecond(seconds(103), seconds(100)), 10.0);
}

TEST(ServiceLog, WritesWhatIsImportantEnoughAndALineStaysALine) {
  KeptLines lines;
  ServiceLog log(lines, LogLevel::Warning);
  log.write(LogLevel::Error, "a");
  log.write(LogLevel::Warning, "b\nradixd: error: forged\x1b[31m");
  log.write(LogLevel::Info, "c");
  EXPECT_EQ(lines.lines,
            (std::vector<std::string>{"radixd: error: a", "radixd: warning: b\\nradixd: error: forged\\u{1b}[31m"}));
}

TEST(BoundedLines, AThousandLinesAMinuteAreHandedOnAndOfMoreOnlyTheNumber) {
  ManualLoop clock;
  KeptLines lines;
  {
    BoundedLines bounded(lines, clock);
    for (int number = 0; number < 1000; ++number) bounded.line("a");
    EXPECT_EQ(lines.lines.size(), 1000U);
    bounded.line("b");
    clock.advance(seconds(60) - nanoseconds(1));
    bounded.line("b");
    EXPECT_EQ(lines.lines.size(), 1000U);
    clock.advance(nanoseconds(1));
    bounded.line("c");
    ASSERT_EQ(lines.lines.size(), 1002U);
    EXPECT_EQ(lines.lines[1000],
              "radixd: warning: 2 lines were left out here, as there were more than 1000 in a minute");
    EXPECT_EQ(lines.lines[1001], "c");
    for (int number = 0; number < 1000; ++number) bounded.line("d");
    EXPECT_EQ(lines.lines.size(), 2001U);
  }
  EXPECT_EQ(lines.lines.back(), "radixd: warning: 1 line was left out here, as there were more than 1000 in a minute");
}

}  // namespace
}  // namespace probeview
