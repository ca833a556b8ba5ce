// SPDX-License-Identifier: Apache-2.0
//
// Handlers of the GSM metrics. The record's lists hold adjusted copies; the display dictionary keeps what came.
#include "messages/metric_identifiers.h"
#include "store/handlers.h"

namespace probeview {

namespace {

void gsmNeighbourMeasurement(HandlerTurn& turn) {
  static constexpr Adjustment gsm[] = {rxlevToDbm("rxlev")};
  // The message names its Ec/No "cpich_ecn0", with a zero, so the second entry is never found and the raw value stays.
  // Whoever reads the page knows it raw, as it has always been shown.
  static constexpr Adjustment utra[] = {rscpToDbm("cpich_rscp"), ecnoToDb("cpich_ecno")};
  static constexpr Adjustment lte[] = {rsrpToDbm("rsrp"), rsrqToDb("rsrq")};
  formatTimestampAndLog(turn);
  turn.collect("gsm_ncell_meas", turn.gsm().geraNbrMeas, gsm);
  turn.collect("umts_ncell_meas", turn.gsm().utraNbrMeas, utra);
  turn.collect("lte_ncell_meas", turn.gsm().eUtraNbrMeas, lte);
}

constexpr MetricHandler gsmTable[] = {
    // Without the "is" of the others.
    {K_GSM_SCELL_INFO, "Received GSM Serving Cell Info ", formatTimestampAndLog},
    {K_GSM_IDLE_CONFIG, "Received GSM Idle Config Info is ", formatTimestampAndLog},
    {K_GSM_IDLE_SCELL_MEAS, "Received GSM Idle Serving Cell Meas Info is ", formatTimestampAndLog},
    {K_GSM_CS_RF_MEAS, "Received GSM Connected Serving Cell Meas Info is ", formatTimestampAndLog},
    {K_GSM_NCELL_MEAS, "Received GSM Nbr Cell Meas Info is ", gsmNeighbourMeasurement},
    {K_GSM_GPRS_CONFIG, "Received GSM GPRS Config Info is ", formatTimestampAndLog},
};

}  // namespace

std::span<const MetricHandler> gsmHandlers() { return gsmTable; }

}  // namespace probeview
