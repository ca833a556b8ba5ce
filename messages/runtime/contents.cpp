// SPDX-License-Identifier: Apache-2.0
//
// Copying, merging, comparing and hashing.
#include <algorithm>

#include "messages/runtime/table_walker.h"

namespace probeview {

namespace {

// One reference on the block in which the element lies, for a second holder.
PBCodable* retained(PBCodable* element) noexcept {
  element->block()->retain();
  return element;
}

constexpr std::uint64_t hashFactor = 0x9E3779B1;

std::uint64_t hashBytes(std::span<const std::uint8_t> bytes) noexcept {
  std::uint64_t hash = 0xCBF29CE484222325U;
  for (const std::uint8_t byte : bytes) hash = (hash ^ byte) * 0x100000001B3U;
  return hash;
}

}  // namespace

bool TableWalker::isPresent(const PBCodable& message, const FieldDescriptor& row) noexcept {
  switch (row.kind) {
    case FieldKind::UInt64:
    case FieldKind::UInt32:
    case FieldKind::Int32:
    case FieldKind::Enumeration:
    case FieldKind::SInt32:
    case FieldKind::Bool:
      return message.hasBit(row.number);
    case FieldKind::Bytes:
    case FieldKind::Text:
      return (message.*row.member.bytes).isPresent();
    case FieldKind::Message:
      return (message.*row.member.message).isPresent();
    case FieldKind::RepeatedMessage:
      return (message.*row.member.messages).count() != 0;
    case FieldKind::RepeatedUInt32:
      return (message.*row.member.unsigned32List).count() != 0;
    case FieldKind::RepeatedSInt32:
      return (message.*row.member.signed32List).count() != 0;
  }
  return false;
}

namespace {

// The value of a scalar alone; its bit is the caller's.
void copyScalar(PBCodable& target, const PBCodable& source, const FieldDescriptor& row) noexcept {
  switch (row.kind) {
    case FieldKind::UInt64:
      target.*row.member.unsigned64 = source.*row.member.unsigned64;
      break;
    case FieldKind::UInt32:
      target.*row.member.unsigned32 = source.*row.member.unsigned32;
      break;
    case FieldKind::Int32:
    case FieldKind::Enumeration:
    case FieldKind::SInt32:
      target.*row.member.signed32 = source.*row.member.signed32;
      break;
    case FieldKind::Bool:
      target.*row.member.truth = source.*row.member.truth;
      break;
    case FieldKind::Bytes:
    case FieldKind::Text:
    case FieldKind::Message:
    case FieldKind::RepeatedMessage:
    case FieldKind::RepeatedUInt32:
    case FieldKind::RepeatedSInt32:
      break;
  }
}

}  // namespace

void TableWalker::copy(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor) {
  if (&target == &source) return;
  if (!descriptor.isFlat) target.noteOwnedMemory();
  for (const FieldDescriptor& row : descriptor.fields()) {
    if (!isPresent(source, row)) continue;
    switch (row.kind) {
      case FieldKind::UInt64:
      case FieldKind::UInt32:
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
      case FieldKind::Bool:
        copyScalar(target, source, row);
        target.setBit(row.number);
        break;
      case FieldKind::Bytes:
      case FieldKind::Text:
        (target.*row.member.bytes).set((source.*row.member.bytes).bytes());
        break;
      case FieldKind::Message:
        (target.*row.member.message).setCounted(retained((source.*row.member.message).element()), target.block_);
        break;
      case FieldKind::RepeatedMessage: {
        const PBMessageList& elements = source.*row.member.messages;
        PBMessageList& list = target.*row.member.messages;
        list.clear();
        for (std::size_t index = 0; index < elements.count(); ++index) {
          list.addCounted(retained(&elements[index]), target.block_);
        }
        break;
      }
      case FieldKind::RepeatedUInt32:
        (target.*row.member.unsigned32List).set((source.*row.member.unsigned32List).values());
        break;
      case FieldKind::RepeatedSInt32:
        (target.*row.member.signed32List).set((source.*row.member.signed32List).values());
        break;
    }
  }
}

void TableWalker::copyDeep(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor,
                           Block* block) {
  if (block == nullptr && !descriptor.isFlat) target.noteOwnedMemory();
  target._has = source._has;
  // Without a block for all, each element gets one of its own.
  const auto copyElement = [block](const PBCodable& element, const MessageDescriptor& elementDescriptor) {
    Block* elementBlock = block != nullptr ? block : Block::makeFor(elementDescriptor.size);
    PBCodable* made = makeElement(elementDescriptor, *elementBlock);
    copyDeep(*made, element, elementDescriptor, block);
    return made;
  };
  for (const FieldDescriptor& row : descriptor.fields()) {
    switch (row.kind) {
      case FieldKind::UInt64:
      case FieldKind::UInt32:
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
      case FieldKind::Bool:
        if (source.hasBit(row.number)) copyScalar(target, source, row);
        break;
      case FieldKind::Bytes:
      case FieldKind::Text: {
        const PBByteField& field = source.*row.member.bytes;
        if (!field.isPresent()) break;
        if (block != nullptr) {
          (target.*row.member.bytes).set(field.bytes(), *block);
        } else {
          (target.*row.member.bytes).set(field.bytes());
        }
        break;
      }
      case FieldKind::Message: {
        const PBCodable* element = (source.*row.member.message).element();
        if (element == nullptr) break;
        PBCodable* made = copyElement(*element, *row.element);
        if (block != nullptr) {
          (target.*row.member.message).setLocal(made);
        } else {
          (target.*row.member.message).setCounted(made, target.block_);
        }
        break;
      }
      case FieldKind::RepeatedMessage: {
        const PBMessageList& elements = source.*row.member.messages;
        PBMessageList& list = target.*row.member.messages;
        for (std::size_t index = 0; index < elements.count(); ++index) {
          PBCodable* made = copyElement(elements[index], *row.element);
          if (block != nullptr) {
            list.addLocal(made, *block);
          } else {
            list.addCounted(made, target.block_);
          }
        }
        break;
      }
      case FieldKind::RepeatedUInt32:
        (target.*row.member.unsigned32List).set((source.*row.member.unsigned32List).values(), block);
        break;
      case FieldKind::RepeatedSInt32:
        (target.*row.member.signed32List).set((source.*row.member.signed32List).values(), block);
        break;
    }
  }
}

void TableWalker::move(PBCodable& target, PBCodable& source, const MessageDescriptor& descriptor) noexcept {
  target._has = std::exchange(source._has, 0);
  std::swap(target.block_, source.block_);
  for (const FieldDescriptor& row : descriptor.fields()) {
    switch (row.kind) {
      case FieldKind::UInt64:
      case FieldKind::UInt32:
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
      case FieldKind::Bool:
        copyScalar(target, source, row);
        break;
      case FieldKind::Bytes:
      case FieldKind::Text:
        target.*row.member.bytes = std::move(source.*row.member.bytes);
        break;
      case FieldKind::Message:
        target.*row.member.message = std::move(source.*row.member.message);
        break;
      case FieldKind::RepeatedMessage:
        target.*row.member.messages = std::move(source.*row.member.messages);
        break;
      case FieldKind::RepeatedUInt32:
        target.*row.member.unsigned32List = std::move(source.*row.member.unsigned32List);
        break;
      case FieldKind::RepeatedSInt32:
        target.*row.member.signed32List = std::move(source.*row.member.signed32List);
        break;
    }
  }
}

void TableWalker::merge(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor) {
  if (!descriptor.isFlat) target.noteOwnedMemory();
  for (const FieldDescriptor& row : descriptor.fields()) {
    if (!isPresent(source, row)) continue;
    switch (row.kind) {
      case FieldKind::UInt64:
      case FieldKind::UInt32:
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
      case FieldKind::Bool:
        copyScalar(target, source, row);
        target.setBit(row.number);
        break;
      case FieldKind::Bytes:
      case FieldKind::Text:
        (target.*row.member.bytes).set((source.*row.member.bytes).bytes());
        break;
      case FieldKind::Message: {
        PBMessageField& field = target.*row.member.message;
        PBCodable* element = (source.*row.member.message).element();
        if (field.isPresent()) {
          merge(*field.element(), *element, *row.element);
        } else {
          field.setCounted(retained(element), target.block_);
        }
        break;
      }
      case FieldKind::RepeatedMessage: {
        const PBMessageList& elements = source.*row.member.messages;
        PBMessageList& list = target.*row.member.messages;
        // The number of elements is read once: merging a message into itself doubles its lists.
        const std::size_t count = elements.count();
        for (std::size_t index = 0; index < count; ++index) {
          list.addCounted(retained(&elements[index]), target.block_);
        }
        break;
      }
      case FieldKind::RepeatedUInt32:
        (target.*row.member.unsigned32List).append((source.*row.member.unsigned32List).values());
        break;
      case FieldKind::RepeatedSInt32:
        (target.*row.member.signed32List).append((source.*row.member.signed32List).values());
        break;
    }
  }
}

bool TableWalker::areEqual(const PBCodable& left, const PBCodable& right,
                           const MessageDescriptor& descriptor) noexcept {
  if (left._has != right._has) return false;
  for (const FieldDescriptor& row : descriptor.fields()) {
    bool isEqual = true;
    switch (row.kind) {
      case FieldKind::UInt64:
        isEqual = !left.hasBit(row.number) || left.*row.member.unsigned64 == right.*row.member.unsigned64;
        break;
      case FieldKind::UInt32:
        isEqual = !left.hasBit(row.number) || left.*row.member.unsigned32 == right.*row.member.unsigned32;
        break;
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
        isEqual = !left.hasBit(row.number) || left.*row.member.signed32 == right.*row.member.signed32;
        break;
      case FieldKind::Bool:
        isEqual = !left.hasBit(row.number) || left.*row.member.truth == right.*row.member.truth;
        break;
      case FieldKind::Bytes:
      case FieldKind::Text: {
        const PBByteField& one = left.*row.member.bytes;
        const PBByteField& other = right.*row.member.bytes;
        isEqual = one.isPresent() == other.isPresent() && one.text() == other.text();
        break;
      }
      case FieldKind::Message: {
        const PBCodable* one = (left.*row.member.message).element();
        const PBCodable* other = (right.*row.member.message).element();
        isEqual = one == other || (one != nullptr && other != nullptr && areEqual(*one, *other, *row.element));
        break;
      }
      case FieldKind::RepeatedMessage: {
        const PBMessageList& one = left.*row.member.messages;
        const PBMessageList& other = right.*row.member.messages;
        isEqual = one.count() == other.count();
        for (std::size_t index = 0; isEqual && index < one.count(); ++index) {
          isEqual = &one[index] == &other[index] || areEqual(one[index], other[index], *row.element);
        }
        break;
      }
      case FieldKind::RepeatedUInt32:
        isEqual = (left.*row.member.unsigned32List).isEqual(right.*row.member.unsigned32List);
        break;
      case FieldKind::RepeatedSInt32:
        isEqual = (left.*row.member.signed32List).isEqual(right.*row.member.signed32List);
        break;
    }
    if (!isEqual) return false;
  }
  return true;
}

std::uint64_t TableWalker::hash(const PBCodable& message, const MessageDescriptor& descriptor) noexcept {
  std::uint64_t hash = 0;
  for (const FieldDescriptor& row : descriptor.fields()) {
    if (!isPresent(message, row)) continue;
    switch (row.kind) {
      case FieldKind::UInt64:
        hash ^= message.*row.member.unsigned64 * hashFactor;
        break;
      case FieldKind::UInt32:
        hash ^= message.*row.member.unsigned32 * hashFactor;
        break;
      case FieldKind::Int32:
      case FieldKind::Enumeration:
      case FieldKind::SInt32:
        hash ^= static_cast<std::uint64_t>(std::int64_t{message.*row.member.signed32}) * hashFactor;
        break;
      case FieldKind::Bool:
        hash ^= (message.*row.member.truth ? 1U : 0U) * hashFactor;
        break;
      case FieldKind::Bytes:
      case FieldKind::Text:
        hash ^= hashBytes((message.*row.member.bytes).bytes());
        break;
      case FieldKind::Message:
        hash ^= TableWalker::hash(*(message.*row.member.message).element(), *row.element);
        break;
      case FieldKind::RepeatedMessage: {
        const PBMessageList& list = message.*row.member.messages;
        // The order of the elements counts.
        std::uint64_t listHash = list.count();
        for (std::size_t index = 0; index < list.count(); ++index) {
          listHash = listHash * 0x100000001B3U ^ TableWalker::hash(list[index], *row.element);
        }
        hash ^= listHash;
        break;
      }
      case FieldKind::RepeatedUInt32:
        hash ^= (message.*row.member.unsigned32List).hash();
        break;
      case FieldKind::RepeatedSInt32:
        hash ^= (message.*row.member.signed32List).hash();
        break;
    }
  }
  return hash;
}

}  // namespace probeview
