// SPDX-License-Identifier: Apache-2.0
//
// What may go wrong around the service, on a clock that the test owns.
#include <gtest/gtest.h>

#include <memory>

#include "messages/metric_identifiers.h"
#include "platform/manual_loop.h"
#include "radix/connection_manager.h"
#include "radix/in_process_link.h"
#include "radix/service_commands.h"
#include "service/service.h"
#include "tests/service/harness/scripted_source.h"

namespace probeview {
namespace {

using std::chrono::hours;
using std::chrono::milliseconds;
using std::chrono::seconds;

class Faults : public ::testing::Test, protected radix::Connector {
 protected:
  Faults() : service_(loop_, ServiceLog(log_, LogLevel::Info), {}) {
    script_->metrics = {K_LTE_RRC_STATE};
    service_.addSource(std::make_unique<ScriptedSource>(script_));
    manager_ = radix::client::makeConnectionManager(loop_, std::make_unique<Forward>(*this), {.clientName = "client"},
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

}  // namespace
}  // namespace probeview
