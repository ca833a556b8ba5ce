// SPDX-License-Identifier: Apache-2.0
//
// Insertion-ordered containers of values. The order is a promise: it is the order of the rows on a page, of the entries
// on a log line and of the keys in JSON.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <new>
#include <string_view>
#include <utility>

#include "values/sequence.h"
#include "values/value.h"

namespace probeview {

// A dictionary's key: a view of a constant (no copy, no allocation), or a text of its own.
class Key {
 public:
  // A string literal.
  template <std::size_t N>
  consteval Key(const char (&literal)[N]) : data_(literal), size_(N - 1), owned_(false) {}
  // A text that lives as long as the process, such as a key of a field table.
  static Key constant(std::string_view text) noexcept { return Key(text); }
  static Key copy(std::string_view text);
  // The same as a constant, for a text that stands in memory as it is printed: behind a quotation mark and before one,
  // a colon and a blank, with nothing in it to escape. It is printed by copying longestFramed characters, whatever its
  // own length, so that many must stand there from the quotation mark on; if it is longer it is no framed key.
  static Key framed(std::string_view text) noexcept {
    Key key(text);
    key.isFramed_ = text.size() + frame <= longestFramed;
    return key;
  }

  Key(const Key& other) : data_(other.data_), size_(other.size_), owned_(false), isFramed_(other.isFramed_) {
    if (other.owned_) *this = copy(other.text());
  }
  Key(Key&& other) noexcept
      : data_(other.data_),
        size_(std::exchange(other.size_, 0)),
        owned_(std::exchange(other.owned_, false)),
        isFramed_(std::exchange(other.isFramed_, false)) {}
  Key& operator=(const Key& other);
  Key& operator=(Key&& other) noexcept;
  ~Key() {
    if (owned_) delete[] data_;
  }

  std::string_view text() const noexcept { return {data_, size_}; }
  bool isFramed() const noexcept { return isFramed_; }
  // With what stands around it; only for a framed key.
  std::string_view framedText() const noexcept { return {data_ - 1, size_ + frame}; }
  static constexpr std::size_t longestFramed = 32;
  friend bool operator==(const Key& left, const Key& right) noexcept { return left.text() == right.text(); }

 private:
  static constexpr std::size_t frame = 4;

  explicit Key(std::string_view text) noexcept
      : data_(text.data()), size_(static_cast<std::uint32_t>(text.size())), owned_(false) {}

  const char* data_;
  std::uint32_t size_;
  bool owned_;
  bool isFramed_ = false;
};

class List {
 public:
  List() = default;
  List(std::initializer_list<Value> values) {
    values_.reserve(values.size());
    for (const Value& value : values) values_.append(value);
  }

  std::size_t size() const noexcept { return values_.size(); }
  bool empty() const noexcept { return values_.size() == 0; }
  void reserve(std::size_t count) { values_.reserve(count); }
  template <typename Content>
  void append(Content&& content) {
    values_.append(std::forward<Content>(content));
  }
  void clear() noexcept { values_.clear(); }

  // Gives a list up to so many values instead of what it has, and looks for room only once. The list has them when this
  // ends.
  class Filler : public Sequence<Value>::Filler {
   public:
    Filler(List& list, std::size_t most) : Sequence<Value>::Filler(list.values_, most) {}
  };

  // Whether copies of a value share it; it is not to be changed then.
  bool isShared() const noexcept { return values_.isShared(); }

  // The index must be below size().
  const Value& operator[](std::size_t index) const noexcept { return values_[index]; }
  Value& operator[](std::size_t index) noexcept { return values_[index]; }

  auto begin() const noexcept { return values_.begin(); }
  auto end() const noexcept { return values_.end(); }
  auto begin() noexcept { return values_.begin(); }
  auto end() noexcept { return values_.end(); }

  friend bool operator==(const List& left, const List& right) noexcept {
    return std::equal(left.begin(), left.end(), right.begin(), right.end());
  }

 private:
  Sequence<Value> values_;
};

class Dictionary {
 public:
  struct Entry {
    Key key;
    Value value;
  };

  Dictionary() = default;
  Dictionary(std::initializer_list<Entry> entries);

  std::size_t size() const noexcept { return entries_.size(); }
  bool empty() const noexcept { return entries_.size() == 0; }
  void reserve(std::size_t count) { entries_.reserve(count); }
  void clear() noexcept { entries_.clear(); }
  // Whether copies of a value share it; it is not to be changed then.
  bool isShared() const noexcept { return entries_.isShared(); }

  // Null when there is no such key. Valid until the dictionary changes.
  const Value* find(std::string_view key) const noexcept;
  Value* find(std::string_view key) noexcept;
  bool contains(std::string_view key) const noexcept { return find(key) != nullptr; }

  // Replaces the value in its place, or adds the entry at the end.
  void set(Key key, Value value);
  // Adds an entry whose key is known not to be there; saves the search.
  // The value is made in its place from anything that a value can be made from.
  template <typename Content>
  void append(Key key, Content&& content) {
    entries_.append(std::move(key), std::forward<Content>(content));
  }

  // Gives a dictionary up to so many entries instead of what it has, and looks for room only once. The dictionary has
  // them when this ends.
  class Filler {
   public:
    Filler(Dictionary& dictionary, std::size_t most) : entries_(dictionary.entries_, most) {}
    template <typename Content>
    [[gnu::always_inline]] void append(Key key, Content&& content) {
      entries_.append(std::move(key), std::forward<Content>(content));
    }

   private:
    Sequence<Entry>::Filler entries_;
  };

  // Entries in the order of insertion; the index must be below size().
  const Entry& operator[](std::size_t index) const noexcept { return entries_[index]; }
  auto begin() const noexcept { return entries_.begin(); }
  auto end() const noexcept { return entries_.end(); }
  auto begin() noexcept { return entries_.begin(); }
  auto end() noexcept { return entries_.end(); }

  // Same keys with equal values, in any order.
  friend bool operator==(const Dictionary& left, const Dictionary& right) noexcept;

 private:
  Sequence<Entry> entries_;
};

// Each is one pointer, which lies in the value's storage.
static_assert(sizeof(List) == sizeof(void*) && sizeof(Dictionary) == sizeof(void*));

inline Value::Value(List list) noexcept : form_(formShared), kind_(ValueKind::List) {
  new (storage_) List(std::move(list));
}

inline Value::Value(Dictionary dictionary) noexcept : form_(formShared), kind_(ValueKind::Dictionary) {
  new (storage_) Dictionary(std::move(dictionary));
}

}  // namespace probeview
