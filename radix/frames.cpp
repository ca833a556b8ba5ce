// SPDX-License-Identifier: Apache-2.0
#include "radix/frames.h"

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"
#include "platform/fatal_error.h"
#include "radix/client.h"

namespace radix {

using probeview::FieldDescriptor;
using probeview::PBDataReader;
using probeview::PBDataWriter;

PB_DEFINE(Hello)
PB_DEFINE(Command)
PB_DEFINE(Reply)
PB_DEFINE(Delivery)
PB_DEFINE(Event)
PB_DEFINE(Dropped)
PB_DEFINE(Ping)
PB_DEFINE(SourceMetric)
PB_DEFINE(Source)
PB_DEFINE(Sources)
PB_DEFINE(Frame)

Hello::Hello(std::string_view name, ProtocolVersions versions) {
  setVersion(versions.spoken);
  setOldestVersion(versions.oldest);
  setName(name);
}

Command::Command(std::uint32_t sequence, std::string_view name, std::span<const std::uint8_t> arguments) {
  setSequence(sequence);
  setName(name);
  setArguments(arguments);
}

Reply::Reply(std::uint32_t sequence, std::int32_t status, std::string_view message,
             std::span<const std::uint8_t> content) {
  setSequence(sequence);
  setStatus(status);
  setMessage(message);
  setContent(content);
}

Ping::Ping(std::uint64_t number, bool isAnswer) {
  setNumber(number);
  setIsAnswer(isAnswer);
}

FrameBytes encode(const PBCodable& content) {
  const auto fields = Frame::pbDescriptor.fields();
  const auto place = std::find_if(fields.begin(), fields.end(), [&content](const FieldDescriptor& field) {
    return field.element == &content.descriptor();
  });
  if (place == fields.end()) probeview::fatalError(std::string(content.className()) + " is no frame's content");
  PBDataWriter writer;
  PBDataWriterWriteSubmessage(writer, content, place->number);
  return std::make_shared<const std::vector<std::uint8_t>>(writer.takeBytes());
}

Trailer ageTrailer(std::chrono::nanoseconds age) {
  constexpr std::uint32_t key = Frame::pbField(probeview::FieldNumber<9>()).key;
  const auto milliseconds = std::chrono::duration_cast<std::chrono::milliseconds>(boundedSpan(age)).count();
  static_assert(Trailer::longest >= probeview::wire::varintSize(key) + probeview::wire::longestVarint);
  Trailer trailer;
  std::uint8_t* end = probeview::wire::writeVarint(trailer.bytes.data(), key);
  end = probeview::wire::writeVarint(end, unsignedOf(milliseconds));
  trailer.size = static_cast<std::uint8_t>(end - trailer.bytes.data());
  return trailer;
}

std::chrono::milliseconds spanOf(std::uint64_t milliseconds) {
  return boundedSpan(std::chrono::duration<std::uint64_t, std::milli>(milliseconds));
}

bool decodeFrame(std::span<const std::uint8_t> bytes, FrameHandler& handler) {
  // An unknown frame says something that is not understood; this one says nothing at all.
  if (bytes.empty()) return false;
  Frame frame;
  PBDataReader reader(bytes);
  if (!frame.readFrom(reader)) return false;
  if (const auto hello = frame.hello()) {
    handler.onHello(*hello);
  } else if (const auto command = frame.command()) {
    handler.onCommand(*command);
  } else if (const auto reply = frame.reply()) {
    handler.onReply(*reply);
  } else if (const auto delivery = frame.delivery()) {
    handler.onDelivery(*delivery);
  } else if (const auto event = frame.event()) {
    // A kind of event that is not known is passed over like any unknown frame.
    if (!event->isOf(EventKind::Metric) && !event->isOf(EventKind::Trigger)) return true;
    handler.onEvent(*event, frame.hasAge() ? std::optional(spanOf(frame.age())) : std::nullopt);
  } else if (const auto dropped = frame.dropped()) {
    handler.onDropped(*dropped);
  } else if (const auto ping = frame.ping()) {
    handler.onPing(*ping);
  } else if (const auto sources = frame.sources()) {
    handler.onSources(*sources);
  }
  return true;
}

}  // namespace radix
