// SPDX-License-Identifier: Apache-2.0
//
// What may go wrong around the service, and what it may be made to hold, on a clock that the test owns.
#include <gtest/gtest.h>
#include <malloc.h>

#include <deque>
#include <memory>
#include <semaphore>
#include <vector>

#include "messages/metric_identifiers.h"
#include "platform/manual_loop.h"
#include "radix/connection_manager.h"
#include "radix/dictionary_bytes.h"
#include "radix/in_process_link.h"
#include "radix/service_commands.h"
#include "radix/source_states.h"
#include "radix/status.h"
#include "service/service.h"
#include "tests/service/harness/raw_client.h"
#include "tests/service/harness/scripted_source.h"
#include "tests/service/harness/test_service.h"
#include "tests/support/frames.h"

namespace probeview {
namespace {

using std::chrono::hours;
using std::chrono::milliseconds;
using std::chrono::minutes;
using std::chrono::seconds;

class Faults : public ::testing::Test, protected radix::Connector {
 protected:
  Faults() : service_(loop_, ServiceLog(log_, LogLevel::Info), {}) {
    script_->metrics = {K_LTE_RRC_STATE};
    service_.addSource(std::make_unique<ScriptedSource>(script_));
    manager_ = radix::client::makeConnectionManager(loop_, std::make_unique<Forward>(*this),
                                                    {.clientName = "client", .observes = true},
                                                    {std::shared_ptr<void>(), &loop_});
    radix::client::RegisterEventHandler(manager_, radix::kEventMetric,
                                        [this](const auto&, radix::client::Group) { ++events_; });
    radix::client::EventsOn(manager_);
    loop_.advance(milliseconds(1));
  }
  ~Faults() override {
    manager_.reset();
    loop_.run();
  }

  radix::ConnectResult connect() override {
    auto [near, far] = radix::makeInProcessLinks(loop_);
    service_.accept(std::move(far), {});
    return {std::move(near), false, {}};
  }

  std::unique_ptr<RawClient> connectRaw() { return std::make_unique<RawClient>(connect().link); }

  // A raw client that has greeted and been greeted.
  std::unique_ptr<RawClient> greeted(const std::string& name = "raw", bool observes = true) {
    auto client = connectRaw();
    client->say(observes ? radix::observer(name) : radix::Hello(name));
    loop_.run();
    EXPECT_TRUE(client->hello.has_value());
    return client;
  }

  static radix::Command query(std::int64_t metric) {
    return {1, radix::kCommandQueryMetric, radix::encodeDictionary({{radix::kKeyMetricID, metric}})};
  }

  static radix::Command push(const std::string& text) {
    return {
        1, radix::kCommandAddConfiguration,
        radix::encodeDictionary(
            {{radix::kKeyPayload, Value::bytes({reinterpret_cast<const std::uint8_t*>(text.data()), text.size()})}})};
  }

  void emit() { script_->emit(K_LTE_RRC_STATE, {0x10, 1}, loop_.wallTime()); }

  Dictionary status() {
    radix::client::ObjectHandle reply;
    EXPECT_EQ(radix::client::PerformCommand(manager_, radix::kCommandShowStatus, {}, reply).status, 0);
    return reply ? radix::client::nativeDictionary(*reply) : Dictionary{};
  }

  ManualLoop loop_;
  KeptLines log_;
  std::shared_ptr<ScriptedSource::Script> script_ = std::make_shared<ScriptedSource::Script>();
  Service service_;
  radix::client::ManagerHandle manager_;
  int events_ = 0;

 private:
  class Forward final : public radix::Connector {
   public:
    explicit Forward(Faults& faults) : faults_(faults) {}
    radix::ConnectResult connect() override { return faults_.connect(); }

   private:
    Faults& faults_;
  };
};

TEST_F(Faults, TheTimeOfDayMayJumpBackAndForthAndEverythingGoesOn) {
  for (int jump = 0; jump < 20; ++jump) {
    loop_.setWallTime(jump % 2 == 0 ? milliseconds(0) : ManualLoop::defaultWallTime + hours(24 * 365 * jump));
    emit();
    loop_.advance(milliseconds(10));
    EXPECT_EQ(events_, jump + 1);
    const Dictionary report = status();
    EXPECT_EQ(report.find("uptime_ms")->int64(), 1 + 10 * (jump + 1));
  }
}

TEST_F(Faults, ADayOfOneRecordASecondIsDeliveredWholeAndNothingPilesUp) {
  const auto source = script_->context->scheduler.every(seconds(1), [this] { emit(); });
  loop_.advance(hours(24));
  loop_.advance(milliseconds(1));
  EXPECT_EQ(events_, 24 * 3600);
  const Dictionary report = status();
  const Dictionary& client = *(*report.find("clients")->list())[0].dictionary();
  EXPECT_EQ(client.find("queued")->rawUInt64(), 0U);
  EXPECT_EQ(client.find("lost")->rawUInt64(), 0U);
  EXPECT_DOUBLE_EQ(client.find("records_per_second")->rawDouble(), 1.0);
  EXPECT_EQ(report.find("uptime_ms")->int64(), 24 * 3600 * 1000 + 2);
}

TEST_F(Faults, ADayWithoutAnythingSetsOffNoTimerAtAll) {
  EXPECT_EQ(loop_.untilNextTimer(), std::nullopt);
  loop_.advance(hours(24));
  EXPECT_EQ(loop_.untilNextTimer(), std::nullopt);
}

TEST_F(Faults, ASourceThatTakesAQuestionAndNeverAnswersKeepsNobodyWaiting) {
  script_->onQuery = [](std::int64_t) { return true; };
  const auto before = loop_.monotonicTime();
  radix::client::ObjectHandle reply;
  EXPECT_EQ(radix::client::PerformCommand(manager_, radix::kCommandQueryMetric,
                                          {{radix::kKeyMetricID, K_LTE_RRC_STATE}}, reply)
                .status,
            0);
  EXPECT_EQ(loop_.monotonicTime(), before);
}

TEST_F(Faults, ASourceMayReportAtTheVeryMomentInWhichSomebodyBeginsToListen) {
  script_->onListening = [this](bool listening) {
    if (listening) emit();
  };
  radix::client::EventsOff(manager_);
  loop_.run();
  radix::client::EventsOn(manager_);
  loop_.advance(milliseconds(1));
  EXPECT_EQ(events_, 1);
}

TEST_F(Faults, ASourceThatThrowsAtItsStartIsReportedAndTheServiceGoesOn) {
  auto other = std::make_shared<ScriptedSource::Script>();
  other->origin = "broken";
  other->onStart = [] { throw std::runtime_error("no modem"); };
  service_.addSource(std::make_unique<ScriptedSource>(other));
  loop_.run();
  EXPECT_EQ(log_.count("broken failed starting: no modem; it runs no more"), 1U);
  emit();
  loop_.advance(milliseconds(1));
  EXPECT_EQ(events_, 1);
}

TEST_F(Faults, ARecordThatFitsNoFrameIsWithheldAndTheLongestThatDoesIsSent) {
  // Field 15, unknown to every message, filled up: the payload decodes whatever its length.
  const auto payload = [](std::size_t size) {
    std::vector<std::uint8_t> bytes(size, 'x');
    const std::size_t content = size - 4;
    bytes[0] = 0x7A;
    bytes[1] = static_cast<std::uint8_t>(content & 0x7F) | 0x80;
    bytes[2] = static_cast<std::uint8_t>((content >> 7) & 0x7F) | 0x80;
    bytes[3] = static_cast<std::uint8_t>(content >> 14);
    return bytes;
  };
  // A frame has 131072 bytes; the origin and the other fields keep 1280 of them.
  constexpr std::size_t longest = 131072 - 1280;
  script_->emit(K_LTE_RRC_STATE, payload(longest));
  loop_.advance(milliseconds(1));
  EXPECT_EQ(events_, 1);
  script_->emit(K_LTE_RRC_STATE, payload(longest + 1));
  loop_.advance(milliseconds(1));
  EXPECT_EQ(events_, 1);
  EXPECT_EQ(log_.count("its payload has 129793 bytes, more than 129792"), 1U);
}

TEST_F(Faults, ADayOfComingAndGoingUnderAClockThatIsSetAgainAndAgainLeavesNothingBehind) {
  const auto source = script_->context->scheduler.every(seconds(1), [this] { emit(); });
  std::size_t early = 0;
  for (int stay = 0; stay < 24 * 6; ++stay) {
    // Somebody comes, wants something, does not read for a while, and goes without a word.
    auto guest = greeted("guest " + std::to_string(stay));
    const bool known = events_ > 0;
    const int before = events_;
    guest->say(push("[metrics]\nK_LTE_RRC_STATE = " + std::to_string(100 + stay) + "\nK_OF_NOBODY = 5\n"));
    guest->say(radix::Delivery(true));
    guest->say(radix::Command(2, radix::kCommandQueryMetric));
    loop_.advance(minutes(2) + milliseconds(500));
    guest->setReading(false);
    loop_.advance(minutes(5));
    guest->setReading(true);
    loop_.advance(minutes(1));
    EXPECT_EQ(guest->replies.size(), 2U);
    EXPECT_EQ(guest->events.size() + guest->dropped, static_cast<std::size_t>(events_ - before) + (known ? 1 : 0));
    guest.reset();
    loop_.advance(minutes(2) - milliseconds(500));
    loop_.setWallTime(stay % 2 == 0 ? milliseconds(stay) : ManualLoop::defaultWallTime + hours(stay));
    EXPECT_EQ(service_.clientCount(), 1U);
    log_.lines = {};
    if (stay == 12) early = ::mallinfo2().uordblks;
  }
  EXPECT_EQ(events_, 24 * 3600);
  EXPECT_LE(::mallinfo2().uordblks, early + 16 * 1024);
  const Dictionary report = status();
  EXPECT_EQ(report.find("uptime_ms")->int64(), 24 * 3600 * 1000 + 1);
  const Dictionary& client = *(*report.find("clients")->list())[0].dictionary();
  EXPECT_EQ(client.find("lost")->rawUInt64(), 0U);
  EXPECT_DOUBLE_EQ(client.find("records_per_second")->rawDouble(), 1.0);
  EXPECT_EQ(script_->plan, std::nullopt);
}

TEST_F(Faults, AHundredAndTwentyEightClientsAreServedAndOneMoreIsToldSo) {
  std::deque<std::unique_ptr<RawClient>> crowd;
  for (int number = 0; number < 127; ++number) crowd.push_back(greeted(std::string(64, 'n')));
  EXPECT_EQ(service_.clientCount(), 128U);
  for (const auto& client : crowd) EXPECT_EQ(client->hello->refusalStatus(), 0);
  // What the service has to say of so many fits into one frame.
  EXPECT_EQ(status().find("clients")->list()->size(), 128U);
  auto late = greeted("late");
  EXPECT_EQ(late->hello->refusalStatus(), static_cast<std::int32_t>(radix::Status::TooMany));
  EXPECT_EQ(late->hello->refusal(), "there are already 128 clients, more are not served");
  EXPECT_EQ(log_.count("'late' (process 0, user 0) was refused: there are already 128 clients"), 1U);
  crowd.pop_front();
  loop_.run();
  EXPECT_EQ(greeted()->hello->refusalStatus(), 0);
}

TEST_F(Faults, SixteenClientsAndConnectionsMoreAreKeptForTheServicesOwnUserAndRoot) {
  const auto connectOwn = [this] {
    auto [near, far] = radix::makeInProcessLinks(loop_);
    service_.accept(std::move(far), {.isOwn = true});
    return std::make_unique<RawClient>(std::move(near));
  };
  std::deque<std::unique_ptr<RawClient>> crowd;
  for (int number = 0; number < 127; ++number) crowd.push_back(greeted(std::string(64, 'n')));
  EXPECT_NE(greeted("late")->hello->refusalStatus(), 0);
  std::deque<std::unique_ptr<RawClient>> own;
  for (int number = 0; number < 17; ++number) {
    own.push_back(connectOwn());
    own.back()->say(radix::Hello(std::string(64, 'o')));
  }
  loop_.run();
  EXPECT_EQ(service_.clientCount(), 128U + 16);
  EXPECT_EQ(own[15]->hello->refusalStatus(), 0);
  EXPECT_EQ(own[16]->hello->refusal(), "there are already 144 clients, more are not served");
  // What the service has to say of so many fits into one frame.
  EXPECT_EQ(status().find("clients")->list()->size(), 144U);
  own.clear();
  crowd.clear();
  loop_.advance(seconds(2));

  // One connection is the manager's.
  for (int number = 0; number < 255; ++number) crowd.push_back(connectRaw());
  const auto late = connectRaw();
  for (int number = 0; number < 16; ++number) own.push_back(connectOwn());
  const auto ownLate = connectOwn();
  loop_.run();
  EXPECT_TRUE(late->closed);
  for (const auto& client : own) EXPECT_FALSE(client->closed);
  EXPECT_TRUE(ownLate->closed);
}

TEST_F(Faults, TwoHundredAndFiftySixConnectionsAreKeptAndOneMoreIsClosedWithoutAWord) {
  std::vector<std::unique_ptr<RawClient>> crowd;
  for (int number = 0; number < 255; ++number) crowd.push_back(connectRaw());
  loop_.run();
  for (const auto& client : crowd) EXPECT_FALSE(client->closed);
  const auto late = connectRaw();
  loop_.run();
  EXPECT_TRUE(late->closed);
  EXPECT_FALSE(late->hello.has_value());
  EXPECT_EQ(log_.count("a connection of process 0 was closed: there are too many already (1 closed so far)"), 1U);
  for (int number = 0; number < 7; ++number) connectRaw();
  EXPECT_EQ(log_.count("was closed: there are too many already"), 4U) << "the 1st, 2nd, 4th and 8th";
}

TEST_F(Faults, AClientHasFiveSecondsToGreetAndWhoeverWasRefusedOneToGo) {
  const auto silent = connectRaw();
  loop_.advance(seconds(5) - milliseconds(1));
  EXPECT_FALSE(silent->closed);
  loop_.advance(milliseconds(1));
  EXPECT_TRUE(silent->closed);
  const auto refused = connectRaw();
  refused->say(radix::Delivery(true));
  loop_.run();
  ASSERT_TRUE(refused->hello.has_value());
  loop_.advance(seconds(1) - milliseconds(1));
  EXPECT_FALSE(refused->closed);
  loop_.advance(milliseconds(1));
  EXPECT_TRUE(refused->closed);
}

TEST_F(Faults, AClientsNameIsKeptUpToSixtyFourBytesAndNoCharacterIsCutInTwo) {
  const auto names = [this] {
    std::vector<std::string> all;
    const Dictionary report = status();
    for (const Value& client : *report.find("clients")->list()) {
      all.emplace_back(*client.dictionary()->find("name")->text());
    }
    return all;
  };
  const auto whole = greeted(std::string(64, 'n'));
  const auto cut = greeted(std::string(65, 'm'));
  const auto between = greeted(std::string(63, 'o') + "\u00e9");
  EXPECT_EQ(names(),
            (std::vector<std::string>{"client", std::string(64, 'n'), std::string(64, 'm'), std::string(63, 'o')}));
}

TEST_F(Faults, AnOriginIsKeptUpTo1024Bytes) {
  const auto client = greeted();
  client->say(radix::Delivery(true));
  loop_.run();
  for (const std::size_t size : {1024U, 1025U}) {
    script_->sink->emit({K_LTE_RRC_STATE, {}, milliseconds(1), std::string(size, 'o')});
    loop_.advance(milliseconds(1));
    EXPECT_EQ(client->events.back().origin(), std::string(1024, 'o'));
  }
  auto other = std::make_shared<ScriptedSource::Script>();
  other->origin = std::string(1025, 'p');
  service_.addSource(std::make_unique<ScriptedSource>(other));
  EXPECT_EQ((*status().find("sources")->list())[1].dictionary()->find("origin")->text(), std::string(1024, 'p'));
}

TEST_F(Faults, TenNotesOnAConfigurationAreLoggedAndOfMoreOnlyTheNumber) {
  const auto client = greeted();
  std::string text = "[metrics]\n";
  for (int number = 0; number < 10; ++number) text += "K_OF_NOBODY_" + std::to_string(number) + " = 1\n";
  client->say(push(text));
  loop_.run();
  EXPECT_EQ(log_.count("is not known, ignored"), 10U);
  EXPECT_EQ(log_.count("more like these"), 0U);
  log_.lines.clear();
  client->say(push(text + "K_OF_NOBODY_10 = 1\n"));
  loop_.run();
  EXPECT_EQ(log_.count("is not known, ignored"), 10U);
  EXPECT_EQ(log_.count("the configuration of client 2 'raw': and 1 more like these"), 1U);
}

TEST_F(Faults, OfTheRecordsThatAreWithheldTheFirstTheSecondTheFourthTheEighthAreLogged) {
  for (int number = 1; number <= 16; ++number) {
    script_->emit(K_LTE_RRC_STATE, {0x08});
    const std::size_t logged = number < 2 ? 1 : number < 4 ? 2 : number < 8 ? 3 : number < 16 ? 4 : 5;
    EXPECT_EQ(log_.count("was withheld"), logged) << number;
  }
}

TEST_F(Faults, ACommandsNameInAReplyIsCutAtSixtyFourBytes) {
  const auto client = greeted();
  for (const std::size_t size : {64U, 65U, 100'000U}) {
    client->say(radix::Command(1, std::string(size, 'c')));
    client->say(radix::Command(2, std::string(size, 'c'), std::vector<std::uint8_t>{0x0A, 0x7F}));
    loop_.run();
    ASSERT_EQ(client->replies.size(), 2U);
    EXPECT_EQ(client->replies[0].message(), "the command '" + std::string(64, 'c') + "' is not known");
    EXPECT_EQ(client->replies[1].message(), "the arguments of " + std::string(64, 'c') + " cannot be read");
    client->replies.clear();
  }
}

// The service's end of a connection whose other end takes as much as the test says.
class StuckLink final : public radix::Link {
 public:
  struct Shared {
    radix::LinkListener* listener = nullptr;
    std::size_t room = 0;
    std::size_t sent = 0;
    std::vector<std::vector<std::uint8_t>> frames{};
    bool reading = true;
  };
  explicit StuckLink(Shared& shared) : shared_(shared) {}
  void start(radix::LinkListener& listener) override { shared_.listener = &listener; }
  std::size_t send(std::span<const radix::OutgoingFrame> frames) override {
    const std::size_t taken = std::min(frames.size(), shared_.room);
    shared_.room -= taken;
    shared_.sent += taken;
    for (const radix::OutgoingFrame& one : frames.first(taken)) {
      auto& bytes = shared_.frames.emplace_back(*one.frame);
      bytes.insert(bytes.end(), one.trailer.bytes.begin(), one.trailer.bytes.begin() + one.trailer.size);
    }
    return taken;
  }
  void setReading(bool reading) override { shared_.reading = reading; }

 private:
  Shared& shared_;
};

TEST_F(Faults, SixtyFourRepliesMayBeLeftUnreadAndAfterOneMoreTheClientIsNotListenedToUntilItReads) {
  StuckLink::Shared link;
  // The greeting, and what feeds the service.
  link.room = 2;
  service_.accept(std::make_unique<StuckLink>(link), {});
  link.listener->onFrame(*radix::encode(radix::Hello("stuck")));
  loop_.run();
  EXPECT_EQ(link.sent, 2U);
  for (std::uint64_t number = 0; number < 64; ++number) {
    link.listener->onFrame(*radix::encode(radix::Ping(number)));
  }
  loop_.run();
  EXPECT_TRUE(link.reading);
  link.listener->onFrame(*radix::encode(radix::Ping(64)));
  loop_.run();
  EXPECT_FALSE(link.reading);
  link.room = 64;
  link.listener->onWritable();
  EXPECT_FALSE(link.reading) << "one is still there";
  link.room = 1;
  link.listener->onWritable();
  EXPECT_TRUE(link.reading);
  EXPECT_EQ(link.sent, 67U);
}

// What a frame says, to be looked at.
class Heard final : public radix::FrameHandler {
 public:
  explicit Heard(const std::vector<std::vector<std::uint8_t>>& frames) {
    for (const auto& frame : frames) EXPECT_TRUE(radix::decodeFrame(frame, *this));
  }
  void onEvent(const radix::Event& event, std::optional<milliseconds> age) override {
    events.push_back(event);
    ages.push_back(age);
  }
  void onReply(const radix::Reply& reply) override { replies.push_back(reply); }
  void onSources(const radix::Sources& sources) override { told.push_back(radix::statesOf(sources)); }
  void onDropped(const radix::Dropped& one) override { dropped += one.count(); }
  std::vector<radix::Event> events;
  std::vector<std::optional<milliseconds>> ages;
  std::vector<radix::Reply> replies;
  std::vector<radix::SourceStates> told;
  std::uint64_t dropped = 0;
};

TEST_F(Faults, WhatWaitsForAClientThatClearsItsConfigurationIsTakenBackAndALaterPushBringsIt) {
  script_->metrics = {K_LTE_RRC_STATE, K_LTE_TX_POWER};
  script_->onQuery = [this](std::int64_t metric) {
    script_->emit(metric, {}, milliseconds(3));
    return true;
  };
  StuckLink::Shared link;
  link.room = 2;
  service_.accept(std::make_unique<StuckLink>(link), {});
  const auto say = [&](const auto& sentence) { link.listener->onFrame(*radix::encode(sentence)); };
  say(radix::Hello("stuck"));
  say(radix::Delivery(true));
  say(push("[metrics]\nK_LTE_RRC_STATE = 1000\n"));
  loop_.advance(milliseconds(1));
  script_->emit(K_LTE_RRC_STATE, {0x10, 1}, milliseconds(1));
  script_->emit(K_LTE_RRC_STATE, {0x10, 1}, milliseconds(2));
  say(radix::Command(2, radix::kCommandQueryMetric, radix::encodeDictionary({{radix::kKeyMetricID, K_LTE_RRC_STATE}})));
  say(radix::Command(3, radix::kCommandClearConfiguration));
  link.room = 100;
  link.listener->onWritable();
  loop_.advance(milliseconds(1));
  Heard heard(link.frames);
  ASSERT_EQ(heard.replies.size(), 3U);
  ASSERT_EQ(heard.events.size(), 1U) << "the answer to its question is its own";
  EXPECT_EQ(heard.events[0].time(), 3U);
  EXPECT_EQ(heard.dropped, 0U) << "nobody was too slow";
  // Of the other metric nothing has left.
  link.room = 0;
  say(push("[metrics]\nK_LTE_TX_POWER = 1000\n"));
  script_->emit(K_LTE_TX_POWER, {}, milliseconds(4));
  loop_.advance(milliseconds(1));
  say(radix::Command(5, radix::kCommandClearConfiguration));
  say(push("[metrics]\nK_LTE_TX_POWER = 1000\nK_LTE_RRC_STATE = 1000\n"));
  link.room = 100;
  link.listener->onWritable();
  loop_.advance(milliseconds(1));
  heard = Heard(link.frames);
  ASSERT_EQ(heard.events.size(), 2U);
  EXPECT_EQ(heard.events[1].time(), 4U);
}

TEST_F(Faults, ARecordGrowsOlderWhileTheDeviceSleeps) {
  emit();
  loop_.advance(seconds(1));
  loop_.sleep(hours(8));
  const auto client = greeted();
  client->say(radix::Delivery(true));
  loop_.advance(milliseconds(1));
  ASSERT_EQ(client->events.size(), 1U);
  ASSERT_TRUE(client->ages[0]);
  EXPECT_GE(*client->ages[0], hours(8) + seconds(1));
  EXPECT_LT(*client->ages[0], hours(8) + seconds(2));
  const Dictionary report = status();
  const auto ageOfLast = (*report.find("sources")->list())[0].dictionary()->find("last_record_age_ms")->int64();
  EXPECT_GE(milliseconds(ageOfLast.value()), hours(8) + seconds(1));
}

TEST_F(Faults, ARecordThatWaitsForAStuckReaderOverASleepHasGrownOlderWhenItLeaves) {
  StuckLink::Shared link;
  link.room = 2;
  service_.accept(std::make_unique<StuckLink>(link), {});
  link.listener->onFrame(*radix::encode(radix::observer("stuck")));
  link.listener->onFrame(*radix::encode(radix::Delivery(true)));
  loop_.advance(milliseconds(1));
  emit();
  loop_.advance(milliseconds(1));
  loop_.sleep(hours(8));
  link.room = 100;
  link.listener->onWritable();
  loop_.advance(milliseconds(1));
  const Heard heard(link.frames);
  ASSERT_EQ(heard.events.size(), 1U);
  ASSERT_TRUE(heard.ages[0]);
  EXPECT_GE(*heard.ages[0], hours(8));
  EXPECT_LT(*heard.ages[0], hours(8) + seconds(1));
}

TEST_F(Faults, ARecordTellsHowOldItWasWhenItLeftWhateverTheTimeOfDay) {
  script_->sink->emit({.metricId = K_LTE_RRC_STATE,
                       .payload = {0x10, 1},
                       .time = loop_.wallTime(),
                       .origin = {},
                       .period = seconds(1),
                       .age = seconds(5)});
  loop_.advance(minutes(3));
  loop_.setWallTime(loop_.wallTime() - hours(1000));
  const auto client = greeted();
  client->say(radix::Delivery(true));
  loop_.advance(milliseconds(1));
  ASSERT_EQ(client->events.size(), 1U);
  EXPECT_EQ(client->ages[0], milliseconds(185'000));
  EXPECT_EQ(client->events[0].period(), 1000U);
  emit();
  loop_.advance(milliseconds(1));
  ASSERT_EQ(client->events.size(), 2U);
  EXPECT_EQ(client->ages[1], milliseconds(0));
  EXPECT_TRUE(client->events[1].hasPeriod());
  EXPECT_EQ(client->events[1].period(), 0U) << "on change";
}

TEST_F(Faults, ARecordThatWaitsForASlowClientGrowsOlderUntilItLeaves) {
  StuckLink::Shared link;
  link.room = 2;
  service_.accept(std::make_unique<StuckLink>(link), {});
  link.listener->onFrame(*radix::encode(radix::observer("slow")));
  link.listener->onFrame(*radix::encode(radix::Delivery(true)));
  loop_.advance(milliseconds(1));
  emit();
  loop_.advance(seconds(7));
  link.room = 1;
  link.listener->onWritable();
  const Heard heard(link.frames);
  ASSERT_EQ(heard.events.size(), 1U);
  EXPECT_EQ(heard.ages[0], milliseconds(7000));
}

TEST_F(Faults, OfAllChangesOfTheSourcesASlowClientIsToldTheLastAlone) {
  StuckLink::Shared link;
  link.room = 2;
  service_.accept(std::make_unique<StuckLink>(link), {});
  link.listener->onFrame(*radix::encode(radix::Hello("slow")));
  loop_.advance(milliseconds(1));
  using Phase = SourceCondition::Phase;
  for (int turn = 0; turn < 500; ++turn) {
    script_->sink->conditionChanged({.phase = turn % 2 == 0 ? Phase::Ended : Phase::Running, .reason = {}});
    script_->sink->conditionChanged({.phase = Phase::Failed, .reason = std::string(100'000, 'x')});
    loop_.run();
  }
  link.room = 100;
  link.listener->onWritable();
  const Heard heard(link.frames);
  EXPECT_LE(heard.told.size(), 3U);
  ASSERT_FALSE(heard.told.empty());
  EXPECT_EQ(heard.told.back().states.at(0).phase, Phase::Failed);
  EXPECT_EQ(heard.told.back().states.at(0).reason, std::string(512, 'x'));
}

TEST_F(Faults, AnAnswerThatComesAfterHalfAMinuteIsNone) {
  script_->onQuery = [](std::int64_t) { return true; };
  for (const auto late : {milliseconds(0), milliseconds(1)}) {
    const auto client = greeted("asks", false);
    client->say(radix::Delivery(true));
    client->say(query(K_LTE_RRC_STATE));
    loop_.run();
    loop_.advance(seconds(30) + late);
    emit();
    loop_.advance(milliseconds(1));
    EXPECT_EQ(client->events.size(), late.count() == 0 ? 1U : 0U);
  }
}

TEST_F(Faults, AnAnswerThatCameWhileEventsWereOffIsThereHoweverLongTheyStayOff) {
  script_->onQuery = [](std::int64_t) { return true; };
  const auto client = greeted("asks", false);
  client->say(query(K_LTE_RRC_STATE));
  loop_.run();
  script_->emit(K_LTE_RRC_STATE, {0x10, 1}, milliseconds(1));
  loop_.advance(minutes(10));
  script_->emit(K_LTE_TX_POWER, {}, milliseconds(2));
  loop_.advance(milliseconds(1));
  ASSERT_TRUE(client->events.empty());
  client->say(radix::Delivery(true));
  loop_.advance(milliseconds(1));
  ASSERT_EQ(client->events.size(), 1U);
  EXPECT_EQ(client->events[0].time(), 1U);
}

TEST_F(Faults, TwoHundredAndFiftySixQuestionsMayBeOpenAndOneMoreTakesThePlaceOfTheOldest) {
  script_->onQuery = [](std::int64_t) { return true; };
  const auto silent = std::make_shared<ScriptedSource::Script>();
  silent->metrics = {K_LTE_TX_POWER};
  silent->onQuery = script_->onQuery;
  service_.addSource(std::make_unique<ScriptedSource>(silent));
  for (const int others : {255, 256}) {
    const auto client = greeted("asks", false);
    client->say(radix::Delivery(true));
    client->say(query(K_LTE_RRC_STATE));
    for (int number = 0; number < others; ++number) {
      client->say(query(K_LTE_TX_POWER));
      loop_.run();
    }
    emit();
    loop_.advance(milliseconds(1));
    EXPECT_EQ(client->events.size(), others == 255 ? 1U : 0U);
  }
}

TEST(HangingSource, HoldsUpTheServiceForAsLongAsItHangsAndEverybodyIsToldAfterTwoSeconds) {
  const auto world = makeSocketService();
  world->script().metrics = {K_LTE_RRC_STATE};
  std::binary_semaphore freed(0);
  world->script().onQuery = [&freed](std::int64_t) {
    freed.acquire();
    return true;
  };
  world->kill();
  world->restart();
  const auto asker = world->manager("asker");
  const auto other = world->manager("other", {.observes = true});
  int events = 0;
  radix::client::RegisterEventHandler(other, radix::kEventMetric,
                                      [&events](const auto&, radix::client::Group) { ++events; });
  radix::client::EventsOn(other);
  world->settle();
  radix::client::ObjectHandle reply;
  const auto result =
      radix::client::PerformCommand(asker, radix::kCommandQueryMetric, {{radix::kKeyMetricID, K_LTE_RRC_STATE}}, reply);
  EXPECT_EQ(result.status, static_cast<int>(radix::Status::TimedOut));
  EXPECT_EQ(result.message, "the baseband service did not answer in time");
  freed.release();
  // Everything goes on as if nothing had been.
  EXPECT_EQ(radix::client::PerformCommand(asker, radix::kCommandShowStatus, {}, reply).status, 0);
  world->emit(K_LTE_RRC_STATE, {});
  EXPECT_TRUE(world->until([&] { return events == 1; }));
  EXPECT_TRUE(radix::client::Connection(asker).connected);
}

}  // namespace
}  // namespace probeview
