// SPDX-License-Identifier: Apache-2.0
#include "values/value.h"

#include <cstring>
#include <limits>
#include <new>
#include <utility>

#include "values/dictionary.h"
#include "values/pool.h"

namespace probeview {

struct Value::ListNode {
  static void* operator new(std::size_t size) { return takeMemory(size); }
  static void operator delete(void* memory, std::size_t size) noexcept { giveMemoryBack(memory, size); }

  std::atomic<std::uint32_t> references{1};
  List list;
};

struct Value::DictionaryNode {
  static void* operator new(std::size_t size) { return takeMemory(size); }
  static void operator delete(void* memory, std::size_t size) noexcept { giveMemoryBack(memory, size); }

  std::atomic<std::uint32_t> references{1};
  Dictionary dictionary;
};

static_assert(sizeof(Value) == 32);

namespace {

// The last owner need not pay for a locked instruction.
bool releaseReference(std::atomic<std::uint32_t>& references) noexcept {
  return references.load(std::memory_order_acquire) == 1 || references.fetch_sub(1, std::memory_order_acq_rel) == 1;
}

}  // namespace

Value::Value(ValueKind kind, std::string_view content) : kind_(kind) {
  if (content.size() <= inlineCapacity) {
    form_ = static_cast<std::uint8_t>(content.size());
    if (!content.empty()) std::memcpy(storage_, content.data(), content.size());
    return;
  }
  void* memory = takeMemory(sizeof(Buffer) + content.size());
  auto* buffer = new (memory) Buffer{{1}, static_cast<std::uint32_t>(content.size())};
  std::memcpy(buffer->data(), content.data(), content.size());
  form_ = formShared;
  store(buffer);
}

Value::Value(List list) : kind_(ValueKind::List) { store(new ListNode{.list = std::move(list)}); }

Value::Value(Dictionary dictionary) : kind_(ValueKind::Dictionary) {
  store(new DictionaryNode{.dictionary = std::move(dictionary)});
}

Value Value::text(std::string_view text) { return Value(ValueKind::Text, text); }

Value Value::bytes(std::span<const std::uint8_t> bytes) {
  return Value(ValueKind::Bytes, {reinterpret_cast<const char*>(bytes.data()), bytes.size()});
}

void Value::retain() const noexcept {
  std::atomic<std::uint32_t>& references = kind_ == ValueKind::List         ? load<ListNode*>()->references
                                           : kind_ == ValueKind::Dictionary ? load<DictionaryNode*>()->references
                                                                            : load<Buffer*>()->references;
  references.fetch_add(1, std::memory_order_relaxed);
}

void Value::release() noexcept {
  if (kind_ == ValueKind::List) {
    if (releaseReference(load<ListNode*>()->references)) delete load<ListNode*>();
  } else if (kind_ == ValueKind::Dictionary) {
    if (releaseReference(load<DictionaryNode*>()->references)) delete load<DictionaryNode*>();
  } else if (releaseReference(load<Buffer*>()->references)) {
    giveMemoryBack(load<Buffer*>(), sizeof(Buffer) + load<Buffer*>()->size);
  }
}

std::optional<std::int32_t> Value::integer32() const noexcept {
  using Limits = std::numeric_limits<std::int32_t>;
  switch (kind_) {
    case ValueKind::Int32:
      return load<std::int32_t>();
    case ValueKind::UInt32:
      if (load<std::uint32_t>() <= static_cast<std::uint32_t>(Limits::max()))
        return static_cast<std::int32_t>(load<std::uint32_t>());
      return std::nullopt;
    case ValueKind::Int64:
      if (load<std::int64_t>() >= Limits::min() && load<std::int64_t>() <= Limits::max())
        return static_cast<std::int32_t>(load<std::int64_t>());
      return std::nullopt;
    case ValueKind::UInt64:
      if (load<std::uint64_t>() <= static_cast<std::uint64_t>(Limits::max()))
        return static_cast<std::int32_t>(load<std::uint64_t>());
      return std::nullopt;
    case ValueKind::Bool:
    case ValueKind::Float:
    case ValueKind::Double:
    case ValueKind::Text:
    case ValueKind::Bytes:
    case ValueKind::List:
    case ValueKind::Dictionary:
      return std::nullopt;
  }
  return std::nullopt;
}

std::optional<std::int64_t> Value::int64() const noexcept {
  if (kind_ == ValueKind::Int64) return load<std::int64_t>();
  return std::nullopt;
}

std::optional<double> Value::real() const noexcept {
  switch (kind_) {
    case ValueKind::Int32:
      return static_cast<double>(load<std::int32_t>());
    case ValueKind::UInt32:
      return static_cast<double>(load<std::uint32_t>());
    case ValueKind::Int64:
      return static_cast<double>(load<std::int64_t>());
    case ValueKind::UInt64:
      return static_cast<double>(load<std::uint64_t>());
    case ValueKind::Float:
      return static_cast<double>(load<float>());
    case ValueKind::Double:
      return load<double>();
    case ValueKind::Bool:
    case ValueKind::Text:
    case ValueKind::Bytes:
    case ValueKind::List:
    case ValueKind::Dictionary:
      return std::nullopt;
  }
  return std::nullopt;
}

std::optional<bool> Value::boolean() const noexcept {
  if (kind_ == ValueKind::Bool) return load<bool>();
  return std::nullopt;
}

std::optional<std::string_view> Value::text() const noexcept {
  if (kind_ == ValueKind::Text) return std::string_view(data(), size());
  return std::nullopt;
}

std::optional<std::span<const std::uint8_t>> Value::bytes() const noexcept {
  if (kind_ == ValueKind::Bytes) return std::span(reinterpret_cast<const std::uint8_t*>(data()), size());
  return std::nullopt;
}

const List* Value::list() const noexcept { return kind_ == ValueKind::List ? &load<ListNode*>()->list : nullptr; }

const Dictionary* Value::dictionary() const noexcept {
  return kind_ == ValueKind::Dictionary ? &load<DictionaryNode*>()->dictionary : nullptr;
}

List* Value::mutableList() {
  if (kind_ != ValueKind::List) return nullptr;
  if (load<ListNode*>()->references.load(std::memory_order_acquire) != 1) *this = Value(List(load<ListNode*>()->list));
  return &load<ListNode*>()->list;
}

Dictionary* Value::mutableDictionary() {
  if (kind_ != ValueKind::Dictionary) return nullptr;
  if (load<DictionaryNode*>()->references.load(std::memory_order_acquire) != 1) {
    *this = Value(Dictionary(load<DictionaryNode*>()->dictionary));
  }
  return &load<DictionaryNode*>()->dictionary;
}

bool operator==(const Value& left, const Value& right) noexcept {
  if (left.kind_ != right.kind_) return false;
  switch (left.kind_) {
    case ValueKind::Int32:
      return left.load<std::int32_t>() == right.load<std::int32_t>();
    case ValueKind::UInt32:
      return left.load<std::uint32_t>() == right.load<std::uint32_t>();
    case ValueKind::Int64:
      return left.load<std::int64_t>() == right.load<std::int64_t>();
    case ValueKind::UInt64:
      return left.load<std::uint64_t>() == right.load<std::uint64_t>();
    case ValueKind::Bool:
      return left.load<bool>() == right.load<bool>();
    case ValueKind::Float:
      return left.load<float>() == right.load<float>();
    case ValueKind::Double:
      return left.load<double>() == right.load<double>();
    case ValueKind::Text:
    case ValueKind::Bytes:
      return left.rawText() == right.rawText();
    case ValueKind::List:
      return left.load<Value::ListNode*>() == right.load<Value::ListNode*>() ||
             left.load<Value::ListNode*>()->list == right.load<Value::ListNode*>()->list;
    case ValueKind::Dictionary:
      return left.load<Value::DictionaryNode*>() == right.load<Value::DictionaryNode*>() ||
             left.load<Value::DictionaryNode*>()->dictionary == right.load<Value::DictionaryNode*>()->dictionary;
  }
  return false;
}

}  // namespace probeview
