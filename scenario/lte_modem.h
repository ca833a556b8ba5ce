// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "messages/lte_messages.h"
#include "scenario/modem.h"

namespace probeview::scenario {

using LteConnection = KCellularLteRrcState::State;
using LteCause = KCellularLteRrcState::Cause;
using SecondaryState = SecondaryComponentCarrier::State;

struct SecondaryCarrier {
  CellIndex cell = 0;
  std::uint32_t index = 1;  // from 1; stays as long as the carrier is there, whatever becomes of the others
  SecondaryState::Value state = SecondaryState::SCC_STATE_CONFIGURED_DEACTIVATED;
  double rsrp = 0, rsrq = 0, sinr = 0, rssi = 0;
};

// One look at the serving cell with both antennas, between the slower measurements of layer 1.
struct LteSample {
  CellIndex cell = 0;
  std::array<double, 2> rsrp{};
  std::array<double, 2> rsrq{};
  std::array<double, 2> sinr{};
};

// What one uplink subframe was sent with, in dBm.
struct TransmitPower {
  std::optional<double> control;  // PUCCH
  std::optional<double> shared;   // PUSCH, or the whole of UTRA's uplink
  unsigned subframe = 0;          // 0 to 9
};

struct LteState {
  LteConnection::Value connection = LteConnection::KLTE_RRC_STATE_NULL;
  std::optional<LteConnection::Value> previous;  // none before the first change
  Milliseconds since = 0;
  Milliseconds previousDuration = 0;
  LteCause::Value cause = LteCause::KLTE_RRC_CAUSE_NA;
  std::optional<CellIndex> serving;  // the cell that serves, or the last one that did
  double rsrp = 0, rsrq = 0, sinr = 0;
  NeighbourLists neighbours;
  std::vector<LteSample> samples;  // the ten at most of the last report, the oldest first
  std::vector<TransmitPower> transmitPowers;
  std::vector<SecondaryCarrier> secondaries;
  unsigned transmissionMode = 3;

  // C-DRX is configured with the connection and ends with it, also when the phone leaves, looks for a cell in which to
  // go on or is on its way to another technology (3GPP TS 36.331, 5.3.7.2, 5.3.12 and 5.4.3).
  bool drxConfigured() const { return connected(); }
  bool connected() const { return connection == LteConnection::KLTE_RRC_STATE_CONNECTED; }
  bool camped() const { return connection != LteConnection::KLTE_RRC_STATE_NULL; }
};

// The phone in E-UTRA: idle mode, connections, handover, carrier aggregation, radio link failure.
class LteModem {
 public:
  explicit LteModem(const Network& network) : network_(network) {}

  const LteState& state() const { return state_; }

  // Camps on a cell, or arrives in it with a connection.
  void enter(CellIndex cell, Manner manner, const Circumstances& c);
  // The phone has gone to another technology.
  void leave(LteCause::Value cause, const Circumstances& c);
  // Goes one step on. A departure is the wish to be elsewhere; the phone then calls leave() here and enter() there.
  std::optional<Departure> advance(const Circumstances& c);
  // Whether the cell that served is gone and no other of this technology has been found.
  bool lost() const { return lost_; }

 private:
  void change(LteConnection::Value to, LteCause::Value cause, const Circumstances& c);
  void serve(CellIndex cell, const Circumstances& c);
  void measure(const Circumstances& c);
  void sample(const Circumstances& c);
  void control(const Circumstances& c);
  std::optional<Departure> advanceIdle(const Circumstances& c);
  std::optional<CellIndex> reselectionCandidate(const Circumstances& c) const;
  std::optional<Departure> advanceConnected(const Circumstances& c);
  std::optional<CellIndex> handoverCandidate(const Circumstances& c) const;
  std::optional<CellIndex> outboundCandidate(const Circumstances& c) const;
  void superviseLink(const Circumstances& c);
  void beginReestablishment(LteCause::Value cause, const Circumstances& c);
  void advanceReestablishment(const Circumstances& c);
  void aggregate(const Circumstances& c);
  void endAggregation(const Circumstances& c);
  void forgetDeconfigured(const Circumstances& c);
  void becomeConnected(LteCause::Value cause, const Circumstances& c);

  const Network& network_;
  LteState state_;
  Milliseconds deadline_ = 0;  // of the present state, where it has one
  Milliseconds backOff_ = 0;   // no connection attempt before
  Milliseconds lastActivity_ = 0;
  Milliseconds downloadSince_ = -1;
  FailingCell failing_;
  int outOfSync_ = 0;
  Milliseconds t310Ends_ = -1;
  bool reestablishing_ = false;
  bool lost_ = false;
  Pending reselection_;
  Pending handover_;
  Pending outbound_;
  std::optional<CellIndex> executing_;  // the target of a handover that has been ordered
  Milliseconds executesAt_ = 0;
  std::optional<Departure> leaving_;  // a departure that has been ordered
  unsigned nextSubframe_ = 0;
  std::vector<LteSample> samples_;  // those of the serving cell up to now, ten at most, the oldest first
};

}  // namespace probeview::scenario
