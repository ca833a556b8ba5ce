// SPDX-License-Identifier: Apache-2.0
//
// Which cell a row of a drive-test log names, if it can be believed. When the phone changes between technologies,
// loggers write the identity of the cell that was left into rows of the technology that serves now. They write it
// twice, whole and in two parts, and the parts give it away: they are those of the other technology.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "service/sources/trace_reader.h"

namespace probeview {

// The two parts of an identity as the row holds them, hexadecimal or "-".
struct TraceCellParts {
  std::string_view node;  // NODEHEX: the eNB (LTE) or the RNC (UMTS); "-" on GSM
  std::string_view cell;  // CELLHEX: the cell in it
};

struct TraceCell {
  std::optional<std::uint32_t> identity;
  // Why an identity that is written down is not known; empty where it is known, or none is written down.
  std::string doubt;
};

// The cell that RAWCELLID and its parts name, by what an identity is made of (3GPP TS 36.413, 9.2.1.37; 25.331,
// 10.3.2.2; 23.003, 4.3.1):
//   LTE    node × 256 + cell, the cell below 256
//   UMTS   node × 65536 + cell, the cell below 65536; a node of 0 is none
//   GSM    the cell alone, below 65536
// 0 is no identity. Without parts, in a file that lacks their columns, the identity is taken as it stands as long as it
// is no wider than one of the technology.
TraceCell traceCell(TraceTechnology technology, std::uint64_t identity, const std::optional<TraceCellParts>& parts);

}  // namespace probeview
