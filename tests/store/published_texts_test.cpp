// SPDX-License-Identifier: Apache-2.0
//
// What the published schema says that the viewer makes of a field is what the store does.
#include <algorithm>

#include "messages/metric_identifiers.h"
#include "messages/registry.h"
#include "scenario/edges_story.h"
#include "schema/field_text.h"
#include "tests/store/store_fixture.h"

namespace probeview {
namespace {

bool says(std::string_view text, std::string_view words) { return text.find(words) != std::string_view::npos; }

// The display dictionary after one message of the kind with every field and lists of two.
Dictionary shown(const MetricIdentifier& metric, std::string_view dictionaryName) {
  CollectingSink console, systemLog;
  MetricValidator store(MetricValidator::Surroundings{.wrapper = nullptr, .console = console, .systemLog = systemLog});
  const auto payload = scenario::EdgesStory::variant(*metric.message, 0, someTime);
  store.metricsDidUpdate(Dictionary{{"kKeyMetricID", metric.id}, {"kKeyPayload", Value::bytes(payload)}});
  const auto name = std::find(displayDictionaryNames.begin(), displayDictionaryNames.end(), dictionaryName);
  const auto which = static_cast<DisplayDictionary>(name - displayDictionaryNames.begin());
  return store.displayDictionary(which).value_or(Dictionary{});
}

TEST(PublishedTexts, ATimestampIsShownAsTextWhereTheyAreSaidTo) {
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    if (!metric.isHandled) continue;
    const FieldDescriptor* timestamp = metric.message->fieldNamed("timestamp");
    ASSERT_NE(timestamp, nullptr) << metric.name;
    const Dictionary dictionary = shown(metric, displayDictionaryOf(*metric.message));
    const Value* value = dictionary.find("timestamp");
    EXPECT_EQ(says(viewerText(*metric.message, *timestamp), "shown as text"),
              value != nullptr && value->text().has_value())
        << metric.name;
  }
}

TEST(PublishedTexts, AnEntryOfAListGetsTheTimestampWhereTheySaySo) {
  std::size_t get = 0, stay = 0;
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    if (!metric.isHandled) continue;
    const Dictionary dictionary = shown(metric, displayDictionaryOf(*metric.message));
    for (const FieldDescriptor& field : metric.message->fields()) {
      const Value* value = field.kind == FieldKind::RepeatedMessage ? dictionary.find(field.name) : nullptr;
      if (value == nullptr || value->list() == nullptr) continue;
      const List& list = *value->list();
      ASSERT_EQ(list.size(), 2U) << metric.name << " " << field.name;
      const bool has = list[0].dictionary()->find("timestamp") != nullptr;
      EXPECT_EQ(list[1].dictionary()->find("timestamp") != nullptr, has);
      EXPECT_EQ(says(viewerText(*metric.message, field), "each entry gets the timestamp"), has)
          << metric.name << " " << field.name;
      ++(has ? get : stay);
    }
  }
  EXPECT_GT(get, 0U);
  EXPECT_GT(stay, 0U);
}

TEST(PublishedTexts, NothingIsMadeOfAMessageThatTheStoreDoesNotTake) {
  // Those that no metric carries to a dictionary, nor are part of one that does.
  std::size_t untaken = 0;
  for (const MessageDescriptor* message : messageClasses()) {
    if (!displayDictionaryOf(*message).empty() || message->meaning.pages.empty()) continue;
    for (const FieldDescriptor& field : message->fields()) {
      EXPECT_EQ(viewerText(*message, field), "") << message->name << " " << field.name;
      ++untaken;
    }
  }
  EXPECT_GT(untaken, 0U);
}

}  // namespace
}  // namespace probeview
