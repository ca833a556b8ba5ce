// SPDX-License-Identifier: Apache-2.0
#include "scenario/phone.h"

#include <gtest/gtest.h>

#include <map>

#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

constexpr Milliseconds hour = 3600 * 1000;

TEST(Phone, IsSwitchedOnAndLooksThroughAllTechnologiesBeforeItStaysInLte) {
  for (std::uint64_t seed = 1; seed <= 100; ++seed) {
    for (const auto& make : {cityWorld, highwayWorld, indoorWorld}) {
      Phone phone(make(seed), seed);
      std::vector<Technology> visited;
      while (phone.now() < 1900) {
        phone.advance();
        if (phone.technology() && (visited.empty() || visited.back() != *phone.technology())) {
          visited.push_back(*phone.technology());
        }
      }
      EXPECT_EQ(visited, (std::vector{Technology::Gsm, Technology::Umts, Technology::Lte})) << "seed " << seed;
      EXPECT_TRUE(phone.registration().eps().registered());
      for (std::size_t fact = 0; fact < factCount; ++fact) {
        EXPECT_GE(phone.facts()[static_cast<Fact>(fact)].learnt, 0) << "seed " << seed << ", fact " << fact;
      }
    }
  }
}

// Watches a phone as an independent observer would: which candidate has fulfilled a handover's condition, since when.
TEST(Phone, HandsOverOnlyWhatHasBeenBetterForTheTimeToTrigger) {
  int handovers = 0;
  for (std::uint64_t seed = 1; seed <= 3; ++seed) {
    Phone phone(cityWorld(seed), seed);
    std::map<CellIndex, Milliseconds> better;
    std::optional<CellIndex> serving;
    bool wasConnected = false;
    while (phone.now() < hour / 2) {
      phone.advance();
      const bool connected = phone.technology() == Technology::Lte && phone.lte().connected();
      std::optional<CellIndex> now;
      if (phone.technology() == Technology::Lte) now = phone.lte().serving;
      if (connected && wasConnected && serving && now != serving) {
        ++handovers;
        const auto since = better.find(now.value_or(0));
        ASSERT_NE(since, better.end()) << "at " << phone.now();
        EXPECT_GE(phone.now() - since->second, LteMobility::timeToTrigger) << "at " << phone.now();
      }
      if (now != serving) better.clear();
      serving = now;
      wasConnected = connected;
      if (!connected || phone.now() % measurementPeriod != 0) continue;
      const Network& network = phone.network();
      const Surroundings& surroundings = phone.surroundings();
      const double own = surroundings.strength(*serving);
      for (CellIndex cell = 0; cell < network.cells.size(); ++cell) {
        if (network.technologyOf(cell) != Technology::Lte) continue;
        const double other = surroundings.strength(cell);
        const bool sameCarrier = network.cells[cell].carrier == network.cells[*serving].carrier;
        const bool holds = sameCarrier ? other > own + LteMobility::a3Offset + LteMobility::hysteresis
                                       : own < LteMobility::a5Serving - LteMobility::hysteresis &&
                                             other > LteMobility::a5Candidate + LteMobility::hysteresis;
        if (!holds) {
          better.erase(cell);
        } else {
          better.try_emplace(cell, phone.now());
        }
      }
    }
  }
  EXPECT_GT(handovers, 30);
}

TEST(Phone, SendsStrongerWhereLessArrivesAndNeverMoreThanItCan) {
  Phone phone(cityWorld(1), 1);
  double strongSum = 0, weakSum = 0;
  int strong = 0, weak = 0;
  while (phone.now() < hour / 2) {
    phone.advance();
    if (phone.technology() != Technology::Lte || !phone.lte().connected()) continue;
    for (const TransmitPower& power : phone.lte().transmitPowers) {
      ASSERT_TRUE(power.control.has_value());
      EXPECT_GE(*power.control, -40);
      EXPECT_LE(*power.control, 23);  // 3GPP TS 36.101, 6.2.2: power class 3
      if (power.shared) {
        EXPECT_LE(*power.shared, 23);
      }
      EXPECT_LE(power.subframe, 9U);
      if (phone.lte().rsrp > -85) strongSum += *power.control, ++strong;
      if (phone.lte().rsrp < -100) weakSum += *power.control, ++weak;
    }
  }
  ASSERT_GT(strong, 100);
  ASSERT_GT(weak, 100);
  EXPECT_GT(weakSum / weak, strongSum / strong + 8);
}

TEST(Phone, NeverStaysWhereItIsForbidden) {
  Phone phone(cityWorld(2), 2);
  Milliseconds forbiddenFor = 0, longest = 0;
  bool refused = false;
  while (phone.now() < hour) {
    phone.advance();
    std::optional<CellIndex> serving;
    if (phone.technology() == Technology::Lte) serving = phone.lte().serving;
    if (phone.technology() == Technology::Umts) serving = phone.umts().serving;
    const bool forbidden = serving && phone.registration().knownForbidden(*serving);
    refused |= forbidden;
    forbiddenFor = forbidden ? forbiddenFor + stepTime : 0;
    longest = std::max(longest, forbiddenFor);
  }
  EXPECT_TRUE(refused);
  EXPECT_LT(longest, 20000);
}

TEST(Phone, AddsCarriersForDownloadsAndTakesThemAwayWithTheConnection) {
  Phone phone(cityWorld(1), 1);
  bool activated = false, deactivated = false;
  while (phone.now() < hour / 2) {
    phone.advance();
    const LteState& lte = phone.lte();
    for (const SecondaryCarrier& carrier : lte.secondaries) {
      if (carrier.state == SecondaryState::SCC_STATE_DECONFIGURED) continue;
      ASSERT_TRUE(phone.technology() == Technology::Lte && lte.connected());
      const Network& network = phone.network();
      EXPECT_EQ(network.cells[carrier.cell].site, network.cells[*lte.serving].site);
      EXPECT_NE(network.cells[carrier.cell].carrier, network.cells[*lte.serving].carrier);
      activated |= carrier.state == SecondaryState::SCC_STATE_ACTIVATED;
      deactivated |= carrier.state == SecondaryState::SCC_STATE_CONFIGURED_DEACTIVATED;
    }
    EXPECT_LE(lte.secondaries.size(), 2U);
  }
  EXPECT_TRUE(activated);
  EXPECT_TRUE(deactivated);
}

TEST(Phone, LosesItsLinkNowAndThenAndReestablishesIt) {
  bool failed = false, reestablished = false;
  for (std::uint64_t seed = 1; seed <= 8; ++seed) {
    Phone phone(cityWorld(seed), seed);
    while (phone.now() < hour) {
      phone.advance();
      if (phone.lte().cause != LteCause::KLTE_RRC_CAUSE_REEST_OTHER_FAIL_T310_EXP) continue;
      failed |= phone.lte().connection == LteConnection::KLTE_RRC_STATE_ATMPT_CONNECTION;
      reestablished |= phone.lte().connected();
    }
  }
  EXPECT_TRUE(failed);
  EXPECT_TRUE(reestablished);
}

TEST(Phone, LosesServiceInAHighwayTunnelAndFindsItAgain) {
  Phone phone(highwayWorld(1), 1);
  Milliseconds without = 0;
  while (phone.now() < hour) {
    phone.advance();
    if (phone.technology()) continue;
    without += stepTime;
    EXPECT_EQ(phone.lte().connection, LteConnection::KLTE_RRC_STATE_NULL);
    EXPECT_FALSE(phone.umts().camped());
    EXPECT_FALSE(phone.gsm().camped());
    EXPECT_EQ(phone.registration().eps().service, Service::KREG_STATUS_NO_SERVICE);
  }
  EXPECT_GT(without, 5000);
  EXPECT_LT(without, 120000);
  EXPECT_TRUE(phone.technology().has_value());
}

TEST(Phone, IsWeaklyServedByUmtsAndGsmIndoors) {
  Phone phone(indoorWorld(1), 1);
  double umts = 0, gsm = 0;
  int umtsSteps = 0, gsmSteps = 0;
  while (phone.now() < hour) {
    phone.advance();
    if (phone.technology() == Technology::Umts) umts += phone.umts().rscp, ++umtsSteps;
    if (phone.technology() == Technology::Gsm) gsm += phone.gsm().rxLev, ++gsmSteps;
  }
  ASSERT_GT(umtsSteps, 1000);
  ASSERT_GT(gsmSteps, 1000);
  EXPECT_LT(umts / umtsSteps, -90);
  EXPECT_LT(gsm / gsmSteps, -85);
}

}  // namespace
}  // namespace probeview::scenario
