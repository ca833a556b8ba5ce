// SPDX-License-Identifier: Apache-2.0
//
// The typed value that travels from a decoded message to a cell of a page.
//
// A Value knows exactly what it is: signed or unsigned, 32 or 64 bits, float or double, text or bytes. Nothing is ever
// widened on the way, because an engineer must be able to trust the sign and the width of what is shown.
//
// Cost: 32 bytes; short texts (up to 30 bytes) and constants need no allocation; lists and dictionaries are shared
// between copies and detached on the first write. Copies may be handed to another thread; one Value is not to be used
// by two threads at once.
#pragma once

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <utility>

#include "values/holder_count.h"

namespace probeview {

class Dictionary;
class List;

enum class ValueKind : std::uint8_t {
  Int32,
  UInt32,
  Int64,
  UInt64,
  Bool,
  Float,
  Double,
  Text,
  Bytes,
  List,
  Dictionary,
};

// A text that lives as long as the process and holds nothing that printing would escape, such as an identifier.
struct Identifier {
  std::string_view text;
};

class Value {
 public:
  // An empty text.
  Value() noexcept : storage_{} {}

  // Numbers keep the type they are given; no other conversion is offered.
  template <std::same_as<std::int32_t> T>
  Value(T number) noexcept : kind_(ValueKind::Int32) {
    store(number);
  }
  template <std::same_as<std::uint32_t> T>
  Value(T number) noexcept : kind_(ValueKind::UInt32) {
    store(number);
  }
  template <std::same_as<std::int64_t> T>
  Value(T number) noexcept : kind_(ValueKind::Int64) {
    store(number);
  }
  template <std::same_as<std::uint64_t> T>
  Value(T number) noexcept : kind_(ValueKind::UInt64) {
    store(number);
  }
  template <std::same_as<bool> T>
  Value(T truth) noexcept : kind_(ValueKind::Bool) {
    store(truth);
  }
  template <std::same_as<float> T>
  Value(T number) noexcept : kind_(ValueKind::Float) {
    store(number);
  }
  template <std::same_as<double> T>
  Value(T number) noexcept : kind_(ValueKind::Double) {
    store(number);
  }
  // Refers to the text.
  Value(Identifier name) noexcept : Value(name.text, formIdentifier) {}
  Value(List list) noexcept;
  Value(Dictionary dictionary) noexcept;

  // Copies the bytes of the text.
  static Value text(std::string_view text);
  // Refers to the text, which must live as long as the process (an enumeration name, a literal).
  static Value constant(std::string_view text) noexcept { return Value(text, formConstant); }
  // Copies the bytes.
  static Value bytes(std::span<const std::uint8_t> bytes);

  Value(const Value& other) noexcept {
    take(other);
    if (isShared()) retain();
  }
  Value(Value&& other) noexcept {
    take(other);
    other.becomeEmptyText();
  }
  Value& operator=(const Value& other) noexcept { return *this = Value(other); }
  Value& operator=(Value&& other) noexcept {
    if (this == &other) return *this;
    // Released last: the other may lie inside what this one held.
    const Value previous(std::move(*this));
    take(other);
    other.becomeEmptyText();
    return *this;
  }
  ~Value() {
    if (isShared()) release();
  }

  ValueKind kind() const noexcept { return kind_; }

  // An integer of any width and sign whose number a signed 32-bit integer can hold; absent for everything else,
  // booleans included.
  std::optional<std::int32_t> integer32() const noexcept;
  // A signed 64-bit integer, and nothing else: the integer kind of event and command dictionaries.
  std::optional<std::int64_t> int64() const noexcept;
  // Any number but a boolean, as a double.
  std::optional<double> real() const noexcept;
  std::optional<bool> boolean() const noexcept;
  std::optional<std::string_view> text() const noexcept;
  std::optional<std::span<const std::uint8_t>> bytes() const noexcept;
  // Null when the value is of another kind. Valid until the value changes or moves.
  const List* list() const noexcept { return kind_ == ValueKind::List ? container<List>() : nullptr; }
  const Dictionary* dictionary() const noexcept {
    return kind_ == ValueKind::Dictionary ? container<Dictionary>() : nullptr;
  }
  // For changing the content in place; copies of this value keep the old content. Null when of another kind.
  List* mutableList();
  Dictionary* mutableDictionary();

  // The numbers as they are stored; the kind must be the one named.
  std::int32_t rawInt32() const noexcept { return load<std::int32_t>(); }
  std::uint32_t rawUInt32() const noexcept { return load<std::uint32_t>(); }
  std::int64_t rawInt64() const noexcept { return load<std::int64_t>(); }
  std::uint64_t rawUInt64() const noexcept { return load<std::uint64_t>(); }
  bool rawBool() const noexcept { return load<bool>(); }
  float rawFloat() const noexcept { return load<float>(); }
  double rawDouble() const noexcept { return load<double>(); }
  std::string_view rawText() const noexcept { return {data(), size()}; }
  // Whether the text is known to hold nothing that printing would escape.
  bool isIdentifier() const noexcept { return form_ == formIdentifier; }

  // Same kind and same content; floating-point numbers by ==, dictionaries regardless of their order.
  friend bool operator==(const Value& left, const Value& right) noexcept;

 private:
  static constexpr std::size_t inlineCapacity = 30;
  static constexpr std::uint8_t formConstant = 31;
  static constexpr std::uint8_t formIdentifier = 32;
  // The storage holds one pointer, to memory that begins with a count of its holders: that of a longer text, or of the
  // elements of a list or dictionary.
  static constexpr std::uint8_t formShared = 33;

  struct View {
    const char* data;
    std::size_t size;
  };
  // A text or byte buffer that is never changed once made, shared by all copies. The characters stand behind it.
  struct Buffer {
    HolderCount holders;
    std::uint32_t size;
    char* data() noexcept { return reinterpret_cast<char*>(this + 1); }
  };
  // The storage is plain bytes, so that a text can use all that the kind and the form leave free.
  template <typename T>
  T load() const noexcept {
    T content;
    std::memcpy(&content, storage_, sizeof content);
    return content;
  }
  template <typename T>
  void store(T content) noexcept {
    std::memcpy(storage_, &content, sizeof content);
  }

  Value(ValueKind kind, std::string_view content);
  Value(std::string_view text, std::uint8_t form) noexcept : form_(form) { store(View{text.data(), text.size()}); }
  bool isConstant() const noexcept { return form_ == formConstant || form_ == formIdentifier; }
  const char* data() const noexcept {
    if (form_ <= inlineCapacity) return storage_;
    return isConstant() ? load<View>().data : load<Buffer*>()->data();
  }
  std::size_t size() const noexcept {
    if (form_ <= inlineCapacity) return form_;
    return isConstant() ? load<View>().size : load<Buffer*>()->size;
  }
  // A list or dictionary is one pointer, which lies in the storage and moves with its bytes.
  template <typename Container>
  const Container* container() const noexcept {
    return reinterpret_cast<const Container*>(storage_);
  }
  template <typename Container>
  Container* unsharedContainer();
  // One holder more, or less, of what is shared; only for a value that shares.
  void retain() const noexcept;
  void release() noexcept;
  void becomeEmptyText() noexcept {
    form_ = 0;
    kind_ = ValueKind::Text;
  }
  void take(const Value& other) noexcept {
    std::memcpy(storage_, other.storage_, sizeof storage_);
    form_ = other.form_;
    kind_ = other.kind_;
  }
  bool isShared() const noexcept { return form_ == formShared; }

  alignas(8) char storage_[inlineCapacity];
  // The length of text and bytes that lie inline, else one of the three forms; 0 for numbers.
  std::uint8_t form_ = 0;
  ValueKind kind_ = ValueKind::Text;
};

}  // namespace probeview
