// SPDX-License-Identifier: Apache-2.0
#include "scenario/edges_story.h"

#include <algorithm>
#include <array>
#include <limits>
#include <span>
#include <string_view>

#include "messages/metric_identifiers.h"
#include "messages/quantities.h"
#include "messages/runtime/data_writer.h"
#include "scenario/reports.h"

namespace probeview::scenario {
namespace {

// The variants before those that walk through the enumerations.
enum class Shape : std::uint8_t { Everything, NoLists, LongLists, Smallest, Largest, TimestampOnly, Walk };
constexpr std::size_t shapeCount = static_cast<std::size_t>(Shape::Walk);

constexpr std::size_t longListLength = 32;
// A reader takes an offset away from what it shows in dBm, and the smallest number would not survive that.
constexpr std::int32_t largestOffset = static_cast<std::int32_t>(quantities::lteRsrp.offset);
constexpr std::int32_t smallestSigned = std::numeric_limits<std::int32_t>::min() + largestOffset;
constexpr std::int32_t largestSigned = std::numeric_limits<std::int32_t>::max();
constexpr std::uint32_t largestUnsigned = std::numeric_limits<std::uint32_t>::max();

struct Variant {
  Shape shape = Shape::Everything;
  std::uint32_t step = 0;  // of the walk; otherwise a small number that makes elements differ

  std::size_t listLength() const {
    switch (shape) {
      case Shape::NoLists:
      case Shape::TimestampOnly:
        return 0;
      case Shape::LongLists:
        return longListLength;
      case Shape::Smallest:
        return 1;
      case Shape::Everything:
      case Shape::Largest:
      case Shape::Walk:
        return 2;
    }
    return 0;
  }
  std::uint32_t unsignedNumber() const {
    switch (shape) {
      case Shape::Smallest:
        return 0;
      case Shape::Largest:
        return largestUnsigned;
      case Shape::Everything:
      case Shape::NoLists:
      case Shape::LongLists:
      case Shape::TimestampOnly:
      case Shape::Walk:
        return step;
    }
    return 0;
  }
  std::int32_t signedNumber() const {
    switch (shape) {
      case Shape::Smallest:
        return smallestSigned;
      case Shape::Largest:
        return largestSigned;
      case Shape::Everything:
      case Shape::NoLists:
      case Shape::LongLists:
      case Shape::TimestampOnly:
      case Shape::Walk:
        return step % 2 == 0 ? static_cast<std::int32_t>(step) : -static_cast<std::int32_t>(step);
    }
    return 0;
  }
  // The walk goes through all names and ends with a number that has none.
  std::int32_t enumerationNumber(const EnumerationTable& table) const {
    const std::span<const EnumerationEntry> entries = table.entries();
    switch (shape) {
      case Shape::Smallest:
        return entries.front().value;
      case Shape::Largest:
        return largestSigned;
      case Shape::Everything:
      case Shape::NoLists:
      case Shape::LongLists:
      case Shape::TimestampOnly:
        return entries[step % entries.size()].value;
      case Shape::Walk:
        return step % (entries.size() + 1) == entries.size() ? entries.back().value + 1
                                                             : entries[step % (entries.size() + 1)].value;
    }
    return 0;
  }
  std::vector<std::uint8_t> bytes() const {
    switch (shape) {
      case Shape::Smallest:
        return {};
      case Shape::Largest:
        return std::vector<std::uint8_t>(255, 0xFF);
      case Shape::Everything:
      case Shape::NoLists:
      case Shape::LongLists:
      case Shape::TimestampOnly:
      case Shape::Walk:
        return {0x00, 0xF1, static_cast<std::uint8_t>(0x10 + step)};
    }
    return {};
  }
  std::string_view text() const {
    switch (shape) {
      case Shape::Smallest:
        return "";
      case Shape::Largest:
        return "a \"quoted\" name,\na second line\tand an umlaut: \xC3\xBC";
      case Shape::Everything:
      case Shape::NoLists:
      case Shape::LongLists:
      case Shape::TimestampOnly:
      case Shape::Walk:
        return "internet.example";
    }
    return "";
  }
};

void writeMessage(PBDataWriter& writer, const MessageDescriptor& message, Variant variant);

void writeNested(PBDataWriter& writer, const FieldDescriptor& field, Variant variant) {
  PBWriterMark mark;
  PBDataWriterPlaceMark(writer, mark, field.number);
  writeMessage(writer, *field.element, variant);
  PBDataWriterRecallMark(writer, mark);
}

// A packed list: its elements one after the other in one record.
template <typename Write>
void writePacked(PBDataWriter& writer, const FieldDescriptor& field, std::size_t count, Write write) {
  if (count == 0) return;
  PBWriterMark mark;
  PBDataWriterPlaceMark(writer, mark, field.number);
  for (std::size_t i = 0; i < count; ++i) write(static_cast<std::uint32_t>(i));
  PBDataWriterRecallMark(writer, mark);
}

void writeField(PBDataWriter& writer, const FieldDescriptor& field, Variant variant) {
  switch (field.kind) {
    case FieldKind::UInt64:
    case FieldKind::UInt32:
      PBDataWriterWriteUint32Field(writer, variant.unsignedNumber(), field.number);
      return;
    case FieldKind::Int32:
      PBDataWriterWriteInt32Field(writer, variant.signedNumber(), field.number);
      return;
    case FieldKind::Enumeration:
      PBDataWriterWriteInt32Field(writer, variant.enumerationNumber(*field.enumeration), field.number);
      return;
    case FieldKind::SInt32:
      PBDataWriterWriteSint32Field(writer, variant.signedNumber(), field.number);
      return;
    case FieldKind::Bool:
      PBDataWriterWriteBOOLField(writer, variant.step % 2 == 1, field.number);
      return;
    case FieldKind::Bytes:
      PBDataWriterWriteDataField(writer, variant.bytes(), field.number);
      return;
    case FieldKind::Text:
      PBDataWriterWriteStringField(writer, variant.text(), field.number);
      return;
    case FieldKind::Message:
      writeNested(writer, field, variant);
      return;
    case FieldKind::RepeatedMessage:
      for (std::size_t i = 0; i < variant.listLength(); ++i) {
        writeNested(writer, field, {variant.shape, variant.step + static_cast<std::uint32_t>(i)});
      }
      return;
    case FieldKind::RepeatedUInt32:
      writePacked(writer, field, variant.listLength(), [&](std::uint32_t i) {
        PBDataWriterWriteUint32Field(writer, variant.unsignedNumber() / (i + 1), PBDataWriterNoField);
      });
      return;
    case FieldKind::RepeatedSInt32:
      writePacked(writer, field, variant.listLength(), [&](std::uint32_t i) {
        PBDataWriterWriteSint32Field(writer, variant.signedNumber() / static_cast<std::int32_t>(i + 1),
                                     PBDataWriterNoField);
      });
      return;
  }
}

void writeMessage(PBDataWriter& writer, const MessageDescriptor& message, Variant variant) {
  for (const FieldDescriptor& field : message.fields()) writeField(writer, field, variant);
}

// The most names that an enumeration of the message, or of one nested in it, has.
std::size_t mostNames(const MessageDescriptor& message) {
  std::size_t most = 0;
  for (const FieldDescriptor& field : message.fields()) {
    if (field.enumeration != nullptr) most = std::max(most, field.enumeration->entries().size());
    if (field.element != nullptr) most = std::max(most, mostNames(*field.element));
  }
  return most;
}

const MessageDescriptor& messageOf(Fact fact) { return *metricWithId(reportOf(fact).metricId)->message; }

}  // namespace

std::size_t EdgesStory::variants(const MessageDescriptor& message) { return shapeCount + mostNames(message) + 1; }

std::vector<std::uint8_t> EdgesStory::variant(const MessageDescriptor& message, std::size_t number,
                                              std::uint64_t timestamp) {
  const std::size_t which = number % variants(message);
  Variant variant{Shape::Walk, 0};
  if (which < shapeCount) {
    variant = {static_cast<Shape>(which), 3};
  } else {
    variant.step = static_cast<std::uint32_t>(which - shapeCount);
  }
  PBDataWriter writer;
  for (const FieldDescriptor& field : message.fields()) {
    if (field.name == "timestamp") {
      PBDataWriterWriteUint64Field(writer, timestamp, field.number);
    } else if (variant.shape != Shape::TimestampOnly) {
      writeField(writer, field, variant);
    }
  }
  return writer.takeBytes();
}

void EdgesStory::advance() {
  now_ += stepTime;
  if (now_ % newsTime != 0) return;
  for (const Report& report : reports()) facts_.learn(report.fact, now_);
}

std::vector<std::uint8_t> EdgesStory::tell(Fact fact, std::uint64_t timestamp) {
  return variant(messageOf(fact), told_[static_cast<std::size_t>(fact)]++, timestamp);
}

}  // namespace probeview::scenario
