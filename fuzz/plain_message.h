// SPDX-License-Identifier: Apache-2.0
//
// A message in its plainest form, with decoding, encoding, merging and comparing written as simply as they can be: one
// byte after the other, no expectation, no shared memory. Of the real thing it knows only the tables' numbers, kinds
// and names, so that the two can be held against each other.
#pragma once

#include <cstdint>
#include <cstdio>
#include <map>
#include <span>
#include <string>
#include <vector>

#include "messages/metric_utility.h"
#include "messages/runtime/field_descriptor.h"
#include "values/dictionary.h"

namespace probeview {

class PlainMessage {
 public:
  using Bytes = std::vector<std::uint8_t>;

  // What reading shares between the records of a payload.
  struct Input {
    std::span<const std::uint8_t> payload;
    std::size_t position = 0;
    std::vector<std::string> log;
  };

  explicit PlainMessage(const MessageDescriptor& descriptor) : descriptor_(&descriptor) {}

  // False when the payload cannot be read to its end; what was read before stays.
  bool read(Input& input) { return readUntil(input, input.payload.size()); }

  Bytes encoding() const {
    Bytes out;
    for (const auto& [number, field] : fields_) {
      const FieldKind kind = row(number).kind;
      if (isScalar(kind)) {
        append(out, number, 0);
        appendVarint(out, wireNumber(kind, field.number));
      } else if (kind == FieldKind::Message || kind == FieldKind::RepeatedMessage) {
        for (const PlainMessage& element : field.messages) appendRecord(out, number, element.encoding());
      } else if (kind == FieldKind::Bytes || kind == FieldKind::Text) {
        appendRecord(out, number, field.bytes);
      } else if (!field.numbers.empty()) {
        Bytes content;
        for (const std::uint32_t element : field.numbers) appendVarint(content, element);
        appendRecord(out, number, content);
      }
    }
    return out;
  }

  Dictionary dictionary() const {
    Dictionary dictionary;
    for (const auto& [number, field] : fields_) {
      const FieldDescriptor& known = row(number);
      if (known.kind == FieldKind::RepeatedUInt32 || known.kind == FieldKind::RepeatedSInt32) {
        if (field.numbers.empty()) continue;
      }
      dictionary.set(Key::copy(known.name), value(known, field));
    }
    return dictionary;
  }

  // Scalars, bytes and texts of the other replace, single nested messages are merged, lists grow.
  void merge(const PlainMessage& other) {
    for (const auto& [number, field] : other.fields_) {
      Field& mine = fields_[number];
      const FieldKind kind = row(number).kind;
      mine.number = field.number;
      mine.bytes = field.bytes;
      mine.numbers.insert(mine.numbers.end(), field.numbers.begin(), field.numbers.end());
      if (kind == FieldKind::Message && !mine.messages.empty()) {
        mine.messages.front().merge(field.messages.front());
      } else {
        mine.messages.insert(mine.messages.end(), field.messages.begin(), field.messages.end());
      }
    }
  }

  // What is present here replaces what the target has, lists included.
  void copyTo(PlainMessage& target) const {
    for (const auto& [number, field] : fields_) {
      const bool isEmptyList = isRepeated(row(number).kind) && field.messages.empty() && field.numbers.empty();
      if (!isEmptyList) target.fields_[number] = field;
    }
  }

  // For a message of scalars alone: each value times the factor, all of them XORed.
  std::uint64_t hashOfScalars() const {
    std::uint64_t hash = 0;
    for (const auto& [number, field] : fields_) {
      const FieldKind kind = row(number).kind;
      const bool isSigned = kind == FieldKind::SInt32 || kind == FieldKind::Int32 || kind == FieldKind::Enumeration;
      hash ^= (isSigned ? signExtended(field.number) : field.number) * 0x9E3779B1U;
    }
    return hash;
  }

  // The elements of a field of nested messages.
  std::span<const PlainMessage> elements(std::uint16_t number) const {
    const auto found = fields_.find(number);
    if (found == fields_.end()) return {};
    return found->second.messages;
  }

 private:
  struct Field {
    std::uint64_t number = 0;  // as it is shown; of 32 bits: in the low ones
    Bytes bytes;
    std::vector<PlainMessage> messages;  // a single one, too
    std::vector<std::uint32_t> numbers;  // as they stand on the wire
  };

  const FieldDescriptor* rowOrNull(std::uint16_t number) const {
    for (const FieldDescriptor& candidate : descriptor_->fields()) {
      if (candidate.number == number) return &candidate;
    }
    return nullptr;
  }
  const FieldDescriptor& row(std::uint16_t number) const { return *rowOrNull(number); }

  // Reading. Each answers false when the data ends too early.

  static bool readVarint(Input& input, std::size_t end, std::uint64_t& value) {
    value = 0;
    for (unsigned count = 0; count < 10; ++count) {
      if (input.position >= end) {
        value = 0;
        return false;
      }
      const std::uint8_t byte = input.payload[input.position++];
      value |= std::uint64_t{byte & 0x7FU} << (7 * count);
      if (byte < 0x80) return true;
    }
    value = 0;
    return true;
  }

  static bool readRecord(Input& input, std::size_t end, std::size_t& recordEnd) {
    std::uint64_t length = 0;
    if (!readVarint(input, end, length) || length > end - input.position) return false;
    recordEnd = input.position + static_cast<std::size_t>(length);
    return true;
  }

  static bool skip(Input& input, std::size_t end, std::uint64_t type) {
    std::uint64_t ignored = 0;
    std::size_t behind = input.position;
    if (type == 0) return readVarint(input, end, ignored);
    if (type == 1) {
      behind += 8;
    } else if (type == 5) {
      behind += 4;
    } else if (type != 2 || !readRecord(input, end, behind)) {
      return false;
    }
    if (behind > end) return false;
    input.position = behind;
    return true;
  }

  bool readUntil(Input& input, std::size_t end) {
    while (input.position < end) {
      std::uint64_t key = 0;
      if (!readVarint(input, end, key)) return false;
      if (key % 8 == 4) return true;
      const auto number = static_cast<std::uint16_t>(key / 8);
      if (isMetric(number)) {
        std::uint64_t dropped = 0;
        const bool isWhole = readVarint(input, end, dropped);
        char line[48];
        std::snprintf(line, sizeof line, "Unknown tag: %x:%u", unsigned{number}, static_cast<unsigned>(dropped));
        input.log.emplace_back("valid metricId tag");
        input.log.emplace_back(line);
        if (!isWhole) return false;
        continue;
      }
      const FieldDescriptor* known = rowOrNull(number);
      if (!(known == nullptr ? skip(input, end, key % 8) : readField(input, end, *known, key % 8))) return false;
    }
    return true;
  }

  bool readField(Input& input, std::size_t end, const FieldDescriptor& known, std::uint64_t type) {
    std::uint64_t value = 0;
    std::size_t recordEnd = 0;
    switch (known.kind) {
      case FieldKind::UInt64:
      case FieldKind::UInt32:
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
      case FieldKind::Bool: {
        const bool isWhole = readVarint(input, end, value);
        fields_[known.number].number = shownNumber(known.kind, value);
        return isWhole;
      }
      case FieldKind::Bytes:
      case FieldKind::Text: {
        if (!readRecord(input, end, recordEnd)) return false;
        const auto content = input.payload.subspan(input.position, recordEnd - input.position);
        fields_[known.number].bytes.assign(content.begin(), content.end());
        input.position = recordEnd;
        return true;
      }
      case FieldKind::Message:
      case FieldKind::RepeatedMessage: {
        std::vector<PlainMessage>& elements = fields_[known.number].messages;
        if (known.kind == FieldKind::Message) elements.clear();
        elements.emplace_back(*known.element);
        if (!readRecord(input, end, recordEnd) || !elements.back().readUntil(input, recordEnd)) return false;
        input.position = recordEnd;
        return true;
      }
      case FieldKind::RepeatedUInt32:
      case FieldKind::RepeatedSInt32: {
        std::vector<std::uint32_t>& numbers = fields_[known.number].numbers;
        bool isWhole = true;
        if (type != 2) {
          isWhole = readVarint(input, end, value);
          numbers.push_back(static_cast<std::uint32_t>(value));
          return isWhole;
        }
        if (!readRecord(input, end, recordEnd)) return false;
        while (isWhole && input.position < recordEnd) {
          isWhole = readVarint(input, recordEnd, value);
          numbers.push_back(static_cast<std::uint32_t>(value));
        }
        return isWhole;
      }
    }
    return false;
  }

  static bool isMetric(std::uint16_t number) {
    for (const KBBMetricUtility::Row& metric : KBBMetricUtility::rows()) {
      if (metric.metricId == number) return true;
    }
    return false;
  }

  // Numbers. A ZigZag number n stands for n / 2, an odd one for -(n + 1) / 2.

  static std::uint64_t signExtended(std::uint64_t low) {
    return (low & 0x80000000U) != 0 ? low | 0xFFFFFFFF00000000U : low & 0xFFFFFFFFU;
  }
  static std::uint32_t unZigZag(std::uint32_t wire) { return wire % 2 == 0 ? wire / 2 : ~(wire / 2); }
  static std::uint64_t shownNumber(FieldKind kind, std::uint64_t wire) {
    if (kind == FieldKind::UInt64) return wire;
    if (kind == FieldKind::Bool) return wire == 0 ? 0 : 1;
    if (kind == FieldKind::SInt32) return unZigZag(static_cast<std::uint32_t>(wire));
    return wire & 0xFFFFFFFFU;
  }
  static std::uint64_t wireNumber(FieldKind kind, std::uint64_t shown) {
    if (kind == FieldKind::SInt32) {
      const bool isNegative = (shown & 0x80000000U) != 0;
      return isNegative ? ~shown % 0x80000000U * 2 + 1 : shown * 2;
    }
    return kind == FieldKind::Int32 || kind == FieldKind::Enumeration ? signExtended(shown) : shown;
  }

  // Writing.

  static void appendVarint(Bytes& out, std::uint64_t value) {
    for (; value >= 128; value /= 128) out.push_back(static_cast<std::uint8_t>(value % 128 + 128));
    out.push_back(static_cast<std::uint8_t>(value));
  }
  static void append(Bytes& out, std::uint16_t number, unsigned type) {
    appendVarint(out, std::uint64_t{number} * 8 + type);
  }
  static void appendRecord(Bytes& out, std::uint16_t number, const Bytes& content) {
    append(out, number, 2);
    appendVarint(out, content.size());
    out.insert(out.end(), content.begin(), content.end());
  }

  static Value value(const FieldDescriptor& known, const Field& field) {
    const auto low = static_cast<std::uint32_t>(field.number);
    switch (known.kind) {
      case FieldKind::UInt64:
        return field.number;
      case FieldKind::UInt32:
        return low;
      case FieldKind::Int32:
      case FieldKind::SInt32:
        return static_cast<std::int32_t>(low);
      case FieldKind::Enumeration: {
        const auto number = static_cast<std::int32_t>(low);
        for (const EnumerationEntry& entry : known.enumeration->entries()) {
          if (entry.value == number) return Value::text(entry.name);
        }
        return Value::text("(unknown: " + std::to_string(number) + ")");
      }
      case FieldKind::Bool:
        return field.number != 0;
      case FieldKind::Bytes:
        return Value::bytes(field.bytes);
      case FieldKind::Text:
        return Value::text({reinterpret_cast<const char*>(field.bytes.data()), field.bytes.size()});
      case FieldKind::Message:
        return field.messages.front().dictionary();
      case FieldKind::RepeatedMessage: {
        List list;
        for (const PlainMessage& element : field.messages) list.append(element.dictionary());
        return list;
      }
      case FieldKind::RepeatedUInt32:
      case FieldKind::RepeatedSInt32: {
        List list;
        for (const std::uint32_t number : field.numbers) {
          if (known.kind == FieldKind::RepeatedUInt32) {
            list.append(number);
          } else {
            list.append(static_cast<std::int32_t>(unZigZag(number)));
          }
        }
        return list;
      }
    }
    return {};
  }

  const MessageDescriptor* descriptor_;
  std::map<std::uint16_t, Field> fields_;
};

}  // namespace probeview
