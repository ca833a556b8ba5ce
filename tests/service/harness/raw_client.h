// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <utility>
#include <vector>

#include "radix/frames.h"
#include "radix/link.h"

namespace probeview {

// A client that says what a test wants and keeps what it hears.
class RawClient final : radix::LinkListener, radix::FrameHandler {
 public:
  explicit RawClient(std::unique_ptr<radix::Link> link) : link_(std::move(link)) {
    if (link_) link_->start(*this);
  }

  // Whether the link took it at once.
  bool say(const radix::FrameBytes& frame) { return link_->sendOne(frame); }
  bool sayBytes(std::vector<std::uint8_t> bytes) {
    return say(std::make_shared<const std::vector<std::uint8_t>>(std::move(bytes)));
  }
  template <typename Sentence>
  bool say(const Sentence& sentence) {
    return say(radix::encode(sentence));
  }
  void setReading(bool reading) { link_->setReading(reading); }
  void hangUp() { link_.reset(); }

  std::optional<radix::Hello> hello;
  std::vector<radix::Reply> replies;
  std::vector<radix::Event> events;
  std::vector<radix::Ping> pings;
  std::vector<radix::Sources> told;  // what feeds the service, as often as it was said
  std::uint64_t dropped = 0;
  int droppedFrames = 0;
  bool closed = false;

 private:
  void onFrame(std::span<const std::uint8_t> frame) override { radix::decodeFrame(frame, *this); }
  void onOverlongFrame(std::size_t) override {}
  void onBatchEnd() override {}
  void onWritable() override {}
  void onClosed() override { closed = true; }
  void onHello(radix::Hello one) override { hello = std::move(one); }
  void onReply(radix::Reply reply) override { replies.push_back(std::move(reply)); }
  void onEvent(radix::Event event) override { events.push_back(std::move(event)); }
  void onDropped(radix::Dropped one) override {
    dropped += one.count;
    ++droppedFrames;
  }
  void onPing(radix::Ping ping) override { pings.push_back(ping); }
  void onSources(radix::Sources sources) override { told.push_back(std::move(sources)); }

  std::unique_ptr<radix::Link> link_;
};

}  // namespace probeview
