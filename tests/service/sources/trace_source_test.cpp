// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_source.h"

#include <gmock/gmock.h>

#include "messages/lte_messages.h"
#include "messages/metric_identifiers.h"
#include "messages/runtime/data_reader.h"
#include "tests/service/sources/trace_source_fixture.h"
#include "values/printer.h"

namespace probeview {
namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

TEST_F(TraceSourceTest, IsNamedAfterItsFile) {
  start(measurement("12.00.00", -90));
  EXPECT_EQ(source->origin(), "trace:drive.csv");
}

TEST_F(TraceSourceTest, FillsTheMetricsThatItsRowsCanFillAndNoOthers) {
  start(measurement("12.00.00", -90));
  EXPECT_THAT(source->metrics(), ElementsAre(K_LTE_RSRP_RSRQ_SINR));
  start(measurement("12.00.00", -90) + TraceLine{.mode = "EDGE", .level = "-80", .state = "I"}.text());
  EXPECT_THAT(source->metrics(), ElementsAre(K_GSM_SCELL_INFO, K_LTE_RSRP_RSRQ_SINR, K_GSM_IDLE_SCELL_MEAS));
}

TEST_F(TraceSourceTest, PlaysFromTheStartWhenSomebodyFirstListens) {
  start(measurement("12.00.00", -90) + measurement("12.00.01", -91));
  loop.advance(seconds(100));
  EXPECT_THAT(sink.records, IsEmpty());
  EXPECT_EQ(loop.untilNextTimer(), std::nullopt) << "nothing to wake up for while nobody listens";
  listen();
  EXPECT_THAT(sink.records, SizeIs(1));
}

TEST_F(TraceSourceTest, KeepsTheRowsOwnPace) {
  start(measurement("12.00.00", -90) + measurement("12.00.02", -91) + measurement("12.05.00", -92));
  listen();
  loop.advance(milliseconds(1999));
  EXPECT_THAT(sink.records, SizeIs(1));
  loop.advance(milliseconds(1));
  EXPECT_THAT(sink.records, SizeIs(2));
  loop.advance(seconds(297));
  EXPECT_THAT(sink.records, SizeIs(2)) << "a gap of minutes is waited for";
  loop.advance(seconds(1));
  EXPECT_THAT(sink.records, SizeIs(3));
}

TEST_F(TraceSourceTest, PlaysFasterBySpeed) {
  start(measurement("12.00.00", -90) + measurement("12.00.20", -91), ",speed=20");
  listen();
  loop.advance(milliseconds(999));
  EXPECT_THAT(sink.records, SizeIs(1));
  loop.advance(milliseconds(1));
  EXPECT_THAT(sink.records, SizeIs(2));
}

TEST_F(TraceSourceTest, RowsOfOneSecondComeTogetherAndInTheirOrder) {
  start(measurement("12.00.00", -90) + measurement("12.00.00", -91) + measurement("12.00.00", -92));
  listen();
  EXPECT_THAT(sink.records, SizeIs(3));
}

TEST_F(TraceSourceTest, ASleepOfTheDeviceIsNoTimeOfTheDrive) {
  std::string rows;
  for (int minute = 0; minute < 60; ++minute) {
    const std::string digits = (minute < 10 ? "0" : "") + std::to_string(minute);
    rows += measurement("12." + digits + ".00", -90);
  }
  start(rows);
  listen();
  loop.advance(seconds(30));
  loop.sleep(std::chrono::hours(8));
  loop.advance(milliseconds(29'999));
  EXPECT_THAT(sink.records, SizeIs(1)) << "no rows of the night in one burst";
  loop.advance(milliseconds(1));
  EXPECT_THAT(sink.records, SizeIs(2));
}

TEST_F(TraceSourceTest, AClockThatGoesBackCostsNoTime) {
  start(measurement("12.00.10", -90) + measurement("12.00.00", -91) + measurement("12.00.01", -92));
  listen();
  EXPECT_THAT(sink.records, SizeIs(2));
  EXPECT_EQ(sink.records[1].time, sink.records[0].time - seconds(10));
  loop.advance(seconds(1));
  EXPECT_THAT(sink.records, SizeIs(3));
}

TEST_F(TraceSourceTest, DatesThatAreMillenniaApartAreWaitedForWithoutHarm) {
  start(TraceLine{.time = "0001.01.01_00.00.00", .level = "-90"}.text() +
            TraceLine{.time = "9999.12.31_23.59.59", .level = "-91"}.text() +
            TraceLine{.time = "0001.01.01_00.00.00", .level = "-92"}.text() +
            TraceLine{.time = "9999.12.31_23.59.59", .level = "-93"}.text(),
        ",speed=0.001,loop");
  listen();
  loop.advance(std::chrono::hours(24 * 365));
  EXPECT_THAT(sink.records, SizeIs(1));
}

TEST_F(TraceSourceTest, RecordsCarryTheRowsOwnTimeAndTheirOrigin) {
  start(TraceLine{.time = "2024.03.05_12.34.56", .level = "-90"}.text());
  listen();
  ASSERT_THAT(sink.records, SizeIs(1));
  EXPECT_EQ(sink.records[0].time, milliseconds(1709642096000));
  EXPECT_EQ(sink.records[0].origin, "trace:drive.csv");
  EXPECT_EQ(sink.records[0].metricId, K_LTE_RSRP_RSRQ_SINR);
}

TEST_F(TraceSourceTest, RestsWhileNobodyListensAndGoesOnFromThere) {
  start(measurement("12.00.00", -90) + measurement("12.00.10", -91));
  listen();
  loop.advance(seconds(4));
  source->setListening(false);
  EXPECT_EQ(loop.untilNextTimer(), std::nullopt);
  loop.advance(std::chrono::hours(1));
  EXPECT_THAT(sink.records, SizeIs(1));
  source->setListening(true);
  loop.advance(milliseconds(5999));
  EXPECT_THAT(sink.records, SizeIs(1));
  loop.advance(milliseconds(1));
  EXPECT_THAT(sink.records, SizeIs(2));
}

TEST_F(TraceSourceTest, ItsEndIsToldOnceAndWhatWasLastKnownCanStillBeAskedFor) {
  start(measurement("12.00.00", -90) + measurement("12.00.01", -91));
  listen();
  loop.advance(seconds(100));
  EXPECT_THAT(log.lines, ElementsAre("played to its end, line 3"));
  EXPECT_EQ(loop.untilNextTimer(), std::nullopt);
  EXPECT_TRUE(source->query(K_LTE_RSRP_RSRQ_SINR));
  ASSERT_THAT(sink.records, SizeIs(3));
  EXPECT_EQ(sink.records[2].payload, sink.records[1].payload);
  EXPECT_EQ(sink.records[2].time, sink.records[1].time);
}

TEST_F(TraceSourceTest, ATraceThatWasPlayedHasEndedAndOneThatLoopsNever) {
  const std::string rows = measurement("12.00.00", -90) + measurement("12.00.01", -91);
  start(rows);
  listen();
  EXPECT_THAT(sink.phases, IsEmpty());
  loop.advance(seconds(1));
  EXPECT_THAT(sink.phases, ElementsAre(SourceCondition::Phase::Ended));
  EXPECT_THAT(sink.records, SizeIs(2));
  loop.advance(std::chrono::minutes(2));
  EXPECT_TRUE(source->query(K_LTE_RSRP_RSRQ_SINR));
  EXPECT_EQ(sink.records.back().age, std::chrono::minutes(2)) << "what was last known does not grow young";
  sink.phases.clear();
  start(rows, ",loop");
  listen();
  loop.advance(std::chrono::minutes(2));
  EXPECT_THAT(sink.phases, IsEmpty());
}

TEST_F(TraceSourceTest, MeasurementsComeAtTheRowsPaceAndStatesAndCellsOnChange) {
  const std::vector<std::pair<std::string, int>> paces{{"", 1000}, {",speed=0.1", 10'000}, {",speed=100000", 1}};
  for (const auto& [options, period] : paces) {
    sink.records.clear();
    start(TraceLine{.level = "-90", .state = "D", .area = "1A2B", .cell = "25601"}.text(), options);
    listen();
    for (const MetricRecord& record : sink.records) {
      EXPECT_EQ(record.period.count(), record.metricId == K_LTE_RSRP_RSRQ_SINR ? period : 0) << record.metricId;
    }
    EXPECT_THAT(sink.records, SizeIs(3));
  }
}

TEST_F(TraceSourceTest, TellsHowManyRowsItHasReadAndSkipped) {
  start(measurement("12.00.00", -90) + "x\n" + measurement("12.00.01", -91) + "y\n" + "z\n");
  ASSERT_TRUE(source->intake());
  EXPECT_EQ(source->intake()->rowsRead, 2U);
  EXPECT_EQ(source->intake()->rowsSkipped, 3U);
}

TEST_F(TraceSourceTest, AQueryForWhatIsNotKnownIsRefused) {
  start(measurement("12.00.00", -90));
  EXPECT_FALSE(source->query(K_LTE_RSRP_RSRQ_SINR)) << "nothing has been played yet";
  listen();
  EXPECT_FALSE(source->query(K_SIM_FILE_INFO));
}

TEST_F(TraceSourceTest, LoopStartsOverASecondOfTheDriveLater) {
  const std::string rows = TraceLine{.time = "2024.03.05_12.00.00", .state = "I"}.text() +
                           TraceLine{.time = "2024.03.05_12.00.01", .state = "D"}.text();
  start(rows, ",loop,speed=2");
  listen();
  loop.advance(milliseconds(500));
  ASSERT_THAT(sink.records, SizeIs(2));
  loop.advance(milliseconds(499));
  EXPECT_THAT(sink.records, SizeIs(2));
  loop.advance(milliseconds(1));
  ASSERT_THAT(sink.records, SizeIs(3));
  EXPECT_EQ(sink.records[2].payload, sink.records[0].payload) << "a new drive knows nothing of the one before";
  loop.advance(seconds(10));
  EXPECT_THAT(sink.records, SizeIs(23));
  EXPECT_THAT(log.lines, IsEmpty());
}

TEST_F(TraceSourceTest, ARoundThatBeginsElsewhereThanTheLastEndedLeavesThatTechnology) {
  start(TraceLine{.time = "2024.03.05_12.00.00", .mode = "UMTS", .state = "I"}.text() +
            TraceLine{.time = "2024.03.05_12.00.04", .mode = "LTE", .state = "D"}.text(),
        ",loop");
  EXPECT_THAT(source->metrics(), ElementsAre(K_LTE_RRC_STATE, K_UMTS_RRC_STATE));
  listen();
  loop.advance(seconds(5 + 4));
  const auto lteState = [this](std::size_t record) {
    KCellularLteRrcState message;
    PBDataReader reader(sink.records.at(record).payload);
    EXPECT_TRUE(message.readFrom(reader));
    return printed(message.dictionaryRepresentation());
  };
  std::vector<std::int64_t> metrics;
  for (const MetricRecord& record : sink.records) metrics.push_back(record.metricId);
  ASSERT_THAT(metrics, ElementsAre(K_UMTS_RRC_STATE, K_UMTS_RRC_STATE, K_LTE_RRC_STATE,  // the first round
                                   K_LTE_RRC_STATE, K_UMTS_RRC_STATE, K_UMTS_RRC_STATE, K_LTE_RRC_STATE));
  EXPECT_EQ(lteState(2), R"(["timestamp": 1709640004000, "state": "KLTE_RRC_STATE_CONNECTED"])");
  EXPECT_EQ(lteState(3), R"(["timestamp": 1709640000000, "state": "KLTE_RRC_STATE_NULL"])")
      << "at the new round's time, with nothing of the old one's";
  EXPECT_EQ(lteState(6), R"(["timestamp": 1709640004000, "state": "KLTE_RRC_STATE_CONNECTED", )"
                         R"("prev_state": "KLTE_RRC_STATE_NULL", "prev_state_dur_ms": 4000])");
}

TEST_F(TraceSourceTest, ATechnologyThatWasLeftIsLeftForThosePlannedAndAskingLaterToo) {
  start(TraceLine{.time = "2024.03.05_12.00.00", .state = "D"}.text() +
        TraceLine{.time = "2024.03.05_12.00.01", .mode = "UMTS", .state = "I"}.text());
  MetricPlan plan;
  plan.metrics[K_LTE_RRC_STATE] = seconds(10);
  source->setPlan(plan);
  listen();
  loop.advance(seconds(2));
  const auto isLeft = [this] {
    KCellularLteRrcState message;
    PBDataReader reader(sink.records.back().payload);
    EXPECT_TRUE(message.readFrom(reader));
    return sink.records.back().metricId == K_LTE_RRC_STATE && message.hasState() &&
           message.state() == KCellularLteRrcState::State::KLTE_RRC_STATE_NULL;
  };
  ASSERT_THAT(sink.records, SizeIs(1));
  EXPECT_FALSE(isLeft());
  EXPECT_TRUE(source->query(K_LTE_RRC_STATE));
  ASSERT_THAT(sink.records, SizeIs(2));
  EXPECT_TRUE(isLeft()) << "whoever asks gets the state that is";
  loop.advance(seconds(60));
  EXPECT_THAT(sink.records, SizeIs(2)) << "and what has been passed on is not passed on again";

  start(TraceLine{.time = "2024.03.05_12.00.00", .state = "D"}.text() +
        TraceLine{.time = "2024.03.05_12.00.01", .mode = "UMTS", .state = "I"}.text());
  source->setPlan(plan);
  listen();
  loop.advance(milliseconds(10'001));
  ASSERT_THAT(sink.records, SizeIs(4));
  EXPECT_TRUE(isLeft()) << "with the end of the period that it came in";

  source->setPlan(MetricPlan{});
  plan.metrics[K_UMTS_RRC_STATE] = std::nullopt;
  source->setPlan(plan);
  ASSERT_THAT(sink.records, SizeIs(5));
  EXPECT_EQ(sink.records.back().metricId, K_UMTS_RRC_STATE) << "what waited for somebody to want it";
}

TEST_F(TraceSourceTest, MetricsThatNobodyWantsAreNotSent) {
  start(TraceLine{.level = "-90", .state = "I"}.text());
  MetricPlan plan;
  plan.metrics[K_LTE_RRC_STATE] = std::nullopt;
  source->setPlan(plan);
  listen();
  ASSERT_THAT(sink.records, SizeIs(1));
  EXPECT_EQ(sink.records[0].metricId, K_LTE_RRC_STATE);
}

TEST_F(TraceSourceTest, APeriodIsTheShortestTimeBetweenTwoRecords) {
  std::string rows;
  for (int second = 0; second < 10; ++second) rows += measurement("12.00.0" + std::to_string(second), -90 - second);
  start(rows);
  MetricPlan plan;
  plan.metrics[K_LTE_RSRP_RSRQ_SINR] = milliseconds(3000);
  source->setPlan(plan);
  listen();
  loop.advance(seconds(60));
  std::vector<std::int64_t> secondsOfRecords;
  for (const MetricRecord& record : sink.records) secondsOfRecords.push_back(record.time.count() / 1000 % 60);
  EXPECT_THAT(secondsOfRecords, ElementsAre(0, 3, 6, 9));
}

TEST_F(TraceSourceTest, ManyRowsThatAreDueTogetherLeaveTheLoopToItsOtherWork) {
  // Counts the turns that are asked for.
  struct CountingScheduler final : Scheduler {
    explicit CountingScheduler(Scheduler& scheduler) : real(scheduler) {}
    ScheduledTaskHandle after(std::chrono::nanoseconds delay, Task task) override {
      ++turns;
      return real.after(delay, std::move(task));
    }
    ScheduledTaskHandle every(std::chrono::nanoseconds interval, Task task) override {
      return real.every(interval, std::move(task));
    }
    Scheduler& real;
    int turns = 0;
  };
  std::string rows;
  for (int count = 0; count < 640; ++count) rows += measurement("12.00.00", -90);
  source = makeTraceSource(write(traceHeader + rows)).source;
  CountingScheduler scheduler(loop);
  source->start(SourceContext{scheduler, loop, log}, sink);
  listen();
  EXPECT_THAT(sink.records, SizeIs(640));
  EXPECT_EQ(scheduler.turns, 10);
}

}  // namespace
}  // namespace probeview
