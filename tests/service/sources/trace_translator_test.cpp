// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_translator.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "messages/metric_identifiers.h"
#include "messages/runtime/data_reader.h"
#include "tests/service/sources/trace_rows.h"
#include "values/printer.h"

namespace probeview {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

// The metrics of each row of a log, as "K_NAME [dictionary]" without the timestamp.
class TraceTranslatorTest : public ::testing::Test {
 protected:
  std::vector<std::string> add(const TraceLine& line) {
    const TraceLogResult result = readTraceLog(traceHeader + line.text());
    EXPECT_EQ(result.error, "");
    std::vector<TraceMetric> metrics;
    translator.translate(result.log->rows.at(0), metrics);
    std::vector<std::string> texts;
    for (const TraceMetric& metric : metrics) {
      const MetricIdentifier& identifier = *metricWithId(metric.metricId);
      const std::unique_ptr<PBCodable> message = identifier.message->make();
      PBDataReader reader(metric.payload);
      EXPECT_TRUE(message->readFrom(reader));
      const Dictionary whole = message->dictionaryRepresentation();
      EXPECT_EQ(whole.find("timestamp")->rawUInt64(), static_cast<std::uint64_t>(result.log->rows[0].time.count()));
      Dictionary rest;
      for (const auto& entry : whole) {
        if (entry.key.text() != "timestamp") rest.append(entry.key, entry.value);
      }
      texts.push_back(std::string(identifier.name) + " " + printed(rest));
    }
    return texts;
  }

  TraceTranslator translator;
};

TEST_F(TraceTranslatorTest, AnLteRowFillsServingCellStateSampleAndNeighbour) {
  EXPECT_THAT(add({.mode = "LTE",
                   .level = "-95",
                   .quality = "-11",
                   .snr = "12.5",
                   .state = "D",
                   .area = "1A2B",
                   .cell = "25601",
                   .neighbourLevel = "-100.0",
                   .neighbourQuality = "-9.5"}),
              ElementsAre(R"(K_LTE_SCELL_INFO ["cell_id": 25601, "tracking_area_code": 6699])",
                          R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED"])",
                          R"(K_LTE_RSRP_RSRQ_SINR ["inst_values": [["rsrp0": -95, "rsrq0": -11, "sinr0": 25]]])",
                          R"(K_LTE_INTRARAT_MEAS ["meas_nbr_eutra": [["nbr_rsrp": 40, "nbr_rsrq": 20]]])"));
}

TEST_F(TraceTranslatorTest, ARowOfTheNewRadioIsToldAsItsLteAnchor) {
  EXPECT_THAT(add({.mode = "5G", .level = "-95", .state = "I"}),
              ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_IDLE"])",
                          R"(K_LTE_RSRP_RSRQ_SINR ["inst_values": [["rsrp0": -95]]])"));
}

TEST_F(TraceTranslatorTest, WhatIsUnknownIsLeftUnset) {
  EXPECT_THAT(add({.mode = "LTE", .snr = "-3.0"}),
              ElementsAre(R"(K_LTE_RSRP_RSRQ_SINR ["inst_values": [["sinr0": -6]]])"));
  EXPECT_THAT(add({.mode = "LTE", .neighbourLevel = "-51.0", .neighbourQuality = "-24.0"}), IsEmpty());
  EXPECT_THAT(add({.mode = "LTE", .neighbourLevel = "-101.0"}),
              ElementsAre(R"(K_LTE_INTRARAT_MEAS ["meas_nbr_eutra": [["nbr_rsrp": 39]]])"));
  EXPECT_THAT(add({.mode = "LTE", .cell = "25601"}), ElementsAre(R"(K_LTE_SCELL_INFO ["cell_id": 25601])"));
  EXPECT_THAT(add({.mode = "-", .level = "-95", .state = "D"}), IsEmpty());
}

TEST_F(TraceTranslatorTest, StatesAndServingCellsAreToldWhenTheyChange) {
  const TraceLine first{.mode = "LTE", .state = "I", .area = "10", .cell = "25601"};
  EXPECT_EQ(add(first).size(), 2u);
  EXPECT_THAT(add(first), IsEmpty());
  EXPECT_THAT(add({.mode = "LTE", .state = "I", .area = "10", .cell = "25602"}),
              ElementsAre(R"(K_LTE_SCELL_INFO ["cell_id": 25602, "tracking_area_code": 16])"));
  EXPECT_THAT(add({.mode = "LTE", .state = "I"}), IsEmpty()) << "a row that names no cell says nothing of a new one";
}

TEST_F(TraceTranslatorTest, APreviousStateComesWithItsDurationFromEarlierRows) {
  add({.time = "2024.03.05_12.00.00", .state = "I"});
  add({.time = "2024.03.05_12.00.05", .state = "I"});
  EXPECT_THAT(add({.time = "2024.03.05_12.01.30", .state = "VD"}),
              ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED", "prev_state": )"
                          R"("KLTE_RRC_STATE_IDLE", "prev_state_dur_ms": 90000])"));
  EXPECT_THAT(add({.time = "2024.03.05_12.01.31", .state = "D"}), IsEmpty()) << "voice that ends leaves it connected";
  EXPECT_THAT(add({.time = "2024.03.05_12.01.32", .state = "I"}),
              ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_IDLE", "prev_state": )"
                          R"("KLTE_RRC_STATE_CONNECTED", "prev_state_dur_ms": 2000])"));
}

TEST_F(TraceTranslatorTest, AClockThatWentBackLeavesTheDurationUnset) {
  add({.time = "2024.03.05_12.00.10", .state = "I"});
  EXPECT_THAT(add({.time = "2024.03.05_12.00.00", .state = "D"}),
              ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED", "prev_state": )"
                          R"("KLTE_RRC_STATE_IDLE"])"));
}

TEST_F(TraceTranslatorTest, AStateThatNobodySawLeavesThePreviousOneUnset) {
  add({.state = "I"});
  add({.state = "-"});
  EXPECT_THAT(add({.state = "D"}), ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED"])"));
}

TEST_F(TraceTranslatorTest, AUmtsRowFillsServingCellStateAndNeighbour) {
  EXPECT_THAT(add({.mode = "HSPA+",
                   .level = "-91",
                   .quality = "-4",
                   .state = "D",
                   .area = "75AA",
                   .cell = "838585",
                   .neighbourLevel = "-95.0",
                   .neighbourQuality = "-8.0"}),
              ElementsAre(R"(K_UMTS_SCELL_INFO ["lac": 30122, "cell_id": 838585])",
                          R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_CELL_DCH"])",
                          R"(K_UMTS_NCELL_MEAS ["meas_utra_result": [["ecno": 33, "rscp": 21]]])"));
  EXPECT_THAT(add({.mode = "UMTS", .state = "I"}),
              ElementsAre(R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_IDLE"])"));
}

TEST_F(TraceTranslatorTest, AGsmRowInIdleFillsServingCellLevelAndNeighbour) {
  EXPECT_THAT(add({.mode = "EDGE",
                   .level = "-83",
                   .quality = "3",
                   .state = "D",
                   .area = "3FE",
                   .cell = "34124",
                   .neighbourLevel = "-90.0"}),
              ElementsAre(R"(K_GSM_SCELL_INFO ["lac": 1022, "cell_id": 34124, "state": "NON_DEDICATED_STATE"])",
                          R"(K_GSM_IDLE_SCELL_MEAS ["idle_rxlev_dBm": -83])",
                          R"(K_GSM_NCELL_MEAS ["gsm_ncell_meas": [["rxlev": 20]]])"));
}

TEST_F(TraceTranslatorTest, AGsmRowInACallFillsTheDedicatedMeasurement) {
  EXPECT_THAT(add({.mode = "GPRS", .level = "-83", .quality = "3", .state = "V", .area = "3FE", .cell = "34124"}),
              ElementsAre(R"(K_GSM_SCELL_INFO ["lac": 1022, "cell_id": 34124, "state": "DEDICATED_STATE"])",
                          R"(K_GSM_CS_RF_MEAS ["cs_rxlev_sub": 27, "cs_rxqual_sub": 3])"));
  EXPECT_THAT(
      add({.mode = "GPRS", .level = "-51", .quality = "0", .state = "V"}),
      ElementsAre(R"(K_GSM_SCELL_INFO ["state": "DEDICATED_STATE"])", R"(K_GSM_CS_RF_MEAS ["cs_rxqual_sub": 0])"));
}

TEST_F(TraceTranslatorTest, ATechnologyThatIsEnteredAgainIsToldAnewAndWithoutAPast) {
  const TraceLine lte{.mode = "LTE", .state = "D", .area = "10", .cell = "25601"};
  add({.mode = "LTE", .state = "I", .area = "10", .cell = "25601"});
  add(lte);
  add({.mode = "UMTS", .state = "D", .area = "75AA", .cell = "838585"});
  EXPECT_THAT(add(lte), ElementsAre(R"(K_LTE_SCELL_INFO ["cell_id": 25601, "tracking_area_code": 16])",
                                    R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED"])"));
}

}  // namespace
}  // namespace probeview
