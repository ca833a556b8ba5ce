// SPDX-License-Identifier: Apache-2.0
#include "radix/service_connection.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "radix/source_states.h"
#include "values/plain_text.h"

namespace radix::client {

namespace {

// Of what a service says, as much is kept as anybody reads.
constexpr std::size_t longestTrouble = 1000;

// What nobody waits for any more, in the form in which the results of commands stand in the log.
std::string refusedLate(const Reply& reply) {
  return "the baseband service refuses the configuration that was pushed: error=" + std::to_string(reply.status()) +
         " msg=" + probeview::onOneLine(probeview::beginningOf(reply.message(), longestTrouble));
}

}  // namespace

ServiceConnection::ServiceConnection(probeview::Worker& worker, std::unique_ptr<Connector> connector, Identity identity,
                                     Events events)
    : worker_(worker), connector_(std::move(connector)), identity_(std::move(identity)), events_(std::move(events)) {
  state_.since = worker_.clock().wallTime();
}

ServiceConnection::~ServiceConnection() { failAll(Status::NoService, "the manager was closed"); }

void ServiceConnection::start() { attempt(); }

void ServiceConnection::perform(std::shared_ptr<PendingCommand> command) {
  Waiting waiting{.command = std::move(command), .deadline = {}};
  if (waiting_.size() >= mostCommandsAtOnce) {
    finish(std::move(waiting), Status::TooMany,
           "more than " + std::to_string(mostCommandsAtOnce) + " commands wait for the baseband service");
    return;
  }
  const PendingCommand* key = waiting.command.get();
  waiting.deadline = worker_.after(waiting.command->deadline - worker_.clock().monotonicTime(), [this, key] {
    const auto found =
        std::find_if(waiting_.begin(), waiting_.end(), [key](const Waiting& one) { return one.command.get() == key; });
    if (found == waiting_.end()) return;
    Waiting late = std::move(*found);
    waiting_.erase(found);
    const bool wasSent = late.sequence != 0;
    finish(std::move(late), Status::TimedOut,
           wasSent || state_.trouble.empty() ? "the baseband service did not answer in time" : state_.trouble);
    updateReading();
  });
  waiting_.push_back(std::move(waiting));
  updateReading();
  switch (phase_) {
    case Phase::Ready:
      sendWaiting();
      break;
    case Phase::Greeting:
      break;
    case Phase::Idle:
      // Whoever asks now may have just started the service: no waiting for the next attempt in the row.
      attempt();
      break;
  }
}

void ServiceConnection::setDelivery(bool on) {
  // Also when it is on already: an older service gives the last records of a configuration that was pushed in the
  // meantime only when events are switched on.
  delivery_ = on;
  if (phase_ == Phase::Ready) send(encode(Delivery(on)));
}

void ServiceConnection::setAppetite(Appetite appetite) {
  if (appetite_ == appetite) return;
  appetite_ = appetite;
  updateReading();
}

void ServiceConnection::attempt() {
  nextAttempt_.reset();
  ConnectResult result = connector_->connect();
  if (!result.link) {
    state_.trouble = std::move(result.error);
    // First: whose command fails may ask at once why.
    publish();
    if (result.busy) {
      scheduleAttempt(waiting_.empty() ? reconnectDelay_ : busyRetryDelay);
    } else {
      failAll(Status::NoService, state_.trouble);
      scheduleAttempt(reconnectDelay_);
      reconnectDelay_ = std::min(reconnectDelay_ * 2, longestReconnectDelay);
    }
    return;
  }
  phase_ = Phase::Greeting;
  link_ = std::move(result.link);
  link_->start(*this);
  updateReading();
  greetingDeadline_ = worker_.after(commandDeadline, [this] {
    lose(Status::TimedOut, "the baseband service accepted the connection and then did not greet");
  });
  Hello hello(identity_.clientName, identity_.versions);
  if (identity_.observes) hello.setObserves(true);
  send(encode(hello));
}

void ServiceConnection::scheduleAttempt(std::chrono::nanoseconds delay) {
  nextAttempt_ = worker_.after(delay, [this] { attempt(); });
}

void ServiceConnection::lose(Status status, const std::string& reason) {
  greetingDeadline_.reset();
  link_.reset();
  outgoing_.clear();
  blocked_ = false;
  phase_ = Phase::Idle;
  if (state_.connected) {
    state_.connected = false;
    state_.since = worker_.clock().wallTime();
  }
  state_.sources.reset();
  state_.areSourcesCut = false;
  state_.trouble = reason;
  // Events that came with the last batch were received in full.
  onBatchEnd();
  failAll(status, reason);
  // The next service counts from anew what it answers.
  for (PushedConfiguration& one : configurations_) one.sequence = 0;
  scheduleAttempt(reconnectDelay_);
  reconnectDelay_ = std::min(reconnectDelay_ * 2, longestReconnectDelay);
  publish();
}

void ServiceConnection::failAll(Status status, const std::string& reason) {
  std::deque<Waiting> failed = std::move(waiting_);
  waiting_.clear();
  for (Waiting& one : failed) finish(std::move(one), status, reason);
}

void ServiceConnection::finish(Waiting waiting, Status status, std::string message, Judge judge) {
  PendingCommand& command = *waiting.command;
  command.result = {static_cast<std::int32_t>(status), std::move(message)};
  if (command.name == kCommandAddConfiguration) {
    if (judge == Judge::Nobody) {
      // What the service never judged is still wanted: it is asked again on the next connection.
      configurations_.push_back({command.arguments, waiting.sequence});
      const std::size_t accepted = configurations_.front().isAccepted ? 1 : 0;
      if (configurations_.size() - accepted > mostUnjudgedConfigurations) {
        configurations_.erase(configurations_.begin() + static_cast<std::ptrdiff_t>(accepted));
      }
    } else if (status == Status::Ok) {
      acceptConfiguration(waiting.sequence, command.arguments);
    }
    setConfigurationOutcome(judge == Judge::Nobody ? ConfigurationOutcome::Unsent
                            : status == Status::Ok ? ConfigurationOutcome::Accepted
                                                   : ConfigurationOutcome::Refused,
                            command.result.message);
  } else if (command.name == kCommandClearConfiguration) {
    // Wanted or not by the service: who clears a configuration does not want it back on the next connection.
    configurations_.clear();
    setConfigurationOutcome(ConfigurationOutcome::NotPushed);
  }
  // Last: whoever waits for it may ask at once what has become of it.
  command.done->open();
}

void ServiceConnection::refuseConfiguration(const std::string& reason) {
  setConfigurationOutcome(ConfigurationOutcome::Refused, reason);
}

void ServiceConnection::setConfigurationOutcome(ConfigurationOutcome outcome, std::string_view trouble) {
  state_.configuration = outcome;
  const bool isTrouble = outcome == ConfigurationOutcome::Refused || outcome == ConfigurationOutcome::Unsent;
  state_.configurationTrouble = isTrouble ? probeview::beginningOf(trouble, longestTrouble) : std::string_view();
  publish();
}

void ServiceConnection::restore() {
  for (PushedConfiguration& one : configurations_) {
    one.sequence = nextSequence();
    send(encode(Command(one.sequence, kCommandAddConfiguration, one.arguments)));
  }
  if (delivery_) send(encode(Delivery(true)));
}

void ServiceConnection::acceptConfiguration(std::uint32_t sequence, std::vector<std::uint8_t> arguments) {
  std::erase_if(configurations_,
                [sequence](const PushedConfiguration& one) { return one.isAccepted || one.sequence <= sequence; });
  configurations_.push_front({.arguments = std::move(arguments), .sequence = 0, .isAccepted = true});
}

void ServiceConnection::judgeRestored(const Reply& reply) {
  const auto found = std::find_if(
      configurations_.begin(), configurations_.end(),
      [&reply](const PushedConfiguration& one) { return one.sequence != 0 && one.sequence == reply.sequence(); });
  if (found == configurations_.end()) return;
  const bool isOk = static_cast<Status>(reply.status()) == Status::Ok;
  // Of those before it nobody wants to know any more.
  const bool isLast = std::next(found) == configurations_.end();
  if (isOk) {
    acceptConfiguration(reply.sequence(), std::move(found->arguments));
  } else {
    configurations_.erase(found);
    if (events_.notice) events_.notice(refusedLate(reply));
  }
  if (!isLast) return;
  setConfigurationOutcome(isOk ? ConfigurationOutcome::Accepted : ConfigurationOutcome::Refused, reply.message());
}

std::uint32_t ServiceConnection::nextSequence() {
  // 0 stands for a command that was not sent yet.
  if (++lastSequence_ == 0) ++lastSequence_;
  return lastSequence_;
}

void ServiceConnection::sendWaiting() {
  for (Waiting& one : waiting_) {
    if (one.sequence != 0) continue;
    one.sequence = nextSequence();
    send(encode(Command(one.sequence, one.command->name, one.command->arguments)));
  }
}

void ServiceConnection::send(FrameBytes frame) {
  outgoing_.push_back(std::move(frame));
  flush();
}

void ServiceConnection::flush() {
  while (!blocked_ && !outgoing_.empty() && link_) {
    if (link_->sendOne(outgoing_.front())) {
      outgoing_.pop_front();
    } else {
      blocked_ = true;
    }
  }
}

void ServiceConnection::updateReading() {
  if (!link_) return;
  link_->setReading(appetite_ == Appetite::Everything || (appetite_ == Appetite::Replies && !waiting_.empty()));
}

void ServiceConnection::publish() { events_.state(state_); }

void ServiceConnection::onFrame(std::span<const std::uint8_t> frame) {
  const auto self = shared_from_this();
  if (!decodeFrame(frame, *this)) lose(Status::MalformedFrame, "the baseband service sent what is no frame");
}

void ServiceConnection::onOverlongFrame(std::size_t size) {
  lose(Status::MalformedFrame, "the baseband service sent a frame of " + std::to_string(size) + " bytes, more than " +
                                   std::to_string(longestFrame));
}

void ServiceConnection::onBatchEnd() {
  if (batch_.empty()) return;
  std::vector<ArrivedEvent> batch;
  batch.swap(batch_);
  batchBytes_ = 0;
  events_.events(std::move(batch));
}

void ServiceConnection::onWritable() {
  blocked_ = false;
  flush();
}

void ServiceConnection::onClosed() {
  const auto self = shared_from_this();
  if (phase_ != Phase::Ready) {
    lose(Status::NoService, "the baseband service closed the connection");
  } else {
    lose(Status::NoService,
         waiting_.empty() ? "the baseband service went away" : "the baseband service went away before it answered");
  }
}

void ServiceConnection::onHello(const Hello& hello) {
  if (phase_ != Phase::Greeting) return;
  if (hello.refusalStatus() != 0) {
    lose(static_cast<Status>(hello.refusalStatus()), std::string(hello.refusal()));
    return;
  }
  if (const auto trouble = versionTrouble({"client", identity_.versions}, {"service", hello.versions()})) {
    lose(Status::VersionMismatch, "the baseband " + *trouble);
    return;
  }
  greetingDeadline_.reset();
  phase_ = Phase::Ready;
  reconnectDelay_ = firstReconnectDelay;
  state_.connected = true;
  state_.everConnected = true;
  state_.since = worker_.clock().wallTime();
  state_.serviceName = hello.name();
  state_.trouble.clear();
  publish();
  restore();
  sendWaiting();
}

void ServiceConnection::onReply(const Reply& reply) {
  const auto found = std::find_if(waiting_.begin(), waiting_.end(), [&reply](const Waiting& one) {
    return one.sequence != 0 && one.sequence == reply.sequence();
  });
  if (found == waiting_.end()) {
    // Nobody waits for it any more, or it answers what was restored.
    judgeRestored(reply);
    return;
  }
  Waiting answered = std::move(*found);
  waiting_.erase(found);
  answered.command->reply.assign(reply.content().begin(), reply.content().end());
  finish(std::move(answered), static_cast<Status>(reply.status()), std::string(reply.message()), Judge::Service);
  updateReading();
}

void ServiceConnection::onEvent(const Event& event, std::optional<std::chrono::milliseconds> age) {
  batch_.push_back(arrivedEvent(event, age));
  batchBytes_ += batch_.back().size();
  // So that whoever counts what waits may stop the reading before too much is there.
  if (batchBytes_ >= largestBatch) onBatchEnd();
}

void ServiceConnection::onDropped(const Dropped& dropped) {
  state_.lostEvents += dropped.count();
  publish();
}

void ServiceConnection::onSources(const Sources& sources) {
  if (phase_ != Phase::Ready) return;
  SourceStates told = statesOf(sources);
  state_.sources = std::move(told.states);
  state_.areSourcesCut = told.isCut;
  publish();
}

void ServiceConnection::onPing(const Ping& ping) {
  if (ping.isAnswer()) return;
  if (outgoing_.size() >= mostAnswersUnread) {
    lose(Status::MalformedFrame, "the baseband service asks without reading the answers");
    return;
  }
  send(encode(Ping(ping.number(), true)));
}

}  // namespace radix::client
