// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_translator.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <random>

#include "messages/lte_messages.h"
#include "messages/metric_identifiers.h"
#include "messages/runtime/data_reader.h"
#include "messages/umts_messages.h"
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
  EXPECT_THAT(add({.mode = "GPRS", .level = "-51", .quality = "0", .state = "V"}),
              ElementsAre(R"(K_GSM_CS_RF_MEAS ["cs_rxqual_sub": 0])"))
      << "a row that names no cell says nothing of a new one";
}

TEST_F(TraceTranslatorTest, AServingCellThatARowDoesNotNameStaysTheOneThatWasTold) {
  const TraceLine lte{.mode = "LTE", .area = "10", .cell = "25601"};
  const TraceLine foreign{
      .mode = "LTE", .level = "-99", .area = "75AA", .cell = "838535", .cellPart = "CB87", .nodePart = "C"};
  add(lte);
  EXPECT_THAT(add(foreign), ElementsAre(R"(K_LTE_RSRP_RSRQ_SINR ["inst_values": [["rsrp0": -99]]])"));
  EXPECT_THAT(add(lte), IsEmpty()) << "the same cell as before";
  EXPECT_THAT(add({.mode = "LTE", .area = "-", .cell = "25601"}), IsEmpty()) << "the same cell, told less of";
  EXPECT_THAT(add({.mode = "LTE", .area = "-", .cell = "25602"}),
              ElementsAre(R"(K_LTE_SCELL_INFO ["cell_id": 25602])"));
  EXPECT_THAT(add({.mode = "LTE", .area = "10", .cell = "25602"}),
              ElementsAre(R"(K_LTE_SCELL_INFO ["cell_id": 25602, "tracking_area_code": 16])"));
}

TEST_F(TraceTranslatorTest, AChangeOfTheGsmStateIsToldWithoutTheCellWhileThatIsNotKnown) {
  const TraceLine foreign{
      .mode = "EDGE", .state = "I", .area = "75AA", .cell = "838535", .cellPart = "CB87", .nodePart = "C"};
  add({.mode = "EDGE", .state = "V", .area = "3FE", .cell = "34124"});
  EXPECT_THAT(add(foreign), ElementsAre(R"(K_GSM_SCELL_INFO ["state": "NON_DEDICATED_STATE"])"));
  EXPECT_THAT(add(foreign), IsEmpty());
  EXPECT_THAT(add({.mode = "EDGE", .state = "I", .area = "3FE", .cell = "34124"}),
              ElementsAre(R"(K_GSM_SCELL_INFO ["lac": 1022, "cell_id": 34124, "state": "NON_DEDICATED_STATE"])"));
}

TEST_F(TraceTranslatorTest, AnotherTechnologyThatServesEndsTheStateOfTheOneThatIsLeft) {
  add({.time = "2024.03.05_12.00.00", .mode = "LTE", .state = "D"});
  EXPECT_THAT(add({.time = "2024.03.05_12.00.07", .mode = "UMTS", .state = "V", .area = "75AA", .cell = "838585"}),
              ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_NULL", "prev_state": )"
                          R"("KLTE_RRC_STATE_CONNECTED", "prev_state_dur_ms": 7000])",
                          R"(K_UMTS_SCELL_INFO ["lac": 30122, "cell_id": 838585])",
                          R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_CELL_DCH"])"));
  EXPECT_THAT(add({.time = "2024.03.05_12.00.08", .mode = "HSPA+", .state = "V"}), IsEmpty()) << "UMTS as well";
  EXPECT_THAT(add({.time = "2024.03.05_12.00.10", .mode = "EDGE", .state = "V", .area = "3FE", .cell = "34124"}),
              ElementsAre(R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_INACTIVE"])",
                          R"(K_GSM_SCELL_INFO ["lac": 1022, "cell_id": 34124, "state": "DEDICATED_STATE"])"));
  EXPECT_THAT(add({.time = "2024.03.05_12.00.20", .mode = "LTE", .state = "I"}),
              ElementsAre(R"(K_GSM_SCELL_INFO ["state": "NON_DEDICATED_STATE"])",
                          R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_IDLE", "prev_state": )"
                          R"("KLTE_RRC_STATE_NULL", "prev_state_dur_ms": 13000])"));
  EXPECT_THAT(add({.time = "2024.03.05_12.00.21", .mode = "EDGE", .state = "I"}),
              ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_NULL", "prev_state": )"
                          R"("KLTE_RRC_STATE_IDLE", "prev_state_dur_ms": 1000])",
                          R"(K_GSM_SCELL_INFO ["state": "NON_DEDICATED_STATE"])"));
  EXPECT_THAT(add({.time = "2024.03.05_12.00.22", .mode = "UMTS", .state = "I"}),
              ElementsAre(R"(K_GSM_SCELL_INFO ["state": "NON_DEDICATED_STATE"])",
                          R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_IDLE"])"))
      << "left from its idle state, too: no cell of GSM serves any more";
}

TEST_F(TraceTranslatorTest, ATechnologyWhoseStateWasNeverToldIsLeftInSilence) {
  add({.mode = "LTE", .level = "-95", .state = "-"});
  EXPECT_THAT(add({.mode = "UMTS"}), IsEmpty());
  EXPECT_THAT(add({.mode = "EDGE"}), IsEmpty());
  EXPECT_THAT(add({.mode = "LTE", .state = "I"}), ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_IDLE"])"))
      << "and nothing was told that could have lasted";
}

TEST_F(TraceTranslatorTest, LeavingTellsThePreviousStateOnlyWhereItIsKnown) {
  add({.mode = "LTE", .state = "D"});
  add({.mode = "LTE", .state = "-"});
  EXPECT_THAT(add({.mode = "UMTS"}), ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_NULL"])"));
  EXPECT_THAT(add({.mode = "LTE", .state = "-"}), IsEmpty()) << "a state that nobody knows";
  EXPECT_THAT(add({.mode = "LTE", .state = "I"}), ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_IDLE"])"))
      << "which came between";
}

TEST_F(TraceTranslatorTest, RowsWithoutATechnologyAreNoLeaving) {
  add({.time = "2024.03.05_12.00.00", .mode = "LTE", .state = "D", .area = "10", .cell = "25601"});
  EXPECT_THAT(add({.time = "2024.03.05_12.00.01", .mode = "-"}), IsEmpty());
  EXPECT_THAT(add({.time = "2024.03.05_12.00.02", .mode = "LTE", .state = "D", .area = "10", .cell = "25601"}),
              ElementsAre(R"(K_LTE_SCELL_INFO ["cell_id": 25601, "tracking_area_code": 16])",
                          R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED"])"));
  EXPECT_THAT(add({.time = "2024.03.05_12.00.03", .mode = "-"}), IsEmpty());
  EXPECT_THAT(add({.time = "2024.03.05_12.00.10", .mode = "UMTS", .state = "I"}),
              ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_NULL"])",
                          R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_IDLE"])"))
      << "left when another technology serves, from nobody knows which state";
  EXPECT_THAT(add({.time = "2024.03.05_12.00.11", .mode = "-"}), IsEmpty());
  EXPECT_THAT(add({.time = "2024.03.05_12.00.15", .mode = "LTE", .state = "I"}),
              ElementsAre(R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_INACTIVE"])",
                          R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_IDLE", "prev_state": )"
                          R"("KLTE_RRC_STATE_NULL", "prev_state_dur_ms": 5000])"))
      << "LTE was away all the time";
}

TEST_F(TraceTranslatorTest, AClockThatWentBackWhileLteWasAwayLeavesTheDurationUnset) {
  add({.time = "2024.03.05_12.00.00", .mode = "LTE", .state = "D"});
  add({.time = "2024.03.05_12.00.10", .mode = "UMTS"});
  add({.time = "2024.03.05_11.00.00", .mode = "UMTS"});
  EXPECT_THAT(add({.time = "2024.03.05_12.00.20", .mode = "LTE", .state = "D"}),
              ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED", "prev_state": )"
                          R"("KLTE_RRC_STATE_NULL"])"))
      << "the two times alone would say ten seconds";
}

TEST_F(TraceTranslatorTest, ATechnologyThatIsEnteredAgainIsToldAnew) {
  const TraceLine lte{.mode = "LTE", .state = "D", .area = "10", .cell = "25601"};
  const TraceLine umts{.mode = "UMTS", .state = "I", .area = "75AA", .cell = "838585"};
  add(lte);
  add(umts);
  EXPECT_THAT(add(lte), ElementsAre(R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_INACTIVE"])",
                                    R"(K_LTE_SCELL_INFO ["cell_id": 25601, "tracking_area_code": 16])",
                                    R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED", "prev_state": )"
                                    R"("KLTE_RRC_STATE_NULL", "prev_state_dur_ms": 0])"));
  EXPECT_THAT(add(umts), ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_NULL", "prev_state": )"
                                     R"("KLTE_RRC_STATE_CONNECTED", "prev_state_dur_ms": 0])",
                                     R"(K_UMTS_SCELL_INFO ["lac": 30122, "cell_id": 838585])",
                                     R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_IDLE"])"));
}

TEST_F(TraceTranslatorTest, ADriveThatStartsOverLeavesWhatServedAtItsEndAndHasNoPast) {
  const TraceLine umts{.time = "2024.03.05_12.00.00", .mode = "UMTS", .state = "D", .area = "75AA", .cell = "838585"};
  const TraceLine lte{.time = "2024.03.05_12.00.05", .mode = "LTE", .state = "D", .area = "10", .cell = "25601"};
  add(umts);
  add(lte);
  translator.startOver();
  EXPECT_THAT(add(umts), ElementsAre(R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_NULL"])",
                                     R"(K_UMTS_SCELL_INFO ["lac": 30122, "cell_id": 838585])",
                                     R"(K_UMTS_RRC_STATE ["state": "KWCDMA_RRC_CONN_STATE_CELL_DCH"])"));
  EXPECT_EQ(add(lte).back(), R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED", "prev_state": )"
                             R"("KLTE_RRC_STATE_NULL", "prev_state_dur_ms": 5000])")
      << "both ends are of this round";
  add({.time = "2024.03.05_12.00.06", .mode = "UMTS", .state = "I"});
  translator.startOver();
  add({.time = "2024.03.05_12.00.00", .mode = "UMTS", .state = "I"});
  EXPECT_EQ(add(lte).back(), R"(K_LTE_RRC_STATE ["state": "KLTE_RRC_STATE_CONNECTED"])")
      << "LTE was left in the round before";
}

TEST_F(TraceTranslatorTest, InARandomDriveNoTechnologyKeepsAStateThatAnotherOneContradicts) {
  const char* const modes[] = {"LTE", "5G", "HSPA+", "EDGE", "-"};
  const char* const states[] = {"I", "D", "V", "-"};
  std::mt19937 random(20240305);
  std::optional<std::uint64_t> lteTold;  // the time of the last state of LTE
  bool clockWentBack = false;            // since then
  std::int32_t lte = 0;
  bool umtsEnded = true;
  bool gsmEnded = true;
  std::uint64_t now = 1'709'640'000'000;
  int durations = 0;
  std::size_t mode = 0;
  for (int count = 0; count < 5000; ++count) {
    TraceRow row;
    if (random() % 3 == 0) mode = random() % std::size(modes);
    const std::string state = states[random() % std::size(states)];
    if (random() % 50 == 0) {
      now -= 30'000;
      clockWentBack = true;
    } else {
      now += random() % 3 * 1000;
    }
    if (random() % 1000 == 0) {
      translator.startOver();
      clockWentBack = true;
    }
    row.time = std::chrono::milliseconds(now);
    if (mode < 2) row.technology = TraceTechnology::Lte;
    if (mode == 2) row.technology = TraceTechnology::Umts;
    if (mode == 3) row.technology = TraceTechnology::Gsm;
    if (state != "-") row.activity = TraceActivity{.data = state == "D", .voice = state == "V"};
    std::vector<TraceMetric> metrics;
    translator.translate(row, metrics);
    for (const TraceMetric& metric : metrics) {
      PBDataReader reader(metric.payload);
      if (metric.metricId == K_LTE_RRC_STATE) {
        KCellularLteRrcState message;
        ASSERT_TRUE(message.readFrom(reader));
        if (message.hasPrevState()) {
          ASSERT_TRUE(lteTold.has_value());
          EXPECT_EQ(message.prevState(), lte);
        }
        if (message.hasPrevStateDurMs()) {
          EXPECT_FALSE(clockWentBack);
          EXPECT_EQ(message.prevStateDurMs(), now - *lteTold);
          ++durations;
        }
        lte = message.state();
        lteTold = now;
        clockWentBack = false;
      } else if (metric.metricId == K_UMTS_RRC_STATE) {
        KCellularWcdmaRrcConnectionState message;
        ASSERT_TRUE(message.readFrom(reader));
        umtsEnded = message.state() == KCellularWcdmaRrcConnectionState::State::KWCDMA_RRC_CONN_STATE_INACTIVE;
        EXPECT_EQ(umtsEnded, row.technology != TraceTechnology::Umts);
      } else {
        ASSERT_EQ(metric.metricId, K_GSM_SCELL_INFO);
        gsmEnded = row.technology != TraceTechnology::Gsm;
      }
    }
    if (!row.technology) {
      EXPECT_THAT(metrics, IsEmpty());
      continue;
    }
    EXPECT_TRUE(lte == KCellularLteRrcState::State::KLTE_RRC_STATE_NULL || *row.technology == TraceTechnology::Lte);
    EXPECT_TRUE(umtsEnded || *row.technology == TraceTechnology::Umts);
    EXPECT_TRUE(gsmEnded || *row.technology == TraceTechnology::Gsm);
  }
  EXPECT_GT(durations, 500);
}

}  // namespace
}  // namespace probeview
