// SPDX-License-Identifier: Apache-2.0
#include "tools/record_text.h"

#include "messages/metric_identifiers.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "radix/client.h"
#include "tools/personal_data.h"
#include "values/json.h"
#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

namespace {

std::int64_t integerOf(const Dictionary& event, std::string_view key) {
  const Value* value = event.find(key);
  return value != nullptr ? value->int64().value_or(0) : 0;
}

// What could be decoded of it; absent when nobody knows the metric's messages.
std::optional<Dictionary> contentOf(const MetricIdentifier* metric, const Dictionary& event) {
  const Value* payload = event.find(radix::kKeyPayload);
  if (metric == nullptr || metric->message == nullptr || payload == nullptr || !payload->bytes()) return std::nullopt;
  const auto message = metric->message->make();
  PBDataReader reader(*payload->bytes());
  // The service has tried it before; what does not decode shows as far as it came.
  message->readFrom(reader);
  return message->dictionaryRepresentation();
}

}  // namespace

std::string RecordText::line(const Dictionary& event) {
  const std::int64_t id = integerOf(event, radix::kKeyMetricID);
  const std::int64_t time = integerOf(event, radix::kKeyTime);
  const Value* origin = event.find(radix::kKeyOrigin);
  const std::string_view originText = origin != nullptr ? origin->text().value_or("") : "";
  const MetricIdentifier* metric = metricWithId(id);
  std::optional<Dictionary> content = contentOf(metric, event);
  if (content && !options_.personal) hidePersonalData(*content);

  const std::string name = metric != nullptr ? std::string(metric->name) : hexText(id);

  std::string text;
  if (options_.json) {
    text = "{\"time\":";
    printNumber(time, text);
    text += ",\"origin\":";
    appendJsonString(originText, text);
    text += ",\"metric\":";
    appendJsonString(name, text);
    text += ",\"id\":";
    printNumber(id, text);
    text += ",\"dict\":";
    if (content) {
      appendJson(*content, text);
    } else {
      text += "null";
    }
    text += '}';
    return text;
  }
  text = timestamps_.format(static_cast<double>(time));
  text += "  ";
  // An origin is a file's name, which may hold anything.
  text += onOneLine(originText);
  text += "  " + name + "  ";
  print(content.value_or(Dictionary{}), text);
  return text;
}

std::optional<std::int64_t> metricOnCommandLine(std::string_view text) {
  if (const MetricIdentifier* const metric = metricNamed(text)) return metric->id;
  return parseInteger64(text);
}

}  // namespace probeview
