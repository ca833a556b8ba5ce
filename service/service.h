// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/worker.h"
#include "radix/frames.h"
#include "radix/link.h"
#include "service/configuration.h"
#include "service/last_records.h"
#include "service/log.h"
#include "service/session.h"
#include "service/source_slot.h"
#include "source/metric_source.h"

namespace probeview {

// The baseband manager service without its socket: sources on one side, sessions on the other, between them the
// configurations and the last record of each metric. Lives on one worker, where everything of it is called, and does
// nothing while nothing happens.
class Service final : Session::Host {
 public:
  struct Settings {
    std::string name = "radixd " PROBEVIEW_VERSION;
    radix::ProtocolVersions versions{};
    // Clients that are served at once; those past it are told so. Of connections there may be twice as many.
    std::size_t mostClients = 128;
    // Beside both, so many of the service's own user and root: others cannot keep them out.
    std::size_t keptForOwn = 16;
    // How long a client may take to greet, and to go away after it was refused.
    std::chrono::milliseconds greetingTime{5000};
    std::chrono::milliseconds leavingTime{1000};
    Outbox::Limits outbox{};
  };

  Service(Worker& worker, ServiceLog log, Settings settings);
  ~Service() override;
  Service(const Service&) = delete;
  Service& operator=(const Service&) = delete;

  // Starts the source.
  void addSource(std::unique_ptr<MetricSource> source);
  // Begins a conversation over the link.
  void accept(std::unique_ptr<radix::Link> link, Peer peer);

  std::size_t clientCount() const;
  ServiceLog& log() { return log_; }

 private:
  friend class StatusReport;

  // How many more than usual there may be for this one.
  std::size_t reserve(const Peer& peer) const { return peer.isOwn ? settings_.keptForOwn : 0; }
  std::optional<std::string> refusal(const Session& session) override;
  radix::Reply perform(Session& session, const radix::Command& command) override;
  void deliveryChanged(Session& session, bool switchedOn) override;
  void ended(Session& session) override;
  std::uint64_t countSilent() override { return ++silentClients_; }
  radix::FrameBytes sources() override;

  radix::Reply addConfiguration(Session& session, const Dictionary& arguments);
  radix::Reply clearConfiguration(Session& session);
  radix::Reply setBaseConfiguration(const Dictionary& arguments);
  radix::Reply clearBaseConfiguration();
  radix::Reply queryMetric(Session& session, const Dictionary& arguments);
  radix::Reply showStatus() const;
  // Whether it is a metric's, by its name or because a source can fill it.
  bool isMetric(std::int64_t identifier) const;
  // Empty when no configuration that counts for the session says what the trigger stands for.
  std::vector<std::int64_t> metricsOfTrigger(const Session& session, std::int64_t trigger) const;

  // Takes a record of a source, known by its place in the row, to all who want it.
  void route(std::size_t source, MetricRecord record, std::chrono::nanoseconds now);
  // Tells all clients what feeds the service.
  void sourcesChanged();
  // A session listens from now on, or no more, or for something else.
  void wishesChanged(Session& session);
  // Tells the sources what has changed for them.
  void updatePlan();
  void updateListening();
  void removeEnded();

  Worker& worker_;
  ServiceLog log_;
  Settings settings_;
  Session::Settings sessionSettings_;
  std::chrono::nanoseconds started_;
  std::vector<std::unique_ptr<SourceSlot>> sources_;
  std::vector<std::unique_ptr<Session>> sessions_;
  std::uint64_t sessionsAccepted_ = 0;
  std::uint64_t closedAtOnce_ = 0;
  std::uint64_t silentClients_ = 0;
  LastRecords lastRecords_;
  std::optional<Configuration> baseConfiguration_;
  std::optional<MetricPlan> plan_;
  bool listening_ = false;
  bool removalPosted_ = false;
  std::shared_ptr<bool> alive_;
};

}  // namespace probeview
