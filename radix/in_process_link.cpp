// SPDX-License-Identifier: Apache-2.0
#include "radix/in_process_link.h"

#include <deque>

namespace radix {

namespace {

class InProcessLink;

// One direction: what was sent and not yet taken.
struct Pipe {
  std::deque<OutgoingFrame> frames;
  InProcessLink* receiver = nullptr;
  InProcessLink* sender = nullptr;
  bool senderWaits = false;
  bool deliveryPosted = false;
};

FrameBytes joined(OutgoingFrame outgoing) {
  if (outgoing.trailer.size == 0) return std::move(outgoing.frame);
  std::vector<std::uint8_t> bytes;
  bytes.reserve(outgoing.frame->size() + outgoing.trailer.size);
  bytes.assign(outgoing.frame->begin(), outgoing.frame->end());
  bytes.insert(bytes.end(), outgoing.trailer.bytes.begin(), outgoing.trailer.bytes.begin() + outgoing.trailer.size);
  return std::make_shared<const std::vector<std::uint8_t>>(std::move(bytes));
}

class InProcessLink final : public Link {
 public:
  InProcessLink(probeview::TaskQueue& queue, std::size_t capacity, std::shared_ptr<Pipe> in, std::shared_ptr<Pipe> out)
      : queue_(queue), capacity_(capacity), in_(std::move(in)), out_(std::move(out)) {
    in_->receiver = this;
    out_->sender = this;
  }

  ~InProcessLink() override {
    in_->receiver = nullptr;
    out_->sender = nullptr;
    // The other end learns of it after what it has not read yet.
    postDelivery(queue_, out_);
  }

  void start(LinkListener& listener) override {
    listener_ = &listener;
    postDelivery(queue_, in_);
  }

  std::size_t send(std::span<const OutgoingFrame> frames) override {
    std::size_t taken = 0;
    for (const OutgoingFrame& frame : frames) {
      if (out_->frames.size() >= capacity_) {
        out_->senderWaits = true;
        break;
      }
      out_->frames.push_back(frame);
      ++taken;
    }
    if (taken > 0) postDelivery(queue_, out_);
    return taken;
  }

  void setReading(bool reading) override {
    if (reading_ == reading) return;
    reading_ = reading;
    if (reading_) postDelivery(queue_, in_);
  }

 private:
  static void postDelivery(probeview::TaskQueue& queue, const std::shared_ptr<Pipe>& pipe) {
    if (pipe->deliveryPosted) return;
    pipe->deliveryPosted = true;
    queue.post([pipe, &queue] {
      pipe->deliveryPosted = false;
      deliver(pipe, queue);
    });
  }

  static void deliver(const std::shared_ptr<Pipe>& pipe, probeview::TaskQueue& queue) {
    bool any = false;
    // The receiver is looked up for each frame: any of them may be the last that it wants.
    while (!pipe->frames.empty() && pipe->receiver != nullptr && pipe->receiver->listener_ != nullptr &&
           pipe->receiver->reading_) {
      const FrameBytes frame = joined(std::move(pipe->frames.front()));
      pipe->frames.pop_front();
      any = true;
      if (frame->size() > longestFrame) {
        pipe->receiver->listener_->onOverlongFrame(frame->size());
      } else {
        pipe->receiver->listener_->onFrame(*frame);
      }
    }
    if (any && pipe->receiver != nullptr) pipe->receiver->listener_->onBatchEnd();
    if (pipe->senderWaits && pipe->frames.empty()) {
      pipe->senderWaits = false;
      queue.post([pipe] {
        if (pipe->sender != nullptr && pipe->sender->listener_ != nullptr) pipe->sender->listener_->onWritable();
      });
    }
    if (pipe->sender == nullptr && pipe->frames.empty() && pipe->receiver != nullptr &&
        pipe->receiver->listener_ != nullptr && !pipe->receiver->closed_) {
      pipe->receiver->closed_ = true;
      pipe->receiver->listener_->onClosed();
    }
  }

  probeview::TaskQueue& queue_;
  std::size_t capacity_;
  std::shared_ptr<Pipe> in_;
  std::shared_ptr<Pipe> out_;
  LinkListener* listener_ = nullptr;
  bool reading_ = true;
  bool closed_ = false;
};

}  // namespace

std::pair<std::unique_ptr<Link>, std::unique_ptr<Link>> makeInProcessLinks(probeview::TaskQueue& queue,
                                                                           std::size_t capacity) {
  const auto there = std::make_shared<Pipe>();
  const auto back = std::make_shared<Pipe>();
  return {std::make_unique<InProcessLink>(queue, capacity, back, there),
          std::make_unique<InProcessLink>(queue, capacity, there, back)};
}

}  // namespace radix
