// SPDX-License-Identifier: Apache-2.0
//
// What must hold at every moment of every drive, and what was found: how often each rule was put to the test, where it
// was broken first, and which transitions were seen at all.
#pragma once

#include <array>
#include <chrono>
#include <cstddef>
#include <map>
#include <set>
#include <string>
#include <string_view>

namespace probeview {

enum class Rule : std::size_t {
  TimestampIsTheRecords,
  TimeOfAMetricNeverGoesBack,
  LeavingIsToldBeforeTheNextTechnology,
  LeavingIsToldAtTheMomentOfArrival,
  WhatIsLeftIsSilent,
  LtePreviousStateIsTheOneBefore,
  LteDurationIsExact,
  LteComesBackFromNull,
  DrxNamesTheStateThatIs,
  DrxIsConfiguredInConnectedAlone,
  LteCellChangesAtOneMoment,
  LteRanges,
  LteChannelInBand,
  LteNeighbourIsNotTheServingCell,
  LtePowerWhileSending,
  CarriersAreThoseOfTheServingCell,
  CarriersAreDistinct,
  SecondaryKeepsItsIndex,
  SecondaryNeverNamesThePrimary,
  SecondaryOnlyWhileConnected,
  DeconfiguredHasNoMeasurements,
  DeconfiguredWasConfiguredInThisConnection,
  UmtsCellChangesAtOneMoment,
  UmtsRanges,
  UmtsChannelInBand,
  UmtsNeighbourIsNotTheServingCell,
  UmtsConnectedModeIsThatOfTheState,
  UmtsPowerWhileSending,
  UmtsConfigurationIsOverWhenLeft,
  UmtsMeasurementsEndUnconnected,
  GsmCellChangesAtOneMoment,
  GsmRanges,
  GsmChannelInBand,
  GsmNeighbourIsNotTheServingCell,
  GsmMeasurementIsThatOfTheMode,
  GsmWithoutACellIsNotDedicated,
  MobilityRanges,
  TmsiIsTheVisitorRegisters,
  PacketTmsiIsTheServingNodes,
  BearersAreDistinct,
  Count,
};

std::string_view nameOf(Rule rule);

class Findings {
 public:
  // A new drive begins.
  void begin(std::string drive) { drive_ = std::move(drive); }
  // ... and the record at this time of it is looked at.
  void at(std::chrono::milliseconds sinceTheStart) { now_ = sinceTheStart; }

  void expect(Rule rule, bool holds);
  template <typename Number>
  void expectBetween(Rule rule, Number value, std::int64_t lowest, std::int64_t highest) {
    expect(rule, std::int64_t{value} >= lowest && std::int64_t{value} <= highest);
  }
  void reach(const std::string& transition) { reached_.insert(transition); }

  // One line for each rule that was broken, or never put to the test.
  std::string broken() const;
  const std::set<std::string>& reached() const { return reached_; }

 private:
  struct Tally {
    std::size_t asked = 0, broken = 0;
    std::string first;  // where it was broken first
  };
  std::array<Tally, static_cast<std::size_t>(Rule::Count)> tallies_;
  std::set<std::string> reached_;
  std::string drive_;
  std::chrono::milliseconds now_{};
};

}  // namespace probeview
