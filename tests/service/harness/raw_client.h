// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
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
  std::vector<std::optional<std::chrono::milliseconds>> ages;  // of the events' records
  std::vector<radix::Ping> pings;
  std::uint64_t dropped = 0;
  int droppedFrames = 0;
  bool closed = false;

 private:
  void onFrame(std::span<const std::uint8_t> frame) override { radix::decodeFrame(frame, *this); }
  void onOverlongFrame(std::size_t) override {}
  void onBatchEnd() override {}
  void onWritable() override {}
  void onClosed() override { closed = true; }
  void onHello(const radix::Hello& one) override { hello = one; }
  void onReply(const radix::Reply& reply) override { replies.push_back(reply); }
  void onEvent(const radix::Event& event, std::optional<std::chrono::milliseconds> age) override {
    events.push_back(event);
    ages.push_back(age);
  }
  void onDropped(const radix::Dropped& one) override {
    dropped += one.count();
    ++droppedFrames;
  }
  void onPing(const radix::Ping& ping) override { pings.push_back(ping); }

  std::unique_ptr<radix::Link> link_;
};

}  // namespace probeview
