// SPDX-License-Identifier: Apache-2.0
//
// What holds for every handler, over a table of all of them.
#include <gtest/gtest.h>

#include <set>

#include "messages/metric_identifiers.h"
#include "store/handlers.h"
#include "tests/store/store_fixture.h"

namespace probeview {
namespace {

// When a handler writes its line: with the timestamp as it came, or as text.
enum class Line { BeforeRewriting, AfterTimestamp };

struct Row {
  const char* constant;
  std::int64_t metricID;
  std::int64_t number;  // the identifier in figures
  DisplayDictionary dictionary;
  const char* prefix;
  Line line = Line::AfterTimestamp;
};

void PrintTo(const Row& row, std::ostream* out) { *out << row.constant; }

using enum DisplayDictionary;

const Row rows[] = {
    {"K_LTE_RRC_STATE", K_LTE_RRC_STATE, 0x3C4E04, myLTERRCStateDict, "Current RRC state is "},
    {"K_LTE_CDRX_CONFIG", K_LTE_CDRX_CONFIG, 0x3C4E18, myLTECDRXConfigDict, "Current CDRX Config is "},
    {"K_LTE_SCELL_INFO", K_LTE_SCELL_INFO, 0x3C40C2, myLTESCellInfoDict, "Current Serving Cell Info is "},
    {"K_LTE_TX_POWER", K_LTE_TX_POWER, 0x3CD302, myLTETxPowerDict, "Received LTE Tx Power is "},
    {"K_LTE_COMPCARR_INFO", K_LTE_COMPCARR_INFO, 0x3CD30B, myLTECompCarrDict, "Received Component Carrier info is "},
    {"K_LTE_SEL_RESEL_INFO", K_LTE_SEL_RESEL_INFO, 0x3CD30E, myLTESelReselDict, "Received LTE Cell Resel Info is ",
     Line::BeforeRewriting},
    {"K_LTE_INTRARAT_MEAS", K_LTE_INTRARAT_MEAS, 0x3CD30F, myLTEIntraRatMeasDict, "Received LTE IRAT Meas is "},
    {"K_LTE_INTERRAT_MEAS", K_LTE_INTERRAT_MEAS, 0x3CD310, myLTEInterRatMeasDict,
     "Received LTE InterRat Meas Info is "},
    {"K_LTE_CA_STATUS", K_LTE_CA_STATUS, 0x3CD313, myLTECAStatusDict, "Received CA Status Dict is "},
    {"K_LTE_RSRP_RSRQ_SINR", K_LTE_RSRP_RSRQ_SINR, 0x3C4F6A, myLTERsrpRsrqSinrDict,
     "Received RSRP RSRQ SINR is : ", Line::BeforeRewriting},
    {"K_UMTS_RRC_STATE", K_UMTS_RRC_STATE, 0x3CD112, myUMTSRRCStateDict, "Received UMTS RRC Connection State is "},
    {"K_UMTS_RRC_CONFIG", K_UMTS_RRC_CONFIG, 0x3CD113, myUMTSRRCConfigDict, "Received UMTS RRC Configuration is "},
    {"K_UMTS_SCELL_INFO", K_UMTS_SCELL_INFO, 0x3C300C, myUMTSCellInfoDict, "Received UMTS Serving Cell Info is "},
    {"K_UMTS_SCELL_MEAS", K_UMTS_SCELL_MEAS, 0x3CD102, myUMTSCellMeasDict, "Received UMTS Serving Cell Meas is "},
    {"K_UMTS_TX_POWER", K_UMTS_TX_POWER, 0x3CD103, myUMTSTxPowerDict, "Received Tx Power is "},
    {"K_UMTS_SEL_RESEL_INFO", K_UMTS_SEL_RESEL_INFO, 0x3CD104, myUMTSSelReselDict, "Received UMTS Cell Resel Info is "},
    {"K_UMTS_NCELL_MEAS", K_UMTS_NCELL_MEAS, 0x3CD105, myUMTSNbrMeasDict, "Received UMTS InterRat Meas Info is "},
    {"K_GSM_SCELL_INFO", K_GSM_SCELL_INFO, 0x3C2E0C, myGSMScellInfoDict, "Received GSM Serving Cell Info "},
    {"K_GSM_IDLE_CONFIG", K_GSM_IDLE_CONFIG, 0x3CD001, myGSMIdleConfigInfoDict, "Received GSM Idle Config Info is "},
    {"K_GSM_IDLE_SCELL_MEAS", K_GSM_IDLE_SCELL_MEAS, 0x3CD002, myGSMIdleScellMeasDict,
     "Received GSM Idle Serving Cell Meas Info is "},
    {"K_GSM_CS_RF_MEAS", K_GSM_CS_RF_MEAS, 0x3CD003, myGSMConnRfMeasDict,
     "Received GSM Connected Serving Cell Meas Info is "},
    {"K_GSM_NCELL_MEAS", K_GSM_NCELL_MEAS, 0x3CD009, myGSMNbrMeasDict, "Received GSM Nbr Cell Meas Info is "},
    {"K_GSM_GPRS_CONFIG", K_GSM_GPRS_CONFIG, 0x3CD00C, myGSMGPRSConfigDict, "Received GSM GPRS Config Info is "},
    {"K_CELLULAR_MM_INFO", K_CELLULAR_MM_INFO, 0x3CD509, myCellularMMCommonInfoDict,
     "Received MM Common Info Dict is : "},
    {"K_CELLULAR_MM_CTXT", K_CELLULAR_MM_CTXT, 0x3CD50A, myMMContextDict, "Received MM Context Info is "},
    {"K_CELLULAR_GMM_CTXT", K_CELLULAR_GMM_CTXT, 0x3CD50B, myGMMContextDict, "Received GMM Context Info is "},
    {"K_LTE_EMM_CTXT", K_LTE_EMM_CTXT, 0x3CD50C, myLTEEMMContextDict, "Received EMM Context is "},
    {"K_CELLULAR_ACTIVE_BEARER", K_CELLULAR_ACTIVE_BEARER, 0x3CD50D, myCellularActiveBearerDict,
     "Received Bearer Context Info is "},
    {"K_SIM_FILE_INFO", K_SIM_FILE_INFO, 0x3C0013, mySIMFileInfoDict, "Received SIM Card File Info is "},
};

class EveryHandler : public StoreTest, public testing::WithParamInterface<Row> {
 protected:
  const std::optional<Dictionary>& stored() const { return store_.displayDictionary(GetParam().dictionary); }
};

TEST_P(EveryHandler, HasTheIdentifierOfTheMetricService) { EXPECT_EQ(GetParam().metricID, GetParam().number); }

TEST_P(EveryHandler, FillsItsDisplayDictionaryAndNoOther) {
  EXPECT_TRUE(send(GetParam().metricID, Wire().varint(1, someTime)));
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    const auto which = static_cast<DisplayDictionary>(index);
    EXPECT_EQ(store_.displayDictionary(which).has_value(), which == GetParam().dictionary)
        << displayDictionaryName(which);
  }
}

TEST_P(EveryHandler, StoresTheTimestampAsText) {
  send(GetParam().metricID, Wire().varint(1, someTime));
  EXPECT_EQ(printed(*stored()), R"(["timestamp": "2024-03-05 12:00:00 UTC"])");
}

TEST_P(EveryHandler, WritesItsPrefixDirectlyFollowedByTheDictionaryAtItsPlace) {
  const std::string expected = GetParam().line == Line::BeforeRewriting
                                   ? std::string(GetParam().prefix) + R"(["timestamp": 1709640000123])"
                                   : std::string(GetParam().prefix) + R"(["timestamp": "2024-03-05 12:00:00 UTC"])";
  EXPECT_EQ(linesOf(GetParam().metricID, Wire().varint(1, someTime)), (Lines{expected}));
}

TEST_P(EveryHandler, TakesAnEmptyPayloadAsAMessageWithoutFields) {
  EXPECT_EQ(linesOf(GetParam().metricID, {}), (Lines{std::string(GetParam().prefix) + "[]"}));
  EXPECT_TRUE(stored()->empty());
}

TEST_P(EveryHandler, ReplacesItsDictionaryWhole) {
  send(GetParam().metricID, Wire().varint(1, someTime));
  send(GetParam().metricID, {});
  EXPECT_TRUE(stored()->empty());
}

TEST_P(EveryHandler, StopsTheProgramWhenThePayloadDoesNotDecode) {
  const std::uint8_t truncated[] = {0x08};
  const Dictionary event{{"kKeyMetricID", GetParam().metricID}, {"kKeyPayload", Value::bytes(truncated)}};
  EXPECT_TRUE(reasonOfStop([&] { store_.metricsDidUpdate(event); }).has_value());
  EXPECT_EQ(console_.lines.size(), 1u);
  EXPECT_EQ(stored(), std::nullopt);
}

INSTANTIATE_TEST_SUITE_P(Store, EveryHandler, testing::ValuesIn(rows),
                         [](const auto& instance) { return std::string(instance.param.constant); });

TEST(Handlers, AreThoseListedHereEachWithADictionaryOfItsOwn) {
  std::set<std::int64_t> identifiers;
  std::set<DisplayDictionary> dictionaries;
  for (const auto family : {lteHandlers(), umtsHandlers(), gsmHandlers(), nasHandlers()}) {
    for (const MetricHandler& handler : family) {
      identifiers.insert(handler.metricID);
      dictionaries.insert(handledMetric(handler.metricID)->dictionary);
    }
  }
  EXPECT_EQ(identifiers.size(), std::size(rows));
  EXPECT_EQ(dictionaries.size(), std::size(rows));
  EXPECT_EQ(dictionaries.size(), displayDictionaryCount - 1);
  EXPECT_FALSE(dictionaries.contains(myLTESCellMeasDict));
}

TEST(Handlers, AreChosenByExactIdentifier) {
  for (const Row& row : rows) {
    const HandledMetric* metric = handledMetric(row.metricID);
    ASSERT_NE(metric, nullptr) << row.constant;
    EXPECT_EQ(metric->handler.metricID, row.metricID);
    EXPECT_EQ(handledMetric(-row.metricID), nullptr);
  }
  EXPECT_EQ(handledMetric(K_LTE_RLF), nullptr);
  EXPECT_EQ(handledMetric(K_LTE_SCELL_MEAS), nullptr);
  EXPECT_EQ(handledMetric(std::numeric_limits<std::int64_t>::max()), nullptr);
  EXPECT_EQ(handledMetric(std::numeric_limits<std::int64_t>::min()), nullptr);
}

TEST(Handlers, AreExactlyTheMetricsThatAreNamedAsHandled) {
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    EXPECT_EQ(handledMetric(metric.id) != nullptr, metric.isHandled) << metric.name;
  }
}

TEST(DisplayDictionaries, AreFoundByTheirNames) {
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    EXPECT_EQ(displayDictionaryNamed(displayDictionaryNames[index]), static_cast<DisplayDictionary>(index));
  }
  EXPECT_EQ(displayDictionaryNamed("myLTE"), std::nullopt);
  EXPECT_EQ(displayDictionaryName(myUMTSNbrMeasDict), "myUMTSNbrMeasDict");
}

}  // namespace
}  // namespace probeview
