// SPDX-License-Identifier: Apache-2.0
//
// Frames of the socket. The input is a conversation: a byte with the length of each frame, then its bytes. Each frame
// is decoded by itself, where what is understood must come back the same from its own encoding; then all are said to a
// service, one after the other, while another client listens, which must get every record.
#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <optional>
#include <span>
#include <vector>

#include "platform/manual_loop.h"
#include "radix/arrived_event.h"
#include "radix/dictionary_bytes.h"
#include "radix/frames.h"
#include "radix/in_process_link.h"
#include "radix/source_states.h"
#include "service/service.h"
#include "tests/support/frames.h"

namespace {

using probeview::ManualLoop;
using Bytes = std::vector<std::uint8_t>;

void check(bool holds) {
  if (!holds) std::abort();
}

void checkDictionary(std::span<const std::uint8_t> bytes) {
  const auto first = radix::decodeDictionary(bytes);
  if (!first) return;
  const Bytes encoded = radix::encodeDictionary(*first);
  const auto second = radix::decodeDictionary(encoded);
  // Compared as bytes: a number that is none is not equal to itself.
  check(second && radix::encodeDictionary(*second) == encoded);
}

// What the handler of an event is given holds what the event says, within its bounds.
void checkArrival(const radix::Event& event, std::optional<std::chrono::milliseconds> age) {
  radix::client::ArrivedEvent arrived = radix::client::arrivedEvent(event, age);
  check(arrived.foreignBytes <= arrived.size());
  const bool isMetric = arrived.kind == radix::EventKind::Metric;
  const auto object = radix::client::objectOf(std::move(arrived), std::chrono::hours(1), {});
  const probeview::Dictionary& content = radix::client::nativeDictionary(*object);
  check(content.find(radix::kKeyOrigin)->text()->size() <= radix::longestOrigin);
  check(content.contains(radix::kKeyAge) == (isMetric && age.has_value()));
  check(!isMetric || std::ranges::equal(*content.find(radix::kKeyPayload)->bytes(), event.payload()));
}

// Encodes again what it is told and remembers it.
class Echo final : public radix::FrameHandler {
 public:
  void onHello(const radix::Hello& hello) override { encoded = *radix::encode(hello); }
  void onCommand(const radix::Command& command) override {
    checkDictionary(command.arguments());
    encoded = *radix::encode(command);
  }
  void onReply(const radix::Reply& reply) override {
    checkDictionary(reply.content());
    encoded = *radix::encode(reply);
  }
  void onDelivery(const radix::Delivery& delivery) override { encoded = *radix::encode(delivery); }
  void onEvent(const radix::Event& event, std::optional<std::chrono::milliseconds> age) override {
    encoded = *radix::encode(event);
    checkArrival(event, age);
    if (!age) return;
    check(*age >= age->zero() && *age <= radix::longestSpan);
    const radix::Trailer trailer = radix::ageTrailer(*age);
    encoded->insert(encoded->end(), trailer.bytes.begin(), trailer.bytes.begin() + trailer.size);
  }
  void onDropped(const radix::Dropped& dropped) override { encoded = *radix::encode(dropped); }
  void onPing(const radix::Ping& ping) override { encoded = *radix::encode(ping); }
  // What is understood of them is said again, and not what else there was.
  void onSources(const radix::Sources& sources) override { encoded = *radix::encode(radix::statesOf(sources)); }

  std::optional<Bytes> encoded;
};

void checkFrame(std::span<const std::uint8_t> bytes) {
  Echo first;
  if (!radix::decodeFrame(bytes, first)) {
    check(!first.encoded);
    return;
  }
  if (!first.encoded) return;
  Echo second;
  check(radix::decodeFrame(*first.encoded, second));
  check(second.encoded == first.encoded);
}

class Source final : public probeview::MetricSource {
 public:
  std::string_view origin() const override { return "fuzz"; }
  std::vector<std::int64_t> metrics() const override { return {0x3C4E04}; }
  void start(const probeview::SourceContext&, probeview::MetricSink& sink) override { sink_ = &sink; }
  void stop() override {}
  void setPlan(const std::optional<probeview::MetricPlan>&) override {}
  void setListening(bool) override {}
  bool query(std::int64_t) override { return false; }
  void emit() { sink_->emit({.metricId = 0x3C4E04, .payload = {0x10, 3}, .time = {}, .origin = {}}); }

 private:
  probeview::MetricSink* sink_ = nullptr;
};

class Client final : radix::LinkListener, radix::FrameHandler {
 public:
  explicit Client(std::unique_ptr<radix::Link> link) : link_(std::move(link)) { link_->start(*this); }
  void say(Bytes bytes) {
    const radix::FrameBytes frame = std::make_shared<const Bytes>(std::move(bytes));
    if (!closed_) link_->sendOne(frame);
  }
  std::size_t events() const { return events_; }

 private:
  void onFrame(std::span<const std::uint8_t> frame) override { check(radix::decodeFrame(frame, *this)); }
  void onOverlongFrame(std::size_t) override { std::abort(); }
  void onBatchEnd() override {}
  void onWritable() override {}
  void onClosed() override { closed_ = true; }
  void onEvent(const radix::Event&, std::optional<std::chrono::milliseconds>) override { ++events_; }

  std::unique_ptr<radix::Link> link_;
  std::size_t events_ = 0;
  bool closed_ = false;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  std::vector<Bytes> frames;
  for (std::size_t position = 0; position < size;) {
    const std::size_t announced = data[position++];
    const std::size_t length = std::min(announced, size - position);
    frames.emplace_back(data + position, data + position + length);
    position += length;
  }
  for (const Bytes& frame : frames) checkFrame(frame);

  ManualLoop loop;
  probeview::DiscardingSink log;
  probeview::Service service(loop, probeview::ServiceLog(log, probeview::LogLevel::Debug), {});
  auto source = std::make_unique<Source>();
  Source& emitter = *source;
  service.addSource(std::move(source));
  auto goodEnds = radix::makeInProcessLinks(loop);
  auto badEnds = radix::makeInProcessLinks(loop);
  service.accept(std::move(goodEnds.second), {});
  service.accept(std::move(badEnds.second), {});
  Client good(std::move(goodEnds.first));
  good.say(*radix::encode(radix::observer("good")));
  good.say(*radix::encode(radix::Delivery(true)));
  loop.run();
  Client bad(std::move(badEnds.first));
  std::size_t emitted = 0;
  for (Bytes& frame : frames) {
    bad.say(std::move(frame));
    loop.run();
    emitter.emit();
    ++emitted;
  }
  loop.advance(std::chrono::seconds(10));
  check(good.events() == emitted);
  return 0;
}
