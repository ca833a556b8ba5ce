// SPDX-License-Identifier: Apache-2.0
#include "bench/case.h"
#include "protozero_peer.h"

namespace probeview::bench {

namespace {

using Run = void (*)(const Payload&);

template <typename Message>
void decodeFresh(const Payload& payload) {
  Message message;
  zero::decode(protozero::pbf_reader(reinterpret_cast<const char*>(payload.bytes.data()), payload.bytes.size()),
               message);
  keep(message);
}

Run decoderOf(std::string_view name) {
#define METRIC(constant, identifier, Class, ...) \
  if (name == #Class) return decodeFresh<zero::Class>;
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

std::vector<Contender> protozeroContenders() {
  return {{"protozero", Task::Decode,
           [](const PayloadSet& set) -> std::unique_ptr<Case> { return std::make_unique<Decode>(set); }}};
}

}  // namespace probeview::bench
