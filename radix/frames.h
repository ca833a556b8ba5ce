// SPDX-License-Identifier: Apache-2.0
//
// What a client and the service say to each other, one frame for each sentence. A frame is a protocol-buffer message,
// written here as the table of its fields, and both sides read and write it through the accessors that the table makes.
//
// The client opens with Hello and the service answers with its own. A Hello with a refusal says why there will be no
// conversation. Then the client sends Command and Delivery, and the service Reply, Event, Dropped and Sources; either
// may send Ping. Unknown frames and unknown fields are ignored, so that both sides can grow; numbers are never given a
// second meaning.
//
// What came later than version 1 began, and what peers make of it that do not know it: a service that does not know
// that its client observes gives it every record, as the client has pushed nothing; a client that cannot say it gets no
// record before it pushes a configuration. A client that does not know ages, periods and sources passes them over; one
// whose service does not tell them shows nothing of them. One that does not know that sources may be cut takes those
// that it is told for all, as it always has.
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

#include "messages/runtime/field_table.h"
#include "radix/link.h"
#include "radix/protocol_versions.h"

namespace radix {

using probeview::PBCodable;

// Signed 64-bit numbers travel as their two's complement.
constexpr std::uint64_t unsignedOf(std::int64_t number) { return static_cast<std::uint64_t>(number); }
constexpr std::int64_t signedOf(std::uint64_t number) { return static_cast<std::int64_t>(number); }

// clang-format off

class Hello final : public PBCodable {
  PB_MESSAGE(Hello)
  PB_FIELD (1, "version",        version,       Version,       uint32);
  PB_FIELD (2, "oldest_version", oldestVersion, OldestVersion, uint32);
  PB_OBJECT(3, "name",           name,          Name,          string);   // the service's with its version
  PB_FIELD (4, "refusal_status", refusalStatus, RefusalStatus, int32);    // not 0: there will be no conversation
  PB_OBJECT(5, "refusal",        refusal,       Refusal,       string);
  PB_FIELD (6, "observes",       observes,      Observes,      boolean);  // the client wants every record

 public:
  explicit Hello(std::string_view name, ProtocolVersions versions = {});
  ProtocolVersions versions() const { return {version(), oldestVersion()}; }
};

class Command final : public PBCodable {
  PB_MESSAGE(Command)
  PB_FIELD (1, "sequence",  sequence,  Sequence,  uint32);  // chosen by the client; the reply bears it
  PB_OBJECT(2, "name",      name,      Name,      string);
  PB_OBJECT(3, "arguments", arguments, Arguments, bytes);   // of radix/dictionary_bytes.h

 public:
  Command(std::uint32_t sequence, std::string_view name, std::span<const std::uint8_t> arguments = {});
};

class Reply final : public PBCodable {
  PB_MESSAGE(Reply)
  PB_FIELD (1, "sequence", sequence, Sequence, uint32);
  PB_FIELD (2, "status",   status,   Status,   int32);   // of radix/status.h
  PB_OBJECT(3, "message",  message,  Message,  string);
  PB_OBJECT(4, "content",  content,  Content,  bytes);   // of radix/dictionary_bytes.h

 public:
  Reply(std::uint32_t sequence, std::int32_t status, std::string_view message = {},
        std::span<const std::uint8_t> content = {});
};

// Whether the client takes events from now on.
class Delivery final : public PBCodable {
  PB_MESSAGE(Delivery)
  PB_FIELD(1, "on", on, On, boolean);

 public:
  explicit Delivery(bool on) { setOn(on); }
};

enum class EventKind : std::int32_t { Metric = 0, Trigger = 1 };

// Of an origin, and of the reason why a source failed, no more is taken, sent or kept.
inline constexpr std::size_t longestOrigin = 1024;
inline constexpr std::size_t longestReason = 512;

// What is left out reads as 0.
class Event final : public PBCodable {
  PB_MESSAGE(Event)
  PB_FIELD (1,  "kind",         kind,        Kind,        int32);   // as EventKind
  PB_FIELD (2,  "metric_id",    metricId,    MetricId,    uint64);
  PB_OBJECT(3,  "payload",      payload,     Payload,     bytes);
  PB_FIELD (4,  "profile_id",   profileId,   ProfileId,   uint64);
  PB_FIELD (5,  "time",         time,        Time,        uint64);  // milliseconds since 1970-01-01 UTC
  PB_OBJECT(6,  "origin",       origin,      Origin,      string);
  PB_FIELD (7,  "group",        group,       Group,       uint64);
  PB_FIELD (8,  "trigger_id",   triggerId,   TriggerId,   uint64);
  PB_FIELD (9,  "trigger_ref",  triggerRef,  TriggerRef,  uint64);
  PB_FIELD (10, "trigger_type", triggerType, TriggerType, uint64);
  PB_FIELD (11, "period",       period,      Period,      uint64);  // milliseconds; 0 on change; absent: nobody says

 public:
  explicit Event(EventKind kind) { setKind(static_cast<std::int32_t>(kind)); }
  bool isOf(EventKind one) const { return kind() == static_cast<std::int32_t>(one); }
};

// So many records were not delivered because the client was too slow, counted since the last such frame.
class Dropped final : public PBCodable {
  PB_MESSAGE(Dropped)
  PB_FIELD(1, "count", count, Count, uint64);

 public:
  explicit Dropped(std::uint64_t count) { setCount(count); }
};

// Asks whether the other side is alive; it sends the same number back as an answer.
class Ping final : public PBCodable {
  PB_MESSAGE(Ping)
  PB_FIELD(1, "number",    number,   Number,   uint64);
  PB_FIELD(2, "is_answer", isAnswer, IsAnswer, boolean);

 public:
  explicit Ping(std::uint64_t number, bool isAnswer = false);
};

class SourceMetric final : public PBCodable {
  PB_MESSAGE(SourceMetric)
  PB_FIELD(1, "identifier", identifier, Identifier, uint64);
};

class Source final : public PBCodable {
  PB_MESSAGE(Source)
  PB_OBJECT(1, "origin",  origin,  Origin,  string);
  PB_FIELD (2, "phase",   phase,   Phase,   uint32);  // 0 running, 1 ended, 2 failed
  PB_OBJECT(3, "reason",  reason,  Reason,  string);
  PB_LIST  (4, "metric",  metrics, Metrics, metric, Metric, repeated<message<SourceMetric>>);
};

// What feeds the service: all of it, at the greeting and whenever something of it has changed. Made and read by
// radix/source_states.h.
class Sources final : public PBCodable {
  PB_MESSAGE(Sources)
  PB_LIST (1, "source",  sources, Sources, source, Source, repeated<message<Source>>);
  PB_FIELD(2, "is_cut",  isCut,   IsCut,   boolean);  // more is there than is told
};

// A frame is one of these with one of its messages, and the age beside an event.
class Frame final : public PBCodable {
  PB_MESSAGE(Frame)
  PB_OBJECT(1, "hello",    hello,    Hello,    message<Hello>);
  PB_OBJECT(2, "command",  command,  Command,  message<Command>);
  PB_OBJECT(3, "reply",    reply,    Reply,    message<Reply>);
  PB_OBJECT(4, "delivery", delivery, Delivery, message<Delivery>);
  PB_OBJECT(5, "event",    event,    Event,    message<Event>);
  PB_OBJECT(6, "dropped",  dropped,  Dropped,  message<Dropped>);
  PB_OBJECT(7, "ping",     ping,     Ping,     message<Ping>);
  PB_OBJECT(8, "sources",  sources,  Sources,  message<Sources>);
  // How old the event's record is, in milliseconds. It stands in the frame and not in the event, so that it can follow
  // the bytes of an event that many share.
  PB_FIELD (9, "age",      age,      Age,      uint64);
};

// clang-format on

// A frame with this content, which is of a class that Frame names.
FrameBytes encode(const PBCodable& content);

// What goes behind an encoded event to say how old its record is, so that all who get the event share its bytes. Less
// than nothing counts as nothing.
Trailer ageTrailer(std::chrono::nanoseconds age);

// An age or a period that a peer says, which may be any number of milliseconds; 0 to longestSpan.
std::chrono::milliseconds spanOf(std::uint64_t milliseconds);

// Takes what a frame says, which is gone after the call. What a side has no ears for is ignored.
class FrameHandler {
 public:
  virtual ~FrameHandler() = default;
  virtual void onHello(const Hello&) {}
  virtual void onCommand(const Command&) {}
  virtual void onReply(const Reply&) {}
  virtual void onDelivery(const Delivery&) {}
  // The age is that of the record when it left the service; absent where a service does not say.
  virtual void onEvent(const Event&, std::optional<std::chrono::milliseconds> /*age*/) {}
  virtual void onDropped(const Dropped&) {}
  virtual void onPing(const Ping&) {}
  virtual void onSources(const Sources&) {}
};

// Hands the content to the handler. False when the bytes are no frame, as no bytes are; nothing has been handed over
// then.
bool decodeFrame(std::span<const std::uint8_t> bytes, FrameHandler& handler);

}  // namespace radix
