// SPDX-License-Identifier: Apache-2.0
#include "ui/varnet_view_items.h"

#include <gtest/gtest.h>

#include <set>

namespace probeview {
namespace {

using Names = std::vector<std::string>;

TEST(VarnetViewItems, TheLaunchListHasFourTechnologiesInTheirOrder) {
  EXPECT_EQ(VarnetViewItems().launchViewItemNames, (Names{"Device Info", "LTE", "UMTS", "GSM"}));
}

TEST(VarnetViewItems, EachTechnologyHasItsCategoriesLetterForLetterAndInTheirOrder) {
  const VarnetViewItems items;
  EXPECT_EQ(items.firstLevelViewItems.size(), 4u);
  EXPECT_EQ(items.firstLevelViewItems.at("Device Info"), (Names{"IMSI", "IMEISV", "SIM Files"}));
  EXPECT_EQ(items.firstLevelViewItems.at("LTE"),
            (Names{"NAS", "RRC State", "Serving Cell Info", "Serving Cell Meas", "Tx Power", "Sel Resel Parameters",
                   "EUTRA Neighbor Info", "C-DRX", "LTE Neighbor Cell Meas", "UMTS Neighbor Cell Meas",
                   "GSM Neighbor Cell Meas", "CA Status", "Active Bearers"}));
  EXPECT_EQ(items.firstLevelViewItems.at("UMTS"),
            (Names{"NAS GMM", "NAS MM", "RRC State", "RRC Configuration", "Serving Cell Info", "Serving Cell Meas",
                   "Tx Power", "Sel Resel Parameters", "EUTRA Neighbor Info", "UTRA Neighbor Info", "GSM Neighbor Info",
                   "LTE Neighbor Cell Meas", "UMTS Neighbor Cell Meas", "GSM Neighbor Cell Meas", "Active Bearers"}));
  EXPECT_EQ(items.firstLevelViewItems.at("GSM"),
            (Names{"NAS GMM", "NAS MM", "Serving Cell Info", "Idle Config", "Idle Serv Cell Meas",
                   "Connected Serv Cell Meas", "GSM GPRS Config", "LTE Neighbor Cell Meas", "UMTS Neighbor Cell Meas",
                   "GSM Neighbor Cell Meas", "Active Bearers"}));
}

TEST(VarnetViewItems, TheLaunchPagesItemsAreMadeOnce) { EXPECT_EQ(&launchViewItems(), &launchViewItems()); }

TEST(VarnetViewItems, ThereAre42PageKeysAllDifferentInTheOrderOfTheLists) {
  const auto keys = navigablePageKeys();
  EXPECT_EQ(keys.size(), 42u);
  EXPECT_EQ(std::set<std::string>(keys.begin(), keys.end()).size(), 42u);
  EXPECT_EQ(keys.front(), "Device Info IMSI");
  EXPECT_EQ(keys[3], "LTE NAS");
  EXPECT_EQ(keys[16], "UMTS NAS GMM");
  EXPECT_EQ(keys.back(), "GSM Active Bearers");
}

TEST(VarnetViewItems, APageKeyIsTechnologyAndCategoryJoinedByOneBlank) {
  EXPECT_EQ(pageKey("LTE", "Tx Power"), "LTE Tx Power");
  EXPECT_EQ(pageKey("GSM", "GSM GPRS Config"), "GSM GSM GPRS Config");
}

}  // namespace
}  // namespace probeview
