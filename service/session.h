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
#include <unordered_map>
#include <vector>

#include "platform/worker.h"
#include "radix/frames.h"
#include "radix/link.h"
#include "radix/status.h"
#include "service/configuration.h"
#include "service/last_records.h"
#include "service/log.h"
#include "service/outbox.h"
#include "service/rate_meter.h"

namespace probeview {

// Who is at the other end of a connection, as far as the transport can tell.
struct Peer {
  pid_t process = 0;
  uid_t user = 0;
  // Why it may not connect; it is told so and let go.
  std::optional<std::string> refusal{};
  // The service's own user or root, for whom room is kept beside that of the others.
  bool isOwn = false;
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
    // What feeds the service, as one frame; a client is told once it has been greeted.
    virtual radix::FrameBytes sources() = 0;
    // One more that did not greet: how many there were so far, this one included.
    virtual std::uint64_t countSilent() = 0;
  };

  struct Settings {
    std::string serviceName;
    radix::ProtocolVersions versions{};
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
  // Whether it wants records without asking for them by a configuration.
  bool observes() const { return observes_; }
  // Whether it takes events now.
  bool takesEvents() const { return isActive() && delivery_; }
  // Whether it takes them as they come, so that sources must not sleep; answers to its queries it takes in any case.
  bool isListening() const { return takesEvents() && (observes_ || configuration_.has_value()); }
  // Whether it would take records of this metric as they come.
  bool wants(std::int64_t metricId) const;

  // What it has pushed.
  const std::optional<Configuration>& configuration() const { return configuration_; }
  void setConfiguration(std::optional<Configuration> configuration);
  // It has asked the source for the metric: it is owed one more record of it, whatever its configuration says. A source
  // that takes the question may answer on a later turn, but not for ever.
  void expectAnswer(std::size_t source, std::int64_t metricId);
  // The source has not taken the question.
  void forgetAnswer(std::size_t source, std::int64_t metricId);

  // Takes a record that flows, if it is one for this client. It leaves soon, together with others.
  void offer(std::size_t source, const LastRecords::Record& record, std::uint64_t number, std::chrono::nanoseconds now);
  // Takes those of the kept records that are for this client and were not sent to it: each record is sent once at most.
  void offerKept(const LastRecords& records);
  // What feeds the service has changed.
  void tellSources(radix::FrameBytes frame);

 private:
  enum class Phase { Greeting, Active, Refused, Ended };

  void onFrame(std::span<const std::uint8_t> frame) override;
  void onOverlongFrame(std::size_t size) override;
  void onBatchEnd() override {}
  void onWritable() override;
  void onClosed() override;
  void onHello(const radix::Hello& hello) override;
  void onCommand(const radix::Command& command) override;
  void onDelivery(const radix::Delivery& delivery) override;
  void onPing(const radix::Ping& ping) override;

  // An answer to a query that has been asked.
  struct AwaitedAnswer {
    std::size_t source = 0;
    std::int64_t metricId = 0;
    std::chrono::nanoseconds until{};
    // The record that came while the client took no events; 0: none so far.
    std::uint64_t number = 0;
  };
  // Whether the record answers a query; that question is settled then.
  bool settlesQuery(std::size_t source, std::int64_t metricId, std::uint64_t number, std::chrono::nanoseconds now);
  bool settlesQueryLate(std::int64_t metricId, std::uint64_t number);
  void send(const LastRecords::Record& record, std::uint64_t number, bool isAnswer, std::chrono::nanoseconds now);
  // Takes back what has not left yet and is not wanted any more.
  void discardUnwanted();

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

  bool observes_ = false;
  bool delivery_ = false;
  std::optional<Configuration> configuration_;
  std::set<std::int64_t> configured_;  // all metrics that the configuration names, its triggers' included
  std::vector<AwaitedAnswer> awaited_;
  // The number of the last record of each kept metric that was sent.
  std::unordered_map<std::int64_t, std::uint64_t> sent_;

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
