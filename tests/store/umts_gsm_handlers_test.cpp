// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>

#include "messages/metric_identifiers.h"
#include "tests/store/store_fixture.h"

namespace probeview {
namespace {

using UmtsHandlers = StoreTest;
using GsmHandlers = StoreTest;

TEST_F(UmtsHandlers, BeforeTheFirstMetricEachListHoldsThePlaceholderAndTheFourteenKeysAreEmpty) {
  const UMTS& umts = store_.myUMTS();
  for (const List* list : {&umts.rXInfo, &umts.TxPower, &umts.eUtraNbrs, &umts.utraNbrs, &umts.geraNbrs,
                           &umts.eUtraNbrMeas, &umts.utraNbrMeas, &umts.geraNbrMeas}) {
    EXPECT_EQ(printed(*list), placeholder);
  }
  EXPECT_EQ(umts.SelReselCellInfo.size(), 14u);
  EXPECT_EQ(
      printed(umts.SelReselCellInfo),
      R"(["timestamp": "", "ims_emergency_support": "", "hsdpa_capable": "", "edch_capable": "", )"
      R"("duplex_mode": "", "cell_barred": "", "fach_meas_occ_info_present": "", "s_rxlev": "", "s_qual": "", )"
      R"("s_intrasearch": "", "s_intersearch": "", "s_search_rat": "", "s_cell_prio": "", "multi_band_info": ""])");
}

TEST_F(UmtsHandlers, ServingCellsGetTheParentsTimestampAndConnectedMode) {
  EXPECT_EQ(
      linesOf(K_UMTS_SCELL_MEAS, timed().varint(2, 1).message(3, Wire().sint(1, -70)).message(3, Wire().sint(1, -80))),
      (Lines{R"(Received UMTS Serving Cell Meas is ["timestamp": "2024-03-05 12:00:00 UTC", "connected_mode": 1, )"
             R"("rx_info": [["rssi": -70], ["rssi": -80]]])"}));
  EXPECT_EQ(printed(store_.myUMTS().rXInfo),
            R"([["rssi": -70, "timestamp": "2024-03-05 12:00:00 UTC", "connected_mode": 1], )"
            R"(["rssi": -80, "timestamp": "2024-03-05 12:00:00 UTC", "connected_mode": 1]])");
  EXPECT_EQ(printed(*store_.myUMTSCellMeasDict()->find("rx_info")), R"([["rssi": -70], ["rssi": -80]])");
}

TEST_F(UmtsHandlers, ServingCellsGetConnectedModeOnlyIfTheParentHasIt) {
  send(K_UMTS_SCELL_MEAS, Wire().message(3, Wire().sint(1, -70)));
  EXPECT_EQ(printed(store_.myUMTS().rXInfo), R"([["rssi": -70]])");
  send(K_UMTS_SCELL_MEAS, Wire().varint(2, 0).message(3, Wire().sint(1, -70)));
  EXPECT_EQ(printed(store_.myUMTS().rXInfo), R"([["rssi": -70, "connected_mode": 0]])");
}

TEST_F(UmtsHandlers, AMeasurementWithoutCellsKeepsThePreviousCells) {
  send(K_UMTS_SCELL_MEAS, timed());
  EXPECT_EQ(printed(store_.myUMTS().rXInfo), placeholder);
  send(K_UMTS_SCELL_MEAS, Wire().message(3, Wire().sint(1, -70)));
  send(K_UMTS_SCELL_MEAS, timed());
  EXPECT_EQ(printed(store_.myUMTS().rXInfo), R"([["rssi": -70]])");
}

TEST_F(UmtsHandlers, TxPowerFillsTheRecordUnlikeLte) {
  EXPECT_EQ(
      linesOf(K_UMTS_TX_POWER, timed().message(2, Wire().sint(1, 5))),
      (Lines{
          R"(Received Tx Power is ["timestamp": "2024-03-05 12:00:00 UTC", "tx_power_info": [["pucch_tx_power": 5]]])"}));
  EXPECT_EQ(printed(store_.myUMTS().TxPower), R"([["pucch_tx_power": 5, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(*store_.myUMTSTxPowerDict()->find("tx_power_info")), R"([["pucch_tx_power": 5]])");
}

TEST_F(UmtsHandlers, TheReselectionLineFollowsTheTimestampAndPrecedesTheFlatteningOfTheBands) {
  EXPECT_EQ(
      linesOf(K_UMTS_SEL_RESEL_INFO, timed().packed(5, {1, 4})),
      (Lines{R"(Received UMTS Cell Resel Info is ["timestamp": "2024-03-05 12:00:00 UTC", "multi_band_info": [1, 4]])",
             "[1, 4]"}));
}

TEST_F(UmtsHandlers, MultiBandInfoIsStoredAsTextInBothTheDisplayDictionaryAndTheRecord) {
  send(K_UMTS_SEL_RESEL_INFO, timed().packed(5, {1, 4}));
  EXPECT_EQ(*store_.myUMTSSelReselDict()->find("multi_band_info"), Value::text("[1, 4]"));
  EXPECT_EQ(*store_.myUMTS().SelReselCellInfo.find("multi_band_info"), Value::text("[1, 4]"));
}

TEST_F(UmtsHandlers, AReselectionMessageWithoutMultiBandInfoSetsThatKeyToAnEmptyTextWhateverItHeldBefore) {
  send(K_UMTS_SEL_RESEL_INFO, timed().packed(5, {1, 4}).varint(4, 1).varint(14, 9));
  EXPECT_EQ(linesOf(K_UMTS_SEL_RESEL_INFO, timed().sint(9, -3)).size(), 1u);
  const Dictionary& info = store_.myUMTS().SelReselCellInfo;
  EXPECT_EQ(*info.find("multi_band_info"), Value::text(""));
  EXPECT_EQ(*info.find("duplex_mode"), Value::text(""));
  EXPECT_EQ(bareText(*info.find("s_rxlev")), "-3");
  EXPECT_EQ(bareText(*info.find("timestamp")), someTimeText);
  EXPECT_EQ(info.size(), 14u);
}

TEST_F(UmtsHandlers, PriorityListsGoToTheirRecordsWithTheTimestamp) {
  send(K_UMTS_SEL_RESEL_INFO, timed()
                                  .message(22, Wire().varint(1, 6300).varint(2, 5))
                                  .message(23, Wire().varint(1, 10687).varint(2, 4))
                                  .message(24, Wire().varint(1, 62).varint(2, 1)));
  EXPECT_EQ(printed(store_.myUMTS().eUtraNbrs),
            R"([["earfcn": 6300, "prio": 5, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(store_.myUMTS().utraNbrs),
            R"([["uarfcn": 10687, "prio": 4, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(store_.myUMTS().geraNbrs), R"([["arfcn": 62, "prio": 1, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  send(K_UMTS_SEL_RESEL_INFO, Wire().message(23, Wire().varint(1, 1)));
  EXPECT_EQ(printed(store_.myUMTS().eUtraNbrs),
            R"([["earfcn": 6300, "prio": 5, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(store_.myUMTS().utraNbrs), R"([["uarfcn": 1]])");
}

TEST_F(UmtsHandlers, ZeroIsTheLowestLevelOfEachScale) {
  send(K_UMTS_NCELL_MEAS, timed()
                              .message(2, Wire().varint(4, 0).sint(5, 0))
                              .message(3, Wire().varint(3, 0))
                              .message(4, Wire().sint(4, 0).sint(5, 0)));
  EXPECT_EQ(printed(store_.myUMTS().utraNbrMeas),
            R"([["ecno": -24.5, "rscp": -116, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(store_.myUMTS().geraNbrMeas), R"([["rxlev": -110, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(store_.myUMTS().eUtraNbrMeas),
            R"([["rsrp": -140, "rsrq": -19.5, "timestamp": "2024-03-05 12:00:00 UTC"]])");
}

TEST_F(UmtsHandlers, AdjustmentsTouchOnlyTheRecordsCopies) {
  send(K_UMTS_NCELL_MEAS, Wire().message(2, Wire().varint(4, 30).sint(5, 40)));
  EXPECT_EQ(printed(store_.myUMTS().utraNbrMeas), R"([["ecno": -9.5, "rscp": -76]])");
  EXPECT_EQ(printed(*store_.myUMTSNbrMeasDict()), R"(["meas_utra_result": [["ecno": 30, "rscp": 40]]])");
}

TEST_F(UmtsHandlers, AMeasurementWithoutGsmResultsLeavesTheGsmNeighboursAsTheyWere) {
  send(K_UMTS_NCELL_MEAS, Wire().message(2, Wire().sint(5, 1)));
  EXPECT_EQ(printed(store_.myUMTS().geraNbrMeas), placeholder);
  send(K_UMTS_NCELL_MEAS, Wire().message(3, Wire().varint(3, 10)));
  send(K_UMTS_NCELL_MEAS, Wire().message(2, Wire().sint(5, 2)));
  EXPECT_EQ(printed(store_.myUMTS().geraNbrMeas), R"([["rxlev": -100]])");
  EXPECT_EQ(printed(store_.myUMTS().utraNbrMeas), R"([["rscp": -114]])");
}

TEST_F(UmtsHandlers, AListThatShrinksFromFiveCellsToTwoLeavesExactlyTwo) {
  Wire five;
  for (int cell = 0; cell < 5; ++cell) five.message(2, Wire().varint(1, 10600));
  send(K_UMTS_NCELL_MEAS, five);
  EXPECT_EQ(store_.myUMTS().utraNbrMeas.size(), 5u);
  send(K_UMTS_NCELL_MEAS, Wire().message(2, Wire().varint(1, 1)).message(2, Wire().varint(1, 2)));
  EXPECT_EQ(printed(store_.myUMTS().utraNbrMeas), R"([["uarfcn": 1], ["uarfcn": 2]])");
}

TEST_F(UmtsHandlers, AnOverflowingSubtractionStopsTheProgram) {
  send(K_UMTS_NCELL_MEAS, Wire().message(2, Wire().sint(5, lowest + 116)));
  EXPECT_EQ(printed(store_.myUMTS().utraNbrMeas), R"([["rscp": -2147483648]])");
  EXPECT_TRUE(reasonOfStop([this] { send(K_UMTS_NCELL_MEAS, Wire().message(2, Wire().sint(5, lowest + 115))); }));
  EXPECT_TRUE(reasonOfStop([this] { send(K_UMTS_NCELL_MEAS, Wire().message(4, Wire().sint(4, lowest))); }));
}

TEST_F(GsmHandlers, BeforeTheFirstMetricEachListHoldsThePlaceholder) {
  for (const List* list : {&store_.myGSM().eUtraNbrMeas, &store_.myGSM().utraNbrMeas, &store_.myGSM().geraNbrMeas}) {
    EXPECT_EQ(printed(*list), placeholder);
  }
}

TEST_F(GsmHandlers, TheServingCellLineReadsItsPrefixWithoutIsFollowedDirectlyByTheDictionary) {
  EXPECT_EQ(linesOf(K_GSM_SCELL_INFO, Wire().varint(4, 1).varint(5, 1)),
            (Lines{R"(Received GSM Serving Cell Info ["mcc": 1, "mnc": 1])"}));
}

TEST_F(GsmHandlers, TransmitPowersStayAListOfNumbers) {
  send(K_GSM_CS_RF_MEAS, Wire().packedSigned(5, {33, -1}));
  EXPECT_EQ(printed(*store_.myGSMConnRfMeasDict()), R"(["cs_tx_pwr": [33, -1]])");
}

TEST_F(GsmHandlers, ZeroIsTheLowestLevelOfEachScale) {
  send(K_GSM_NCELL_MEAS, timed()
                             .message(2, Wire().varint(7, 0))
                             .message(3, Wire().varint(4, 0))
                             .message(4, Wire().varint(3, 0).varint(5, 0)));
  EXPECT_EQ(printed(store_.myGSM().geraNbrMeas), R"([["rxlev": -110, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(store_.myGSM().utraNbrMeas), R"([["cpich_rscp": -116, "timestamp": "2024-03-05 12:00:00 UTC"]])");
  EXPECT_EQ(printed(store_.myGSM().eUtraNbrMeas),
            R"([["rsrp": -140, "rsrq": -19.5, "timestamp": "2024-03-05 12:00:00 UTC"]])");
}

TEST_F(GsmHandlers, AUmtsNeighbourKeepsItsRawEcn0BecauseTheHandlerLooksUpEcno) {
  send(K_GSM_NCELL_MEAS, Wire().message(3, Wire().varint(4, 40).varint(5, 10)));
  EXPECT_EQ(printed(store_.myGSM().utraNbrMeas), R"([["cpich_rscp": -76, "cpich_ecn0": 10]])");
}

TEST_F(GsmHandlers, TheDisplayDictionaryKeepsTheRawValues) {
  send(K_GSM_NCELL_MEAS, Wire().message(2, Wire().varint(7, 20)).message(4, Wire().varint(3, 50).varint(5, 20)));
  EXPECT_EQ(printed(*store_.myGSMNbrMeasDict()),
            R"(["gsm_ncell_meas": [["rxlev": 20]], "lte_ncell_meas": [["rsrp": 50, "rsrq": 20]]])");
}

TEST_F(GsmHandlers, AMetricWithoutUmtsNeighboursLeavesThemAsTheyWere) {
  send(K_GSM_NCELL_MEAS, Wire().message(2, Wire().varint(7, 20)));
  EXPECT_EQ(printed(store_.myGSM().utraNbrMeas), placeholder);
  send(K_GSM_NCELL_MEAS, Wire().message(3, Wire().varint(2, 7)));
  send(K_GSM_NCELL_MEAS, Wire().message(2, Wire().varint(7, 30)));
  EXPECT_EQ(printed(store_.myGSM().utraNbrMeas), R"([["cpich_sc": 7]])");
  EXPECT_EQ(printed(store_.myGSM().geraNbrMeas), R"([["rxlev": -80]])");
}

TEST_F(GsmHandlers, ALevelPast32SignedBitsStaysAsItIs) {
  send(K_GSM_NCELL_MEAS, Wire()
                             .message(2, Wire().varint(7, 0xFFFFFFFF))
                             .message(3, Wire().varint(4, 0x80000000))
                             .message(4, Wire().varint(3, 0x7FFFFFFF).varint(5, 0xFFFFFFFF)));
  EXPECT_EQ(printed(store_.myGSM().geraNbrMeas), R"([["rxlev": 4294967295]])");
  EXPECT_EQ(printed(store_.myGSM().utraNbrMeas), R"([["cpich_rscp": 2147483648]])");
  EXPECT_EQ(printed(store_.myGSM().eUtraNbrMeas), R"([["rsrp": 2147483507, "rsrq": 2147483628.0]])");
}

}  // namespace
}  // namespace probeview
