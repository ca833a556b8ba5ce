// SPDX-License-Identifier: Apache-2.0
//
// A whole conversation, byte by byte, as both sides of protocol version 1 have always had it: a peer that was built
// before today reads these bytes and no others. They are written down here and made by nothing.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "platform/manual_loop.h"
#include "radix/connection_manager.h"
#include "radix/in_process_link.h"
#include "radix/service_commands.h"
#include "service/service.h"
#include "tests/service/harness/scripted_source.h"

namespace probeview {
namespace {

using std::chrono::milliseconds;
using ::testing::ElementsAre;
using Bytes = std::vector<std::uint8_t>;
using Lines = std::vector<std::string>;

std::string hex(std::span<const std::uint8_t> bytes) {
  constexpr char digits[] = "0123456789abcdef";
  std::string text;
  for (const std::uint8_t byte : bytes) {
    text += digits[byte >> 4];
    text += digits[byte & 15];
  }
  return text;
}

// Stands between the two sides: writes down what passes in one direction and hands it on.
class Tap final : public radix::LinkListener {
 public:
  explicit Tap(std::unique_ptr<radix::Link> link) : link_(std::move(link)) { link_->start(*this); }
  void handOnTo(Tap& other) { other_ = &other; }
  void say(Bytes bytes) { EXPECT_TRUE(link_->sendOne(std::make_shared<const Bytes>(std::move(bytes)))); }
  void setReading(bool reading) { link_->setReading(reading); }
  Lines taken() { return std::exchange(heard_, {}); }

 private:
  void onFrame(std::span<const std::uint8_t> frame) override {
    heard_.push_back(hex(frame));
    if (other_ != nullptr) other_->say({frame.begin(), frame.end()});
  }
  void onOverlongFrame(std::size_t) override { ADD_FAILURE(); }
  void onBatchEnd() override {}
  void onWritable() override {}
  void onClosed() override {}

  std::unique_ptr<radix::Link> link_;
  Tap* other_ = nullptr;
  Lines heard_;
};

class WireBytes : public ::testing::Test {
 protected:
  WireBytes() {
    script_->origin = "scripted";
    script_->metrics = {0x3C4E04, 0x3C4E25};
    service_.addSource(std::make_unique<ScriptedSource>(script_));
  }
  ~WireBytes() override {
    manager_.reset();
    loop_.run();
  }

  // The service's end of a new connection to it.
  std::unique_ptr<radix::Link> reach(std::size_t capacity = 64) {
    auto [near, far] = radix::makeInProcessLinks(loop_, capacity);
    service_.accept(std::move(far), {.process = 1, .user = 1000, .refusal = {}});
    return std::move(near);
  }

  // Connects a client of the library, with this test between it and the service.
  void connect(bool observes) {
    manager_ = radix::client::makeConnectionManager(loop_, std::make_unique<TappedConnector>(*this),
                                                    {.clientName = "viewer", .observes = observes},
                                                    {std::shared_ptr<void>(), &loop_});
    loop_.run();
  }

  ManualLoop loop_;
  DiscardingSink log_;
  std::shared_ptr<ScriptedSource::Script> script_ = std::make_shared<ScriptedSource::Script>();
  Service service_{loop_, ServiceLog(log_, LogLevel::Error), {.name = "radixd", .outbox = {.records = 2}}};
  std::unique_ptr<Tap> fromClient_;
  std::unique_ptr<Tap> fromService_;
  radix::client::ManagerHandle manager_;

 private:
  class TappedConnector final : public radix::Connector {
   public:
    explicit TappedConnector(WireBytes& test) : test_(test) {}
    radix::ConnectResult connect() override {
      auto [client, tapped] = radix::makeInProcessLinks(test_.loop_);
      test_.fromClient_ = std::make_unique<Tap>(std::move(tapped));
      test_.fromService_ = std::make_unique<Tap>(test_.reach());
      test_.fromClient_->handOnTo(*test_.fromService_);
      test_.fromService_->handOnTo(*test_.fromClient_);
      return {std::move(client), false, {}};
    }

   private:
    WireBytes& test_;
  };
};

TEST_F(WireBytes, AGreetingHasItsBytes) {
  connect(true);
  EXPECT_THAT(fromClient_->taken(), ElementsAre("0a0e080110011a067669657765723001"));
  EXPECT_THAT(fromService_->taken(), ElementsAre("0a0c080110011a06726164697864",
                                                 "421c0a1a0a0873637269707465641000220508849cf101220508a59cf101"));
}

TEST_F(WireBytes, AClientThatDoesNotObserveDoesNotSayIt) {
  connect(false);
  EXPECT_THAT(fromClient_->taken(), ElementsAre("0a0c080110011a06766965776572"));
}

TEST_F(WireBytes, CommandsAndRepliesHaveTheirBytes) {
  connect(false);
  fromClient_->taken();
  fromService_->taken();
  radix::client::ObjectHandle reply;
  script_->onQuery = [](std::int64_t) { return true; };
  EXPECT_EQ(radix::client::PerformCommand(manager_, radix::kCommandClearConfiguration, {}, reply).status, 0);
  EXPECT_EQ(radix::client::PerformCommand(manager_, radix::kCommandQueryMetric,
                                          {{radix::kKeyMetricID, std::int64_t{0x3C4E04}}}, reply)
                .status,
            0);
  EXPECT_NE(radix::client::PerformCommand(manager_, "kNone", {}, reply).status, 0);
  EXPECT_THAT(
      fromClient_->taken(),
      ElementsAre(
          "12200801121a6b436f6d6d616e64436c656172436f6e66696775726174696f6e1a00",
          "1230080212136b436f6d6d616e6451756572794d65747269631a170a150a0c6b4b65794d65747269634944100318849cf101",
          "120b080312056b4e6f6e651a00"));
  EXPECT_THAT(
      fromService_->taken(),
      ElementsAre("1a08080110001a002200", "1a20080210001a0022180a160a076d657472696373100a22090a07100318849cf101",
                  "1a28080310011a2074686520636f6d6d616e6420276b4e6f6e6527206973206e6f74206b6e6f776e2200"));
}

TEST_F(WireBytes, EventsAndTheirSwitchHaveTheirBytes) {
  connect(true);
  radix::client::EventsOn(manager_);
  loop_.run();
  fromService_->taken();
  script_->sink->emit({.metricId = 0x3C4E04,
                       .payload = {0x08, 0x01, 0x10, 0x03},
                       .time = milliseconds(1709640000123),
                       .origin = {},
                       .period = milliseconds(1500),
                       .age = milliseconds(300)});
  loop_.advance(milliseconds(1));
  script_->sink->emit({.metricId = -2, .payload = {}, .time = milliseconds(-1), .origin = "other"});
  loop_.advance(milliseconds(1));
  radix::client::EventsOff(manager_);
  loop_.run();
  EXPECT_THAT(fromService_->taken(),
              ElementsAre("2a21080010849cf1011a040801100328fbc4f0f3e0313208736372697074656458dc0b48ac02",
                          "2a23080010feffffffffffffffff011a0028ffffffffffffffffff0132056f7468657258004800"));
  const Lines said = fromClient_->taken();
  ASSERT_EQ(said.size(), 3U);
  EXPECT_EQ(said[1], "22020801");
  EXPECT_EQ(said[2], "22020800");
}

TEST_F(WireBytes, AnEventOfManyBytesHasLengthsOfSeveral) {
  connect(true);
  radix::client::EventsOn(manager_);
  loop_.run();
  fromService_->taken();
  script_->emit(0x3C4E04, Bytes(20'000, 0xAB));
  loop_.advance(milliseconds(1));
  std::string payload;
  for (int number = 0; number < 20'000; ++number) payload += "ab";
  EXPECT_THAT(fromService_->taken(),
              ElementsAre("2ab99c01080010849cf1011aa09c01" + payload + "2800320873637269707465645800" + "4800"));
}

TEST_F(WireBytes, AnAccountOfLossesHasItsBytes) {
  // Room for the greeting and the sources and no more: of what comes then the service keeps two.
  Tap slow(reach(2));
  slow.say({0x0A, 0x0A, 0x08, 0x01, 0x10, 0x01, 0x1A, 0x02, 'm', 'e', 0x30, 0x01});
  slow.say({0x22, 0x02, 0x08, 0x01});
  loop_.run();
  slow.taken();
  slow.setReading(false);
  for (int number = 0; number < 2 + 2 + 300; ++number) {
    script_->emit(0x3C4E04, {});
    loop_.advance(milliseconds(1));
  }
  slow.setReading(true);
  loop_.advance(milliseconds(1));
  const Lines heard = slow.taken();
  ASSERT_GE(heard.size(), 3U);
  EXPECT_EQ(heard[2], "320308ac02");
}

TEST_F(WireBytes, ARefusalHasItsBytes) {
  Tap late(reach());
  late.say({0x0A, 0x04, 0x08, 0x09, 0x10, 0x05});
  loop_.run();
  EXPECT_THAT(late.taken(),
              ElementsAre("0a7e080110011a0672616469786420082a6e74686520636c69656e7420737065616b732076657273696f6e203920"
                          "6f66207468652070726f746f636f6c20616e64206e6565647320352c207468697320736572766963652073706561"
                          "6b73203120616e64206e6565647320313a20757064617465207468652073657276696365"));
}

TEST_F(WireBytes, WhoeverIsAskedWhetherHeIsThereAnswersWithTheseBytes) {
  connect(false);
  fromClient_->taken();
  fromService_->taken();
  fromClient_->handOnTo(*fromClient_);
  fromService_->handOnTo(*fromService_);
  fromClient_->say({0x3A, 0x05, 0x08, 0xAC, 0x02, 0x10, 0x00});
  loop_.run();
  EXPECT_THAT(fromClient_->taken(), ElementsAre("3a0508ac021001"));
  fromService_->say({0x3A, 0x05, 0x08, 0xAC, 0x02, 0x10, 0x00});
  loop_.run();
  EXPECT_THAT(fromService_->taken(), ElementsAre("3a0508ac021001"));
}

TEST_F(WireBytes, WhatFeedsTheServiceHasItsBytes) {
  connect(false);
  fromService_->taken();
  script_->sink->conditionChanged({.phase = SourceCondition::Phase::Failed, .reason = "gone"});
  loop_.run();
  EXPECT_THAT(fromService_->taken(),
              ElementsAre("42220a200a08736372697074656410021a04676f6e65220508849cf101220508a59cf101"));
}

}  // namespace
}  // namespace probeview
