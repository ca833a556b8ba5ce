// SPDX-License-Identifier: Apache-2.0
//
// The launch list, the category lists, and what each hands to the next.
#include "tests/ui/testing.h"
#include "ui/first_level_view_controller.h"
#include "ui/page_snapshot.h"
#include "ui/second_level_view_controller.h"
#include "ui/third_level_view_controller.h"
#include "ui/varnet_view_controller.h"

namespace probeview {
namespace {

using Names = std::vector<std::string>;

Names labels(ListPage& page) {
  Names names;
  for (const auto& section : takeSnapshot(page).sections) {
    for (const auto& row : section.rows) names.push_back(row.text.value_or("(blank)"));
  }
  return names;
}

class FirstLists : public testing_ui::PagesTest {
 protected:
  FirstLevelViewController first{environment};
  SecondLevelViewController second{environment};
};

TEST_F(FirstLists, TheLaunchPageShowsExactlyFourRowsInOrder) {
  VarnetViewController launch;
  EXPECT_EQ(launch.numberOfSectionsInTableView(), 1u);
  EXPECT_EQ(launch.titleForHeaderInSection(0), std::nullopt);
  EXPECT_EQ(labels(launch), (Names{"Device Info", "LTE", "UMTS", "GSM"}));
}

TEST_F(FirstLists, TheLaunchPagesCellsAreOfTheKindLaunchViewAndHaveNoDetail) {
  VarnetViewController launch;
  ListCell cell;
  launch.cellForRowAtIndexPath(0, 1, cell);
  EXPECT_EQ(cell, (ListCell{"LaunchView", "LTE", std::nullopt}));
}

TEST_F(FirstLists, TappingATechnologyShowsItsCategoriesAsManyAsItHas) {
  VarnetViewController launch;
  for (const auto& [technology, categories] : launchViewItems().firstLevelViewItems) {
    const ListCell tapped{"LaunchView", technology, std::nullopt};
    FirstLevelViewController page(environment);
    launch.prepareForNavigation(&tapped, page);
    EXPECT_EQ(page.numberOfSectionsInTableView(), 1u);
    EXPECT_EQ(page.titleForHeaderInSection(0), std::nullopt);
    EXPECT_EQ(page.numberOfRowsInSection(0), categories.size()) << technology;
    EXPECT_EQ(labels(page), categories);
  }
}

TEST_F(FirstLists, TheCategoryListsCellsAreOfTheKindFirstClickViewAndHaveNoDetail) {
  first.seguedThroughRow = "GSM";
  ListCell cell;
  first.cellForRowAtIndexPath(0, 3, cell);
  EXPECT_EQ(cell, (ListCell{"FirstClickView", "Idle Config", std::nullopt}));
}

TEST_F(FirstLists, TappingGsmThenIdleConfigGivesTheCategoryPageBothTexts) {
  VarnetViewController launch;
  const ListCell technology{"LaunchView", "GSM", std::nullopt};
  launch.prepareForNavigation(&technology, first);
  EXPECT_EQ(first.seguedThroughRow, "GSM");
  const ListCell category{"FirstClickView", "Idle Config", std::nullopt};
  first.prepareForNavigation(&category, second);
  EXPECT_EQ(second.firstSelection, "GSM");
  EXPECT_EQ(second.seguedThroughRow, "Idle Config");
  EXPECT_EQ(pageKey(*second.firstSelection, *second.seguedThroughRow), "GSM Idle Config");
}

TEST_F(FirstLists, CategoriesOfTheSameNameUnderDifferentTechnologiesLeadToDifferentPages) {
  const ListCell category{"FirstClickView", "RRC State", std::nullopt};
  SecondLevelViewController lte(environment);
  SecondLevelViewController umts(environment);
  first.seguedThroughRow = "LTE";
  first.prepareForNavigation(&category, lte);
  first.seguedThroughRow = "UMTS";
  first.prepareForNavigation(&category, umts);
  store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"lte", Value::text("1")}};
  store.filled[DisplayDictionary::myUMTSRRCStateDict] = Dictionary{{"umts", Value::text("2")}};
  EXPECT_EQ(labels(lte), Names{"lte"});
  EXPECT_EQ(labels(umts), Names{"umts"});
}

TEST_F(FirstLists, ATappedCellWithoutTextHandsOnAnAbsentText) {
  VarnetViewController launch;
  const ListCell blank{"LaunchView", std::nullopt, std::nullopt};
  first.seguedThroughRow = "LTE";
  launch.prepareForNavigation(&blank, first);
  EXPECT_EQ(first.seguedThroughRow, std::nullopt);
}

TEST_F(FirstLists, AnotherSenderOrDestinationIsLeftAlone) {
  VarnetViewController launch;
  const ListCell cell{"LaunchView", "LTE", std::nullopt};
  launch.prepareForNavigation(nullptr, first);
  EXPECT_EQ(first.seguedThroughRow, std::nullopt);
  launch.prepareForNavigation(&cell, second);
  EXPECT_EQ(second.firstSelection, std::nullopt);
  EXPECT_EQ(second.seguedThroughRow, std::nullopt);

  first.seguedThroughRow = "LTE";
  first.prepareForNavigation(nullptr, second);
  EXPECT_EQ(second.firstSelection, std::nullopt);
  FirstLevelViewController other(environment);
  first.prepareForNavigation(&cell, other);
  EXPECT_EQ(other.seguedThroughRow, std::nullopt);
}

TEST_F(FirstLists, ACategoryListThatWasToldNoTechnologyStopsTheProgram) {
  ListCell cell;
  EXPECT_TRUE(testing_ui::stopReason([&] { first.numberOfRowsInSection(0); }));
  EXPECT_TRUE(testing_ui::stopReason([&] { first.cellForRowAtIndexPath(0, 0, cell); }));
  EXPECT_EQ(first.numberOfSectionsInTableView(), 1u);
}

TEST_F(FirstLists, ACategoryListOfAnUnknownTechnologyStopsTheProgram) {
  ListCell cell;
  first.seguedThroughRow = "5G";
  EXPECT_TRUE(testing_ui::stopReason([&] { first.numberOfRowsInSection(0); }));
  EXPECT_TRUE(testing_ui::stopReason([&] { first.cellForRowAtIndexPath(0, 0, cell); }));
}

TEST_F(FirstLists, ARowPastTheEndOfAListStopsTheProgram) {
  VarnetViewController launch;
  ListCell cell;
  first.seguedThroughRow = "Device Info";
  EXPECT_EQ(testing_ui::stopReason([&] { launch.cellForRowAtIndexPath(0, 4, cell); }),
            "row 4 asked of the launch list, which has 4");
  EXPECT_EQ(testing_ui::stopReason([&] { first.cellForRowAtIndexPath(0, 3, cell); }),
            "row 3 asked of Device Info, which has 3");
}

TEST_F(FirstLists, EveryPageBuildsItsOwnCopyOfTheItems) {
  FirstLevelViewController other(environment);
  EXPECT_NE(&first.tableViewFields, &other.tableViewFields);
  EXPECT_EQ(first.tableViewFields.launchViewItemNames, other.tableViewFields.launchViewItemNames);
  EXPECT_EQ(&first.myMetricValidator, &store);
  EXPECT_EQ(&second.myMetricValidator, &store);
}

TEST_F(FirstLists, TheNavigationBarNamesTheProgramThenTheTechnologyThenTheCategory) {
  first.seguedThroughRow = "LTE";
  second.firstSelection = "LTE";
  second.seguedThroughRow = "Tx Power";
  EXPECT_EQ(VarnetViewController().title(), "probeview");
  EXPECT_EQ(first.title(), "LTE");
  EXPECT_EQ(second.title(), "Tx Power");
}

TEST_F(FirstLists, TheDetailPageShowsExactlyOneEmptyRowWhateverItsPropertiesHold) {
  ThirdLevelViewController detail;
  EXPECT_EQ(detail.firstSelection, std::nullopt);
  EXPECT_EQ(detail.secondSelection, std::nullopt);
  EXPECT_EQ(detail.seguedThroughRow, std::nullopt);
  const PageSnapshot expected{{{std::nullopt, {{"ThirdClickView", std::nullopt, std::nullopt}}}}};
  EXPECT_EQ(takeSnapshot(detail), expected);
  detail.firstSelection = "LTE";
  detail.secondSelection = "Tx Power";
  detail.seguedThroughRow = "timestamp";
  EXPECT_EQ(takeSnapshot(detail), expected);
}

}  // namespace
}  // namespace probeview
