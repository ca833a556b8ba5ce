// SPDX-License-Identifier: Apache-2.0
//
// From the row of a drive-test log to the display dictionary, the log line and the text of a page.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

#include "platform/manual_loop.h"
#include "service/sources/trace_source.h"
#include "store/metric_validator.h"
#include "tests/service/sources/trace_rows.h"
#include "tools/batch.h"
#include "ui/category_page.h"
#include "ui/page_snapshot.h"
#include "values/printer.h"

namespace probeview {
namespace {

using ::testing::ElementsAre;

// Hands a source's records to a store as if the service and its client library stood between them.
class StoreSink final : public MetricSink {
 public:
  explicit StoreSink(MetricValidator& store) : store_(store) {}
  void emit(MetricRecord record) override {
    store_.metricsDidUpdate(
        Dictionary{{"kKeyMetricID", record.metricId}, {"kKeyPayload", Value::bytes(record.payload)}});
  }

 private:
  MetricValidator& store_;
};

class TracePagesTest : public ::testing::Test {
 protected:
  void play(const std::string& rows) {
    const std::filesystem::path path =
        std::filesystem::path(::testing::TempDir()) / ("trace_pages." + std::to_string(getpid()) + ".csv");
    std::ofstream(path) << traceHeader << rows;
    SourceResult result = makeTraceSource(path.string() + ",speed=1000");
    std::filesystem::remove(path);
    ASSERT_EQ(result.error, "");
    source = std::move(result.source);
    source->start(SourceContext{loop, loop, sourceLog}, sink);
    source->setListening(true);
    loop.advance(std::chrono::hours(1));
  }
  std::string page(const std::string& key) {
    CategoryPage content(key, store, console);
    return plainText(takeSnapshot(content));
  }

  ManualLoop loop;
  CollectedLines console;
  CollectedLines systemLog;
  CollectedLines sourceLog;
  MetricValidator store{MetricValidator::Surroundings{.wrapper = nullptr, .console = console, .systemLog = systemLog}};
  StoreSink sink{store};
  std::unique_ptr<MetricSource> source;
};

TEST_F(TracePagesTest, AnLteRowShowsInDictionariesLogAndPages) {
  play(TraceLine{.time = "2024.03.05_12.00.00", .state = "I", .area = "1A2B", .cell = "25601"}.text() +
       TraceLine{.time = "2024.03.05_12.00.05",
                 .level = "-95",
                 .quality = "-11",
                 .snr = "12.5",
                 .state = "D",
                 .area = "1A2B",
                 .cell = "25601",
                 .neighbourLevel = "-100.0",
                 .neighbourQuality = "-9.5"}
           .text());
  EXPECT_EQ(printed(store.myLTESCellInfoDict().value()),
            R"(["timestamp": "2024-03-05 12:00:00 UTC", "cell_id": 25601, "tracking_area_code": 6699])");
  EXPECT_EQ(printed(store.myLTERRCStateDict().value()),
            R"(["timestamp": "2024-03-05 12:00:05 UTC", "state": "KLTE_RRC_STATE_CONNECTED", )"
            R"("prev_state": "KLTE_RRC_STATE_IDLE", "prev_state_dur_ms": 5000])");
  EXPECT_EQ(printed(store.myLTERsrpRsrqSinrDict().value()),
            R"(["timestamp": "2024-03-05 12:00:05 UTC", "inst_values": [["rsrp0": -95, "rsrq0": -11, "sinr0": 12.5, )"
            R"("timestamp": "2024-03-05 12:00:05 UTC"]]])");
  EXPECT_EQ(printed(store.myLTEIntraRatMeasDict().value()),
            R"(["timestamp": "2024-03-05 12:00:05 UTC", "meas_nbr_eutra": [["nbr_rsrp": -100, "nbr_rsrq": -9.5, )"
            R"("timestamp": "2024-03-05 12:00:05 UTC"]]])");
  EXPECT_THAT(
      console.lines(),
      ElementsAre(
          "Metric ID in Hex = 3C40C2",
          R"(Current Serving Cell Info is ["timestamp": "2024-03-05 12:00:00 UTC", "cell_id": 25601, )"
          R"("tracking_area_code": 6699])",
          "Received Valid Metric", "Metric ID in Hex = 3C4E04",
          R"(Current RRC state is ["timestamp": "2024-03-05 12:00:00 UTC", "state": "KLTE_RRC_STATE_IDLE"])",
          "Received Valid Metric", "Metric ID in Hex = 3C4E04",
          R"(Current RRC state is ["timestamp": "2024-03-05 12:00:05 UTC", "state": "KLTE_RRC_STATE_CONNECTED", )"
          R"("prev_state": "KLTE_RRC_STATE_IDLE", "prev_state_dur_ms": 5000])",
          "Received Valid Metric", "Metric ID in Hex = 3C4F6A",
          R"(Received RSRP RSRQ SINR is : ["timestamp": 1709640005000, "inst_values": [["rsrp0": -95, )"
          R"("rsrq0": -11, "sinr0": 25]]])",
          "Received Valid Metric", "Metric ID in Hex = 3CD30F",
          R"(Received LTE IRAT Meas is ["timestamp": "2024-03-05 12:00:05 UTC", )"
          R"("meas_nbr_eutra": [["nbr_rsrp": 40, "nbr_rsrq": 20]]])",
          "Received Valid Metric"));
  EXPECT_EQ(page("LTE RRC State"),
            "  timestamp          2024-03-05 12:00:05 UTC\n"
            "  state              KLTE_RRC_STATE_CONNECTED\n"
            "  prev_state         KLTE_RRC_STATE_IDLE\n"
            "  prev_state_dur_ms  5000\n");
  EXPECT_EQ(page("LTE Serving Cell Info"),
            "  timestamp           2024-03-05 12:00:00 UTC\n"
            "  cell_id             25601\n"
            "  tracking_area_code  6699\n");
}

TEST_F(TracePagesTest, ADriveThatLeavesLteShowsOnTheOtherTechnologiesPages) {
  play(TraceLine{.time = "2024.03.05_12.00.00", .state = "D", .area = "1A2B", .cell = "25601"}.text() +
       TraceLine{.time = "2024.03.05_12.00.01",
                 .mode = "HSPA+",
                 .level = "-91",
                 .quality = "-4",
                 .state = "D",
                 .area = "75AA",
                 .cell = "838585",
                 .neighbourLevel = "-95.0",
                 .neighbourQuality = "-8.0"}
           .text() +
       TraceLine{.time = "2024.03.05_12.00.02",
                 .mode = "EDGE",
                 .level = "-83",
                 .quality = "3",
                 .state = "I",
                 .area = "3FE",
                 .cell = "34124",
                 .neighbourLevel = "-90.0"}
           .text() +
       TraceLine{.time = "2024.03.05_12.00.03", .state = "I", .area = "1A2B", .cell = "25602"}.text());
  EXPECT_EQ(page("UMTS RRC State"),
            "  timestamp  2024-03-05 12:00:02 UTC\n"
            "  state      KWCDMA_RRC_CONN_STATE_INACTIVE\n")
      << "UMTS has been left";
  EXPECT_EQ(page("UMTS Serving Cell Info"),
            "  timestamp  2024-03-05 12:00:01 UTC\n"
            "  lac        30122\n"
            "  cell_id    838585\n");
  EXPECT_EQ(page("UMTS UMTS Neighbor Cell Meas"),
            "UMTS Neighbor 0\n"
            "  ecno       -8.0\n"
            "  rscp       -95\n"
            "  timestamp  2024-03-05 12:00:01 UTC\n");
  EXPECT_EQ(page("GSM Serving Cell Info"), "  timestamp  2024-03-05 12:00:03 UTC\n") << "one row, by its nature";
  EXPECT_EQ(printed(store.myGSMScellInfoDict().value()),
            R"(["timestamp": "2024-03-05 12:00:03 UTC", "state": "NON_DEDICATED_STATE"])")
      << "no cell of GSM serves any more";
  EXPECT_EQ(printed(store.myGSMIdleScellMeasDict().value()),
            R"(["timestamp": "2024-03-05 12:00:02 UTC", "idle_rxlev_dBm": -83])");
  EXPECT_EQ(page("GSM GSM Neighbor Cell Meas"),
            "GSM Neighbor 0\n"
            "  rxlev      -90\n"
            "  timestamp  2024-03-05 12:00:02 UTC\n");
  EXPECT_EQ(page("LTE RRC State"),
            "  timestamp          2024-03-05 12:00:03 UTC\n"
            "  state              KLTE_RRC_STATE_IDLE\n"
            "  prev_state         KLTE_RRC_STATE_NULL\n"
            "  prev_state_dur_ms  2000\n");
  EXPECT_THAT(systemLog.lines(), ElementsAre());
}

}  // namespace
}  // namespace probeview
