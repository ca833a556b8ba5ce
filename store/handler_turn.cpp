// SPDX-License-Identifier: Apache-2.0
#include "store/handler_turn.h"

#include <algorithm>
#include <array>
#include <optional>
#include <string>

#include "platform/fatal_error.h"
#include "values/printer.h"

namespace probeview {

namespace {

constexpr std::string_view timestampKey = "timestamp";

// The list under the key if all its elements are dictionaries; else null.
Value* listOfDictionaries(Dictionary& dictionary, std::string_view key) {
  Value* value = dictionary.find(key);
  if (value == nullptr || value->list() == nullptr) return nullptr;
  const List& list = *value->list();
  const bool fits = std::all_of(list.begin(), list.end(), [](const Value& e) { return e.dictionary() != nullptr; });
  return fits ? value : nullptr;
}

std::optional<float> bandwidthInMegahertz(std::int32_t index) {
  if (index < 0 || static_cast<std::size_t>(index) >= MetricValidator::dlbwlookup.size()) return std::nullopt;
  return MetricValidator::dlbwlookup[static_cast<std::size_t>(index)];
}

}  // namespace

void HandlerTurn::formatTimestamp() {
  Value* timestamp = dictionary().find(timestampKey);
  if (timestamp == nullptr) return;
  const std::optional<double> milliseconds = timestamp->real();
  if (!milliseconds) stop("has a timestamp that is not a number");
  *timestamp = Value::text(store_.timestampFormatter_.format(*milliseconds));
}

void HandlerTurn::log() {
  std::string& line = store_.line_;
  line = prefix_;
  print(dictionary(), line);
  store_.surroundings_.console.line(line);
}

void HandlerTurn::halveInteger(std::string_view key) {
  Value* value = dictionary().find(key);
  if (value == nullptr) return;
  if (const auto number = value->integer32()) *value = *number / 2;
}

void HandlerTurn::flattenIntegers(std::string_view key) {
  Value* value = dictionary().find(key);
  if (value == nullptr || value->list() == nullptr) return;
  const List& list = *value->list();
  if (!std::all_of(list.begin(), list.end(), [](const Value& e) { return e.integer32().has_value(); })) return;
  const std::string flat = printed(list);
  *value = Value::text(flat);
  store_.surroundings_.console.line(flat);
}

void HandlerTurn::flattenDictionary(std::string_view key) {
  Value* value = dictionary().find(key);
  if (value != nullptr && value->dictionary() != nullptr) *value = Value::text(printed(*value->dictionary()));
}

void HandlerTurn::flattenDictionaries(std::string_view key) {
  if (Value* value = listOfDictionaries(dictionary(), key)) *value = Value::text(printed(*value->list()));
}

void HandlerTurn::rewriteList(std::string_view key, Adjustments adjustments) {
  Dictionary& parent = dictionary();
  Value* value = listOfDictionaries(parent, key);
  if (value == nullptr) return;
  const Value* timestamp = parent.find(timestampKey);
  for (Value& elementValue : *value->mutableList()) {
    Dictionary& element = *elementValue.mutableDictionary();
    adjust(element, adjustments);
    if (timestamp != nullptr) element.set(Key::constant(timestampKey), *timestamp);
  }
}

void HandlerTurn::collect(std::string_view key, List& record, Adjustments adjustments, KeyNames inherited) {
  Dictionary& parent = dictionary();
  const Value* value = listOfDictionaries(parent, key);
  if (value == nullptr) return;
  const List& source = *value->list();
  record.clear();
  record.reserve(source.size());
  for (const Value& original : source) {
    Dictionary element;
    element.reserve(original.dictionary()->size() + inherited.size());
    for (const Dictionary::Entry& entry : *original.dictionary()) element.append(entry.key, entry.value);
    adjust(element, adjustments);
    for (const std::string_view name : inherited) {
      if (const Value* inheritedValue = parent.find(name)) element.set(Key::constant(name), *inheritedValue);
    }
    record.append(std::move(element));
  }
}

void HandlerTurn::mergeInto(Dictionary& record) {
  const Dictionary& latest = dictionary();
  for (Dictionary::Entry& entry : record) {
    const Value* value = latest.find(entry.key.text());
    entry.value = value == nullptr ? Value() : *value;
  }
}

void HandlerTurn::adjust(Dictionary& element, Adjustments adjustments) const {
  for (const Adjustment& adjustment : adjustments) {
    Value* value = element.find(adjustment.key);
    if (value == nullptr) continue;
    switch (adjustment.kind) {
      case Adjustment::Kind::SubtractInteger:
        if (const auto number = value->integer32()) {
          std::int32_t difference = 0;
          if (__builtin_sub_overflow(*number, adjustment.whole, &difference)) {
            stop("has a measurement whose value leaves 32 bits: " + std::string(adjustment.key));
          }
          *value = difference;
        }
        break;
      case Adjustment::Kind::DivideInteger:
        if (const auto number = value->integer32()) *value = *number / adjustment.whole;
        break;
      case Adjustment::Kind::ScaleReal:
        if (const auto number = value->real()) *value = *number * adjustment.factor + adjustment.offset;
        break;
      case Adjustment::Kind::DivideReal:
        if (const auto number = value->real()) *value = *number / adjustment.factor;
        break;
      case Adjustment::Kind::LookUpBandwidth:
        if (const auto index = value->integer32()) {
          if (const auto megahertz = bandwidthInMegahertz(*index)) *value = *megahertz;
        }
        break;
    }
  }
}

Dictionary& HandlerTurn::dictionary() {
  std::optional<Dictionary>& stored = store_.mutableDisplayDictionary(which_);
  if (!stored) stop("is absent when it is read back");
  return *stored;
}

void HandlerTurn::stop(std::string_view reason) const {
  std::string text(displayDictionaryName(which_));
  text += ' ';
  text += reason;
  fatalError(text);
}

}  // namespace probeview
