// SPDX-License-Identifier: Apache-2.0
//
// What is told to somebody who begins to listen in the middle of a drive.
#include <map>

#include "messages/lte_messages.h"
#include "tests/service/scenario/drive.h"

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
  for (const std::int64_t id : handledMetrics()) plan.metrics[id] = 1000ms;
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

}  // namespace
}  // namespace probeview
