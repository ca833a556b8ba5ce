// SPDX-License-Identifier: Apache-2.0
#include "client/radix_wrapper.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <functional>
#include <limits>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "platform/manual_loop.h"
#include "platform/serial_queue.h"
#include "radix/manager.h"
#include "radix/object.h"
#include "tests/support/harmless.h"
#include "values/printer.h"

namespace probeview {
namespace {

using Lines = std::vector<std::string>;

class CollectingSink final : public LineSink {
 public:
  void line(std::string_view text) override { lines.emplace_back(text); }
  Lines lines;
};

// A service in hand: notes every call, and sends events when told to.
class FakeManager final : public radix::client::Manager {
 public:
  radix::client::Result performCommand(std::string_view command, const Dictionary& arguments,
                                       radix::client::ObjectHandle&) override {
    calls.emplace_back(std::string(command) + " " + printed(arguments));
    sent.push_back(arguments);
    return answer;
  }
  void registerEventHandler(std::string_view event, radix::client::EventHandler handler) override {
    calls.emplace_back("register " + std::string(event));
    handlers[std::string(event)] = std::move(handler);
  }
  void eventsOn() override { calls.emplace_back("on"); }
  void eventsOff() override { calls.emplace_back("off"); }
  radix::client::ConnectionState connection() const override { return state; }

  void send(const char* event, const Dictionary& content) {
    handlers.at(event)(radix::client::makeObject(content), radix::client::Group{});
  }

  radix::client::Result answer;
  radix::client::ConnectionState state;
  Lines calls;
  std::vector<Dictionary> sent;
  std::map<std::string, radix::client::EventHandler> handlers;
};

class NotedDelegate final : public RadixWrapperDelegate {
 public:
  void eventsDidUpdate(const Dictionary* event) override { calls.emplace_back("events " + printed(*event)); }
  void metricsDidUpdate(const Dictionary* event) override { calls.emplace_back("metrics " + printed(*event)); }
  Lines calls;
};

class RadixWrapperTest : public testing::Test {
 protected:
  std::string file(std::string_view content) const {
    const std::string path =
        testing::TempDir() + "radix_wrapper_" + testing::UnitTest::GetInstance()->current_test_info()->name();
    std::ofstream(path, std::ios::binary) << content;
    return path;
  }

  std::shared_ptr<FakeManager> manager_ = std::make_shared<FakeManager>();
  ManualLoop main_;
  CollectingSink systemLog_;
  RadixWrapper wrapper_{manager_, {.mainQueue = main_, .systemLog = systemLog_, .clock = main_}};
};

TEST_F(RadixWrapperTest, ClearingSendsADictionaryThatHoldsOnlyTheApplicationIdentifierTwo) {
  EXPECT_TRUE(wrapper_.removeTelemConfigForAppid("probeview"));
  EXPECT_EQ(manager_->calls, (Lines{R"(kCommandClearConfiguration ["kKeyAppID": 2])"}));
  ASSERT_EQ(manager_->sent.size(), 1u);
  EXPECT_EQ(manager_->sent[0].find("kKeyAppID")->int64(), 2);
}

TEST_F(RadixWrapperTest, AddingSendsTheWholeFileByteForByteUnderTheKeysInTheirOrder) {
  using namespace std::string_view_literals;
  EXPECT_TRUE(wrapper_.addTelemConfigForAppId("probeview", file("a\0\xff\r\n"sv)));
  EXPECT_EQ(manager_->calls,
            (Lines{R"(kCommandAddConfiguration ["kKeyAppID": 2, "kKeyPayload": <6100ff0d0a>, "kKeyPayloadType": 0])"}));
  EXPECT_EQ(manager_->sent[0].find("kKeyPayloadType")->int64(), 0);
}

TEST_F(RadixWrapperTest, AFileLargerThanOneReadIsSentWhole) {
  const std::string content(100'001, 'x');
  EXPECT_TRUE(wrapper_.addTelemConfigForAppId("probeview", file(content)));
  EXPECT_EQ(manager_->sent[0].find("kKeyPayload")->bytes()->size(), content.size());
}

TEST_F(RadixWrapperTest, OfWhatHasNoEndNoMoreIsReadThanIsRefusedAndTheRefusalIsLogged) {
  manager_->answer = {5, "too large"};
  EXPECT_FALSE(wrapper_.addTelemConfigForAppId("probeview", "/dev/zero"));
  ASSERT_EQ(manager_->sent.size(), 1u);
  EXPECT_EQ(manager_->sent[0].find("kKeyPayload")->bytes()->size(), 128u * 1024 + 1);
  EXPECT_EQ(systemLog_.lines,
            (Lines{"-[RadixWrapper addTelemConfigForAppId:andProtofFilePath:]: error=5 msg=too large"}));
}

TEST_F(RadixWrapperTest, AnEmptyButExistingFileIsSentAsAnEmptyDataValue) {
  EXPECT_TRUE(wrapper_.addTelemConfigForAppId("probeview", file("")));
  EXPECT_EQ(manager_->calls,
            (Lines{R"(kCommandAddConfiguration ["kKeyAppID": 2, "kKeyPayload": <>, "kKeyPayloadType": 0])"}));
}

TEST_F(RadixWrapperTest, AFileThatIsMissingOrUnreadableIsFalseWithNothingSentAndNothingLogged) {
  EXPECT_FALSE(wrapper_.addTelemConfigForAppId("probeview", testing::TempDir() + "there_is_no_such_file"));
  EXPECT_FALSE(wrapper_.addTelemConfigForAppId("probeview", testing::TempDir()));
  EXPECT_EQ(manager_->calls, Lines{});
  EXPECT_EQ(systemLog_.lines, Lines{});
}

TEST_F(RadixWrapperTest, WhatTheServiceSaysStaysOnItsLineOfTheLog) {
  manager_->answer = {3, "line 1\n\x1b[2Jgone\xff"};
  EXPECT_FALSE(wrapper_.removeTelemConfigForAppid("probeview"));
  EXPECT_EQ(systemLog_.lines,
            Lines{"-[RadixWrapper removeTelemConfigForAppid:]: error=3 msg=line 1\\n\\u{1b}[2Jgone\ufffd"});
  manager_->answer = {3, hostileText()};
  wrapper_.removeTelemConfigForAppid("probeview");
  EXPECT_TRUE(isHarmless(systemLog_.lines.back()));
}

TEST_F(RadixWrapperTest, AQuerySendsItsArgumentsWidenedWithTheirSignInTheirOrder) {
  EXPECT_TRUE(wrapper_.querySpecificMetric("probeview", 9999, 0, 0x7F0013, 0, 0));
  EXPECT_TRUE(wrapper_.querySpecificMetric("probeview", std::numeric_limits<std::int32_t>::min(), 1, 2, -7, 3));
  EXPECT_EQ(manager_->calls,
            (Lines{R"(kCommandQueryMetric ["kKeyAppID": 2, "kKeyPayloadType": 0, "kKeyTriggerRef": 9999, )"
                   R"("kKeyTriggerType": 0, "kKeyTriggerID": 8323091, "kKeyProfileID": 0, "kKeyMetricID": 0])",
                   R"(kCommandQueryMetric ["kKeyAppID": 2, "kKeyPayloadType": 0, "kKeyTriggerRef": -2147483648, )"
                   R"("kKeyTriggerType": 1, "kKeyTriggerID": 2, "kKeyProfileID": -7, "kKeyMetricID": 3])"}));
}

TEST_F(RadixWrapperTest, ANegativeProfileIdentifierIsSentAsANegative64BitInteger) {
  wrapper_.querySpecificMetric("probeview", 0, 0, 0, -1, 0);
  const Value* profile = manager_->sent[0].find("kKeyProfileID");
  ASSERT_NE(profile, nullptr);
  EXPECT_EQ(profile->kind(), ValueKind::Int64);
  EXPECT_EQ(profile->int64(), -1);
}

TEST_F(RadixWrapperTest, AnotherApplicationIdentifierIsFalseWithNothingSentAndNothingLogged) {
  const std::string path = file("content");
  for (const std::string_view other : {"", "Probeview", "probeview ", "probe"}) {
    EXPECT_FALSE(wrapper_.addTelemConfigForAppId(other, path));
    EXPECT_FALSE(wrapper_.removeTelemConfigForAppid(other));
    EXPECT_FALSE(wrapper_.querySpecificMetric(other, 0, 0, 0, 0, 0));
  }
  EXPECT_EQ(manager_->calls, Lines{});
  EXPECT_EQ(systemLog_.lines, Lines{});
}

TEST_F(RadixWrapperTest, EachCommandLogsItsNameStatusAndMessageOnSuccessAndOnFailureAlike) {
  const std::string path = file("content");
  EXPECT_TRUE(wrapper_.addTelemConfigForAppId("probeview", path));
  manager_->answer = {-5, "no service"};
  EXPECT_FALSE(wrapper_.addTelemConfigForAppId("probeview", path));
  EXPECT_FALSE(wrapper_.removeTelemConfigForAppid("probeview"));
  manager_->answer = {7, ""};
  EXPECT_FALSE(wrapper_.querySpecificMetric("probeview", 0, 0, 0, 0, 0));
  EXPECT_EQ(systemLog_.lines,
            (Lines{"-[RadixWrapper addTelemConfigForAppId:andProtofFilePath:]: error=0 msg=",
                   "-[RadixWrapper addTelemConfigForAppId:andProtofFilePath:]: error=-5 msg=no service",
                   "-[RadixWrapper removeTelemConfigForAppid:]: error=-5 msg=no service",
                   "-[RadixWrapper querySpecificMetric:triggerRef:triggerType:triggerID:profileID:metricID:]: error=7 "
                   "msg="}));
}

TEST_F(RadixWrapperTest, ListeningRegistersBothHandlersAndRestartsDelivery) {
  wrapper_.listen();
  EXPECT_EQ(manager_->calls, (Lines{"register kEventTrigger", "register kEventMetric", "off", "on"}));
  EXPECT_EQ(systemLog_.lines, (Lines{"-[RadixWrapper listen]: listening for events"}));
}

TEST_F(RadixWrapperTest, ListeningTwiceRegistersAgainAndDoesNotDeliverTwice) {
  const auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  wrapper_.listen();
  wrapper_.listen();
  EXPECT_EQ(manager_->calls.size(), 8u);
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{1}}});
  main_.run();
  EXPECT_EQ(delegate->calls, (Lines{R"(metrics ["kKeyMetricID": 1])"}));
}

TEST_F(RadixWrapperTest, EventsAreLoggedWhereTheyArriveAndDeliveredOnTheMainQueue) {
  const auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  wrapper_.listen();
  systemLog_.lines.clear();
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{0x3C4E04}},
                                       {"kKeyPayload", Value::bytes(std::vector<std::uint8_t>{8, 1})}});
  manager_->send(radix::kEventTrigger, {{"kKeyTriggerID", std::int64_t{5}}});
  EXPECT_EQ(systemLog_.lines,
            (Lines{"-[RadixWrapper listen]_block_invoke: MetricsTrigger dict=[\"kKeyMetricID\": 3952132, "
                   "\"kKeyPayload\": <0801>]",
                   "-[RadixWrapper listen]_block_invoke: EventTrigger dict=[\"kKeyTriggerID\": 5]"}));
  EXPECT_EQ(delegate->calls, Lines{});
  main_.run();
  EXPECT_EQ(delegate->calls,
            (Lines{R"(metrics ["kKeyMetricID": 3952132, "kKeyPayload": <0801>])", R"(events ["kKeyTriggerID": 5])"}));
}

// One value of a large event that is copied costs as much as the event; one of a small event lies within its
// dictionary.
TEST_F(RadixWrapperTest, TheDelegateIsGivenTheEventThatTheLibraryHandedOverAndNoCopyOfIt) {
  class Looking final : public RadixWrapperDelegate {
   public:
    void eventsDidUpdate(const Dictionary* event) override { seen = event; }
    void metricsDidUpdate(const Dictionary* event) override { seen = event; }
    const Dictionary* seen = nullptr;
  };
  const auto delegate = std::make_shared<Looking>();
  wrapper_.setDelegate(delegate);
  wrapper_.listen();
  for (const char* name : {radix::kEventMetric, radix::kEventTrigger}) {
    auto event = radix::client::makeObject({{"kKeyMetricID", std::int64_t{0x3C4E04}}});
    const std::weak_ptr<const radix::client::Object> waits = event;
    const Dictionary* content = &radix::client::nativeDictionary(*event);
    manager_->handlers.at(name)(event, radix::client::Group{});
    event.reset();
    EXPECT_FALSE(waits.expired()) << "it counts among those that wait until the main thread has had it";
    main_.run();
    EXPECT_EQ(delegate->seen, content);
    EXPECT_TRUE(waits.expired());
  }
}

TEST_F(RadixWrapperTest, AnEventThatArrivesWhileTheDelegateIsUnsetIsLoggedAndNotDelivered) {
  wrapper_.listen();
  systemLog_.lines.clear();
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{1}}});
  EXPECT_EQ(systemLog_.lines,
            (Lines{R"(-[RadixWrapper listen]_block_invoke: MetricsTrigger dict=["kKeyMetricID": 1])"}));
  const auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  EXPECT_FALSE(main_.runOne());
  EXPECT_EQ(delegate->calls, Lines{});
}

TEST_F(RadixWrapperTest, TheDelegateIsReadAgainOnTheMainQueue) {
  const auto first = std::make_shared<NotedDelegate>();
  const auto second = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(first);
  wrapper_.listen();
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{1}}});
  wrapper_.setDelegate(second);
  main_.run();
  EXPECT_EQ(first->calls, Lines{});
  EXPECT_EQ(second->calls.size(), 1u);
}

TEST_F(RadixWrapperTest, TheDelegateIsKeptWeakly) {
  auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  EXPECT_EQ(wrapper_.delegate(), delegate);
  wrapper_.listen();
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{1}}});
  delegate.reset();
  EXPECT_EQ(wrapper_.delegate(), nullptr);
  EXPECT_EQ(main_.run(), 1u);
  EXPECT_FALSE(wrapper_.serviceStatus().lastRecord.has_value());
}

TEST_F(RadixWrapperTest, EventsFromAnotherThreadReachTheDelegateOnTheMainThreadInTheirOrder) {
  const auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  wrapper_.listen();
  Lines expected;
  for (std::int64_t id = 0; id < 100; ++id) {
    expected.push_back(R"(metrics ["kKeyMetricID": )" + std::to_string(id) + "]");
    RadixWrapper::queue()->post([this, id] { manager_->send(radix::kEventMetric, {{"kKeyMetricID", id}}); });
  }
  ASSERT_TRUE(main_.runUntil([&] { return delegate->calls.size() == 100; }, std::chrono::minutes(1)));
  EXPECT_EQ(delegate->calls, expected);
}

TEST_F(RadixWrapperTest, AnEventThatArrivesWhenTheWrapperIsGoneHarmsNobody) {
  const auto delegate = std::make_shared<NotedDelegate>();
  {
    RadixWrapper passing(manager_, {.mainQueue = main_, .systemLog = systemLog_, .clock = main_});
    passing.setDelegate(delegate);
    passing.listen();
  }
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{1}}});
  main_.run();
  EXPECT_EQ(delegate->calls.size(), 1u);
}

TEST(RadixWrapperQueue, IsMadeOncePerProcessWithALabelThatEndsInSerialQQueue) {
  const std::shared_ptr<TaskQueue>& queue = RadixWrapper::queue();
  EXPECT_EQ(queue, RadixWrapper::queue());
  const auto* serial = dynamic_cast<const SerialQueue*>(queue.get());
  ASSERT_NE(serial, nullptr);
  EXPECT_EQ(serial->label(), "probeview.RadixWrapper.serialQ.queue");
  EXPECT_TRUE(serial->label().ends_with(".serialQ.queue"));
}

TEST_F(RadixWrapperTest, TheServiceStatusTellsTheConnectionAndTheLastRecord) {
  const auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  wrapper_.listen();
  EXPECT_FALSE(wrapper_.serviceStatus().lastRecord.has_value());
  EXPECT_FALSE(wrapper_.serviceStatus().connection.connected);
  manager_->state = {true, std::chrono::milliseconds(5), true};
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{1}},
                                       {"kKeyTime", std::int64_t{1709640000123}},
                                       {"kKeyOrigin", Value::text("scenario:city")}});
  main_.advance(std::chrono::milliseconds(400));
  const ServiceStatus status = wrapper_.serviceStatus();
  EXPECT_TRUE(status.connection.connected);
  ASSERT_TRUE(status.lastRecord.has_value());
  EXPECT_EQ(status.lastRecord->origin, "scenario:city");
  EXPECT_EQ(status.lastRecord->time, std::chrono::milliseconds(1709640000123));
  EXPECT_EQ(status.lastRecord->receivedWallTime, ManualLoop::defaultWallTime);
  EXPECT_EQ(main_.ageTime() - status.lastRecord->receivedAgeTime, std::chrono::milliseconds(400));
}

TEST_F(RadixWrapperTest, TheServiceStatusKeepsTheLastRecordOfEachMetricWithAgeAndPeriod) {
  const auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  wrapper_.listen();
  const auto send = [&](std::int64_t metric, const char* origin, std::int64_t age, std::int64_t period) {
    manager_->send(
        radix::kEventMetric,
        {{"kKeyMetricID", metric}, {"kKeyOrigin", Value::text(origin)}, {"kKeyAge", age}, {"kKeyPeriod", period}});
    main_.run();
  };
  send(1, "trace:a.csv", 180'000, 1000);
  send(2, "modem", 0, 0);
  send(1, "trace:b.csv", 5, 2000);
  const ServiceStatus& status = wrapper_.serviceStatus();
  ASSERT_EQ(status.lastRecords.size(), 2u);
  EXPECT_EQ(status.lastRecords.at(1).origin, "trace:b.csv");
  EXPECT_EQ(status.lastRecords.at(1).age, std::chrono::milliseconds(5));
  EXPECT_EQ(status.lastRecords.at(1).period, std::chrono::milliseconds(2000));
  EXPECT_EQ(status.lastRecords.at(2).metricId, 2);
  EXPECT_EQ(status.lastRecords.at(2).period, std::chrono::milliseconds(0));
  EXPECT_EQ(status.lastRecord->metricId, 1);
  // An older service says neither; one that says what cannot be is cut.
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{2}}});
  main_.run();
  EXPECT_EQ(wrapper_.serviceStatus().lastRecords.at(2).age, std::nullopt);
  EXPECT_EQ(wrapper_.serviceStatus().lastRecords.at(2).period, std::nullopt);
  send(2, "modem", INT64_MAX, INT64_MIN);
  EXPECT_EQ(wrapper_.serviceStatus().lastRecords.at(2).age, radix::longestSpan);
  EXPECT_EQ(wrapper_.serviceStatus().lastRecords.at(2).period, std::chrono::milliseconds(0));
  // One that invents metrics does not fill the memory.
  for (std::int64_t metric = 0; metric < 1000; ++metric) send(metric, "modem", 0, 0);
  EXPECT_EQ(wrapper_.serviceStatus().lastRecords.size(), radix::mostMetrics);
  EXPECT_EQ(wrapper_.serviceStatus().lastRecord->metricId, 999);
}

TEST_F(RadixWrapperTest, WhenARecordCameIsKeptOnTheClockThatCountsTheTimeAsleep) {
  const auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  wrapper_.listen();
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{1}}});
  main_.run();
  main_.sleep(std::chrono::hours(8));
  EXPECT_EQ(main_.ageTime() - wrapper_.serviceStatus().lastRecord->receivedAgeTime, std::chrono::hours(8));
}

TEST_F(RadixWrapperTest, WhatTheSourcesCanFillIsKnownWithoutACommand) {
  using State = radix::client::SourceState;
  EXPECT_EQ(wrapper_.fillableMetrics(), std::nullopt) << "the service does not say";
  manager_->state.sources = {{.origin = "a", .phase = State::Phase::Running, .reason = "", .metrics = {1, 2}},
                             {.origin = "b", .phase = State::Phase::Ended, .reason = "", .metrics = {2, 3}},
                             {.origin = "c", .phase = State::Phase::Failed, .reason = "gone", .metrics = {9}}};
  EXPECT_EQ(wrapper_.fillableMetrics(), (std::set<std::int64_t>{1, 2, 3}));
  manager_->state.areSourcesCut = true;
  EXPECT_EQ(wrapper_.fillableMetrics(), std::nullopt) << "the service does not say all";
  EXPECT_TRUE(manager_->calls.empty());
}

TEST_F(RadixWrapperTest, ATriggerIsNoRecordAndARecordNeedNotNameTimeOrOrigin) {
  const auto delegate = std::make_shared<NotedDelegate>();
  wrapper_.setDelegate(delegate);
  wrapper_.listen();
  manager_->send(radix::kEventTrigger, {{"kKeyOrigin", Value::text("scenario:city")}});
  main_.run();
  EXPECT_FALSE(wrapper_.serviceStatus().lastRecord.has_value());
  manager_->send(radix::kEventMetric, {{"kKeyMetricID", std::int64_t{1}}});
  main_.run();
  ASSERT_TRUE(wrapper_.serviceStatus().lastRecord.has_value());
  EXPECT_EQ(wrapper_.serviceStatus().lastRecord->origin, "");
  EXPECT_EQ(wrapper_.serviceStatus().lastRecord->time, std::nullopt);
}

}  // namespace
}  // namespace probeview
