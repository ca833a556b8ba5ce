// SPDX-License-Identifier: Apache-2.0
#include "radix/connection_manager.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <deque>
#include <map>
#include <memory>
#include <utility>

#include "platform/guarded.h"
#include "platform/system_log.h"
#include "radix/dictionary_bytes.h"
#include "radix/object.h"
#include "radix/service_commands.h"
#include "radix/waiting_events.h"

namespace radix::client {

namespace {

using probeview::Dictionary;
using probeview::Task;
using probeview::TaskQueue;
using probeview::Value;
using probeview::Worker;

// Whoever reads a file to send it may have stopped behind the limit.
std::string sizeText(std::size_t size) {
  return (size > longestFrame ? "more than " : "") + std::to_string(std::min(size, longestFrame));
}

using Handlers = std::map<std::string, EventHandler, std::less<>>;

// The way of the events from the connection to the handlers. Shared with the tasks on the handlers' queue, which may
// run after the manager has gone, or never. It does not own that queue: a queue whose tasks own it would never go.
class EventRoad : public std::enable_shared_from_this<EventRoad> {
 public:
  explicit EventRoad(Worker& worker) : waiting_(std::make_shared<WaitingEvents>(worker)), clock_(worker.clock()) {}

  // Callers register one after the other; nobody registers for the same manager from two threads at once.
  void setHandler(std::string_view event, EventHandler handler) {
    const std::shared_ptr<const Handlers> handlers = handlers_.get();
    auto changed = handlers ? std::make_shared<Handlers>(*handlers) : std::make_shared<Handlers>();
    (*changed)[std::string(event)] = std::move(handler);
    handlers_.set(std::move(changed));
  }

  // Once this has returned from switching off, no event begins to be handed over. What the service sent before it knew
  // of that is kept for the next switching on: it is sent once only, and switching off and on again loses nothing.
  void setOn(bool on, TaskQueue& queue) {
    on_ = on;
    if (on && waiting_->any()) queue.post([self = shared_from_this()] { self->handOver(); });
  }
  // The handlers go, too: they may own what owns the queue.
  void close() {
    closed_ = true;
    waiting_->close();
    handlers_.set(nullptr);
  }

  // On the worker.
  void deliver(TaskQueue& queue, std::vector<ArrivedEvent> events,
               const std::shared_ptr<ServiceConnection>& connection) {
    std::shared_ptr<const void> hold = waiting_->add(events, connection);
    queue.post(
        [self = shared_from_this(), batch = Batch{std::move(events), std::move(hold), clock_.ageTime()}]() mutable {
          self->batches_.push_back(std::move(batch));
          self->handOver();
        });
  }

 private:
  // Events that came together, and those of them that have been handed over.
  struct Batch {
    std::vector<ArrivedEvent> events;
    std::shared_ptr<const void> hold;
    std::chrono::nanoseconds arrived{};  // by Clock::ageTime()
    std::size_t handedOver = 0;
  };

  // On the handlers' queue.
  void handOver() {
    // A handler that lets the queue run gets what is left when it is through: one event at a time.
    if (std::exchange(handsOver_, true)) return;
    handOverWhileOn();
    handsOver_ = false;
  }

  void handOverWhileOn() {
    while (!batches_.empty()) {
      Batch& batch = batches_.front();
      while (batch.handedOver < batch.events.size() && !closed_) {
        if (!on_) return;
        hand(batch.events[batch.handedOver++], batch);
      }
      batches_.pop_front();
    }
  }

  void hand(ArrivedEvent& event, const Batch& batch) const {
    // Asked for each event: the handler before it may have registered another one.
    const std::shared_ptr<const Handlers> handlers = handlers_.get();
    if (!handlers) return;
    const auto found = handlers->find(event.kind == EventKind::Trigger ? kEventTrigger : kEventMetric);
    if (found == handlers->end() || !found->second) return;
    const Group group = event.group;
    found->second(objectOf(std::move(event), clock_.ageTime() - batch.arrived, batch.hold), group);
  }

  std::shared_ptr<WaitingEvents> waiting_;
  const probeview::Clock& clock_;
  probeview::Guarded<std::shared_ptr<const Handlers>> handlers_;
  std::atomic<bool> on_ = false;
  std::atomic<bool> closed_ = false;
  // On the handlers' queue.
  std::deque<Batch> batches_;
  bool handsOver_ = false;
};

class ConnectionManager final : public Manager {
 public:
  ConnectionManager(Worker& worker, std::unique_ptr<Connector> connector, ServiceConnection::Identity identity,
                    std::shared_ptr<TaskQueue> queue)
      : worker_(worker),
        queue_(std::move(queue)),
        road_(std::make_shared<EventRoad>(worker)),
        state_(std::make_shared<probeview::Guarded<ConnectionState>>()) {
    ConnectionState initial;
    initial.since = worker.clock().wallTime();
    state_->set(initial);
    auto holder = std::make_shared<std::weak_ptr<ServiceConnection>>();
    connection_ = std::make_shared<ServiceConnection>(
        worker, std::move(connector), std::move(identity),
        ServiceConnection::Events{.events =
                                      [road = road_, handlersQueue = queue_, holder](std::vector<ArrivedEvent> events) {
                                        const auto here = holder->lock();
                                        if (here) road->deliver(*handlersQueue, std::move(events), here);
                                      },
                                  .state = [state = state_](const ConnectionState& now) { state->set(now); },
                                  .notice = [](const std::string& text) { probeview::systemLog().line(text); }});
    *holder = connection_;
    worker_.post([connection = connection_] { connection->start(); });
  }

  ~ConnectionManager() override {
    road_->close();
    // The connection goes where it lived.
    worker_.post([connection = std::move(connection_)]() mutable { connection.reset(); });
  }

  Result performCommand(std::string_view command, const Dictionary& arguments, ObjectHandle& reply) override {
    auto pending = std::make_shared<PendingCommand>();
    pending->name = command;
    pending->arguments = encodeDictionary(arguments);
    const std::size_t size = encode(Command(UINT32_MAX, pending->name, pending->arguments))->size();
    if (size > longestFrame) {
      const Value* payload = arguments.find(kKeyPayload);
      const std::size_t given = payload != nullptr && payload->bytes() ? payload->bytes()->size() : size;
      std::string reason =
          (command == kCommandAddConfiguration || command == kCommandSetBaseConfiguration ? "the configuration has "
                                                                                          : "the command has ") +
          sizeText(given) + " bytes; at most " + std::to_string(longestFrame - (size - given)) + " fit into one frame";
      if (command == kCommandAddConfiguration) {
        worker_.post([connection = connection_, reason] { connection->refuseConfiguration(reason); });
      }
      return {static_cast<std::int32_t>(Status::TooLarge), std::move(reason)};
    }
    pending->deadline = worker_.clock().monotonicTime() + commandDeadline;
    pending->done = worker_.makeGate();
    worker_.post([connection = connection_, pending] { connection->perform(pending); });
    if (!pending->done->wait(commandDeadline + lateness)) {
      return {static_cast<std::int32_t>(Status::TimedOut), "the baseband service did not answer in time"};
    }
    if (auto content = decodeDictionary(pending->reply)) reply = makeObject(*content);
    return pending->result;
  }

  void registerEventHandler(std::string_view event, EventHandler handler) override {
    road_->setHandler(event, std::move(handler));
  }

  void eventsOn() override {
    road_->setOn(true, *queue_);
    worker_.post([connection = connection_] { connection->setDelivery(true); });
  }

  void eventsOff() override {
    // Nothing is handed over from here on, whatever is still on its way.
    road_->setOn(false, *queue_);
    worker_.post([connection = connection_] { connection->setDelivery(false); });
  }

  ConnectionState connection() const override { return state_->get(); }

 private:
  // The worker itself ends the command at its deadline and says why; this only stands behind it.
  static constexpr std::chrono::nanoseconds lateness = std::chrono::milliseconds(100);

  Worker& worker_;
  std::shared_ptr<TaskQueue> queue_;
  std::shared_ptr<EventRoad> road_;
  std::shared_ptr<probeview::Guarded<ConnectionState>> state_;
  std::shared_ptr<ServiceConnection> connection_;
};

}  // namespace

std::shared_ptr<Manager> makeConnectionManager(Worker& worker, std::unique_ptr<Connector> connector,
                                               ServiceConnection::Identity identity, std::shared_ptr<TaskQueue> queue) {
  return std::make_shared<ConnectionManager>(worker, std::move(connector), std::move(identity), std::move(queue));
}

}  // namespace radix::client
