// SPDX-License-Identifier: Apache-2.0
//
// Handlers of the UMTS metrics. The record's lists hold adjusted copies; the display dictionaries keep what came.
#include "messages/metric_identifiers.h"
#include "store/handlers.h"

namespace probeview {

namespace {

void servingCellMeasurement(HandlerTurn& turn) {
  static constexpr std::string_view inherited[] = {"timestamp", "connected_mode"};
  formatTimestampAndLog(turn);
  turn.collect("rx_info", turn.umts().rXInfo, {}, inherited);
}

void umtsTxPower(HandlerTurn& turn) {
  formatTimestampAndLog(turn);
  turn.collect("tx_power_info", turn.umts().TxPower);
}

void umtsReselection(HandlerTurn& turn) {
  formatTimestampAndLog(turn);
  turn.flattenIntegers("multi_band_info");
  turn.mergeInto(turn.umts().SelReselCellInfo);
  turn.collect("eutra_prio_info", turn.umts().eUtraNbrs);
  turn.collect("utra_prio_info", turn.umts().utraNbrs);
  turn.collect("gsm_prio_info", turn.umts().geraNbrs);
}

void umtsNeighbourMeasurement(HandlerTurn& turn) {
  static constexpr Adjustment utra[] = {rscpToDbm("rscp"), ecnoToDb("ecno")};
  static constexpr Adjustment gsm[] = {rxlevToDbm("rxlev")};
  static constexpr Adjustment lte[] = {rsrpToDbm("rsrp"), rsrqToDb("rsrq")};
  formatTimestampAndLog(turn);
  turn.collect("meas_utra_result", turn.umts().utraNbrMeas, utra);
  turn.collect("meas_gsm_result", turn.umts().geraNbrMeas, gsm);
  turn.collect("meas_lte_result", turn.umts().eUtraNbrMeas, lte);
}

constexpr MetricHandler umtsTable[] = {
    {K_UMTS_SCELL_MEAS, "Received UMTS Serving Cell Meas is ", servingCellMeasurement},
    {K_UMTS_TX_POWER, "Received Tx Power is ", umtsTxPower},
    {K_UMTS_SEL_RESEL_INFO, "Received UMTS Cell Resel Info is ", umtsReselection},
    {K_UMTS_NCELL_MEAS, "Received UMTS InterRat Meas Info is ", umtsNeighbourMeasurement},
    {K_UMTS_RRC_STATE, "Received UMTS RRC Connection State is ", formatTimestampAndLog},
    {K_UMTS_RRC_CONFIG, "Received UMTS RRC Configuration is ", formatTimestampAndLog},
    {K_UMTS_SCELL_INFO, "Received UMTS Serving Cell Info is ", formatTimestampAndLog},
};

}  // namespace

std::span<const MetricHandler> umtsHandlers() { return umtsTable; }

}  // namespace probeview
