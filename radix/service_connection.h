// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/worker.h"
#include "radix/arrived_event.h"
#include "radix/client.h"
#include "radix/frames.h"
#include "radix/link.h"
#include "radix/status.h"

namespace radix::client {

inline constexpr std::chrono::nanoseconds commandDeadline = std::chrono::seconds(2);
inline constexpr std::chrono::nanoseconds firstReconnectDelay = std::chrono::milliseconds(100);
inline constexpr std::chrono::nanoseconds longestReconnectDelay = std::chrono::seconds(1);
// How soon a service that takes no more connections at this moment is tried again while a command waits.
inline constexpr std::chrono::nanoseconds busyRetryDelay = std::chrono::milliseconds(10);
// Answers that the service leaves unread before this side leaves it.
inline constexpr std::size_t mostAnswersUnread = 64;
// Bytes of events that are handed on together at most; a batch may have one event more.
inline constexpr std::size_t largestBatch = 1024 * 1024;
// Commands that wait for their replies at once; more than any caller has threads.
inline constexpr std::size_t mostCommandsAtOnce = 256;
// Configurations that are kept for the next connection although no service has judged them; of more the last ones.
inline constexpr std::size_t mostUnjudgedConfigurations = 4;

// What a connection may read now.
enum class Appetite {
  Everything,
  Replies,  // events only while a command waits: its reply stands behind them
  Nothing
};

// One command on its way. The worker fills in the result and then opens the gate.
struct PendingCommand {
  std::string name;
  std::vector<std::uint8_t> arguments;
  std::chrono::nanoseconds deadline{};  // on the worker's clock
  std::shared_ptr<probeview::Gate> done;

  Result result;
  std::vector<std::uint8_t> reply;
};

// The connection of one manager: finds the service, keeps what is to be restored, matches replies with commands. A
// state machine on one worker, where everything of it is called; it waits for nothing.
class ServiceConnection final : public std::enable_shared_from_this<ServiceConnection>, LinkListener, FrameHandler {
 public:
  struct Events {
    // The events of one batch, in order.
    std::function<void(std::vector<ArrivedEvent>)> events;
    // Something of it has changed.
    std::function<void(const ConnectionState&)> state;
    // Something that concerns no command that waits, in one line for the log.
    std::function<void(const std::string&)> notice{};
  };

  struct Identity {
    std::string clientName;
    bool observes = false;
    ProtocolVersions versions{};
  };

  ServiceConnection(probeview::Worker& worker, std::unique_ptr<Connector> connector, Identity identity, Events events);
  ~ServiceConnection() override;

  // Looks for the service, now and for as long as this lives.
  void start();
  // Sends the command as soon as there is a service. Fails it when there is none, when the connection ends before the
  // reply and at its deadline.
  void perform(std::shared_ptr<PendingCommand> command);
  // The configuration that was to be pushed is refused without asking a service. What was pushed before stays.
  void refuseConfiguration(const std::string& reason);
  // Whether events are to be delivered, on this connection and on those after it.
  void setDelivery(bool on);
  void setAppetite(Appetite appetite);

 private:
  enum class Phase { Idle, Greeting, Ready };
  // Who ended a command: the service with its reply, or nobody, as it did not come to that.
  enum class Judge { Nobody, Service };
  struct Waiting {
    std::shared_ptr<PendingCommand> command;
    probeview::ScheduledTaskHandle deadline;
    std::uint32_t sequence = 0;  // 0: not sent yet
  };

  struct PushedConfiguration {
    std::vector<std::uint8_t> arguments;
    std::uint32_t sequence = 0;  // under which it waits for its reply on this connection; 0: it does not
    bool isAccepted = false;
  };

  void onFrame(std::span<const std::uint8_t> frame) override;
  void onOverlongFrame(std::size_t size) override;
  void onBatchEnd() override;
  void onWritable() override;
  void onClosed() override;
  void onHello(const Hello& hello) override;
  void onReply(const Reply& reply) override;
  void onEvent(const Event& event, std::optional<std::chrono::milliseconds> age) override;
  void onDropped(const Dropped& dropped) override;
  void onPing(const Ping& ping) override;
  void onSources(const Sources& sources) override;

  void attempt();
  void scheduleAttempt(std::chrono::nanoseconds delay);
  // Ends the link, fails what waits for it and tries again later.
  void lose(Status status, const std::string& reason);
  void failAll(Status status, const std::string& reason);
  void finish(Waiting waiting, Status status, std::string message, Judge judge = Judge::Nobody);
  void restore();
  // The service has taken the configuration that was pushed under the sequence number, and goes by no earlier one.
  void acceptConfiguration(std::uint32_t sequence, std::vector<std::uint8_t> arguments);
  void judgeRestored(const Reply& reply);
  void setConfigurationOutcome(ConfigurationOutcome outcome, std::string_view trouble = {});
  std::uint32_t nextSequence();
  void sendWaiting();
  void send(FrameBytes frame);
  void flush();
  void updateReading();
  void publish();

  probeview::Worker& worker_;
  std::unique_ptr<Connector> connector_;
  Identity identity_;
  Events events_;

  Phase phase_ = Phase::Idle;
  std::unique_ptr<Link> link_;
  std::deque<FrameBytes> outgoing_;
  bool blocked_ = false;
  probeview::ScheduledTaskHandle nextAttempt_;
  probeview::ScheduledTaskHandle greetingDeadline_;
  std::chrono::nanoseconds reconnectDelay_ = firstReconnectDelay;

  // In the order in which they were asked for.
  std::deque<Waiting> waiting_;
  std::uint32_t lastSequence_ = 0;

  // What is restored on a new connection: the configuration that a service has accepted last, and behind it those
  // pushed since then of which none has said whether it takes them. Should it refuse those, it still goes by the first.
  std::deque<PushedConfiguration> configurations_;
  bool delivery_ = false;

  std::vector<ArrivedEvent> batch_;
  std::size_t batchBytes_ = 0;
  Appetite appetite_ = Appetite::Everything;
  ConnectionState state_;
};

}  // namespace radix::client
