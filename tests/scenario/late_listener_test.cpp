// SPDX-License-Identifier: Apache-2.0
//
// What is told to somebody who begins to listen, or asks, in the middle of a drive.
#include <map>

#include "messages/lte_messages.h"
#include "tests/scenario/drive.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

void listenAnew(Drive& drive) {
  drive.source->setListening(false);
  drive.source->setListening(true);
}

// A state with a period is told again and again with the time that it is; once it is over it must not be told as if it
// had been known for less long.
TEST(LateListener, TimeDoesNotGoBackForWhatIsOver) {
  Drive drive("city");
  MetricPlan plan;
  for (const std::int64_t id : toldMetrics()) plan.metrics[id] = 1000ms;
  drive.source->setPlan(plan);
  drive.listen();
  std::map<std::int64_t, std::chrono::milliseconds> last;
  for (int round = 0; round < 200; ++round) {
    drive.forSeconds(7.3);
    listenAnew(drive);
    for (const MetricRecord& record : drive.records) {
      EXPECT_GE(record.time, last[record.metricId]) << nameOf(record.metricId) << " in round " << round;
      last[record.metricId] = record.time;
    }
    drive.records.clear();
  }
}

TEST(LateListener, IsNotToldOfTheCellBeforeTheOneThatServes) {
  Drive first("city");
  first.source->setPlan(MetricPlan{{{K_LTE_SCELL_INFO, std::nullopt}}});
  first.listen();
  first.forSeconds(600);
  ASSERT_GT(first.records.size(), 10U);
  std::size_t looked = 0;
  for (const MetricRecord& change : first.records) {
    Drive drive("city");
    drive.source->setPlan(MetricPlan{{{K_LTE_SCELL_INFO, std::nullopt}}});
    drive.listen();
    drive.loop.advance(change.time - ManualLoop::defaultWallTime + 100ms);
    drive.records.clear();
    drive.source->setPlan(MetricPlan{{{K_LTE_SCELL_INFO, std::nullopt}, {K_LTE_RSRP_RSRQ_SINR, std::nullopt}}});
    listenAnew(drive);
    drive.forSeconds(1);
    std::optional<std::uint32_t> serving;
    for (const MetricRecord& record : drive.records) {
      if (record.metricId == K_LTE_SCELL_INFO) serving = decoded<KCellularLteScellInfo>(record).phyCellId();
      if (record.metricId != K_LTE_RSRP_RSRQ_SINR) continue;
      const auto message = decoded<KCellularLteRsrpRsrqSinr>(record);
      for (const RsrpRsrqSinr& sample : message.instValues()) EXPECT_EQ(sample.phyCellId(), serving);
      ++looked;
    }
  }
  EXPECT_GT(looked, 10U);
}

TEST(Asker, IsToldOfTheCellThatServedWhenItWasMeasured) {
  Drive drive("city");
  drive.source->setPlan(MetricPlan{{{K_LTE_SCELL_INFO, std::nullopt}}});
  drive.listen();
  std::map<std::chrono::milliseconds, std::uint32_t> served;  // since when
  std::size_t answers = 0;
  for (int step = 0; step < 15'000; ++step) {
    drive.forSeconds(0.04);
    drive.source->query(K_LTE_RSRP_RSRQ_SINR);
    for (const MetricRecord& record : drive.records) {
      if (record.metricId == K_LTE_SCELL_INFO) {
        served[record.time] = decoded<KCellularLteScellInfo>(record).phyCellId();
        continue;
      }
      // What was measured at the moment of a change is of the cell before.
      const auto after = served.lower_bound(record.time);
      ASSERT_NE(after, served.begin());
      const auto message = decoded<KCellularLteRsrpRsrqSinr>(record);
      EXPECT_GE(message.numSamples(), 5U);
      for (const RsrpRsrqSinr& sample : message.instValues()) {
        EXPECT_EQ(sample.phyCellId(), std::prev(after)->second) << "in step " << step;
      }
      ++answers;
    }
    drive.records.clear();
  }
  EXPECT_GT(answers, 10'000U);
  EXPECT_GT(served.size(), 10U);
}

TEST(Asker, IsNotToldLaterOfAnEarlierTimeThanInTheAnswer) {
  Drive drive("city");
  drive.listen();
  std::map<std::int64_t, std::chrono::milliseconds> last;
  for (int round = 0; round < 200; ++round) {
    drive.forSeconds(7.3);
    for (const std::int64_t id : toldMetrics()) drive.source->query(id);
    drive.forSeconds(1.1);
    listenAnew(drive);
    drive.forSeconds(0.1);
    for (const MetricRecord& record : drive.records) {
      EXPECT_GE(record.time, last[record.metricId]) << nameOf(record.metricId) << " in round " << round;
      last[record.metricId] = record.time;
    }
    drive.records.clear();
  }
}

}  // namespace
}  // namespace probeview
