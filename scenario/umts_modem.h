// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <vector>

#include "messages/umts_messages.h"
#include "scenario/lte_modem.h"
#include "scenario/modem.h"

namespace probeview::scenario {

using UmtsConnection = KCellularWcdmaRrcConnectionState::State;
using UmtsEstablishment = KCellularWcdmaRrcConnectionState::EstablishmentCause;
using UmtsRelease = KCellularWcdmaRrcConnectionState::ReleaseCause;

struct UmtsState {
  UmtsConnection::Value connection = UmtsConnection::KWCDMA_RRC_CONN_STATE_INACTIVE;
  std::optional<UmtsEstablishment::Value> establishment;  // of the present or last connection
  std::optional<UmtsRelease::Value> release;              // of the last connection, until the next one
  std::optional<CellIndex> serving;                       // the cell that serves, or the last one that did
  double rscp = 0, ecNo = 0, pilotRatio = 0, carrierPower = 0;
  std::array<double, 2> antennaPower{};  // the carrier's power at each antenna, dBm
  bool measuredConnected = false;        // whether that was measured in connected mode
  NeighbourLists neighbours;
  std::vector<TransmitPower> transmitPowers;
  std::optional<unsigned> drxCycle;  // ms; none while the phone listens all the time
  bool dualCarrier = false;

  bool camped() const { return connection != UmtsConnection::KWCDMA_RRC_CONN_STATE_INACTIVE; }
  // With a dedicated or shared channel of its own.
  bool connected() const {
    return connection == UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_FACH ||
           connection == UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_DCH;
  }
  // UTRA RRC connected mode (3GPP TS 25.331, 7): from the establishment of a connection until it has been released,
  // also while the phone only listens for pages.
  bool connectedMode() const {
    return camped() && connection != UmtsConnection::KWCDMA_RRC_CONN_STATE_IDLE &&
           connection != UmtsConnection::KWCDMA_RRC_CONN_STATE_ESTABLISH;
  }
};

// The phone in UTRA: idle mode, the connected states, change of the best cell, radio link failure.
class UmtsModem {
 public:
  explicit UmtsModem(const Network& network) : network_(network) {}

  const UmtsState& state() const { return state_; }
  void enter(CellIndex cell, Manner manner, const Circumstances& c);
  void leave(const Circumstances& c);
  std::optional<Departure> advance(const Circumstances& c);
  bool lost() const { return lost_; }

 private:
  void change(UmtsConnection::Value to, const Circumstances& c);
  void configure(const Circumstances& c);
  void serve(CellIndex cell, const Circumstances& c);
  void measure(const Circumstances& c);
  void control(const Circumstances& c);
  void release(UmtsRelease::Value cause, const Circumstances& c);
  std::optional<Departure> advanceIdle(const Circumstances& c);
  void advanceChannel(const Circumstances& c);
  std::optional<Departure> changeCell(const Circumstances& c);
  std::optional<CellIndex> reselectionCandidate(const Circumstances& c) const;

  const Network& network_;
  UmtsState state_;
  Milliseconds since_ = 0;
  Milliseconds deadline_ = 0;
  Milliseconds backOff_ = 0;
  Milliseconds lastActivity_ = 0;
  FailingCell failing_;
  int outOfSync_ = 0;
  bool lost_ = false;
  Pending reselection_;
  Pending bestCell_;
  Pending outbound_;
};

}  // namespace probeview::scenario
