// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/contents.h"

#include <concepts>
#include <utility>

#include "messages/runtime/message_internals.h"
#include "messages/runtime/with_member.h"

namespace probeview {

namespace {

template <typename Type>
concept Scalar = std::integral<Type>;

// What can be done to a member of each type. Scalars know nothing of their presence: their bits are kept apart.

// Whether there is something, where no bit tells.
struct Presence {
  bool operator()(const Scalar auto&) const noexcept { return true; }
  bool operator()(const PBByteField& field) const noexcept { return field.isPresent(); }
  bool operator()(const PBMessageField& field) const noexcept { return field.isPresent(); }
  bool operator()(const PBMessageList& list) const noexcept { return list.count() != 0; }
  template <typename Number>
  bool operator()(const PBRepeatedNumber<Number>& list) const noexcept {
    return list.count() != 0;
  }
};

// One reference on the block in which the element lies, for a second holder.
PBCodable* retained(PBCodable* element) noexcept {
  element->block()->retain();
  return element;
}

struct Copy {
  const Block* home;  // of the target

  template <Scalar Type>
  void operator()(Type& to, const Type& from) const noexcept {
    to = from;
  }
  void operator()(PBByteField& to, const PBByteField& from) const { to.set(from.bytes()); }
  void operator()(PBMessageField& to, const PBMessageField& from) const noexcept {
    to.setCounted(retained(from.element()), home);
  }
  void operator()(PBMessageList& to, const PBMessageList& from) const {
    to.clear();
    for (std::size_t index = 0; index < from.count(); ++index) to.addCounted(retained(&from[index]), home);
  }
  template <typename Number>
  void operator()(PBRepeatedNumber<Number>& to, const PBRepeatedNumber<Number>& from) const {
    to.set(from.values());
  }
};

struct Merge : Copy {
  const MessageDescriptor* element;  // of the row

  using Copy::operator();
  void operator()(PBMessageField& to, const PBMessageField& from) const {
    if (to.isPresent()) {
      mergeContents(*to.element(), *from.element(), *element);
    } else {
      Copy::operator()(to, from);
    }
  }
  void operator()(PBMessageList& to, const PBMessageList& from) const {
    // The number of elements is read once: merging a message into itself doubles its lists.
    const std::size_t count = from.count();
    for (std::size_t index = 0; index < count; ++index) to.addCounted(retained(&from[index]), home);
  }
  template <typename Number>
  void operator()(PBRepeatedNumber<Number>& to, const PBRepeatedNumber<Number>& from) const {
    to.append(from.values());
  }
};

// For a target that is empty.
struct DeepCopy {
  const Block* home;                 // of the target
  Block* block;                      // for all copies; without one each element gets one of its own
  const MessageDescriptor* element;  // of the row

  template <Scalar Type>
  void operator()(Type& to, const Type& from) const noexcept {
    to = from;
  }
  void operator()(PBByteField& to, const PBByteField& from) const {
    if (block != nullptr) {
      to.set(from.bytes(), *block);
    } else {
      to.set(from.bytes());
    }
  }
  void operator()(PBMessageField& to, const PBMessageField& from) const {
    PBCodable* const made = copied(*from.element());
    if (block != nullptr) {
      to.setLocal(made);
    } else {
      to.setCounted(made, home);
    }
  }
  void operator()(PBMessageList& to, const PBMessageList& from) const {
    for (std::size_t index = 0; index < from.count(); ++index) {
      PBCodable* const made = copied(from[index]);
      if (block != nullptr) {
        to.addLocal(made, *block);
      } else {
        to.addCounted(made, home);
      }
    }
  }
  template <typename Number>
  void operator()(PBRepeatedNumber<Number>& to, const PBRepeatedNumber<Number>& from) const {
    to.set(from.values(), block);
  }

  PBCodable* copied(const PBCodable& original) const {
    Block* const elementBlock = block != nullptr ? block : Block::makeFor(element->size);
    PBCodable* const made = MessageInternals::makeElement(*element, *elementBlock);
    copyDeeply(*made, original, *element, block);
    return made;
  }
};

// Of members that are both present.
struct Equality {
  const MessageDescriptor* element;  // of the row

  bool operator()(const Scalar auto& one, const Scalar auto& other) const noexcept { return one == other; }
  bool operator()(const PBByteField& one, const PBByteField& other) const noexcept {
    return one.text() == other.text();
  }
  bool operator()(const PBMessageField& one, const PBMessageField& other) const noexcept {
    return areEqual(*one.element(), *other.element());
  }
  bool operator()(const PBMessageList& one, const PBMessageList& other) const noexcept {
    bool isEqual = one.count() == other.count();
    for (std::size_t index = 0; isEqual && index < one.count(); ++index) isEqual = areEqual(one[index], other[index]);
    return isEqual;
  }
  template <typename Number>
  bool operator()(const PBRepeatedNumber<Number>& one, const PBRepeatedNumber<Number>& other) const noexcept {
    return one.isEqual(other);
  }

  bool areEqual(const PBCodable& one, const PBCodable& other) const noexcept {
    return &one == &other || haveEqualContents(one, other, *element);
  }
};

struct Hash {
  const MessageDescriptor* element;  // of the row

  // Signed numbers are extended to 64 bits.
  std::uint64_t operator()(const Scalar auto& value) const noexcept {
    return static_cast<std::uint64_t>(value) * 0x9E3779B1;
  }
  std::uint64_t operator()(const PBByteField& field) const noexcept {
    std::uint64_t hash = 0xCBF29CE484222325U;
    for (const std::uint8_t byte : field.bytes()) hash = (hash ^ byte) * 0x100000001B3U;
    return hash;
  }
  std::uint64_t operator()(const PBMessageField& field) const noexcept {
    return hashOfContents(*field.element(), *element);
  }
  // The order of the elements counts.
  std::uint64_t operator()(const PBMessageList& list) const noexcept {
    std::uint64_t hash = list.count();
    for (std::size_t index = 0; index < list.count(); ++index) {
      hash = hash * 0x100000001B3U ^ hashOfContents(list[index], *element);
    }
    return hash;
  }
  template <typename Number>
  std::uint64_t operator()(const PBRepeatedNumber<Number>& list) const noexcept {
    return list.hash();
  }
};

}  // namespace

bool isPresent(const PBCodable& message, const FieldDescriptor& row) noexcept {
  if (isScalar(row.kind)) return (MessageInternals::presence(message) >> row.number & 1U) != 0;
  return withMember(row, Presence{}, message);
}

void copyContents(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor) {
  if (&target == &source) return;
  if (!descriptor.isFlat) MessageInternals::noteOwnedMemory(target);
  for (const FieldDescriptor& row : descriptor.fields()) {
    if (isPresent(source, row)) withMember(row, Copy{target.block()}, target, source);
  }
  MessageInternals::presence(target) |= MessageInternals::presence(source);
}

void copyDeeply(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor, Block* block) {
  if (block == nullptr && !descriptor.isFlat) MessageInternals::noteOwnedMemory(target);
  for (const FieldDescriptor& row : descriptor.fields()) {
    if (isPresent(source, row)) withMember(row, DeepCopy{target.block(), block, row.element}, target, source);
  }
  MessageInternals::presence(target) = MessageInternals::presence(source);
}

void moveContents(PBCodable& target, PBCodable& source, const MessageDescriptor& descriptor) noexcept {
  MessageInternals::presence(target) = std::exchange(MessageInternals::presence(source), 0);
  std::swap(MessageInternals::block(target), MessageInternals::block(source));
  for (const FieldDescriptor& row : descriptor.fields()) {
    withMember(
        row, [](auto& to, auto& from) noexcept { to = std::move(from); }, target, source);
  }
}

void mergeContents(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor) {
  if (!descriptor.isFlat) MessageInternals::noteOwnedMemory(target);
  for (const FieldDescriptor& row : descriptor.fields()) {
    if (isPresent(source, row)) withMember(row, Merge{{target.block()}, row.element}, target, source);
  }
  MessageInternals::presence(target) |= MessageInternals::presence(source);
}

bool haveEqualContents(const PBCodable& left, const PBCodable& right, const MessageDescriptor& descriptor) noexcept {
  for (const FieldDescriptor& row : descriptor.fields()) {
    const bool isThere = isPresent(left, row);
    if (isThere != isPresent(right, row)) return false;
    if (isThere && !withMember(row, Equality{row.element}, left, right)) return false;
  }
  return true;
}

std::uint64_t hashOfContents(const PBCodable& message, const MessageDescriptor& descriptor) noexcept {
  std::uint64_t hash = 0;
  for (const FieldDescriptor& row : descriptor.fields()) {
    if (isPresent(message, row)) hash ^= withMember(row, Hash{row.element}, message);
  }
  return hash;
}

}  // namespace probeview
