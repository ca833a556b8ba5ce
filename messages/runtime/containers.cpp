// SPDX-License-Identifier: Apache-2.0
#include <array>
#include <cstring>
#include <stdexcept>
#include <string>

#include "messages/runtime/byte_field.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/message_list.h"
#include "messages/runtime/repeated_scalar.h"

namespace probeview {

void throwIndexOutOfRange(std::size_t index, std::size_t count) {
  throw std::out_of_range("idx (" + std::to_string(index) + ") is out of range (" + std::to_string(count) + ")");
}

void PBByteField::throwTooLong() { throw std::length_error("a field has at most 4294967295 bytes"); }

PBByteField::PBByteField(PBByteField&& other) noexcept { *this = std::move(other); }

PBByteField& PBByteField::operator=(PBByteField&& other) noexcept {
  std::swap(data_, other.data_);
  std::swap(size_, other.size_);
  std::swap(ownsMemory_, other.ownsMemory_);
  return *this;
}

void PBByteField::set(std::span<const std::uint8_t> bytes) {
  if (bytes.size() > longest) throwTooLong();
  if (bytes.empty()) {
    clear();
    data_ = noBytes;
    return;
  }
  auto* copy = new std::uint8_t[bytes.size()];
  std::memcpy(copy, bytes.data(), bytes.size());
  clear();
  data_ = copy;
  size_ = static_cast<std::uint32_t>(bytes.size());
  ownsMemory_ = true;
}

void PBByteField::clear() noexcept {
  if (ownsMemory_) delete[] data_;
  data_ = nullptr;
  size_ = 0;
  ownsMemory_ = false;
}

void PBMessageField::clear() noexcept {
  if (element_.isCounted()) element()->block()->release();
  element_ = ElementPointer();
}

void PBMessageField::setCounted(PBCodable* element, const Block* home) noexcept {
  clear();
  if (element == nullptr) return;
  if (element->block() == home) {
    element->block()->release();
    element_ = ElementPointer::local(element);
  } else {
    element_ = ElementPointer::counted(element);
  }
}

PBCodable& PBMessageList::at(std::size_t index) const {
  if (index >= count_) throwIndexOutOfRange(index, count_);
  return *elements_[index].get();
}

void PBMessageList::addCounted(PBCodable* element, const Block* home) {
  if (count_ == capacity_) grow(nullptr);
  if (element->block() == home) {
    element->block()->release();
    elements_[count_++] = ElementPointer::local(element);
  } else {
    elements_[count_++] = ElementPointer::counted(element);
    hasCounted_ = true;
  }
}

void PBMessageList::clear() noexcept {
  if (hasCounted_) {
    for (std::uint32_t index = 0; index < count_; ++index) {
      if (elements_[index].isCounted()) elements_[index].get()->block()->release();
    }
    hasCounted_ = false;
  }
  count_ = 0;
}

void PBMessageList::release() noexcept {
  clear();
  if (ownsTable_) delete[] elements_;
  elements_ = nullptr;
  capacity_ = 0;
  ownsTable_ = false;
}

void PBMessageList::grow(Block* home) {
  const std::uint32_t capacity = capacity_ == 0 ? firstCapacity : 2 * capacity_;
  if (capacity >= 1U << 30) throw std::length_error("a list of messages has at most 536870912 of them");
  auto* elements = home != nullptr ? static_cast<ElementPointer*>(home->allocate(capacity * sizeof(ElementPointer)))
                                   : new ElementPointer[capacity];
  if (count_ != 0) std::memcpy(static_cast<void*>(elements), elements_, count_ * sizeof(ElementPointer));
  if (ownsTable_) delete[] elements_;
  elements_ = elements;
  capacity_ = capacity;
  ownsTable_ = home == nullptr;
}

void PBMessageList::swap(PBMessageList& other) noexcept {
  std::swap(elements_, other.elements_);
  std::swap(count_, other.count_);
  std::swap(capacity_, other.capacity_);
  std::swap(hasCounted_, other.hasCounted_);
  std::swap(ownsTable_, other.ownsTable_);
}

}  // namespace probeview
