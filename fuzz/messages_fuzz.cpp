// SPDX-License-Identifier: Apache-2.0
//
// All message classes. The first byte chooses the class, the second says how many of the bytes behind it are a second
// payload of that class; the rest is the first one. Both are decoded and held against the plainest possible reading of
// them: what was decoded, logged and written must be the same to the last byte, whether the payload is whole or not.
//
// What may well be unequal and is not asked for: a payload decoded twice into the same message (lists grow), a message
// merged with its equal (lists grow), and messages with equal hashes.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "fuzz/plain_message.h"
#include "messages/registry.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"
#include "values/printer.h"

namespace {

using namespace probeview;
using Payload = std::span<const std::uint8_t>;

void must(bool holds) {
  if (!holds) std::abort();
}

class LogLines final : public LineSink {
 public:
  void line(std::string_view text) override { lines.emplace_back(text); }
  std::vector<std::string> lines;
};

bool decode(PBCodable& message, Payload payload) {
  PBDataReader reader(payload);
  return message.readFrom(reader);
}

std::unique_ptr<PBCodable> decoded(const MessageDescriptor& descriptor, Payload payload) {
  std::unique_ptr<PBCodable> message = descriptor.make();
  decode(*message, payload);
  return message;
}

PlainMessage::Bytes encoding(const PBCodable& message) {
  PBDataWriter writer;
  message.writeTo(writer);
  must(writer.bytes().size() == writer.size());
  return writer.takeBytes();
}

// Every way to look at the message shows what the plain one has.
void mustBe(const PBCodable& message, const PlainMessage& plain) {
  const MessageDescriptor& descriptor = message.descriptor();
  const Dictionary shown = message.dictionaryRepresentation();
  const Dictionary expected = plain.dictionary();
  must(shown == expected);
  const std::string text = printed(expected);
  must(printed(shown) == text);
  must(message.description() == std::string(descriptor.name) + " " + text);
  must(isValidUtf8(text) && text.find('\n') == std::string::npos);
  for (const FieldDescriptor& field : descriptor.fields()) {
    must(message.hasField(field) == expected.contains(field.name));
  }
  must(encoding(message) == plain.encoding());
  if (descriptor.isFlat) must(message.hash() == plain.hashOfScalars());
}

void mustEqual(const PBCodable& left, const PBCodable& right) {
  must(left.isEqual(right) && right.isEqual(left) && left.hash() == right.hash());
}

PlainMessage checkDecoding(const MessageDescriptor& descriptor, Payload payload) {
  PlainMessage plain(descriptor);
  PlainMessage::Input input{.payload = payload, .position = 0, .log = {}};
  const bool isWhole = plain.read(input);
  LogLines log;
  PBDataReader reader(payload, &log);
  const std::unique_ptr<PBCodable> message = descriptor.make();
  must(message->readFrom(reader) == isWhole);
  must(reader.hasError() == !isWhole);
  if (isWhole) must(reader.position() == input.position);
  must(log.lines == input.log);
  mustBe(*message, plain);

  // The same again, in a new message and in one that is used again.
  const std::unique_ptr<PBCodable> second = decoded(descriptor, payload);
  mustEqual(*message, *second);
  second->reset();
  must(encoding(*second).empty() && second->hash() == 0);
  must(decode(*second, payload) == isWhole);
  mustBe(*second, plain);
  mustEqual(*message, *second);
  return plain;
}

void checkEncoding(const MessageDescriptor& descriptor, Payload payload, const PlainMessage& plain) {
  const std::unique_ptr<PBCodable> message = decoded(descriptor, payload);
  const PlainMessage::Bytes bytes = encoding(*message);
  const std::unique_ptr<PBCodable> back = descriptor.make();
  must(decode(*back, bytes));
  mustBe(*back, plain);
  mustEqual(*message, *back);

  // As a record in what has been begun, twice, in a writer that is used again.
  PBDataWriter writer;
  PBDataWriterWriteUint32Field(writer, 1, 1);
  writer.clear();
  PBDataWriterWriteSubmessage(writer, *message, 16);
  PBDataWriterWriteSubmessage(writer, *message, 16);
  PBDataReader reader(writer.bytes());
  for (int record = 0; record < 2; ++record) {
    must(reader.readVarint() == (16 << 3 | 2));
    must(std::ranges::equal(PBReaderReadData(reader), bytes));
  }
  must(!reader.hasMoreData() && !reader.hasError());
}

void checkCopies(const MessageDescriptor& descriptor, Payload payload, const PlainMessage& plain) {
  std::unique_ptr<PBCodable> message = decoded(descriptor, payload);
  const std::unique_ptr<PBCodable> deep = message->copyWithZone();
  const std::unique_ptr<PBCodable> shared = descriptor.make();
  const std::unique_ptr<PBCodable> merged = descriptor.make();
  must(message->copyTo(*shared) && merged->mergeFrom(*message));
  for (const PBCodable* copy : {deep.get(), shared.get(), merged.get()}) mustEqual(*message, *copy);
  // Copies outlive what they were made of.
  message.reset();
  for (const PBCodable* copy : {deep.get(), shared.get(), merged.get()}) mustBe(*copy, plain);
  mustEqual(*deep, *shared);
  mustEqual(*deep, *merged);
  // What is done to the one that shares nothing is not seen in the others.
  decode(*deep, payload);
  deep->mergeFrom(*deep);
  deep->reset();
  mustBe(*shared, plain);
}

void checkPairs(const MessageDescriptor& descriptor, Payload one, Payload other, const PlainMessage& plainOne,
                const PlainMessage& plainOther) {
  const std::unique_ptr<PBCodable> left = decoded(descriptor, one);
  const std::unique_ptr<PBCodable> right = decoded(descriptor, other);
  must(left->isEqual(*right) == (plainOne.encoding() == plainOther.encoding()));
  must(left->isEqual(*right) == right->isEqual(*left));

  PlainMessage plain = plainOne;
  plain.merge(plainOther);
  const std::unique_ptr<PBCodable> merged = decoded(descriptor, one);
  must(merged->mergeFrom(*decoded(descriptor, other)));
  mustBe(*merged, plain);
  plain.merge(PlainMessage(plain));
  must(merged->mergeFrom(*merged));
  mustBe(*merged, plain);

  plain = plainOne;
  plainOther.copyTo(plain);
  const std::unique_ptr<PBCodable> overwritten = decoded(descriptor, one);
  must(decoded(descriptor, other)->copyTo(*overwritten));
  mustBe(*overwritten, plain);

  // Decoding goes on where the last payload ended.
  PlainMessage::Input input{.payload = other, .position = 0, .log = {}};
  plain = plainOne;
  const bool isWhole = plain.read(input);
  const std::unique_ptr<PBCodable> continued = decoded(descriptor, one);
  must(decode(*continued, other) == isWhole);
  mustBe(*continued, plain);
}

// Nested messages outlive the message that they came with, and are messages like any other.
void checkElements(const MessageDescriptor& descriptor, Payload payload, const PlainMessage& plain) {
  struct Held {
    Shared<PBCodable> element;
    const PlainMessage* plain;
  };
  std::vector<Held> held;
  {
    const std::unique_ptr<PBCodable> message = decoded(descriptor, payload);
    for (const FieldDescriptor& field : descriptor.fields()) {
      const std::span<const PlainMessage> elements = plain.elements(field.number);
      if (field.kind == FieldKind::Message && !elements.empty()) {
        held.push_back({Shared<PBCodable>::of(*(*message.*field.member.message).element()), elements.data()});
      } else if (field.kind == FieldKind::RepeatedMessage) {
        const PBMessageList& list = *message.*field.member.messages;
        must(list.count() == elements.size());
        for (std::size_t index = 0; index < std::min<std::size_t>(list.count(), 3); ++index) {
          held.push_back({Shared<PBCodable>::of(list[index]), &elements[index]});
        }
      }
    }
  }
  for (const Held& each : held) {
    mustBe(*each.element, *each.plain);
    PlainMessage twice = *each.plain;
    twice.merge(*each.plain);
    each.element->mergeFrom(*each.element->copyWithZone());
    mustBe(*each.element, twice);
    each.element->reset();
    decode(*each.element, each.plain->encoding());
    mustBe(*each.element, *each.plain);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 2) return 0;
  const MessageDescriptor& descriptor = *messageClasses()[data[0] % messageClasses().size()];
  const Payload rest(data + 2, size - 2);
  const Payload other = rest.first(std::min<std::size_t>(data[1], rest.size()));
  const Payload one = rest.subspan(other.size());
  const PlainMessage plainOne = checkDecoding(descriptor, one);
  checkEncoding(descriptor, one, plainOne);
  checkCopies(descriptor, one, plainOne);
  checkElements(descriptor, one, plainOne);
  checkPairs(descriptor, one, other, plainOne, checkDecoding(descriptor, other));
  return 0;
}
