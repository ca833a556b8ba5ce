// SPDX-License-Identifier: Apache-2.0
//
// UMTS: RRC state and configuration, serving and neighbour cells, reselection, transmit power, measurements.
#pragma once

#include "messages/lte_messages.h"
#include "messages/quantities.h"
#include "messages/runtime/field_table.h"
#include "messages/viewer_notes.h"

namespace probeview {

// Tables read best in columns.
// clang-format off

class KCellularWcdmaRrcConnectionState final : public PBCodable {
  PB_MESSAGE(KCellularWcdmaRrcConnectionState,
             "State of the RRC connection, 3GPP TS 25.331, 7, with establishment and release causes.",
             "\"UMTS RRC State\"")

 public:
  PB_ENUMERATION(State,
    KWCDMA_RRC_CONN_STATE_INVALID = 0,
    KWCDMA_RRC_CONN_STATE_INACTIVE = 1,
    KWCDMA_RRC_CONN_STATE_IDLE = 2,
    KWCDMA_RRC_CONN_STATE_ESTABLISH = 3,
    KWCDMA_RRC_CONN_STATE_URA_PCH = 4,
    KWCDMA_RRC_CONN_STATE_CELL_PCH = 5,
    KWCDMA_RRC_CONN_STATE_CELL_FACH = 6,
    KWCDMA_RRC_CONN_STATE_CELL_DCH = 7,
    KWCDMA_RRC_CONN_STATE_RELEASE = 8,
    KWCDMA_RRC_CONN_STATE_RADIO_LINK_FAILURE = 9,
    KWCDMA_RRC_CONN_STATE_SCRI_SENT = 10);

  PB_ENUMERATION(EstablishmentCause,
    KRRC_EST_ORIG_CONV_CALL = 0,
    KRRC_EST_ORIG_STREAM_CALL = 1,
    KRRC_EST_ORIG_INTERACT_CALL = 2,
    KRRC_EST_ORIG_BACKGND_CALL = 3,
    KRRC_EST_ORIG_SUBSCRIBED_TRF_CALL = 4,
    KRRC_EST_TERM_CONV_CALL = 5,
    KRRC_EST_TERM_STREAM_CALL = 6,
    KRRC_EST_TERM_INTERACT_CALL = 7,
    KRRC_EST_TERM_BACKGND_CALL = 8,
    KRRC_EST_EMERGENCY_CALL = 9,
    KRRC_EST_INTER_RAT_CELL_RESELECT = 10,
    KRRC_EST_INTER_RAT_CELL_CHANGE_ORDER = 11,
    KRRC_EST_REGISTRATION = 12,
    KRRC_EST_DETACH = 13,
    KRRC_EST_HI_PRI_SIGNALLING = 14,
    KRRC_EST_LOW_PRI_SIGNALLING = 15,
    KRRC_EST_CALL_RE_ESTABLISH = 16,
    KRRC_EST_TERM_HI_SIGNALLING = 17,
    KRRC_EST_TERM_LOW_SIGNALLING = 18,
    KRRC_EST_TERM_UNKNOWN = 19,
    KRRC_EST_MBMS_RECEPTION = 20,
    KRRC_EST_MBMS_PTP_RB_REQUEST = 21,
    KRRC_EST_DELAY_TOLERANT_ACCESS = 22);

  PB_ENUMERATION(ReleaseCause,
    KRRC_REL_OTHER_CAUSE = 0,
    KRRC_REL_NO_CAUSE = 1,
    KRRC_REL_NO_CELL = 2,
    KRRC_REL_INACTIVE = 3,
    KRRC_REL_NORMAL_EVENT = 4,
    KRRC_REL_CELL_BARRED = 5,
    KRRC_REL_CELL_CHANGED = 6,
    KRRC_REL_ACCESS_NOT_ALLOWED = 7,
    KRRC_REL_RRC_CONN_ESTABLISHMENT_FAILURE = 8,
    KRRC_REL_RELEASE_OOSA = 9,
    KRRC_REL_SIGN_CONN_REL = 10,
    KRRC_REL_CONN_REJECT_REDIRECTION = 11,
    KRRC_REL_NAS_TRIGGERED_ABORT = 12,
    KRRC_REL_CONN_REL_LOWER_LAYER_FAILURE_DL = 13,
    KRRC_REL_CONN_REL_LOWER_LAYER_FAILURE_UL = 14,
    KRRC_REL_HO_FROM_UTRAN_REVERT_BACK_SYNC_FAIL = 15,
    KRRC_REL_CONN_REJECT_CONGESTION = 16,
    KRRC_REL_CONN_REJECT_UNSPECIFIED = 17);

  PB_FIELD(1, "timestamp",           timestamp,          Timestamp,          uint64,                          timestamp, "Time of the values", viewer::localTime);
  PB_FIELD(2, "state",               state,              State,              enumeration<State>,              none,      "RRC state (3GPP TS 25.331, 7)");
  PB_FIELD(3, "establishment_cause", establishmentCause, EstablishmentCause, enumeration<EstablishmentCause>,
              none, "Why the connection was established (3GPP TS 25.331, 10.3.3.11)");
  PB_FIELD(4, "release_cause",       releaseCause,       ReleaseCause,       enumeration<ReleaseCause>,       none,      "Why the connection was released");
};

class KCellularWcdmaRrcConfiguration final : public PBCodable {
  PB_MESSAGE(KCellularWcdmaRrcConfiguration,
             "RRC configuration: DRX cycle, MIMO, dual cell.",
             "\"UMTS RRC Configuration\"")
  PB_FIELD(1, "timestamp",           timestamp,        Timestamp,        uint64,  timestamp,    "Time of the values", viewer::localTime);
  PB_FIELD(2, "drx_cycle_length_ms", drxCycleLengthMs, DrxCycleLengthMs, uint32,  utraDrxCycle, "DRX cycle");
  PB_FIELD(3, "is_mimo_configured",  isMimoConfigured, IsMimoConfigured, boolean, none,         "Whether MIMO is configured");
  PB_FIELD(4, "is_dc_configured",    isDcConfigured,   IsDcConfigured,   boolean, none,         "Whether dual cell is configured");
};

class KCellularWcdmaCellInfo final : public PBCodable {
  PB_MESSAGE(KCellularWcdmaCellInfo,
             "The serving cell: PLMN, LAC, cell identity, band, UARFCN (3GPP TS 25.101, 5.4), PSC and HSPA support.",
             "\"UMTS Serving Cell Info\"")

 public:
  PB_ENUMERATION(WcdmaBand,
    SYS_BAND_BC0 = 0,
    SYS_BAND_BC1 = 1,
    SYS_BAND_BC3 = 3,
    SYS_BAND_BC4 = 4,
    SYS_BAND_BC5 = 5,
    SYS_BAND_BC6 = 6,
    SYS_BAND_BC7 = 7,
    SYS_BAND_BC8 = 8,
    SYS_BAND_BC9 = 9,
    SYS_BAND_BC10 = 10,
    SYS_BAND_BC11 = 11,
    SYS_BAND_BC12 = 12,
    SYS_BAND_BC13 = 13,
    SYS_BAND_BC14 = 14,
    SYS_BAND_BC15 = 15,
    SYS_BAND_BC16 = 16,
    SYS_BAND_BC17 = 17,
    SYS_BAND_BC18 = 18,
    SYS_BAND_BC19 = 19,
    SYS_BAND_GSM_450 = 40,
    SYS_BAND_GSM_480 = 41,
    SYS_BAND_GSM_750 = 42,
    SYS_BAND_GSM_850 = 43,
    SYS_BAND_GSM_EGSM_900 = 44,
    SYS_BAND_GSM_PGSM_900 = 45,
    SYS_BAND_GSM_RGSM_900 = 46,
    SYS_BAND_GSM_DCS_1800 = 47,
    SYS_BAND_GSM_PCS_1900 = 48,
    SYS_BAND_WCDMA_I_IMT_2000 = 80,
    SYS_BAND_WCDMA_II_PCS_1900 = 81,
    SYS_BAND_WCDMA_III_1700 = 82,
    SYS_BAND_WCDMA_IV_1700 = 83,
    SYS_BAND_WCDMA_V_850 = 84,
    SYS_BAND_WCDMA_VI_800 = 85,
    SYS_BAND_WCDMA_VII_2600 = 86,
    SYS_BAND_WCDMA_VIII_900 = 87,
    SYS_BAND_WCDMA_IX_1700 = 88,
    SYS_BAND_WCDMA_XI_1500 = 90,
    SYS_BAND_WCDMA_XIX_850 = 91,
    SYS_BAND_LTE_EUTRAN_BAND1 = 120,
    SYS_BAND_LTE_EUTRAN_BAND2 = 121,
    SYS_BAND_LTE_EUTRAN_BAND3 = 122,
    SYS_BAND_LTE_EUTRAN_BAND4 = 123,
    SYS_BAND_LTE_EUTRAN_BAND5 = 124,
    SYS_BAND_LTE_EUTRAN_BAND6 = 125,
    SYS_BAND_LTE_EUTRAN_BAND7 = 126,
    SYS_BAND_LTE_EUTRAN_BAND8 = 127,
    SYS_BAND_LTE_EUTRAN_BAND9 = 128,
    SYS_BAND_LTE_EUTRAN_BAND10 = 129,
    SYS_BAND_LTE_EUTRAN_BAND11 = 130,
    SYS_BAND_LTE_EUTRAN_BAND12 = 131,
    SYS_BAND_LTE_EUTRAN_BAND13 = 132,
    SYS_BAND_LTE_EUTRAN_BAND14 = 133,
    SYS_BAND_LTE_EUTRAN_BAND17 = 136,
    SYS_BAND_LTE_EUTRAN_BAND18 = 137,
    SYS_BAND_LTE_EUTRAN_BAND19 = 138,
    SYS_BAND_LTE_EUTRAN_BAND20 = 139,
    SYS_BAND_LTE_EUTRAN_BAND21 = 140,
    SYS_BAND_LTE_EUTRAN_BAND24 = 143,
    SYS_BAND_LTE_EUTRAN_BAND25 = 144,
    SYS_BAND_LTE_EUTRAN_BAND26 = 145,
    SYS_BAND_LTE_EUTRAN_BAND33 = 152,
    SYS_BAND_LTE_EUTRAN_BAND34 = 153,
    SYS_BAND_LTE_EUTRAN_BAND35 = 154,
    SYS_BAND_LTE_EUTRAN_BAND36 = 155,
    SYS_BAND_LTE_EUTRAN_BAND37 = 156,
    SYS_BAND_LTE_EUTRAN_BAND38 = 157,
    SYS_BAND_LTE_EUTRAN_BAND39 = 158,
    SYS_BAND_LTE_EUTRAN_BAND40 = 159,
    SYS_BAND_LTE_EUTRAN_BAND41 = 160,
    SYS_BAND_LTE_EUTRAN_BAND42 = 161,
    SYS_BAND_LTE_EUTRAN_BAND43 = 162,
    SYS_BAND_UMTS_BAND1 = 163,
    SYS_BAND_UMTS_BAND2 = 164,
    SYS_BAND_UMTS_BAND3 = 165,
    SYS_BAND_UMTS_BAND4 = 166,
    SYS_BAND_UMTS_BAND5 = 167,
    SYS_BAND_UMTS_BAND6 = 168);

  PB_ENUMERATION(Hspa,
    SYS_HS_IND_HSDPA_HSUPA_UNSUPP_CELL = 0,
    SYS_HS_IND_HSDPA_SUPP_CELL = 1,
    SYS_HS_IND_HSUPA_SUPP_CELL = 2,
    SYS_HS_IND_HSDPA_HSUPA_SUPP_CELL = 3);

  PB_FIELD( 1, "timestamp",      timestamp,    Timestamp,    uint64,                 timestamp,         "Time of the values", viewer::localTime);
  PB_FIELD( 4, "mcc",            mcc,          Mcc,          uint32,                 countryCode,       "Mobile country code");
  PB_FIELD( 5, "mnc",            mnc,          Mnc,          uint32,                 networkCode,       "Mobile network code");
  PB_FIELD( 6, "lac",            lac,          Lac,          uint32,                 locationAreaCode,  "Location area code");
  PB_FIELD( 7, "cell_id",        cellId,       CellId,       uint32,                 utraCellIdentity,  "UTRAN cell identity");
  PB_FIELD( 8, "wcdma_band",     wcdmaBand,    WcdmaBand,    enumeration<WcdmaBand>, none,              "Band");
  PB_FIELD( 9, "dl_uarfcn",      dlUarfcn,     DlUarfcn,     uint32,                 uarfcn,            "Downlink UARFCN");
  PB_FIELD(10, "psc",            psc,          Psc,          uint32,                 utraPsc,           "Primary scrambling code");
  PB_FIELD(13, "num_mnc_digits", numMncDigits, NumMncDigits, uint32,                 networkCodeDigits, "Digits of the mobile network code");
  PB_FIELD(14, "hspa",           hspa,         Hspa,         enumeration<Hspa>,      none,              "HSPA support of the cell");
};

class KCellularWcdmaScellMeasurement final : public PBCodable {
  PB_MESSAGE(KCellularWcdmaScellMeasurement,
             "Measurement of the serving cell, per antenna.",
             "\"UMTS Serving Cell Meas\" (as many sections and rows, but all read \"Come back later\")")
  PB_FIELD(1, "timestamp",      timestamp,     Timestamp,     uint64,  timestamp, "Time of the values", viewer::localTime);
  PB_FIELD(2, "connected_mode", connectedMode, ConnectedMode, boolean, none,      "Whether the measurement was made in connected mode");
  PB_LIST (3, "rx_info",        rxInfos,       RxInfos, rxInfo, RxInfo, repeated<message<RxInfo>>,
              "One entry per receive antenna", ViewerNote{"on the page each entry has the timestamp and connected_mode of its message, but every row reads \"Come back later\""});
};

class KCellularWcdmaTxPower final : public PBCodable {
  PB_MESSAGE(KCellularWcdmaTxPower, "Uplink transmit power.", "\"UMTS Tx Power\"")
  PB_FIELD(1, "timestamp",     timestamp,    Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_LIST (2, "tx_power_info", txPowerInfos, TxPowerInfos, txPowerInfo, TxPowerInfo, repeated<message<TxPowerInfo>>, "One entry per subframe", viewer::pageEntriesGetTimestamp);
};

class EutraFreqInfo final : public PBCodable {
  PB_MESSAGE(EutraFreqInfo, "Reselection priority of an LTE frequency.")
  PB_FIELD(1, "earfcn", earfcn, Earfcn, uint32, earfcn,              "EARFCN");
  PB_FIELD(2, "prio",   prio,   Prio,   uint32, reselectionPriority, "Reselection priority (0: lowest)");
};

class UtraFreqInfo final : public PBCodable {
  PB_MESSAGE(UtraFreqInfo, "Reselection priority of a UMTS frequency.")
  PB_FIELD(1, "uarfcn", uarfcn, Uarfcn, uint32, uarfcn,              "UARFCN");
  PB_FIELD(2, "prio",   prio,   Prio,   uint32, reselectionPriority, "Reselection priority (0: lowest)");
};

class GsmFreqInfo final : public PBCodable {
  PB_MESSAGE(GsmFreqInfo, "Reselection priority of a GSM frequency.")
  PB_FIELD(1, "arfcn", arfcn, Arfcn, uint32, arfcn,               "ARFCN");
  PB_FIELD(2, "prio",  prio,  Prio,  uint32, reselectionPriority, "Reselection priority (0: lowest)");
};

class KCellularWcdmaSelReselCellInfo final : public PBCodable {
  PB_MESSAGE(KCellularWcdmaSelReselCellInfo,
             "What the serving cell broadcasts for cell selection and reselection, 3GPP TS 25.304, 5.2, with the "
             "priorities of LTE, UMTS and GSM frequencies.",
             "\"UMTS Sel Resel Parameters\" (fourteen of its fields, blank when absent), \"UMTS EUTRA Neighbor "
             "Info\", \"UMTS UTRA Neighbor Info\" and \"UMTS GSM Neighbor Info\"")

 public:
  PB_ENUMERATION(DuplexMode,
    FDD = 0,
    TDD = 1);

  PB_FIELD ( 1, "timestamp",                  timestamp,              Timestamp,              uint64,                  timestamp,           "Time of the values", viewer::localTime);
  PB_FIELD ( 2, "hsdpa_capable",              hsdpaCapable,           HsdpaCapable,           uint32,                  none,                "Whether the cell supports HSDPA, 0 or 1");
  PB_FIELD ( 3, "edch_capable",               edchCapable,            EdchCapable,            uint32,                  none,                "Whether the cell supports E-DCH, 0 or 1");
  PB_FIELD ( 4, "duplex_mode",                duplexMode,             DuplexMode,             enumeration<DuplexMode>, none,                "Duplex mode");
  PB_VALUES( 5, "multi_band_info",            multiBandInfos,         MultiBandInfos, multiBandInfo, MultiBandInfo, repeated<uint32>,
                utraBand, "Numbers of the further bands to which the cell belongs", viewer::listTextLogged);
  PB_FIELD ( 6, "ims_emergency_support",      imsEmergencySupport,    ImsEmergencySupport,    uint32,
                none, "Whether emergency calls over IMS are supported, 0 or 1");
  PB_FIELD ( 7, "cell_barred",                cellBarred,             CellBarred,             uint32,                  none,                "Whether the cell is barred, 0 or 1");
  PB_FIELD ( 8, "fach_meas_occ_info_present", fachMeasOccInfoPresent, FachMeasOccInfoPresent, uint32,
                none, "Whether FACH measurement occasions are configured, 0 or 1");
  PB_FIELD ( 9, "s_rxlev",                    sRxlev,                 SRxlev,                 sint32,                  utraSrxlev,          "Srxlev");
  PB_FIELD (10, "s_qual",                     sQual,                  SQual,                  sint32,                  utraSqual,           "Squal");
  PB_FIELD (11, "s_intrasearch",              sIntrasearch,           SIntrasearch,           sint32,                  utraSearchThreshold, "Sintrasearch");
  PB_FIELD (12, "s_intersearch",              sIntersearch,           SIntersearch,           sint32,                  utraSearchThreshold, "Sintersearch");
  PB_FIELD (13, "s_search_rat",               sSearchRat,             SSearchRat,             sint32,                  utraSearchThreshold, "SsearchRAT");
  PB_FIELD (21, "s_cell_prio",                sCellPrio,              SCellPrio,              uint32,
                reselectionPriority, "Reselection priority of the serving cell (0: lowest)");
  PB_LIST  (22, "eutra_prio_info",            eutraPrioInfos,         EutraPrioInfos, eutraPrioInfo, EutraPrioInfo, repeated<message<EutraFreqInfo>>,
                "One entry per LTE frequency", viewer::pageEntriesGetTimestamp);
  PB_LIST  (23, "utra_prio_info",             utraPrioInfos,          UtraPrioInfos, utraPrioInfo, UtraPrioInfo, repeated<message<UtraFreqInfo>>,
                "One entry per UMTS frequency", viewer::pageEntriesGetTimestamp);
  PB_LIST  (24, "gsm_prio_info",              gsmPrioInfos,           GsmPrioInfos, gsmPrioInfo, GsmPrioInfo, repeated<message<GsmFreqInfo>>,
                "One entry per GSM frequency", viewer::pageEntriesGetTimestamp);
};

class UtraCellMeasResult final : public PBCodable {
  PB_MESSAGE(UtraCellMeasResult, "One UMTS neighbour, RSCP and Ec/No as reported (3GPP TS 25.133, 9.1).")
  PB_FIELD(1, "uarfcn", uarfcn, Uarfcn, uint32, uarfcn,   "UARFCN");
  PB_FIELD(2, "band",   band,   Band,   uint32, utraBand, "Number of the operating band");
  PB_FIELD(3, "psc",    psc,    Psc,    uint32, utraPsc,  "Primary scrambling code");
  PB_FIELD(4, "ecno",   ecno,   Ecno,   uint32, utraEcNo, "Reported Ec/No", viewer::convertedOnPage);
  PB_FIELD(5, "rscp",   rscp,   Rscp,   sint32, utraRscp, "Reported RSCP", viewer::convertedOnPage);
};

class GsmCellMeasResult final : public PBCodable {
  PB_MESSAGE(GsmCellMeasResult, "One GSM neighbour, the level as reported (3GPP TS 45.008, 8.1.4).")
  PB_FIELD(1, "arfcn", arfcn, Arfcn, uint32, arfcn,    "ARFCN");
  PB_FIELD(2, "bsic",  bsic,  Bsic,  uint32, gsmBsic,  "Base station identity code");
  PB_FIELD(3, "rxlev", rxlev, Rxlev, uint32, gsmRxLev, "Received level", viewer::convertedOnPage);
};

class LteCellMeasResult final : public PBCodable {
  PB_MESSAGE(LteCellMeasResult, "One LTE neighbour, RSRP and RSRQ as reported (3GPP TS 36.133, 9.1).")
  PB_FIELD(1, "earfcn",      earfcn,    Earfcn,    uint32, earfcn,    "EARFCN");
  PB_FIELD(2, "phy_cell_id", phyCellId, PhyCellId, uint32, eutraPci,  "Physical cell identity");
  PB_FIELD(3, "eutra_band",  eutraBand, EutraBand, uint32, eutraBand, "Number of the E-UTRA operating band");
  PB_FIELD(4, "rsrp",        rsrp,      Rsrp,      sint32, lteRsrp,   "Reported RSRP", viewer::convertedOnPage);
  PB_FIELD(5, "rsrq",        rsrq,      Rsrq,      sint32, lteRsrq,   "Reported RSRQ", viewer::convertedOnPage);
};

class KCellularWcdmaNbrCellMeas final : public PBCodable {
  PB_MESSAGE(KCellularWcdmaNbrCellMeas,
             "Measured UMTS, GSM and LTE neighbour cells of a UMTS cell.",
             "\"UMTS UMTS Neighbor Cell Meas\", \"UMTS GSM Neighbor Cell Meas\" and \"UMTS LTE Neighbor Cell Meas\"")
  PB_FIELD(1, "timestamp",        timestamp,       Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_LIST (2, "meas_utra_result", measUtraResults, MeasUtraResults, measUtraResult, MeasUtraResult, repeated<message<UtraCellMeasResult>>,
              "One entry per UMTS neighbour", viewer::pageEntriesGetTimestamp);
  PB_LIST (3, "meas_gsm_result",  measGsmResults,  MeasGsmResults, measGsmResult, MeasGsmResult, repeated<message<GsmCellMeasResult>>,
              "One entry per GSM neighbour", viewer::pageEntriesGetTimestamp);
  PB_LIST (4, "meas_lte_result",  measLteResults,  MeasLteResults, measLteResult, MeasLteResult, repeated<message<LteCellMeasResult>>,
              "One entry per LTE neighbour", viewer::pageEntriesGetTimestamp);
};

// All of them, in the order of the registry.
#define UMTS_MESSAGES(EACH) \
  EACH(KCellularWcdmaRrcConnectionState) \
  EACH(KCellularWcdmaRrcConfiguration) \
  EACH(KCellularWcdmaCellInfo) \
  EACH(KCellularWcdmaScellMeasurement) \
  EACH(KCellularWcdmaTxPower) \
  EACH(KCellularWcdmaSelReselCellInfo) \
  EACH(EutraFreqInfo) \
  EACH(UtraFreqInfo) \
  EACH(GsmFreqInfo) \
  EACH(KCellularWcdmaNbrCellMeas) \
  EACH(UtraCellMeasResult) \
  EACH(GsmCellMeasResult) \
  EACH(LteCellMeasResult)

// clang-format on

}  // namespace probeview
