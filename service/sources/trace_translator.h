// SPDX-License-Identifier: Apache-2.0
//
// From the rows of a drive-test log to metrics. What a row says is put on the wire in the wire's units; what it does
// not say is left out: a log knows no PLMN, EARFCN, PCI or band, no causes, and nothing of what the phone sends.
//
//   LTE    serving cell (identity, tracking area), RRC state with the state before and how long it lasted,
//          RSRP/RSRQ/SINR sample, strongest E-UTRA neighbour
//   UMTS   serving cell (identity, location area), RRC state, strongest UTRA neighbour (CPICH RSCP, Ec/No).
//          No metric has a field for the RSCP and Ec/No of the serving cell, so these are not reported.
//   GSM    serving cell (identity, location area, dedicated or not), level in idle and in dedicated mode,
//          RXQUAL in dedicated mode, strongest GSM neighbour
//
// A technology that is left for another is told to be left, as every source does (docs/architecture.md): its RRC state
// becomes NULL (LTE) or INACTIVE (UMTS), its channel not dedicated (GSM).
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <vector>

#include "messages/runtime/codable.h"
#include "service/sources/trace_reader.h"

namespace probeview {

struct TraceMetric {
  std::int64_t metricId = 0;
  std::vector<std::uint8_t> payload;
};

// Follows one drive, row by row. States and serving cells are reported when they change, measurements with every row
// that has one.
class TraceTranslator {
 public:
  // Replaces the content of `metrics` by what the row adds to the rows before.
  void translate(const TraceRow& row, std::vector<TraceMetric>& metrics);
  // The drive begins anew. Between its end and its beginning nobody knows what the phone did, nor for how long; but
  // what was told of the technology that served at the end is ended where the beginning is on another.
  void startOver();

 private:
  struct Cell {
    std::optional<std::uint32_t> identity;
    std::optional<std::uint32_t> area;
    std::optional<bool> dedicated;  // GSM
  };
  // Of which technologies a state was ever told: there is nothing to end of another.
  struct Told {
    bool lte = false;
    bool umts = false;
    bool gsm = false;
  };

  void loseSight();
  void leave(const TraceRow& row);
  bool isNews(const Cell& cell);
  void translateLte(const TraceRow& row);
  void translateUmts(const TraceRow& row);
  void translateGsm(const TraceRow& row);
  void tellLteState(const TraceRow& row, std::int32_t state);
  void tellUmtsState(const TraceRow& row, std::int32_t state);
  void add(std::int64_t metricId, const PBCodable& message);

  std::vector<TraceMetric>* metrics_ = nullptr;
  std::optional<TraceTechnology> technology_;  // that serves, or served before there was none
  std::optional<std::chrono::milliseconds> time_;
  Cell cell_;  // what was told of the cell that serves
  Told told_;
  // The states as told; absent: not known. They are ended, not unknown, while another technology serves.
  std::optional<std::int32_t> lteState_;
  std::optional<std::chrono::milliseconds> lteStateSince_;  // absent: not known
  std::optional<std::int32_t> umtsState_;
};

}  // namespace probeview
