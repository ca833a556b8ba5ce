// SPDX-License-Identifier: Apache-2.0
#include "source/metric_pacer.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "platform/manual_loop.h"

namespace probeview {
namespace {

using std::chrono::milliseconds;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr std::int64_t metric = 0x3C4E04;
constexpr std::int64_t otherMetric = 0x3C40C2;

// Keeps the first byte of each payload, which the tests use as the value.
class Sink final : public MetricSink {
 public:
  void emit(MetricRecord record) override {
    values.push_back(record.payload.at(0));
    last = std::move(record);
  }
  std::vector<int> values;
  MetricRecord last;
};

class MetricPacerTest : public ::testing::Test {
 protected:
  void offer(std::uint8_t value, std::int64_t id = metric) { pacer.offer({id, {value}, milliseconds(0), "test"}); }
  void planPeriod(std::optional<milliseconds> period) {
    MetricPlan plan;
    plan.metrics[metric] = period;
    pacer.setPlan(plan);
  }

  ManualLoop loop;
  DiscardingSink log;
  Sink sink;
  MetricPacer pacer{SourceContext{loop, loop, log}, sink};
};

TEST_F(MetricPacerTest, WithoutAPlanEverythingPassesAtOnce) {
  offer(1);
  offer(2);
  offer(3, otherMetric);
  EXPECT_THAT(sink.values, ElementsAre(1, 2, 3));
}

TEST_F(MetricPacerTest, AMetricWithoutAPeriodPassesAtOnce) {
  planPeriod(std::nullopt);
  offer(1);
  offer(2);
  EXPECT_THAT(sink.values, ElementsAre(1, 2));
}

TEST_F(MetricPacerTest, AMetricThatIsNotInThePlanDoesNotPassUntilItIs) {
  pacer.setPlan(MetricPlan{});
  offer(1);
  offer(2);
  EXPECT_THAT(sink.values, IsEmpty());
  planPeriod(std::nullopt);
  EXPECT_THAT(sink.values, ElementsAre(2));
}

TEST_F(MetricPacerTest, APeriodPassesTheFirstAtOnceAndThenTheLatestOfEachPeriod) {
  planPeriod(milliseconds(1000));
  offer(1);
  for (std::uint8_t value = 2; value <= 4; ++value) {
    loop.advance(milliseconds(300));
    offer(value);
  }
  loop.advance(milliseconds(100));
  EXPECT_THAT(sink.values, ElementsAre(1));
  loop.advance(milliseconds(1));
  EXPECT_THAT(sink.values, ElementsAre(1, 4));
  loop.advance(milliseconds(5000));
  EXPECT_THAT(sink.values, ElementsAre(1, 4)) << "nothing new, nothing to pass";
  offer(5);
  EXPECT_THAT(sink.values, ElementsAre(1, 4, 5));
}

TEST_F(MetricPacerTest, WhileSomebodyObservesEverythingPassesAtOnceAlsoWhatThePlanDoesNotName) {
  MetricPlan plan{.metrics = {{metric, milliseconds(1000)}}, .observed = true};
  pacer.setPlan(plan);
  offer(1);
  offer(2);
  offer(3, otherMetric);
  EXPECT_THAT(sink.values, ElementsAre(1, 2, 3));
  plan.observed = false;
  pacer.setPlan(plan);
  offer(4);
  offer(5, otherMetric);
  EXPECT_THAT(sink.values, ElementsAre(1, 2, 3));
}

TEST_F(MetricPacerTest, ARecordTellsThePeriodAsPlannedAndNoneWhereItComesOnChangeOrWasAskedFor) {
  const auto offerEvery = [&](milliseconds own, std::int64_t id = metric) {
    pacer.offer({.metricId = id, .payload = {1}, .time = {}, .origin = "test", .period = own});
  };
  const auto passed = [&] { return sink.last.period; };
  offerEvery(milliseconds(1000));
  EXPECT_EQ(passed(), milliseconds(1000));
  planPeriod(milliseconds(3000));
  loop.advance(milliseconds(3000));
  offerEvery(milliseconds(1000));
  EXPECT_EQ(passed(), milliseconds(3000));
  planPeriod(milliseconds(10));
  loop.advance(milliseconds(10));
  offerEvery(milliseconds(1000));
  EXPECT_EQ(passed(), milliseconds(1000)) << "it comes no oftener than the source has it";
  planPeriod(std::nullopt);
  offerEvery(milliseconds(1000));
  EXPECT_EQ(passed(), milliseconds(1000));
  planPeriod(milliseconds(5000));
  loop.advance(milliseconds(5000));
  offerEvery(milliseconds(0));
  EXPECT_EQ(passed(), milliseconds(0)) << "it comes on change";
  offerEvery(milliseconds(1000), otherMetric);
  EXPECT_TRUE(pacer.resend(otherMetric));
  EXPECT_EQ(passed(), milliseconds(0)) << "nobody wants it again and again";
}

TEST_F(MetricPacerTest, WhatWaitedOrIsPassedAgainIsAsOldAsItIs) {
  planPeriod(milliseconds(1000));
  offer(1);
  EXPECT_EQ(sink.last.age, milliseconds(0));
  loop.advance(milliseconds(400));
  offer(2);
  loop.advance(milliseconds(601));
  ASSERT_THAT(sink.values, ElementsAre(1, 2));
  EXPECT_EQ(sink.last.age, milliseconds(601));
  loop.advance(std::chrono::minutes(3));
  EXPECT_TRUE(pacer.resend(metric));
  EXPECT_EQ(sink.last.age, milliseconds(180'601));
}

TEST_F(MetricPacerTest, ASleepOfTheDeviceMakesWhatWaitsOlderAndEndsNoPeriod) {
  planPeriod(milliseconds(1000));
  offer(1);
  offer(2);
  loop.advance(milliseconds(400));
  loop.sleep(std::chrono::hours(8));
  loop.advance(milliseconds(600));
  EXPECT_THAT(sink.values, ElementsAre(1)) << "what was due in a second is due in a second of being awake";
  loop.advance(milliseconds(1));
  ASSERT_THAT(sink.values, ElementsAre(1, 2));
  EXPECT_EQ(sink.last.age, std::chrono::hours(8) + milliseconds(1001));
}

TEST_F(MetricPacerTest, AShorterPeriodHoldsAtOnce) {
  planPeriod(milliseconds(10'000));
  offer(1);
  offer(2);
  loop.advance(milliseconds(500));
  planPeriod(milliseconds(400));
  EXPECT_THAT(sink.values, ElementsAre(1, 2));
}

TEST_F(MetricPacerTest, ALongerPeriodPostponesWhatWaits) {
  planPeriod(milliseconds(400));
  offer(1);
  offer(2);
  planPeriod(milliseconds(1000));
  loop.advance(milliseconds(1000));
  EXPECT_THAT(sink.values, ElementsAre(1));
  loop.advance(milliseconds(1));
  EXPECT_THAT(sink.values, ElementsAre(1, 2));
}

TEST_F(MetricPacerTest, AValueThatComesJustWhenThePeriodEndsIsTheOneThatPasses) {
  planPeriod(milliseconds(1000));
  offer(1);
  loop.advance(milliseconds(500));
  offer(2);
  loop.advance(milliseconds(500));
  offer(3);
  EXPECT_THAT(sink.values, ElementsAre(1, 3));
  loop.advance(milliseconds(5000));
  EXPECT_THAT(sink.values, ElementsAre(1, 3));
}

TEST_F(MetricPacerTest, ResendPassesTheLatestOnAgainWhateverThePlan) {
  EXPECT_FALSE(pacer.resend(metric));
  pacer.setPlan(MetricPlan{});
  offer(7);
  EXPECT_TRUE(pacer.resend(metric));
  EXPECT_TRUE(pacer.resend(metric));
  EXPECT_FALSE(pacer.resend(otherMetric));
  EXPECT_THAT(sink.values, ElementsAre(7, 7));
}

}  // namespace
}  // namespace probeview
