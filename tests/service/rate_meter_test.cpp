// SPDX-License-Identifier: Apache-2.0
#include "service/rate_meter.h"

#include <gtest/gtest.h>

#include <chrono>

namespace probeview {
namespace {

using std::chrono::nanoseconds;
using std::chrono::seconds;

TEST(RateMeter, IsTheMeanOfTheLastTenWholeSeconds) {
  RateMeter meter;
  const nanoseconds start = seconds(100);
  for (int second = 0; second < 30; ++second) {
    meter.add(start + seconds(second), second < 20 ? 100 : 5);
  }
  EXPECT_DOUBLE_EQ(meter.perSecond(start + seconds(30), start), 5.0);
  EXPECT_DOUBLE_EQ(meter.perSecond(start + seconds(35), start), 2.5);
  EXPECT_DOUBLE_EQ(meter.perSecond(start + seconds(60), start), 0.0);
}

TEST(RateMeter, OfSomethingYoungerIsTheMeanOfWhatThereIs) {
  RateMeter meter;
  meter.add(seconds(100), 30);
  EXPECT_DOUBLE_EQ(meter.perSecond(seconds(100), seconds(100)), 0.0);
  EXPECT_DOUBLE_EQ(meter.perSecond(seconds(101), seconds(100)), 30.0);
  EXPECT_DOUBLE_EQ(meter.perSecond(seconds(103), seconds(100)), 10.0);
}

}  // namespace
}  // namespace probeview
