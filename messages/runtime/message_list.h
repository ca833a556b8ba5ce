// SPDX-License-Identifier: Apache-2.0
//
// Nested messages: the handle that shares one, the place of a single one, and the list of many.
#pragma once

#include <cstddef>
#include <cstdint>
#include <utility>

#include "messages/runtime/block.h"

namespace probeview {

class PBCodable;

// Shares one nested message with whoever else holds it: what one changes, all see. Never null unless made from null.
template <typename Message>
class Shared {
 public:
  Shared(std::nullptr_t) noexcept {}
  // A message of its own with the content of the given one.
  Shared(const Message& message) : Shared(make()) { *message_ = message; }
  // Another holder of a message that lies in a block; one reference is taken.
  static Shared of(Message& element) noexcept {
    if (element.block() != nullptr) element.block()->retain();
    return Shared(&element);
  }
  // A new, empty message.
  static Shared make() {
    Block* block = Block::makeFor(sizeof(Message));
    return Shared(Message::make(block->allocate(sizeof(Message)), *block));
  }

  Shared(const Shared& other) noexcept : message_(other.message_) {
    if (message_ != nullptr) message_->block()->retain();
  }
  Shared(Shared&& other) noexcept : message_(std::exchange(other.message_, nullptr)) {}
  Shared& operator=(Shared other) noexcept {
    std::swap(message_, other.message_);
    return *this;
  }
  ~Shared() {
    if (message_ != nullptr) message_->block()->release();
  }

  Message* get() const noexcept { return message_; }
  Message& operator*() const noexcept { return *message_; }
  Message* operator->() const noexcept { return message_; }
  explicit operator bool() const noexcept { return message_ != nullptr; }
  friend bool operator==(const Shared& left, const Shared& right) noexcept { return left.message_ == right.message_; }

  // Hands the reference over to the caller.
  Message* detach() noexcept { return std::exchange(message_, nullptr); }

 private:
  explicit Shared(Message* message) noexcept : message_(message) {}

  Message* message_ = nullptr;
};

// Where a message holds a nested one. The nested message either lies in the same block as all else that its holder
// owns, which keeps it alive without being counted, or the holder counts as one reference on the block in which it
// lies.
class ElementPointer {
 public:
  ElementPointer() noexcept = default;
  static ElementPointer local(PBCodable* element) noexcept {
    return ElementPointer(reinterpret_cast<std::uintptr_t>(element));
  }
  static ElementPointer counted(PBCodable* element) noexcept {
    return ElementPointer(reinterpret_cast<std::uintptr_t>(element) | 1U);
  }
  PBCodable* get() const noexcept { return reinterpret_cast<PBCodable*>(bits_ & ~std::uintptr_t{1}); }
  bool isCounted() const noexcept { return (bits_ & 1U) != 0; }

 private:
  explicit ElementPointer(std::uintptr_t bits) noexcept : bits_(bits) {}
  std::uintptr_t bits_ = 0;
};

// The elements of a list, to walk through and to index; valid until the list changes. The index must be below size().
template <typename Message>
class MessageView {
 public:
  class Iterator {
   public:
    using value_type = Message;
    using difference_type = std::ptrdiff_t;
    Iterator() noexcept = default;
    explicit Iterator(const ElementPointer* position) noexcept : position_(position) {}
    Message& operator*() const noexcept { return static_cast<Message&>(*position_->get()); }
    Message* operator->() const noexcept { return static_cast<Message*>(position_->get()); }
    Iterator& operator++() noexcept {
      ++position_;
      return *this;
    }
    Iterator operator++(int) noexcept { return Iterator(position_++); }
    friend bool operator==(const Iterator& left, const Iterator& right) noexcept {
      return left.position_ == right.position_;
    }

   private:
    const ElementPointer* position_ = nullptr;
  };

  MessageView(const ElementPointer* elements, std::size_t size) noexcept : elements_(elements), size_(size) {}
  std::size_t size() const noexcept { return size_; }
  bool empty() const noexcept { return size_ == 0; }
  Message& operator[](std::size_t index) const noexcept { return static_cast<Message&>(*elements_[index].get()); }
  Iterator begin() const noexcept { return Iterator(elements_); }
  Iterator end() const noexcept { return Iterator(elements_ + size_); }

 private:
  const ElementPointer* elements_;
  std::size_t size_;
};

// The place of a single nested message; present when there is one.
class PBMessageField {
 public:
  PBMessageField() noexcept = default;
  PBMessageField(const PBMessageField&) = delete;
  PBMessageField& operator=(const PBMessageField&) = delete;
  PBMessageField(PBMessageField&& other) noexcept { std::swap(element_, other.element_); }
  PBMessageField& operator=(PBMessageField&& other) noexcept {
    std::swap(element_, other.element_);
    return *this;
  }
  ~PBMessageField() {
    if (ownsMemory()) clear();
  }

  PBCodable* element() const noexcept { return element_.get(); }
  bool isPresent() const noexcept { return element() != nullptr; }
  bool ownsMemory() const noexcept { return element_.isCounted(); }
  void clear() noexcept;
  // Takes over one reference on the element's block; null leaves the place empty. The home is the block of the message
  // that this place belongs to, if it has one.
  void setCounted(PBCodable* element, const Block* home) noexcept;
  // The element lies in the home of this place.
  void setLocal(PBCodable* element) noexcept {
    if (ownsMemory()) clear();
    element_ = ElementPointer::local(element);
  }

 private:
  ElementPointer element_;
};

// A list of nested messages, all of one class.
class PBMessageList {
 public:
  PBMessageList() noexcept = default;
  PBMessageList(const PBMessageList&) = delete;
  PBMessageList& operator=(const PBMessageList&) = delete;
  PBMessageList(PBMessageList&& other) noexcept { swap(other); }
  PBMessageList& operator=(PBMessageList&& other) noexcept {
    swap(other);
    return *this;
  }
  ~PBMessageList() {
    if (ownsMemory()) release();
  }

  std::size_t count() const noexcept { return count_; }
  const ElementPointer* elements() const noexcept { return elements_; }
  PBCodable& operator[](std::size_t index) const noexcept { return *elements_[index].get(); }
  // Throws std::out_of_range, "idx (7) is out of range (3)".
  PBCodable& at(std::size_t index) const;
  bool ownsMemory() const noexcept { return hasCounted_ || ownsTable_; }

  // Takes over one reference on the element's block. The home is the block of the message that this list belongs to, if
  // it has one.
  void addCounted(PBCodable* element, const Block* home);
  // The element lies in the home of this list.
  void addLocal(PBCodable* element, Block& home) {
    if (count_ == capacity_) {
      if (capacity_ == 0) {
        elements_ = static_cast<ElementPointer*>(home.allocate(firstCapacity * sizeof(ElementPointer)));
        capacity_ = firstCapacity;
      } else {
        grow(&home);
      }
    }
    elements_[count_++] = ElementPointer::local(element);
  }
  void clear() noexcept;
  // Clears, and gives the memory back.
  void release() noexcept;
  void swap(PBMessageList& other) noexcept;

 private:
  static constexpr std::uint32_t firstCapacity = 8;

  void grow(Block* home);

  ElementPointer* elements_ = nullptr;
  std::uint32_t count_ = 0;
  std::uint32_t capacity_ = 0;
  bool hasCounted_ = false;
  bool ownsTable_ = false;
};

}  // namespace probeview
