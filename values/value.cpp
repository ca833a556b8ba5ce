// SPDX-License-Identifier: Apache-2.0
#include "values/value.h"

#include <cstring>
#include <limits>
#include <memory>
#include <new>
#include <utility>

#include "values/dictionary.h"
#include "values/pool.h"

namespace probeview {

static_assert(sizeof(Value) == 32);

Value::Value(ValueKind kind, std::string_view content) : kind_(kind) {
  if (content.size() <= inlineCapacity) {
    form_ = static_cast<std::uint8_t>(content.size());
    if (!content.empty()) std::memcpy(storage_, content.data(), content.size());
    return;
  }
  void* memory = takeMemory(sizeof(Buffer) + content.size());
  auto* buffer = new (memory) Buffer{{}, static_cast<std::uint32_t>(content.size())};
  std::memcpy(buffer->data(), content.data(), content.size());
  form_ = formShared;
  store(buffer);
}

Value Value::text(std::string_view text) { return Value(ValueKind::Text, text); }

Value Value::bytes(std::span<const std::uint8_t> bytes) {
  return Value(ValueKind::Bytes, {reinterpret_cast<const char*>(bytes.data()), bytes.size()});
}

void Value::retain() const noexcept {
  // An empty list or dictionary has no memory.
  if (auto* const holders = load<HolderCount*>()) holders->add();
}

void Value::release() noexcept {
  if (kind_ == ValueKind::List) {
    std::destroy_at(reinterpret_cast<List*>(storage_));
  } else if (kind_ == ValueKind::Dictionary) {
    std::destroy_at(reinterpret_cast<Dictionary*>(storage_));
  } else if (auto* const buffer = load<Buffer*>(); buffer->holders.remove()) {
    giveMemoryBack(buffer, sizeof(Buffer) + buffer->size);
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

template <typename Container>
Container* Value::unsharedContainer() {
  auto* const content = reinterpret_cast<Container*>(storage_);
  if (content->isShared()) *this = Value(Container(*content));
  return content;
}

List* Value::mutableList() { return kind_ == ValueKind::List ? unsharedContainer<List>() : nullptr; }

Dictionary* Value::mutableDictionary() {
  return kind_ == ValueKind::Dictionary ? unsharedContainer<Dictionary>() : nullptr;
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
      return left.load<void*>() == right.load<void*>() || *left.list() == *right.list();
    case ValueKind::Dictionary:
      return left.load<void*>() == right.load<void*>() || *left.dictionary() == *right.dictionary();
  }
  return false;
}

}  // namespace probeview
