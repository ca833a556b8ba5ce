// SPDX-License-Identifier: Apache-2.0
//
// The phone of a scenario: it travels, measures, camps, connects and registers. Everything is a function of the world
// and the seed; time is what advance() says it is.
#pragma once

#include <cstdint>
#include <optional>

#include "scenario/bearers.h"
#include "scenario/facts.h"
#include "scenario/gsm_modem.h"
#include "scenario/lte_modem.h"
#include "scenario/registration.h"
#include "scenario/surroundings.h"
#include "scenario/traffic.h"
#include "scenario/umts_modem.h"
#include "scenario/world.h"

namespace probeview::scenario {

class Phone {
 public:
  Phone(World world, std::uint64_t seed);
  Phone(const Phone&) = delete;
  Phone& operator=(const Phone&) = delete;

  // One step of stepTime. The first one is the moment of power-on.
  void advance();

  Milliseconds now() const { return now_; }
  const Network& network() const { return world_.network; }
  const Surroundings& surroundings() const { return surroundings_; }
  const Facts& facts() const { return facts_; }
  // The technology in service.
  std::optional<Technology> technology() const { return technology_; }
  const LteState& lte() const { return lte_.state(); }
  const UmtsState& umts() const { return umts_.state(); }
  const GsmState& gsm() const { return gsm_.state(); }
  const Registration& registration() const { return registration_; }
  const Traffic& traffic() const { return traffic_; }
  const std::vector<Bearer>& bearers() const { return bearers_.active(); }

 private:
  void measure();
  Circumstances circumstances();
  bool connected() const;
  std::optional<CellIndex> servingCell() const;
  void powerOn();
  void search();
  void go(const Departure& departure);
  void leave(LteCause::Value cause);
  void loseService();

  World world_;
  Surroundings surroundings_;
  Traffic traffic_;
  Registration registration_;
  Bearers bearers_;
  LteModem lte_;
  UmtsModem umts_;
  GsmModem gsm_;
  Facts facts_;
  Random random_;
  Milliseconds now_ = -stepTime;
  std::optional<Technology> technology_;
  std::optional<CellIndex> lastCell_;  // the cell that mobility management knows of
  bool firstSearch_ = true;
  bool wasConnected_ = false;
  bool measured_ = false;
  unsigned attaches_ = 0;
};

}  // namespace probeview::scenario
