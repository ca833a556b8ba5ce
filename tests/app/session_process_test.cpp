// SPDX-License-Identifier: Apache-2.0
//
// A session of this process against the real service process.
#include <gtest/gtest.h>

#include <algorithm>
#include <mutex>

#include "app/root_navigation_controller.h"
#include "platform/event_loop.h"
#include "tests/app/radixd_process.h"
#include "ui/open_page.h"
#include "ui/page_snapshot.h"
#include "ui/second_level_view_controller.h"
#include "ui/status_line.h"

namespace probeview {
namespace {

using Lines = std::vector<std::string>;
using namespace std::chrono_literals;

// Standard output and the system's log in one; the latter's lines come from the wrapper's queue, too.
class SharedLog final : public LineSink {
 public:
  void line(std::string_view text) override {
    const std::lock_guard lock(mutex_);
    lines_.emplace_back(text);
  }
  Lines lines() const {
    const std::lock_guard lock(mutex_);
    return lines_;
  }

 private:
  mutable std::mutex mutex_;
  Lines lines_;
};

class RealService : public testing::Test {
 protected:
  bool until(const std::function<bool()>& condition, std::chrono::nanoseconds atMost = 20s) {
    // The condition may hold by the mere passing of time.
    const auto wake = loop.every(50ms, [] {});
    return loop.runUntil(condition, atMost);
  }
  bool has(DisplayDictionary which) const { return validator.displayDictionary(which).has_value(); }

  RadixdProcess radixd{"scenario:city,seed=1"};
  const bool isServing = radixd.start();
  EventLoop loop;
  SharedLog log;
  RadixWrapper wrapper{radix::client::CreateManager("probeview", RadixWrapper::queue()),
                       {.mainQueue = loop, .systemLog = log}};
  MetricValidator validator{{.wrapper = &wrapper, .console = log, .systemLog = log}};
  RootNavigationController controller{&wrapper, validator, PageEnvironment{loop, loop, log, validator}};
};

TEST_F(RealService, TheSessionStartsInItsOrderAndTheSimFilesAnswer) {
  ASSERT_TRUE(isServing);
  controller.viewDidLoad();
  Lines steps;
  for (const auto& line : log.lines()) {
    // Metrics that the service already delivers come in between, from the wrapper's queue.
    if (line.find("dict=") == std::string::npos) steps.push_back(line.substr(0, line.find(" msg=")));
  }
  EXPECT_EQ(steps,
            (Lines{
                "-[RadixWrapper listen]: listening for events",
                "-[RadixWrapper removeTelemConfigForAppid:]: error=0",
                "pushing metric file",
                "-[RadixWrapper addTelemConfigForAppId:andProtofFilePath:]: error=0",
                "-[RadixWrapper listen]: listening for events",
                "Querying SIM files",
                "-[RadixWrapper querySpecificMetric:triggerRef:triggerType:triggerID:profileID:metricID:]: error=0",
            }));
  EXPECT_TRUE(until([&] { return has(DisplayDictionary::mySIMFileInfoDict); }));
}

TEST_F(RealService, EveryMetricThatTheSourcesCanFillComesOnce) {
  ASSERT_TRUE(isServing);
  controller.viewDidLoad();
  const auto fillable = wrapper.fillableMetrics();
  ASSERT_TRUE(fillable);
  EXPECT_EQ(fillable->size(), 29u);
  EXPECT_TRUE(until([&] {
    for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
      const auto which = static_cast<DisplayDictionary>(index);
      if (which != DisplayDictionary::myLTESCellMeasDict && !has(which)) return false;
    }
    return true;
  }));
}

TEST_F(RealService, KillingAndRestartingItUnderARunningSessionResumesWithinSixSecondsAndLosesNothingThatWasShown) {
  ASSERT_TRUE(isServing);
  controller.viewDidLoad();
  ASSERT_TRUE(openPage(controller, "LTE RRC State"));
  PageSnapshot shown;
  int reloads = 0;
  controller.topPage().setReloadObserver([&] {
    ++reloads;
    shown = takeSnapshot(controller.topPage());
  });
  ASSERT_TRUE(until([&] { return shown.rowCount() > 0; }));

  radixd.kill();
  ASSERT_TRUE(until([&] { return !wrapper.serviceStatus().connection.connected; }));
  // What was received before is delivered first.
  bool isDelivered = false;
  RadixWrapper::queue()->post([&] { loop.post([&] { isDelivered = true; }); });
  ASSERT_TRUE(until([&] { return isDelivered; }));
  const auto known = takeSnapshot(controller.topPage());
  EXPECT_GT(known.rowCount(), 0u);
  const int reloadsBefore = reloads;
  ASSERT_TRUE(until([&] { return reloads > reloadsBefore; }));
  EXPECT_EQ(shown, known) << "a page that reloads while the service is away shows what was last known";
  EXPECT_NE(StatusLine().status({wrapper.serviceStatus()}).text.find("away since"), std::string::npos);

  const auto wentAway = systemClock().ageTime();
  ASSERT_TRUE(radixd.start());
  const auto restarted = systemClock().monotonicTime();
  EXPECT_TRUE(until(
      [&] {
        const auto last = wrapper.serviceStatus().lastRecord;
        return last && last->receivedAgeTime > wentAway && last->origin == "scenario:city";
      },
      6s));
  EXPECT_LT(systemClock().monotonicTime() - restarted, 6s);
  EXPECT_TRUE(wrapper.serviceStatus().connection.connected);
  EXPECT_EQ(StatusLine().status({wrapper.serviceStatus()}).text.find("scenario:city · "), 0u);
}

TEST_F(RealService, ASessionStartedBeforeTheServiceWaitsAndFillsWhenItComes) {
  ASSERT_TRUE(isServing);
  radixd.kill();
  ASSERT_TRUE(until([&] { return !wrapper.serviceStatus().connection.connected; }));
  // The configuration cannot be pushed; events flow all the same, because a client without one receives every record.
  controller.viewDidLoad();
  EXPECT_TRUE(std::ranges::none_of(log.lines(), [](const auto& line) { return line == "Querying SIM files"; }));
  ASSERT_TRUE(radixd.start());
  EXPECT_TRUE(until([&] { return has(DisplayDictionary::myLTERRCStateDict); }));
}

}  // namespace
}  // namespace probeview
