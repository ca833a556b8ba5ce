// SPDX-License-Identifier: Apache-2.0
//
// From decibels to the numbers of the metric service. Each quantity is one row: what a source knows in dBm, dB or MHz
// becomes the number that the viewer turns back into the same dBm, dB or MHz. Every source goes through here, so that
// an offset is written in one place.
//
//   wire = round((value + offset) × scale)        value = wire ÷ scale − offset
//
// The reporting ranges of the standards start counting at the weakest step ("RSRP_00 is below −140 dBm"); the offsets
// here are the ones that the viewer undoes, so a value read back is right to half a step.
#pragma once

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <iterator>
#include <limits>
#include <optional>
#include <string_view>

namespace probeview::units {

struct Quantity {
  std::string_view name;
  std::string_view unit;  // of the value: "dBm", "dB"
  double offset;          // added to the value
  double scale;           // then multiplied by
  double lowest;          // the values that can be measured at all, in the unit
  double highest;
  std::string_view clause;  // where the standard defines the quantity and its range

  // Whether a value is one that can be measured. A source leaves out what is not.
  constexpr bool contains(double value) const { return value >= lowest && value <= highest; }

  // For a signed field. Numbers that no 32 bits hold are cut at their ends; not-a-number is 0.
  std::int32_t toSigned(double value) const {
    return static_cast<std::int32_t>(rounded(value, std::numeric_limits<std::int32_t>::min()));
  }
  // For an unsigned field: what would be negative is 0, the weakest step.
  std::uint32_t toUnsigned(double value) const { return static_cast<std::uint32_t>(rounded(value, 0)); }

  // What the viewer shows for a number on the wire.
  constexpr double toValue(double wire) const { return wire / scale - offset; }

 private:
  double rounded(double value, double lowestNumber) const {
    const double number = std::round((value + offset) * scale);
    if (std::isnan(number)) return 0;
    return std::clamp(number, lowestNumber, double{std::numeric_limits<std::int32_t>::max()});
  }
};

// LTE, measured neighbours and reported ranges: RSRP in steps of 1 dB from −140, RSRQ in steps of 0.5 dB from −19.5.
inline constexpr Quantity lteRsrp{"LTE RSRP", "dBm", 140, 1, -156, -31, "3GPP TS 36.133, 9.1.4"};
inline constexpr Quantity lteRsrq{"LTE RSRQ", "dB", 19.5, 2, -34, 2.5, "3GPP TS 36.133, 9.1.7"};
// LTE, samples: whole dBm and dB; the signal to interference and noise ratio in half dB.
inline constexpr Quantity lteSampleRsrp{"LTE RSRP sample", "dBm", 0, 1, -156, -31, "3GPP TS 36.133, 9.1.4"};
inline constexpr Quantity lteSampleRsrq{"LTE RSRQ sample", "dB", 0, 1, -34, 2.5, "3GPP TS 36.133, 9.1.7"};
inline constexpr Quantity lteSampleSinr{"LTE SINR sample", "dB", 0, 2, -23, 40, "3GPP TS 36.133, 9.1.17"};
// LTE, component carriers: hundredths.
inline constexpr Quantity lteCarrierRsrp{"LTE carrier RSRP", "dBm", 0, 100, -156, -31, "3GPP TS 36.133, 9.1.4"};
inline constexpr Quantity lteCarrierRssi{"LTE carrier RSSI", "dBm", 0, 100, -140, 0, "3GPP TS 36.214, 5.1.3"};
inline constexpr Quantity lteCarrierRsrq{"LTE carrier RSRQ", "dB", 0, 100, -34, 2.5, "3GPP TS 36.133, 9.1.7"};

// UTRA: CPICH RSCP in steps of 1 dB from −116, CPICH Ec/No in steps of 0.5 dB from −24.5.
inline constexpr Quantity utraRscp{"CPICH RSCP", "dBm", 116, 1, -120, -25, "3GPP TS 25.133, 9.1.1.3"};
inline constexpr Quantity utraEcNo{"CPICH Ec/No", "dB", 24.5, 2, -24.5, 0, "3GPP TS 25.133, 9.1.2.3"};

// GSM: RXLEV in steps of 1 dB from −110, 0 being everything below; the idle-mode level is told in dBm as it is.
inline constexpr Quantity gsmRxLev{"RXLEV", "dBm", 110, 1, -120, -25, "3GPP TS 45.008, 8.1.4"};
inline constexpr Quantity gsmIdleLevel{"idle-mode level", "dBm", 0, 1, -120, -25, "3GPP TS 45.008, 6.1"};

// RXQUAL has no unit: 0 (fewest bit errors) to 7.
inline constexpr Quantity gsmRxQual{"RXQUAL", "", 0, 1, 0, 7, "3GPP TS 45.008, 8.2.4"};

// The index of an LTE channel bandwidth in carrier and neighbour lists: 0…5 for 1.4, 3, 5, 10, 15, 20 MHz (3GPP TS
// 36.101, 5.6). Absent for a bandwidth that LTE does not have.
inline std::optional<std::uint32_t> lteBandwidthIndex(double megahertz) {
  constexpr double bandwidths[] = {1.4, 3, 5, 10, 15, 20};
  for (std::uint32_t index = 0; index < std::size(bandwidths); ++index) {
    if (std::abs(bandwidths[index] - megahertz) < 0.01) return index;
  }
  return std::nullopt;
}

// The serving cell's downlink bandwidth travels in quarter MHz, because the viewer halves it twice to show MHz.
inline std::uint32_t lteServingDownlinkBandwidth(double megahertz) {
  return static_cast<std::uint32_t>(std::lround(std::max(megahertz, 0.0) * 4));
}
// Its uplink bandwidth is shown as it comes: whole MHz.
inline std::uint32_t lteServingUplinkBandwidth(double megahertz) {
  return static_cast<std::uint32_t>(std::lround(std::max(megahertz, 0.0)));
}

}  // namespace probeview::units
