// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <set>
#include <string>

#include "platform/worker.h"
#include "radix/frames.h"
#include "radix/link.h"
#include "radix/status.h"
#include "service/configuration.h"
#include "service/log.h"
#include "service/outbox.h"
#include "service/rate_meter.h"

namespace probeview {

// Who is at the other end of a connection, as far as the transport can tell.
struct Peer {
  pid_t process = 0;
  uid_t user = 0;
  // Why it may not connect; it is told so and let go.
  std::optional<std::string> refusal;
};

// The conversation with one client: greets it, hands its commands to the service, sends it what it wants.
class Session final : radix::LinkListener, radix::FrameHandler {
 public:
  // What the service does for its sessions.
  class Host {
   public:
    virtual ~Host() = default;
    // Why the client may not stay although it may connect; empty if it may. Asked once it has said its name.
    virtual std::optional<std::string> refusal(const Session& session) = 0;
    // Answers a command; the sequence number is filled in by the session.
    virtual radix::Reply perform(Session& session, const radix::Command& command) = 0;
    virtual void deliveryChanged(Session& session, bool switchedOn) = 0;
    // The session is over: to be destroyed, but not from inside this call.
    virtual void ended(Session& session) = 0;
    // One more that did not greet: how many there were so far, this one included.
    virtual std::uint64_t countSilent() = 0;
  };

  struct Settings {
    std::string serviceName;
    std::uint32_t version = radix::protocolVersion;
    std::uint32_t oldestVersion = radix::oldestProtocolVersion;
    std::chrono::milliseconds greetingTime{};
    std::chrono::milliseconds leavingTime{};
    Outbox::Limits outbox{};
  };

  Session(std::uint64_t number, Worker& worker, ServiceLog& log, Host& host, const Settings& settings,
          std::unique_ptr<radix::Link> link, Peer peer);
  ~Session() override;

  void start();

  std::uint64_t number() const { return number_; }
  const std::string& clientName() const { return clientName_; }
  const Peer& peer() const { return peer_; }
  const Outbox& outbox() const { return outbox_; }
  std::chrono::milliseconds connectedSince() const { return connectedSince_; }
  double recordsPerSecond() const;
  // Whether it has greeted and was welcome.
  bool isActive() const { return phase_ == Phase::Active; }
  bool hasEnded() const { return phase_ == Phase::Ended; }
  // Whether it takes records now.
  bool isListening() const { return isActive() && delivery_; }
  // Whether it would take records of this metric.
  bool wants(std::int64_t metricId) const;

  // What it has pushed.
  const std::optional<Configuration>& configuration() const { return configuration_; }
  void setConfiguration(std::optional<Configuration> configuration);
  // It has asked for the metric: it wants the answer whatever its configuration says.
  void expectMetric(std::int64_t metricId) { asked_.insert(metricId); }
  // Whether the last records are due to it now: at its first listening with each configuration. Asking settles it.
  bool takeLastRecordsDue();

  // Queues the record; it leaves soon, together with others.
  void send(std::int64_t metricId, const radix::FrameBytes& frame, std::chrono::nanoseconds now);

 private:
  enum class Phase { Greeting, Active, Refused, Ended };

  void onFrame(std::span<const std::uint8_t> frame) override;
  void onOverlongFrame(std::size_t size) override;
  void onBatchEnd() override {}
  void onWritable() override;
  void onClosed() override;
  void onHello(radix::Hello hello) override;
  void onCommand(radix::Command command) override;
  void onDelivery(radix::Delivery delivery) override;
  void onPing(radix::Ping ping) override;

  void say(radix::FrameBytes frame);
  // Tells the client why and ends the conversation.
  void refuse(radix::Status status, const std::string& reason);
  void end();
  // At the end of this turn of the loop; records that follow others closely wait a little for company.
  void flushWords();
  void flushRecords(std::chrono::nanoseconds now);
  void flush();
  std::string description() const;

  const std::uint64_t number_;
  Worker& worker_;
  ServiceLog& log_;
  Host& host_;
  const Settings& settings_;
  std::unique_ptr<radix::Link> link_;
  Peer peer_;
  std::string clientName_;
  std::chrono::milliseconds connectedSince_;
  std::chrono::nanoseconds started_;
  Phase phase_ = Phase::Greeting;
  ScheduledTaskHandle deadline_;

  bool delivery_ = false;
  bool lastRecordsGiven_ = false;
  std::optional<Configuration> configuration_;
  std::set<std::int64_t> configured_;  // all metrics that the configuration names, its triggers' included
  std::set<std::int64_t> asked_;

  Outbox outbox_;
  RateMeter rate_;
  bool blocked_ = false;
  bool flushPosted_ = false;
  ScheduledTaskHandle flushTimer_;
  std::chrono::nanoseconds lastFlush_{};
  bool reading_ = true;
  // Seen by posted tasks, which may run after the session has gone.
  std::shared_ptr<bool> alive_;
};

}  // namespace probeview
