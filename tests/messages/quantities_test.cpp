// SPDX-License-Identifier: Apache-2.0
//
// How each quantity travels, there and back. The expected numbers are those of the standards, written here anew: a
// wrong offset in the product cannot agree with itself.
#include "messages/quantities.h"

#include <gtest/gtest.h>

#include <limits>
#include <set>

#include "messages/registry.h"

namespace probeview::quantities {
namespace {

struct Case {
  const Quantity& quantity;
  double value;
  std::int32_t signedNumber;
  std::uint32_t unsignedNumber;
};

// clang-format off
const Case cases[] = {
    // 3GPP TS 36.133, 9.1.4: RSRP_00 is below -140 dBm, each step is 1 dB; 9.1.7: RSRQ_00 is below -19.5 dB, steps of 0.5.
    {lteRsrp, -100, 40, 40},         {lteRsrp, -140, 0, 0},         {lteRsrp, -141, -1, 0},
    {lteRsrq, -9.5, 20, 20},         {lteRsrq, -19.5, 0, 0},        {lteRsrq, -12, 15, 15},      {lteRsrq, -20, -1, 0},
    // Whole dBm and dB; half dB.
    {lteSampleRsrp, -73, -73, 0},    {lteSampleRsrq, -7, -7, 0},
    {lteSampleSinr, 25, 50, 50},     {lteSampleSinr, -6.5, -13, 0},
    // Hundredths.
    {lteCarrierRsrp, -95.5, -9550, 0}, {lteCarrierRssi, -65, -6500, 0}, {lteCarrierRsrq, -10.5, -1050, 0},
    // 3GPP TS 25.133, 9.1.1.3: CPICH_RSCP_LEV_00 is -116 to -115 dBm, _-05 below -120; 9.1.2.3: CPICH_Ec/No_00 is below
    // -24 dB, _49 above 0, steps of 0.5 dB.
    {utraRscp, -116, 0, 0},          {utraRscp, -91, 25, 25},       {utraRscp, -120, -4, 0},
    {utraEcNo, -24.5, 0, 0},         {utraEcNo, -2, 45, 45},        {utraEcNo, 0, 49, 49},
    // 3GPP TS 45.008, 8.1.4: RXLEV 0 is below -110 dBm, 63 above -48; 8.2.4: RXQUAL is a number.
    {gsmRxLev, -110, 0, 0},          {gsmRxLev, -83, 27, 27},       {gsmRxLev, -47, 63, 63},     {gsmRxLev, -115, -5, 0},
    {gsmIdleLevel, -83, -83, 0},     {gsmRxQual, 5, 5, 5},
    // Quarter MHz and MHz.
    {lteServingDownlinkBandwidth, 20, 80, 80}, {lteServingDownlinkBandwidth, 1.5, 6, 6},
    {lteServingUplinkBandwidth, 15, 15, 15},
    // 3GPP TS 36.331, 6.3.4: Q-RxLevMin and ReselectionThreshold are half of the dBm and dB.
    {lteQRxLevMin, -140, -70, 0},    {lteQRxLevMin, -44, -22, 0},
    {lteLevelThreshold, 62, 31, 31}, {lteQualityThreshold, 31, 31, 31},
    // 3GPP TS 44.018, 10.5.2.34: CELL_RESELECT_OFFSET in 2 dB, TEMPORARY_OFFSET in 10 dB, PENALTY_TIME 0 is 20 s, 30 is
    // 620 s; 10.5.2.11: T3212 in tenths of an hour.
    {gsmReselectOffset, 126, 63, 63}, {gsmTemporaryOffset, 60, 6, 6},
    {gsmPenaltyTime, 20, 0, 0},      {gsmPenaltyTime, 620, 30, 30}, {gsmPeriodicUpdate, 25.5, 255, 255},
    // 3GPP TS 44.018, 10.5.2.3: RADIO-LINK-TIMEOUT 0 is 4, 15 is 64; 10.5.2.4: CELL-RESELECT-HYSTERESIS in 2 dB.
    {gsmRadioLinkTimeout, 4, 0, 0},  {gsmRadioLinkTimeout, 64, 15, 15},
    {gsmReselectHysteresis, 14, 7, 7},
};
// clang-format on

TEST(Quantities, EachBecomesTheNumberThatTheViewerUndoes) {
  for (const Case& each : cases) {
    SCOPED_TRACE(std::string(each.quantity.name) + " " + std::to_string(each.value));
    EXPECT_EQ(each.quantity.toSigned(each.value), each.signedNumber);
    EXPECT_EQ(each.quantity.toUnsigned(each.value), each.unsignedNumber);
    EXPECT_DOUBLE_EQ(each.quantity.toValue(each.signedNumber), each.value);
    EXPECT_TRUE(each.quantity.isMeasurable(each.value));
  }
}

TEST(Quantities, EachThatIsConvertedAndThatAFieldNamesIsTriedAbove) {
  std::set<const Quantity*> tried;
  for (const Case& each : cases) tried.insert(&each.quantity);
  std::set<const Quantity*> named;
  for (const MessageDescriptor* message : messageClasses()) {
    for (const FieldDescriptor& field : message->fields()) named.insert(message->meaningOf(field).quantity);
  }
  std::size_t converted = 0;
  for (const Quantity* quantity : named) {
    if (quantity == nullptr || !quantity->isConverted() || !quantity->table.empty()) continue;
    EXPECT_TRUE(tried.contains(quantity)) << quantity->name;
    ++converted;
  }
  EXPECT_GT(converted, 10U);
}

TEST(Quantities, WhatIsMeasuredNamesItsClause) {
  for (const Quantity* quantity :
       {&lteRsrp, &lteRsrq, &lteSampleRsrp, &lteSampleRsrq, &lteSampleSinr, &lteCarrierRsrp, &lteCarrierRssi,
        &lteCarrierRsrq, &utraRscp, &utraEcNo, &gsmRxLev, &gsmIdleLevel, &gsmRxQual, &lteTxPower}) {
    EXPECT_TRUE(quantity->clause.starts_with("3GPP TS ")) << quantity->name;
  }
}

TEST(Quantities, AValueBetweenTwoStepsTakesTheNearerOne) {
  EXPECT_EQ(lteRsrp.toSigned(-99.6), 40);
  EXPECT_EQ(lteRsrq.toSigned(-9.7), 20);
  EXPECT_EQ(lteSampleSinr.toSigned(-6.3), -13);
}

TEST(Quantities, WhatNoFieldHoldsIsCutAtItsEndsAndNotANumberIsZero) {
  EXPECT_EQ(lteRsrp.toSigned(1e300), std::numeric_limits<std::int32_t>::max());
  EXPECT_EQ(lteRsrp.toSigned(-1e300), std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(lteRsrp.toUnsigned(-1e300), 0u);
  EXPECT_EQ(lteRsrp.toSigned(std::numeric_limits<double>::quiet_NaN()), 0);
  EXPECT_FALSE(lteRsrp.isMeasurable(std::numeric_limits<double>::quiet_NaN()));
}

TEST(Quantities, ValuesThatCannotBeMeasuredLieOutsideTheRange) {
  EXPECT_FALSE(lteRsrq.isMeasurable(-225));
  EXPECT_FALSE(lteRsrp.isMeasurable(0));
  EXPECT_FALSE(utraEcNo.isMeasurable(1));
  EXPECT_FALSE(gsmRxQual.isMeasurable(8));
}

TEST(Quantities, BandwidthIndicesAreThoseOfTheSixLteBandwidths) {
  const double bandwidths[] = {1.4, 3, 5, 10, 15, 20};
  for (std::uint32_t index = 0; index < 6; ++index) EXPECT_EQ(lteBandwidth.indexOf(bandwidths[index]), index);
  EXPECT_EQ(lteBandwidth.indexOf(7), std::nullopt);
}

TEST(Quantities, TheBarringTablesAreThoseOfTheBroadcast) {
  // 3GPP TS 36.331, 6.3.1, AC-BarringConfig: p00 to p95 and s4 to s512.
  EXPECT_EQ(lteBarringFactor.table.size(), 16U);
  EXPECT_EQ(lteBarringFactor.indexOf(0), 0U);
  EXPECT_EQ(lteBarringFactor.indexOf(0.3), 6U);
  EXPECT_EQ(lteBarringFactor.indexOf(0.4), 7U);
  EXPECT_EQ(lteBarringFactor.indexOf(0.75), 11U);
  EXPECT_EQ(lteBarringFactor.indexOf(0.95), 15U);
  EXPECT_EQ(lteBarringTime.table.size(), 8U);
  EXPECT_EQ(lteBarringTime.indexOf(4), 0U);
  EXPECT_EQ(lteBarringTime.indexOf(512), 7U);
}

TEST(Quantities, TheServingDownlinkBandwidthSurvivesBeingHalvedTwice) {
  const auto shown = [](double megahertz) { return lteServingDownlinkBandwidth.toUnsigned(megahertz) / 2 / 2; };
  EXPECT_EQ(shown(1.4), 1u);
  EXPECT_EQ(shown(3), 3u);
  EXPECT_EQ(shown(5), 5u);
  EXPECT_EQ(shown(10), 10u);
  EXPECT_EQ(shown(15), 15u);
  EXPECT_EQ(shown(20), 20u);
  EXPECT_EQ(shown(-1), 0u);
  EXPECT_EQ(lteServingUplinkBandwidth.toUnsigned(20), 20u);
}

// Bands go upward, lie within what can be measured, and say whose they are.
TEST(Quantities, QualityBandsAreOrderedAndNameTheirSource) {
  for (const Quantity* quantity : {&lteRsrp, &lteRsrq, &lteSampleRsrp, &lteSampleRsrq, &lteSampleSinr, &lteCarrierRsrp,
                                   &lteCarrierRsrq, &signalToNoise, &utraRscp, &gsmRxLev, &gsmIdleLevel}) {
    SCOPED_TRACE(std::string(quantity->name));
    EXPECT_FALSE(quantity->bandsSource.empty());
    ASSERT_EQ(quantity->bands.size(), 4U);
    for (std::size_t index = 0; index < quantity->bands.size(); ++index) {
      EXPECT_TRUE(quantity->isMeasurable(quantity->bands[index].lowest));
      EXPECT_TRUE(index == 0 || quantity->bands[index].lowest > quantity->bands[index - 1].lowest);
    }
  }
  EXPECT_TRUE(utraEcNo.bands.empty());
}

}  // namespace
}  // namespace probeview::quantities
