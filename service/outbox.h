// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <deque>
#include <span>
#include <unordered_map>

#include "radix/link.h"

namespace probeview {

// What waits for one client. Records are bounded: a client that does not keep up loses the oldest record of the metric
// that comes in, else the oldest of the metric that has most of them waiting. What is said about losses is exact.
// Replies and other words of the conversation are never dropped and go first.
class Outbox {
 public:
  struct Limits {
    std::size_t records = 4096;
    std::size_t bytes = 8 * 1024 * 1024;
  };

  explicit Outbox(Limits limits) : limits_(limits) {}

  void addWord(radix::FrameBytes frame) { words_.push_back(std::move(frame)); }
  void addRecord(std::int64_t metricId, radix::FrameBytes frame);

  // Copies the next frames, as many as fit and are there; how many. An account of new losses comes before the records.
  std::size_t next(std::span<radix::FrameBytes> frames);
  // Takes away so many of those that next() has given.
  void sent(std::size_t count);

  bool empty() const { return words_.empty() && records_ == 0 && lost_ == told_; }
  std::size_t words() const { return words_.size(); }
  std::size_t records() const { return records_; }
  // Records sent and lost since the beginning.
  std::uint64_t sentRecords() const { return sentRecords_; }
  std::uint64_t lostRecords() const { return lost_; }

 private:
  struct Entry {
    std::int64_t metricId;
    radix::FrameBytes frame;  // null: dropped
  };

  void makeRoom(std::int64_t metricId, std::size_t size);
  void dropOldest(std::deque<std::uint64_t>& waiting);
  void discardDropped();

  Limits limits_;
  std::deque<radix::FrameBytes> words_;
  std::deque<Entry> queue_;
  std::uint64_t firstNumber_ = 0;  // of the entry at the front of the queue
  // The numbers of the entries of each metric that wait, oldest first.
  std::unordered_map<std::int64_t, std::deque<std::uint64_t>> ofMetric_;
  std::size_t records_ = 0;
  std::size_t bytes_ = 0;
  std::uint64_t sentRecords_ = 0;
  std::uint64_t lost_ = 0;
  std::uint64_t told_ = 0;
};

}  // namespace probeview
