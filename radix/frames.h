// SPDX-License-Identifier: Apache-2.0
//
// What a client and the service say to each other, one frame for each sentence. How they look on the wire stands in
// radix/frame_tables.h.
//
// The client opens with Hello and the service answers with its own. A Hello with a refusal says why there will be no
// conversation. Then the client sends Command and Delivery, and the service Reply, Event, Dropped and Sources; either
// may send Ping. Unknown frames and unknown fields are ignored, so that both sides can grow.
//
// What came later than version 1 began, and what peers make of it that do not know it: a service that does not know
// that its client observes gives it every record, as the client has pushed nothing; a client that cannot say it gets no
// record before it pushes a configuration. A client that does not know ages, periods and sources passes them over; one
// whose service does not tell them shows nothing of them. One that does not know that sources may be cut takes those
// that it is told for all, as it always has.
//
// Versions: each side says which version of the protocol it speaks and the oldest with which it can still work. Two
// sides talk when neither is older than the oldest of the other; then both keep to what the older of the two knows.
// Otherwise the service refuses, and the client that is newer than it likes goes away; both say which side to update.
#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "radix/client.h"
#include "radix/link.h"

namespace radix {

inline constexpr std::uint32_t protocolVersion = 1;
inline constexpr std::uint32_t oldestProtocolVersion = 1;

struct Hello {
  std::uint32_t version = protocolVersion;
  std::uint32_t oldestVersion = oldestProtocolVersion;
  std::string name{};              // the client's name, or the service's with its version
  std::int32_t refusalStatus = 0;  // not 0: this side does not talk to the other
  std::string refusal{};
  bool observes = false;  // the client wants every record, and no configuration needed for it
};

struct Command {
  std::uint32_t sequence = 0;  // chosen by the client; the reply bears it
  std::string name{};
  std::vector<std::uint8_t> arguments{};  // of radix/dictionary_bytes.h
};

struct Reply {
  std::uint32_t sequence = 0;
  std::int32_t status = 0;
  std::string message{};
  std::vector<std::uint8_t> content{};  // of radix/dictionary_bytes.h
};

// Whether the client takes events from now on.
struct Delivery {
  bool on = false;
};

enum class EventKind : std::int32_t { Metric = 0, Trigger = 1 };

// Of an origin no more is taken, sent or kept.
inline constexpr std::size_t longestOrigin = 1024;

struct Event {
  EventKind kind = EventKind::Metric;
  std::int64_t metricId = 0;
  std::vector<std::uint8_t> payload{};
  std::int64_t profileId = 0;
  std::int64_t time = 0;  // milliseconds since 1970-01-01 UTC
  std::string origin{};
  std::int64_t group = 0;
  std::int64_t triggerId = 0;
  std::int64_t triggerRef = 0;
  std::int64_t triggerType = 0;
  // 0 to longestSpan. Absent where a service does not say.
  std::optional<std::chrono::milliseconds> period{};  // the source's, for this metric; 0 on change
  std::optional<std::chrono::milliseconds> age{};     // when it left the service; not encoded, see ageTrailer()
};

// So many records were not delivered because the client was too slow, counted since the last such frame.
struct Dropped {
  std::uint64_t count = 0;
};

// What feeds the service: all of it, at the greeting and whenever something of it has changed.
struct Sources {
  // What is past these, or past radix::mostMetrics of one source, is left out or cut, by the side that says it and by
  // the side that hears it.
  static constexpr std::size_t most = 32;
  static constexpr std::size_t longestOrigin = radix::longestOrigin;
  static constexpr std::size_t longestReason = 512;
  std::vector<client::SourceState> states{};
  // A source or a metric of one has been left out: what is not told may be there all the same. Set by encode() and
  // decodeFrame() where they leave something out.
  bool isCut = false;
};

// Asks whether the other side is alive; it sends the same number back as an answer.
struct Ping {
  std::uint64_t number = 0;
  bool isAnswer = false;
};

FrameBytes encode(const Hello& hello);
FrameBytes encode(const Command& command);
FrameBytes encode(const Reply& reply);
FrameBytes encode(const Delivery& delivery);
FrameBytes encode(const Event& event);
FrameBytes encode(const Dropped& dropped);
FrameBytes encode(const Ping& ping);
FrameBytes encode(const Sources& sources);

// What goes behind an encoded event to say how old its record is, so that all who get the event share its bytes. Less
// than nothing counts as nothing.
Trailer ageTrailer(std::chrono::nanoseconds age);

// Takes what a frame says. What a side has no ears for is ignored.
class FrameHandler {
 public:
  virtual ~FrameHandler() = default;
  virtual void onHello(Hello) {}
  virtual void onCommand(Command) {}
  virtual void onReply(Reply) {}
  virtual void onDelivery(Delivery) {}
  virtual void onEvent(Event) {}
  virtual void onDropped(Dropped) {}
  virtual void onPing(Ping) {}
  virtual void onSources(Sources) {}
};

// Hands the content to the handler. False when the bytes are no frame, as no bytes are; nothing has been handed over
// then.
bool decodeFrame(std::span<const std::uint8_t> bytes, FrameHandler& handler);

}  // namespace radix
