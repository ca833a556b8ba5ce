// SPDX-License-Identifier: Apache-2.0
//
// Handlers of the LTE metrics. Only reselection and carrier aggregation fill the LTE record; the measurements are
// rewritten in their display dictionaries alone, so the record's lists for them keep their placeholder.
#include "messages/metric_identifiers.h"
#include "messages/quantities.h"
#include "store/handlers.h"

namespace probeview {

namespace {

void servingCellInfo(HandlerTurn& turn) {
  turn.formatTimestamp();
  // The bandwidth travels in quarter megahertz. Two truncating steps, each of them stored.
  static_assert(quantities::lteServingDownlinkBandwidth.scale == 2 * 2);
  turn.halveInteger("dl_bw");
  turn.halveInteger("dl_bw");
  turn.log();
}

void lteTxPower(HandlerTurn& turn) {
  formatTimestampAndLog(turn);
  turn.rewriteList("tx_power_info");
}

void lteReselection(HandlerTurn& turn) {
  static constexpr Adjustment neighbour[] = {lookUpBandwidth("dl_bw")};
  // The line shows the message as it came, its timestamp in milliseconds.
  turn.log();
  turn.formatTimestamp();
  turn.flattenIntegers("multi_band_info");
  turn.mergeInto(turn.lte().SelReselCellInfo);
  turn.collect("nbr_eutra", turn.lte().EutraNbrs, neighbour);
}

void intraRatMeasurement(HandlerTurn& turn) {
  static constexpr Adjustment eutra[] = {rsrpToDbm("nbr_rsrp"), rsrqToDb("nbr_rsrq")};
  formatTimestampAndLog(turn);
  turn.rewriteList("meas_nbr_eutra", eutra);
}

void interRatMeasurement(HandlerTurn& turn) {
  static constexpr Adjustment utra[] = {rscpToDbm("rscp"), ecnoToDb("ecno")};
  static constexpr Adjustment geran[] = {rxlevToDbm("rxlev")};
  formatTimestampAndLog(turn);
  turn.rewriteList("meas_nbr_utra", utra);
  turn.rewriteList("meas_nbr_geran", geran);
}

void rsrpRsrqSinr(HandlerTurn& turn) {
  // The ratio of signal to noise travels in half decibels.
  static constexpr Adjustment sample[] = {scaleReal("sinr0", quantities::lteSampleSinr),
                                          scaleReal("sinr1", quantities::lteSampleSinr)};
  // The line shows the message as it came, its timestamp in milliseconds.
  turn.log();
  turn.formatTimestamp();
  turn.rewriteList("inst_values", sample);
}

void carrierAggregation(HandlerTurn& turn) {
  // Power and quality travel in hundredths.
  static constexpr Adjustment carrier[] = {
      lookUpBandwidth("dl_bandwidth"), divideInteger("rsrp", quantities::lteCarrierRsrp),
      divideInteger("rssi", quantities::lteCarrierRssi), divideReal("rsrq", quantities::lteCarrierRsrq)};
  formatTimestampAndLog(turn);
  turn.collect("scc_list", turn.lte().CAStatusList, carrier);
}

constexpr MetricHandler lteTable[] = {
    {K_LTE_RRC_STATE, "Current RRC state is ", formatTimestampAndLog},
    {K_LTE_CDRX_CONFIG, "Current CDRX Config is ", formatTimestampAndLog},
    {K_LTE_SCELL_INFO, "Current Serving Cell Info is ", servingCellInfo},
    {K_LTE_TX_POWER, "Received LTE Tx Power is ", lteTxPower},
    {K_LTE_COMPCARR_INFO, "Received Component Carrier info is ", formatTimestampAndLog},
    {K_LTE_SEL_RESEL_INFO, "Received LTE Cell Resel Info is ", lteReselection},
    {K_LTE_INTRARAT_MEAS, "Received LTE IRAT Meas is ", intraRatMeasurement},
    {K_LTE_INTERRAT_MEAS, "Received LTE InterRat Meas Info is ", interRatMeasurement},
    {K_LTE_CA_STATUS, "Received CA Status Dict is ", carrierAggregation},
    {K_LTE_RSRP_RSRQ_SINR, "Received RSRP RSRQ SINR is : ", rsrpRsrqSinr},
};

}  // namespace

std::span<const MetricHandler> lteHandlers() { return lteTable; }

}  // namespace probeview
