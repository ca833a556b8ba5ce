// SPDX-License-Identifier: Apache-2.0
#include "bench/case.h"
#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "messages/registry.h"
#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"
#include "messages/umts_messages.h"
#include "values/printer.h"

namespace probeview::bench {

namespace {

using Run = void (*)(const Payload&);

// A new message for each payload, as the store makes it.
template <typename Message>
void decodeFresh(const Payload& payload) {
  Message message;
  PBDataReader reader(payload.bytes);
  keep(message.readFrom(reader));
  keep(message);
}

Run decoderOf(std::string_view name) {
#define METRIC(constant, identifier, Class, ...) \
  if (name == #Class) return decodeFresh<Class>;
#include "messages/metrics.inc"
  return nullptr;
}

class DecodeFresh : public Case {
 public:
  explicit DecodeFresh(const PayloadSet& set) {
    for (const Payload& payload : set.payloads) steps_.push_back({decoderOf(payload.message), &payload});
  }
  void run() override {
    for (const auto& step : steps_) step.function(*step.payload);
  }

 private:
  std::vector<Step<Run>> steps_;
};

// The messages of a set, decoded.
std::vector<std::unique_ptr<PBCodable>> messagesOf(const PayloadSet& set) {
  std::vector<std::unique_ptr<PBCodable>> messages;
  for (const Payload& payload : set.payloads) {
    messages.push_back(messageClass(payload.message)->make());
    PBDataReader reader(payload.bytes);
    messages.back()->readFrom(reader);
  }
  return messages;
}

class DecodeReused : public Case {
 public:
  explicit DecodeReused(const PayloadSet& set) : set_(set), messages_(messagesOf(set)) {}
  void run() override {
    for (std::size_t index = 0; index < messages_.size(); ++index) {
      messages_[index]->reset();
      PBDataReader reader(set_.payloads[index].bytes);
      keep(messages_[index]->readFrom(reader));
    }
  }

 private:
  const PayloadSet& set_;
  std::vector<std::unique_ptr<PBCodable>> messages_;
};

class Encode : public Case {
 public:
  explicit Encode(const PayloadSet& set) : messages_(messagesOf(set)) {}
  void run() override {
    for (const auto& message : messages_) {
      writer_.clear();
      message->writeTo(writer_);
      keep(writer_);
    }
  }
  std::string result() override {
    writer_.clear();
    messages_.front()->writeTo(writer_);
    return std::to_string(writer_.size());
  }

 private:
  std::vector<std::unique_ptr<PBCodable>> messages_;
  PBDataWriter writer_;
};

template <typename Message>
void printOne(const Payload& payload, std::string& line) {
  Message message;
  PBDataReader reader(payload.bytes);
  message.readFrom(reader);
  line.clear();
  print(message.dictionaryRepresentation(), line);
  keep(line);
}

using Print = void (*)(const Payload&, std::string&);

Print printerOf(std::string_view name) {
#define METRIC(constant, identifier, Class, ...) \
  if (name == #Class) return printOne<Class>;
#include "messages/metrics.inc"
  return nullptr;
}

class PrintLine : public Case {
 public:
  explicit PrintLine(const PayloadSet& set) {
    for (const Payload& payload : set.payloads) steps_.push_back({printerOf(payload.message), &payload});
  }
  void run() override {
    for (const auto& step : steps_) step.function(*step.payload, line_);
  }
  std::string result() override {
    steps_.front().function(*steps_.front().payload, line_);
    return line_;
  }

 private:
  std::vector<Step<Print>> steps_;
  std::string line_;
};

template <typename Made>
std::unique_ptr<Case> make(const PayloadSet& set) {
  return std::make_unique<Made>(set);
}

}  // namespace

std::vector<Contender> ourContenders() {
  return {{"ours", Task::Decode, make<DecodeFresh>},
          {"ours reused", Task::Decode, make<DecodeReused>},
          {"ours", Task::Encode, make<Encode>},
          {"ours", Task::Print, make<PrintLine>}};
}

}  // namespace probeview::bench
