// SPDX-License-Identifier: Apache-2.0
#include "scenario/propagation.h"

#include <algorithm>
#include <cmath>

#include "scenario/decibel.h"
#include "scenario/random.h"

namespace probeview::scenario {
namespace {

constexpr double nearestMetres = 35;      // 3GPP TR 36.942, 4.5.1: no base station stands nearer
constexpr double correlationMetres = 50;  // how far one shadow reaches

// 3GPP TR 36.942, 4.2.1: 65 degrees wide at 3 dB, 20 dB to the back.
double antennaLoss(double degreesOff) {
  const double relative = degreesOff / 65.0;
  return std::min(12.0 * relative * relative, 20.0);
}

}  // namespace

Propagation::Propagation(const Network& network, std::uint64_t seed) : network_(network), seed_(seed) {
  for (CellIndex index = 0; index < network.cells.size(); ++index) {
    const Carrier& carrier = network.carrierOf(index);
    cellConstant_.push_back(network.referenceDbm(index) - network.pathLoss.constant - network.pathLoss.bodyLoss -
                            2.1 * toDecibels(carrier.megahertz));
    std::vector<SiteCells>& sites = sites_[static_cast<std::size_t>(carrier.technology)];
    if (sites.empty() || sites.back().site != network.cells[index].site || sites.back().end != index) {
      sites.push_back({network.cells[index].site, index, index});
    }
    sites.back().end = index + 1;
  }
}

// Values on a grid of the correlation distance, made up from the grid point's coordinates, and a smooth blend between.
double Propagation::shadowing(std::uint64_t map, Point where) const {
  const double column = where.x / correlationMetres;
  const double row = where.y / correlationMetres;
  const double left = std::floor(column);
  const double bottom = std::floor(row);
  const auto corner = [&](double x, double y) {
    const auto i = static_cast<std::uint64_t>(static_cast<std::int64_t>(x));
    const auto j = static_cast<std::uint64_t>(static_cast<std::int64_t>(y));
    return normalFrom(scramble((map << 48) ^ (i & 0xFFFFFFU) ^ ((j & 0xFFFFFFU) << 24) ^ seed_));
  };
  const double u = column - left;
  const double v = row - bottom;
  const double low = corner(left, bottom) * (1 - u) + corner(left + 1, bottom) * u;
  const double high = corner(left, bottom + 1) * (1 - u) + corner(left + 1, bottom + 1) * u;
  return low * (1 - v) + high * v;
}

double Propagation::enclosureLoss(std::uint32_t siteEnclosure, Point where) const {
  double loss = 0;
  for (std::uint32_t number = 1; number <= network_.enclosures.size(); ++number) {
    const Enclosure& enclosure = network_.enclosures[number - 1];
    const double inward = enclosure.radius - length(where - enclosure.centre);
    const double inside = std::clamp(inward / enclosure.edge, 0.0, 1.0);
    loss += enclosure.lossDecibels * (siteEnclosure == number ? 1.0 - inside : inside);
  }
  return loss;
}

void Propagation::receive(Technology technology, Point where, std::span<double> dbmByCell) const {
  // Half of the shadow comes from what stands around the phone, half from what stands along the way to each site.
  constexpr double rootOfHalf = 0.7071067811865476;
  const double deviation = network_.pathLoss.shadowDeviation * rootOfHalf;
  const double around = shadowing(0, where);
  // The loss of each enclosure depends on whether the site stands in it too; most sites stand in the open.
  const double lossFromTheOpen = enclosureLoss(0, where);
  for (const SiteCells& entry : sites_[static_cast<std::size_t>(technology)]) {
    const Site& site = network_.sites[entry.site];
    const Point way = where - site.place;
    const double metres = std::max(length(way), nearestMetres);
    const double loss = network_.pathLoss.slope * 0.1 * toDecibels(metres / 1000.0) +
                        deviation * (around + shadowing(entry.site + 1, where)) +
                        (site.enclosure == 0 ? lossFromTheOpen : enclosureLoss(site.enclosure, where));
    // The sectors of one site's carriers look the same ways, so an angle is rarely worked out twice in a row.
    for (CellIndex index = entry.first; index < entry.end; ++index) {
      const Cell& cell = network_.cells[index];
      const bool sectored = cell.facing.x != 0 || cell.facing.y != 0;
      const double antenna = sectored ? antennaLoss(arcCosineDegrees(dot(way, cell.facing) / metres)) : 0;
      dbmByCell[index] = cellConstant_[index] - loss - antenna;
    }
  }
}

}  // namespace probeview::scenario
