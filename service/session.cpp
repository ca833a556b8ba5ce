// SPDX-License-Identifier: Apache-2.0
#include "service/session.h"

#include <algorithm>
#include <array>
#include <iterator>
#include <utility>

#include "values/plain_text.h"

namespace probeview {

namespace {

using radix::Status;

constexpr std::size_t longestClientName = 64;
// Frames that leave together; a queue that has grown this long does not wait for the end of the turn.
constexpr std::size_t framesPerFlush = 64;
// How soon after the last ones records may leave again: each departure wakes the client, and twenty thousand records in
// a second must not wake it twenty thousand times. Nobody who measures sees the delay.
constexpr std::chrono::microseconds flushInterval{500};
// Replies that a client may leave unread before it is no longer listened to.
constexpr std::size_t mostWordsUnread = 64;
// How long a source may take to answer a query: what comes later is no answer. A modem reads files from a card for it.
constexpr std::chrono::seconds longestAnswer{30};
// Questions of one client that are open at once.
constexpr std::size_t mostAnswersAwaited = 256;

}  // namespace

Session::Session(std::uint64_t number, Worker& worker, ServiceLog& log, Host& host, const Settings& settings,
                 std::unique_ptr<radix::Link> link, Peer peer)
    : number_(number),
      worker_(worker),
      log_(log),
      host_(host),
      settings_(settings),
      link_(std::move(link)),
      peer_(std::move(peer)),
      connectedSince_(worker.clock().wallTime()),
      started_(worker.clock().monotonicTime()),
      outbox_(settings.outbox),
      alive_(std::make_shared<bool>(true)) {}

Session::~Session() { *alive_ = false; }

void Session::start() {
  deadline_ = worker_.after(settings_.greetingTime, [this] {
    if (const std::uint64_t silent = host_.countSilent(); isWorthTelling(silent)) {
      log_.write(LogLevel::Warning, description() + " did not greet within " +
                                        std::to_string(settings_.greetingTime.count()) + " ms and was let go (" +
                                        std::to_string(silent) + " so far)");
    }
    end();
  });
  link_->start(*this);
  if (peer_.refusal) {
    log_.write(LogLevel::Warning, description() + " was refused: " + *peer_.refusal);
    refuse(Status::NotPermitted, *peer_.refusal);
  }
}

double Session::recordsPerSecond() const { return rate_.perSecond(worker_.clock().monotonicTime(), started_); }

bool Session::wants(std::int64_t metricId) const { return observes_ || configured_.contains(metricId); }

void Session::setConfiguration(std::optional<Configuration> configuration) {
  configuration_ = std::move(configuration);
  configured_.clear();
  if (configuration_) {
    for (const auto& [metric, period] : configuration_->plan.metrics) configured_.insert(metric);
    for (const auto& [trigger, metrics] : configuration_->triggers) configured_.insert(metrics.begin(), metrics.end());
  }
  discardUnwanted();
}

void Session::discardUnwanted() {
  if (observes_ || outbox_.records() == 0) return;
  outbox_.discard([this](const Outbox::Record& record) {
    if (wants(record.metricId)) return false;
    // It was not sent after all: a later configuration may bring it.
    if (const auto last = sent_.find(record.metricId); last != sent_.end() && last->second == record.number) {
      sent_.erase(last);
    }
    return true;
  });
}

void Session::expectAnswer(std::size_t source, std::int64_t metricId) {
  // Whoever asks and asks what is never answered is owed the last of it.
  if (awaited_.size() >= mostAnswersAwaited) awaited_.erase(awaited_.begin());
  awaited_.push_back(
      {.source = source, .metricId = metricId, .until = worker_.clock().monotonicTime() + longestAnswer, .number = 0});
}

void Session::forgetAnswer(std::size_t source, std::int64_t metricId) {
  // The question that was asked last; one from before may still be answered.
  const auto found = std::find_if(awaited_.rbegin(), awaited_.rend(), [&](const AwaitedAnswer& one) {
    return one.source == source && one.metricId == metricId && one.number == 0;
  });
  if (found != awaited_.rend()) awaited_.erase(std::next(found).base());
}

bool Session::settlesQuery(std::size_t source, std::int64_t metricId, std::uint64_t number,
                           std::chrono::nanoseconds now) {
  std::erase_if(awaited_, [now](const AwaitedAnswer& one) { return one.number == 0 && now > one.until; });
  const auto found = std::find_if(awaited_.begin(), awaited_.end(), [&](const AwaitedAnswer& one) {
    return one.source == source && one.metricId == metricId && one.number == 0;
  });
  if (found == awaited_.end()) return false;
  if (takesEvents()) {
    awaited_.erase(found);
  } else {
    // For when it does, so that switching events off and on loses no answer.
    found->number = number;
  }
  return true;
}

bool Session::settlesQueryLate(std::int64_t metricId, std::uint64_t number) {
  // A record that came after the one that was asked for answers as well; that one is not kept any more.
  return std::erase_if(awaited_, [&](const AwaitedAnswer& one) {
           return one.metricId == metricId && one.number != 0 && one.number <= number;
         }) > 0;
}

void Session::offer(std::size_t source, const LastRecords::Record& record, std::uint64_t number,
                    std::chrono::nanoseconds now) {
  const bool isAnswer = !awaited_.empty() && settlesQuery(source, record.metricId, number, now);
  if (takesEvents() && (isAnswer || wants(record.metricId))) send(record, number, isAnswer, now);
}

void Session::offerKept(const LastRecords& records) {
  if (!takesEvents()) return;
  const std::chrono::nanoseconds now = worker_.clock().monotonicTime();
  for (const auto& [number, record] : records.records()) {
    const bool isAnswer = !awaited_.empty() && settlesQueryLate(record.metricId, number);
    if (!isAnswer && !wants(record.metricId)) continue;
    const auto last = sent_.find(record.metricId);
    if (last == sent_.end() || last->second < number) send(record, number, isAnswer, now);
  }
}

void Session::tellSources(radix::FrameBytes frame) {
  outbox_.setNews(std::move(frame));
  flushWords();
}

void Session::send(const LastRecords::Record& record, std::uint64_t number, bool isAnswer,
                   std::chrono::nanoseconds now) {
  outbox_.addRecord({.metricId = record.metricId,
                     .frame = record.frame,
                     .born = record.born,
                     .number = number,
                     .isAnswer = isAnswer});
  // What is not kept is never offered again.
  if (number != 0) sent_[record.metricId] = number;
  rate_.add(now);
  if (!blocked_ && outbox_.records() >= framesPerFlush) {
    flush();
  } else {
    flushRecords(now);
  }
}

void Session::onFrame(std::span<const std::uint8_t> frame) {
  // Whoever was refused may go on talking until it has gone.
  if (phase_ == Phase::Refused || phase_ == Phase::Ended) return;
  if (!radix::decodeFrame(frame, *this)) {
    const std::string reason = "a frame of " + std::to_string(frame.size()) + " bytes is malformed";
    log_.write(LogLevel::Warning, description() + " was let go: " + reason);
    refuse(Status::MalformedFrame, reason);
  } else if (phase_ == Phase::Greeting) {
    const std::string reason = "the first frame is no greeting";
    log_.write(LogLevel::Warning, description() + " was let go: " + reason);
    refuse(Status::MalformedFrame, reason);
  }
}

void Session::onOverlongFrame(std::size_t size) {
  if (phase_ == Phase::Refused || phase_ == Phase::Ended) return;
  const std::string reason = "a frame of " + std::to_string(size) + " bytes is too long, at most " +
                             std::to_string(radix::longestFrame) + " are taken";
  log_.write(LogLevel::Warning, description() + " was let go: " + reason);
  refuse(Status::TooLarge, reason);
}

void Session::onWritable() {
  blocked_ = false;
  flush();
}

void Session::onClosed() {
  if (phase_ == Phase::Active) {
    log_.write(LogLevel::Info, description() + " has gone after " + std::to_string(outbox_.sentRecords()) +
                                   " records, " + std::to_string(outbox_.lostRecords()) + " lost");
  }
  end();
}

void Session::onHello(const radix::Hello& hello) {
  if (phase_ != Phase::Greeting) return;
  clientName_ = beginningOf(hello.name(), longestClientName);
  std::optional<std::string> reason;
  Status status = Status::VersionMismatch;
  if (const auto trouble = radix::versionTrouble({"service", settings_.versions}, {"client", hello.versions()})) {
    reason = "the " + *trouble;
  } else {
    status = Status::TooMany;
    reason = host_.refusal(*this);
  }
  if (reason) {
    log_.write(LogLevel::Warning, description() + " was refused: " + *reason);
    refuse(status, *reason);
    return;
  }
  deadline_.reset();
  phase_ = Phase::Active;
  observes_ = hello.observes();
  log_.write(LogLevel::Info, description() + " has connected");
  say(radix::encode(radix::Hello(settings_.serviceName, settings_.versions)));
  tellSources(host_.sources());
}

void Session::onCommand(const radix::Command& command) {
  if (phase_ != Phase::Active) return;
  radix::Reply reply = host_.perform(*this, command);
  reply.setSequence(command.sequence());
  if (log_.takes(LogLevel::Debug)) {
    const std::string message(reply.message());
    log_.write(LogLevel::Debug, description() + ": " + std::string(beginningOf(command.name(), 64)) +
                                    " answered with " + std::to_string(reply.status()) +
                                    (message.empty() ? "" : ", " + message));
  }
  say(radix::encode(reply));
}

void Session::onDelivery(const radix::Delivery& delivery) {
  if (phase_ != Phase::Active) return;
  delivery_ = delivery.on();
  host_.deliveryChanged(*this, delivery_);
}

void Session::onPing(const radix::Ping& ping) {
  if (phase_ == Phase::Active && !ping.isAnswer()) say(radix::encode(radix::Ping(ping.number(), true)));
}

void Session::say(radix::FrameBytes frame) {
  outbox_.addWord(std::move(frame));
  flushWords();
  // A client that asks and never reads is not asked to go on.
  if (outbox_.words() > mostWordsUnread && reading_) {
    reading_ = false;
    link_->setReading(false);
  }
}

void Session::refuse(Status status, const std::string& reason) {
  phase_ = Phase::Refused;
  delivery_ = false;
  host_.deliveryChanged(*this, false);
  // The link is closed by the client once it has read this: closing first could take the words away from it.
  deadline_ = worker_.after(settings_.leavingTime, [this] { end(); });
  radix::Hello hello(settings_.serviceName, settings_.versions);
  hello.setRefusalStatus(static_cast<std::int32_t>(status));
  hello.setRefusal(reason);
  outbox_.addWord(radix::encode(hello));
  flush();
}

void Session::end() {
  if (phase_ == Phase::Ended) return;
  phase_ = Phase::Ended;
  deadline_.reset();
  link_.reset();
  host_.ended(*this);
}

void Session::flushWords() {
  if (flushPosted_ || blocked_) return;
  flushPosted_ = true;
  worker_.post([this, alive = alive_] {
    if (!*alive) return;
    flushPosted_ = false;
    flush();
  });
}

void Session::flushRecords(std::chrono::nanoseconds now) {
  if (flushPosted_ || flushTimer_ || blocked_) return;
  if (now - lastFlush_ >= flushInterval) {
    flushWords();
  } else {
    flushTimer_ = worker_.after(lastFlush_ + flushInterval - now, [this] { flush(); });
  }
}

void Session::flush() {
  flushTimer_.reset();
  lastFlush_ = worker_.clock().monotonicTime();
  std::array<radix::OutgoingFrame, framesPerFlush> frames;
  while (!blocked_ && link_ && !outbox_.empty()) {
    const std::size_t count = outbox_.next(frames, worker_.clock().ageTime());
    const std::size_t taken = link_->send({frames.data(), count});
    outbox_.sent(taken);
    if (taken < count) blocked_ = true;
  }
  if (!reading_ && outbox_.words() == 0 && link_) {
    reading_ = true;
    link_->setReading(true);
  }
}

std::string Session::description() const {
  return "client " + std::to_string(number_) + (clientName_.empty() ? "" : " '" + clientName_ + "'") + " (process " +
         std::to_string(peer_.process) + ", user " + std::to_string(peer_.user) + ")";
}

}  // namespace probeview
