// SPDX-License-Identifier: Apache-2.0
//
// What carries frames between a client and the service. Both sides are written against this and know no transport: over
// a socket or within one process they behave the same, and the same tests prove it.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <utility>
#include <vector>

namespace radix {

// A frame is one record of the transport: it arrives whole or not at all.
inline constexpr std::size_t longestFrame = 128 * 1024;

// An encoded frame. It is never changed, so that all who send it share it.
using FrameBytes = std::shared_ptr<const std::vector<std::uint8_t>>;

// A few bytes behind a frame that are not shared with others.
struct Trailer {
  static constexpr std::size_t longest = 12;
  std::array<std::uint8_t, longest> bytes{};
  std::uint8_t size = 0;
};

// A frame on its way to one receiver: it gets the frame's bytes and then the trailer's, as one record.
struct OutgoingFrame {
  FrameBytes frame{};
  Trailer trailer{};
};

// Is told what happens on a link, on the link's own thread. It may destroy the link from inside each of these.
class LinkListener {
 public:
  virtual ~LinkListener() = default;
  // One frame; the bytes are gone after the call.
  virtual void onFrame(std::span<const std::uint8_t> frame) = 0;
  // A frame longer than longestFrame came; its content is lost.
  virtual void onOverlongFrame(std::size_t size) = 0;
  // All frames that were there have been handed over; for those who work in batches.
  virtual void onBatchEnd() = 0;
  // There is room again after send() took less than it was offered.
  virtual void onWritable() = 0;
  // The peer has gone; nothing comes any more. Called once, after the last frame.
  virtual void onClosed() = 0;
};

// One end of a connection. Lives on one thread. Destroying it closes the connection.
class Link {
 public:
  virtual ~Link() = default;
  // Begins to report. The listener outlives the link. Called once, first.
  virtual void start(LinkListener& listener) = 0;
  // Takes frames from the front as long as there is room; how many. Less than all means that onWritable() will follow.
  virtual std::size_t send(std::span<const OutgoingFrame> frames) = 0;
  // Whether the one frame was taken.
  bool sendOne(FrameBytes frame) {
    const OutgoingFrame one{std::move(frame), {}};
    return send({&one, 1}) == 1;
  }
  // Whether frames are wanted now; they wait in the transport otherwise, and the peer feels it in the end.
  virtual void setReading(bool reading) = 0;
};

// A link, or why there is none.
struct ConnectResult {
  std::unique_ptr<Link> link;
  // Somebody is there but takes no more connections at this moment: try again soon.
  bool busy = false;
  // For people: what, where and what to do.
  std::string error;
};

// Makes links to the service.
class Connector {
 public:
  virtual ~Connector() = default;
  // Never waits.
  virtual ConnectResult connect() = 0;
};

}  // namespace radix
