// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace probeview::scenario {

// Simulated time since power-on.
using Milliseconds = std::int64_t;

// The model goes forward in steps of this length; everything in it happens at a multiple.
constexpr Milliseconds stepTime = 40;
// How often the technology in service is measured: the layer 1 period of 3GPP TS 36.133, 8.1.2.2.1.
constexpr Milliseconds measurementPeriod = 200;

// The things about the phone that can be reported, one for each metric. What is learnt at one moment is reported in
// this order: which cell serves before what has been measured of it.
enum class Fact : std::uint8_t {
  LteConnection,
  LteServingCell,
  LteSelection,
  LteComponentCarriers,
  LteAggregation,
  LteDrx,
  UmtsConnection,
  UmtsServingCell,
  UmtsSelection,
  UmtsConfiguration,
  GsmServingCell,
  GsmIdleConfiguration,
  GsmPacketConfiguration,
  LteSamples,
  LteTransmitPower,
  LteNeighbours,
  LteInterRatNeighbours,
  UmtsServingMeasurement,
  UmtsTransmitPower,
  UmtsNeighbours,
  GsmIdleMeasurement,
  GsmDedicatedMeasurement,
  GsmNeighbours,
  EpsContext,
  GprsContext,
  MobilityContext,
  MobilityCommon,
  Bearers,
  SimFiles,
};
constexpr std::size_t factCount = static_cast<std::size_t>(Fact::SimFiles) + 1;

// When each fact was last learnt. A report is due when the revision has moved on.
class Facts {
 public:
  struct Entry {
    Milliseconds learnt = -1;    // -1: never yet
    std::uint32_t revision = 0;  // moves on each time that the fact is learnt anew
    bool holds = false;          // whether it is still so
    bool left = false;           // it is not, because the phone has left the technology
    bool lastWord = false;       // it was learnt as the technology was left, and is to be told all the same
    bool outdated = false;       // what was learnt is of no use any more, and it is about to be learnt anew
  };

  void learn(Fact fact, Milliseconds now) {
    Entry& entry = entries_[static_cast<std::size_t>(fact)];
    entry.learnt = now;
    ++entry.revision;
    entry.holds = true;
    entry.left = entry.lastWord = entry.outdated = false;
  }
  // What was measured is of another cell; the measurement of this one goes on.
  void beginAnew(Fact fact) {
    Entry& entry = entries_[static_cast<std::size_t>(fact)];
    entry.holds = entry.outdated = true;
    entry.left = entry.lastWord = false;
  }
  void end(Fact fact) { entries_[static_cast<std::size_t>(fact)].holds = false; }
  // The phone has left the technology. A state that has changed with that is told, a measurement that waits is not.
  void leave(Fact fact) {
    Entry& entry = entries_[static_cast<std::size_t>(fact)];
    entry.holds = false;
    entry.left = true;
  }
  // ... but this measurement is told: it says that the phone has left.
  void leaveWithLastWord(Fact fact, Milliseconds now) {
    learn(fact, now);
    leave(fact);
    entries_[static_cast<std::size_t>(fact)].lastWord = true;
  }
  const Entry& operator[](Fact fact) const { return entries_[static_cast<std::size_t>(fact)]; }

 private:
  std::array<Entry, factCount> entries_{};
};

}  // namespace probeview::scenario
