// SPDX-License-Identifier: Apache-2.0
#include "store/metric_validator.h"

#include "client/radix_wrapper.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "platform/fatal_error.h"
#include "store/handler_turn.h"
#include "store/handlers.h"

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
  const HandledMetric* metric = handledMetric(*metricID_);
  if (metric == nullptr) {
    surroundings_.console.line("I dont care for this Metric");
    return false;
  }
  HandlerTurn turn(*this, metric->dictionary, metric->handler.prefix);
  turn.store(decode(*metric, event));
  metric->handler.rewrite(turn);
  return true;
}

Dictionary MetricValidator::decode(const HandledMetric& metric, const Dictionary& event) {
  const Value* payload = event.find(payloadKey);
  const auto bytes = payload == nullptr ? std::nullopt : payload->bytes();
  if (!bytes) fatalError("a metric event carries no payload for " + std::string(metric.message->name));
  std::unique_ptr<PBCodable>& message = messages_[static_cast<std::size_t>(metric.dictionary)];
  if (message == nullptr) message = metric.message->make();
  PBDataReader reader(*bytes, &surroundings_.systemLog);
  const bool decoded = message->readFrom(reader);
  Dictionary content = message->dictionaryRepresentation();
  message->reset();
  if (!decoded) fatalError("a payload does not decode as " + std::string(metric.message->name));
  return content;
}

const std::optional<Dictionary>& MetricValidator::displayDictionary(DisplayDictionary which) const {
  return displayDictionaries_[static_cast<std::size_t>(which)];
}

std::optional<Dictionary>& MetricValidator::mutableDisplayDictionary(DisplayDictionary which) {
  return displayDictionaries_[static_cast<std::size_t>(which)];
}

}  // namespace probeview
