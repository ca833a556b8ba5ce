// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "scenario/modem.h"

namespace probeview::scenario {

enum class GsmConnection : std::uint8_t { Inactive, Idle, Dedicated };

struct GsmState {
  GsmConnection connection = GsmConnection::Inactive;
  std::optional<CellIndex> serving;        // the cell that serves, or the last one that did
  double rxLev = 0;                        // dBm
  unsigned rxQual = 0;                     // 0 to 7; of dedicated mode
  std::optional<CellIndex> dedicatedCell;  // where dedicated mode was measured last, and with which level
  double dedicatedRxLev = 0;
  std::vector<int> transmitPowers;  // dBm, of dedicated mode, the last four at most
  unsigned antenna = 0;
  NeighbourLists neighbours;

  bool camped() const { return connection != GsmConnection::Inactive; }
};

// The phone in GSM: idle mode, calls and signalling in dedicated mode, handover, packet data on the side.
class GsmModem {
 public:
  explicit GsmModem(const Network& network) : network_(network) {}

  const GsmState& state() const { return state_; }
  void enter(CellIndex cell, Manner manner, const Circumstances& c);
  void leave(const Circumstances& c);
  std::optional<Departure> advance(const Circumstances& c);
  bool lost() const { return lost_; }

 private:
  void change(GsmConnection to, const Circumstances& c);
  void serve(CellIndex cell, const Circumstances& c);
  void measure(const Circumstances& c);
  std::optional<CellIndex> reselectionCandidate(const Circumstances& c) const;

  const Network& network_;
  GsmState state_;
  int powerStep_ = 0;
  FailingCell failing_;
  bool lost_ = false;
  Pending reselection_;
  Pending handover_;
};

}  // namespace probeview::scenario
