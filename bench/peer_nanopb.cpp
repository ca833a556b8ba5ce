// SPDX-License-Identifier: Apache-2.0
#include <pb_decode.h>
#include <pb_encode.h>

#include "bench/case.h"
#include "gsm_nano.pb.h"
#include "lte_nano.pb.h"
#include "nas_nano.pb.h"
#include "umts_nano.pb.h"

namespace probeview::bench {

namespace {

struct Kind {
  const pb_msgdesc_t* fields;
  std::size_t size;
};

Kind kindOf(std::string_view name) {
#define METRIC(constant, identifier, Class, ...) \
  if (name == #Class) return {cellular_metrics_##Class##_fields, sizeof(cellular_metrics_##Class)};
#include "messages/metrics.inc"
  return {};
}

struct Message {
  Kind kind;
  const Payload* payload;
  std::vector<std::uint64_t> storage;  // aligned for every struct

  bool decode() {
    pb_istream_t stream = pb_istream_from_buffer(payload->bytes.data(), payload->bytes.size());
    return pb_decode(&stream, kind.fields, storage.data());
  }
};

std::vector<Message> messagesOf(const PayloadSet& set) {
  std::vector<Message> messages;
  for (const Payload& payload : set.payloads) {
    const Kind kind = kindOf(payload.message);
    messages.push_back({kind, &payload, std::vector<std::uint64_t>((kind.size + 7) / 8)});
    messages.back().decode();
  }
  return messages;
}

class Decode : public Case {
 public:
  explicit Decode(const PayloadSet& set) : messages_(messagesOf(set)) {}
  void run() override {
    for (Message& message : messages_) keep(message.decode());
  }

 private:
  std::vector<Message> messages_;
};

class Encode : public Case {
 public:
  explicit Encode(const PayloadSet& set) : messages_(messagesOf(set)), buffer_(65536) {}
  void run() override {
    for (const Message& message : messages_) keep(encode(message));
  }
  std::string result() override { return std::to_string(encode(messages_.front())); }

 private:
  std::size_t encode(const Message& message) {
    pb_ostream_t stream = pb_ostream_from_buffer(buffer_.data(), buffer_.size());
    return pb_encode(&stream, message.kind.fields, message.storage.data()) ? stream.bytes_written : 0;
  }

  std::vector<Message> messages_;
  std::vector<std::uint8_t> buffer_;
};

template <typename Made>
std::unique_ptr<Case> make(const PayloadSet& set) {
  return std::make_unique<Made>(set);
}

}  // namespace

std::vector<Contender> nanopbContenders() {
  return {{"nanopb", Task::Decode, make<Decode>}, {"nanopb", Task::Encode, make<Encode>}};
}

}  // namespace probeview::bench
