// SPDX-License-Identifier: Apache-2.0
#include "values/dictionary.h"

#include <cstring>

namespace probeview {

Key Key::copy(std::string_view text) {
  char* data = new char[text.size()];
  if (!text.empty()) std::memcpy(data, text.data(), text.size());
  Key key(std::string_view(data, text.size()));
  key.owned_ = true;
  return key;
}

Key& Key::operator=(const Key& other) {
  if (this != &other) *this = Key(other);
  return *this;
}

Key& Key::operator=(Key&& other) noexcept {
  std::swap(data_, other.data_);
  std::swap(size_, other.size_);
  std::swap(owned_, other.owned_);
  std::swap(isFramed_, other.isFramed_);
  return *this;
}

Dictionary::Dictionary(std::initializer_list<Entry> entries) {
  entries_.reserve(entries.size());
  for (const Entry& entry : entries) set(entry.key, entry.value);
}

const Value* Dictionary::find(std::string_view key) const noexcept {
  for (const Entry& entry : entries_) {
    if (entry.key.text() == key) return &entry.value;
  }
  return nullptr;
}

Value* Dictionary::find(std::string_view key) noexcept {
  for (Entry& entry : entries_) {
    if (entry.key.text() == key) return &entry.value;
  }
  return nullptr;
}

void Dictionary::set(Key key, Value value) {
  if (Value* present = find(key.text())) {
    *present = std::move(value);
  } else {
    append(std::move(key), std::move(value));
  }
}

bool operator==(const Dictionary& left, const Dictionary& right) noexcept {
  if (left.size() != right.size()) return false;
  for (const Dictionary::Entry& entry : left.entries_) {
    const Value* other = right.find(entry.key.text());
    if (other == nullptr || !(entry.value == *other)) return false;
  }
  return true;
}

}  // namespace probeview
