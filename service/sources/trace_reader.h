// SPDX-License-Identifier: Apache-2.0
//
// Reads a drive-test log: comma-separated rows, about one a second, under a line that names the columns. Knows what the
// columns mean and nothing of metrics; what a row does not say stays absent. docs/traces.md tells it to users.
//
// Columns are found by name, in any order, others may stand between them; "-" and nothing are no value:
//   Timestamp          yyyy.MM.dd_HH.mm.ss, taken as UTC
//   NetworkMode        LTE, 5G (the values are those of the LTE anchor);
//                      UMTS, HSDPA, HSUPA, HSPA, HSPA+;
//                      GSM, GPRS, EDGE
//   RSRP, RSRQ         the serving cell's level and quality in whatever the technology calls them:
//                      RSRP in dBm and RSRQ in dB on LTE, CPICH RSCP in dBm and Ec/No in dB on UMTS,
//                      RXLEV in dBm and RXQUAL 0 to 7 on GSM
//   SNR                signal to noise ratio in dB, on LTE
//   State              I (idle), D (data), V (voice), VD (both)
//   LACHEX             tracking area code (LTE) or location area code, hexadecimal
//   RAWCELLID          the full cell identity, decimal: 28 bits on LTE and UMTS, 16 bits on GSM
//   NODEHEX, CELLHEX   the same in two parts, hexadecimal; trace_cell.h says how they must fit. A file may lack them.
//   NRxRSRP, NRxRSRQ   the strongest neighbour's level and quality
//
// Numbers that the logger writes when it knows nothing are no value either: a level of -51 with a quality of -24, and
// for a neighbour also without any; a serving level of -51 on GSM, whatever RXQUAL says; a row whose RSRP, RSRQ and SNR
// are -200, -20 and -30.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace probeview {

enum class TraceTechnology : std::uint8_t { Lte, Umts, Gsm };

// What the State column says: idle, or active with data, voice or both.
struct TraceActivity {
  bool data = false;
  bool voice = false;
  bool idle() const { return !data && !voice; }
  friend bool operator==(const TraceActivity&, const TraceActivity&) = default;
};

struct TraceRow {
  std::uint32_t line = 0;                     // in the file, from 1
  std::chrono::milliseconds time{};           // since 1970-01-01 UTC
  std::optional<TraceTechnology> technology;  // absent: no service
  std::optional<TraceActivity> activity;
  std::optional<std::uint32_t> cellIdentity;  // LTE: 28-bit ECI; UMTS: 28 bits; GSM: 16 bits; absent: not known
  std::optional<std::uint32_t> areaCode;      // of that cell; LTE: tracking area; else location area
  std::optional<double> level;                // dBm: RSRP, CPICH RSCP or RXLEV
  std::optional<double> quality;              // RSRQ dB, CPICH Ec/No dB or RXQUAL
  std::optional<double> signalToNoise;        // dB
  std::optional<double> neighbourLevel;       // as level
  std::optional<double> neighbourQuality;     // as quality
};

struct TraceLog {
  std::vector<TraceRow> rows;  // in the order of the file; times may repeat and go back
  // What was skipped or left out, each with its line, in the order of the lines. Rows in a row whose cell is not known
  // are one. At most traceProblemsKept of these, and as many of all others: a column that is bad throughout must not
  // hide them.
  std::vector<std::string> problems;
  std::size_t problemCount = 0;
  std::size_t rowsSkipped = 0;
  // What is to be said of the file as a whole; empty when there is nothing.
  std::string remark;
};

struct TraceLogResult {
  std::optional<TraceLog> log;
  std::string error;  // why this is no such log: what, where
};

inline constexpr std::size_t traceLineLengthLimit = 4096;  // bytes; a row has about a hundred and twenty
inline constexpr std::size_t traceRowLimit = 500'000;
inline constexpr std::size_t traceProblemsKept = 20;  // of each of the two kinds

// Any bytes may come in; independent of the process's locale.
TraceLogResult readTraceLog(std::string_view text);

}  // namespace probeview
