// SPDX-License-Identifier: Apache-2.0
//
// The base of all messages. What a message class has is a table of its fields (field_table.h); what it can do is
// written once, here, by walking that table.
//
// A message and the messages with which it shares elements belong to one thread at a time.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <utility>

#include "messages/runtime/block.h"
#include "messages/runtime/field_descriptor.h"
#include "messages/runtime/wire_format.h"
#include "values/dictionary.h"

namespace probeview {

class PBDataReader;
class PBDataWriter;

class PBCodable {
 public:
  virtual ~PBCodable() {
    if (block_ != nullptr && !isElement_) block_->release();
  }

  virtual const MessageDescriptor& descriptor() const noexcept = 0;
  std::string_view className() const noexcept { return descriptor().name; }

  // Decodes the reader's data into this message: scalars replace, lists grow. False when the data ends too early or
  // holds something that cannot be skipped; what was decoded before that stays. Only reset() gives memory free again.
  bool readFrom(PBDataReader& reader);
  // Appends the message's encoding, fields in ascending order of their numbers.
  void writeTo(PBDataWriter& writer) const;

  // Every present field under its key, in the order of the field numbers; empty lists are left out.
  Dictionary dictionaryRepresentation() const;
  // The class name, a blank and the printed dictionary.
  std::string description() const;

  // The three that take another message do nothing and answer false if it is not of exactly the same class.

  // Overwrites in the target what is present here. Nested messages are shared with the target.
  bool copyTo(PBCodable& target) const;
  // Takes over what is present in the other; its list elements are appended and shared.
  bool mergeFrom(const PBCodable& other);
  bool isEqual(const PBCodable& other) const noexcept;
  // A copy that shares nothing with this message.
  std::unique_ptr<PBCodable> copyWithZone() const;
  // Equal messages have equal hashes.
  std::uint64_t hash() const noexcept;

  // Back to an empty message, keeping its memory for what is decoded next.
  void reset();
  // Whether the field, a row of this message's own table, is present: a scalar's bit is set, an object is there, a list
  // has elements.
  bool hasField(const FieldDescriptor& field) const noexcept;
  // The block in which an element lies; for others the block that holds what they own, null if they own nothing.
  Block* block() const noexcept { return block_; }

 protected:
  PBCodable() noexcept = default;
  // An element, which lies in the block.
  explicit PBCodable(Block& block) noexcept : block_(&block), isElement_(true) {}
  PBCodable(const PBCodable&) noexcept {}  // the content is copied by the class, through its table
  PBCodable& operator=(const PBCodable&) = delete;

  // The types that the rows of a field table name.
  template <FieldKind Kind, typename Type>
  struct FieldType {
    using Stored = Type;
    template <typename Message>
    static constexpr FieldDescriptor describe(std::uint16_t number, std::string_view name,
                                              Stored Message::*member) noexcept {
      FieldDescriptor row;
      row.key = wire::key(number, isScalar(Kind) ? wire::WireType::Varint : wire::WireType::LengthDelimited);
      row.number = number;
      row.kind = Kind;
      row.member = FieldMember(static_cast<Stored PBCodable::*>(member));
      row.name = name;
      return row;
    }
  };
  using uint64 = FieldType<FieldKind::UInt64, std::uint64_t>;
  using uint32 = FieldType<FieldKind::UInt32, std::uint32_t>;
  using int32 = FieldType<FieldKind::Int32, std::int32_t>;
  using sint32 = FieldType<FieldKind::SInt32, std::int32_t>;
  using boolean = FieldType<FieldKind::Bool, bool>;

  template <typename Names>
  struct enumeration : FieldType<FieldKind::Enumeration, std::int32_t> {
    template <typename Message>
    static constexpr FieldDescriptor describe(std::uint16_t number, std::string_view name,
                                              std::int32_t Message::*member) noexcept {
      FieldDescriptor row = FieldType<FieldKind::Enumeration, std::int32_t>::describe(number, name, member);
      row.enumeration = &Names::table;
      return row;
    }
  };

  // Bytes are set from a span, copied; null takes them away.
  struct bytes : FieldType<FieldKind::Bytes, PBByteField> {
    using Value = std::span<const std::uint8_t>;
    static Value get(const PBByteField& field) noexcept { return field.bytes(); }
    static void set(PBByteField& field, Value value, const Block*) { field.set(value); }
  };
  // Texts are set from a view, copied; null takes them away.
  struct string : FieldType<FieldKind::Text, PBByteField> {
    using Value = std::string_view;
    static Value get(const PBByteField& field) noexcept { return field.text(); }
    static void set(PBByteField& field, Value value, const Block*) {
      field.set({reinterpret_cast<const std::uint8_t*>(value.data()), value.size()});
    }
  };
  // Nested messages are shared with whoever set them; null takes them away.
  template <typename Element>
  struct message : FieldType<FieldKind::Message, PBMessageField> {
    using Value = Shared<Element>;
    static Value get(const PBMessageField& field) noexcept {
      return field.isPresent() ? Value::of(static_cast<Element&>(*field.element())) : Value(nullptr);
    }
    static void set(PBMessageField& field, Value value, const Block* home) noexcept {
      field.setCounted(value.detach(), home);
    }
    template <typename Message>
    static constexpr FieldDescriptor describe(std::uint16_t number, std::string_view name,
                                              PBMessageField Message::*member) noexcept {
      FieldDescriptor row = FieldType<FieldKind::Message, PBMessageField>::describe(number, name, member);
      row.element = &Element::pbDescriptor;
      return row;
    }
  };

  template <typename Type>
  struct repeated;
  template <typename Nested>
  struct repeated<message<Nested>> : FieldType<FieldKind::RepeatedMessage, PBMessageList> {
    using Element = Nested;
    using Handle = Shared<Element>;
    using View = MessageView<Element>;
    static Handle at(const PBMessageList& list, std::size_t index) {
      return Handle::of(static_cast<Element&>(list.at(index)));
    }
    // A null handle adds nothing.
    static void add(PBMessageList& list, PBCodable& owner, Handle element) {
      owner.noteOwnedMemory();
      if (element) list.addCounted(element.detach(), owner.block());
    }
    // The new elements may be the list's own.
    static void set(PBMessageList& list, PBCodable& owner, View elements) {
      PBMessageList fresh;
      for (Element& element : elements) add(fresh, owner, Handle::of(element));
      list.swap(fresh);
    }
    static void set(PBMessageList& list, PBCodable& owner, std::span<const Handle> elements) {
      PBMessageList fresh;
      for (const Handle& element : elements) add(fresh, owner, element);
      list.swap(fresh);
    }
    template <typename Message>
    static constexpr FieldDescriptor describe(std::uint16_t number, std::string_view name,
                                              PBMessageList Message::*member) noexcept {
      FieldDescriptor row = FieldType<FieldKind::RepeatedMessage, PBMessageList>::describe(number, name, member);
      row.element = &Element::pbDescriptor;
      return row;
    }
  };

  bool hasBit(unsigned number) const noexcept { return (_has >> number & 1U) != 0; }
  void setBit(unsigned number) noexcept { _has |= std::uint64_t{1} << number; }
  void setBit(unsigned number, bool present) noexcept {
    if (present) {
      setBit(number);
    } else {
      _has &= ~(std::uint64_t{1} << number);
    }
  }

  // To be called by whatever may have given this message memory of its own outside its block.
  void noteOwnedMemory() {
    if (isElement_ && !isDestroyedLater_) {
      block_->destroyLater(*this);
      isDestroyedLater_ = true;
    }
  }
  // A deep copy of the other, which is of the same class, into this new message.
  void copyFrom(const PBCodable& other);
  // The same, taking the other's memory where that is possible.
  void moveFrom(PBCodable& other) noexcept;
  // Replaces the content by a deep copy of the other, which is of the same class.
  void assignFrom(const PBCodable& other);

 private:
  friend struct MessageInternals;

  std::uint64_t _has = 0;  // bit n: the scalar field of number n is present
  Block* block_ = nullptr;
  bool isElement_ = false;
  bool isDestroyedLater_ = false;
};

template <>
struct PBCodable::repeated<PBCodable::uint32> : FieldType<FieldKind::RepeatedUInt32, PBRepeatedUInt32> {
  using Number = std::uint32_t;
};
template <>
struct PBCodable::repeated<PBCodable::sint32> : FieldType<FieldKind::RepeatedSInt32, PBRepeatedInt32> {
  using Number = std::int32_t;
};

}  // namespace probeview
