// SPDX-License-Identifier: Apache-2.0
#include "schema/field_text.h"

#include <array>
#include <charconv>
#include <span>

namespace probeview {

namespace {

std::string rangeText(const Range& range) {
  return plainNumber(range.lowest) + (range.highest - range.lowest == 1 ? " or " : " to ") + plainNumber(range.highest);
}

std::string withUnit(std::string text, const Quantity& quantity) {
  if (!quantity.unit.empty()) text += ' ' + std::string(quantity.unit);
  return text;
}

// The values of a table: all, or the ends of a long one.
std::string tableText(const Quantity& quantity) {
  constexpr std::size_t mostListed = 8;
  const std::span<const double> table = quantity.table;
  std::string text;
  if (table.size() > mostListed) {
    text = plainNumber(table.front()) + " to " + plainNumber(table.back());
  } else {
    for (const double value : table) text += (text.empty() ? "" : ", ") + plainNumber(value);
  }
  return withUnit(std::move(text), quantity);
}

// How the number becomes the value: "number / 2 - 19.5".
std::string formula(const Quantity& quantity) {
  std::string text = "number";
  if (quantity.scale > 1) text += " / " + plainNumber(quantity.scale);
  if (quantity.scale < 1) text += " * " + plainNumber(1 / quantity.scale);
  if (quantity.offset > 0) text += " - " + plainNumber(quantity.offset);
  if (quantity.offset < 0) text += " + " + plainNumber(-quantity.offset);
  return text;
}

Range numbersOf(const Quantity& quantity, bool isUnsigned) {
  Range numbers = quantity.numbers;
  if (isUnsigned && numbers.isKnown() && numbers.lowest < 0) numbers.lowest = 0;
  return numbers;
}

Range valuesOf(const Quantity& quantity, bool isUnsigned) {
  Range values = quantity.valueRange();
  if (isUnsigned && quantity.numbers.isKnown() && quantity.numbers.lowest < 0) values.lowest = quantity.toValue(0);
  return values;
}

// Behind what a row itself says.
std::string quantityText(const Quantity& quantity, bool isUnsigned) {
  std::string text;
  const std::string numbers = numbersText(quantity, isUnsigned);
  if (!quantity.table.empty()) {
    text = ", index " + numbers + " for " + tableText(quantity);
  } else if (quantity.isConverted()) {
    const Range values = valuesOf(quantity, isUnsigned);
    if (!numbers.empty()) text = ", " + numbers + " for " + withUnit(rangeText(values), quantity);
    text += ", " + conversionText(quantity);
  } else {
    if (!quantity.unit.empty()) text = ", " + std::string(quantity.unit);
    if (!numbers.empty()) text += ", " + numbers;
  }
  if (!quantity.clause.empty()) text += " (" + std::string(quantity.clause) + ")";
  return text;
}

bool isUnsignedNumber(FieldKind kind) {
  return kind == FieldKind::UInt32 || kind == FieldKind::UInt64 || kind == FieldKind::RepeatedUInt32;
}

struct Shown {
  std::string_view message;
  std::string_view dictionary;
};

constexpr auto shownMessages = std::to_array<Shown>({
#define METRIC(constant, identifier, messageClass, dictionary, ...) {#messageClass, #dictionary},
#include "messages/metrics.inc"
});

}  // namespace

std::string plainNumber(double value) {
  std::array<char, 400> digits;
  const auto end = std::to_chars(digits.data(), digits.data() + digits.size(), value, std::chars_format::fixed).ptr;
  return {digits.data(), end};
}

std::string numbersText(const Quantity& quantity, bool isUnsigned) {
  if (quantity.bits != 0) return std::to_string(quantity.bits) + " bits";
  if (!quantity.table.empty()) return rangeText({0, static_cast<double>(quantity.table.size() - 1)});
  return quantity.numbers.isKnown() ? rangeText(numbersOf(quantity, isUnsigned)) : std::string();
}

std::string conversionText(const Quantity& quantity) {
  if (!quantity.isConverted()) return {};
  if (!quantity.table.empty()) return "index for " + tableText(quantity);
  return std::string(quantity.unit.empty() ? "value" : quantity.unit) + " = " + formula(quantity);
}

std::string meaningText(const MessageDescriptor& message, const FieldDescriptor& field) {
  const FieldMeaning& meaning = message.meaningOf(field);
  std::string text(meaning.text);
  if (meaning.isPersonal) text += ", personal data";
  if (meaning.quantity != nullptr) text += quantityText(*meaning.quantity, isUnsignedNumber(field.kind));
  return text;
}

std::string viewerText(const MessageDescriptor& message, const FieldDescriptor& field) {
  if (!field.isDecoded) {
    return "never there: the field number is that of a metric and decoding drops it";
  }
  const FieldMeaning& meaning = message.meaningOf(field);
  std::string text(meaning.viewer.text);
  if (!meaning.viewer.converts || meaning.quantity == nullptr) return text;
  const Quantity& quantity = *meaning.quantity;
  text += "in " + std::string(quantity.unit);
  if (!quantity.table.empty()) return text + "; another index stays";
  if (quantity.scale > 1 && quantity.decimals == 0) text += ", toward zero";
  return text;
}

std::string_view displayDictionaryOf(const MessageDescriptor& message) {
  for (const Shown& shown : shownMessages) {
    if (shown.message == message.name) return shown.dictionary;
  }
  return {};
}

}  // namespace probeview
