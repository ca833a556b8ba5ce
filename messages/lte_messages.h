// SPDX-License-Identifier: Apache-2.0
//
// LTE: RRC state, DRX, serving and neighbour cells, reselection, carriers, transmit power, measurements.
#pragma once

#include "messages/quantities.h"
#include "messages/runtime/field_table.h"
#include "messages/viewer_notes.h"

namespace probeview {

// Tables read best in columns.
// clang-format off

class KCellularLteRrcState final : public PBCodable {
  PB_MESSAGE(KCellularLteRrcState,
             "State of the RRC connection, 3GPP TS 36.331, 4.2.1, with the cause of the last change and the time "
             "spent in the state before.",
             "\"LTE RRC State\"")

 public:
  PB_ENUMERATION(State,
    KLTE_RRC_STATE_NULL = 0,
    KLTE_RRC_STATE_IDLE = 1,
    KLTE_RRC_STATE_ATMPT_CONNECTION = 2,
    KLTE_RRC_STATE_CONNECTED = 3,
    KLTE_RRC_STATE_ENDING = 4,
    KLTE_RRC_STATE_ATMPT_OUTBND_MOBILITY = 5,
    KLTE_RRC_STATE_ATMPT_INBND_MOBILITY = 6);

  PB_ENUMERATION(Cause,
    KLTE_RRC_CAUSE_EST_EMERGENCY = 0,
    KLTE_RRC_CAUSE_EST_HIGH_PRIO_ACC = 1,
    KLTE_RRC_CAUSE_EST_MT_ACC = 2,
    KLTE_RRC_CAUSE_EST_MO_SIGNAL = 3,
    KLTE_RRC_CAUSE_EST_MO_DATA = 4,
    KLTE_RRC_CAUSE_EST_DELAY_TOL_ACC = 5,
    KLTE_RRC_CAUSE_REEST_RECFG_FAIL = 6,
    KLTE_RRC_CAUSE_REEST_HO_FAIL = 7,
    KLTE_RRC_CAUSE_REEST_OTHER_FAIL = 8,
    KLTE_RRC_CAUSE_REL_OTHER_RECFG_FAIL = 9,
    KLTE_RRC_CAUSE_REL_CONN_FAIL_IRAT_RESEL = 10,
    KLTE_RRC_CAUSE_REL_CONN_FAIL_T311_EXP = 11,
    KLTE_RRC_CAUSE_REL_CONN_FAIL_CELL_NOT_SUIT = 12,
    KLTE_RRC_CAUSE_REL_CONN_FAIL_REEST_REJ = 13,
    KLTE_RRC_CAUSE_REL_LOAD_BAL_TAU_REQD = 14,
    KLTE_RRC_CAUSE_REL_OTHER = 15,
    KLTE_RRC_CAUSE_REL_CSFB_HIGH_PRIO = 16,
    KLTE_RRC_CAUSE_REL_T310_EXP = 17,
    KLTE_RRC_CAUSE_REL_RND_ACC = 18,
    KLTE_RRC_CAUSE_REL_MAX_RLC_RETRANS = 19,
    KLTE_RRC_CAUSE_REL_SUCC_MOB_FROM_EUTRAN = 20,
    KLTE_RRC_CAUSE_EST_SUCC_MOB_TO_EUTRAN = 21,
    KLTE_RRC_CAUSE_EST_FAIL_NO_RESP_FROM_CELL = 22,
    KLTE_RRC_CAUSE_EST_FAIL_REJ = 23,
    KLTE_RRC_CAUSE_EST_FAIL_CELL_RESEL = 24,
    KLTE_RRC_CAUSE_EST_FAIL_ABORTED = 25,
    KLTE_RRC_CAUSE_EST_FAIL_CELL_BARRED = 26,
    KLTE_RRC_CAUSE_REEST_OTHER_FAIL_T310_EXP = 27,
    KLTE_RRC_CAUSE_REEST_OTHER_FAIL_RND_ACC = 28,
    KLTE_RRC_CAUSE_REEST_OTHER_FAIL_MAX_RLC_RETX = 29,
    KLTE_RRC_CAUSE_REEST_OTHER_FAIL_INTEG_CHECK = 30,
    KLTE_RRC_CAUSE_NO_SERVICE = 254,
    KLTE_RRC_CAUSE_NA = 255);

  PB_FIELD(1, "timestamp",         timestamp,      Timestamp,      uint64,             timestamp,    "Time of the values", viewer::localTime);
  PB_FIELD(2, "state",             state,          State,          enumeration<State>, none,         "RRC state (3GPP TS 36.331, 4.2.1)");
  PB_FIELD(3, "prev_state",        prevState,      PrevState,      enumeration<State>, none,         "RRC state before this one");
  PB_FIELD(4, "prev_state_dur_ms", prevStateDurMs, PrevStateDurMs, uint32,             milliseconds, "Time spent in the state before");
  PB_FIELD(5, "cause",             cause,          Cause,          enumeration<Cause>, none,         "Why the state changed");
};

class KCellularLteCdrxConfig final : public PBCodable {
  PB_MESSAGE(KCellularLteCdrxConfig,
             "Connected-mode DRX as configured by the network, 3GPP TS 36.321, 5.7.",
             "\"LTE C-DRX\"")
  PB_FIELD( 1, "timestamp",           timestamp,        Timestamp,        uint64,                                   timestamp,            "Time of the values", viewer::localTime);
  PB_FIELD( 2, "cell_status",         cellStatus,       CellStatus,       uint32,                                   none,                 "Status of the cell, a number of the modem");
  PB_FIELD( 3, "on_duration_ms",      onDurationMs,     OnDurationMs,     uint32,                                   lteOnDuration,        "onDurationTimer");
  PB_FIELD( 4, "drx_inactivity_ms",   drxInactivityMs,  DrxInactivityMs,  uint32,                                   lteDrxInactivity,     "drx-InactivityTimer");
  PB_FIELD( 5, "drx_retx_timer_ms",   drxRetxTimerMs,   DrxRetxTimerMs,   uint32,                                   lteDrxRetransmission, "drx-RetransmissionTimer");
  PB_FIELD( 7, "long_drx_cycle_ms",   longDrxCycleMs,   LongDrxCycleMs,   uint32,                                   lteLongDrxCycle,      "Long DRX cycle");
  PB_FIELD(10, "short_drx_cycle_ms",  shortDrxCycleMs,  ShortDrxCycleMs,  uint32,                                   lteShortDrxCycle,     "Short DRX cycle");
  PB_FIELD(11, "drx_short_cycle_num", drxShortCycleNum, DrxShortCycleNum, uint32,                                   lteShortDrxCycles,    "drxShortCycleTimer before the long cycle");
  PB_FIELD(12, "rrc_state",           rrcState,         RrcState,         enumeration<KCellularLteRrcState::State>, none,                 "RRC state (3GPP TS 36.331, 4.2.1)");
  PB_FIELD(13, "cdrx_config_status",  cdrxConfigStatus, CdrxConfigStatus, uint32,                                   none,                 "Whether DRX is configured, 0 or 1");
  PB_FIELD(14, "transmission_mode",   transmissionMode, TransmissionMode, uint32,
               none, "Downlink transmission mode, 1 to 10 (3GPP TS 36.213, 7.1)");
};

class KCellularLteScellInfo final : public PBCodable {
  PB_MESSAGE(KCellularLteScellInfo,
             "The serving cell: PCI, EARFCNs, bandwidths, cell identity, band, TAC and PLMN, TDD configuration "
             "(3GPP TS 36.211, 4.2).",
             "\"LTE Serving Cell Info\"")
  PB_FIELD( 1, "timestamp",          timestamp,        Timestamp,        uint64, timestamp,                   "Time of the values", viewer::localTime);
  PB_FIELD( 2, "phy_cell_id",        phyCellId,        PhyCellId,        uint32, eutraPci,                    "Physical cell identity");
  PB_FIELD( 3, "dl_freq",            dlFreq,           DlFreq,           uint32, earfcn,                      "Downlink EARFCN");
  PB_FIELD( 4, "ul_freq",            ulFreq,           UlFreq,           uint32, earfcn,                      "Uplink EARFCN");
  PB_FIELD( 5, "dl_bw",              dlBw,             DlBw,             uint32, lteServingDownlinkBandwidth, "Downlink bandwidth", viewer::converted);
  PB_FIELD( 6, "ul_bw",              ulBw,             UlBw,             uint32, lteServingUplinkBandwidth,   "Uplink bandwidth");
  PB_FIELD( 7, "cell_id",            cellId,           CellId,           uint32, eutraCellIdentity,           "E-UTRAN cell identity");
  PB_FIELD( 8, "freq_band_ind",      freqBandInd,      FreqBandInd,      uint32, eutraBand,                   "Number of the E-UTRA operating band");
  PB_FIELD( 9, "tracking_area_code", trackingAreaCode, TrackingAreaCode, uint32, trackingAreaCode,            "Tracking area code");
  PB_FIELD(10, "num_mnc_digits",     numMncDigits,     NumMncDigits,     uint32, networkCodeDigits,           "Digits of the mobile network code");
  PB_FIELD(11, "sel_plmn_mcc",       selPlmnMcc,       SelPlmnMcc,       uint32, countryCode,                 "Mobile country code of the selected PLMN");
  PB_FIELD(12, "sel_plmn_mnc",       selPlmnMnc,       SelPlmnMnc,       uint32, networkCode,                 "Mobile network code of the selected PLMN");
  PB_FIELD(14, "tdd_sf_assignment",  tddSfAssignment,  TddSfAssignment,  uint32, none,                        "TDD uplink-downlink configuration, 0 to 6 (3GPP TS 36.211, 4.2)");
  PB_FIELD(15, "tdd_ssf_patterns",   tddSsfPatterns,   TddSsfPatterns,   uint32, none,                        "TDD special subframe configuration, 0 to 9 (3GPP TS 36.211, 4.2)");
};

class NbrEutra final : public PBCodable {
  PB_MESSAGE(NbrEutra, "A neighbour frequency for reselection, 3GPP TS 36.331, SystemInformationBlockType5.")

 public:
  PB_ENUMERATION(FrameType,
    FDD = 0,
    TDD = 1,
    INVALID = 2);

  PB_FIELD( 1, "earfcn",        earfcn,      Earfcn,      uint32,                 earfcn,              "EARFCN");
  PB_FIELD( 2, "Q_rxlev_min",   qRxlevMin,   QRxlevMin,   sint32,                 lteQRxLevMin,        "q-RxLevMin");
  PB_FIELD( 3, "Q_qual_min",    qQualMin,    QQualMin,    sint32,                 lteQQualMin,         "q-QualMin");
  PB_FIELD( 4, "Q_offset",      qOffset,     QOffset,     sint32,                 lteQOffset,          "q-OffsetFreq");
  PB_FIELD( 5, "Pmax",          pmax,        Pmax,        sint32,                 lteMaximumPower,     "p-Max");
  PB_FIELD( 6, "dl_bw",         dlBw,        DlBw,        uint32,                 lteBandwidth,        "Downlink bandwidth", viewer::convertedOnPage);
  PB_FIELD( 7, "Thres_X_highP", thresXHighP, ThresXHighP, uint32,                 lteLevelThreshold,   "threshX-High");
  PB_FIELD( 8, "Thres_X_lowP",  thresXLowP,  ThresXLowP,  uint32,                 lteLevelThreshold,   "threshX-Low");
  PB_FIELD( 9, "Thres_X_highQ", thresXHighQ, ThresXHighQ, uint32,                 lteQualityThreshold, "threshX-HighQ");
  PB_FIELD(10, "Thres_X_lowQ",  thresXLowQ,  ThresXLowQ,  uint32,                 lteQualityThreshold, "threshX-LowQ");
  PB_FIELD(11, "priority",      priority,    Priority,    uint32,                 reselectionPriority, "Reselection priority (0: lowest)");
  PB_FIELD(12, "frame_type",    frameType,   FrameType,   enumeration<FrameType>, none,                "Duplex mode");
  PB_FIELD(13, "band",          band,        Band,        uint32,                 eutraBand,           "Number of the operating band");
};

class KCellularLteSelReselCellInfo final : public PBCodable {
  PB_MESSAGE(KCellularLteSelReselCellInfo,
             "What the serving cell broadcasts for cell selection and reselection, 3GPP TS 36.304, 5.2 and TS "
             "36.331, 6.3.1: access barring, thresholds, priorities, and the E-UTRA neighbour frequencies.",
             "\"LTE Sel Resel Parameters\" (twenty of its fields, blank when absent) and \"LTE EUTRA Neighbor Info\"")
  PB_FIELD ( 1, "timestamp",                               timestamp,                         Timestamp,                         uint64,
                timestamp, "Time of the values", viewer::localTime);
  PB_VALUES( 2, "multi_band_info",                         multiBandInfos,                    MultiBandInfos, multiBandInfo, MultiBandInfo, repeated<uint32>,
                eutraBand, "Numbers of the further bands to which the cell belongs", viewer::listTextLogged);
  PB_FIELD ( 3, "ims_emergency_support",                   imsEmergencySupport,               ImsEmergencySupport,               uint32,
                none, "Whether emergency calls over IMS are supported, 0 or 1");
  PB_FIELD ( 4, "ac_barring_for_emergency",                acBarringForEmergency,             AcBarringForEmergency,             uint32,
                none, "Whether emergency calls are barred, 0 or 1 (3GPP TS 36.331, 6.3.1)");
  PB_FIELD ( 5, "mo_signalling_ac_barring_factor",         moSignallingAcBarringFactor,       MoSignallingAcBarringFactor,       uint32,
                lteBarringFactor, "ac-BarringFactor for signalling");
  PB_FIELD ( 6, "mo_signalling_ac_barring_time",           moSignallingAcBarringTime,         MoSignallingAcBarringTime,         uint32,
                lteBarringTime, "ac-BarringTime for signalling");
  PB_FIELD ( 7, "mo_signalling_ac_barring_for_special_ac", moSignallingAcBarringForSpecialAc, MoSignallingAcBarringForSpecialAc, uint32,
                none, "Barring of access classes 11 to 15 for signalling, 5 bits");
  PB_FIELD ( 8, "mo_data_ac_barring_factor",               moDataAcBarringFactor,             MoDataAcBarringFactor,             uint32,
                lteBarringFactor, "ac-BarringFactor for data");
  PB_FIELD ( 9, "mo_data_ac_barring_time",                 moDataAcBarringTime,               MoDataAcBarringTime,               uint32,
                lteBarringTime, "ac-BarringTime for data");
  PB_FIELD (10, "mo_data_ac_barring_for_special_ac",       moDataAcBarringForSpecialAc,       MoDataAcBarringForSpecialAc,       uint32,
                none, "Barring of access classes 11 to 15 for data, 5 bits");
  PB_FIELD (11, "QRxLevMin",                               qRxLevMin,                         QRxLevMin,                         sint32,
                lteQRxLevMin, "q-RxLevMin");
  PB_FIELD (12, "QQualMin",                                qQualMin,                          QQualMin,                          sint32,
                lteQQualMin, "q-QualMin");
  PB_FIELD (13, "Q_hyst",                                  qHyst,                             QHyst,                             uint32,
                lteQHyst, "q-Hyst");
  PB_FIELD (14, "S_non_intra_search_P",                    sNonIntraSearchP,                  SNonIntraSearchP,                  uint32,
                lteLevelThreshold, "s-NonIntraSearchP");
  PB_FIELD (15, "S_non_intra_search_Q",                    sNonIntraSearchQ,                  SNonIntraSearchQ,                  uint32,
                lteQualityThreshold, "s-NonIntraSearchQ");
  PB_FIELD (16, "S_intra_search_P",                        sIntraSearchP,                     SIntraSearchP,                     uint32,
                lteLevelThreshold, "s-IntraSearchP");
  PB_FIELD (17, "S_intra_search_Q",                        sIntraSearchQ,                     SIntraSearchQ,                     uint32,
                lteQualityThreshold, "s-IntraSearchQ");
  PB_FIELD (18, "Thresh_serving_lowP",                     threshServingLowP,                 ThreshServingLowP,                 uint32,
                lteLevelThreshold, "threshServingLowP");
  PB_FIELD (19, "Thresh_serving_lowQ",                     threshServingLowQ,                 ThreshServingLowQ,                 uint32,
                lteQualityThreshold, "threshServingLowQ");
  PB_FIELD (20, "priority_operating_freq",                 priorityOperatingFreq,             PriorityOperatingFreq,             uint32,
                reselectionPriority, "Reselection priority of the serving frequency (0: lowest)");
  PB_LIST  (21, "nbr_eutra",                               nbrEutras,                         NbrEutras, nbrEutra, NbrEutra, repeated<message<NbrEutra>>,
                "One entry per E-UTRA neighbour frequency", viewer::pageEntriesGetTimestamp);
};

class RxInfo final : public PBCodable {
  PB_MESSAGE(RxInfo, "One antenna's measurement, RSRP and RSRQ as reported (3GPP TS 36.133, 9.1).")
  PB_FIELD(1, "rssi",       rssi,      Rssi,      sint32, rssi,          "RSSI");
  PB_FIELD(2, "rsrp_range", rsrpRange, RsrpRange, uint32, lteRsrp,       "Reported RSRP");
  PB_FIELD(3, "rsrq_range", rsrqRange, RsrqRange, uint32, lteRsrq,       "Reported RSRQ");
  PB_FIELD(4, "snr",        snr,       Snr,       sint32, signalToNoise, "Signal to noise ratio");
};

class KCellularLteServingCellMeasurement final : public PBCodable {
  PB_MESSAGE(KCellularLteServingCellMeasurement,
             "Measurement of the serving cell, per antenna.",
             "none: its metric is known but not taken")
  PB_FIELD(1, "timestamp",         timestamp,       Timestamp,       uint64,  timestamp, "Time of the values");
  PB_FIELD(2, "is_connected_mode", isConnectedMode, IsConnectedMode, boolean, none,      "Whether the measurement was made in connected mode");
  PB_LIST (3, "rx_info",           rxInfos,         RxInfos, rxInfo, RxInfo, repeated<message<RxInfo>>, "One entry per receive antenna");
};

class TxPowerInfo final : public PBCodable {
  PB_MESSAGE(TxPowerInfo, "Transmit power of PUCCH and PUSCH in one subframe.")
  PB_FIELD(1, "pucch_tx_power", pucchTxPower,  PucchTxPower,  sint32, lteTxPower, "PUCCH power (3GPP TS 36.213, 5.1.2)");
  PB_FIELD(2, "pusch_tx_power", puschTxPower,  PuschTxPower,  sint32, lteTxPower, "PUSCH power (3GPP TS 36.213, 5.1.1)");
  PB_FIELD(3, "subframe_index", subframeIndex, SubframeIndex, uint32, none,       "Subframe, 0 to 9");
};

class KCellularLteTxPower final : public PBCodable {
  PB_MESSAGE(KCellularLteTxPower,
             "Uplink transmit power, per subframe.",
             "none: \"LTE Tx Power\" keeps its placeholder")
  PB_FIELD(1, "timestamp",     timestamp,    Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_LIST (2, "tx_power_info", txPowerInfos, TxPowerInfos, txPowerInfo, TxPowerInfo, repeated<message<TxPowerInfo>>, "One entry per subframe", viewer::entriesGetTimestamp);
};

class RsrpRsrqSinr final : public PBCodable {
  PB_MESSAGE(RsrpRsrqSinr, "RSRP, RSRQ and SINR of one cell, per receive antenna.")
  PB_FIELD( 1, "phy_cell_id", phyCellId, PhyCellId, uint32, eutraPci,      "Physical cell identity");
  PB_FIELD( 4, "rsrp0",       rsrp0,     Rsrp0,     sint32, lteSampleRsrp, "RSRP of the first antenna");
  PB_FIELD( 5, "rsrp1",       rsrp1,     Rsrp1,     sint32, lteSampleRsrp, "RSRP of the second antenna");
  PB_FIELD( 7, "rsrq0",       rsrq0,     Rsrq0,     sint32, lteSampleRsrq, "RSRQ of the first antenna");
  PB_FIELD( 8, "rsrq1",       rsrq1,     Rsrq1,     sint32, lteSampleRsrq, "RSRQ of the second antenna");
  PB_FIELD(10, "sinr0",       sinr0,     Sinr0,     sint32, lteSampleSinr, "SINR of the first antenna", viewer::convertedInSamples);
  PB_FIELD(11, "sinr1",       sinr1,     Sinr1,     sint32, lteSampleSinr, "SINR of the second antenna", viewer::convertedInSamples);
};

class KCellularLteRsrpRsrqSinr final : public PBCodable {
  PB_MESSAGE(KCellularLteRsrpRsrqSinr,
             "Measurement statistics of the serving cell: averages over the last seconds and the single samples.",
             "none: \"LTE Serving Cell Meas\" keeps its placeholder")
  PB_FIELD ( 1, "timestamp",        timestamp,      Timestamp,      uint64,                timestamp,    "Time of the values", viewer::localTime);
  PB_OBJECT( 3, "call_id",          callId,         CallId,         string,                "Call to which the statistics belong");
  PB_FIELD ( 6, "last_x_seconds",   lastXSeconds,   LastXSeconds,   uint32,                seconds,      "Time that the averages cover");
  PB_FIELD ( 7, "last_y_samples",   lastYSamples,   LastYSamples,   uint32,                none,         "Samples that the averages cover");
  PB_FIELD ( 8, "sample_period_ms", samplePeriodMs, SamplePeriodMs, uint32,                milliseconds, "Time between samples");
  PB_FIELD (10, "duration_ms",      durationMs,     DurationMs,     uint32,                milliseconds, "Time that the samples cover");
  PB_FIELD (11, "num_samples",      numSamples,     NumSamples,     uint32,                none,         "Number of samples");
  PB_OBJECT(14, "avg_values",       avgValues,      AvgValues,      message<RsrpRsrqSinr>, "Averages");
  PB_LIST  (15, "inst_values",      instValues,     InstValues, instValues, InstValues, repeated<message<RsrpRsrqSinr>>,
                "One entry per sample, oldest first", viewer::entriesGetTimestamp);
};

class KCellularLteComponentCarrierInfo final : public PBCodable {
  PB_MESSAGE(KCellularLteComponentCarrierInfo,
             "EARFCN and bandwidth of the primary and up to two secondary carriers.",
             "none that the lists lead to: \"LTE Component Carrier Info\" shows it")
  PB_FIELD(1, "timestamp",      timestamp,     Timestamp,     uint64, timestamp,    "Time of the values", viewer::localTime);
  PB_FIELD(2, "pcc_earfcn",     pccEarfcn,     PccEarfcn,     uint32, earfcn,       "EARFCN of the primary carrier");
  PB_FIELD(3, "scc0_earfcn",    scc0Earfcn,    Scc0Earfcn,    uint32, earfcn,       "EARFCN of the first secondary carrier");
  PB_FIELD(4, "scc1_earfcn",    scc1Earfcn,    Scc1Earfcn,    uint32, earfcn,       "EARFCN of the second secondary carrier");
  PB_FIELD(5, "pcc_bandwidth",  pccBandwidth,  PccBandwidth,  uint32, lteBandwidth, "Bandwidth of the primary carrier");
  PB_FIELD(6, "scc0_bandwidth", scc0Bandwidth, Scc0Bandwidth, uint32, lteBandwidth, "Bandwidth of the first secondary carrier");
  PB_FIELD(7, "scc1_bandwidth", scc1Bandwidth, Scc1Bandwidth, uint32, lteBandwidth, "Bandwidth of the second secondary carrier");
};

class SecondaryComponentCarrier final : public PBCodable {
  PB_MESSAGE(SecondaryComponentCarrier, "One secondary carrier.")

 public:
  PB_ENUMERATION(State,
    SCC_STATE_DECONFIGURED = 0,
    SCC_STATE_CONFIGURED_DEACTIVATED = 1,
    SCC_STATE_ACTIVATED = 2);

  PB_FIELD( 1, "index",        index,       Index,       uint32,             none,           "SCellIndex, 1 to 7 (3GPP TS 36.331, 6.3.4)");
  PB_FIELD( 2, "state",        state,       State,       enumeration<State>, none,           "State of the carrier");
  PB_FIELD( 3, "pci",          pci,         Pci,         uint32,             eutraPci,       "Physical cell identity");
  PB_FIELD( 4, "dl_earfcn",    dlEarfcn,    DlEarfcn,    uint32,             earfcn,         "Downlink EARFCN");
  PB_FIELD( 5, "dl_rf_band",   dlRfBand,    DlRfBand,    uint32,             eutraBand,      "Downlink band");
  PB_FIELD( 6, "dl_bandwidth", dlBandwidth, DlBandwidth, uint32,             lteBandwidth,   "Downlink bandwidth", viewer::convertedOnPage);
  PB_FIELD( 7, "has_uplink",   hasUplink,   HasUplink,   boolean,            none,           "Whether the carrier has an uplink");
  PB_FIELD( 8, "ul_earfcn",    ulEarfcn,    UlEarfcn,    uint32,             earfcn,         "Uplink EARFCN");
  PB_FIELD( 9, "ul_rf_band",   ulRfBand,    UlRfBand,    uint32,             eutraBand,      "Uplink band");
  PB_FIELD(10, "ul_bandwidth", ulBandwidth, UlBandwidth, uint32,             lteBandwidth,   "Uplink bandwidth");
  PB_FIELD(11, "rsrp",         rsrp,        Rsrp,        sint32,             lteCarrierRsrp, "RSRP", viewer::convertedOnPage);
  PB_FIELD(12, "rsrq",         rsrq,        Rsrq,        sint32,             lteCarrierRsrq, "RSRQ", viewer::convertedOnPage);
  PB_FIELD(13, "snr",          snr,         Snr,         sint32,             signalToNoise,  "Signal to noise ratio");
  PB_FIELD(14, "rssi",         rssi,        Rssi,        sint32,             lteCarrierRssi, "RSSI", viewer::convertedOnPage);
};

class KCellularLteCarrierAggregationStatus final : public PBCodable {
  PB_MESSAGE(KCellularLteCarrierAggregationStatus,
             "State of the secondary component carriers, 3GPP TS 36.321, 5.13.",
             "\"LTE CA Status\"")
  PB_FIELD(1, "timestamp", timestamp, Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_LIST (2, "scc_list",  sccLists,  SccLists, sccList, SccList, repeated<message<SecondaryComponentCarrier>>, "One entry per secondary carrier", viewer::pageEntriesGetTimestamp);
};

class EgwErrcNbrEutraMeas final : public PBCodable {
  PB_MESSAGE(EgwErrcNbrEutraMeas, "One LTE neighbour, RSRP and RSRQ as reported (3GPP TS 36.133, 9.1.4 and 9.1.7).")
  PB_FIELD(1, "nbr_earfcn",       nbrEarfcn,     NbrEarfcn,     uint32, earfcn,    "EARFCN");
  PB_FIELD(2, "nbr_phys_cell_id", nbrPhysCellId, NbrPhysCellId, uint32, eutraPci,  "Physical cell identity");
  PB_FIELD(3, "freq_band_ind",    freqBandInd,   FreqBandInd,   uint32, eutraBand, "Number of the E-UTRA operating band");
  PB_FIELD(4, "nbr_rsrp",         nbrRsrp,       NbrRsrp,       sint32, lteRsrp,   "Reported RSRP", viewer::converted);
  PB_FIELD(5, "nbr_rsrq",         nbrRsrq,       NbrRsrq,       sint32, lteRsrq,   "Reported RSRQ", viewer::converted);
};

class KCellularLteNbrEutraCellMeas final : public PBCodable {
  PB_MESSAGE(KCellularLteNbrEutraCellMeas,
             "Measured LTE neighbour cells.",
             "none: \"LTE LTE Neighbor Cell Meas\" keeps its placeholder")
  PB_FIELD(1, "timestamp",      timestamp,     Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_LIST (2, "meas_nbr_eutra", measNbrEutras, MeasNbrEutras, measNbrEutra, MeasNbrEutra, repeated<message<EgwErrcNbrEutraMeas>>,
              "One entry per LTE neighbour", viewer::entriesGetTimestamp);
};

class EgwErrcNbrUtraMeas final : public PBCodable {
  PB_MESSAGE(EgwErrcNbrUtraMeas, "One UMTS neighbour, RSCP and Ec/No as reported (3GPP TS 25.133, 9.1).")
  PB_FIELD(1, "uarfcn", uarfcn, Uarfcn, uint32, uarfcn,   "UARFCN");
  PB_FIELD(2, "psc",    psc,    Psc,    uint32, utraPsc,  "Primary scrambling code");
  PB_FIELD(3, "rscp",   rscp,   Rscp,   sint32, utraRscp, "Reported RSCP", viewer::converted);
  PB_FIELD(4, "ecno",   ecno,   Ecno,   uint32, utraEcNo, "Reported Ec/No", viewer::converted);
};

class EgwErrcNbrGeranMeas final : public PBCodable {
  PB_MESSAGE(EgwErrcNbrGeranMeas, "One GSM neighbour, the level as reported (3GPP TS 45.008, 8.1.4).")
  PB_FIELD(1, "arfcn", arfcn, Arfcn, uint32, arfcn,    "ARFCN");
  PB_FIELD(2, "bsic",  bsic,  Bsic,  uint32, gsmBsic,  "Base station identity code");
  PB_FIELD(3, "rxlev", rxlev, Rxlev, uint32, gsmRxLev, "Received level", viewer::converted);
};

class KCellularLteNbrInterRatCellMeas final : public PBCodable {
  PB_MESSAGE(KCellularLteNbrInterRatCellMeas,
             "Measured UMTS and GSM neighbour cells of an LTE cell.",
             "none: \"LTE UMTS Neighbor Cell Meas\" and \"LTE GSM Neighbor Cell Meas\" keep their placeholders")
  PB_FIELD(1, "timestamp",      timestamp,     Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_LIST (2, "meas_nbr_utra",  measNbrUtras,  MeasNbrUtras, measNbrUtra, MeasNbrUtra, repeated<message<EgwErrcNbrUtraMeas>>,
              "One entry per UMTS neighbour", viewer::entriesGetTimestamp);
  PB_LIST (3, "meas_nbr_geran", measNbrGerans, MeasNbrGerans, measNbrGeran, MeasNbrGeran, repeated<message<EgwErrcNbrGeranMeas>>,
              "One entry per GSM neighbour", viewer::entriesGetTimestamp);
};

// All of them, in the order of the registry.
#define LTE_MESSAGES(EACH) \
  EACH(KCellularLteRrcState) \
  EACH(KCellularLteCdrxConfig) \
  EACH(KCellularLteScellInfo) \
  EACH(KCellularLteSelReselCellInfo) \
  EACH(NbrEutra) \
  EACH(KCellularLteServingCellMeasurement) \
  EACH(RxInfo) \
  EACH(KCellularLteTxPower) \
  EACH(TxPowerInfo) \
  EACH(KCellularLteRsrpRsrqSinr) \
  EACH(RsrpRsrqSinr) \
  EACH(KCellularLteComponentCarrierInfo) \
  EACH(KCellularLteCarrierAggregationStatus) \
  EACH(SecondaryComponentCarrier) \
  EACH(KCellularLteNbrEutraCellMeas) \
  EACH(EgwErrcNbrEutraMeas) \
  EACH(KCellularLteNbrInterRatCellMeas) \
  EACH(EgwErrcNbrUtraMeas) \
  EACH(EgwErrcNbrGeranMeas)

// clang-format on

}  // namespace probeview
