// SPDX-License-Identifier: Apache-2.0
//
// GSM: serving cell, idle configuration, measurements, neighbour cells, GPRS configuration.
#pragma once

#include "messages/runtime/field_table.h"
#include "messages/umts_messages.h"

namespace probeview {

// Tables read best in columns.
// clang-format off

// The serving cell: PLMN, LAC, cell identity, band, ARFCN (3GPP TS 45.005, 2), BSIC, and whether a channel is
// dedicated.
class KCellularGsmScellInfo final : public PBCodable {
 public:
  PB_ENUMERATION(State,
    DEDICATED_STATE = 1,
    NON_DEDICATED_STATE = 2);

  PB_MESSAGE(KCellularGsmScellInfo)
  PB_FIELD( 1, "timestamp",      timestamp,    Timestamp,    uint64);
  PB_FIELD( 4, "mcc",            mcc,          Mcc,          uint32);
  PB_FIELD( 5, "mnc",            mnc,          Mnc,          uint32);
  PB_FIELD( 6, "lac",            lac,          Lac,          uint32);
  PB_FIELD( 7, "cell_id",        cellId,       CellId,       uint32);
  PB_FIELD( 8, "gsm_band",       gsmBand,      GsmBand,      enumeration<KCellularWcdmaCellInfo::WcdmaBand>);
  PB_FIELD( 9, "arfcn",          arfcn,        Arfcn,        uint32);
  PB_FIELD(10, "bsic",           bsic,         Bsic,         uint32);
  PB_FIELD(11, "state",          state,        State,        enumeration<State>);
  PB_FIELD(13, "num_mnc_digits", numMncDigits, NumMncDigits, uint32);
};

// What the serving cell broadcasts in idle mode, 3GPP TS 44.018, 9.1.31 to 9.1.40.
class KCellularGsmIdleConfig final : public PBCodable {
  PB_MESSAGE(KCellularGsmIdleConfig)
  PB_FIELD( 1, "timestamp",           timestamp,         Timestamp,         uint64);
  PB_FIELD( 2, "arfcn_bcch",          arfcnBcch,         ArfcnBcch,         uint32);
  PB_FIELD( 3, "mcc",                 mcc,               Mcc,               uint32);
  PB_FIELD( 4, "mnc",                 mnc,               Mnc,               uint32);
  PB_FIELD( 5, "lac",                 lac,               Lac,               uint32);
  PB_FIELD( 6, "ci",                  ci,                Ci,                uint32);
  PB_FIELD( 7, "bsic",                bsic,              Bsic,              uint32);
  PB_FIELD( 8, "dtx_from_bs",         dtxFromBs,         DtxFromBs,         uint32);
  PB_FIELD( 9, "radio_link_timeout",  radioLinkTimeout,  RadioLinkTimeout,  uint32);
  PB_FIELD(10, "multib_rep",          multibRep,         MultibRep,         uint32);
  PB_FIELD(11, "gsm_band",            gsmBand,           GsmBand,           uint32);
  PB_FIELD(12, "access_tech",         accessTech,        AccessTech,        uint32);
  PB_FIELD(13, "type_of_cur_chan",    typeOfCurChan,     TypeOfCurChan,     uint32);
  PB_FIELD(14, "ms_txpwr",            msTxpwr,           MsTxpwr,           uint32);
  PB_FIELD(15, "rx_acc_min",          rxAccMin,          RxAccMin,          uint32);
  PB_FIELD(16, "cbq",                 cbq,               Cbq,               uint32);
  PB_FIELD(17, "cba",                 cba,               Cba,               uint32);
  PB_FIELD(18, "c2_valid",            c2Valid,           C2Valid,           uint32);
  PB_FIELD(19, "cr_offset",           crOffset,          CrOffset,          uint32);
  PB_FIELD(20, "tmp_offset",          tmpOffset,         TmpOffset,         uint32);
  PB_FIELD(21, "penalty_t",           penaltyT,          PenaltyT,          uint32);
  PB_FIELD(22, "t3212",               t3212,             T3212,             uint32);
  PB_FIELD(23, "acc",                 acc,               Acc,               uint32);
  PB_FIELD(24, "bs_pa_mfrms",         bsPaMfrms,         BsPaMfrms,         uint32);
  PB_FIELD(25, "cs_pagemode",         csPagemode,        CsPagemode,        uint32);
  PB_FIELD(26, "max_retrans_cs",      maxRetransCs,      MaxRetransCs,      uint32);
  PB_FIELD(27, "emerg_call_allowed",  emergCallAllowed,  EmergCallAllowed,  uint32);
  PB_FIELD(28, "attach_allowed",      attachAllowed,     AttachAllowed,     uint32);
  PB_FIELD(29, "half_rate_supported", halfRateSupported, HalfRateSupported, uint32);
  PB_FIELD(30, "si_7_8_broadcast",    si78Broadcast,     Si78Broadcast,     uint32);
  PB_FIELD(31, "cbch_supported",      cbchSupported,     CbchSupported,     uint32);
  PB_FIELD(32, "reest_allowed",       reestAllowed,      ReestAllowed,      uint32);
  PB_FIELD(33, "ecsc",                ecsc,              Ecsc,              uint32);
  PB_FIELD(34, "si_2_ter_needed",     si2TerNeeded,      Si2TerNeeded,      uint32);
};

// Level of the serving cell in idle mode, in dBm.
class KCellularGsmIdleScellMeasurement final : public PBCodable {
  PB_MESSAGE(KCellularGsmIdleScellMeasurement)
  PB_FIELD(1, "timestamp",           timestamp,         Timestamp,         uint64);
  PB_FIELD(2, "scell_arfcn",         scellArfcn,        ScellArfcn,        uint32);
  PB_FIELD(3, "simplified_l1_state", simplifiedL1State, SimplifiedL1State, uint32);
  PB_FIELD(4, "current_antenna",     currentAntenna,    CurrentAntenna,    uint32);
  PB_FIELD(5, "idle_rxlev_dBm",      idleRxlevDBm,      IdleRxlevDBm,      sint32);
};

// Radio measurement in dedicated mode: transmit powers in dBm, RXLEV_SUB (0 to 63) and RXQUAL_SUB (0 to 7), 3GPP TS
// 45.008, 8.
class KCellularGsmCsRfMeasurement final : public PBCodable {
  PB_MESSAGE(KCellularGsmCsRfMeasurement)
  PB_FIELD (1, "timestamp",           timestamp,         Timestamp,         uint64);
  PB_FIELD (2, "scell_arfcn",         scellArfcn,        ScellArfcn,        uint32);
  PB_FIELD (3, "simplified_l1_state", simplifiedL1State, SimplifiedL1State, uint32);
  PB_FIELD (4, "current_antenna",     currentAntenna,    CurrentAntenna,    uint32);
  PB_VALUES(5, "cs_tx_pwr",           csTxPwrs,          CsTxPwrs, csTxPwr, CsTxPwr, repeated<sint32>);
  PB_FIELD (6, "cs_rxlev_sub",        csRxlevSub,        CsRxlevSub,        uint32);
  PB_FIELD (7, "cs_rxqual_sub",       csRxqualSub,       CsRxqualSub,       uint32);
  PB_FIELD (8, "scell_band",          scellBand,         ScellBand,         uint32);
};

// One GSM neighbour; the level in dBm is rxlev - 110 (3GPP TS 45.008, 8.1.4).
class GsmNcellMeas final : public PBCodable {
  PB_MESSAGE(GsmNcellMeas)
  PB_FIELD(1, "mcc",   mcc,   Mcc,   uint32);
  PB_FIELD(2, "mnc",   mnc,   Mnc,   uint32);
  PB_FIELD(3, "lac",   lac,   Lac,   uint32);
  PB_FIELD(4, "ci",    ci,    Ci,    uint32);
  PB_FIELD(5, "bsic",  bsic,  Bsic,  uint32);
  PB_FIELD(6, "arfcn", arfcn, Arfcn, uint32);
  PB_FIELD(7, "rxlev", rxlev, Rxlev, uint32);
};

// One UMTS neighbour; RSCP in dBm is cpich_rscp - 116, Ec/No in dB is cpich_ecn0 / 2 - 24.5 (3GPP TS 25.133, 9.1).
class UmtsNcellMeas final : public PBCodable {
  PB_MESSAGE(UmtsNcellMeas)
  PB_FIELD(1, "cell_type",  cellType,  CellType,  uint32);
  PB_FIELD(2, "cpich_sc",   cpichSc,   CpichSc,   uint32);
  PB_FIELD(3, "dl_uarfcn",  dlUarfcn,  DlUarfcn,  uint32);
  PB_FIELD(4, "cpich_rscp", cpichRscp, CpichRscp, uint32);
  PB_FIELD(5, "cpich_ecn0", cpichEcn0, CpichEcn0, uint32);
};

// One LTE neighbour; RSRP in dBm is rsrp - 140, RSRQ in dB is rsrq / 2 - 19.5 (3GPP TS 36.133, 9.1).
class LteNcellMeas final : public PBCodable {
  PB_MESSAGE(LteNcellMeas)
  PB_FIELD(1, "physical_cell_id", physicalCellId, PhysicalCellId, uint32);
  PB_FIELD(2, "bandwidth",        bandwidth,      Bandwidth,      uint32);
  PB_FIELD(3, "rsrp",             rsrp,           Rsrp,           uint32);
  PB_FIELD(4, "earfcn",           earfcn,         Earfcn,         uint32);
  PB_FIELD(5, "rsrq",             rsrq,           Rsrq,           uint32);
};

// Measured GSM, UMTS and LTE neighbour cells of a GSM cell.
class KCellularGsmGrrEventMeasCr final : public PBCodable {
  PB_MESSAGE(KCellularGsmGrrEventMeasCr)
  PB_FIELD(1, "timestamp",       timestamp,     Timestamp,     uint64);
  PB_LIST (2, "gsm_ncell_meas",  gsmNcellMeas,  GsmNcellMeas, gsmNcellMeas, GsmNcellMeas, repeated<message<GsmNcellMeas>>);
  PB_LIST (3, "umts_ncell_meas", umtsNcellMeas, UmtsNcellMeas, umtsNcellMeas, UmtsNcellMeas, repeated<message<UmtsNcellMeas>>);
  PB_LIST (4, "lte_ncell_meas",  lteNcellMeas,  LteNcellMeas, lteNcellMeas, LteNcellMeas, repeated<message<LteNcellMeas>>);
};

// What the serving cell broadcasts about GPRS, 3GPP TS 44.018, 10.5.2.37b, and 44.060, 11.2.20 and 12.24.
class KCellularGsmGprsConfig final : public PBCodable {
  PB_MESSAGE(KCellularGsmGprsConfig)
  PB_FIELD( 1, "timestamp",             timestamp,          Timestamp,          uint64);
  PB_FIELD( 2, "gprs_sup",              gprsSup,            GprsSup,            boolean);
  PB_FIELD( 3, "rac",                   rac,                Rac,                uint32);
  PB_FIELD( 4, "sp_pg_cy",              spPgCy,             SpPgCy,             boolean);
  PB_FIELD( 5, "nco",                   nco,                Nco,                uint32);
  PB_FIELD( 6, "nom",                   nom,                Nom,                uint32);
  PB_FIELD( 7, "cr_hyst",               crHyst,             CrHyst,             uint32);
  PB_FIELD( 8, "acc_thr",               accThr,             AccThr,             uint32);
  PB_FIELD( 9, "ext_upl_tbf_supported", extUplTbfSupported, ExtUplTbfSupported, boolean);
  PB_FIELD(10, "priority_class",        priorityClass,      PriorityClass,      uint32);
  PB_FIELD(11, "cell_bar_access_2",     cellBarAccess2,     CellBarAccess2,     uint32);
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
