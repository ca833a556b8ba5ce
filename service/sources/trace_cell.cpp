// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_cell.h"

#include "messages/quantities.h"
#include "service/sources/trace_field.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

struct Layout {
  std::string_view technology;
  std::uint32_t cellsOfNode;  // how many cells a node may have; 0: there are no nodes
  std::uint32_t highestIdentity;
};
Layout layoutOf(TraceTechnology technology) {
  switch (technology) {
    case TraceTechnology::Lte:
      break;
    case TraceTechnology::Umts:
      return {"UMTS", 0x10000, (1U << quantities::utraCellIdentity.bits) - 1};
    case TraceTechnology::Gsm:
      return {"GSM", 0, static_cast<std::uint32_t>(quantities::gsmCellIdentity.numbers.highest)};
  }
  return {"LTE", 0x100, (1U << quantities::eutraCellIdentity.bits) - 1};
}

// The identity that the parts make; absent when they make none.
std::optional<std::uint64_t> combined(const TraceCellParts& parts, const Layout& layout) {
  const auto cell = parseNumber<std::uint32_t>(parts.cell, 16);
  if (!cell) return std::nullopt;
  if (layout.cellsOfNode == 0) return *cell;
  const auto node = parseNumber<std::uint32_t>(parts.node, 16);
  if (!node || *cell >= layout.cellsOfNode) return std::nullopt;
  return std::uint64_t{*node} * layout.cellsOfNode + *cell;
}

}  // namespace

TraceCell traceCell(TraceTechnology technology, std::uint64_t identity, const std::optional<TraceCellParts>& parts) {
  // The logger writes 0 when it has no cell.
  if (identity == 0) return {};
  const Layout layout = layoutOf(technology);
  const std::string written = "RAWCELLID " + std::to_string(identity);
  const std::string ofTechnology(layout.technology);
  if (identity > layout.highestIdentity) {
    return {std::nullopt,
            written + " is above " + std::to_string(layout.highestIdentity) + " and thus no cell of " + ofTechnology};
  }
  if (parts) {
    if (combined(*parts, layout) != identity) {
      return {std::nullopt, written + " is not what NODEHEX " + shownField(parts->node) + " and CELLHEX " +
                                shownField(parts->cell) + " make on " + ofTechnology};
    }
    if (technology == TraceTechnology::Umts && identity < layout.cellsOfNode) {
      return {std::nullopt, written + " has the RNC 0 and thus is no cell of UMTS"};
    }
  }
  return {static_cast<std::uint32_t>(identity), {}};
}

}  // namespace probeview
