// SPDX-License-Identifier: Apache-2.0
#include "scenario/network.h"

#include "scenario/random.h"

namespace probeview::scenario {
namespace {

// North and its third parts of a circle, and the same turned by 30, 60 and 90 degrees.
Point direction(double degrees) {
  constexpr double halfRootOfThree = 0.8660254037844386;
  const auto twelfth = static_cast<int>(degrees / 30.0 + 0.5) % 12;
  switch (twelfth) {
    case 0:
      return {0, 1};
    case 1:
      return {0.5, halfRootOfThree};
    case 2:
      return {halfRootOfThree, 0.5};
    case 3:
      return {1, 0};
    case 4:
      return {halfRootOfThree, -0.5};
    case 5:
      return {0.5, -halfRootOfThree};
    case 6:
      return {0, -1};
    case 7:
      return {-0.5, -halfRootOfThree};
    case 8:
      return {-halfRootOfThree, -0.5};
    case 9:
      return {-1, 0};
    case 10:
      return {-halfRootOfThree, 0.5};
    default:
      return {-0.5, halfRootOfThree};
  }
}

}  // namespace

std::uint32_t bandwidthMegahertz(const Carrier& carrier) { return carrier.resourceBlocks / 5; }

std::uint32_t areaCodeOf(std::uint32_t area) { return 0x1001 + area; }

CarrierIndex NetworkBuilder::add(Carrier carrier) {
  network_.carriers.push_back(carrier);
  return static_cast<CarrierIndex>(network_.carriers.size() - 1);
}

std::uint32_t NetworkBuilder::add(Enclosure enclosure) {
  network_.enclosures.push_back(enclosure);
  return static_cast<std::uint32_t>(network_.enclosures.size());
}

void NetworkBuilder::add(const SitePlan& plan) {
  const auto site = static_cast<std::uint32_t>(network_.sites.size());
  network_.sites.push_back({plan.place, plan.enclosure});
  // A different seed numbers the same sites differently.
  const auto offset = static_cast<std::uint32_t>(scramble(seed_) % 150);
  std::uint32_t layer = 0;
  for (const CarrierIndex carrier : plan.carriers) {
    const Technology technology = network_.carriers[carrier].technology;
    for (std::uint32_t sector = 0; sector < plan.sectors; ++sector) {
      Cell cell;
      cell.site = site;
      cell.carrier = carrier;
      cell.powerOffset = plan.powerOffset;
      if (plan.sectors > 1) cell.facing = direction(plan.turnDegrees + 360.0 / plan.sectors * sector);
      cell.areaCode = areaCodeOf(plan.area);
      cell.routingAreaCode = 1 + plan.area;
      cell.load = 0.25 + 0.5 * static_cast<double>(scramble(seed_ + network_.cells.size()) % 100) / 100.0;
      const std::uint32_t number = (site + offset) * 3 + sector;
      switch (technology) {
        case Technology::Lte:
          cell.physicalIdentity = number % 504;
          cell.identity = (0x0A00 + site) << 8 | (layer * 3 + sector + 1);
          break;
        case Technology::Umts:
          cell.physicalIdentity = (number * 8) % 512;
          cell.identity = 0x0101U << 16 | (site * 16 + layer * 3 + sector + 1);
          break;
        case Technology::Gsm:
          // Network colour codes 2 to 5, and base station colour codes so that re-used channels tell apart.
          cell.physicalIdentity = 2 * 8 + (site + offset) % 32;
          cell.identity = 10001 + site * 10 + sector + layer % 3;
          break;
      }
      network_.cells.push_back(cell);
      // The sectors of a GSM site have each a carrier of their own.
      if (technology == Technology::Gsm) break;
    }
    ++layer;
  }
  // A GSM sector looks where its number among the site's GSM carriers says.
  if (plan.sectors > 1) {
    std::uint32_t sector = 0;
    for (Cell& cell : network_.cells) {
      if (cell.site != site || network_.carriers[cell.carrier].technology != Technology::Gsm) continue;
      cell.facing = direction(plan.turnDegrees + 360.0 / plan.sectors * (sector % plan.sectors));
      cell.identity = 10001 + site * 10 + sector;
      ++sector;
    }
  }
}

}  // namespace probeview::scenario
