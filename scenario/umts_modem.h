// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <vector>

#include "scenario/lte_modem.h"
#include "scenario/modem.h"

namespace probeview::scenario {

// The numbers are those of the metric service.
enum class UmtsConnection : std::int32_t {
  Inactive = 1,
  Idle = 2,
  Establishing = 3,
  UraPch = 4,
  CellPch = 5,
  CellFach = 6,
  CellDch = 7,
  Releasing = 8,
  RadioLinkFailure = 9,
  SignallingReleaseIndicated = 10,
};

enum class UmtsEstablishment : std::int32_t {
  OriginatingCall = 0,
  OriginatingInteractive = 2,
  OriginatingBackground = 3,
  TerminatingCall = 5,
  TerminatingInteractive = 7,
  InterRatReselection = 10,
  Registration = 12,
};

enum class UmtsRelease : std::int32_t {
  Other = 0,
  Normal = 4,
  CellChanged = 6,
  SignallingConnectionRelease = 10,
  LowerLayerFailureDownlink = 13,
};

struct UmtsState {
  UmtsConnection connection = UmtsConnection::Inactive;
  std::optional<UmtsEstablishment> establishment;  // of the present or last connection
  std::optional<UmtsRelease> release;              // of the last connection, until the next one
  std::optional<CellIndex> serving;                // the cell that serves, or the last one that did
  double rscp = 0, ecNo = 0, pilotRatio = 0, carrierPower = 0;
  std::array<double, 2> antennaPower{};  // the carrier's power at each antenna, dBm
  bool measuredConnected = false;        // whether that was measured in connected mode
  NeighbourLists neighbours;
  std::vector<TransmitPower> transmitPowers;
  std::optional<unsigned> drxCycle;  // ms; none while the phone listens all the time
  bool dualCarrier = false;

  bool camped() const { return connection != UmtsConnection::Inactive; }
  // With a dedicated or shared channel of its own.
  bool connected() const { return connection == UmtsConnection::CellFach || connection == UmtsConnection::CellDch; }
  // UTRA RRC connected mode (3GPP TS 25.331, 7): from the establishment of a connection until it has been released,
  // also while the phone only listens for pages.
  bool connectedMode() const {
    return camped() && connection != UmtsConnection::Idle && connection != UmtsConnection::Establishing;
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
  void change(UmtsConnection to, const Circumstances& c);
  void configure(const Circumstances& c);
  void serve(CellIndex cell, const Circumstances& c);
  void measure(const Circumstances& c);
  void control(const Circumstances& c);
  void release(UmtsRelease cause, const Circumstances& c);
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
  Milliseconds cellFailingSince_ = -1;
  int outOfSync_ = 0;
  bool lost_ = false;
  Pending reselection_;
  Pending bestCell_;
  Pending outbound_;
};

}  // namespace probeview::scenario
