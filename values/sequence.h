// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <new>
#include <stdexcept>
#include <utility>

#include "values/holder_count.h"
#include "values/pool.h"

namespace probeview {

// A growing row of elements, as lists and dictionaries need it: a vector whose memory comes from the pool. It is one
// pointer, to memory that begins with a count of its holders, so that a value can share it; what is shared is not
// changed.
template <typename Element>
class Sequence {
  // The elements stand behind it.
  struct Row {
    HolderCount holders;
    std::uint32_t size;
    std::uint32_t capacity;

    static std::size_t bytes(std::size_t capacity) noexcept { return offset + capacity * sizeof(Element); }
    Element* elements() noexcept { return reinterpret_cast<Element*>(reinterpret_cast<std::byte*>(this) + offset); }
    static constexpr std::size_t offset = 16;
  };
  static_assert(sizeof(Row) <= Row::offset);

 public:
  Sequence() noexcept = default;
  Sequence(const Sequence& other) : Sequence() {
    reserve(other.size());
    for (const Element& element : other) append(element);
  }
  Sequence(Sequence&& other) noexcept : row_(std::exchange(other.row_, nullptr)) {}
  Sequence& operator=(Sequence other) noexcept {
    std::swap(row_, other.row_);
    return *this;
  }
  ~Sequence() {
    if (row_ != nullptr && row_->holders.remove()) destroy();
  }

  std::size_t size() const noexcept { return row_ != nullptr ? row_->size : 0; }
  bool isShared() const noexcept { return row_ != nullptr && !row_->holders.isOne(); }
  void reserve(std::size_t count) {
    if (count > capacity()) grow(count);
  }
  // Inline, so that an element is made where it stands.
  template <typename... Parts>
  [[gnu::always_inline]] Element& append(Parts&&... parts) {
    if (size() == capacity()) [[unlikely]]
      return appendGrowing(Element{std::forward<Parts>(parts)...});
    Element* element = new (static_cast<void*>(end())) Element{std::forward<Parts>(parts)...};
    ++row_->size;
    return *element;
  }
  // Gives a sequence up to so many elements instead of what it has, and looks for room only once. The sequence has them
  // when this ends, whatever ends it.
  class Filler {
   public:
    Filler(Sequence& sequence, std::size_t most) : row_(makeRow(most)), next_(row_->elements()) {
      sequence = Sequence(row_);
    }
    ~Filler() { row_->size = static_cast<std::uint32_t>(next_ - row_->elements()); }
    Filler(const Filler&) = delete;
    Filler& operator=(const Filler&) = delete;

    template <typename... Parts>
    [[gnu::always_inline]] void append(Parts&&... parts) {
      new (static_cast<void*>(next_)) Element{std::forward<Parts>(parts)...};
      ++next_;
    }

   private:
    Row* row_;
    Element* next_;
  };
  void clear() noexcept {
    std::destroy(begin(), end());
    if (row_ != nullptr) row_->size = 0;
  }

  Element& operator[](std::size_t index) noexcept { return begin()[index]; }
  const Element& operator[](std::size_t index) const noexcept { return begin()[index]; }
  Element* begin() noexcept { return row_ != nullptr ? row_->elements() : nullptr; }
  Element* end() noexcept { return begin() + size(); }
  const Element* begin() const noexcept { return row_ != nullptr ? row_->elements() : nullptr; }
  const Element* end() const noexcept { return begin() + size(); }

 private:
  explicit Sequence(Row* row) noexcept : row_(row) {}
  [[gnu::noinline]] static Row* makeRow(std::size_t capacity) {
    if (capacity > UINT32_MAX) throw std::length_error("a list or dictionary has at most 4294967295 elements");
    return new (takeMemory(Row::bytes(capacity))) Row{{}, 0, static_cast<std::uint32_t>(capacity)};
  }
  std::size_t capacity() const noexcept { return row_ != nullptr ? row_->capacity : 0; }
  [[gnu::noinline]] void destroy() noexcept {
    std::destroy(begin(), end());
    giveMemoryBack(row_, Row::bytes(row_->capacity));
  }
  // The element is made before the others move: it may have been made from one of them.
  Element& appendGrowing(Element element) {
    grow(size() + 1);
    return *new (static_cast<void*>(row_->elements() + row_->size++)) Element(std::move(element));
  }
  [[gnu::noinline]] void grow(std::size_t count) {
    std::size_t most = capacity() < 4 ? 8 : 2 * capacity();
    // Asked for from the start, it is most likely what will be needed.
    if (capacity() == 0 || most < count) most = count;
    Sequence longer(makeRow(most));
    if (row_ != nullptr) {
      std::uninitialized_move(begin(), end(), longer.row_->elements());
      longer.row_->size = row_->size;
    }
    std::swap(row_, longer.row_);
  }

  Row* row_ = nullptr;
};

}  // namespace probeview
