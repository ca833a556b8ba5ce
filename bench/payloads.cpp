// SPDX-License-Identifier: Apache-2.0
#include "bench/payloads.h"

#include <random>
#include <span>

#include "messages/metric_identifiers.h"
#include "messages/registry.h"
#include "messages/runtime/data_writer.h"

namespace probeview::bench {

namespace {

struct Shape {
  std::size_t listLength;
  std::size_t byteLength;
  bool isReversed;
};

// Every field present, with numbers as large as they are on the air: most fit into one byte on the wire, some take two
// or three, identities four.
class Filler {
 public:
  explicit Filler(Shape shape, std::uint64_t seed = 7) : shape_(shape), random_(seed) {}

  std::vector<std::uint8_t> fill(const MessageDescriptor& descriptor) {
    PBDataWriter writer;
    const std::span<const FieldDescriptor> fields = descriptor.fields();
    for (std::size_t index = 0; index < fields.size(); ++index) {
      const FieldDescriptor& field = fields[shape_.isReversed ? fields.size() - 1 - index : index];
      // Decoding drops the one field whose number is that of a metric; a service does not send it.
      if (field.number != 19) fillField(writer, field);
    }
    return writer.takeBytes();
  }

 private:
  std::uint32_t number() {
    const std::uint64_t size = random_() % 100;
    const std::uint64_t value = random_();
    return static_cast<std::uint32_t>(size < 60 ? value & 0x7F : size < 90 ? value & 0x3FFF : value & 0xFFFFFFF);
  }

  std::int32_t signedNumber() {
    const auto value = static_cast<std::int32_t>(random_() % 140);
    return random_() % 10 < 8 ? -value : value;
  }

  std::vector<std::uint8_t> bytes() {
    std::vector<std::uint8_t> bytes(shape_.byteLength);
    for (std::uint8_t& byte : bytes) byte = static_cast<std::uint8_t>(random_());
    return bytes;
  }

  void fillField(PBDataWriter& writer, const FieldDescriptor& field) {
    switch (field.kind) {
      case FieldKind::UInt64:
        PBDataWriterWriteUint64Field(writer, 1700000000000 + number(), field.number);
        break;
      case FieldKind::UInt32:
        PBDataWriterWriteUint32Field(writer, number(), field.number);
        break;
      case FieldKind::Int32:
      case FieldKind::Enumeration: {
        const auto entries = field.enumeration->entries();
        PBDataWriterWriteInt32Field(writer, entries[random_() % entries.size()].value, field.number);
        break;
      }
      case FieldKind::SInt32:
        PBDataWriterWriteSint32Field(writer, signedNumber(), field.number);
        break;
      case FieldKind::Bool:
        PBDataWriterWriteBOOLField(writer, random_() % 2 == 0, field.number);
        break;
      case FieldKind::Bytes:
        PBDataWriterWriteDataField(writer, bytes(), field.number);
        break;
      case FieldKind::Text:
        PBDataWriterWriteStringField(writer, "internet", field.number);
        break;
      case FieldKind::Message:
        PBDataWriterWriteDataField(writer, fill(*field.element), field.number);
        break;
      case FieldKind::RepeatedMessage:
        for (std::size_t index = 0; index < shape_.listLength; ++index) {
          PBDataWriterWriteDataField(writer, fill(*field.element), field.number);
        }
        break;
      case FieldKind::RepeatedUInt32:
      case FieldKind::RepeatedSInt32: {
        PBWriterMark mark;
        PBDataWriterPlaceMark(writer, mark, field.number);
        for (std::size_t index = 0; index < shape_.listLength; ++index) {
          PBDataWriterWriteUint32Field(writer, number() & 0x3F, PBDataWriterNoField);
        }
        PBDataWriterRecallMark(writer, mark);
        break;
      }
    }
  }

  Shape shape_;
  std::mt19937_64 random_;
};

PayloadSet single(std::string name, std::string title, std::string_view message, Shape shape) {
  const MessageDescriptor* descriptor = messageClass(message);
  return {std::move(name), std::move(title), {{descriptor->name, Filler(shape).fill(*descriptor)}}};
}

PayloadSet mixed(std::string name, std::string title, Shape shape) {
  PayloadSet set{std::move(name), std::move(title), {}};
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    if (metric.isHandled) set.payloads.push_back({metric.message->name, Filler(shape).fill(*metric.message)});
  }
  return set;
}

}  // namespace

std::vector<std::uint8_t> payloadOf(std::string_view message, std::uint64_t seed) {
  return Filler({2, 8, false}, seed).fill(*messageClass(message));
}

const std::vector<PayloadSet>& payloadSets() {
  static const std::vector<PayloadSet> sets = {
      single("a", "`KCellularLteRrcState`", "KCellularLteRrcState", {0, 0, false}),
      single("b", "`KCellularLteRsrpRsrqSinr`, averages and 10 samples", "KCellularLteRsrpRsrqSinr", {10, 0, false}),
      single("c", "`KCellularWcdmaNbrCellMeas`, 8 + 8 + 8", "KCellularWcdmaNbrCellMeas", {8, 0, false}),
      single("d", "`KCellularSimCardFiles`, 40 files of 100 bytes", "KCellularSimCardFiles", {40, 100, false}),
      single("e", "`KCellularGsmIdleConfig`", "KCellularGsmIdleConfig", {0, 0, false}),
      mixed("f", "the mixed stream of all kinds, lists of 2", {2, 8, false}),
      mixed("r", "the mixed stream, fields in reversed order", {2, 8, true}),
  };
  return sets;
}

const PayloadSet& payloadSet(std::string_view name) {
  for (const PayloadSet& set : payloadSets()) {
    if (set.name == name) return set;
  }
  return payloadSets().front();
}

}  // namespace probeview::bench
