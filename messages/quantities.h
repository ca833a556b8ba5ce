// SPDX-License-Identifier: Apache-2.0
//
// The quantities of the radio, each in one row: unit, range, where the standard defines it, how it travels, and how a
// person reads it. Rows of messages name them; sources, the store and the published pages convert by them, so that an
// offset is written in one place.
//
// The reporting ranges of the standards start counting at the weakest step ("RSRP_00 is below −140 dBm"). The offsets
// here are the ones that the viewer undoes, so that a value read back is right to half a step; the strongest step of
// RSRP and RSRQ is therefore shown one step above the edge that the standard names.
//
// What can be measured reaches beyond what is reported; a source takes a value for real within that.
#pragma once

#include <array>

#include "messages/runtime/quantity.h"

namespace probeview::quantities {

// Of a number that measures nothing: a count, a code, a truth value, a number of the modem's own.
inline constexpr Quantity none{};

// Time.
inline constexpr Quantity timestamp{.name = "time", .unit = "ms since 1970-01-01 UTC"};
inline constexpr Quantity milliseconds{.name = "time span in ms", .unit = "ms"};
inline constexpr Quantity seconds{.name = "time span in s", .unit = "s"};

// Quality. The standards define none of these bands; they are what phones draw their bars by. For Ec/No, RSSI and
// RXQUAL there are none that are as widely used.
inline constexpr std::array lteRsrpBands{QualityBand{-115, "poor"}, QualityBand{-105, "moderate"},
                                         QualityBand{-95, "good"}, QualityBand{-85, "great"}};
inline constexpr std::array lteRsrqBands{QualityBand{-19, "poor"}, QualityBand{-17, "moderate"},
                                         QualityBand{-14, "good"}, QualityBand{-12, "great"}};
inline constexpr std::array lteSinrBands{QualityBand{-3, "poor"}, QualityBand{1, "moderate"}, QualityBand{5, "good"},
                                         QualityBand{13, "great"}};
inline constexpr std::array utraRscpBands{QualityBand{-115, "poor"}, QualityBand{-105, "moderate"},
                                          QualityBand{-95, "good"}, QualityBand{-85, "great"}};
inline constexpr std::array gsmLevelBands{QualityBand{-107, "poor"}, QualityBand{-103, "moderate"},
                                          QualityBand{-97, "good"}, QualityBand{-89, "great"}};
inline constexpr std::string_view androidLte = "what Android's CellSignalStrengthLte falls back on";
inline constexpr std::string_view androidUtra = "what Android's CellSignalStrengthWcdma falls back on";
inline constexpr std::string_view androidGsm = "the constants of Android's CellSignalStrengthGsm";

// Tables read best in columns.
// clang-format off

// LTE, measured neighbours and reported ranges: RSRP in steps of 1 dB, RSRQ in steps of 0.5 dB.
inline constexpr Quantity lteRsrp{.name = "LTE RSRP", .unit = "dBm", .clause = "3GPP TS 36.133, 9.1.4",
    .offset = 140, .numbers = {0, 97}, .values = {-140, -44}, .measurable = {-156, -31},
    .bands = lteRsrpBands, .bandsSource = androidLte};
inline constexpr Quantity lteRsrq{.name = "LTE RSRQ", .unit = "dB", .clause = "3GPP TS 36.133, 9.1.7",
    .offset = 19.5, .scale = 2, .numbers = {0, 34}, .values = {-19.5, -3}, .measurable = {-34, 2.5},
    .decimals = 1, .bands = lteRsrqBands, .bandsSource = androidLte};
// LTE, samples: whole dBm and dB; the signal to interference and noise ratio in half dB.
inline constexpr Quantity lteSampleRsrp{.name = "LTE RSRP sample", .unit = "dBm", .clause = "3GPP TS 36.133, 9.1.4",
    .numbers = lteRsrp.values, .measurable = lteRsrp.measurable, .bands = lteRsrpBands, .bandsSource = androidLte};
inline constexpr Quantity lteSampleRsrq{.name = "LTE RSRQ sample", .unit = "dB", .clause = "3GPP TS 36.133, 9.1.7",
    .numbers = {-20, -3}, .measurable = lteRsrq.measurable, .bands = lteRsrqBands, .bandsSource = androidLte};
inline constexpr Quantity lteSampleSinr{.name = "LTE SINR sample", .unit = "dB", .clause = "3GPP TS 36.133, 9.1.17",
    .scale = 2, .numbers = {-46, 80}, .measurable = {-23, 40}, .decimals = 1,
    .bands = lteSinrBands, .bandsSource = androidLte};
// LTE, component carriers: hundredths. RSRP and RSSI are read without them.
inline constexpr Quantity lteCarrierRsrp{.name = "LTE carrier RSRP", .unit = "dBm", .clause = "3GPP TS 36.133, 9.1.4",
    .scale = 100, .numbers = {-14000, -4400}, .measurable = lteRsrp.measurable,
    .bands = lteRsrpBands, .bandsSource = androidLte};
inline constexpr Quantity lteCarrierRssi{.name = "LTE carrier RSSI", .unit = "dBm", .clause = "3GPP TS 36.214, 5.1.3",
    .scale = 100, .measurable = {-140, 0}};
inline constexpr Quantity lteCarrierRsrq{.name = "LTE carrier RSRQ", .unit = "dB", .clause = "3GPP TS 36.133, 9.1.7",
    .scale = 100, .numbers = {-2000, -300}, .measurable = lteRsrq.measurable, .decimals = 2,
    .bands = lteRsrqBands, .bandsSource = androidLte};
// RSSI and the signal to noise ratio of one antenna, whole dBm and dB.
inline constexpr Quantity rssi{.name = "RSSI", .unit = "dBm"};
inline constexpr Quantity signalToNoise{.name = "signal to noise ratio", .unit = "dB",
    .bands = lteSinrBands, .bandsSource = androidLte};

// UTRA: CPICH RSCP in steps of 1 dB, CPICH Ec/No in steps of 0.5 dB.
inline constexpr Quantity utraRscp{.name = "CPICH RSCP", .unit = "dBm", .clause = "3GPP TS 25.133, 9.1.1.3",
    .offset = 116, .numbers = {-5, 91}, .measurable = {-120, -25}, .bands = utraRscpBands, .bandsSource = androidUtra};
inline constexpr Quantity utraEcNo{.name = "CPICH Ec/No", .unit = "dB", .clause = "3GPP TS 25.133, 9.1.2.3",
    .offset = 24.5, .scale = 2, .numbers = {0, 49}, .measurable = {-24.5, 0}, .decimals = 1};

// GSM: RXLEV in steps of 1 dB, 0 being everything below; the idle-mode level is told in dBm as it is. RXQUAL has no
// unit: 0 (fewest bit errors) to 7.
inline constexpr Quantity gsmRxLev{.name = "RXLEV", .unit = "dBm", .clause = "3GPP TS 45.008, 8.1.4",
    .offset = 110, .numbers = {0, 63}, .measurable = {-120, -25}, .bands = gsmLevelBands, .bandsSource = androidGsm};
inline constexpr Quantity gsmIdleLevel{.name = "idle-mode level", .unit = "dBm", .clause = "3GPP TS 45.008, 6.1",
    .numbers = gsmRxLev.valueRange(), .measurable = gsmRxLev.measurable, .bands = gsmLevelBands, .bandsSource = androidGsm};
inline constexpr Quantity gsmRxQual{.name = "RXQUAL", .clause = "3GPP TS 45.008, 8.2.4",
    .numbers = {0, 7}, .measurable = {0, 7}};

// Transmit power.
inline constexpr Quantity lteTxPower{.name = "LTE transmit power", .unit = "dBm",
    .clause = "3GPP TS 36.101, 6.2.2 and 6.3.2", .numbers = {-40, 23}};
inline constexpr Quantity lteMaximumPower{.name = "p-Max", .unit = "dBm", .numbers = {-30, 33}};
inline constexpr Quantity gsmTxPower{.name = "GSM transmit power", .unit = "dBm"};

// Bandwidth: an index in carrier and neighbour lists. The serving cell's downlink bandwidth travels in quarter MHz and
// is read as the viewer shows it, by halving it twice in whole numbers; its uplink bandwidth in whole MHz.
inline constexpr std::array lteBandwidths{1.4, 3.0, 5.0, 10.0, 15.0, 20.0};
inline constexpr Quantity lteBandwidth{.name = "LTE bandwidth", .unit = "MHz", .clause = "3GPP TS 36.101, 5.6",
    .table = lteBandwidths, .decimals = 1};
inline constexpr Quantity lteServingDownlinkBandwidth{.name = "LTE serving downlink bandwidth", .unit = "MHz",
    .clause = "3GPP TS 36.101, 5.6", .scale = 4};
inline constexpr Quantity lteServingUplinkBandwidth{.name = "LTE serving uplink bandwidth", .unit = "MHz",
    .clause = "3GPP TS 36.101, 5.6"};

// Connected-mode DRX.
inline constexpr Quantity lteOnDuration{.name = "onDurationTimer", .unit = "ms",
    .clause = "3GPP TS 36.331, 6.3.2, DRX-Config"};
inline constexpr Quantity lteDrxInactivity{.name = "drx-InactivityTimer", .unit = "ms",
    .clause = "3GPP TS 36.331, 6.3.2, DRX-Config", .numbers = {0, 2560}};
inline constexpr Quantity lteDrxRetransmission{.name = "drx-RetransmissionTimer", .unit = "ms",
    .clause = "3GPP TS 36.331, 6.3.2, DRX-Config"};
inline constexpr Quantity lteLongDrxCycle{.name = "long DRX cycle", .unit = "ms",
    .clause = "3GPP TS 36.331, 6.3.2, DRX-Config", .numbers = {10, 2560}};
inline constexpr Quantity lteShortDrxCycle{.name = "short DRX cycle", .unit = "ms",
    .clause = "3GPP TS 36.331, 6.3.2, DRX-Config", .numbers = {2, 640}};
inline constexpr Quantity lteShortDrxCycles{.name = "drxShortCycleTimer", .unit = "short cycles",
    .clause = "3GPP TS 36.331, 6.3.2, DRX-Config", .numbers = {1, 16}};
inline constexpr Quantity utraDrxCycle{.name = "UTRA DRX cycle", .unit = "ms", .numbers = {80, 5120}};

// LTE access barring and reselection, as broadcast.
inline constexpr std::array lteBarringFactors{0.0, 0.05, 0.1, 0.15, 0.2, 0.25, 0.3, 0.4,
                                              0.5, 0.6, 0.7, 0.75, 0.8, 0.85, 0.9, 0.95};
inline constexpr std::array lteBarringTimes{4.0, 8.0, 16.0, 32.0, 64.0, 128.0, 256.0, 512.0};
inline constexpr Quantity lteBarringFactor{.name = "ac-BarringFactor", .clause = "3GPP TS 36.331, 6.3.1",
    .table = lteBarringFactors, .decimals = 2};
inline constexpr Quantity lteBarringTime{.name = "ac-BarringTime", .unit = "s", .clause = "3GPP TS 36.331, 6.3.1",
    .table = lteBarringTimes};
inline constexpr Quantity lteQRxLevMin{.name = "q-RxLevMin", .unit = "dBm", .clause = "3GPP TS 36.304, 5.2.3.2",
    .scale = 0.5, .numbers = {-70, -22}};
inline constexpr Quantity lteQQualMin{.name = "q-QualMin", .unit = "dB", .clause = "3GPP TS 36.304, 5.2.3.2",
    .numbers = {-34, -3}};
inline constexpr Quantity lteQHyst{.name = "q-Hyst", .unit = "dB", .clause = "3GPP TS 36.331, 6.3.1",
    .numbers = {0, 24}};
inline constexpr Quantity lteQOffset{.name = "q-OffsetFreq", .unit = "dB", .clause = "3GPP TS 36.331, 6.3.4",
    .numbers = {-24, 24}};
inline constexpr Quantity lteLevelThreshold{.name = "ReselectionThreshold", .unit = "dB",
    .clause = "3GPP TS 36.331, 6.3.4", .scale = 0.5, .numbers = {0, 31}};
inline constexpr Quantity lteQualityThreshold{.name = "ReselectionThresholdQ", .unit = "dB",
    .clause = "3GPP TS 36.331, 6.3.4", .numbers = {0, 31}};
inline constexpr Quantity reselectionPriority{.name = "reselection priority", .numbers = {0, 7}};

// UTRA and GSM reselection, as broadcast.
inline constexpr Quantity utraSrxlev{.name = "Srxlev", .unit = "dB", .clause = "3GPP TS 25.304, 5.2.3.1.2"};
inline constexpr Quantity utraSqual{.name = "Squal", .unit = "dB", .clause = "3GPP TS 25.304, 5.2.3.1.2"};
inline constexpr Quantity utraSearchThreshold{.name = "UTRA search threshold", .unit = "dB", .numbers = {-32, 20}};
inline constexpr Quantity gsmReselectOffset{.name = "CELL_RESELECT_OFFSET", .unit = "dB",
    .clause = "3GPP TS 45.008, 6.4", .scale = 0.5, .numbers = {0, 63}};
inline constexpr Quantity gsmTemporaryOffset{.name = "TEMPORARY_OFFSET", .unit = "dB",
    .clause = "3GPP TS 45.008, 6.4", .scale = 0.1, .numbers = {0, 6}};
inline constexpr Quantity gsmPenaltyTime{.name = "PENALTY_TIME", .unit = "s", .clause = "3GPP TS 45.008, 6.4",
    .offset = -20, .scale = 0.05, .numbers = {0, 30}};
inline constexpr Quantity gsmReselectHysteresis{.name = "CELL_RESELECT_HYSTERESIS", .unit = "dB", .scale = 0.5,
    .numbers = {0, 7}};
inline constexpr Quantity gsmPeriodicUpdate{.name = "T3212 as broadcast", .unit = "h", .scale = 10,
    .numbers = {0, 255}, .decimals = 1};
inline constexpr Quantity gsmRadioLinkTimeout{.name = "RADIO-LINK-TIMEOUT", .offset = -4, .scale = 0.25,
    .numbers = {0, 15}};
inline constexpr Quantity gsmPagingMultiframes{.name = "BS_PA_MFRMS", .unit = "multiframes", .numbers = {2, 9}};
inline constexpr std::array gsmRetransmissions{1.0, 2.0, 4.0, 7.0};
inline constexpr Quantity gsmMaximumRetransmissions{.name = "Max retrans", .table = gsmRetransmissions};

// Channels and bands.
inline constexpr Quantity earfcn{.name = "EARFCN", .clause = "3GPP TS 36.101, 5.7.3", .numbers = {0, 262143}};
inline constexpr Quantity uarfcn{.name = "UARFCN", .clause = "3GPP TS 25.101, 5.4.3", .numbers = {0, 16383}};
inline constexpr Quantity arfcn{.name = "ARFCN", .clause = "3GPP TS 45.005, 2", .numbers = {0, 1023}};
inline constexpr Quantity eutraBand{.name = "E-UTRA band", .clause = "3GPP TS 36.101, 5.5", .numbers = {1, 256}};
inline constexpr Quantity utraBand{.name = "UTRA band", .clause = "3GPP TS 25.101, 5.2"};

// Identities.
inline constexpr Quantity eutraPci{.name = "PCI", .clause = "3GPP TS 36.211, 6.11", .numbers = {0, 503}};
inline constexpr Quantity utraPsc{.name = "PSC", .clause = "3GPP TS 25.213, 5.2.2", .numbers = {0, 511}};
inline constexpr Quantity gsmBsic{.name = "BSIC", .clause = "3GPP TS 23.003, 4.3.2", .numbers = {0, 63}};
inline constexpr Quantity eutraCellIdentity{.name = "E-UTRAN cell identity", .clause = "3GPP TS 23.003, 19.6",
    .bits = 28, .isHexadecimal = true};
inline constexpr Quantity utraCellIdentity{.name = "UTRAN cell identity", .clause = "3GPP TS 25.331, 10.3.2.2",
    .bits = 28, .isHexadecimal = true};
inline constexpr Quantity gsmCellIdentity{.name = "GSM cell identity", .clause = "3GPP TS 23.003, 4.3.1",
    .numbers = {0, 65535}, .isHexadecimal = true};
inline constexpr Quantity trackingAreaCode{.name = "TAC", .clause = "3GPP TS 23.003, 19.4.2.3",
    .numbers = {0, 65535}, .isHexadecimal = true};
inline constexpr Quantity locationAreaCode{.name = "LAC", .clause = "3GPP TS 23.003, 4.1",
    .numbers = {0, 65535}, .isHexadecimal = true};
inline constexpr Quantity routingAreaCode{.name = "RAC", .clause = "3GPP TS 23.003, 4.2",
    .numbers = {0, 255}, .isHexadecimal = true};
inline constexpr Quantity countryCode{.name = "MCC", .clause = "3GPP TS 23.003, 2.2", .numbers = {0, 999}};
inline constexpr Quantity networkCode{.name = "MNC", .clause = "3GPP TS 23.003, 2.2", .numbers = {0, 999}};
inline constexpr Quantity networkCodeDigits{.name = "digits of the MNC", .clause = "3GPP TS 23.003, 2.2",
    .numbers = {2, 3}};
inline constexpr Quantity mmeGroup{.name = "MME group identity", .clause = "3GPP TS 23.003, 2.8",
    .numbers = {0, 65535}, .isHexadecimal = true};
inline constexpr Quantity mmeCode{.name = "MME code", .clause = "3GPP TS 23.003, 2.8",
    .numbers = {0, 255}, .isHexadecimal = true};
inline constexpr Quantity temporaryIdentity{.name = "TMSI", .clause = "3GPP TS 23.003, 2.4",
    .bits = 32, .isHexadecimal = true};
inline constexpr Quantity mmeTemporaryIdentity{.name = "M-TMSI", .clause = "3GPP TS 23.003, 2.8",
    .bits = 32, .isHexadecimal = true};
inline constexpr Quantity simFileIdentifier{.name = "SIM file identifier", .clause = "3GPP TS 31.102, 4",
    .bits = 16, .isHexadecimal = true};

// clang-format on

}  // namespace probeview::quantities
