// SPDX-License-Identifier: Apache-2.0
//
// GSM: serving cell, idle configuration, measurements, neighbour cells, GPRS configuration.
#pragma once

#include "messages/quantities.h"
#include "messages/runtime/field_table.h"
#include "messages/umts_messages.h"
#include "messages/viewer_notes.h"

namespace probeview {

// Tables read best in columns.
// clang-format off

class KCellularGsmScellInfo final : public PBCodable {
  PB_MESSAGE(KCellularGsmScellInfo,
             "The serving cell: PLMN, LAC, cell identity, band, ARFCN (3GPP TS 45.005, 2), BSIC, and whether a "
             "channel is dedicated.",
             "\"GSM Serving Cell Info\" (the first field)")

 public:
  PB_ENUMERATION(State,
    DEDICATED_STATE = 1,
    NON_DEDICATED_STATE = 2);

  PB_FIELD( 1, "timestamp",      timestamp,    Timestamp,    uint64,                                         timestamp,         "Time of the values", viewer::localTime);
  PB_FIELD( 4, "mcc",            mcc,          Mcc,          uint32,                                         countryCode,       "Mobile country code");
  PB_FIELD( 5, "mnc",            mnc,          Mnc,          uint32,                                         networkCode,       "Mobile network code");
  PB_FIELD( 6, "lac",            lac,          Lac,          uint32,                                         locationAreaCode,  "Location area code");
  PB_FIELD( 7, "cell_id",        cellId,       CellId,       uint32,                                         gsmCellIdentity,   "Cell identity");
  PB_FIELD( 8, "gsm_band",       gsmBand,      GsmBand,      enumeration<KCellularWcdmaCellInfo::WcdmaBand>, none,              "Band");
  PB_FIELD( 9, "arfcn",          arfcn,        Arfcn,        uint32,                                         arfcn,             "ARFCN");
  PB_FIELD(10, "bsic",           bsic,         Bsic,         uint32,                                         gsmBsic,           "Base station identity code");
  PB_FIELD(11, "state",          state,        State,        enumeration<State>,                             none,              "Whether a channel is dedicated to the phone");
  PB_FIELD(13, "num_mnc_digits", numMncDigits, NumMncDigits, uint32,                                         networkCodeDigits, "Digits of the mobile network code");
};

class KCellularGsmIdleConfig final : public PBCodable {
  PB_MESSAGE(KCellularGsmIdleConfig,
             "What the serving cell broadcasts in idle mode, 3GPP TS 44.018, 9.1.31 to 9.1.40.",
             "\"GSM Idle Config\" (the first field)")
  PB_FIELD( 1, "timestamp",           timestamp,         Timestamp,         uint64, timestamp,                 "Time of the values", viewer::localTime);
  PB_FIELD( 2, "arfcn_bcch",          arfcnBcch,         ArfcnBcch,         uint32, arfcn,                     "ARFCN of the BCCH carrier");
  PB_FIELD( 3, "mcc",                 mcc,               Mcc,               uint32, countryCode,               "Mobile country code");
  PB_FIELD( 4, "mnc",                 mnc,               Mnc,               uint32, networkCode,               "Mobile network code");
  PB_FIELD( 5, "lac",                 lac,               Lac,               uint32, locationAreaCode,          "Location area code");
  PB_FIELD( 6, "ci",                  ci,                Ci,                uint32, gsmCellIdentity,           "Cell identity");
  PB_FIELD( 7, "bsic",                bsic,              Bsic,              uint32, gsmBsic,                   "Base station identity code");
  PB_FIELD( 8, "dtx_from_bs",         dtxFromBs,         DtxFromBs,         uint32, none,                      "DTX as the base station allows it, 0 to 2 (3GPP TS 44.018, 10.5.2.3)");
  PB_FIELD( 9, "radio_link_timeout",  radioLinkTimeout,  RadioLinkTimeout,  uint32, gsmRadioLinkTimeout,       "RADIO-LINK-TIMEOUT");
  PB_FIELD(10, "multib_rep",          multibRep,         MultibRep,         uint32, none,                      "MULTIBAND_REPORTING, 0 to 3 (3GPP TS 45.008, 8.4.3)");
  PB_FIELD(11, "gsm_band",            gsmBand,           GsmBand,           uint32, none,                      "Band, a number of the modem");
  PB_FIELD(12, "access_tech",         accessTech,        AccessTech,        uint32, none,                      "Access technology, a number of the modem");
  PB_FIELD(13, "type_of_cur_chan",    typeOfCurChan,     TypeOfCurChan,     uint32, none,                      "Type of the current channel, a number of the modem");
  PB_FIELD(14, "ms_txpwr",            msTxpwr,           MsTxpwr,           uint32, none,                      "MS_TXPWR_MAX_CCH, power control level, 0 to 31 (3GPP TS 45.005, 4.1)");
  PB_FIELD(15, "rx_acc_min",          rxAccMin,          RxAccMin,          uint32, gsmRxLev,                  "RXLEV_ACCESS_MIN (3GPP TS 45.008, 6.4)");
  PB_FIELD(16, "cbq",                 cbq,               Cbq,               uint32, none,                      "CELL_BAR_QUALIFY, 0 or 1");
  PB_FIELD(17, "cba",                 cba,               Cba,               uint32, none,                      "CELL_BAR_ACCESS, 0 or 1");
  PB_FIELD(18, "c2_valid",            c2Valid,           C2Valid,           uint32, none,                      "Whether C2 parameters are broadcast, 0 or 1");
  PB_FIELD(19, "cr_offset",           crOffset,          CrOffset,          uint32, gsmReselectOffset,         "CELL_RESELECT_OFFSET");
  PB_FIELD(20, "tmp_offset",          tmpOffset,         TmpOffset,         uint32, gsmTemporaryOffset,        "TEMPORARY_OFFSET (7: infinity)");
  PB_FIELD(21, "penalty_t",           penaltyT,          PenaltyT,          uint32, gsmPenaltyTime,            "PENALTY_TIME (31: no time, CELL_RESELECT_OFFSET is taken away)");
  PB_FIELD(22, "t3212",               t3212,             T3212,             uint32, gsmPeriodicUpdate,         "T3212");
  PB_FIELD(23, "acc",                 acc,               Acc,               uint32, none,                      "Access control classes, 16 bits");
  PB_FIELD(24, "bs_pa_mfrms",         bsPaMfrms,         BsPaMfrms,         uint32, gsmPagingMultiframes,      "BS_PA_MFRMS between pages");
  PB_FIELD(25, "cs_pagemode",         csPagemode,        CsPagemode,        uint32, none,                      "Page mode, 0 to 3 (3GPP TS 44.018, 10.5.2.26)");
  PB_FIELD(26, "max_retrans_cs",      maxRetransCs,      MaxRetransCs,      uint32, gsmMaximumRetransmissions, "Max retrans");
  PB_FIELD(27, "emerg_call_allowed",  emergCallAllowed,  EmergCallAllowed,  uint32, none,                      "Whether emergency calls are allowed to all, 0 or 1");
  PB_FIELD(28, "attach_allowed",      attachAllowed,     AttachAllowed,     uint32, none,                      "ATT, whether IMSI attach and detach apply, 0 or 1");
  PB_FIELD(29, "half_rate_supported", halfRateSupported, HalfRateSupported, uint32, none,                      "Whether half rate is supported, 0 or 1");
  PB_FIELD(30, "si_7_8_broadcast",    si78Broadcast,     Si78Broadcast,     uint32, none,                      "Whether SI 7 and 8 are broadcast, 0 or 1");
  PB_FIELD(31, "cbch_supported",      cbchSupported,     CbchSupported,     uint32, none,                      "Whether the cell has a cell broadcast channel, 0 or 1");
  PB_FIELD(32, "reest_allowed",       reestAllowed,      ReestAllowed,      uint32, none,                      "Whether call re-establishment is allowed, 0 or 1");
  PB_FIELD(33, "ecsc",                ecsc,              Ecsc,              uint32, none,                      "Early classmark sending control, 0 or 1");
  PB_FIELD(34, "si_2_ter_needed",     si2TerNeeded,      Si2TerNeeded,      uint32, none,                      "Whether SI 2ter is broadcast, 0 or 1");
};

class KCellularGsmIdleScellMeasurement final : public PBCodable {
  PB_MESSAGE(KCellularGsmIdleScellMeasurement,
             "Level of the serving cell in idle mode.",
             "\"GSM Idle Serv Cell Meas\" (the first field)")
  PB_FIELD(1, "timestamp",           timestamp,         Timestamp,         uint64, timestamp,    "Time of the values", viewer::localTime);
  PB_FIELD(2, "scell_arfcn",         scellArfcn,        ScellArfcn,        uint32, arfcn,        "ARFCN of the serving cell");
  PB_FIELD(3, "simplified_l1_state", simplifiedL1State, SimplifiedL1State, uint32, none,         "State of layer 1, a number of the modem");
  PB_FIELD(4, "current_antenna",     currentAntenna,    CurrentAntenna,    uint32, none,         "Antenna in use, a number of the modem");
  PB_FIELD(5, "idle_rxlev_dBm",      idleRxlevDBm,      IdleRxlevDBm,      sint32, gsmIdleLevel, "Received level of the serving cell");
};

class KCellularGsmCsRfMeasurement final : public PBCodable {
  PB_MESSAGE(KCellularGsmCsRfMeasurement,
             "Radio measurement in dedicated mode: transmit powers, RXLEV_SUB and RXQUAL_SUB, 3GPP TS 45.008, 8.",
             "none that the lists lead to: \"GSM Connected Serv Cell Meas\" reads \"Come back later\"")
  PB_FIELD (1, "timestamp",           timestamp,         Timestamp,         uint64, timestamp, "Time of the values", viewer::localTime);
  PB_FIELD (2, "scell_arfcn",         scellArfcn,        ScellArfcn,        uint32, arfcn,     "ARFCN of the serving cell");
  PB_FIELD (3, "simplified_l1_state", simplifiedL1State, SimplifiedL1State, uint32, none,      "State of layer 1, a number of the modem");
  PB_FIELD (4, "current_antenna",     currentAntenna,    CurrentAntenna,    uint32, none,      "Antenna in use, a number of the modem");
  PB_VALUES(5, "cs_tx_pwr",           csTxPwrs,          CsTxPwrs, csTxPwr, CsTxPwr, repeated<sint32>, gsmTxPower, "Transmit powers");
  PB_FIELD (6, "cs_rxlev_sub",        csRxlevSub,        CsRxlevSub,        uint32, gsmRxLev,  "RXLEV_SUB");
  PB_FIELD (7, "cs_rxqual_sub",       csRxqualSub,       CsRxqualSub,       uint32, gsmRxQual, "RXQUAL_SUB (0: best)");
  PB_FIELD (8, "scell_band",          scellBand,         ScellBand,         uint32, none,      "Band of the serving cell, a number of the modem");
};

class GsmNcellMeas final : public PBCodable {
  PB_MESSAGE(GsmNcellMeas, "One GSM neighbour, the level as reported (3GPP TS 45.008, 8.1.4).")
  PB_FIELD(1, "mcc",   mcc,   Mcc,   uint32, countryCode,      "Mobile country code");
  PB_FIELD(2, "mnc",   mnc,   Mnc,   uint32, networkCode,      "Mobile network code");
  PB_FIELD(3, "lac",   lac,   Lac,   uint32, locationAreaCode, "Location area code");
  PB_FIELD(4, "ci",    ci,    Ci,    uint32, gsmCellIdentity,  "Cell identity");
  PB_FIELD(5, "bsic",  bsic,  Bsic,  uint32, gsmBsic,          "Base station identity code");
  PB_FIELD(6, "arfcn", arfcn, Arfcn, uint32, arfcn,            "ARFCN");
  PB_FIELD(7, "rxlev", rxlev, Rxlev, uint32, gsmRxLev,         "Received level", viewer::convertedOnPage);
};

class UmtsNcellMeas final : public PBCodable {
  PB_MESSAGE(UmtsNcellMeas, "One UMTS neighbour, RSCP and Ec/No as reported (3GPP TS 25.133, 9.1).")
  PB_FIELD(1, "cell_type",  cellType,  CellType,  uint32, none,     "Type of the cell, a number of the modem");
  PB_FIELD(2, "cpich_sc",   cpichSc,   CpichSc,   uint32, utraPsc,  "Primary scrambling code");
  PB_FIELD(3, "dl_uarfcn",  dlUarfcn,  DlUarfcn,  uint32, uarfcn,   "Downlink UARFCN");
  PB_FIELD(4, "cpich_rscp", cpichRscp, CpichRscp, uint32, utraRscp, "Reported RSCP", viewer::convertedOnPage);
  PB_FIELD(5, "cpich_ecn0", cpichEcn0, CpichEcn0, uint32, utraEcNo, "Reported Ec/No", ViewerNote{"shown as it is: the viewer looks for cpich_ecno"});
};

class LteNcellMeas final : public PBCodable {
  PB_MESSAGE(LteNcellMeas, "One LTE neighbour, RSRP and RSRQ as reported (3GPP TS 36.133, 9.1).")
  PB_FIELD(1, "physical_cell_id", physicalCellId, PhysicalCellId, uint32, eutraPci,     "Physical cell identity");
  PB_FIELD(2, "bandwidth",        bandwidth,      Bandwidth,      uint32, lteBandwidth, "Bandwidth");
  PB_FIELD(3, "rsrp",             rsrp,           Rsrp,           uint32, lteRsrp,      "Reported RSRP", viewer::convertedOnPage);
  PB_FIELD(4, "earfcn",           earfcn,         Earfcn,         uint32, earfcn,       "EARFCN");
  PB_FIELD(5, "rsrq",             rsrq,           Rsrq,           uint32, lteRsrq,      "Reported RSRQ", viewer::convertedOnPage);
};

class KCellularGsmGrrEventMeasCr final : public PBCodable {
  PB_MESSAGE(KCellularGsmGrrEventMeasCr,
             "Measured GSM, UMTS and LTE neighbour cells of a GSM cell.",
             "\"GSM GSM Neighbor Cell Meas\", \"GSM UMTS Neighbor Cell Meas\" and \"GSM LTE Neighbor Cell Meas\"")
  PB_FIELD(1, "timestamp",       timestamp,     Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_LIST (2, "gsm_ncell_meas",  gsmNcellMeas,  GsmNcellMeas, gsmNcellMeas, GsmNcellMeas, repeated<message<GsmNcellMeas>>,
              "One entry per GSM neighbour", viewer::pageEntriesGetTimestamp);
  PB_LIST (3, "umts_ncell_meas", umtsNcellMeas, UmtsNcellMeas, umtsNcellMeas, UmtsNcellMeas, repeated<message<UmtsNcellMeas>>,
              "One entry per UMTS neighbour", viewer::pageEntriesGetTimestamp);
  PB_LIST (4, "lte_ncell_meas",  lteNcellMeas,  LteNcellMeas, lteNcellMeas, LteNcellMeas, repeated<message<LteNcellMeas>>,
              "One entry per LTE neighbour", viewer::pageEntriesGetTimestamp);
};

class KCellularGsmGprsConfig final : public PBCodable {
  PB_MESSAGE(KCellularGsmGprsConfig,
             "What the serving cell broadcasts about GPRS, 3GPP TS 44.018, 10.5.2.37b, and 44.060, 11.2.20 and 12.24.",
             "none that the lists lead to: \"GSM GSM GPRS Config\" reads \"Come back later\", \"GSM GPRS Config\" "
             "shows the first field")
  PB_FIELD( 1, "timestamp",             timestamp,          Timestamp,          uint64,  timestamp,             "Time of the values", viewer::localTime);
  PB_FIELD( 2, "gprs_sup",              gprsSup,            GprsSup,            boolean, none,                  "Whether the cell supports GPRS");
  PB_FIELD( 3, "rac",                   rac,                Rac,                uint32,  routingAreaCode,       "Routing area code");
  PB_FIELD( 4, "sp_pg_cy",              spPgCy,             SpPgCy,             boolean, none,                  "SPLIT_PG_CYCLE_CODE, whether split paging is supported");
  PB_FIELD( 5, "nco",                   nco,                Nco,                uint32,  none,                  "NETWORK_CONTROL_ORDER, 0 to 2 (3GPP TS 44.018, 10.5.2.37b)");
  PB_FIELD( 6, "nom",                   nom,                Nom,                uint32,  none,                  "Network mode of operation, 1 to 3 (3GPP TS 23.060, 6.3.3)");
  PB_FIELD( 7, "cr_hyst",               crHyst,             CrHyst,             uint32,  gsmReselectHysteresis, "CELL_RESELECT_HYSTERESIS");
  PB_FIELD( 8, "acc_thr",               accThr,             AccThr,             uint32,  none,                  "GPRS access threshold");
  PB_FIELD( 9, "ext_upl_tbf_supported", extUplTbfSupported, ExtUplTbfSupported, boolean, none,                  "Whether extended uplink TBF mode is supported");
  PB_FIELD(10, "priority_class",        priorityClass,      PriorityClass,      uint32,  none,                  "Priority class for reselection");
  PB_FIELD(11, "cell_bar_access_2",     cellBarAccess2,     CellBarAccess2,     uint32,  none,                  "CELL_BAR_ACCESS_2, 0 or 1 (3GPP TS 44.060, 11.2.20)");
};

// All of them, in the order of the registry.
#define GSM_MESSAGES(EACH) \
  EACH(KCellularGsmScellInfo) \
  EACH(KCellularGsmIdleConfig) \
  EACH(KCellularGsmIdleScellMeasurement) \
  EACH(KCellularGsmCsRfMeasurement) \
  EACH(KCellularGsmGrrEventMeasCr) \
  EACH(GsmNcellMeas) \
  EACH(UmtsNcellMeas) \
  EACH(LteNcellMeas) \
  EACH(KCellularGsmGprsConfig)

// clang-format on

}  // namespace probeview
