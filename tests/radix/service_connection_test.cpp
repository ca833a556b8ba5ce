// SPDX-License-Identifier: Apache-2.0
//
// The client's connection against a service that a test plays itself, on a manual loop.
#include "radix/service_connection.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <deque>
#include <memory>
#include <vector>

#include "platform/manual_loop.h"
#include "platform/system_log.h"
#include "radix/connection_manager.h"
#include "radix/dictionary_bytes.h"
#include "radix/in_process_link.h"
#include "tests/support/frames.h"

namespace radix::client {
namespace {

using probeview::Dictionary;
using probeview::ManualLoop;
using probeview::Value;
using std::chrono::milliseconds;
using std::chrono::nanoseconds;
using std::chrono::seconds;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::SizeIs;

// The other end of one connection.
class PlayedService final : LinkListener, FrameHandler {
 public:
  explicit PlayedService(std::unique_ptr<Link> link) : link_(std::move(link)) { link_->start(*this); }

  template <typename Sentence>
  void say(const Sentence& sentence) {
    const FrameBytes frame = encode(sentence);
    EXPECT_TRUE(link_->sendOne(frame));
  }
  void sayBytes(std::vector<std::uint8_t> bytes) {
    const FrameBytes frame = std::make_shared<const std::vector<std::uint8_t>>(std::move(bytes));
    EXPECT_TRUE(link_->sendOne(frame));
  }
  template <typename Sentence>
  bool trySay(const Sentence& sentence) {
    const FrameBytes frame = encode(sentence);
    return link_->sendOne(frame);
  }
  void greet() { say(Hello("played")); }
  void answer(std::size_t index, std::int32_t status = 0, std::string_view message = {}) {
    say(Reply(commands.at(index).sequence(), status, message));
  }
  void hangUp() { link_.reset(); }
  void setReading(bool reading) { link_->setReading(reading); }

  std::vector<Hello> hellos;
  std::vector<Command> commands;
  std::vector<bool> deliveries;
  std::vector<Ping> pings;
  bool closed = false;

 private:
  void onFrame(std::span<const std::uint8_t> frame) override { EXPECT_TRUE(decodeFrame(frame, *this)); }
  void onOverlongFrame(std::size_t) override { ADD_FAILURE(); }
  void onBatchEnd() override {}
  void onWritable() override {}
  void onClosed() override { closed = true; }
  void onHello(const Hello& hello) override { hellos.push_back(hello); }
  void onCommand(const Command& command) override { commands.push_back(command); }
  void onDelivery(const Delivery& delivery) override { deliveries.push_back(delivery.on()); }
  void onPing(const Ping& ping) override { pings.push_back(ping); }

  std::unique_ptr<Link> link_;
};

class ServiceConnectionTest : public ::testing::Test {
 protected:
  enum class Mood { Absent, Busy, There, Silent };

  ServiceConnectionTest() { restart(); }
  ~ServiceConnectionTest() override {
    manager_.reset();
    loop_.run();
  }

  void restart(ServiceConnection::Identity identity = {.clientName = "client"}) {
    manager_ = makeConnectionManager(loop_, std::make_unique<TestConnector>(*this), std::move(identity),
                                     {std::shared_ptr<void>(), &loop_});
  }

  Result perform(std::string_view command = "kCommandTest", const Dictionary& arguments = {}) {
    ObjectHandle reply;
    return PerformCommand(manager_, command, arguments, reply);
  }

  Result push(std::string_view text) {
    return perform(kCommandAddConfiguration,
                   {{kKeyPayload, Value::bytes({reinterpret_cast<const std::uint8_t*>(text.data()), text.size()})}});
  }

  // Answers each command with 0 as it comes, from now on.
  void answerAll() {
    answering_ = loop_.every(milliseconds(1), [this] {
      while (!services_.empty() && answered_ < current().commands.size()) current().answer(answered_++);
    });
  }

  // What still waits for handlers holds on to their queue.
  void closeWith(ManualLoop& queue) {
    manager_.reset();
    loop_.run();
    queue.run();
  }

  PlayedService& current() { return *services_.back(); }

  std::vector<milliseconds> attemptTimes() const {
    std::vector<milliseconds> times;
    for (const nanoseconds time : attempts_) {
      times.push_back(std::chrono::duration_cast<milliseconds>(time - attempts_.front()));
    }
    return times;
  }

  ManualLoop loop_;
  Mood mood_ = Mood::There;
  std::vector<nanoseconds> attempts_;
  std::vector<std::unique_ptr<PlayedService>> services_;
  std::size_t answered_ = 0;
  probeview::ScheduledTaskHandle answering_;
  ManagerHandle manager_;

  class TestConnector final : public Connector {
   public:
    explicit TestConnector(ServiceConnectionTest& test) : test_(test) {}
    ConnectResult connect() override {
      test_.attempts_.push_back(test_.loop_.monotonicTime());
      switch (test_.mood_) {
        case Mood::Absent:
          return {nullptr, false, "nobody there"};
        case Mood::Busy:
          return {nullptr, true, "too busy"};
        case Mood::There:
        case Mood::Silent:
          break;
      }
      auto [near, far] = makeInProcessLinks(test_.loop_);
      test_.services_.push_back(std::make_unique<PlayedService>(std::move(far)));
      test_.answered_ = 0;
      if (test_.mood_ == Mood::There) test_.services_.back()->greet();
      return {std::move(near), false, {}};
    }

   private:
    ServiceConnectionTest& test_;
  };
};

TEST_F(ServiceConnectionTest, ItGreetsWithItsNameAndVersion) {
  loop_.run();
  ASSERT_THAT(current().hellos, SizeIs(1));
  EXPECT_EQ(current().hellos[0].name(), "client");
  EXPECT_EQ(current().hellos[0].version(), ProtocolVersions{}.spoken);
  EXPECT_EQ(current().hellos[0].oldestVersion(), ProtocolVersions{}.oldest);
  EXPECT_TRUE(Connection(manager_).connected);
  EXPECT_EQ(Connection(manager_).serviceName, "played");
}

TEST_F(ServiceConnectionTest, ACommandIsAnsweredWithStatusMessageAndContent) {
  loop_.run();
  const auto answering = loop_.after(milliseconds(5), [this] {
    ASSERT_THAT(current().commands, SizeIs(1));
    EXPECT_EQ(current().commands[0].name(), "kCommandTest");
    EXPECT_EQ(decodeDictionary(current().commands[0].arguments()), (Dictionary{{"a", std::int64_t{-1}}}));
    current().say(Reply(current().commands[0].sequence(), 5, "because", encodeDictionary({{"b", true}})));
  });
  ObjectHandle reply;
  const Result result = PerformCommand(manager_, "kCommandTest", {{"a", std::int64_t{-1}}}, reply);
  EXPECT_EQ(result.status, 5);
  EXPECT_EQ(result.message, "because");
  EXPECT_EQ(nativeDictionary(*reply), (Dictionary{{"b", true}}));
}

TEST_F(ServiceConnectionTest, ACommandWaitsTwoSecondsAndALateReplyIsForgotten) {
  loop_.run();
  const auto start = loop_.monotonicTime();
  const Result result = perform();
  EXPECT_EQ(result.status, static_cast<int>(Status::TimedOut));
  EXPECT_EQ(result.message, "the baseband service did not answer in time");
  EXPECT_EQ(loop_.monotonicTime() - start, seconds(2));
  current().answer(0, 77);
  loop_.run();
  const auto late = loop_.after(seconds(2) - milliseconds(1), [this] { current().answer(1); });
  EXPECT_EQ(perform().status, 0) << "just in time";
  answered_ = 2;
  answerAll();
  EXPECT_EQ(perform().status, 0);
}

TEST_F(ServiceConnectionTest, ACommandRightAfterCreationWaitsForTheConnection) {
  mood_ = Mood::There;
  answerAll();
  EXPECT_EQ(perform().status, 0);
}

TEST_F(ServiceConnectionTest, WithoutAServiceACommandFailsAtOnceAndSaysSo) {
  mood_ = Mood::Absent;
  const auto start = loop_.monotonicTime();
  const Result result = perform();
  EXPECT_EQ(result.status, static_cast<int>(Status::NoService));
  EXPECT_EQ(result.message, "nobody there");
  EXPECT_EQ(loop_.monotonicTime(), start);
}

TEST_F(ServiceConnectionTest, ItTriesAgainAfterAHundredMillisecondsDoublingToASecond) {
  mood_ = Mood::Absent;
  loop_.advance(seconds(5));
  EXPECT_THAT(attemptTimes(),
              ElementsAre(milliseconds(0), milliseconds(100), milliseconds(300), milliseconds(700), milliseconds(1500),
                          milliseconds(2500), milliseconds(3500), milliseconds(4500)));
}

TEST_F(ServiceConnectionTest, AfterASuccessTheDelaysBeginAnew) {
  mood_ = Mood::Absent;
  loop_.advance(seconds(5));
  mood_ = Mood::There;
  loop_.advance(seconds(1));
  ASSERT_TRUE(Connection(manager_).connected);
  mood_ = Mood::Absent;
  attempts_.clear();
  current().hangUp();
  loop_.run();
  EXPECT_FALSE(Connection(manager_).connected);
  const auto lost = loop_.monotonicTime();
  loop_.advance(milliseconds(150));
  ASSERT_THAT(attempts_, SizeIs(1));
  EXPECT_EQ(attempts_[0] - lost, milliseconds(100));
}

TEST_F(ServiceConnectionTest, ACommandTriesAtOnceAsTheServiceMayJustHaveStarted) {
  mood_ = Mood::Absent;
  loop_.advance(seconds(5));
  mood_ = Mood::There;
  answerAll();
  const auto start = loop_.monotonicTime();
  EXPECT_EQ(perform().status, 0);
  EXPECT_LT(loop_.monotonicTime() - start, milliseconds(10));
}

TEST_F(ServiceConnectionTest, AServiceWithAFullQueueIsTriedAgainUntilTheCommandsDeadline) {
  mood_ = Mood::Busy;
  answerAll();
  const auto relief = loop_.after(milliseconds(1500), [this] { mood_ = Mood::There; });
  EXPECT_EQ(perform().status, 0);
  EXPECT_GT(attempts_.size(), 100U);
}

TEST_F(ServiceConnectionTest, AServiceThatStaysBusyFailsTheCommandAtItsDeadlineWithTheReason) {
  mood_ = Mood::Busy;
  const auto start = loop_.monotonicTime();
  const Result result = perform();
  EXPECT_EQ(result.status, static_cast<int>(Status::TimedOut));
  EXPECT_EQ(result.message, "too busy");
  EXPECT_EQ(loop_.monotonicTime() - start, seconds(2));
}

TEST_F(ServiceConnectionTest, AServiceThatNeverGreetsIsGivenUpAndTriedAgain) {
  mood_ = Mood::Silent;
  loop_.advance(milliseconds(2050));
  EXPECT_FALSE(Connection(manager_).connected);
  EXPECT_THAT(Connection(manager_).trouble, HasSubstr("did not greet"));
  EXPECT_TRUE(current().closed);
  loop_.advance(milliseconds(100));
  EXPECT_THAT(attempts_, SizeIs(2));
}

TEST_F(ServiceConnectionTest, AConnectionThatEndsFailsTheCommandsThatWait) {
  loop_.run();
  const auto end = loop_.after(milliseconds(5), [this] {
    mood_ = Mood::Absent;
    current().hangUp();
  });
  const Result result = perform();
  EXPECT_EQ(result.status, static_cast<int>(Status::NoService));
  EXPECT_EQ(result.message, "the baseband service went away before it answered");
}

TEST_F(ServiceConnectionTest, ConfigurationAndDeliveryAreRestoredInThisOrderBeforeAnythingElse) {
  answerAll();
  ASSERT_EQ(push("[metrics]").status, 0);
  EventsOn(manager_);
  loop_.run();
  answering_.reset();
  current().hangUp();
  loop_.advance(milliseconds(100));
  ASSERT_THAT(services_, SizeIs(2));
  ASSERT_THAT(current().commands, SizeIs(1));
  EXPECT_EQ(current().commands[0].name(), kCommandAddConfiguration);
  EXPECT_EQ(copyOf(current().commands[0].arguments()), copyOf(services_[0]->commands[0].arguments()));
  EXPECT_THAT(current().deliveries, ElementsAre(true));
}

TEST_F(ServiceConnectionTest, AConfigurationThatWasRefusedIsNotRestoredButTheOneBeforeIs) {
  answerAll();
  ASSERT_EQ(push("first").status, 0);
  answering_.reset();
  const auto refusing = loop_.after(milliseconds(5), [this] { current().answer(1, 3, "no"); });
  ASSERT_EQ(push("second").status, 3);
  current().hangUp();
  loop_.advance(milliseconds(100));
  ASSERT_THAT(current().commands, SizeIs(1));
  EXPECT_EQ(copyOf(current().commands[0].arguments()), copyOf(services_[0]->commands[0].arguments()));
}

TEST_F(ServiceConnectionTest, AConfigurationPushedBeforeTheServiceIsThereIsSentWhenItComes) {
  mood_ = Mood::Absent;
  EXPECT_EQ(push("wish").status, static_cast<int>(Status::NoService));
  mood_ = Mood::There;
  loop_.advance(seconds(1));
  ASSERT_THAT(current().commands, SizeIs(1));
  EXPECT_EQ(current().commands[0].name(), kCommandAddConfiguration);
}

TEST_F(ServiceConnectionTest, AConfigurationThatTheServiceDidNotAnswerInTimeIsRestored) {
  loop_.run();
  EXPECT_EQ(push("wish").status, static_cast<int>(Status::TimedOut));
  current().hangUp();
  loop_.advance(milliseconds(100));
  ASSERT_THAT(services_, SizeIs(2));
  EXPECT_THAT(current().commands, SizeIs(1));
}

TEST_F(ServiceConnectionTest, AConfigurationThatIsRefusedOnlyWhenRestoredIsNotTriedAgainAndTheLogSaysSo) {
  class Lines final : public probeview::LineSink {
   public:
    void line(std::string_view text) override { lines.emplace_back(text); }
    std::vector<std::string> lines;
  };
  // The log stays set for the rest of this program; nobody else writes to it.
  static auto& log = *new Lines;
  probeview::setSystemLog(log);
  // This test may run again.
  log.lines.clear();
  mood_ = Mood::Absent;
  EXPECT_NE(push("wish").status, 0);
  mood_ = Mood::There;
  loop_.advance(seconds(1));
  current().answer(0, 3, "no\nsuch metric");
  loop_.run();
  EXPECT_THAT(log.lines, ElementsAre("the baseband service refuses the configuration that was pushed: error=3 "
                                     "msg=no\\nsuch metric"));
  current().hangUp();
  loop_.advance(milliseconds(100));
  ASSERT_THAT(services_, SizeIs(2));
  EXPECT_THAT(current().commands, IsEmpty());
}

// The configurations that were pushed.
std::vector<std::string> pushedOf(const PlayedService& service) {
  std::vector<std::string> texts;
  for (const Command& command : service.commands) {
    const auto arguments = decodeDictionary(command.arguments());
    const Value* payload = arguments ? arguments->find(kKeyPayload) : nullptr;
    if (payload == nullptr) continue;
    const auto bytes = *payload->bytes();
    texts.emplace_back(bytes.begin(), bytes.end());
  }
  return texts;
}

TEST_F(ServiceConnectionTest, AConfigurationThatIsRefusedLateLeavesTheOneThatWasAcceptedToBeRestored) {
  answerAll();
  ASSERT_EQ(push("accepted").status, 0);
  answering_.reset();
  EXPECT_EQ(push("second").status, static_cast<int>(Status::TimedOut));
  EXPECT_EQ(Connection(manager_).configuration, ConfigurationOutcome::Unsent);
  current().answer(1, 3, "no");
  loop_.run();
  EXPECT_EQ(Connection(manager_).configuration, ConfigurationOutcome::Refused);
  EXPECT_EQ(Connection(manager_).configurationTrouble, "no");
  current().hangUp();
  loop_.advance(milliseconds(100));
  ASSERT_THAT(services_, SizeIs(2));
  EXPECT_THAT(pushedOf(current()), ElementsAre("accepted"));
  current().answer(0);
  loop_.run();
  EXPECT_EQ(Connection(manager_).configuration, ConfigurationOutcome::Accepted);
}

TEST_F(ServiceConnectionTest, AConfigurationThatNobodyHasJudgedIsRestoredBehindTheOneThatWasAccepted) {
  for (const bool takesSecond : {false, true}) {
    manager_.reset();
    loop_.run();
    services_.clear();
    restart();
    answerAll();
    ASSERT_EQ(push("accepted").status, 0);
    answering_.reset();
    EXPECT_EQ(push("second").status, static_cast<int>(Status::TimedOut));
    EventsOn(manager_);
    loop_.run();
    current().hangUp();
    loop_.advance(milliseconds(100));
    ASSERT_THAT(services_, SizeIs(2));
    // Should the second be refused, the first counts: as it did where both were pushed.
    EXPECT_THAT(pushedOf(current()), ElementsAre("accepted", "second"));
    EXPECT_THAT(current().deliveries, ElementsAre(true));
    current().answer(0);
    loop_.run();
    EXPECT_EQ(Connection(manager_).configuration, ConfigurationOutcome::Unsent) << "of the last one nothing is known";
    current().answer(1, takesSecond ? 0 : 3, takesSecond ? "" : "no");
    loop_.run();
    EXPECT_EQ(Connection(manager_).configuration,
              takesSecond ? ConfigurationOutcome::Accepted : ConfigurationOutcome::Refused);
    current().hangUp();
    loop_.advance(milliseconds(200));
    ASSERT_THAT(services_, SizeIs(3));
    EXPECT_THAT(pushedOf(current()), ElementsAre(takesSecond ? "second" : "accepted"));
  }
}

TEST_F(ServiceConnectionTest, OfTwoLateJudgementsEachCountsForItsOwnConfiguration) {
  loop_.run();
  EXPECT_EQ(push("first").status, static_cast<int>(Status::TimedOut));
  EXPECT_EQ(push("second").status, static_cast<int>(Status::TimedOut));
  current().answer(0);
  loop_.run();
  EXPECT_EQ(Connection(manager_).configuration, ConfigurationOutcome::Unsent);
  current().answer(1, 3, "no");
  loop_.run();
  EXPECT_EQ(Connection(manager_).configuration, ConfigurationOutcome::Refused);
  current().hangUp();
  loop_.advance(milliseconds(100));
  EXPECT_THAT(pushedOf(current()), ElementsAre("first"));
}

TEST_F(ServiceConnectionTest, AConfigurationThatIsAcceptedTakesThePlaceOfAllBeforeIt) {
  loop_.run();
  EXPECT_EQ(push("first").status, static_cast<int>(Status::TimedOut));
  answered_ = 1;
  answerAll();
  EXPECT_EQ(push("second").status, 0);
  answering_.reset();
  current().answer(0, 3, "late");
  loop_.run();
  EXPECT_EQ(Connection(manager_).configuration, ConfigurationOutcome::Accepted);
  current().hangUp();
  loop_.advance(milliseconds(100));
  EXPECT_THAT(pushedOf(current()), ElementsAre("second"));
}

TEST_F(ServiceConnectionTest, OfConfigurationsThatNobodyJudgesTheLastFourAreKept) {
  mood_ = Mood::Absent;
  for (const char* text : {"1", "2", "3", "4", "5", "6"}) EXPECT_NE(push(text).status, 0);
  mood_ = Mood::There;
  loop_.advance(seconds(1));
  EXPECT_THAT(pushedOf(current()), ElementsAre("3", "4", "5", "6"));
}

TEST_F(ServiceConnectionTest, ALateAnswerToAConfigurationThatHasBeenClearedSinceSaysNothingAnyMore) {
  for (const auto status : {Status::Ok, Status::BadConfiguration}) {
    restart();
    loop_.run();
    EXPECT_NE(push("[metrics]\n").status, 0);
    EXPECT_NE(perform(kCommandClearConfiguration).status, 0);
    current().answer(0, static_cast<std::int32_t>(status), "late");
    loop_.run();
    EXPECT_EQ(Connection(manager_).configuration, ConfigurationOutcome::NotPushed);
    EXPECT_EQ(Connection(manager_).configurationTrouble, "");
  }
}

TEST_F(ServiceConnectionTest, AServiceThatGoesWhileNothingIsAskedJustWentAway) {
  loop_.run();
  mood_ = Mood::Silent;
  current().hangUp();
  loop_.run();
  EXPECT_EQ(Connection(manager_).trouble, "the baseband service went away");
}

TEST_F(ServiceConnectionTest, AConfigurationThatWasClearedIsNotRestoredEvenIfTheServiceWasAway) {
  answerAll();
  ASSERT_EQ(push("first").status, 0);
  mood_ = Mood::Absent;
  current().hangUp();
  loop_.run();
  EXPECT_NE(perform(kCommandClearConfiguration).status, 0);
  mood_ = Mood::There;
  loop_.advance(seconds(1));
  EXPECT_THAT(current().commands, IsEmpty());
}

TEST_F(ServiceConnectionTest, LossesThatTheServiceTellsAreAddedUp) {
  loop_.run();
  current().say(Dropped(3));
  current().say(Dropped(4));
  loop_.run();
  EXPECT_EQ(Connection(manager_).lostEvents, 7U);
}

TEST_F(ServiceConnectionTest, ATriggerEventReachesItsHandlerWithItsKeysAndGroup) {
  Dictionary got;
  Group group = 0;
  RegisterEventHandler(manager_, kEventTrigger, [&](const ObjectHandle& event, Group one) {
    got = nativeDictionary(*event);
    group = one;
  });
  EventsOn(manager_);
  loop_.run();
  Event event(EventKind::Trigger);
  event.setTime(5);
  event.setOrigin("o");
  event.setGroup(6);
  event.setTriggerId(0x7F0013);
  event.setTriggerRef(9999);
  event.setTriggerType(1);
  current().say(event);
  loop_.run();
  const Dictionary expected{{"kKeyTriggerID", std::int64_t{0x7F0013}},
                            {"kKeyTriggerRef", std::int64_t{9999}},
                            {"kKeyTriggerType", std::int64_t{1}},
                            {"kKeyTime", std::int64_t{5}},
                            {"kKeyOrigin", Value::text("o")}};
  EXPECT_EQ(got, expected);
  EXPECT_EQ(group, 6);
}

TEST_F(ServiceConnectionTest, EventsThatAreStillOnTheirWayAfterEventsOffWaitForTheNextEventsOn) {
  std::vector<std::int64_t> metrics;
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle& event, Group) {
    metrics.push_back(nativeDictionary(*event).find(kKeyMetricID)->int64().value());
  });
  EventsOn(manager_);
  loop_.run();
  current().say(metricEvent());
  EventsOff(manager_);
  loop_.run();
  EXPECT_THAT(metrics, IsEmpty());
  // The service sends each record once: what is thrown away here never comes again.
  EventsOn(manager_);
  current().say(metricEvent({.metricId = 2}));
  loop_.run();
  EXPECT_THAT(metrics, ElementsAre(1, 2));
}

TEST_F(ServiceConnectionTest, AnEventThatWaitsForItsHandlerGrowsOlder) {
  std::vector<std::optional<std::int64_t>> ages;
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle& event, Group) {
    const Dictionary content = nativeDictionary(*event);
    const Value* age = content.find(kKeyAge);
    ages.push_back(age != nullptr ? age->int64() : std::nullopt);
  });
  EventsOn(manager_);
  loop_.run();
  const auto say = [&](std::chrono::nanoseconds age) { current().sayBytes(agedFrame(metricEvent(), age)); };
  EventsOff(manager_);
  say(seconds(5));
  say(longestSpan);
  current().say(metricEvent());
  loop_.advance(seconds(180));
  EXPECT_THAT(ages, IsEmpty());
  EventsOn(manager_);
  loop_.run();
  EXPECT_THAT(ages, ElementsAre(185'000, longestSpan.count(), std::nullopt));
}

TEST_F(ServiceConnectionTest, AnEventThatWaitsForItsHandlerOverASleepOfTheDeviceIsSoMuchOlder) {
  std::optional<std::int64_t> age;
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle& event, Group) {
    age = nativeDictionary(*event).find(kKeyAge)->int64();
  });
  EventsOn(manager_);
  loop_.run();
  EventsOff(manager_);
  current().sayBytes(agedFrame(metricEvent(), seconds(5)));
  loop_.run();
  loop_.sleep(std::chrono::hours(8));
  EventsOn(manager_);
  loop_.run();
  EXPECT_EQ(age, 8 * 3600 * 1000 + 5000);
}

TEST_F(ServiceConnectionTest, AHandlerMaySwitchEventsOffAndOnInTheMiddleOfABatchAndLosesNothing) {
  std::vector<std::int64_t> metrics;
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle& event, Group) {
    metrics.push_back(nativeDictionary(*event).find(kKeyMetricID)->int64().value());
    if (metrics.size() == 2) EventsOff(manager_);
  });
  EventsOn(manager_);
  loop_.run();
  for (std::int64_t metric = 1; metric <= 4; ++metric) current().say(metricEvent({.metricId = metric}));
  loop_.run();
  EXPECT_THAT(metrics, ElementsAre(1, 2));
  EventsOn(manager_);
  loop_.run();
  EXPECT_THAT(metrics, ElementsAre(1, 2, 3, 4));
}

TEST_F(ServiceConnectionTest, AHandlerThatLetsItsQueueRunGetsTheNextEventWhenItIsThrough) {
  std::vector<std::int64_t> metrics;
  int depth = 0;
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle& event, Group) {
    EXPECT_EQ(++depth, 1);
    current().say(metricEvent({.metricId = 10 + static_cast<std::int64_t>(metrics.size())}));
    if (metrics.size() < 3) loop_.run();
    metrics.push_back(nativeDictionary(*event).find(kKeyMetricID)->int64().value());
    --depth;
    if (metrics.size() == 4) EventsOff(manager_);
  });
  EventsOn(manager_);
  loop_.run();
  current().say(metricEvent());
  current().say(metricEvent({.metricId = 2}));
  loop_.run();
  EXPECT_THAT(metrics, ElementsAre(1, 2, 10, 11));
}

TEST_F(ServiceConnectionTest, AnOlderServiceTellsNeitherAgesNorPeriodsNorSources) {
  restart({.clientName = "client", .observes = true});
  Dictionary got;
  RegisterEventHandler(manager_, kEventMetric,
                       [&](const ObjectHandle& event, Group) { got = nativeDictionary(*event); });
  EventsOn(manager_);
  loop_.run();
  EXPECT_TRUE(current().hellos.at(0).observes());
  current().say(metricEvent());
  loop_.run();
  EXPECT_TRUE(got.contains(kKeyMetricID));
  EXPECT_FALSE(got.contains(kKeyAge));
  EXPECT_FALSE(got.contains(kKeyPeriod));
  EXPECT_FALSE(Connection(manager_).sources.has_value());
  // A later one does, and what it says beyond all measure is cut.
  std::vector<std::uint8_t> bytes = *encode(metricEvent({.metricId = 1, .period = milliseconds(INT64_MAX)}));
  bytes.insert(bytes.end(), {0x48, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0x01});
  current().sayBytes(bytes);
  loop_.run();
  EXPECT_EQ(got.find(kKeyAge)->int64(), longestSpan.count());
  EXPECT_EQ(got.find(kKeyPeriod)->int64(), longestSpan.count());
}

TEST_F(ServiceConnectionTest, AHandlerMayRegisterAnotherInItsOwnPlace) {
  std::vector<int> order;
  EventsOn(manager_);
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle&, Group) {
    order.push_back(1);
    RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle&, Group) { order.push_back(2); });
  });
  loop_.run();
  current().say(metricEvent());
  current().say(metricEvent({.metricId = 2}));
  loop_.run();
  EXPECT_THAT(order, ElementsAre(1, 2));
}

TEST_F(ServiceConnectionTest, APingIsAnswered) {
  loop_.run();
  current().say(Ping(5));
  loop_.run();
  ASSERT_THAT(current().pings, SizeIs(1));
  EXPECT_EQ(current().pings[0].number(), 5U);
  EXPECT_TRUE(current().pings[0].isAnswer());
}

TEST_F(ServiceConnectionTest, AServiceThatSendsWhatIsNoFrameIsLeftAndTriedAgain) {
  loop_.run();
  current().sayBytes({0x0A, 0x7F});
  loop_.run();
  EXPECT_TRUE(current().closed);
  EXPECT_THAT(Connection(manager_).trouble, HasSubstr("no frame"));
  loop_.advance(milliseconds(100));
  EXPECT_TRUE(Connection(manager_).connected);
}

TEST_F(ServiceConnectionTest, AFrameOfTheLongestLengthIsTakenAndOneByteMoreEndsTheConnection) {
  loop_.run();
  // Field 15, which nobody knows, with as much content as fits: 3 bytes of length.
  std::vector<std::uint8_t> longest(longestFrame, 'x');
  const std::size_t content = longest.size() - 4;
  longest[0] = 0x7A;
  longest[1] = static_cast<std::uint8_t>(content & 0x7F) | 0x80;
  longest[2] = static_cast<std::uint8_t>((content >> 7) & 0x7F) | 0x80;
  longest[3] = static_cast<std::uint8_t>(content >> 14);
  current().sayBytes(longest);
  loop_.run();
  EXPECT_TRUE(Connection(manager_).connected);
  current().sayBytes(std::vector<std::uint8_t>(longestFrame + 1));
  loop_.run();
  EXPECT_THAT(Connection(manager_).trouble, HasSubstr("a frame of 131073 bytes"));
}

TEST_F(ServiceConnectionTest, UnknownFramesOfALaterServiceAreIgnored) {
  loop_.run();
  current().sayBytes({0x7A, 0x01, 'x'});
  loop_.run();
  EXPECT_TRUE(Connection(manager_).connected);
}

TEST_F(ServiceConnectionTest, ARefusalIsWhatCommandsAnswerWith) {
  mood_ = Mood::Silent;
  const auto later =
      loop_.after(milliseconds(1), [this] { current().say(refusing(9, "only others may connect", "played")); });
  const Result result = perform();
  EXPECT_EQ(result.status, 9);
  EXPECT_EQ(result.message, "only others may connect");
}

TEST_F(ServiceConnectionTest, AServiceOlderThanTheClientLikesIsLeftWithTheAdviceToUpdateIt) {
  restart({.clientName = "new", .versions = {.spoken = 5, .oldest = 3}});
  const Result result = perform();
  EXPECT_EQ(result.status, static_cast<int>(Status::VersionMismatch));
  EXPECT_THAT(result.message, HasSubstr("update the service"));
}

TEST_F(ServiceConnectionTest, AServiceThatNeedsALaterClientIsLeftWithTheAdviceToUpdateTheClient) {
  mood_ = Mood::Silent;
  const auto greeting =
      loop_.after(milliseconds(1), [this] { current().say(Hello("later", {.spoken = 9, .oldest = 2})); });
  EXPECT_THAT(perform().message, HasSubstr("update the client"));
}

TEST_F(ServiceConnectionTest, AServiceOfALaterVersionThatStillKnowsOursIsTaken) {
  mood_ = Mood::Silent;
  const auto greeting = loop_.after(milliseconds(1), [this] {
    current().say(Hello("later", {.spoken = 9, .oldest = 1}));
    answerAll();
  });
  EXPECT_EQ(perform().status, 0);
}

TEST_F(ServiceConnectionTest, WhenTheHandlersDoNotKeepUpTheRestWaitsInTheServiceAndCommandsStillWork) {
  // The handlers' queue is one that only this test moves.
  auto queue = std::make_shared<ManualLoop>();
  manager_ = makeConnectionManager(loop_, std::make_unique<TestConnector>(*this), {.clientName = "slow"}, queue);
  int events = 0;
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle&, Group) { ++events; });
  EventsOn(manager_);
  loop_.run();
  int sent = 0;
  for (int round = 0; round < 100; ++round) {
    for (int count = 0; count < 100 && current().trySay(metricEvent()); ++count) ++sent;
    loop_.run();
  }
  // Not all went out: the client stopped reading.
  EXPECT_LT(sent, 5000);
  EXPECT_GE(sent, 4096);
  // A command's reply stands behind what was not read.
  answered_ = 0;
  answerAll();
  EXPECT_EQ(perform().status, 0);
  queue->run();
  loop_.run();
  queue->run();
  EXPECT_EQ(events, sent);
  EXPECT_TRUE(current().trySay(metricEvent()));
  loop_.run();
  queue->run();
  EXPECT_EQ(events, sent + 1);
}

// How many events the connection to the service still has room for: 256 where the client has read all that came.
std::size_t roomLeft(PlayedService& service) {
  std::size_t count = 0;
  while (service.trySay(metricEvent())) ++count;
  return count;
}

TEST_F(ServiceConnectionTest, FourThousandAndNinetySixEventsWaitForTheHandlersAndAfterOneMoreNoneIsRead) {
  for (const std::size_t past : {0U, 1U}) {
    auto queue = std::make_shared<ManualLoop>();
    manager_ = makeConnectionManager(loop_, std::make_unique<TestConnector>(*this), {.clientName = "slow"}, queue);
    EventsOn(manager_);
    loop_.run();
    for (std::size_t number = 0; number < 4096 + past; ++number) {
      current().say(metricEvent());
      if (number % 200 == 0) loop_.run();
    }
    loop_.run();
    EXPECT_EQ(roomLeft(current()), 256U);
    loop_.run();
    EXPECT_EQ(roomLeft(current()), past == 0 ? 256U : 0U);
    queue->run();
    loop_.run();
    EXPECT_EQ(roomLeft(current()), 256U);
    closeWith(*queue);
  }
}

TEST_F(ServiceConnectionTest, TwoThousandAndFortyEightBytesOfPayloadCountAsOneEventMore) {
  for (const std::size_t size : {2047U, 2048U}) {
    auto queue = std::make_shared<ManualLoop>();
    manager_ = makeConnectionManager(loop_, std::make_unique<TestConnector>(*this), {.clientName = "slow"}, queue);
    EventsOn(manager_);
    loop_.run();
    for (int number = 0; number < 2049; ++number) {
      current().say(metricEvent({.metricId = 1, .payload = std::vector<std::uint8_t>(size)}));
      loop_.run();
    }
    roomLeft(current());
    loop_.run();
    EXPECT_EQ(roomLeft(current()), size == 2047 ? 256U : 0U);
    closeWith(*queue);
  }
}

TEST_F(ServiceConnectionTest, TheOriginCountsLikeThePayload) {
  for (const std::size_t size : {1023U, 1024U}) {
    auto queue = std::make_shared<ManualLoop>();
    manager_ = makeConnectionManager(loop_, std::make_unique<TestConnector>(*this), {.clientName = "slow"}, queue);
    EventsOn(manager_);
    loop_.run();
    for (int number = 0; number < 2049; ++number) {
      current().say(
          metricEvent({.metricId = 1, .payload = std::vector<std::uint8_t>(size), .origin = std::string(1024, 'o')}));
      loop_.run();
    }
    roomLeft(current());
    loop_.run();
    EXPECT_EQ(roomLeft(current()), size == 1023 ? 256U : 0U);
    closeWith(*queue);
  }
}

TEST_F(ServiceConnectionTest, AnOriginIsTakenUpTo1024BytesAndNoCharacterIsCutInTwo) {
  std::vector<std::string> origins;
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle& event, Group) {
    origins.emplace_back(*nativeDictionary(*event).find(kKeyOrigin)->text());
  });
  EventsOn(manager_);
  loop_.run();
  current().say(metricEvent({.metricId = 1, .origin = std::string(1024, 'o')}));
  current().say(metricEvent({.metricId = 1, .origin = std::string(1025, 'o')}));
  current().say(metricEvent({.metricId = 1, .origin = std::string(1023, 'o') + "\u00FC"}));
  loop_.run();
  EXPECT_THAT(origins, ElementsAre(std::string(1024, 'o'), std::string(1024, 'o'), std::string(1023, 'o')));
}

TEST_F(ServiceConnectionTest, AnEventThatItsHandlerHandedOnWaitsUntilTheLastOfItHasGone) {
  // Whoever keeps the object still has to do with the event.
  std::vector<ObjectHandle> others;
  std::vector<ObjectHandle> objects;
  RegisterEventHandler(manager_, kEventMetric, [&](const ObjectHandle& event, Group) {
    (others.size() < objects.size() ? others : objects).push_back(event);
  });
  EventsOn(manager_);
  loop_.run();
  for (std::size_t number = 0; number < 4097; ++number) {
    current().say(metricEvent());
    loop_.run();
  }
  EXPECT_EQ(others.size() + objects.size(), 4097U);
  roomLeft(current());
  loop_.run();
  EXPECT_EQ(roomLeft(current()), 0U);
  objects.clear();
  loop_.run();
  EXPECT_EQ(roomLeft(current()), 0U) << "2048 are not few yet";
  others.resize(1024);
  loop_.run();
  EXPECT_EQ(roomLeft(current()), 256U);
  others.clear();
}

TEST_F(ServiceConnectionTest, WhatWaitsIsBoundedAlsoWhileACommandWaitsForAServiceThatFloodsAndNeverAnswers) {
  auto queue = std::make_shared<ManualLoop>();
  manager_ = makeConnectionManager(loop_, std::make_unique<TestConnector>(*this), {.clientName = "slow"}, queue);
  EventsOn(manager_);
  loop_.run();
  std::size_t sent = 0;
  const auto flood = loop_.every(milliseconds(1), [&] {
    while (current().trySay(metricEvent())) ++sent;
  });
  EXPECT_EQ(perform().message, "the baseband service did not answer in time");
  EXPECT_GE(sent, 4U * 4096);
  EXPECT_LE(sent, 4U * 4096 + 2 * 256);
  closeWith(*queue);
}

TEST_F(ServiceConnectionTest, LargeEventsThatComeAllAtOnceAreLeftInTheServiceLikeOthers) {
  auto queue = std::make_shared<ManualLoop>();
  manager_ = makeConnectionManager(loop_, std::make_unique<TestConnector>(*this), {.clientName = "slow"}, queue);
  EventsOn(manager_);
  loop_.run();
  for (int number = 0; number < 200; ++number) {
    current().say(metricEvent({.metricId = 1, .payload = std::vector<std::uint8_t>(100 * 1024)}));
  }
  loop_.run();
  // Of twenty megabytes not more than nine are here: eight that may wait, and a batch of one.
  const std::size_t taken = roomLeft(current()) + 200 - 256;
  EXPECT_LE(taken, 92U);
  EXPECT_GE(taken, 80U);
  closeWith(*queue);
}

TEST_F(ServiceConnectionTest, SixtyFourAnswersMayBeLeftUnreadAndAServiceThatAsksOnceMoreIsLeft) {
  loop_.run();
  current().setReading(false);
  // What the connection holds, and what waits behind it.
  for (std::uint64_t number = 0; number < 256 + 64; ++number) {
    current().say(Ping(number));
    if (number % 100 == 0) loop_.run();
  }
  loop_.run();
  EXPECT_TRUE(Connection(manager_).connected);
  current().say(Ping(999));
  loop_.run();
  EXPECT_FALSE(Connection(manager_).connected);
  EXPECT_EQ(Connection(manager_).trouble, "the baseband service asks without reading the answers");
}

TEST_F(ServiceConnectionTest, AsManyCommandsAsTheLimitMayWaitAtOnceAndOneMoreIsRefused) {
  loop_.run();
  auto connection = std::make_shared<ServiceConnection>(
      loop_, std::make_unique<TestConnector>(*this), ServiceConnection::Identity{.clientName = "many"},
      ServiceConnection::Events{.events = [](auto) {}, .state = [](const auto&) {}});
  connection->start();
  std::vector<std::shared_ptr<PendingCommand>> commands;
  for (std::size_t number = 0; number <= mostCommandsAtOnce; ++number) {
    auto command = std::make_shared<PendingCommand>();
    command->name = "kCommandTest";
    command->deadline = loop_.monotonicTime() + seconds(2);
    command->done = loop_.makeGate();
    commands.push_back(command);
    connection->perform(command);
  }
  EXPECT_EQ(commands.back()->result.status, static_cast<int>(Status::TooMany));
  EXPECT_EQ(commands[mostCommandsAtOnce - 1]->result.status, 0);
}

}  // namespace
}  // namespace radix::client
