// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>

#include "messages/metric_identifiers.h"
#include "tests/store/store_fixture.h"

namespace probeview {
namespace {

using LteHandlers = StoreTest;

constexpr std::uint32_t pastSigned = 0x80000000;  // one past the largest signed 32-bit integer

TEST_F(LteHandlers, BeforeAnyMetricEveryListHoldsThePlaceholderAndTheTwentyKeysAreEmpty) {
  const LTE& lte = store_.myLTE();
  for (const List* list : {&lte.EutraNbrs, &lte.RsrpRsrqSinr, &lte.TxPower, &lte.EutraNbrsMeas, &lte.UtraNbrsMeas,
                           &lte.GeraNbrsMeas, &lte.CAStatusList, &lte.MMCommonInfo}) {
    EXPECT_EQ(printed(*list), placeholder);
  }
  EXPECT_EQ(bareText(lte.IMSI), "Come Back Later");
  EXPECT_EQ(printed(lte.SelReselCellInfo),
            R"(["timestamp": "", "ims_emergency_support": "", "ac_barring_for_emergency": "", )"
            R"("mo_signalling_ac_barring_factor": "", "mo_signalling_ac_barring_time": "", )"
            R"("mo_signalling_ac_barring_for_special_ac": "", "mo_data_ac_barring_factor": "", )"
            R"("mo_data_ac_barring_time": "", "mo_data_ac_barring_for_special_ac": "", "QRxLevMin": "", )"
            R"("QQualMin": "", "Q_hyst": "", "S_non_intra_search_P": "", "S_non_intra_search_Q": "", )"
            R"("S_intra_search_P": "", "S_intra_search_Q": "", "Thresh_serving_lowP": "", )"
            R"("Thresh_serving_lowQ": "", "priority_operating_freq": "", "multi_band_info": ""])");
  EXPECT_EQ(lte.SelReselCellInfo.size(), 20u);
}

TEST_F(LteHandlers, TheBandwidthTableGivesMegahertzAs32BitFloats) {
  EXPECT_EQ(MetricValidator::dlbwlookup, (std::array<float, 6>{1.4f, 3.0f, 5.0f, 10.0f, 15.0f, 20.0f}));
}

TEST_F(LteHandlers, AServingCellsBandwidthIsHalvedTwiceTruncatingTowardZeroEachTime) {
  for (const auto& [raw, shown] : {std::pair{5, 1}, {3, 0}, {100, 25}, {0, 0}, {7, 1}, {2147483647, 536870911}}) {
    EXPECT_EQ(linesOf(K_LTE_SCELL_INFO, Wire().varint(5, static_cast<std::uint64_t>(raw))),
              (Lines{"Current Serving Cell Info is [\"dl_bw\": " + std::to_string(shown) + "]"}));
    const Value* stored = store_.myLTESCellInfoDict()->find("dl_bw");
    EXPECT_EQ(stored->kind(), ValueKind::Int32);
    EXPECT_EQ(stored->integer32(), shown);
  }
}

TEST_F(LteHandlers, AServingCellsBandwidthPast32SignedBitsStaysAsItIs) {
  send(K_LTE_SCELL_INFO, Wire().varint(5, pastSigned));
  EXPECT_EQ(printed(*store_.myLTESCellInfoDict()), R"(["dl_bw": 2147483648])");
}

TEST_F(LteHandlers, TheServingCellsLineComesAfterBothHalvingsAndTheTimestamp) {
  EXPECT_EQ(
      linesOf(K_LTE_SCELL_INFO, timed().varint(2, 301).varint(5, 80)),
      (Lines{
          R"(Current Serving Cell Info is ["timestamp": "2024-03-05 12:00:00 UTC", "phy_cell_id": 301, "dl_bw": 20])"}));
}

TEST_F(LteHandlers, TxPowerGivesEachElementTheParentsTimestampInTheDisplayDictionaryOnly) {
  EXPECT_EQ(linesOf(K_LTE_TX_POWER, timed().message(2, Wire().sint(1, -7).varint(3, 4)).message(2, {})),
            (Lines{R"(Received LTE Tx Power is ["timestamp": "2024-03-05 12:00:00 UTC", )"
                   R"("tx_power_info": [["pucch_tx_power": -7, "subframe_index": 4], []]])"}));
  EXPECT_EQ(printed(*store_.myLTETxPowerDict()),
            R"(["timestamp": "2024-03-05 12:00:00 UTC", "tx_power_info": [["pucch_tx_power": -7, )"
            R"("subframe_index": 4, "timestamp": "2024-03-05 12:00:00 UTC"], )"
            R"(["timestamp": "2024-03-05 12:00:00 UTC"]]])");
  EXPECT_EQ(printed(store_.myLTE().TxPower), placeholder);
}

TEST_F(LteHandlers, AParentWithoutTimestampAddsNone) {
  send(K_LTE_TX_POWER, Wire().message(2, Wire().sint(1, -7)));
  EXPECT_EQ(printed(*store_.myLTETxPowerDict()), R"(["tx_power_info": [["pucch_tx_power": -7]]])");
  send(K_LTE_CA_STATUS, Wire().message(2, Wire().varint(3, 1)));
  EXPECT_EQ(printed(store_.myLTE().CAStatusList), R"([["pci": 1]])");
}

TEST_F(LteHandlers, TheReselectionLineComesDirectlyAfterStoringAndTheFlattenedBandsOnALineOfTheirOwn) {
  EXPECT_EQ(
      linesOf(K_LTE_SEL_RESEL_INFO, timed().packed(2, {3, 7}).sint(11, -65)),
      (Lines{
          R"(Received LTE Cell Resel Info is ["timestamp": 1709640000123, "multi_band_info": [3, 7], "QRxLevMin": -65])",
          "[3, 7]"}));
  EXPECT_EQ(printed(*store_.myLTESelReselDict()),
            R"(["timestamp": "2024-03-05 12:00:00 UTC", "multi_band_info": "[3, 7]", "QRxLevMin": -65])");
}

TEST_F(LteHandlers, ReselectionMergesIntoTheTwentyKeysAndBlanksThoseThatTheMessageLacks) {
  send(K_LTE_SEL_RESEL_INFO, timed().packed(2, {3}).varint(13, 4).varint(20, 6));
  const Dictionary& info = store_.myLTE().SelReselCellInfo;
  EXPECT_EQ(bareText(*info.find("timestamp")), someTimeText);
  EXPECT_EQ(bareText(*info.find("multi_band_info")), "[3]");
  EXPECT_EQ(bareText(*info.find("Q_hyst")), "4");
  EXPECT_EQ(bareText(*info.find("priority_operating_freq")), "6");
  EXPECT_EQ(bareText(*info.find("QQualMin")), "");
  // The neighbours are no key of it.
  send(K_LTE_SEL_RESEL_INFO, Wire().varint(13, 5).message(21, Wire().varint(1, 6300)));
  EXPECT_EQ(info.size(), 20u);
  EXPECT_EQ(bareText(*info.find("Q_hyst")), "5");
  EXPECT_EQ(bareText(*info.find("timestamp")), "");
  EXPECT_EQ(bareText(*info.find("multi_band_info")), "");
  EXPECT_EQ(info[0].key.text(), "timestamp");
  EXPECT_EQ(info[19].key.text(), "multi_band_info");
}

TEST_F(LteHandlers, AReselectionMessageWithoutPriorityOfTheOperatingFrequencyBlanksThatKey) {
  send(K_LTE_SEL_RESEL_INFO, timed().varint(20, 6));
  ASSERT_EQ(bareText(*store_.myLTE().SelReselCellInfo.find("priority_operating_freq")), "6");
  send(K_LTE_SEL_RESEL_INFO, timed());
  EXPECT_EQ(*store_.myLTE().SelReselCellInfo.find("priority_operating_freq"), Value::text(""));
}

TEST_F(LteHandlers, BandsOfWhichOneIsPast32SignedBitsStayAList) {
  EXPECT_EQ(linesOf(K_LTE_SEL_RESEL_INFO, Wire().packed(2, {3, pastSigned})),
            (Lines{R"(Received LTE Cell Resel Info is ["multi_band_info": [3, 2147483648]])"}));
  EXPECT_EQ(printed(*store_.myLTE().SelReselCellInfo.find("multi_band_info")), "[3, 2147483648]");
}

TEST_F(LteHandlers, ReselectionNeighboursGetMegahertzAndTimestampInTheRecordOnly) {
  send(K_LTE_SEL_RESEL_INFO, timed()
                                 .message(21, Wire().varint(1, 6300).varint(6, 3))
                                 .message(21, Wire().varint(6, 0))
                                 .message(21, Wire().varint(6, 6)));
  EXPECT_EQ(printed(store_.myLTE().EutraNbrs),
            R"([["earfcn": 6300, "dl_bw": 10.0, "timestamp": "2024-03-05 12:00:00 UTC"], )"
            R"(["dl_bw": 1.4, "timestamp": "2024-03-05 12:00:00 UTC"], )"
            R"(["dl_bw": 6, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(store_.myLTE().EutraNbrs[0].dictionary()->find("dl_bw")->kind(), ValueKind::Float);
  EXPECT_EQ(printed(*store_.myLTESelReselDict()->find("nbr_eutra")),
            R"([["earfcn": 6300, "dl_bw": 3], ["dl_bw": 0], ["dl_bw": 6]])");
}

TEST_F(LteHandlers, AMissingNeighbourListLeavesTheRecordAsItWas) {
  send(K_LTE_SEL_RESEL_INFO, Wire().message(21, Wire().varint(1, 1)).message(21, Wire().varint(1, 2)));
  send(K_LTE_SEL_RESEL_INFO, timed());
  EXPECT_EQ(printed(store_.myLTE().EutraNbrs), R"([["earfcn": 1], ["earfcn": 2]])");
  send(K_LTE_SEL_RESEL_INFO, Wire().message(21, Wire().varint(1, 3)));
  EXPECT_EQ(printed(store_.myLTE().EutraNbrs), R"([["earfcn": 3]])");
}

TEST_F(LteHandlers, AnIntraRatNeighbourIsShownInDbmAndDbInTheDisplayDictionaryAndTheRecordKeepsItsPlaceholder) {
  EXPECT_EQ(linesOf(K_LTE_INTRARAT_MEAS, timed().message(2, Wire().varint(1, 6300).sint(4, 40).sint(5, 20))),
            (Lines{R"(Received LTE IRAT Meas is ["timestamp": "2024-03-05 12:00:00 UTC", )"
                   R"("meas_nbr_eutra": [["nbr_earfcn": 6300, "nbr_rsrp": 40, "nbr_rsrq": 20]]])"}));
  EXPECT_EQ(printed(*store_.myLTEIntraRatMeasDict()),
            R"(["timestamp": "2024-03-05 12:00:00 UTC", "meas_nbr_eutra": [["nbr_earfcn": 6300, "nbr_rsrp": -100, )"
            R"("nbr_rsrq": -9.5, "timestamp": "2024-03-05 12:00:00 UTC"]]])");
  EXPECT_EQ(printed(store_.myLTE().EutraNbrsMeas), placeholder);
}

TEST_F(LteHandlers, InterRatNeighboursAreShownInDbmAndDbInTheDisplayDictionaryOnly) {
  EXPECT_EQ(
      linesOf(K_LTE_INTERRAT_MEAS, Wire().message(2, Wire().sint(3, 0).varint(4, 0)).message(3, Wire().varint(3, 0))),
      (Lines{R"(Received LTE InterRat Meas Info is ["meas_nbr_utra": [["rscp": 0, "ecno": 0]], )"
             R"("meas_nbr_geran": [["rxlev": 0]]])"}));
  EXPECT_EQ(printed(*store_.myLTEInterRatMeasDict()),
            R"(["meas_nbr_utra": [["rscp": -116, "ecno": -24.5]], "meas_nbr_geran": [["rxlev": -110]]])");
  EXPECT_EQ(printed(store_.myLTE().UtraNbrsMeas), placeholder);
  EXPECT_EQ(printed(store_.myLTE().GeraNbrsMeas), placeholder);
}

TEST_F(LteHandlers, ALargeUnsignedLevelIsNoIntegerAndStaysAsItIsWhileALargeRatioIsAReal) {
  send(K_LTE_INTERRAT_MEAS, Wire().message(2, Wire().varint(4, 0xFFFFFFFF)).message(3, Wire().varint(3, pastSigned)));
  EXPECT_EQ(printed(*store_.myLTEInterRatMeasDict()),
            R"(["meas_nbr_utra": [["ecno": 2147483623.0]], "meas_nbr_geran": [["rxlev": 2147483648]]])");
}

TEST_F(LteHandlers, ASubtractionThatOverflowsStopsTheProgramAndTheLastOneThatDoesNotIsShown) {
  send(K_LTE_INTRARAT_MEAS, Wire().message(2, Wire().sint(4, lowest + 140)));
  EXPECT_EQ(printed(*store_.myLTEIntraRatMeasDict()), R"(["meas_nbr_eutra": [["nbr_rsrp": -2147483648]]])");
  console_.lines.clear();
  const auto reason =
      reasonOfStop([this] { send(K_LTE_INTRARAT_MEAS, Wire().message(2, Wire().sint(4, lowest + 139))); });
  EXPECT_EQ(reason, "myLTEIntraRatMeasDict has a measurement whose value leaves 32 bits: nbr_rsrp");
  // The line precedes the arithmetic.
  EXPECT_EQ(console_.lines.size(), 2u);
  EXPECT_TRUE(reasonOfStop([this] { send(K_LTE_INTERRAT_MEAS, Wire().message(2, Wire().sint(3, lowest + 115))); }));
}

TEST_F(LteHandlers, SamplesAreHalvedAfterTheirLineWithTheTimestampFormattedAfterItToo) {
  EXPECT_EQ(
      linesOf(K_LTE_RSRP_RSRQ_SINR, timed().message(15, Wire().varint(1, 301).sint(4, -98).sint(10, 25).sint(11, -3))),
      (Lines{R"(Received RSRP RSRQ SINR is : ["timestamp": 1709640000123, )"
             R"("inst_values": [["phy_cell_id": 301, "rsrp0": -98, "sinr0": 25, "sinr1": -3]]])"}));
  EXPECT_EQ(printed(*store_.myLTERsrpRsrqSinrDict()),
            R"(["timestamp": "2024-03-05 12:00:00 UTC", "inst_values": [["phy_cell_id": 301, "rsrp0": -98, )"
            R"("sinr0": 12.5, "sinr1": -1.5, "timestamp": "2024-03-05 12:00:00 UTC"]]])");
  EXPECT_EQ(printed(store_.myLTE().RsrpRsrqSinr), placeholder);
}

TEST_F(LteHandlers, AveragesStayRaw) {
  send(K_LTE_RSRP_RSRQ_SINR, Wire().message(14, Wire().sint(10, 25)));
  EXPECT_EQ(printed(*store_.myLTERsrpRsrqSinrDict()), R"(["avg_values": ["sinr0": 25]])");
}

TEST_F(LteHandlers, ACarrierIsStoredInWholeDbmRealDbAndMegahertzWhileTheDisplayDictionaryKeepsTheRawValues) {
  const Wire carrier = Wire().varint(6, 3).sint(11, -9550).sint(12, -1050).sint(14, -6999);
  EXPECT_EQ(linesOf(K_LTE_CA_STATUS, timed().message(2, carrier)),
            (Lines{R"(Received CA Status Dict is ["timestamp": "2024-03-05 12:00:00 UTC", )"
                   R"("scc_list": [["dl_bandwidth": 3, "rsrp": -9550, "rsrq": -1050, "rssi": -6999]]])"}));
  EXPECT_EQ(
      printed(store_.myLTE().CAStatusList),
      R"([["dl_bandwidth": 10.0, "rsrp": -95, "rsrq": -10.5, "rssi": -69, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(*store_.myLTECAStatusDict()),
            R"(["timestamp": "2024-03-05 12:00:00 UTC", "scc_list": [["dl_bandwidth": 3, "rsrp": -9550, )"
            R"("rsrq": -1050, "rssi": -6999]]])");
}

TEST_F(LteHandlers, ABandwidthIndexOutsideTheTableLeavesTheEntryAsItIs) {
  for (const auto& [index, shown] : {std::pair<std::uint32_t, const char*>{0, "1.4"},
                                     {1, "3.0"},
                                     {2, "5.0"},
                                     {4, "15.0"},
                                     {5, "20.0"},
                                     {6, "6"},
                                     {0xFFFFFFFF, "4294967295"}}) {
    send(K_LTE_CA_STATUS, Wire().message(2, Wire().varint(6, index)));
    EXPECT_EQ(printed(store_.myLTE().CAStatusList), std::string(R"([["dl_bandwidth": )") + shown + "]]");
  }
}

TEST_F(LteHandlers, ACarrierStatusWithoutCarriersLeavesTheListAsItWas) {
  send(K_LTE_CA_STATUS, timed());
  EXPECT_EQ(printed(store_.myLTE().CAStatusList), placeholder);
  send(K_LTE_CA_STATUS, Wire().message(2, Wire().varint(3, 1)).message(2, Wire().varint(3, 2)));
  send(K_LTE_CA_STATUS, timed());
  EXPECT_EQ(printed(store_.myLTE().CAStatusList), R"([["pci": 1], ["pci": 2]])");
  send(K_LTE_CA_STATUS, Wire().message(2, Wire().varint(3, 3)));
  EXPECT_EQ(printed(store_.myLTE().CAStatusList), R"([["pci": 3]])");
}

TEST_F(LteHandlers, PagesReadCopiesThatLaterMetricsDoNotChange) {
  send(K_LTE_CA_STATUS, Wire().message(2, Wire().varint(3, 1)));
  const LTE copy = store_.myLTE();
  const std::optional<Dictionary> dictionary = store_.myLTECAStatusDict();
  send(K_LTE_CA_STATUS, Wire().message(2, Wire().varint(3, 2)));
  EXPECT_EQ(printed(copy.CAStatusList), R"([["pci": 1]])");
  EXPECT_EQ(printed(*dictionary), R"(["scc_list": [["pci": 1]]])");
}

TEST_F(LteHandlers, TheMmCommonInfoMetricDoesNotTouchTheLteRecord) {
  send(K_CELLULAR_MM_INFO, timed().bytes(2, "\x09\x10\x10"));
  EXPECT_EQ(printed(store_.myLTE().MMCommonInfo), placeholder);
  EXPECT_EQ(bareText(store_.myLTE().IMSI), "Come Back Later");
}

}  // namespace
}  // namespace probeview
