// SPDX-License-Identifier: Apache-2.0
#include "scenario/modem.h"

#include "scenario/selection.h"

namespace probeview::scenario {

std::optional<CellIndex> selectionCandidate(const Circumstances& c) {
  if (const auto cell = strongestAllowed(c, Technology::Lte, LteSelection::qRxLevMin)) return cell;
  if (const auto cell = strongestAllowed(c, Technology::Umts, UmtsSelection::qRxLevMin)) return cell;
  return strongestAllowed(c, Technology::Gsm, GsmSelection::rxLevAccessMin);
}

}  // namespace probeview::scenario
