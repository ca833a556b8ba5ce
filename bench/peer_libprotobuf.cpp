// SPDX-License-Identifier: Apache-2.0
#include <google/protobuf/arena.h>
#include <google/protobuf/descriptor.h>
#include <google/protobuf/message.h>
#include <google/protobuf/text_format.h>

#include "bench/case.h"
#include "gsm.pb.h"
#include "lte.pb.h"
#include "nas.pb.h"
#include "umts.pb.h"
#include "values/printer.h"

namespace probeview::bench {

namespace {

namespace peer = cellular_metrics;
using Peer = google::protobuf::Message;
using PeerField = google::protobuf::FieldDescriptor;
using Run = void (*)(const Payload&);

int sizeOf(const Payload& payload) { return static_cast<int>(payload.bytes.size()); }

template <typename Message>
void decodeFresh(const Payload& payload) {
  Message message;
  keep(message.ParseFromArray(payload.bytes.data(), sizeOf(payload)));
  keep(message);
}

Run decoderOf(std::string_view name) {
#define METRIC(constant, identifier, Class, ...) \
  if (name == #Class) return decodeFresh<peer::Class>;
#include "messages/metrics.inc"
  return nullptr;
}

std::unique_ptr<Peer> makePeer(std::string_view name) {
#define METRIC(constant, identifier, Class, ...) \
  if (name == #Class) return std::make_unique<peer::Class>();
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

std::vector<std::unique_ptr<Peer>> messagesOf(const PayloadSet& set) {
  std::vector<std::unique_ptr<Peer>> messages;
  for (const Payload& payload : set.payloads) {
    messages.push_back(makePeer(payload.message));
    messages.back()->ParseFromArray(payload.bytes.data(), sizeOf(payload));
  }
  return messages;
}

class DecodeReused : public Case {
 public:
  explicit DecodeReused(const PayloadSet& set) : set_(set), messages_(messagesOf(set)) {}
  void run() override {
    for (std::size_t index = 0; index < messages_.size(); ++index) {
      const Payload& payload = set_.payloads[index];
      keep(messages_[index]->ParseFromArray(payload.bytes.data(), sizeOf(payload)));
    }
  }

 private:
  const PayloadSet& set_;
  std::vector<std::unique_ptr<Peer>> messages_;
};

// One arena with a first block of its own, reset after each message.
class DecodeArena : public Case {
 public:
  explicit DecodeArena(const PayloadSet& set) : set_(set), messages_(messagesOf(set)), block_(65536) {
    options_.initial_block = block_.data();
    options_.initial_block_size = block_.size();
    arena_ = std::make_unique<google::protobuf::Arena>(options_);
  }
  void run() override {
    for (std::size_t index = 0; index < messages_.size(); ++index) {
      const Payload& payload = set_.payloads[index];
      Peer* message = messages_[index]->New(arena_.get());
      keep(message->ParseFromArray(payload.bytes.data(), sizeOf(payload)));
      arena_->Reset();
    }
  }

 private:
  const PayloadSet& set_;
  std::vector<std::unique_ptr<Peer>> messages_;
  std::vector<char> block_;
  google::protobuf::ArenaOptions options_;
  std::unique_ptr<google::protobuf::Arena> arena_;
};

class Encode : public Case {
 public:
  explicit Encode(const PayloadSet& set) : messages_(messagesOf(set)), buffer_(65536) {}
  void run() override {
    for (const auto& message : messages_) {
      keep(message->SerializeToArray(buffer_.data(), static_cast<int>(buffer_.size())));
    }
  }
  std::string result() override { return std::to_string(messages_.front()->ByteSizeLong()); }

 private:
  std::vector<std::unique_ptr<Peer>> messages_;
  std::vector<std::uint8_t> buffer_;
};

class PrintTextFormat : public Case {
 public:
  explicit PrintTextFormat(const PayloadSet& set) : set_(set), messages_(messagesOf(set)) {
    printer_.SetSingleLineMode(true);
  }
  void run() override {
    for (std::size_t index = 0; index < messages_.size(); ++index) {
      const Payload& payload = set_.payloads[index];
      messages_[index]->ParseFromArray(payload.bytes.data(), sizeOf(payload));
      line_.clear();
      printer_.PrintToString(*messages_[index], &line_);
      keep(line_);
    }
  }
  std::string result() override {
    printer_.PrintToString(*messages_.front(), &line_);
    return line_;
  }

 private:
  const PayloadSet& set_;
  std::vector<std::unique_ptr<Peer>> messages_;
  google::protobuf::TextFormat::Printer printer_;
  std::string line_;
};

// The descriptors live as long as the process, so keys and names are views here too.
Dictionary dictionaryOf(const Peer& message, std::vector<std::vector<const PeerField*>>& pool, std::size_t depth) {
  const auto* reflection = message.GetReflection();
  if (pool.size() <= depth) pool.resize(depth + 1);
  std::vector<const PeerField*> fields = std::move(pool[depth]);
  fields.clear();
  reflection->ListFields(message, &fields);
  Dictionary dictionary;
  dictionary.reserve(fields.size());
  for (const PeerField* field : fields) {
    const Key key = Key::constant(field->name());
    if (field->is_repeated()) {
      const int count = reflection->FieldSize(message, field);
      List list;
      list.reserve(static_cast<std::size_t>(count));
      for (int index = 0; index < count; ++index) {
        if (field->cpp_type() == PeerField::CPPTYPE_MESSAGE) {
          list.append(dictionaryOf(reflection->GetRepeatedMessage(message, field, index), pool, depth + 1));
        } else if (field->cpp_type() == PeerField::CPPTYPE_UINT32) {
          list.append(reflection->GetRepeatedUInt32(message, field, index));
        } else {
          list.append(reflection->GetRepeatedInt32(message, field, index));
        }
      }
      dictionary.append(key, std::move(list));
      continue;
    }
    switch (field->cpp_type()) {
      case PeerField::CPPTYPE_UINT64:
        dictionary.append(key, reflection->GetUInt64(message, field));
        break;
      case PeerField::CPPTYPE_UINT32:
        dictionary.append(key, reflection->GetUInt32(message, field));
        break;
      case PeerField::CPPTYPE_INT32:
        dictionary.append(key, reflection->GetInt32(message, field));
        break;
      case PeerField::CPPTYPE_BOOL:
        dictionary.append(key, reflection->GetBool(message, field));
        break;
      case PeerField::CPPTYPE_ENUM: {
        const int value = reflection->GetEnumValue(message, field);
        const auto* name = field->enum_type()->FindValueByNumber(value);
        dictionary.append(key, name != nullptr ? Value::constant(name->name())
                                               : Value::text("(unknown: " + std::to_string(value) + ")"));
        break;
      }
      case PeerField::CPPTYPE_STRING: {
        std::string scratch;
        const std::string& text = reflection->GetStringReference(message, field, &scratch);
        dictionary.append(key, field->type() == PeerField::TYPE_BYTES
                                   ? Value::bytes({reinterpret_cast<const std::uint8_t*>(text.data()), text.size()})
                                   : Value::text(text));
        break;
      }
      case PeerField::CPPTYPE_MESSAGE:
        dictionary.append(key, dictionaryOf(reflection->GetMessage(message, field), pool, depth + 1));
        break;
      default:
        break;
    }
  }
  pool[depth] = std::move(fields);
  return dictionary;
}

class PrintReflection : public Case {
 public:
  explicit PrintReflection(const PayloadSet& set) : set_(set), messages_(messagesOf(set)) {}
  void run() override {
    for (std::size_t index = 0; index < messages_.size(); ++index) {
      const Payload& payload = set_.payloads[index];
      messages_[index]->ParseFromArray(payload.bytes.data(), sizeOf(payload));
      line_.clear();
      print(dictionaryOf(*messages_[index], pool_, 0), line_);
      keep(line_);
    }
  }
  std::string result() override {
    line_.clear();
    print(dictionaryOf(*messages_.front(), pool_, 0), line_);
    return line_;
  }

 private:
  const PayloadSet& set_;
  std::vector<std::unique_ptr<Peer>> messages_;
  std::vector<std::vector<const PeerField*>> pool_;
  std::string line_;
};

template <typename Made>
std::unique_ptr<Case> make(const PayloadSet& set) {
  return std::make_unique<Made>(set);
}

}  // namespace

std::vector<Contender> libprotobufContenders() {
  return {{"libprotobuf fresh", Task::Decode, make<DecodeFresh>},
          {"libprotobuf reused", Task::Decode, make<DecodeReused>},
          {"libprotobuf arena", Task::Decode, make<DecodeArena>},
          {"libprotobuf", Task::Encode, make<Encode>},
          {"libprotobuf TextFormat", Task::Print, make<PrintTextFormat>},
          {"libprotobuf reflection", Task::Print, make<PrintReflection>}};
}

}  // namespace probeview::bench
