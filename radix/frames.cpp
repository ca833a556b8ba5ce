// SPDX-License-Identifier: Apache-2.0
#include "radix/frames.h"

#include <algorithm>
#include <memory>
#include <utility>

#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"
#include "radix/frame_tables.h"
#include "values/plain_text.h"

namespace radix {

namespace wire {

PB_DEFINE(HelloFrame)
PB_DEFINE(CommandFrame)
PB_DEFINE(ReplyFrame)
PB_DEFINE(DeliveryFrame)
PB_DEFINE(EventFrame)
PB_DEFINE(DroppedFrame)
PB_DEFINE(PingFrame)
PB_DEFINE(MetricFrame)
PB_DEFINE(SourceFrame)
PB_DEFINE(SourcesFrame)
PB_DEFINE(Frame)

}  // namespace wire

namespace {

using probeview::beginningOf;
using probeview::PBDataReader;
using probeview::PBDataWriter;
using probeview::Shared;

FrameBytes bytesOf(const wire::Frame& frame) {
  PBDataWriter writer;
  frame.writeTo(writer);
  return std::make_shared<const std::vector<std::uint8_t>>(writer.takeBytes());
}

std::uint64_t unsignedOf(std::int64_t number) { return static_cast<std::uint64_t>(number); }
std::int64_t signedOf(std::uint64_t number) { return static_cast<std::int64_t>(number); }

std::vector<std::uint8_t> copyOf(std::span<const std::uint8_t> bytes) { return {bytes.begin(), bytes.end()}; }

// What a peer says may be any number.
std::optional<std::chrono::milliseconds> spanOf(bool isThere, std::uint64_t milliseconds) {
  if (!isThere) return std::nullopt;
  return boundedSpan(std::chrono::duration<std::uint64_t, std::milli>(milliseconds));
}

client::SourceState::Phase phaseOf(std::uint32_t number) {
  using Phase = client::SourceState::Phase;
  for (const Phase known : {Phase::Ended, Phase::Failed}) {
    if (number == static_cast<std::uint32_t>(known)) return known;
  }
  // Also what only a later service knows: nothing bad can be said of it.
  return Phase::Running;
}

Sources sourcesOf(const wire::SourcesFrame& frame) {
  Sources sources;
  sources.isCut = frame.isCut();
  for (const wire::SourceFrame& source : frame.sources()) {
    if (sources.states.size() == Sources::most) {
      sources.isCut = true;
      break;
    }
    client::SourceState& state = sources.states.emplace_back();
    state.origin = beginningOf(source.origin(), Sources::longestOrigin);
    state.phase = phaseOf(source.phase());
    state.reason = beginningOf(source.reason(), Sources::longestReason);
    for (const wire::MetricFrame& metric : source.metrics()) {
      if (state.metrics.size() == mostMetrics) {
        sources.isCut = true;
        break;
      }
      state.metrics.push_back(signedOf(metric.identifier()));
    }
  }
  return sources;
}

}  // namespace

FrameBytes encode(const Hello& hello) {
  auto content = Shared<wire::HelloFrame>::make();
  content->setVersion(hello.version);
  content->setOldestVersion(hello.oldestVersion);
  content->setName(hello.name);
  if (hello.refusalStatus != 0) {
    content->setRefusalStatus(hello.refusalStatus);
    content->setRefusal(hello.refusal);
  }
  if (hello.observes) content->setObserves(true);
  wire::Frame frame;
  frame.setHello(std::move(content));
  return bytesOf(frame);
}

FrameBytes encode(const Command& command) {
  auto content = Shared<wire::CommandFrame>::make();
  content->setSequence(command.sequence);
  content->setName(command.name);
  content->setArguments(command.arguments);
  wire::Frame frame;
  frame.setCommand(std::move(content));
  return bytesOf(frame);
}

FrameBytes encode(const Reply& reply) {
  auto content = Shared<wire::ReplyFrame>::make();
  content->setSequence(reply.sequence);
  content->setStatus(reply.status);
  content->setMessage(reply.message);
  content->setContent(reply.content);
  wire::Frame frame;
  frame.setReply(std::move(content));
  return bytesOf(frame);
}

FrameBytes encode(const Delivery& delivery) {
  auto content = Shared<wire::DeliveryFrame>::make();
  content->setOn(delivery.on);
  wire::Frame frame;
  frame.setDelivery(std::move(content));
  return bytesOf(frame);
}

FrameBytes encode(const Event& event) {
  auto content = Shared<wire::EventFrame>::make();
  content->setKind(static_cast<std::int32_t>(event.kind));
  content->setPayload(event.payload);
  content->setTime(unsignedOf(event.time));
  content->setOrigin(event.origin);
  // What is 0 reads as 0 when it is left out.
  if (event.metricId != 0) content->setMetricId(unsignedOf(event.metricId));
  if (event.profileId != 0) content->setProfileId(unsignedOf(event.profileId));
  if (event.group != 0) content->setGroup(unsignedOf(event.group));
  if (event.triggerId != 0) content->setTriggerId(unsignedOf(event.triggerId));
  if (event.triggerRef != 0) content->setTriggerRef(unsignedOf(event.triggerRef));
  if (event.triggerType != 0) content->setTriggerType(unsignedOf(event.triggerType));
  // 0 is said, too: that a metric comes on change is more than that nothing is known.
  if (event.period) content->setPeriod(unsignedOf(event.period->count()));
  wire::Frame frame;
  frame.setEvent(std::move(content));
  return bytesOf(frame);
}

FrameBytes encode(const Dropped& dropped) {
  auto content = Shared<wire::DroppedFrame>::make();
  content->setCount(dropped.count);
  wire::Frame frame;
  frame.setDropped(std::move(content));
  return bytesOf(frame);
}

FrameBytes encode(const Ping& ping) {
  auto content = Shared<wire::PingFrame>::make();
  content->setNumber(ping.number);
  content->setIsAnswer(ping.isAnswer);
  wire::Frame frame;
  frame.setPing(std::move(content));
  return bytesOf(frame);
}

FrameBytes encode(const Sources& sources) {
  // The last ones go when so many of them name so much that no frame holds it.
  for (std::size_t count = std::min(sources.states.size(), Sources::most);; --count) {
    auto content = Shared<wire::SourcesFrame>::make();
    bool isCut = sources.isCut || count < sources.states.size();
    for (std::size_t index = 0; index < count; ++index) {
      const client::SourceState& state = sources.states[index];
      wire::SourceFrame& source = content->addSource();
      source.setOrigin(beginningOf(state.origin, Sources::longestOrigin));
      source.setPhase(static_cast<std::uint32_t>(state.phase));
      if (!state.reason.empty()) source.setReason(beginningOf(state.reason, Sources::longestReason));
      isCut = isCut || state.metrics.size() > mostMetrics;
      for (std::size_t metric = 0; metric < std::min(state.metrics.size(), mostMetrics); ++metric) {
        source.addMetric().setIdentifier(unsignedOf(state.metrics[metric]));
      }
    }
    if (isCut) content->setIsCut(true);
    wire::Frame frame;
    frame.setSources(std::move(content));
    FrameBytes bytes = bytesOf(frame);
    if (count == 0 || bytes->size() <= longestFrame) return bytes;
  }
}

Trailer ageTrailer(std::chrono::nanoseconds age) {
  constexpr std::uint8_t keyOfAge = 9 << 3;  // wire::Frame's field, a varint
  Trailer trailer;
  trailer.bytes[trailer.size++] = keyOfAge;
  auto rest = unsignedOf(std::chrono::duration_cast<std::chrono::milliseconds>(boundedSpan(age)).count());
  for (; rest >= 0x80; rest >>= 7) trailer.bytes[trailer.size++] = static_cast<std::uint8_t>(0x80 | (rest & 0x7F));
  trailer.bytes[trailer.size++] = static_cast<std::uint8_t>(rest);
  return trailer;
}

bool decodeFrame(std::span<const std::uint8_t> bytes, FrameHandler& handler) {
  // An unknown frame says something that is not understood; this one says nothing at all.
  if (bytes.empty()) return false;
  wire::Frame frame;
  PBDataReader reader(bytes);
  if (!frame.readFrom(reader)) return false;
  if (const auto hello = frame.hello()) {
    handler.onHello({.version = hello->version(),
                     .oldestVersion = hello->oldestVersion(),
                     .name = std::string(hello->name()),
                     .refusalStatus = hello->refusalStatus(),
                     .refusal = std::string(hello->refusal()),
                     .observes = hello->observes()});
  } else if (const auto command = frame.command()) {
    handler.onCommand({.sequence = command->sequence(),
                       .name = std::string(command->name()),
                       .arguments = copyOf(command->arguments())});
  } else if (const auto reply = frame.reply()) {
    handler.onReply({.sequence = reply->sequence(),
                     .status = reply->status(),
                     .message = std::string(reply->message()),
                     .content = copyOf(reply->content())});
  } else if (const auto delivery = frame.delivery()) {
    handler.onDelivery({.on = delivery->on()});
  } else if (const auto event = frame.event()) {
    // A kind of event that is not known is passed over like any unknown frame.
    if (event->kind() != static_cast<std::int32_t>(EventKind::Metric) &&
        event->kind() != static_cast<std::int32_t>(EventKind::Trigger)) {
      return true;
    }
    handler.onEvent({.kind = static_cast<EventKind>(event->kind()),
                     .metricId = signedOf(event->metricId()),
                     .payload = copyOf(event->payload()),
                     .profileId = signedOf(event->profileId()),
                     .time = signedOf(event->time()),
                     .origin = std::string(event->origin()),
                     .group = signedOf(event->group()),
                     .triggerId = signedOf(event->triggerId()),
                     .triggerRef = signedOf(event->triggerRef()),
                     .triggerType = signedOf(event->triggerType()),
                     .period = spanOf(event->hasPeriod(), event->period()),
                     .age = spanOf(frame.hasAge(), frame.age())});
  } else if (const auto dropped = frame.dropped()) {
    handler.onDropped({.count = dropped->count()});
  } else if (const auto ping = frame.ping()) {
    handler.onPing({.number = ping->number(), .isAnswer = ping->isAnswer()});
  } else if (const auto sources = frame.sources()) {
    handler.onSources(sourcesOf(*sources));
  }
  return true;
}

}  // namespace radix
