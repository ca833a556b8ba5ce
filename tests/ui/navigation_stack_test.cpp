// SPDX-License-Identifier: Apache-2.0
#include "ui/navigation_stack.h"

#include "tests/ui/testing.h"
#include "ui/first_level_view_controller.h"
#include "ui/page_snapshot.h"
#include "ui/second_level_view_controller.h"
#include "ui/third_level_view_controller.h"
#include "ui/varnet_view_controller.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

class Navigation : public testing_ui::PagesTest {
 protected:
  NavigationStack stack{description};

  // Taps the row of that label on the top page.
  bool tap(const std::string& label) {
    for (const auto& section : takeSnapshot(stack.topPage()).sections) {
      for (const auto& row : section.rows) {
        if (row.text == label) return stack.tap(row);
      }
    }
    ADD_FAILURE() << "there is no row " << label;
    return false;
  }
  template <typename Page>
  Page* top() {
    return dynamic_cast<Page*>(&stack.topPage());
  }
};

TEST_F(Navigation, TheStackStartsWithTheLaunchList) {
  EXPECT_EQ(stack.depth(), 1u);
  EXPECT_NE(top<VarnetViewController>(), nullptr);
}

TEST_F(Navigation, TapsGoDownAndTheTappedTextsArriveAtTheCategoryPage) {
  EXPECT_TRUE(tap("GSM"));
  EXPECT_TRUE(tap("Idle Config"));
  EXPECT_EQ(stack.depth(), 3u);
  ASSERT_NE(top<SecondLevelViewController>(), nullptr);
  EXPECT_EQ(top<SecondLevelViewController>()->firstSelection, "GSM");
  EXPECT_EQ(top<SecondLevelViewController>()->seguedThroughRow, "Idle Config");
}

TEST_F(Navigation, EveryCategoryOfEveryTechnologyIsReached) {
  std::vector<std::string> keys;
  for (const auto& technology : launchViewItems().launchViewItemNames) {
    tap(technology);
    const auto categories = takeSnapshot(stack.topPage());
    for (const auto& category : categories.sections[0].rows) {
      stack.tap(category);
      const auto* page = top<SecondLevelViewController>();
      ASSERT_NE(page, nullptr);
      keys.push_back(pageKey(*page->firstSelection, *page->seguedThroughRow));
      stack.pop();
    }
    stack.pop();
  }
  EXPECT_EQ(keys, navigablePageKeys());
}

TEST_F(Navigation, AValueRowOpensTheDetailPageWhichIsHandedNothing) {
  tap("LTE");
  tap("Tx Power");
  tap("Waiting for Update");
  EXPECT_EQ(stack.depth(), 4u);
  ASSERT_NE(top<ThirdLevelViewController>(), nullptr);
  EXPECT_EQ(top<ThirdLevelViewController>()->firstSelection, std::nullopt);
  EXPECT_EQ(top<ThirdLevelViewController>()->secondSelection, std::nullopt);
  EXPECT_EQ(top<ThirdLevelViewController>()->seguedThroughRow, std::nullopt);
  EXPECT_FALSE(stack.tap(takeSnapshot(stack.topPage()).sections[0].rows[0])) << "its row leads nowhere";
  EXPECT_TRUE(stack.pop());
  EXPECT_NE(top<SecondLevelViewController>(), nullptr);
}

TEST_F(Navigation, GoingBackStopsAtTheRootPage) {
  tap("UMTS");
  EXPECT_TRUE(stack.pop());
  EXPECT_FALSE(stack.pop());
  EXPECT_EQ(stack.depth(), 1u);
}

TEST_F(Navigation, GoingBackToTheRootLeavesItAlone) {
  tap("LTE");
  tap("NAS");
  stack.popToRoot();
  EXPECT_EQ(stack.depth(), 1u);
  EXPECT_NE(top<VarnetViewController>(), nullptr);
}

TEST_F(Navigation, GoingBackAndInAgainMakesAFreshPage) {
  tap("LTE");
  top<FirstLevelViewController>()->seguedThroughRow = "GSM";
  stack.pop();
  tap("LTE");
  EXPECT_EQ(top<FirstLevelViewController>()->seguedThroughRow, "LTE");
}

TEST_F(Navigation, FiveSecondsAfterThePageIsShownAndEveryFiveSecondsAfterThatAllRowsAreReloaded) {
  tap("LTE");
  tap("RRC State");
  int reloads = 0;
  PageSnapshot shown = takeSnapshot(stack.topPage());
  stack.topPage().setReloadObserver([&] {
    ++reloads;
    shown = takeSnapshot(stack.topPage());
  });
  store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"state", Value::text("IDLE")}};
  loop.advance(4999ms);
  EXPECT_EQ(reloads, 0);
  EXPECT_EQ(shown.rowCount(), 0u);
  loop.advance(1ms);
  EXPECT_EQ(reloads, 1);
  ASSERT_EQ(shown.rowCount(), 1u);
  EXPECT_EQ(shown.sections[0].rows[0].detail, "IDLE");
  store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"state", Value::text("CONNECTED")}};
  loop.advance(4999ms);
  EXPECT_EQ(reloads, 1);
  loop.advance(1ms);
  EXPECT_EQ(reloads, 2);
  EXPECT_EQ(shown.sections[0].rows[0].detail, "CONNECTED");
  loop.advance(50s);
  EXPECT_EQ(reloads, 12);
}

TEST_F(Navigation, AnUpdateReloadsOnTheMainQueueAndNotAtOnce) {
  SecondLevelViewController page(environment);
  int reloads = 0;
  page.setReloadObserver([&] { ++reloads; });
  page.update();
  EXPECT_EQ(reloads, 0);
  loop.run();
  EXPECT_EQ(reloads, 1);
}

TEST_F(Navigation, APoppedPageDiesAndItsTimerWithIt) {
  tap("LTE");
  tap("RRC State");
  int reloads = 0;
  stack.topPage().setReloadObserver([&] { ++reloads; });
  EXPECT_TRUE(loop.untilNextTimer());
  stack.pop();
  EXPECT_FALSE(loop.untilNextTimer());
  loop.advance(1min);
  EXPECT_EQ(reloads, 0);
}

TEST_F(Navigation, AReloadThatWaitsInTheQueueWhenItsPageIsPoppedComesToNothing) {
  tap("LTE");
  tap("RRC State");
  int reloads = 0;
  stack.topPage().setReloadObserver([&] { ++reloads; });
  top<SecondLevelViewController>()->update();
  stack.pop();
  loop.run();
  EXPECT_EQ(reloads, 0);
}

TEST_F(Navigation, ACoveredPageKeepsFiring) {
  tap("LTE");
  tap("Tx Power");
  int reloads = 0;
  stack.topPage().setReloadObserver([&] { ++reloads; });
  tap("Waiting for Update");
  ASSERT_NE(top<ThirdLevelViewController>(), nullptr);
  loop.advance(10s);
  EXPECT_EQ(reloads, 2);
  stack.pop();
  loop.advance(5s);
  EXPECT_EQ(reloads, 3);
}

TEST_F(Navigation, AReloadMayPopItsOwnPage) {
  tap("LTE");
  tap("Tx Power");
  stack.topPage().setReloadObserver([&] { stack.pop(); });
  loop.advance(1min);
  EXPECT_EQ(stack.depth(), 2u);
}

TEST_F(Navigation, ValuesStoredWhileAPageWasClosedAreThereWhenItOpens) {
  tap("LTE");
  tap("RRC State");
  EXPECT_EQ(takeSnapshot(stack.topPage()).rowCount(), 0u);
  stack.pop();
  store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"state", Value::text("IDLE")}};
  tap("RRC State");
  EXPECT_EQ(takeSnapshot(stack.topPage()).rowCount(), 1u);
}

class Following final : public NavigationObserver {
 public:
  std::vector<std::string> told;
  void didPush(ListPage& page) override { told.push_back("push " + page.title()); }
  void willPop(ListPage& page) override { told.push_back("pop " + page.title()); }
};

TEST_F(Navigation, AnObserverHearsOfEachPageThatComesAndGoes) {
  Following following;
  stack.setObserver(&following);
  tap("LTE");
  tap("C-DRX");
  stack.popToRoot();
  stack.setObserver(nullptr);
  tap("GSM");
  EXPECT_EQ(following.told, (std::vector<std::string>{"push LTE", "push C-DRX", "pop C-DRX", "pop LTE"}));
}

TEST_F(Navigation, ListsThatLeadFurtherShowSoAndValueRowsDoNot) {
  EXPECT_TRUE(showsDisclosure("LaunchView"));
  EXPECT_TRUE(showsDisclosure("FirstClickView"));
  EXPECT_FALSE(showsDisclosure("SecondClickView"));
  EXPECT_FALSE(showsDisclosure("ThirdClickView"));
}

}  // namespace
}  // namespace probeview
