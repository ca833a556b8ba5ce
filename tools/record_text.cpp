// SPDX-License-Identifier: Apache-2.0
#include "tools/record_text.h"

#include <string_view>
#include <utility>

#include "messages/metric_identifiers.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "radix/client.h"
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
std::optional<Dictionary> contentOf(const Dictionary& event) {
  const MetricIdentifier* metric = metricWithId(integerOf(event, radix::kKeyMetricID));
  const Value* payload = event.find(radix::kKeyPayload);
  if (metric == nullptr || metric->message == nullptr || payload == nullptr || !payload->bytes()) return std::nullopt;
  const auto message = metric->message->make();
  PBDataReader reader(*payload->bytes());
  // The service has tried it before; what does not decode shows as far as it came.
  message->readFrom(reader);
  return message->dictionaryRepresentation();
}

void hide(Value& value, const MessageDescriptor& message) {
  if (Dictionary* const dictionary = value.mutableDictionary()) {
    hidePersonalData(*dictionary, message);
  } else if (List* const list = value.mutableList()) {
    for (Value& element : *list) hide(element, message);
  }
}

constexpr std::string_view timestampKey = "timestamp";

// Without the times that change with every record, however deep they lie.
Value withoutTimestamps(const Value& value) {
  if (const Dictionary* const dictionary = value.dictionary()) {
    Dictionary kept;
    for (const Dictionary::Entry& entry : *dictionary) {
      if (entry.key.text() != timestampKey) kept.set(entry.key, withoutTimestamps(entry.value));
    }
    return kept;
  }
  if (const List* const list = value.list()) {
    List kept;
    for (const Value& element : *list) kept.append(withoutTimestamps(element));
    return kept;
  }
  return value;
}

}  // namespace

void hidePersonalData(Dictionary& dictionary, const MessageDescriptor& message) {
  for (auto& [key, value] : dictionary) {
    const FieldDescriptor* const field = message.fieldNamed(key.text());
    if (field == nullptr) continue;
    if (message.meaningOf(*field).isPersonal) {
      value = Value::constant("…");
    } else if (field->element != nullptr) {
      hide(value, *field->element);
    }
  }
}

std::string RecordText::line(const Dictionary& event) { return line(event, contentOf(event), {}); }

std::optional<std::string> RecordText::changedLine(const Dictionary& event) {
  const std::int64_t id = integerOf(event, radix::kKeyMetricID);
  std::optional<Dictionary> content = contentOf(event);
  const Value* payload = event.find(radix::kKeyPayload);
  Last now{content.value_or(Dictionary{}), payload != nullptr && payload->bytes() ? printed(*payload) : std::string()};
  const auto known = last_.find(id);
  if (known == last_.end()) {
    if (last_.size() == radix::mostMetrics) last_.clear();
    last_.emplace(id, std::move(now));
    return line(event, std::move(content), {});
  }
  const Last before = std::exchange(known->second, now);
  if (!content) return now.payload == before.payload ? std::nullopt : std::optional(line(event, std::nullopt, {}));
  Dictionary changed;
  for (const Dictionary::Entry& entry : now.content) {
    const Value* earlier = before.content.find(entry.key.text());
    const bool same = earlier != nullptr && withoutTimestamps(*earlier) == withoutTimestamps(entry.value);
    if (!same && entry.key.text() != timestampKey) changed.set(entry.key, entry.value);
  }
  List gone;
  for (const Dictionary::Entry& entry : before.content) {
    if (!now.content.contains(entry.key.text()) && entry.key.text() != timestampKey) {
      gone.append(Value::text(entry.key.text()));
    }
  }
  if (changed.empty() && gone.empty()) return std::nullopt;
  return line(event, std::move(changed), gone);
}

std::string RecordText::line(const Dictionary& event, std::optional<Dictionary> content, const List& gone) {
  const std::int64_t id = integerOf(event, radix::kKeyMetricID);
  const std::int64_t time = integerOf(event, radix::kKeyTime);
  const Value* origin = event.find(radix::kKeyOrigin);
  const std::string_view originText = origin != nullptr ? origin->text().value_or("") : "";
  const MetricIdentifier* metric = metricWithId(id);
  // Who has content has the message that it was decoded as.
  if (content && !options_.personal) hidePersonalData(*content, *metric->message);
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
    if (!gone.empty()) {
      text += ",\"gone\":";
      appendJson(gone, text);
    }
    text += '}';
    return text;
  }
  text = timestamps_.format(static_cast<double>(time));
  text += "  ";
  text += originText;
  text += "  " + name + "  ";
  print(content.value_or(Dictionary{}), text);
  if (!gone.empty()) {
    text += "  gone: ";
    print(gone, text);
  }
  // An origin is a file's name, which may hold anything, and texts of a network do so, too.
  return onOneLine(text);
}

}  // namespace probeview
