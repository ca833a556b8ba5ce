// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "scenario/network.h"

namespace probeview::scenario {

// How strong every cell arrives at a place: path loss by distance and frequency, the sector antenna's pattern,
// enclosures, and shadowing that is the same each time that one comes by (so a second lap looks like the first).
class Propagation {
 public:
  // The network outlives it.
  Propagation(const Network& network, std::uint64_t seed);

  // Writes the received reference power, in dBm, of every cell of the technology; the other cells' entries are left.
  void receive(Technology technology, Point where, std::span<double> dbmByCell) const;

 private:
  struct SiteCells {
    std::uint32_t site = 0;
    CellIndex first = 0;
    CellIndex end = 0;
  };

  double shadowing(std::uint64_t map, Point where) const;
  double enclosureLoss(std::uint32_t siteEnclosure, Point where) const;

  const Network& network_;
  std::uint64_t seed_;
  std::vector<double> cellConstant_;               // radiated power less the loss at one kilometre
  std::vector<SiteCells> sites_[technologyCount];  // which cells each site has of each technology
};

}  // namespace probeview::scenario
