// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>

#include <cmath>
#include <map>
#include <set>
#include <tuple>

#include "scenario/decibel.h"
#include "scenario/propagation.h"
#include "scenario/random.h"
#include "scenario/route.h"
#include "scenario/sim_card.h"
#include "scenario/surroundings.h"
#include "scenario/world.h"

namespace probeview::scenario {
namespace {

TEST(Random, AStreamIsDecidedByItsSeedAndItsNumber) {
  Random one(1, 1), same(1, 1), otherSeed(2, 1), otherStream(1, 2);
  const auto first = one.next();
  EXPECT_EQ(first, same.next());
  EXPECT_NE(first, otherSeed.next());
  EXPECT_NE(first, otherStream.next());
}

// Pinned, because a changed generator would change every recording that somebody made of a scenario.
TEST(Random, TheFirstNumberOfAStreamStaysWhatItIs) { EXPECT_EQ(scramble(0), 0xE220A8397B1DCDAFU); }

TEST(Random, DistributionsHaveTheMomentsThatTheyShould) {
  Random random(42, 1);
  double sum = 0, squares = 0, waiting = 0;
  constexpr int draws = 100000;
  for (int i = 0; i < draws; ++i) {
    const double normal = random.normal();
    sum += normal;
    squares += normal * normal;
    EXPECT_LT(std::abs(normal), 3.5);
    waiting += random.exponential(10);
    const auto integer = random.integerBetween(-2, 3);
    EXPECT_TRUE(integer >= -2 && integer <= 3);
    const double unit = random.unit();
    EXPECT_TRUE(unit >= 0 && unit < 1);
  }
  EXPECT_NEAR(sum / draws, 0, 0.02);
  EXPECT_NEAR(squares / draws, 1, 0.02);
  // The mean is 10 less what the limit of three means cuts off: 10 (1 - e^-3).
  EXPECT_NEAR(waiting / draws, 9.5, 0.1);
}

TEST(Decibel, AgreesWithTheMathematicsLibrary) {
  for (double decibels = -200; decibels <= 100; decibels += 0.37) {
    const double ratio = std::pow(10.0, decibels / 10.0);
    EXPECT_NEAR(toDecibels(ratio), decibels, 1e-4);
    EXPECT_NEAR(fromDecibels(decibels) / ratio, 1, 1e-6);
  }
  for (double cosine = -1; cosine <= 1; cosine += 0.01) {
    EXPECT_NEAR(arcCosineDegrees(cosine), std::acos(cosine) * 57.29577951308232, 0.01);
  }
}

TEST(Route, GoesRoundAtTheSpeedsOfItsLegsAndStandsAtItsStops) {
  Route route({{{0, 0}, 2, 10}, {{100, 0}, 0, 20}, {{100, 100}, 0, 50}});
  EXPECT_EQ(route.metresPerSecond(), 0);
  route.advance(2);
  EXPECT_EQ(route.metresPerSecond(), 10);
  route.advance(5);
  EXPECT_DOUBLE_EQ(route.position().x, 50);
  route.advance(7.5);
  EXPECT_DOUBLE_EQ(route.position().x, 100);
  EXPECT_DOUBLE_EQ(route.position().y, 50);
  EXPECT_EQ(route.laps(), 0);
  route.advance(100);
  EXPECT_GT(route.laps(), 4);
}

TEST(Route, ComesBackTheWayThatItWent) {
  Route route = Route::thereAndBack({{{0, 0}, 0, 10}, {{100, 0}, 0, 20}, {{200, 0}, 0, 1}});
  route.advance(15);
  EXPECT_DOUBLE_EQ(route.position().x, 200);
  route.advance(5);
  EXPECT_DOUBLE_EQ(route.position().x, 100);
  route.advance(5);
  EXPECT_DOUBLE_EQ(route.position().x, 50);
  route.advance(5);
  EXPECT_EQ(route.laps(), 1);
}

TEST(Network, NumbersAreWithinTheirRangesAndCellsTellApart) {
  for (const auto& make : {cityWorld, highwayWorld, indoorWorld}) {
    const Network network = make(1).network;
    std::set<std::pair<Technology, std::uint32_t>> identities;
    for (CellIndex index = 0; index < network.cells.size(); ++index) {
      const Cell& cell = network.cells[index];
      const Carrier& carrier = network.carrierOf(index);
      EXPECT_TRUE(identities.insert({carrier.technology, cell.identity}).second) << index;
      EXPECT_LE(cell.areaCode, 0xFFFDU);
      EXPECT_GE(cell.areaCode, 1U);
      switch (carrier.technology) {
        case Technology::Lte:
          EXPECT_LE(cell.physicalIdentity, 503U);
          EXPECT_LT(cell.identity, 1U << 28);
          EXPECT_LE(carrier.channel, 35999U);
          EXPECT_LE(carrier.priority, 7U);
          break;
        case Technology::Umts:
          EXPECT_LE(cell.physicalIdentity, 511U);
          EXPECT_LT(cell.identity, 1U << 28);
          // 3GPP TS 25.101, 5.4.2: band VIII counts from 340 MHz on.
          EXPECT_NEAR(carrier.megahertz, carrier.channel / 5.0 + (carrier.band == 8 ? 340 : 0), 1e-6);
          break;
        case Technology::Gsm:
          EXPECT_LE(cell.physicalIdentity, 63U);
          EXPECT_LE(cell.identity, 0xFFFFU);
          EXPECT_LE(carrier.channel, 1023U);
          break;
      }
    }
  }
}

// 3GPP TS 36.101, table 5.7.3-1: lowest channel, lowest frequency, and the highest channel of each band.
TEST(Network, LteChannelsLieInTheirBands) {
  const std::map<std::uint32_t, std::tuple<std::uint32_t, double, std::uint32_t>> bands{
      {3, {1200, 1805, 1949}}, {7, {2750, 2620, 3449}}, {20, {6150, 791, 6449}}};
  for (const auto& make : {cityWorld, highwayWorld, indoorWorld}) {
    for (const Carrier& carrier : make(1).network.carriers) {
      if (carrier.technology != Technology::Lte) continue;
      const auto& [first, megahertz, last] = bands.at(carrier.band);
      EXPECT_TRUE(carrier.channel >= first && carrier.channel <= last);
      EXPECT_NEAR(carrier.megahertz, megahertz + 0.1 * (carrier.channel - first), 1e-6);
    }
  }
}

TEST(Network, CellsOfOneCarrierThatShareAPhysicalIdentityAreFarApart) {
  for (const auto& make : {cityWorld, highwayWorld, indoorWorld}) {
    const Network network = make(1).network;
    for (CellIndex a = 0; a < network.cells.size(); ++a) {
      for (CellIndex b = a + 1; b < network.cells.size(); ++b) {
        if (network.cells[a].carrier != network.cells[b].carrier ||
            network.cells[a].physicalIdentity != network.cells[b].physicalIdentity) {
          continue;
        }
        EXPECT_GT(length(network.sites[network.cells[a].site].place - network.sites[network.cells[b].site].place), 1500)
            << a << " and " << b;
      }
    }
  }
}

TEST(Propagation, IsWeakerFartherAwayAndBehindTheAntenna) {
  NetworkBuilder builder(1);
  const auto carrier = builder.add({Technology::Lte, 1650, 3, 1850, 30, 100, 6});
  builder.add(SitePlan{.place = {0, 0}, .carriers = {carrier}, .sectors = 3});
  builder.network().pathLoss.shadowDeviation = 0;
  const Propagation propagation(builder.network(), 1);
  std::vector<double> near(3), far(3);
  propagation.receive(Technology::Lte, {0, 200}, near);
  propagation.receive(Technology::Lte, {0, 2000}, far);
  EXPECT_NEAR(near[0] - far[0], 37.6, 0.01);  // ten times the distance
  EXPECT_NEAR(near[0] - near[1], 20, 0.01);   // 120 degrees off
  // 3GPP TR 36.942, 4.5.2 with the station 15 m above the roofs: 128.1 + 37.6 log10(R) at 2 GHz.
  EXPECT_NEAR(30 - far[0], 58.83 + 37.6 * std::log10(2.0) + 21 * std::log10(1850.0), 0.01);
}

TEST(Propagation, IsTheSameEachTimeThatOneComesBy) {
  const Network network = cityWorld(1).network;
  const Propagation propagation(network, 1);
  std::vector<double> first(network.cells.size()), second(network.cells.size()), moved(network.cells.size());
  propagation.receive(Technology::Umts, {100, 100}, first);
  propagation.receive(Technology::Umts, {500, 900}, moved);
  propagation.receive(Technology::Umts, {100, 100}, second);
  EXPECT_EQ(first, second);
  EXPECT_NE(first, moved);
}

TEST(Propagation, AnEnclosureKeepsOutWhatStandsOutside) {
  NetworkBuilder builder(1);
  const auto carrier = builder.add({Technology::Gsm, 20, 900, 939, 56, 0, 1});
  const auto inside = builder.add(Enclosure{{1000, 0}, 100, 10, 40});
  builder.add(SitePlan{.place = {800, 0}, .carriers = {carrier}, .sectors = 1});
  builder.add(SitePlan{.place = {1010, 0}, .carriers = {carrier}, .sectors = 1, .enclosure = inside});
  builder.network().pathLoss.shadowDeviation = 0;
  const Propagation propagation(builder.network(), 1);
  std::vector<double> out(2), in(2);
  propagation.receive(Technology::Gsm, {890, 0}, out);
  propagation.receive(Technology::Gsm, {920, 0}, in);
  EXPECT_GT(out[0] - in[0], 40);
  EXPECT_GT(in[1] - out[1], 40);
}

TEST(Surroundings, StayWithinTheRangesThatCanBeReported) {
  for (const auto& make : {cityWorld, highwayWorld, indoorWorld}) {
    World world = make(3);
    Surroundings surroundings(world.network, 3);
    for (int i = 0; i < 500; ++i) {
      world.route.advance(5);
      for (const Technology technology : {Technology::Gsm, Technology::Umts, Technology::Lte}) {
        surroundings.measure(technology, world.route.position(), 0.5);
        double last = 0;
        for (const CellIndex cell : surroundings.heard(technology)) {
          const double strength = surroundings.strength(cell);
          EXPECT_LE(strength, last);
          last = strength;
          switch (technology) {
            case Technology::Lte:
              EXPECT_TRUE(strength >= -140 && strength <= -44) << strength;
              EXPECT_TRUE(surroundings.quality(cell) >= -19.5 && surroundings.quality(cell) <= -3);
              EXPECT_TRUE(surroundings.interferenceRatio(cell) >= -20 && surroundings.interferenceRatio(cell) <= 30);
              EXPECT_LT(strength, surroundings.carrierPower(cell));
              break;
            case Technology::Umts:
              EXPECT_TRUE(strength >= -120 && strength <= -25) << strength;
              EXPECT_TRUE(surroundings.quality(cell) >= -24 && surroundings.quality(cell) <= 0);
              break;
            case Technology::Gsm:
              EXPECT_TRUE(strength >= -110 && strength <= -48) << strength;
              break;
          }
        }
      }
    }
  }
}

TEST(SimCard, EncodesTheTestNetworkAndItsSubscriber) {
  EXPECT_EQ(encodedPlmn(), (std::array<std::uint8_t, 3>{0x00, 0xF1, 0x10}));
  EXPECT_EQ(encodedPlmn(2), (std::array<std::uint8_t, 3>{0x00, 0xF1, 0x20}));
  EXPECT_EQ(encodedPlmn(99), (std::array<std::uint8_t, 3>{0x00, 0xF1, 0x99}));
  EXPECT_EQ(encodedImsi(), (std::array<std::uint8_t, 8>{0x09, 0x10, 0x10, 0x10, 0x32, 0x54, 0x76, 0x98}));
}

}  // namespace
}  // namespace probeview::scenario
