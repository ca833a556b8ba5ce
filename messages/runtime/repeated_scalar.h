// SPDX-License-Identifier: Apache-2.0
//
// Counted lists of 32-bit numbers: the repeated scalars of messages.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <span>
#include <stdexcept>
#include <string>
#include <type_traits>
#include <utility>

#include "messages/runtime/block.h"
#include "values/dictionary.h"

namespace probeview {

// "idx (7) is out of range (3)"
[[noreturn]] void throwIndexOutOfRange(std::size_t index, std::size_t count);

template <typename Number>
class PBRepeatedNumber {
  static_assert(sizeof(Number) == 4 && std::is_integral_v<Number>);

 public:
  PBRepeatedNumber() noexcept = default;
  PBRepeatedNumber(const PBRepeatedNumber& other) { set(other.values()); }
  PBRepeatedNumber(PBRepeatedNumber&& other) noexcept { swap(other); }
  PBRepeatedNumber& operator=(const PBRepeatedNumber& other) {
    if (this != &other) set(other.values());
    return *this;
  }
  PBRepeatedNumber& operator=(PBRepeatedNumber&& other) noexcept {
    swap(other);
    return *this;
  }
  ~PBRepeatedNumber() {
    if (ownsMemory_) delete[] data_;
  }

  std::size_t count() const noexcept { return count_; }
  const Number* data() const noexcept { return data_; }
  std::span<const Number> values() const noexcept { return {data_, count_}; }
  // Throws std::out_of_range, "idx (7) is out of range (3)".
  Number at(std::size_t index) const {
    if (index >= count_) throwIndexOutOfRange(index, count_);
    return data_[index];
  }

  void add(Number value) {
    if (count_ == capacity_) grow(nullptr, std::size_t{count_} + 1);
    data_[count_++] = value;
  }
  // Memory comes from the block, which must outlive the list's content.
  void add(Number value, Block& block) {
    if (count_ == capacity_) grow(&block, std::size_t{count_} + 1);
    data_[count_++] = value;
  }
  void append(std::span<const Number> values, Block* block = nullptr) {
    if (values.empty()) return;
    // The values may be this list's own; growing keeps what was there readable until it returns.
    const std::size_t needed = count_ + values.size();
    if (needed <= capacity_) {
      std::memmove(data_ + count_, values.data(), values.size_bytes());
    } else {
      PBRepeatedNumber longer;
      longer.grow(block, needed);
      if (count_ != 0) std::memcpy(longer.data_, data_, count_ * sizeof(Number));
      std::memcpy(longer.data_ + count_, values.data(), values.size_bytes());
      swap(longer);
    }
    count_ = static_cast<std::uint32_t>(needed);
  }
  // Replaces the whole list.
  void set(std::span<const Number> values, Block* block = nullptr) {
    if (values.size() <= capacity_) {
      if (!values.empty()) std::memmove(data_, values.data(), values.size_bytes());
      count_ = static_cast<std::uint32_t>(values.size());
      return;
    }
    PBRepeatedNumber fresh;
    fresh.append(values, block);
    swap(fresh);
  }
  void clear() noexcept { count_ = 0; }
  // Clears, and gives the memory back.
  void release() noexcept {
    PBRepeatedNumber empty;
    swap(empty);
  }
  bool ownsMemory() const noexcept { return ownsMemory_; }

  bool isEqual(const PBRepeatedNumber& other) const noexcept {
    return count_ == other.count_ && (count_ == 0 || std::memcmp(data_, other.data_, count_ * sizeof(Number)) == 0);
  }
  // 0 for an empty list, as for one that was never made.
  std::uint64_t hash() const noexcept {
    std::uint64_t hash = 0;
    for (const Number value : values()) {
      hash = (hash ^ static_cast<std::uint32_t>(value)) * 0x9E3779B97F4A7C15U + 1;
      hash ^= hash >> 29;
    }
    return hash;
  }
  List toList() const {
    List list;
    list.reserve(count_);
    for (const Number value : values()) list.append(value);
    return list;
  }

  void swap(PBRepeatedNumber& other) noexcept {
    std::swap(data_, other.data_);
    std::swap(count_, other.count_);
    std::swap(capacity_, other.capacity_);
    std::swap(ownsMemory_, other.ownsMemory_);
  }

 private:
  void grow(Block* block, std::size_t needed) {
    if (needed > 0x7FFFFFFF) throw std::length_error("a list of numbers has at most 2147483647 of them");
    std::size_t capacity = capacity_ == 0 ? 8 : 2 * std::size_t{capacity_};
    if (capacity < needed) capacity = needed;
    auto* data =
        block != nullptr ? static_cast<Number*>(block->allocate(capacity * sizeof(Number))) : new Number[capacity];
    if (count_ != 0) std::memcpy(data, data_, count_ * sizeof(Number));
    if (ownsMemory_) delete[] data_;
    data_ = data;
    capacity_ = static_cast<std::uint32_t>(capacity);
    ownsMemory_ = block == nullptr;
  }

  Number* data_ = nullptr;
  std::uint32_t count_ = 0;
  std::uint32_t capacity_ = 0;
  bool ownsMemory_ = false;
};

using PBRepeatedUInt32 = PBRepeatedNumber<std::uint32_t>;
using PBRepeatedInt32 = PBRepeatedNumber<std::int32_t>;

}  // namespace probeview
