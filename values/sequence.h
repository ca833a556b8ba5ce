// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <new>
#include <stdexcept>
#include <utility>

#include "values/pool.h"

namespace probeview {

// A growing row of elements, as lists and dictionaries need it: a vector whose memory comes from the pool.
template <typename Element>
class Sequence {
 public:
  Sequence() noexcept = default;
  Sequence(const Sequence& other) : Sequence() {
    reserve(other.size_);
    for (const Element& element : other) append(element);
  }
  Sequence(Sequence&& other) noexcept { swap(other); }
  Sequence& operator=(Sequence other) noexcept {
    swap(other);
    return *this;
  }
  ~Sequence() {
    clear();
    if (elements_ != nullptr) giveMemoryBack(elements_, capacity_ * sizeof(Element));
  }

  std::size_t size() const noexcept { return size_; }
  void reserve(std::size_t count) {
    if (count > capacity_) grow(count);
  }
  // Inline, so that an element is made where it stands.
  template <typename... Parts>
  [[gnu::always_inline]] Element& append(Parts&&... parts) {
    if (size_ == capacity_) [[unlikely]]
      return appendGrowing(Element{std::forward<Parts>(parts)...});
    Element* element = new (static_cast<void*>(elements_ + size_)) Element{std::forward<Parts>(parts)...};
    ++size_;
    return *element;
  }
  void clear() noexcept {
    std::destroy_n(elements_, size_);
    size_ = 0;
  }

  Element& operator[](std::size_t index) noexcept { return elements_[index]; }
  const Element& operator[](std::size_t index) const noexcept { return elements_[index]; }
  Element* begin() noexcept { return elements_; }
  Element* end() noexcept { return elements_ + size_; }
  const Element* begin() const noexcept { return elements_; }
  const Element* end() const noexcept { return elements_ + size_; }

 private:
  void swap(Sequence& other) noexcept {
    std::swap(elements_, other.elements_);
    std::swap(size_, other.size_);
    std::swap(capacity_, other.capacity_);
  }
  // The element is made before the others move: it may have been made from one of them.
  Element& appendGrowing(Element element) {
    grow(std::size_t{size_} + 1);
    return *new (static_cast<void*>(elements_ + size_++)) Element(std::move(element));
  }
  void grow(std::size_t count) {
    std::size_t capacity = capacity_ < 4 ? 8 : 2 * std::size_t{capacity_};
    // Asked for from the start, it is most likely what will be needed.
    if (capacity_ == 0 || capacity < count) capacity = count;
    if (capacity > UINT32_MAX) throw std::length_error("a list or dictionary has at most 4294967295 elements");
    auto* elements = static_cast<Element*>(takeMemory(capacity * sizeof(Element)));
    if (elements_ != nullptr) {
      std::uninitialized_move_n(elements_, size_, elements);
      std::destroy_n(elements_, size_);
      giveMemoryBack(elements_, capacity_ * sizeof(Element));
    }
    elements_ = elements;
    capacity_ = static_cast<std::uint32_t>(capacity);
  }

  Element* elements_ = nullptr;
  std::uint32_t size_ = 0;
  std::uint32_t capacity_ = 0;
};

}  // namespace probeview
