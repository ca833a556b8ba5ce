// SPDX-License-Identifier: Apache-2.0
#include "messages/wire_units.h"

#include <gtest/gtest.h>

#include <limits>

namespace probeview::units {
namespace {

struct Case {
  const Quantity& quantity;
  double value;
  std::int32_t signedNumber;
  std::uint32_t unsignedNumber;
};

TEST(WireUnits, EachQuantityBecomesTheNumberThatTheViewerUndoes) {
  const Case cases[] = {
      {lteRsrp, -100, 40, 40},         {lteRsrp, -140, 0, 0},
      {lteRsrp, -141, -1, 0},          {lteRsrq, -9.5, 20, 20},
      {lteRsrq, -19.5, 0, 0},          {lteRsrq, -12, 15, 15},
      {lteRsrq, -20, -1, 0},           {lteSampleRsrp, -73, -73, 0},
      {lteSampleRsrq, -7, -7, 0},      {lteSampleSinr, 25, 50, 50},
      {lteSampleSinr, -6.5, -13, 0},   {lteCarrierRsrp, -95.5, -9550, 0},
      {lteCarrierRssi, -65, -6500, 0}, {lteCarrierRsrq, -10.5, -1050, 0},
      {utraRscp, -116, 0, 0},          {utraRscp, -91, 25, 25},
      {utraRscp, -120, -4, 0},         {utraEcNo, -24.5, 0, 0},
      {utraEcNo, -2, 45, 45},          {utraEcNo, 0, 49, 49},
      {gsmRxLev, -110, 0, 0},          {gsmRxLev, -83, 27, 27},
      {gsmRxLev, -47, 63, 63},         {gsmRxLev, -115, -5, 0},
      {gsmIdleLevel, -83, -83, 0},     {gsmRxQual, 5, 5, 5},
  };
  for (const Case& each : cases) {
    SCOPED_TRACE(std::string(each.quantity.name) + " " + std::to_string(each.value));
    EXPECT_EQ(each.quantity.toSigned(each.value), each.signedNumber);
    EXPECT_EQ(each.quantity.toUnsigned(each.value), each.unsignedNumber);
    EXPECT_DOUBLE_EQ(each.quantity.toValue(each.signedNumber), each.value);
    EXPECT_TRUE(each.quantity.contains(each.value));
    EXPECT_FALSE(each.quantity.clause.empty());
  }
}

TEST(WireUnits, AValueBetweenTwoStepsTakesTheNearerOne) {
  EXPECT_EQ(lteRsrp.toSigned(-99.6), 40);
  EXPECT_EQ(lteRsrq.toSigned(-9.7), 20);
  EXPECT_EQ(lteSampleSinr.toSigned(-6.3), -13);
}

TEST(WireUnits, WhatNoFieldHoldsIsCutAtItsEndsAndNotANumberIsZero) {
  EXPECT_EQ(lteRsrp.toSigned(1e300), std::numeric_limits<std::int32_t>::max());
  EXPECT_EQ(lteRsrp.toSigned(-1e300), std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(lteRsrp.toUnsigned(-1e300), 0u);
  EXPECT_EQ(lteRsrp.toSigned(std::numeric_limits<double>::quiet_NaN()), 0);
  EXPECT_FALSE(lteRsrp.contains(std::numeric_limits<double>::quiet_NaN()));
}

TEST(WireUnits, ValuesThatCannotBeMeasuredLieOutsideTheRange) {
  EXPECT_FALSE(lteRsrq.contains(-225));
  EXPECT_FALSE(lteRsrp.contains(0));
  EXPECT_FALSE(utraEcNo.contains(1));
  EXPECT_FALSE(gsmRxQual.contains(8));
}

TEST(WireUnits, BandwidthIndicesAreThoseOfTheSixLteBandwidths) {
  const double bandwidths[] = {1.4, 3, 5, 10, 15, 20};
  for (std::uint32_t index = 0; index < 6; ++index) EXPECT_EQ(lteBandwidthIndex(bandwidths[index]), index);
  EXPECT_EQ(lteBandwidthIndex(7), std::nullopt);
}

TEST(WireUnits, TheServingDownlinkBandwidthSurvivesBeingHalvedTwice) {
  const auto shown = [](double megahertz) { return lteServingDownlinkBandwidth(megahertz) / 2 / 2; };
  EXPECT_EQ(shown(1.4), 1u);
  EXPECT_EQ(shown(3), 3u);
  EXPECT_EQ(shown(5), 5u);
  EXPECT_EQ(shown(10), 10u);
  EXPECT_EQ(shown(15), 15u);
  EXPECT_EQ(shown(20), 20u);
  EXPECT_EQ(lteServingUplinkBandwidth(20), 20u);
}

}  // namespace
}  // namespace probeview::units
