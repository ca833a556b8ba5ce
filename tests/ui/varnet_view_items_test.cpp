// SPDX-License-Identifier: Apache-2.0
#include "ui/varnet_view_items.h"

#include <gtest/gtest.h>

#include <functional>
#include <map>
#include <set>

#include "tests/support/second_opinion.h"

namespace probeview {
namespace {

using Names = std::vector<std::string>;

TEST(VarnetViewItems, TheLaunchListHasFourTechnologiesInTheirOrder) {
  EXPECT_EQ(VarnetViewItems().launchViewItemNames, (Names{"Device Info", "LTE", "UMTS", "GSM"}));
}

TEST(VarnetViewItems, EachTechnologyHasItsCategoriesLetterForLetterAndInTheirOrder) {
  std::map<std::string, Names, std::less<>> said;
  for (const SecondOpinion::Page& page : secondOpinion().pages) said[page.technology].push_back(page.category);
  EXPECT_EQ(VarnetViewItems().firstLevelViewItems, said);
}

TEST(VarnetViewItems, TheLaunchPagesItemsAreMadeOnce) { EXPECT_EQ(&launchViewItems(), &launchViewItems()); }

TEST(VarnetViewItems, ThePageKeysAreAllDifferentAndInTheOrderOfTheLists) {
  Names said;
  for (const SecondOpinion::Page& page : secondOpinion().pages) said.push_back(page.technology + " " + page.category);
  EXPECT_EQ(navigablePageKeys(), said);
  EXPECT_EQ(std::set<std::string>(said.begin(), said.end()).size(), said.size());
}

TEST(VarnetViewItems, APageKeyIsTechnologyAndCategoryJoinedByOneBlank) {
  EXPECT_EQ(pageKey("LTE", "Tx Power"), "LTE Tx Power");
  EXPECT_EQ(pageKey("GSM", "GSM GPRS Config"), "GSM GSM GPRS Config");
}

}  // namespace
}  // namespace probeview
