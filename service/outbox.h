// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
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

  struct Record {
    std::int64_t metricId = 0;
    radix::FrameBytes frame{};
    std::chrono::nanoseconds born{};  // when its values were new, by Clock::ageTime()
    std::uint64_t number = 0;         // as LastRecords gives it
    bool isAnswer = false;            // to the client's own query
  };

  void addWord(radix::FrameBytes frame) { words_.push_back(std::move(frame)); }
  // A word that takes the place of the one before if that still waits.
  void setNews(radix::FrameBytes frame) { news_ = std::move(frame); }
  void addRecord(Record record);
  // Takes away the records that are not wanted any more, which are no losses. Answers stay.
  void discard(const std::function<bool(const Record& record)>& isUnwanted);

  // Copies the next frames, as many as fit and are there; how many. An account of new losses comes before the records,
  // and behind each record its age at this moment, which is one of Clock::ageTime().
  std::size_t next(std::span<radix::OutgoingFrame> frames, std::chrono::nanoseconds ageTime);
  // Takes away so many of those that next() has given.
  void sent(std::size_t count);

  bool empty() const { return words_.empty() && news_ == nullptr && records_ == 0 && lost_ == told_; }
  std::size_t words() const { return words_.size(); }
  std::size_t records() const { return records_; }
  // Records sent and lost since the beginning.
  std::uint64_t sentRecords() const { return sentRecords_; }
  std::uint64_t lostRecords() const { return lost_; }

 private:
  void makeRoom(std::int64_t metricId, std::size_t size);
  void dropOldest(std::deque<std::uint64_t>& waiting);
  void discardDropped();
  void closeHoles();

  Limits limits_;
  std::deque<radix::FrameBytes> words_;
  radix::FrameBytes news_;
  std::deque<Record> queue_;       // without a frame: dropped
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
