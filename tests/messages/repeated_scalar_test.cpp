// SPDX-License-Identifier: Apache-2.0
//
// The lists of numbers, by themselves.
#include <gtest/gtest.h>

#include <stdexcept>

#include "messages/runtime/repeated_scalar.h"
#include "tests/messages/support.h"

namespace probeview {
namespace {

TEST(RepeatedScalar, AddsClearsSetsCopiesAndCompares) {
  PBRepeatedInt32 list;
  EXPECT_EQ(list.count(), 0U);
  for (std::int32_t value = -20; value < 20; ++value) list.add(value);
  EXPECT_EQ(list.count(), 40U);
  EXPECT_EQ(list.at(0), -20);
  const PBRepeatedInt32 copy = list;
  EXPECT_TRUE(copy.isEqual(list));
  EXPECT_EQ(copy.hash(), list.hash());
  list.add(1);
  EXPECT_FALSE(copy.isEqual(list));
  const std::int32_t values[] = {3, 2, 1};
  list.set(values);
  EXPECT_EQ(list.count(), 3U);
  EXPECT_EQ(printed(list.toList()), "[3, 2, 1]");
  list.clear();
  EXPECT_TRUE(list.isEqual(PBRepeatedInt32()));
  EXPECT_EQ(list.hash(), 0U);
  list.set(std::span(copy.data(), 0));
  EXPECT_EQ(list.count(), 0U);
}

TEST(RepeatedScalar, TheOrderOfTheNumbersCountsInTheHash) {
  PBRepeatedUInt32 one;
  PBRepeatedUInt32 other;
  one.add(1);
  one.add(2);
  other.add(2);
  other.add(1);
  EXPECT_NE(one.hash(), other.hash());
  EXPECT_FALSE(one.isEqual(other));
}

TEST(RepeatedScalar, PrintsUnsignedAndSignedNumbersAsWhatTheyAre) {
  PBRepeatedUInt32 large;
  large.add(0xFFFFFFFF);
  EXPECT_EQ(printed(large.toList()), "[4294967295]");
  PBRepeatedInt32 negative;
  negative.add(-1);
  EXPECT_EQ(printed(negative.toList()), "[-1]");
}

TEST(RepeatedScalar, AnIndexOutOfRangeIsSaidWithIndexAndCount) {
  PBRepeatedUInt32 list;
  try {
    list.at(0);
    FAIL() << "no exception";
  } catch (const std::out_of_range& error) {
    EXPECT_STREQ(error.what(), "idx (0) is out of range (0)");
  }
}

}  // namespace
}  // namespace probeview
