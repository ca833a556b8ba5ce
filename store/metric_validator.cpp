// SPDX-License-Identifier: Apache-2.0
#include "store/metric_validator.h"

#include <charconv>

#include "client/radix_wrapper.h"
#include "platform/fatal_error.h"

namespace probeview {

namespace {

// Upper-case hexadecimal of the low 32 bits, at least two characters wide.
void appendIdentifier(std::int64_t metricID, std::string& out) {
  constexpr std::string_view digits = "0123456789ABCDEF";
  char text[8];
  std::size_t begin = sizeof text;
  auto rest = static_cast<std::uint32_t>(metricID);
  do {
    text[--begin] = digits[rest % 16];
    rest /= 16;
  } while (rest != 0);
  if (sizeof text - begin < 2) out += ' ';
  out.append(text + begin, sizeof text - begin);
}

}  // namespace

MetricValidator::MetricValidator(const Surroundings& surroundings)
    : surroundings_(surroundings),
      timestampFormatter_(surroundings.timeZone),
      self_(this, [](RadixWrapperDelegate*) {}) {
  if (surroundings_.wrapper == nullptr) return;
  // Listening first: an event that arrives before the delegate is set is dropped by the wrapper.
  surroundings_.wrapper->listen();
  surroundings_.wrapper->setDelegate(self_);
}

MetricValidator::~MetricValidator() = default;

void MetricValidator::metricsDidUpdate(const Dictionary* event) {
  if (event == nullptr) fatalError("a metric event without a dictionary was delivered");
  metricsDidUpdate(*event);
}

void MetricValidator::eventsDidUpdate(const Dictionary*) { surroundings_.console.line("I dont care for events"); }

void MetricValidator::eventsDidUpdate(const Dictionary& event) { eventsDidUpdate(&event); }

bool MetricValidator::metricsDidUpdate(const Dictionary& event) {
  const LineGroup group(surroundings_.console);
  const bool recognised = handleMetric(event);
  if (recognised) surroundings_.console.line("Received Valid Metric");
  return recognised;
}

bool MetricValidator::handleMetric(const Dictionary& event) {
  const Value* identifier = event.find(metricIDKey);
  metricID_ = identifier == nullptr ? std::nullopt : identifier->int64();
  if (!metricID_) fatalError("a metric event carries no identifier");
  line_ = "Metric ID in Hex = ";
  appendIdentifier(*metricID_, line_);
  surroundings_.console.line(line_);
  surroundings_.console.line("I dont care for this Metric");
  return false;
}

const std::optional<Dictionary>& MetricValidator::displayDictionary(DisplayDictionary which) const {
  return displayDictionaries_[static_cast<std::size_t>(which)];
}

std::optional<Dictionary>& MetricValidator::mutableDisplayDictionary(DisplayDictionary which) {
  return displayDictionaries_[static_cast<std::size_t>(which)];
}

}  // namespace probeview
