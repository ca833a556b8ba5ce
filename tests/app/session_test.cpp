// SPDX-License-Identifier: Apache-2.0
//
// The start of the metric session, against a manager that writes down what it is asked.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "app/app_delegate.h"
#include "app/application.h"
#include "app/fill_watch.h"
#include "app/root_navigation_controller.h"
#include "messages/metric_identifiers.h"
#include "platform/resources.h"
#include "radix/manager.h"
#include "tests/ui/testing.h"
#include "ui/first_level_view_controller.h"
#include "ui/varnet_view_controller.h"
#include "values/printer.h"

namespace probeview {
namespace {

using Lines = std::vector<std::string>;
using namespace std::chrono_literals;

class WritingManager final : public radix::client::Manager {
 public:
  explicit WritingManager(Lines& calls) : calls_(calls) {}

  // Answered with this status; every other command with 0.
  std::map<std::string, std::int32_t> refused;

  radix::client::Result performCommand(std::string_view command, const Dictionary& arguments,
                                       radix::client::ObjectHandle&) override {
    calls_.push_back(std::string(command) + " " + printed(arguments));
    const auto status = refused.find(std::string(command));
    return status == refused.end() ? radix::client::Result{0, "ok"} : radix::client::Result{status->second, "refused"};
  }
  void registerEventHandler(std::string_view, radix::client::EventHandler) override {}
  void eventsOn() override { calls_.emplace_back("events on"); }
  void eventsOff() override { calls_.emplace_back("events off"); }
  radix::client::ConnectionState connection() const override { return {}; }

 private:
  Lines& calls_;
};

class SessionStart : public testing::Test {
 protected:
  SessionStart() {
    std::filesystem::create_directories(folder);
    setResourceFolders({folder});
  }
  ~SessionStart() override {
    setResourceFolders({});
    std::filesystem::remove_all(folder);
  }
  void putConfiguration() { std::ofstream(folder + "/kiv_test_lte.deviceconfig") << "abc"; }

  const std::string folder = testing::TempDir() + "session_test." + std::to_string(::getpid()) + "." +
                             testing::UnitTest::GetInstance()->current_test_info()->name();
  ManualLoop loop;
  // Standard output and the system's log in one, so that their common order is seen.
  testing_ui::RememberedLines log;
  Lines calls;
  std::shared_ptr<WritingManager> manager = std::make_shared<WritingManager>(calls);
  RadixWrapper wrapper{manager, {.mainQueue = loop, .systemLog = log, .clock = loop}};
  MetricValidator validator{{.wrapper = &wrapper, .console = log, .systemLog = log}};
  const PageEnvironment environment{loop, loop, log, validator};
};

const std::string clearLine = "-[RadixWrapper removeTelemConfigForAppid:]: error=0 msg=ok";
const std::string addLine = "-[RadixWrapper addTelemConfigForAppId:andProtofFilePath:]: error=0 msg=ok";
const std::string listenLine = "-[RadixWrapper listen]: listening for events";
const std::string queryLine =
    "-[RadixWrapper querySpecificMetric:triggerRef:triggerType:triggerID:profileID:metricID:]: error=0 msg=ok";

TEST_F(SessionStart, WithTheResourcePresentAndTheServiceAcceptingItTheLogShowsTheStepsInOrder) {
  putConfiguration();
  RootNavigationController controller(&wrapper, validator, environment);
  // The store listens as soon as it is made, before the controller's view loads.
  EXPECT_EQ(log.lines, Lines{listenLine});
  log.lines.clear();
  controller.viewDidLoad();
  EXPECT_EQ(log.lines, (Lines{clearLine, "pushing metric file", addLine, listenLine, "Querying SIM files", queryLine}));
}

TEST_F(SessionStart, TheServiceIsToldToClearToTakeTheFileToDeliverAndToReportTheSimFiles) {
  putConfiguration();
  RootNavigationController controller(&wrapper, validator, environment);
  calls.clear();
  controller.viewDidLoad();
  EXPECT_EQ(calls, (Lines{
                       R"(kCommandClearConfiguration ["kKeyAppID": 2])",
                       R"(kCommandAddConfiguration ["kKeyAppID": 2, "kKeyPayload": <616263>, "kKeyPayloadType": 0])",
                       "events off",
                       "events on",
                       R"(kCommandQueryMetric ["kKeyAppID": 2, "kKeyPayloadType": 0, "kKeyTriggerRef": 9999, )"
                       R"("kKeyTriggerType": 0, "kKeyTriggerID": 8323091, "kKeyProfileID": 0, "kKeyMetricID": 0])",
                   }));
}

TEST_F(SessionStart, WithoutTheResourceTheConfigurationIsClearedAndNothingElseHappens) {
  RootNavigationController controller(&wrapper, validator, environment);
  log.lines.clear();
  calls.clear();
  controller.viewDidLoad();
  EXPECT_EQ(log.lines, (Lines{clearLine, "Metric Log File path doesnt exist"}));
  EXPECT_EQ(calls, Lines{R"(kCommandClearConfiguration ["kKeyAppID": 2])"});
}

TEST_F(SessionStart, ARefusedConfigurationEndsTheStartSilently) {
  putConfiguration();
  manager->refused[radix::kCommandAddConfiguration] = 3;
  RootNavigationController controller(&wrapper, validator, environment);
  log.lines.clear();
  controller.viewDidLoad();
  EXPECT_EQ(log.lines, (Lines{clearLine, "pushing metric file",
                              "-[RadixWrapper addTelemConfigForAppId:andProtofFilePath:]: error=3 msg=refused"}));
}

TEST_F(SessionStart, ARefusedClearingIsIgnored) {
  putConfiguration();
  manager->refused[radix::kCommandClearConfiguration] = 6;
  RootNavigationController controller(&wrapper, validator, environment);
  controller.viewDidLoad();
  EXPECT_EQ(log.lines.back(), queryLine);
}

TEST_F(SessionStart, WithoutAWrapperTheMissingResourceIsNoted) {
  RootNavigationController controller(nullptr, validator, environment);
  log.lines.clear();
  controller.viewDidLoad();
  EXPECT_EQ(log.lines, Lines{"Metric Log File path doesnt exist"});
}

TEST_F(SessionStart, WithoutAWrapperToPushTheFileWithTheProgramStops) {
  putConfiguration();
  RootNavigationController controller(nullptr, validator, environment);
  log.lines.clear();
  EXPECT_TRUE(testing_ui::stopReason([&] { controller.viewDidLoad(); }));
  EXPECT_EQ(log.lines, Lines{"pushing metric file"});
}

TEST_F(SessionStart, TheListeningIsThatOfTheStoresOwnWrapper) {
  putConfiguration();
  MetricValidator fedByHand({.wrapper = nullptr, .console = log, .systemLog = log});
  RootNavigationController controller(&wrapper, fedByHand, environment);
  log.lines.clear();
  controller.viewDidLoad();
  EXPECT_EQ(log.lines, (Lines{clearLine, "pushing metric file", addLine, "Querying SIM files", queryLine}));
}

TEST_F(SessionStart, TheControllersPropertiesHaveTheirValuesFromTheStart) {
  const RootNavigationController controller(&wrapper, validator, environment);
  EXPECT_EQ(controller.myAppID, "probeview");
  EXPECT_EQ(controller.metricFileName, "kiv_test_lte");
  EXPECT_EQ(controller.metricFileType, "deviceconfig");
  EXPECT_EQ(controller.myRadixWrapper, &wrapper);
  EXPECT_EQ(&controller.myMetricValidator, &validator);
}

TEST_F(SessionStart, TheNameAndTypeOfTheResourceAreTheControllersProperties) {
  std::ofstream(folder + "/other.toml") << "";
  RootNavigationController controller(&wrapper, validator, environment);
  controller.metricFileName = "other";
  controller.metricFileType = "toml";
  controller.viewDidLoad();
  EXPECT_EQ(log.lines.back(), queryLine);
}

TEST_F(SessionStart, AnotherApplicationIdentifierSendsNothing) {
  putConfiguration();
  RootNavigationController controller(&wrapper, validator, environment);
  controller.myAppID = "another";
  log.lines.clear();
  controller.viewDidLoad();
  EXPECT_EQ(log.lines, Lines{"pushing metric file"});
}

class WarnedPage final : public ListPage {
 public:
  explicit WarnedPage(int& warnings) : warnings_(warnings) {}
  std::string title() const override { return ""; }
  std::size_t numberOfSectionsInTableView() override { return 0; }
  std::optional<std::string> titleForHeaderInSection(std::size_t) override { return std::nullopt; }
  std::size_t numberOfRowsInSection(std::size_t) override { return 0; }
  void cellForRowAtIndexPath(std::size_t, std::size_t, ListCell&) override {}
  void didReceiveMemoryWarning() override { ++warnings_; }

 private:
  int& warnings_;
};

TEST_F(SessionStart, AMemoryWarningIsOnlyPassedOn) {
  int warnings = 0;
  RootNavigationController controller(&wrapper, validator, environment, std::make_unique<WarnedPage>(warnings));
  log.lines.clear();
  controller.didReceiveMemoryWarning();
  EXPECT_EQ(warnings, 1);
  EXPECT_EQ(log.lines, Lines{});
}

TEST_F(SessionStart, TheContainerStartsWithTheLaunchListAndItsPagesReadItsStore) {
  RootNavigationController controller(&wrapper, validator, environment);
  EXPECT_NE(dynamic_cast<VarnetViewController*>(&controller.topPage()), nullptr);
  controller.tap({"LaunchView", "LTE", std::nullopt});
  const auto* page = dynamic_cast<FirstLevelViewController*>(&controller.topPage());
  ASSERT_NE(page, nullptr);
  EXPECT_EQ(&page->myMetricValidator, &validator);
}

TEST(AppDelegateLife, LaunchingIsAllowedAndNothingElseIsDone) {
  AppDelegate delegate;
  EXPECT_EQ(delegate.window, nullptr);
  EXPECT_TRUE(delegate.didFinishLaunchingWithOptions());
  delegate.applicationWillResignActive();
  delegate.applicationDidEnterBackground();
  delegate.applicationWillEnterForeground();
  delegate.applicationDidBecomeActive();
  delegate.applicationWillTerminate();
  EXPECT_EQ(delegate.window, nullptr);
}

// Writes down what it hears of the application's life, and the front's part in it.
class WritingDelegate final : public ApplicationDelegate {
 public:
  WritingDelegate(Lines& life, bool letsLaunch) : life_(life), letsLaunch_(letsLaunch) {}

  bool didFinishLaunchingWithOptions() override {
    life_.emplace_back("launched");
    return letsLaunch_;
  }
  void applicationWillResignActive() override { life_.emplace_back("resigns"); }
  void applicationDidEnterBackground() override { life_.emplace_back("background"); }
  void applicationWillEnterForeground() override { life_.emplace_back("foreground"); }
  void applicationDidBecomeActive() override { life_.emplace_back("active"); }
  void applicationWillTerminate() override { life_.emplace_back("terminates"); }

 private:
  Lines& life_;
  bool letsLaunch_;
};

class WritingFront final : public Front {
 public:
  explicit WritingFront(Lines& life) : life_(life) {}

  TaskQueue& mainQueue() override { return loop_; }
  Scheduler& scheduler() override { return loop_; }
  int run(NavigationStack& navigation, const StatusSource&) override {
    life_.push_back("shows " + navigation.topPage().title());
    return 7;
  }

 private:
  ManualLoop loop_;
  Lines& life_;
};

TEST(AppDelegateLife, TheDelegateHearsOfLaunchAndEndAroundWhatTheFrontShows) {
  Lines life;
  WritingFront front(life);
  WritingDelegate delegate(life, true);
  EXPECT_EQ(applicationMain(delegate, front, [&](MetricSession&) { life.emplace_back("prepared"); }), 7);
  EXPECT_EQ(life, (Lines{"launched", "prepared", "active", "shows probeview", "terminates"}));
  EXPECT_EQ(delegate.window, &front);
}

TEST(AppDelegateLife, ADelegateThatDoesNotLetTheApplicationLaunchEndsIt) {
  Lines life;
  WritingFront front(life);
  WritingDelegate delegate(life, false);
  EXPECT_EQ(applicationMain(delegate, front), 1);
  EXPECT_EQ(life, Lines{"launched"});
}

class FillWatching : public testing::Test {
 protected:
  ManualLoop clock;
  testing_ui::RememberedLines log;
  testing_ui::HandFilledStore store{log, log};
  int timesAsked = 0;

  FillWatch watchFor(std::optional<std::set<std::int64_t>> fillable) {
    return FillWatch(store, clock, [this, fillable] {
      ++timesAsked;
      return fillable;
    });
  }
  void comes(DisplayDictionary which) { store.filled[which] = Dictionary{}; }
};

TEST_F(FillWatching, AStoreIsFilledWhenEveryMetricThatTheSourcesCanFillHasCome) {
  // The last one is a metric that nobody handles.
  auto watch = watchFor(std::set<std::int64_t>{K_LTE_RRC_STATE, K_CELLULAR_MM_CTXT, K_LTE_RLF});
  EXPECT_FALSE(watch.isFilled());
  comes(DisplayDictionary::myLTERRCStateDict);
  EXPECT_FALSE(watch.isFilled());
  comes(DisplayDictionary::myGMMContextDict);
  clock.advance(1min);
  EXPECT_FALSE(watch.isFilled()) << "silence is not enough";
  comes(DisplayDictionary::myMMContextDict);
  EXPECT_TRUE(watch.isFilled());
  EXPECT_EQ(timesAsked, 1);
}

TEST_F(FillWatching, TheServiceIsAskedAgainEverySecondUntilItSays) {
  std::optional<std::set<std::int64_t>> fillable;
  FillWatch watch(store, clock, [&] {
    ++timesAsked;
    return fillable;
  });
  comes(DisplayDictionary::myLTERRCStateDict);
  EXPECT_FALSE(watch.isFilled());
  EXPECT_FALSE(watch.isFilled());
  EXPECT_EQ(timesAsked, 1);
  fillable = {K_LTE_RRC_STATE, K_CELLULAR_MM_CTXT};
  clock.advance(999ms);
  EXPECT_FALSE(watch.isFilled());
  EXPECT_EQ(timesAsked, 1);
  clock.advance(1ms);
  EXPECT_FALSE(watch.isFilled());
  clock.advance(1min);
  EXPECT_FALSE(watch.isFilled()) << "now silence is not enough";
  EXPECT_EQ(timesAsked, 2);
}

TEST_F(FillWatching, WhereTheServiceDoesNotSayAStoreIsFilledWhenNoOtherMetricHasComeForThreeSeconds) {
  auto watch = watchFor(std::nullopt);
  clock.advance(1min);
  EXPECT_FALSE(watch.isFilled()) << "nothing has come at all";
  comes(DisplayDictionary::myLTERRCStateDict);
  EXPECT_FALSE(watch.isFilled());
  clock.advance(2999ms);
  EXPECT_FALSE(watch.isFilled());
  comes(DisplayDictionary::myMMContextDict);
  EXPECT_FALSE(watch.isFilled());
  clock.advance(2999ms);
  store.filled[DisplayDictionary::myMMContextDict] = Dictionary{{"again", Value(true)}};
  EXPECT_FALSE(watch.isFilled());
  clock.advance(1ms);
  EXPECT_TRUE(watch.isFilled());
}

}  // namespace
}  // namespace probeview
