// SPDX-License-Identifier: Apache-2.0
//
// Reads a drive-test log: comma-separated rows, about one a second, under a line that names the columns. Knows what the
// columns mean and nothing of metrics; what a row does not say stays absent.
//
// Columns are found by name, in any order, others may stand between them:
//   Timestamp          yyyy.MM.dd_HH.mm.ss, taken as UTC
//   NetworkMode        LTE, 5G (the values are those of the LTE anchor), UMTS, HSDPA, HSUPA, HSPA, HSPA+, GSM, GPRS,
//   EDGE RSRP, RSRQ         the serving cell's level and quality: RSRP dBm and RSRQ dB on LTE, CPICH RSCP dBm and Ec/No
//   dB on
//                      UMTS, RXLEV in dBm and RXQUAL 0…7 on GSM
//   SNR                signal to noise ratio in dB, on LTE
//   State              I (idle), D (data), V (voice), VD (both)
//   LACHEX             tracking area code (LTE) or location area code, hexadecimal
//   RAWCELLID          the full cell identity, decimal: 28 bits on LTE and UMTS, 16 bits on GSM
//   NRxRSRP, NRxRSRQ   the strongest neighbour's level and quality
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
  std::optional<std::uint32_t> cellIdentity;  // LTE: 28-bit ECI; UMTS: 28 bits; GSM: 16 bits
  std::optional<std::uint32_t> areaCode;      // LTE: tracking area; else location area
  std::optional<double> level;                // dBm: RSRP, CPICH RSCP or RXLEV
  std::optional<double> quality;              // RSRQ dB, CPICH Ec/No dB or RXQUAL
  std::optional<double> signalToNoise;        // dB
  std::optional<double> neighbourLevel;       // as level
  std::optional<double> neighbourQuality;     // as quality
};

struct TraceLog {
  std::vector<TraceRow> rows;  // in the order of the file; times may repeat and go back
  // What was skipped or left out, each with its line; at most traceProblemsKept of them.
  std::vector<std::string> problems;
  std::size_t problemCount = 0;
  std::size_t rowsSkipped = 0;
};

struct TraceLogResult {
  std::optional<TraceLog> log;
  std::string error;  // why this is no such log: what, where
};

inline constexpr std::size_t traceFileSizeLimit = 32u << 20;  // bytes; about ninety hours of driving
inline constexpr std::size_t traceLineLengthLimit = 4096;     // bytes; a row has about a hundred and twenty
inline constexpr std::size_t traceRowLimit = 500'000;
inline constexpr std::size_t traceProblemsKept = 20;

// Any bytes may come in; independent of the process's locale.
TraceLogResult readTraceLog(std::string_view text);

// The file's whole content, or why it cannot be had. Regular files only, up to traceFileSizeLimit.
struct TraceTextResult {
  std::optional<std::string> text;
  std::string error;
};
TraceTextResult readTraceFile(const std::string& path);

}  // namespace probeview
