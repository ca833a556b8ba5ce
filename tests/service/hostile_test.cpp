// SPDX-License-Identifier: Apache-2.0
//
// What a client may do wrong, by mistake or not: the service says what happened and serves the others.
#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <vector>

#include "messages/metric_identifiers.h"
#include "radix/dictionary_bytes.h"
#include "radix/service_commands.h"
#include "radix/status.h"
#include "tests/service/harness/raw_client.h"
#include "tests/service/harness/test_service.h"
#include "tests/support/frames.h"

namespace probeview {
namespace {

using radix::Status;
using Factory = std::unique_ptr<TestService> (*)(Service::Settings);
using Bytes = std::vector<std::uint8_t>;

class HostileClients : public ::testing::TestWithParam<Factory> {
 protected:
  HostileClients() { make({}); }

  void make(Service::Settings settings) {
    good_.reset();
    settings.greetingTime = std::chrono::milliseconds(1500);
    settings.leavingTime = std::chrono::milliseconds(100);
    world_ = GetParam()(settings);
    good_ = world_->manager("good", {.observes = true});
    radix::client::RegisterEventHandler(good_, radix::kEventMetric,
                                        [this](const auto&, radix::client::Group) { ++goodEvents_; });
    radix::client::EventsOn(good_);
    world_->settle();
  }

  ~HostileClients() override {
    good_.reset();
    world_->settle();
  }

  std::unique_ptr<RawClient> connect() { return std::make_unique<RawClient>(world_->rawLink()); }

  // A raw client that has greeted and been greeted.
  std::unique_ptr<RawClient> greeted() {
    auto client = connect();
    client->say(radix::observer("raw"));
    EXPECT_TRUE(world_->until([&] { return client->hello.has_value(); }));
    return client;
  }

  void expectOthersServed() {
    radix::client::ObjectHandle reply;
    EXPECT_EQ(radix::client::PerformCommand(good_, radix::kCommandShowStatus, {}, reply).status, 0);
    const int before = goodEvents_;
    world_->emit(K_LTE_TX_POWER, {});
    EXPECT_TRUE(world_->until([&] { return goodEvents_ == before + 1; }));
  }

  std::size_t logged(std::string_view text) {
    std::size_t count = 0;
    world_->onService([&] { count = world_->log().count(text); });
    return count;
  }

  void expectRefused(RawClient& client, Status status, std::string_view reason) {
    EXPECT_TRUE(world_->until([&] { return client.hello && client.hello->refusalStatus() != 0; }));
    EXPECT_EQ(client.hello->refusalStatus(), static_cast<std::int32_t>(status));
    EXPECT_NE(client.hello->refusal().find(reason), std::string::npos) << client.hello->refusal();
    EXPECT_GE(logged(reason), 1U);
    // It is let go also when it does not go by itself.
    EXPECT_TRUE(world_->until([&] { return client.closed; }));
  }

  std::unique_ptr<TestService> world_;
  radix::client::ManagerHandle good_;
  int goodEvents_ = 0;
};

INSTANTIATE_TEST_SUITE_P(, HostileClients, ::testing::Values(&makeInProcessService, &makeSocketService),
                         [](const auto& information) { return information.index == 0 ? "InProcess" : "Socket"; });

TEST_P(HostileClients, AMalformedFrameEndsItsSenderWithAReason) {
  const auto client = greeted();
  client->hello.reset();
  client->sayBytes({0x0A, 0x7F, 0x01});
  expectRefused(*client, Status::MalformedFrame, "a frame of 3 bytes is malformed");
  expectOthersServed();
}

TEST_P(HostileClients, AFrameOfNoBytesIsToldFromTheEndAndEndsItsSenderWithAReason) {
  const auto client = greeted();
  client->sayBytes({});
  expectRefused(*client, Status::MalformedFrame, "");
  world_->onService([this] { EXPECT_EQ(world_->log().count("has gone after"), 0U); });
}

TEST_P(HostileClients, WhoeverDoesNotGreetFirstIsRefused) {
  const auto client = connect();
  client->say(radix::Delivery(true));
  expectRefused(*client, Status::MalformedFrame, "the first frame is no greeting");
  expectOthersServed();
}

TEST_P(HostileClients, WhoeverNeverGreetsIsLetGo) {
  const auto client = connect();
  EXPECT_TRUE(world_->until([&] { return client->closed; }));
  EXPECT_EQ(logged("did not greet within 1500 ms"), 1U);
  expectOthersServed();
}

TEST_P(HostileClients, OfManyWhoNeverGreetOnlyTheFirstTheSecondTheFourthAreLogged) {
  std::vector<std::unique_ptr<RawClient>> clients;
  for (int number = 0; number < 5; ++number) clients.push_back(connect());
  for (const auto& client : clients) {
    EXPECT_TRUE(world_->until([&] { return client->closed; }));
  }
  EXPECT_EQ(logged("did not greet"), 3U);
  EXPECT_EQ(logged("(4 so far)"), 1U);
}

TEST_P(HostileClients, AFrameOfTheLongestLengthIsReadAndOneByteMoreEndsItsSender) {
  const auto client = greeted();
  client->hello.reset();
  // Field 15, which nobody knows, with as much content as fits: 3 bytes of length.
  Bytes longest(radix::longestFrame, 'x');
  const std::size_t content = longest.size() - 4;
  longest[0] = 0x7A;
  longest[1] = static_cast<std::uint8_t>(content & 0x7F) | 0x80;
  longest[2] = static_cast<std::uint8_t>((content >> 7) & 0x7F) | 0x80;
  longest[3] = static_cast<std::uint8_t>(content >> 14);
  client->sayBytes(longest);
  client->say(radix::Ping(4));
  EXPECT_TRUE(world_->until([&] { return client->pings.size() == 1; }));
  longest.push_back('x');
  client->sayBytes(longest);
  expectRefused(*client, Status::TooLarge, "a frame of 131073 bytes is too long, at most 131072 are taken");
  expectOthersServed();
}

TEST_P(HostileClients, FramesAndFieldsOfALaterVersionAreIgnored) {
  const auto client = greeted();
  client->sayBytes({0x7A, 0x01, 'x'});
  client->say(radix::Reply(5, 1));
  client->say(radix::Dropped(7));
  client->say(radix::Ping(9));
  EXPECT_TRUE(world_->until([&] { return client->pings.size() == 1; }));
  EXPECT_FALSE(client->closed);
  expectOthersServed();
}

// A greeting as clients send that know nothing of observing: 0A (hello) 09, 08 01 (version) 10 01 (oldest version)
// 1A 03 (name) "old".
const std::vector<std::uint8_t> greetingOfAnOlderClient{0x0A, 9, 0x08, 1, 0x10, 1, 0x1A, 3, 'o', 'l', 'd'};

TEST_P(HostileClients, AnOlderClientThatCannotSayThatItObservesGetsNothingBeforeItPushes) {
  world_->emit(K_LTE_TX_POWER, {});
  const auto client = connect();
  client->sayBytes(greetingOfAnOlderClient);
  client->say(radix::Delivery(true));
  client->say(radix::Ping(1));
  ASSERT_TRUE(world_->until([&] { return client->pings.size() == 1; }));
  world_->settle();
  EXPECT_TRUE(client->events.empty());
  const std::string text = "[metrics]\nK_LTE_TX_POWER = 1000\n";
  client->say(radix::Command(
      1, radix::kCommandAddConfiguration,
      radix::encodeDictionary(
          {{radix::kKeyPayload, Value::bytes({reinterpret_cast<const std::uint8_t*>(text.data()), text.size()})}})));
  EXPECT_TRUE(world_->until([&] { return client->events.size() == 1; }));
}

TEST_P(HostileClients, APingIsAnsweredWithItsNumber) {
  const auto client = greeted();
  client->say(radix::Ping(77));
  ASSERT_TRUE(world_->until([&] { return client->pings.size() == 1; }));
  EXPECT_EQ(client->pings[0].number(), 77U);
  EXPECT_TRUE(client->pings[0].isAnswer());
}

TEST_P(HostileClients, ArgumentsThatAreNoDictionaryAreRefused) {
  const auto client = greeted();
  client->say(radix::Command(3, "kCommandQueryMetric", std::vector<std::uint8_t>{0x0A, 0x7F}));
  ASSERT_TRUE(world_->until([&] { return client->replies.size() == 1; }));
  EXPECT_EQ(client->replies[0].sequence(), 3U);
  EXPECT_EQ(client->replies[0].status(), static_cast<int>(Status::BadArguments));
}

TEST_P(HostileClients, ALongNameOfACommandOrClientIsCutAndItsControlCharactersStayOutOfTheLog) {
  const auto client = connect();
  client->say(radix::Hello("evil\nradixd: error: forged" + std::string(1000, 'n')));
  ASSERT_TRUE(world_->until([&] { return client->hello.has_value(); }));
  client->say(radix::Command(1, std::string(5000, 'c')));
  ASSERT_TRUE(world_->until([&] { return client->replies.size() == 1; }));
  EXPECT_LT(client->replies[0].message().size(), 120U);
  EXPECT_EQ(logged("\n"), 0U);
  EXPECT_EQ(logged(std::string(100, 'n')), 0U);
}

TEST_P(HostileClients, RandomBytesNeverHarmTheService) {
  std::mt19937 random(20240305);
  for (int round = 0; round < 60; ++round) {
    const auto client = round % 2 == 0 ? connect() : greeted();
    for (int count = 0; count < 20; ++count) {
      Bytes bytes(1 + random() % 200);
      for (auto& byte : bytes) byte = static_cast<std::uint8_t>(random());
      // Often enough something that looks like a frame.
      if (random() % 2 == 0) bytes[0] = static_cast<std::uint8_t>((1 + random() % 7) << 3 | 2);
      client->sayBytes(bytes);
    }
    world_->settle();
  }
  expectOthersServed();
}

TEST_P(HostileClients, AClientThatNeverReadsLosesTheOldestIsToldExactlyHowManyAndSlowsNobody) {
  const auto client = greeted();
  client->say(radix::Delivery(true));
  client->say(radix::Ping(1));
  ASSERT_TRUE(world_->until([&] { return client->pings.size() == 1; }));
  const auto already = client->events.size();
  client->setReading(false);
  constexpr int flood = 30000;
  const int before = goodEvents_;
  for (int batch = 0; batch < flood / 100; ++batch) {
    world_->onService([&] {
      for (int count = 0; count < 100; ++count) world_->script().emit(K_LTE_TX_POWER, {});
    });
    const int expected = before + (batch + 1) * 100;
    ASSERT_TRUE(world_->until([&] { return goodEvents_ >= expected; })) << "the other client lost something";
  }
  EXPECT_EQ(goodEvents_ - before, flood);
  world_->emit(K_LTE_RRC_STATE, {});
  client->setReading(true);
  ASSERT_TRUE(world_->until(
      [&] { return !client->events.empty() && radix::signedOf(client->events.back().metricId()) == K_LTE_RRC_STATE; }));
  EXPECT_GT(client->dropped, 0U);
  EXPECT_EQ(client->dropped + (client->events.size() - already), static_cast<std::size_t>(flood) + 1);
}

TEST_P(HostileClients, AClientThatAsksAndNeverReadsIsListenedToNoMoreUntilItReads) {
  const auto client = greeted();
  client->setReading(false);
  constexpr std::uint32_t most = 20000;
  std::uint32_t asked = 0;
  // Until both directions are full; somebody must stop, and nobody may grow.
  for (int idle = 0; idle < 3 && asked < most;) {
    if (client->say(radix::Command(asked + 1, "kCommandOfNobody"))) {
      ++asked;
      idle = 0;
    } else {
      world_->settle();
      ++idle;
    }
  }
  EXPECT_LT(asked, most);
  expectOthersServed();
  client->setReading(true);
  EXPECT_TRUE(world_->until([&] { return client->replies.size() == asked; })) << client->replies.size();
}

TEST_P(HostileClients, FiftyClientsThatConnectAtOnceAreAllServed) {
  std::vector<std::unique_ptr<RawClient>> crowd;
  for (int number = 0; number < 50; ++number) crowd.push_back(connect());
  for (const auto& client : crowd) {
    client->say(radix::observer("crowd"));
    client->say(radix::Delivery(true));
    client->say(radix::Ping(1));
  }
  for (const auto& client : crowd) {
    EXPECT_TRUE(world_->until([&] { return client->hello && client->pings.size() == 1; }));
  }
  world_->emit(K_LTE_RRC_STATE, {0x10, 1});
  for (const auto& client : crowd) EXPECT_TRUE(world_->until([&] { return client->events.size() == 1; }));
}

TEST_P(HostileClients, AClientThatDiesInTheMiddleOfEverythingLeavesNothingBehind) {
  for (int round = 0; round < 20; ++round) {
    const auto client = round % 3 == 0 ? connect() : greeted();
    client->say(radix::Delivery(true));
    client->say(radix::Command(1, radix::kCommandShowStatus));
    client->hangUp();
  }
  const auto others = [&] {
    std::size_t count = 0;
    world_->onService([&] { count = world_->service().clientCount(); });
    return count;
  };
  EXPECT_TRUE(world_->until([&] { return others() == 1; }));
  expectOthersServed();
}

TEST_P(HostileClients, ASourceThatFloodsDoesNotKeepClientsFromTheirCommands) {
  world_->onService([&] {
    world_->script().onListening = nullptr;
    for (int count = 0; count < 100000; ++count) world_->script().emit(K_LTE_TX_POWER, {});
  });
  radix::client::ObjectHandle reply;
  EXPECT_EQ(radix::client::PerformCommand(good_, radix::kCommandShowStatus, {}, reply).status, 0);
  const auto total = [&] {
    return static_cast<std::uint64_t>(goodEvents_) + radix::client::Connection(good_).lostEvents;
  };
  EXPECT_TRUE(world_->until([&] { return total() == 100000; })) << goodEvents_;
}

TEST_P(HostileClients, ClientsUpToTheLimitAreServedAndOneMoreIsToldSo) {
  make({.mostClients = 4, .keptForOwn = 0});
  std::vector<std::unique_ptr<RawClient>> crowd;
  for (int number = 0; number < 3; ++number) {
    crowd.push_back(greeted());
    EXPECT_EQ(crowd.back()->hello->refusalStatus(), 0);
  }
  const auto late = connect();
  late->say(radix::Hello("late"));
  expectRefused(*late, Status::TooMany, "there are already 4 clients");
  crowd.pop_back();
  EXPECT_TRUE(world_->until([&] {
    const auto next = connect();
    next->say(radix::Hello("next"));
    return world_->until([&] { return next->hello.has_value(); }) && next->hello->refusalStatus() == 0;
  }));
}

TEST_P(HostileClients, VersionsThatDoNotFitAreRefusedBothWays) {
  make({.versions = {.spoken = 4, .oldest = 3}});
  const auto old = connect();
  old->say(radix::Hello("old", {.spoken = 2, .oldest = 1}));
  expectRefused(*old, Status::VersionMismatch, "update the client");
  const auto demanding = connect();
  demanding->say(radix::Hello("demanding", {.spoken = 9, .oldest = 5}));
  expectRefused(*demanding, Status::VersionMismatch, "update the service");
  const auto newer = connect();
  newer->say(radix::Hello("newer", {.spoken = 9, .oldest = 4}));
  ASSERT_TRUE(world_->until([&] { return newer->hello.has_value(); }));
  EXPECT_EQ(newer->hello->refusalStatus(), 0);
  const auto silent = connect();
  silent->sayBytes({0x0A, 0x00});  // a greeting without any version
  expectRefused(*silent, Status::VersionMismatch, "version 0");
}

}  // namespace
}  // namespace probeview
