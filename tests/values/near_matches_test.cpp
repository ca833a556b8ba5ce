// SPDX-License-Identifier: Apache-2.0
#include "values/near_matches.h"

#include <gtest/gtest.h>

#include <array>

namespace probeview {
namespace {

using Names = std::vector<std::string_view>;

TEST(NearMatches, TheDistanceCountsWhatMustBePutInTakenOutReplacedOrExchanged) {
  EXPECT_EQ(editDistance("watch", "watch"), 0u);
  EXPECT_EQ(editDistance("watch", "WATCH"), 0u);
  EXPECT_EQ(editDistance("wach", "watch"), 1u);
  EXPECT_EQ(editDistance("wattch", "watch"), 1u);
  EXPECT_EQ(editDistance("wetch", "watch"), 1u);
  EXPECT_EQ(editDistance("wacth", "watch"), 1u);
  EXPECT_EQ(editDistance("", "watch"), 5u);
  EXPECT_EQ(editDistance("kitten", "sitting"), 3u);
}

TEST(NearMatches, TheNearestComeInTheirOrderAndWhatIsFarDoesNot) {
  const std::array<std::string_view, 5> names{"status", "watch", "pages", "stats", "state"};
  EXPECT_EQ(nearMatches("stauts", names), (Names{"status", "stats"}));
  EXPECT_EQ(nearMatches("statt", names), (Names{"stats", "state"}));
  EXPECT_EQ(nearMatches("query", names), Names{});
  EXPECT_EQ(nearMatches("", names), Names{});
  EXPECT_EQ(nearMatches(std::string(100'000, 's'), names), Names{});
}

TEST(NearMatches, AreSaidAsASentenceEnds) {
  const std::array<std::string_view, 4> names{"aaaa", "aaab", "aaac", "aaad"};
  EXPECT_EQ(didYouMean("aaab", std::array<std::string_view, 1>{"aaaa"}), "; did you mean aaaa?");
  EXPECT_EQ(didYouMean("aaaa", names), "; did you mean aaaa?");
  EXPECT_EQ(didYouMean("aaax", names), "; did you mean aaaa, aaab or aaac?");
  EXPECT_EQ(didYouMean("zzzz", names), "");
}

}  // namespace
}  // namespace probeview
