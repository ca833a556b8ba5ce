// SPDX-License-Identifier: Apache-2.0
#include <malloc.h>

#include <chrono>
#include <map>

#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "tests/scenario/drive.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

const std::vector<std::string> scenarioNames{"city", "highway", "indoor", "soak", "edges"};

std::vector<MetricRecord> driven(std::string_view arguments, double seconds) {
  Drive drive(arguments);
  drive.listen();
  drive.forSeconds(seconds);
  return std::move(drive.records);
}

TEST(ScenarioSource, SameSeedGivesTheSameBytes) {
  for (const std::string& name : scenarioNames) {
    const auto first = driven(name + ",seed=7", 300);
    const auto second = driven(name + ",seed=7", 300);
    ASSERT_FALSE(first.empty());
    EXPECT_TRUE(first == second) << name;
  }
}

TEST(ScenarioSource, AnotherSeedGivesOtherBytes) {
  for (const char* name : {"city", "highway", "indoor"}) {
    EXPECT_FALSE(driven(std::string(name) + ",seed=7", 60) == driven(std::string(name) + ",seed=8", 60)) << name;
  }
}

TEST(ScenarioSource, BytesDoNotDependOnWhenTheLoopTurns) {
  Drive even("city");
  even.listen();
  even.forSeconds(30);
  Drive uneven("city");
  uneven.listen();
  // A loop that is late runs its timers late, and only once.
  for (int i = 0; i < 30; ++i) {
    uneven.loop.advance(900ms);
    uneven.loop.advance(100ms);
  }
  EXPECT_TRUE(even.records == uneven.records);
}

TEST(ScenarioSource, EachMetricComesOnceWithinTwoSeconds) {
  for (const std::string& name : scenarioNames) {
    for (int seed = 1; seed <= 12; ++seed) {
      Drive drive(name + ",seed=" + std::to_string(seed));
      drive.listen();
      drive.forSeconds(2);
      for (const std::int64_t id : toldMetrics()) {
        EXPECT_GE(drive.count(id), 1U) << name << ", seed " << seed << ": " << nameOf(id);
      }
    }
  }
}

TEST(ScenarioSource, ARecordTellsItsPeriodAsPlannedAndItsAge) {
  MetricPlan plan;
  plan.metrics[K_LTE_RSRP_RSRQ_SINR] = 700ms;
  plan.metrics[K_LTE_RRC_STATE] = std::nullopt;
  const auto periodsOf = [](const Drive& drive) {
    std::map<std::int64_t, std::chrono::milliseconds> periods;
    for (const MetricRecord& record : drive.records) {
      EXPECT_GE(record.age, 0ns);
      EXPECT_LT(record.age, 10s);
      periods[record.metricId] = record.period;
    }
    return periods;
  };
  Drive planned("city");
  planned.source->setPlan(plan);
  planned.listen();
  planned.forSeconds(30);
  EXPECT_EQ(periodsOf(planned),
            (std::map<std::int64_t, std::chrono::milliseconds>{{K_LTE_RSRP_RSRQ_SINR, 700ms}, {K_LTE_RRC_STATE, 0ms}}));
  // Who observes gets everything beside them, and nothing more seldom.
  Drive own("city");
  own.listen();
  own.forSeconds(30);
  const auto ownPeriods = periodsOf(own);
  plan.observed = true;
  plan.metrics[K_LTE_TX_POWER] = std::chrono::hours(1);
  Drive observed("city");
  observed.source->setPlan(plan);
  observed.listen();
  observed.forSeconds(30);
  auto expected = ownPeriods;
  expected[K_LTE_RSRP_RSRQ_SINR] = std::min(ownPeriods.at(K_LTE_RSRP_RSRQ_SINR), std::chrono::milliseconds(700));
  EXPECT_EQ(periodsOf(observed), expected);
  for (const auto& [metric, period] : ownPeriods) {
    EXPECT_GE(observed.count(metric), own.count(metric)) << nameOf(metric);
  }
  // What nobody wants again and again was asked for.
  planned.records.clear();
  EXPECT_TRUE(planned.source->query(K_LTE_TX_POWER));
  EXPECT_EQ(planned.records.back().period, 0ms);
}

TEST(ScenarioSource, EachMetricComesOnceWithinTwoSecondsWhateverThePlansPeriods) {
  MetricPlan plan;
  for (const std::int64_t id : toldMetrics()) plan.metrics[id] = 60s;
  Drive drive("city");
  drive.source->setPlan(plan);
  drive.listen();
  drive.forSeconds(2);
  for (const std::int64_t id : toldMetrics()) EXPECT_EQ(drive.count(id), 1U) << nameOf(id);
}

TEST(ScenarioSource, NamesTheMetricsThatItFillsInAscendingOrder) {
  const auto ids = toldMetrics();
  for (const std::string& name : scenarioNames) {
    EXPECT_EQ(Drive(name).source->metrics(), std::vector<std::int64_t>(ids.begin(), ids.end()));
  }
}

TEST(ScenarioSource, RecordsCarryTheirOriginAndTheTimeOfTheirTimestamp) {
  Drive drive("highway");
  drive.listen();
  drive.forSeconds(20);
  for (const MetricRecord& record : drive.records) {
    EXPECT_EQ(record.origin, "scenario:highway");
    const Dictionary dictionary = decodedAny(record)->dictionaryRepresentation();
    const Value* timestamp = dictionary.find("timestamp");
    ASSERT_NE(timestamp, nullptr);
    EXPECT_EQ(timestamp->rawUInt64(), static_cast<std::uint64_t>(record.time.count()));
    EXPECT_GE(record.time, ManualLoop::defaultWallTime);
    EXPECT_LE(record.time, ManualLoop::defaultWallTime + 20s);
  }
}

TEST(ScenarioSource, RestsWithoutTimersWhileNobodyListens) {
  Drive drive("city");
  EXPECT_FALSE(drive.loop.untilNextTimer().has_value());
  drive.source->setPlan(MetricPlan{{{K_LTE_RRC_STATE, 100ms}}});
  EXPECT_FALSE(drive.loop.untilNextTimer().has_value());
  drive.listen();
  EXPECT_TRUE(drive.loop.untilNextTimer().has_value());
  drive.source->setListening(false);
  EXPECT_FALSE(drive.loop.untilNextTimer().has_value());
  drive.forSeconds(100);
  EXPECT_TRUE(drive.records.empty());
}

TEST(ScenarioSource, RestsWithoutTimersWhileNothingIsWanted) {
  for (const char* name : {"city", "soak", "edges"}) {
    Drive drive(name);
    drive.source->setPlan(MetricPlan{});
    drive.listen();
    EXPECT_FALSE(drive.loop.untilNextTimer().has_value());
    drive.source->setPlan(MetricPlan{{{0x3CFFFF, 100ms}}});
    EXPECT_FALSE(drive.loop.untilNextTimer().has_value()) << "nothing of ours is wanted";
    drive.source->setPlan(MetricPlan{{{K_LTE_RRC_STATE, 100ms}}});
    EXPECT_TRUE(drive.loop.untilNextTimer().has_value());
    drive.source->setPlan(MetricPlan{});
    EXPECT_FALSE(drive.loop.untilNextTimer().has_value());
    drive.source->setPlan(std::nullopt);
    EXPECT_TRUE(drive.loop.untilNextTimer().has_value());
    EXPECT_TRUE(drive.records.empty());
  }
}

TEST(ScenarioSource, AfterAnHourInWhichNothingWasWantedItAnswersAndGoesOnAtTheTimeThatItIs) {
  for (const char* arguments : {"city", "city,speed=1000"}) {
    Drive drive(arguments);
    drive.source->setPlan(MetricPlan{});
    drive.listen();
    drive.forSeconds(3600);
    ASSERT_TRUE(drive.source->query(K_LTE_SCELL_INFO));
    ASSERT_EQ(drive.records.size(), 1U);
    EXPECT_GE(drive.records[0].time, drive.loop.wallTime() - 6s);
    EXPECT_LE(drive.records[0].time, drive.loop.wallTime() + 6s);
    drive.forSeconds(3600);
    drive.records.clear();
    drive.source->setPlan(std::nullopt);
    drive.forSeconds(2);
    EXPECT_EQ(drive.seen(), toldMetrics());
  }
}

TEST(ScenarioSource, AClientThatKeepsChangingItsMindDoesNotKeepTheOthersWaiting) {
  Drive drive("city");
  drive.listen();
  for (int change = 0; change < 100; ++change) {
    drive.source->setPlan(MetricPlan{{{K_SIM_FILE_INFO, 1s}, {K_LTE_TX_POWER, change % 2 == 0 ? 1s : 2s}}});
    drive.forSeconds(0.09);
  }
  EXPECT_GE(drive.count(K_SIM_FILE_INFO), 9U);
}

TEST(ScenarioSource, WhenTheClockIsSetTheRecordsFollowIt) {
  Drive drive("city");
  drive.listen();
  drive.forSeconds(5);
  for (const auto now :
       {ManualLoop::defaultWallTime + 24h * 365, std::chrono::milliseconds(0), ManualLoop::defaultWallTime - 2h}) {
    drive.loop.setWallTime(now);
    drive.forSeconds(1);
    drive.records.clear();
    drive.forSeconds(3);
    ASSERT_FALSE(drive.records.empty());
    for (const MetricRecord& record : drive.records) {
      EXPECT_GE(record.time, now);
      EXPECT_LE(record.time, drive.loop.wallTime());
    }
  }
}

// SIM files are known from the first moment on, so that exactly one record a second must come.
TEST(ScenarioSource, SixHoursOfReportsDoNotDriftAndLeaveNothingBehind) {
  Drive drive("city");
  drive.source->setPlan(MetricPlan{{{K_SIM_FILE_INFO, 1s}, {K_LTE_RRC_STATE, std::nullopt}}});
  drive.listen();
  std::size_t sent = 0;
  std::size_t early = 0;
  for (int hour = 0; hour < 6; ++hour) {
    drive.forSeconds(3600);
    sent += drive.count(K_SIM_FILE_INFO);
    for (const MetricRecord& record : drive.records) {
      ASSERT_LE(record.time, drive.loop.wallTime());
      ASSERT_GE(record.time, drive.loop.wallTime() - 1h - 1s);
    }
    drive.records = {};
    if (hour == 1) early = ::mallinfo2().uordblks;
  }
  EXPECT_NEAR(static_cast<double>(sent), 6 * 3600, 1);
  EXPECT_LE(::mallinfo2().uordblks, early + 64 * 1024);
}

TEST(ScenarioSource, GoesOnWhereItRestedAtTheTimeThatItIs) {
  Drive drive("city");
  drive.listen();
  drive.forSeconds(10);
  const auto before = drive.records.back().time;
  drive.source->setListening(false);
  drive.forSeconds(3600);
  drive.records.clear();
  drive.listen();
  drive.forSeconds(2);
  // What is known is told to the new listener, the metrics of technologies that are not in service included.
  EXPECT_EQ(drive.seen(), toldMetrics());
  EXPECT_GE(drive.records.back().time, before + 3600s);
  EXPECT_LE(drive.records.back().time, drive.loop.wallTime());
}

TEST(ScenarioSource, DoesNotDriveTheWayThatAStoppedMachineMissed) {
  class LateScheduler final : public Scheduler {
   public:
    ScheduledTaskHandle after(std::chrono::nanoseconds, Task) override { return nullptr; }
    ScheduledTaskHandle every(std::chrono::nanoseconds, Task task) override {
      turn = std::move(task);
      return std::make_unique<ScheduledTask>();
    }
    Task turn;
  } scheduler;
  Drive drive("city");
  ManualLoop clock;
  drive.source->stop();
  drive.source = makeScenarioSource("city").source;
  drive.source->start({scheduler, clock, drive}, drive);
  drive.listen();
  clock.advance(2s);
  scheduler.turn();
  ASSERT_FALSE(drive.records.empty());
  drive.records.clear();
  clock.advance(1h);
  scheduler.turn();
  EXPECT_TRUE(drive.records.empty());
  clock.advance(1s);
  scheduler.turn();
  EXPECT_FALSE(drive.records.empty());
  EXPECT_LT(drive.records.size(), 100U);
  EXPECT_GE(drive.records.front().time, ManualLoop::defaultWallTime + 1h);
}

TEST(ScenarioSource, AMetricThatIsNotInThePlanIsNotSent) {
  Drive drive("city");
  drive.source->setPlan(MetricPlan{{{K_LTE_RRC_STATE, std::nullopt}, {K_LTE_TX_POWER, 1000ms}}});
  drive.listen();
  drive.forSeconds(120);
  EXPECT_EQ(drive.seen(), (std::set<std::int64_t>{K_LTE_RRC_STATE, K_LTE_TX_POWER}));
}

TEST(ScenarioSource, AnEmptyPlanWantsNothing) {
  Drive drive("city");
  drive.source->setPlan(MetricPlan{});
  drive.listen();
  drive.forSeconds(60);
  EXPECT_TRUE(drive.records.empty());
}

TEST(ScenarioSource, APeriodIsKept) {
  for (const auto period : {200ms, 500ms, 1000ms, 5000ms}) {
    Drive drive("city");
    drive.source->setPlan(MetricPlan{{{K_LTE_RSRP_RSRQ_SINR, period}, {K_LTE_SCELL_INFO, period}}});
    drive.listen();
    drive.forSeconds(62);
    // The phone is in LTE from its second second on.
    const auto expected = static_cast<double>(60s / period);
    EXPECT_NEAR(static_cast<double>(drive.count(K_LTE_RSRP_RSRQ_SINR)), expected, 0.05 * expected + 2);
    EXPECT_NEAR(static_cast<double>(drive.count(K_LTE_SCELL_INFO)), expected, 0.05 * expected + 2);
  }
}

TEST(ScenarioSource, AMetricWithoutAPeriodComesWhenItChanges) {
  Drive drive("city");
  drive.source->setPlan(MetricPlan{{{K_LTE_RRC_STATE, std::nullopt}}});
  drive.listen();
  drive.forSeconds(600);
  ASSERT_GT(drive.records.size(), 10U);
  std::optional<std::pair<std::int32_t, std::int32_t>> last;
  for (const MetricRecord& record : drive.records) {
    const auto message = decoded<KCellularLteRrcState>(record);
    const std::pair state(message.state(), message.cause());
    EXPECT_NE(last, std::optional(state));
    last = state;
  }
}

TEST(ScenarioSource, MeasurementsComeEachSecondWithoutAPlan) {
  Drive drive("city");
  drive.listen();
  drive.forSeconds(61.5);
  EXPECT_NEAR(static_cast<double>(drive.count(K_LTE_RSRP_RSRQ_SINR)), 60, 2);
  EXPECT_LT(drive.count(K_LTE_SCELL_INFO), 10U);
}

TEST(ScenarioSource, AMetricThatIsWantedLaterIsToldAsItIsKnown) {
  Drive drive("city");
  drive.source->setPlan(MetricPlan{{{K_LTE_RRC_STATE, std::nullopt}}});
  drive.listen();
  drive.forSeconds(10);
  drive.records.clear();
  drive.source->setPlan(MetricPlan{{{K_GSM_SCELL_INFO, std::nullopt}, {K_GSM_NCELL_MEAS, 1000ms}}});
  drive.forSeconds(5);
  // The phone is in LTE; what it saw of GSM was in its first second.
  ASSERT_EQ(drive.records.size(), 2U);
  for (const MetricRecord& record : drive.records) EXPECT_LT(record.time, ManualLoop::defaultWallTime + 1s);
}

TEST(ScenarioSource, GoingBackToNoPlanBringsTheOwnPeriodsBack) {
  Drive drive("city");
  drive.source->setPlan(MetricPlan{});
  drive.listen();
  drive.forSeconds(10);
  drive.source->setPlan(std::nullopt);
  drive.forSeconds(2);
  EXPECT_EQ(drive.seen(), toldMetrics());
}

TEST(ScenarioSource, SpeedMakesTheDriveFasterAndNotTheReportsMore) {
  Drive slow("city");
  Drive fast("city,speed=60");
  for (Drive* drive : {&slow, &fast}) {
    drive->source->setPlan(MetricPlan{{{K_LTE_RSRP_RSRQ_SINR, 1000ms}, {K_LTE_SCELL_INFO, std::nullopt}}});
    drive->listen();
    drive->forSeconds(60);
  }
  EXPECT_LE(fast.count(K_LTE_RSRP_RSRQ_SINR), 61U);
  EXPECT_GT(fast.count(K_LTE_SCELL_INFO), 20 * slow.count(K_LTE_SCELL_INFO));
  EXPECT_GT(fast.records.back().time, ManualLoop::defaultWallTime + 50min);
}

TEST(ScenarioSource, MeasurementsOnChangeDoNotComeFasterAtSpeed) {
  Drive drive("city,speed=100");
  drive.source->setPlan(MetricPlan{{{K_LTE_INTRARAT_MEAS, std::nullopt}}});
  drive.listen();
  drive.forSeconds(30);
  EXPECT_LE(drive.count(K_LTE_INTRARAT_MEAS), 30U * 5 + 1);
  EXPECT_GT(drive.count(K_LTE_INTRARAT_MEAS), 50U);
}

TEST(ScenarioSource, SoakSendsEveryMetricTwentyTimesASecondWhateverThePlanSays) {
  MetricPlan plan;
  for (const std::int64_t id : toldMetrics()) plan.metrics[id] = std::nullopt;
  plan.metrics.erase(K_SIM_FILE_INFO);
  Drive drive("soak");
  drive.source->setPlan(plan);
  drive.listen();
  drive.forSeconds(2);
  drive.records.clear();
  drive.forSeconds(10);
  for (const auto& [id, period] : plan.metrics) {
    EXPECT_NEAR(static_cast<double>(drive.count(id)), 200, 2) << nameOf(id);
  }
  EXPECT_EQ(drive.count(K_SIM_FILE_INFO), 0U);
}

TEST(ScenarioSource, AnswersAQueryForTheSimFilesBeforeAnybodyListens) {
  Drive drive("city");
  ASSERT_TRUE(drive.source->query(K_SIM_FILE_INFO));
  ASSERT_EQ(drive.records.size(), 1U);
  EXPECT_EQ(drive.records[0].metricId, K_SIM_FILE_INFO);
  EXPECT_EQ(decoded<KCellularSimCardFiles>(drive.records[0]).efListsCount(), 9U);
}

TEST(ScenarioSource, AnswersAQueryWhateverThePlan) {
  Drive drive("city");
  drive.source->setPlan(MetricPlan{});
  drive.listen();
  drive.forSeconds(5);
  EXPECT_TRUE(drive.source->query(K_LTE_SCELL_INFO));
  EXPECT_EQ(drive.seen(), (std::set<std::int64_t>{K_LTE_SCELL_INFO}));
}

TEST(ScenarioSource, CannotAnswerWhatItDoesNotKnow) {
  Drive drive("city");
  EXPECT_FALSE(drive.source->query(K_LTE_RLF));
  EXPECT_FALSE(drive.source->query(0x1234));
  EXPECT_FALSE(drive.source->query(K_LTE_SCELL_INFO));  // the phone has not been switched on yet
}

std::string errorOf(std::string_view arguments) {
  const SourceResult result = makeScenarioSource(arguments);
  EXPECT_EQ(result.source == nullptr, !result.error.empty());
  return result.error;
}

TEST(ScenarioSource, TakesItsArgumentsInAnyOrder) {
  EXPECT_EQ(Drive("").source->origin(), "scenario:city");
  EXPECT_EQ(Drive(":indoor").source->origin(), "scenario:indoor");
  EXPECT_EQ(Drive("seed=3").source->origin(), "scenario:city");
  EXPECT_EQ(Drive(",speed=2.5,seed=3").source->origin(), "scenario:city");
  EXPECT_EQ(Drive("highway,speed=1000,seed=18446744073709551615").source->origin(), "scenario:highway");
}

TEST(ScenarioSource, AnUnknownNameIsRefusedWithTheNamesThatThereAre) {
  EXPECT_EQ(errorOf("town"),
            "scenario: there is no scenario \"town\"; choose one of city, highway, indoor, soak, edges");
}

TEST(ScenarioSource, ABadOptionIsRefusedWithWhatItMayBe) {
  for (const char* bad :
       {"city,seed=", "city,seed=-1", "city,seed=x", "city,seed=18446744073709551616", "city,seed=1 "}) {
    EXPECT_NE(errorOf(bad).find("a whole number from 0 to 18446744073709551615"), std::string::npos) << bad;
  }
  for (const char* bad : {"city,speed=0", "city,speed=0.5", "city,speed=1001", "city,speed=fast", "city,speed=nan"}) {
    EXPECT_NE(errorOf(bad).find("a number from 1 to 1000"), std::string::npos) << bad;
  }
  for (const char* bad :
       {"city,indoor", "city,loop", "city,seed", "city,,seed=1", "city,Speed=2", "x=1", "city,", "seed=1,", ","}) {
    EXPECT_NE(errorOf(bad).find("no such option; say scenario[:NAME][,seed=N][,speed=N]"), std::string::npos) << bad;
  }
  EXPECT_NE(errorOf("seed=1,seed=2").find("given twice"), std::string::npos);
  EXPECT_NE(errorOf("speed=1,speed=2").find("given twice"), std::string::npos);
}

}  // namespace
}  // namespace probeview
