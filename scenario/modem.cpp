// SPDX-License-Identifier: Apache-2.0
#include "scenario/modem.h"

#include "scenario/selection.h"

namespace probeview::scenario {

std::optional<CellIndex> selectionCandidate(const Circumstances& c) {
  if (const auto cell = strongestAllowed(c, Technology::Lte, LteSelection::qRxLevMin)) return cell;
  if (const auto cell = strongestAllowed(c, Technology::Umts, UmtsSelection::qRxLevMin)) return cell;
  return strongestAllowed(c, Technology::Gsm, GsmSelection::rxLevAccessMin);
}

std::optional<CellIndex> strongerCell(const Circumstances& c, Technology technology, CellIndex serving, double level) {
  for (const CellIndex cell : c.surroundings.heard(technology)) {
    if (cell == serving || c.network.cells[cell].areaCode == c.network.forbiddenAreaCode) continue;
    if (c.surroundings.strength(cell) > level) return cell;
    break;
  }
  return std::nullopt;
}

}  // namespace probeview::scenario
