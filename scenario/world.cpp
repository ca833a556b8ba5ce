// SPDX-License-Identifier: Apache-2.0
#include "scenario/world.h"

#include <array>
#include <vector>

namespace probeview::scenario {
namespace {

// Radiated power towards the main lobe, in dBm: per resource element from 43 or 46 dBm over the carrier's resource
// elements, a tenth of 43 dBm for a pilot, all of it for a BCCH; and 15 dB of antenna gain.
constexpr double lteWideDbm = 30;    // 20 MHz
constexpr double lteNarrowDbm = 30;  // 10 MHz
constexpr double pilotDbm = 48;
constexpr double broadcastDbm = 56;
constexpr double smallCell = -25;  // of a small cell, relative to that

// 3GPP TS 36.101, table 5.7.3-1; 25.101, 5.4.3; 45.005, 2.
Carrier lteBand3() { return {Technology::Lte, 1650, 3, 1850.0, lteWideDbm, 100, 6}; }
Carrier lteBand7() { return {Technology::Lte, 3150, 7, 2660.0, lteWideDbm, 100, 7}; }
Carrier ltePrivate() { return {Technology::Lte, 3425, 7, 2687.5, lteNarrowDbm, 25, 7}; }
Carrier lteBand20() { return {Technology::Lte, 6350, 20, 811.0, lteNarrowDbm, 50, 5}; }
Carrier umtsBand1() { return {Technology::Umts, 10662, 1, 2132.4, pilotDbm, 0, 3}; }
Carrier umtsBand8() { return {Technology::Umts, 3011, 8, 942.2, pilotDbm, 0, 2}; }
Carrier gsm900(std::uint32_t channel) {
  return {Technology::Gsm, channel, 900, 935.0 + 0.2 * channel, broadcastDbm, 0, 1};
}
Carrier gsm1800(std::uint32_t channel) {
  return {Technology::Gsm, channel, 1800, 1805.2 + 0.2 * (channel - 512), broadcastDbm, 0, 1};
}

// Broadcast channels of GSM, three to a site, re-used by every fourth site.
struct GsmPlan {
  std::array<CarrierIndex, 12> channels{};

  explicit GsmPlan(NetworkBuilder& builder) {
    for (std::uint32_t i = 0; i < channels.size(); ++i) channels[i] = builder.add(gsm900(20 + 4 * i));
  }
  void giveTo(SitePlan& plan, std::size_t site) const {
    const std::size_t first = site % 4 * 3;
    for (std::size_t sector = 0; sector < plan.sectors; ++sector) plan.carriers.push_back(channels[first + sector]);
  }
};

}  // namespace

World cityWorld(std::uint64_t seed) {
  NetworkBuilder builder(seed);
  Network& network = builder.network();
  network.pathLoss = {58.83, 37.6, 12, 6};
  const CarrierIndex band3 = builder.add(lteBand3());
  const CarrierIndex band7 = builder.add(lteBand7());
  const CarrierIndex band20 = builder.add(lteBand20());
  const CarrierIndex umts1 = builder.add(umtsBand1());
  const CarrierIndex umts8 = builder.add(umtsBand8());
  const GsmPlan gsm(builder);
  const CarrierIndex gsmUnderpass = builder.add(gsm900(80));
  const CarrierIndex gsmRavine = builder.add(gsm1800(640));
  const CarrierIndex privateCarrier = builder.add(ltePrivate());

  const std::uint32_t underpass = builder.add(Enclosure{{2400, 620}, 260, 70, 48});
  const std::uint32_t ravine = builder.add(Enclosure{{700, 1200}, 240, 70, 52});

  // A railway bridge low above the road: a few seconds without signal.
  builder.add(Enclosure{{1240, 0}, 24, 8, 50});

  // Sites on a lattice, every other row shifted by half.
  for (int row = 0; row < 4; ++row) {
    for (int column = 0; column < 4; ++column) {
      SitePlan plan;
      plan.place = {-150.0 + 850.0 * column + (row % 2 == 1 ? 425.0 : 0.0), -350.0 + 640.0 * row};
      plan.turnDegrees = row % 2 == 0 ? 0 : 30;
      plan.carriers = {band3, band20, umts1};
      if ((row + column) % 2 == 0) plan.carriers.push_back(band7);
      if ((row + column) % 2 == 1) plan.carriers.push_back(umts8);
      gsm.giveTo(plan, static_cast<std::size_t>(column + 2 * row));
      plan.area = (column >= 2 ? 1U : 0U) + (row >= 2 ? 2U : 0U);
      builder.add(plan);
    }
  }
  builder.add(SitePlan{{2430, 600}, {umts8, gsmUnderpass}, 1, 0, underpass, smallCell, 4});
  builder.add(SitePlan{{720, 1230}, {gsmRavine}, 1, 0, ravine, smallCell, 2});
  // A private network's small cells beside the road: strong for some seconds, and closed to this phone.
  builder.add(SitePlan{{2360, 960}, {privateCarrier, umts8}, 1, 0, 0, smallCell, 5});
  network.forbiddenAreaCode = areaCodeOf(5);
  network.voiceAreaCodes = {areaCodeOf(0), areaCodeOf(1)};

  // Lights at the corners and between them.
  Route route({
      {{0, 0}, 8, 11},
      {{800, 0}, 20, 12},
      {{1700, 0}, 0, 13},
      {{2400, 0}, 15, 10},
      {{2400, 500}, 0, 6},
      {{2400, 740}, 10, 9},
      {{2400, 1200}, 12, 11},
      {{1500, 1200}, 18, 10},
      {{850, 1200}, 0, 5},
      {{550, 1200}, 12, 9},
      {{0, 1200}, 15, 11},
      {{0, 600}, 25, 11},
  });
  return {std::move(network), std::move(route), {14, 0.15, 0.25}};
}

World highwayWorld(std::uint64_t seed) {
  NetworkBuilder builder(seed);
  Network& network = builder.network();
  network.pathLoss = {33.5, 34.1, 10, 5};
  const CarrierIndex band3 = builder.add(lteBand3());
  const CarrierIndex band20 = builder.add(lteBand20());
  const CarrierIndex umts8 = builder.add(umtsBand8());
  const GsmPlan gsm(builder);

  constexpr double roadLength = 60000;
  builder.add(Enclosure{{23000, 0}, 500, 60, 90});  // a tunnel into which nothing reaches
  const std::uint32_t upperValley = builder.add(Enclosure{{42300, 0}, 1600, 300, 45});
  const std::uint32_t lowerValley = builder.add(Enclosure{{45700, 0}, 1600, 300, 45});

  std::size_t number = 0;
  for (double x = 500; x < roadLength; x += 2900) {
    SitePlan plan;
    plan.place = {x, number % 2 == 0 ? 350.0 : -420.0};
    plan.turnDegrees = 90;
    plan.sectors = 2;
    plan.carriers = {band20, umts8};
    if (number % 3 != 2) plan.carriers.push_back(band3);
    gsm.giveTo(plan, number);
    plan.area = static_cast<std::uint32_t>(x / 15000);
    builder.add(plan);
    ++number;
  }
  // In the valleys stand old sites that were never rebuilt.
  builder.add(SitePlan{{42400, 200}, {umts8, gsm.channels[5]}, 1, 0, upperValley, -10, 2});
  builder.add(SitePlan{{45600, -150}, {gsm.channels[2]}, 1, 0, lowerValley, -10, 3});

  network.voiceAreaCodes = {areaCodeOf(0), areaCodeOf(1)};
  Route route = Route::thereAndBack({
      {{0, 0}, 4, 22},
      {{1500, 0}, 0, 33},
      {{20000, 0}, 0, 28},
      {{26000, 0}, 0, 36},
      {{40500, 0}, 0, 25},
      {{47500, 0}, 0, 34},
      {{58800, 0}, 0, 22},
      {{59800, 0}, 60, 22},
  });
  return {std::move(network), std::move(route), {20, 0.2, 0.3}};
}

World indoorWorld(std::uint64_t seed) {
  NetworkBuilder builder(seed);
  Network& network = builder.network();
  network.pathLoss = {58.83, 37.6, 24, 4};
  const CarrierIndex band3 = builder.add(lteBand3());
  const CarrierIndex band20 = builder.add(lteBand20());
  const CarrierIndex umts1 = builder.add(umtsBand1());
  const CarrierIndex umts8 = builder.add(umtsBand8());
  const GsmPlan gsm(builder);

  // The deeper inside, the less comes through; the basement below the core lets lower frequencies in by a shaft.
  builder.add(Enclosure{{60, 30}, 26, 8, 22});
  const std::uint32_t basement = builder.add(Enclosure{{110, 30}, 18, 5, 40});

  const std::array<Point, 6> places{{{-240, 150}, {380, 420}, {640, -180}, {-150, -460}, {-700, -300}, {250, -720}}};
  for (std::size_t number = 0; number < places.size(); ++number) {
    SitePlan plan;
    plan.place = places[number];
    plan.turnDegrees = number % 2 == 0 ? 0 : 60;
    plan.carriers = {band3, umts1};
    if (number != 4) plan.carriers.push_back(band20);
    if (number % 2 == 0) plan.carriers.push_back(umts8);
    gsm.giveTo(plan, number);
    plan.area = number < 3 ? 0 : 1;
    builder.add(plan);
  }
  const CarrierIndex shaft = builder.add(Carrier{Technology::Gsm, 100, 900, 955.0, -6, 0, 1});
  builder.add(SitePlan{{112, 34}, {shaft}, 1, 0, basement, 0, 0});
  network.voiceAreaCodes = {areaCodeOf(0)};

  Route route({
      {{4, 4}, 40, 1.2},
      {{30, 6}, 25, 1.2},
      {{34, 28}, 5, 1.0},
      {{60, 30}, 60, 1.0},
      {{84, 30}, 5, 1.1},
      {{110, 30}, 90, 1.0},
      {{128, 6}, 10, 1.3},
      {{60, 2}, 20, 1.3},
  });
  return {std::move(network), std::move(route), {12, 0.12, 0.2}};
}

}  // namespace probeview::scenario
