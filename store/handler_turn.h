// SPDX-License-Identifier: Apache-2.0
//
// What the handler of a metric works with. Each algorithm of the handlers is written here once; a handler is a few of
// them in its order, and its adjustments are tables.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <utility>

#include "messages/quantities.h"
#include "store/metric_validator.h"
#include "values/dictionary.h"

namespace probeview {

// What becomes of one entry of an element. An entry that is absent, or not of the kind named, stays as it is.
struct Adjustment {
  enum class Kind : std::uint8_t {
    SubtractInteger,  // integer − whole, in 32 bits; leaving them stops the program
    DivideInteger,    // integer / whole, truncated toward zero
    ScaleReal,        // real × factor + offset, as a double
    DivideReal,       // real / factor, as a double
    LookUpBandwidth,  // index → MHz as a 32-bit float; an index that the table lacks stays
  };

  std::string_view key;
  Kind kind;
  std::int32_t whole = 0;
  double factor = 1.0;
  double offset = 0.0;
};

// How the number of a quantity becomes its value. Which of the four is done to a field is the store's; what the page
// shows hangs on it, as whole numbers are cut and reals are not.
constexpr Adjustment subtractInteger(std::string_view key, const Quantity& quantity) {
  return {key, Adjustment::Kind::SubtractInteger, static_cast<std::int32_t>(quantity.offset)};
}
constexpr Adjustment divideInteger(std::string_view key, const Quantity& quantity) {
  return {key, Adjustment::Kind::DivideInteger, static_cast<std::int32_t>(quantity.scale)};
}
constexpr Adjustment scaleReal(std::string_view key, const Quantity& quantity) {
  return {key, Adjustment::Kind::ScaleReal, 0, 1 / quantity.scale, 0 - quantity.offset};
}
constexpr Adjustment divideReal(std::string_view key, const Quantity& quantity) {
  return {key, Adjustment::Kind::DivideReal, 0, quantity.scale};
}
constexpr Adjustment lookUpBandwidth(std::string_view key) { return {key, Adjustment::Kind::LookUpBandwidth}; }

// The service sends measurements as indices of the reported ranges; shown is one edge of the interval.
constexpr Adjustment rsrpToDbm(std::string_view key) { return subtractInteger(key, quantities::lteRsrp); }
constexpr Adjustment rsrqToDb(std::string_view key) { return scaleReal(key, quantities::lteRsrq); }
constexpr Adjustment rscpToDbm(std::string_view key) { return subtractInteger(key, quantities::utraRscp); }
constexpr Adjustment ecnoToDb(std::string_view key) { return scaleReal(key, quantities::utraEcNo); }
constexpr Adjustment rxlevToDbm(std::string_view key) { return subtractInteger(key, quantities::gsmRxLev); }

using Adjustments = std::span<const Adjustment>;
using KeyNames = std::span<const std::string_view>;

// One call of a handler. All goes through the store's overridable dictionary: what is read back is what it gives, and
// one that is absent then stops the program.
class HandlerTurn {
 public:
  HandlerTurn(MetricValidator& store, DisplayDictionary which, std::string_view prefix)
      : store_(store), which_(which), prefix_(prefix) {}

  // Replaces the whole display dictionary.
  void store(Dictionary&& content) { store_.mutableDisplayDictionary(which_) = std::move(content); }
  // Replaces the milliseconds under "timestamp", if there are any, by their text.
  void formatTimestamp();
  // Writes the handler's line: its prefix and the dictionary as it is now.
  void log();

  // Replaces a 32-bit integer by its half, truncated toward zero.
  void halveInteger(std::string_view key);
  // Replaces a list of integers by its printed form and writes that on a line of its own.
  void flattenIntegers(std::string_view key);
  // Replaces a dictionary, or a list of dictionaries, by its printed form.
  void flattenDictionary(std::string_view key);
  void flattenDictionaries(std::string_view key);

  // Adjusts the elements of a list of dictionaries where they lie and gives each the parent's timestamp.
  void rewriteList(std::string_view key, Adjustments adjustments = {});

  // Replaces a record's list by the elements of a list of dictionaries, each adjusted in a copy and then given the
  // parent's entries under the inherited names, as far as the parent has them. Without such a list the record's list
  // stays as it was.
  void collect(std::string_view key, List& record, Adjustments adjustments = {}, KeyNames inherited = timestampOnly);
  static constexpr std::string_view timestampOnly[] = {"timestamp"};

  // Gives each key of the record's entry the dictionary's value, or an empty text where the dictionary has none.
  void mergeInto(Dictionary& record);

  LTE& lte() { return store_.lte_; }
  UMTS& umts() { return store_.umts_; }
  GSM& gsm() { return store_.gsm_; }
  Common& common() { return store_.common_; }

 private:
  Dictionary& dictionary();
  void adjust(Dictionary& element, Adjustments adjustments) const;
  [[noreturn]] void stop(std::string_view reason) const;

  MetricValidator& store_;
  DisplayDictionary which_;
  std::string_view prefix_;
};

}  // namespace probeview
