// SPDX-License-Identifier: Apache-2.0
//
// What the phone's receiver makes of the cells around it: levels as layer 3 sees them, quality, interference, and who
// is strongest.
#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "messages/quantities.h"
#include "scenario/network.h"
#include "scenario/propagation.h"
#include "scenario/random.h"

namespace probeview::scenario {

// Ranges of what is reported: RSRP and RSRQ of 3GPP TS 36.133, 9.1.4 and 9.1.7; CPICH RSCP and Ec/No and the power of a
// UTRA carrier of 25.133, 9.1.1 to 9.1.3; RxLev of 45.008, 8.1.4.
constexpr double weakestRsrp = quantities::lteRsrp.values.lowest, strongestRsrp = quantities::lteRsrp.values.highest;
constexpr double worstRsrq = quantities::lteRsrq.values.lowest, bestRsrq = quantities::lteRsrq.values.highest;
constexpr double worstSinr = -20, bestSinr = 30;
constexpr double weakestRscp = quantities::utraRscp.measurable.lowest;
constexpr double strongestRscp = quantities::utraRscp.measurable.highest;
constexpr double worstEcNo = -24, bestEcNo = 0;
constexpr double weakestUtraCarrier = -100, strongestUtraCarrier = -25;
constexpr double weakestRxLev = quantities::gsmRxLev.valueRange().lowest, strongestRxLev = -48;

class Surroundings {
 public:
  // The network outlives it.
  Surroundings(const Network& network, std::uint64_t seed);

  // Measures all cells of the technology at a place. The weight of the new measurement in the filtered level is that
  // of layer 3 filtering (3GPP TS 36.331, 5.5.3.2), 1 forgets the past; a cell that was not heard before starts afresh.
  void measure(Technology technology, Point where, double weight);

  // RSRP, CPICH RSCP or RxLev in dBm, filtered and within the technology's range.
  double strength(CellIndex cell) const;
  // RSRQ or CPICH Ec/No in dB, within range; 0 for GSM, which has none.
  double quality(CellIndex cell) const;
  // Signal to interference and noise in dB, per resource element, chip after despreading, or carrier.
  double interferenceRatio(CellIndex cell) const;
  // The received wideband power in dBm on the carrier of the cell.
  double carrierPower(CellIndex cell) const;

  // The cells of the technology that can be heard, strongest first; 24 at most.
  std::span<const CellIndex> heard(Technology technology) const { return heard_[static_cast<std::size_t>(technology)]; }

 private:
  void sumCarriers(Technology technology);
  void rank(Technology technology);

  const Network& network_;
  Propagation propagation_;
  Random fading_;
  std::vector<double> instant_;     // dBm by cell, of the last measurement
  std::vector<double> filtered_;    // dBm by cell
  std::vector<double> milliwatts_;  // by cell
  std::vector<double> total_;  // by carrier: what is received, per resource block or in the carrier's bandwidth, mW
  std::vector<double> interferers_;            // by carrier: the sum that disturbs, the wanted cell's own part included
  std::vector<std::vector<CellIndex>> cells_;  // by technology
  std::vector<CellIndex> heard_[technologyCount];
};

}  // namespace probeview::scenario
