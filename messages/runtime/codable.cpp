// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/codable.h"

#include "messages/runtime/contents.h"
#include "messages/runtime/message_internals.h"
#include "values/printer.h"

namespace probeview {

Dictionary PBCodable::dictionaryRepresentation() const { return descriptor().dictionary(*this); }

std::string PBCodable::description() const {
  std::string text(className());
  text += ' ';
  print(dictionaryRepresentation(), text);
  return text;
}

bool PBCodable::copyTo(PBCodable& target) const {
  if (&descriptor() != &target.descriptor()) return false;
  copyContents(target, *this, descriptor());
  return true;
}

bool PBCodable::mergeFrom(const PBCodable& other) {
  if (&descriptor() != &other.descriptor()) return false;
  mergeContents(*this, other, descriptor());
  return true;
}

bool PBCodable::isEqual(const PBCodable& other) const noexcept {
  return &descriptor() == &other.descriptor() && haveEqualContents(*this, other, descriptor());
}

std::unique_ptr<PBCodable> PBCodable::copyWithZone() const {
  std::unique_ptr<PBCodable> copy = descriptor().make();
  copy->copyFrom(*this);
  return copy;
}

std::uint64_t PBCodable::hash() const noexcept { return hashOfContents(*this, descriptor()); }

bool PBCodable::hasField(const FieldDescriptor& field) const noexcept { return isPresent(*this, field); }

void PBCodable::reset() {
  // Taken out of the message while a new one is made in its place.
  Block* block = block_;
  const bool isElement = isElement_;
  const bool isDestroyedLater = isDestroyedLater_;
  block_ = nullptr;
  descriptor().renew(*this);
  isElement_ = isElement;
  isDestroyedLater_ = isDestroyedLater;
  if (block == nullptr) return;
  if (isElement) {
    block_ = block;
  } else if (block->isUnique()) {
    block->rewind();
    block_ = block;
  } else {
    block->release();  // an element that lies in it is still shared
  }
}

void PBCodable::copyFrom(const PBCodable& other) {
  const MessageDescriptor& fields = other.descriptor();
  Block* block = fields.isFlat || isElement_ ? nullptr : &MessageInternals::blockFor(*this);
  copyDeeply(*this, other, fields, block);
}

void PBCodable::moveFrom(PBCodable& other) noexcept {
  // What lies in a block that others use too stays there.
  if (other.isElement_) {
    copyFrom(other);
  } else {
    moveContents(*this, other, other.descriptor());
  }
}

void PBCodable::assignFrom(const PBCodable& other) {
  if (this == &other) return;
  reset();
  copyFrom(other);
}

}  // namespace probeview
