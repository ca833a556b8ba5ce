// SPDX-License-Identifier: Apache-2.0
#include "service/outbox.h"

#include <algorithm>
#include <utility>

#include "radix/client.h"
#include "radix/frames.h"

namespace probeview {

void Outbox::addRecord(Record record) {
  const std::size_t size = record.frame->size();
  if (records_ + 1 > limits_.records || bytes_ + size > limits_.bytes) makeRoom(record.metricId, size);
  // Queues of metrics of which nothing waits are kept for the next record, within bounds.
  if (ofMetric_.size() > radix::mostMetrics) {
    std::erase_if(ofMetric_, [](const auto& one) { return one.second.empty(); });
  }
  ofMetric_[record.metricId].push_back(firstNumber_ + queue_.size());
  queue_.push_back(std::move(record));
  ++records_;
  bytes_ += size;
}

void Outbox::makeRoom(std::int64_t metricId, std::size_t size) {
  while (records_ > 0 && (records_ + 1 > limits_.records || bytes_ + size > limits_.bytes)) {
    auto same = ofMetric_.find(metricId);
    if (same == ofMetric_.end() || same->second.empty()) {
      same = std::max_element(ofMetric_.begin(), ofMetric_.end(), [](const auto& left, const auto& right) {
        return left.second.size() < right.second.size();
      });
    }
    dropOldest(same->second);
  }
}

void Outbox::dropOldest(std::deque<std::uint64_t>& waiting) {
  Record& entry = queue_[static_cast<std::size_t>(waiting.front() - firstNumber_)];
  waiting.pop_front();
  bytes_ -= entry.frame->size();
  entry.frame.reset();
  --records_;
  ++lost_;
  discardDropped();
}

void Outbox::discardDropped() {
  while (!queue_.empty() && queue_.front().frame == nullptr) {
    queue_.pop_front();
    ++firstNumber_;
  }
  // Holes in the middle may outnumber what is left, when one metric is dropped behind another that waits: close them.
  if (queue_.size() > 2 * limits_.records) closeHoles();
}

void Outbox::closeHoles() {
  std::deque<Record> kept;
  ofMetric_.clear();
  firstNumber_ += queue_.size();
  for (Record& entry : queue_) {
    if (entry.frame == nullptr) continue;
    ofMetric_[entry.metricId].push_back(firstNumber_ + kept.size());
    kept.push_back(std::move(entry));
  }
  queue_ = std::move(kept);
}

void Outbox::discard(const std::function<bool(const Record& record)>& isUnwanted) {
  bool any = false;
  for (Record& entry : queue_) {
    if (entry.frame == nullptr || entry.isAnswer || !isUnwanted(entry)) continue;
    bytes_ -= entry.frame->size();
    entry.frame.reset();
    --records_;
    any = true;
  }
  if (any) closeHoles();
}

std::size_t Outbox::next(std::span<radix::OutgoingFrame> frames, std::chrono::nanoseconds ageTime) {
  if (lost_ != told_) {
    words_.push_back(radix::encode(radix::Dropped(lost_ - told_)));
    told_ = lost_;
  }
  if (news_ != nullptr) words_.push_back(std::exchange(news_, nullptr));
  std::size_t count = 0;
  for (const radix::FrameBytes& word : words_) {
    if (count == frames.size()) return count;
    frames[count++] = {word, {}};
  }
  for (const Record& entry : queue_) {
    if (count == frames.size()) break;
    if (entry.frame != nullptr) frames[count++] = {entry.frame, radix::ageTrailer(ageTime - entry.born)};
  }
  return count;
}

void Outbox::sent(std::size_t count) {
  for (; count > 0 && !words_.empty(); --count) words_.pop_front();
  for (; count > 0; --count) {
    discardDropped();
    const Record& entry = queue_.front();
    ofMetric_[entry.metricId].pop_front();
    bytes_ -= entry.frame->size();
    --records_;
    ++sentRecords_;
    queue_.pop_front();
    ++firstNumber_;
  }
  discardDropped();
}

}  // namespace probeview
