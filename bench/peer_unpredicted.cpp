// SPDX-License-Identifier: Apache-2.0
//
// Our messages decoded by the plainest loop over their tables: one key after the other, each field looked up by its
// number. What expecting the fields in their order saves, and what it costs when they come in another, is measured
// against this.
#include "bench/case.h"
#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/metric_utility.h"
#include "messages/nas_messages.h"
#include "messages/runtime/decode.h"
#include "messages/runtime/message_internals.h"
#include "messages/umts_messages.h"

namespace probeview::bench {

namespace {

using Position = const std::uint8_t*;

void markPresent(PBCodable& message, unsigned number) {
  MessageInternals::presence(message) |= std::uint64_t{1} << number;
}

Position decode(PBCodable& message, const MessageDescriptor& descriptor, Position position, Position limit,
                PBCodable& root);

Position decodeElement(PBCodable& element, const FieldDescriptor& row, Position position, Position limit,
                       PBCodable& root) {
  const Record record = readRecord(position, limit);
  if (record.end == nullptr) return nullptr;
  return decode(element, *row.element, record.begin, record.end, root) == nullptr ? nullptr : record.end;
}

template <typename Add>
Position decodeNumbers(Position position, Position limit, const Add& add) {
  const Record record = readRecord(position, limit);
  if (record.end == nullptr) return nullptr;
  position = record.begin;
  while (position != nullptr && position < record.end) {
    const wire::Varint number = wire::readVarint(position, record.end);
    add(static_cast<std::uint32_t>(number.value));
    position = number.next;
  }
  return position;
}

Position decodeField(PBCodable& message, const FieldDescriptor& row, Position position, Position limit,
                     PBCodable& root) {
  Block& block = MessageInternals::blockFor(root);
  const auto makeElement = [&] { return row.element->makeElement(block.allocate(row.element->size), block); };
  switch (row.kind) {
    case FieldKind::UInt64: {
      const wire::Varint scalar = wire::readVarint(position, limit);
      message.*row.member.unsigned64 = scalar.value;
      markPresent(message, row.number);
      return scalar.next;
    }
    case FieldKind::UInt32: {
      const wire::Varint scalar = wire::readVarint(position, limit);
      message.*row.member.unsigned32 = static_cast<std::uint32_t>(scalar.value);
      markPresent(message, row.number);
      return scalar.next;
    }
    case FieldKind::Int32:
    case FieldKind::Enumeration: {
      const wire::Varint scalar = wire::readVarint(position, limit);
      message.*row.member.signed32 = static_cast<std::int32_t>(scalar.value);
      markPresent(message, row.number);
      return scalar.next;
    }
    case FieldKind::SInt32: {
      const wire::Varint scalar = wire::readVarint(position, limit);
      message.*row.member.signed32 = wire::unZigZag(static_cast<std::uint32_t>(scalar.value));
      markPresent(message, row.number);
      return scalar.next;
    }
    case FieldKind::Bool: {
      const wire::Varint scalar = wire::readVarint(position, limit);
      message.*row.member.truth = scalar.value != 0;
      markPresent(message, row.number);
      return scalar.next;
    }
    case FieldKind::Bytes:
    case FieldKind::Text: {
      const Record record = readRecord(position, limit);
      if (record.end != nullptr) (message.*row.member.bytes).set({record.begin, record.end}, block);
      return record.end;
    }
    case FieldKind::Message: {
      PBCodable* element = makeElement();
      (message.*row.member.message).setLocal(element);
      return decodeElement(*element, row, position, limit, root);
    }
    case FieldKind::RepeatedMessage: {
      PBCodable* element = makeElement();
      (message.*row.member.messages).addLocal(element, block);
      return decodeElement(*element, row, position, limit, root);
    }
    case FieldKind::RepeatedUInt32:
      return decodeNumbers(position, limit,
                           [&](std::uint32_t number) { (message.*row.member.unsigned32List).add(number, block); });
    case FieldKind::RepeatedSInt32:
      return decodeNumbers(position, limit, [&](std::uint32_t number) {
        (message.*row.member.signed32List).add(wire::unZigZag(number), block);
      });
  }
  return nullptr;
}

Position decode(PBCodable& message, const MessageDescriptor& descriptor, Position position, Position limit,
                PBCodable& root) {
  while (position != nullptr && position < limit) {
    const wire::Varint key = wire::readVarint(position, limit);
    if (key.next == nullptr) return nullptr;
    if ((key.value & 7) == static_cast<unsigned>(wire::WireType::EndGroup)) return key.next;
    const auto number = static_cast<std::uint16_t>(key.value >> 3);
    const FieldDescriptor* row = KBBMetricUtility::isMetricId(number) ? nullptr : descriptor.field(number);
    position = row == nullptr ? wire::skipValue(key.next, limit, key.value & 7)
                              : decodeField(message, *row, key.next, limit, root);
  }
  return position;
}

using Run = void (*)(const Payload&);

template <typename Message>
void decodeFresh(const Payload& payload) {
  Message message;
  const Position begin = payload.bytes.data();
  keep(decode(message, Message::pbDescriptor, begin, begin + payload.bytes.size(), message));
  keep(message);
}

Run decoderOf(std::string_view name) {
#define METRIC(constant, identifier, Class, ...) \
  if (name == #Class) return decodeFresh<Class>;
#include "messages/metrics.inc"
  return nullptr;
}

class Decode : public Case {
 public:
  explicit Decode(const PayloadSet& set) {
    for (const Payload& payload : set.payloads) steps_.push_back({decoderOf(payload.message), &payload});
  }
  void run() override {
    for (const auto& step : steps_) step.function(*step.payload);
  }

 private:
  std::vector<Step<Run>> steps_;
};

}  // namespace

std::vector<Contender> unpredictedContenders() {
  return {{"ours without prediction", Task::Decode,
           [](const PayloadSet& set) -> std::unique_ptr<Case> { return std::make_unique<Decode>(set); }}};
}

}  // namespace probeview::bench
