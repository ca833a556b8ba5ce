// SPDX-License-Identifier: Apache-2.0
//
// What the line below a page says of the real service process.
#include <gtest/gtest.h>

#include <fstream>
#include <regex>

#include "app/root_navigation_controller.h"
#include "platform/event_loop.h"
#include "platform/resources.h"
#include "tests/app/radixd_process.h"
#include "tests/ui/testing.h"
#include "ui/open_page.h"
#include "ui/status_line.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

class RealStatus : public testing::Test {
 protected:
  // A session as the viewer begins it.
  struct Session {
    EventLoop loop;
    testing_ui::RememberedLines console;
    DiscardingSink systemLog;
    RadixWrapper wrapper{radix::client::CreateManager("probeview", RadixWrapper::queue()),
                         {.mainQueue = loop, .systemLog = systemLog}};
    MetricValidator validator{{.wrapper = &wrapper, .console = console, .systemLog = systemLog}};
    RootNavigationController controller{&wrapper, validator, PageEnvironment{loop, loop, console, validator}};

    Status line() {
      return StatusLine().status({.service = wrapper.serviceStatus(),
                                  .feed = feedOfTopPage(controller),
                                  .isConfigurationMissing = controller.metricFileIsMissing()});
    }
    bool untilKind(Status::Kind kind) {
      const auto wake = loop.every(20ms, [] {});
      return loop.runUntil([&] { return line().kind == kind; }, 20s);
    }
  };

  ~RealStatus() override { setResourceFolders({}); }
};

TEST_F(RealStatus, ATraceThatWasPlayedHasEndedAndCannotFillWhatItHasNoColumnsFor) {
  RadixdProcess radixd("trace:tests/pages/traces/drive_a.csv,speed=1000");
  ASSERT_TRUE(radixd.start());
  Session session;
  session.controller.viewDidLoad();
  ASSERT_TRUE(openPage(session.controller, "LTE RRC State"));
  EXPECT_TRUE(session.untilKind(Status::Kind::Ended)) << session.line().text;
  const std::regex ended("trace:drive_a\\.csv · [0-9.]+ (s|min) ago · trace ended");
  EXPECT_TRUE(std::regex_match(session.line().text, ended)) << session.line().text;
  ASSERT_TRUE(openPage(session.controller, "UMTS NAS MM"));
  EXPECT_EQ(session.line(), (Status{Status::Kind::Unfillable, "trace:drive_a.csv cannot fill this page"}));
  session.controller.popToRoot();
  EXPECT_TRUE(std::regex_match(session.line().text, ended)) << session.line().text;
  // Whoever comes later finds the trace ended, too, and its records no younger.
  const auto age = [](Session& of) {
    const auto& last = *of.wrapper.serviceStatus().lastRecord;
    return last.age.value_or(0ms) + (systemClock().ageTime() - last.receivedAgeTime);
  };
  const auto before = age(session);
  Session later;
  later.controller.viewDidLoad();
  EXPECT_TRUE(later.untilKind(Status::Kind::Ended)) << later.line().text;
  EXPECT_GE(age(later) + 1ms, before);
}

TEST_F(RealStatus, AScenarioIsLiveAndNamed) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  Session session;
  session.controller.viewDidLoad();
  ASSERT_TRUE(openPage(session.controller, "LTE Serving Cell Info"));
  EXPECT_TRUE(session.untilKind(Status::Kind::Live)) << session.line().text;
  EXPECT_TRUE(session.line().text.starts_with("scenario:city · ")) << session.line().text;
}

TEST_F(RealStatus, WithoutTheConfigurationsFileItSaysSoAndNothingComes) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const TemporaryFolder empty;
  setResourceFolders({empty.path()});
  Session session;
  session.controller.viewDidLoad();
  EXPECT_TRUE(session.untilKind(Status::Kind::Failed));
  EXPECT_EQ(session.line().text, "no configuration: resource missing");
}

TEST_F(RealStatus, AConfigurationThatTheServiceRefusesIsSaidWithItsReason) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const TemporaryFolder folder;
  std::ofstream(folder.path() + "/kiv_test_lte.deviceconfig") << "[metrics\n";
  setResourceFolders({folder.path()});
  Session session;
  session.controller.viewDidLoad();
  ASSERT_TRUE(openPage(session.controller, "LTE RRC State"));
  EXPECT_TRUE(session.untilKind(Status::Kind::Failed));
  EXPECT_TRUE(session.line().text.starts_with("configuration refused: ")) << session.line().text;
  EXPECT_NE(session.line().text.find("line 1"), std::string::npos) << session.line().text;
}

TEST_F(RealStatus, AServiceThatGoesIsAway) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  Session session;
  session.controller.viewDidLoad();
  ASSERT_TRUE(openPage(session.controller, "LTE RRC State"));
  EXPECT_TRUE(session.untilKind(Status::Kind::Live)) << session.line().text;
  radixd.kill();
  EXPECT_TRUE(session.untilKind(Status::Kind::Away));
  EXPECT_TRUE(session.line().text.ends_with(", showing what was last known")) << session.line().text;
}

}  // namespace
}  // namespace probeview
