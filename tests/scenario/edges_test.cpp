// SPDX-License-Identifier: Apache-2.0
#include <map>

#include "messages/runtime/field_descriptor.h"
#include "scenario/edges_story.h"
#include "tests/scenario/drive.h"

namespace probeview {
namespace {

using scenario::EdgesStory;

std::unique_ptr<PBCodable> variantOf(const MessageDescriptor& message, std::size_t number) {
  auto decodedMessage = message.make();
  const auto payload = EdgesStory::variant(message, number, 1709640000000);
  PBDataReader reader(payload);
  EXPECT_TRUE(decodedMessage->readFrom(reader)) << message.name << " " << number;
  return decodedMessage;
}

// Calls visit(path, value) for every entry of the dictionary and of those within it.
template <typename Visit>
void walk(const std::string& path, const Dictionary& dictionary, const Visit& visit) {
  for (std::size_t i = 0; i < dictionary.size(); ++i) {
    const auto& entry = dictionary[i];
    const std::string here = path + "/" + std::string(entry.key.text());
    visit(here, entry.value);
    if (const Dictionary* nested = entry.value.dictionary()) walk(here, *nested, visit);
    if (const List* list = entry.value.list()) {
      for (std::size_t element = 0; element < list->size(); ++element) {
        if (const Dictionary* nested = (*list)[element].dictionary()) walk(here, *nested, visit);
      }
    }
  }
}

// The paths of all fields that a message of the class can show; field 19 is dropped when it is read.
void collect(const std::string& path, const MessageDescriptor& message,
             std::map<std::string, const FieldDescriptor*>& all) {
  for (const FieldDescriptor& field : message.fields()) {
    if (field.number == 19) continue;
    const std::string here = path + "/" + std::string(field.name);
    all[here] = &field;
    if (field.element != nullptr) collect(here, *field.element, all);
  }
}

std::vector<const MessageDescriptor*> toldMessages() {
  std::vector<const MessageDescriptor*> messages;
  for (const std::int64_t id : toldMetrics()) messages.push_back(metricWithId(id)->message);
  return messages;
}

TEST(Edges, ShowEveryFieldOfEveryMessageAndEveryNameOfEveryEnumeration) {
  for (const MessageDescriptor* message : toldMessages()) {
    std::map<std::string, const FieldDescriptor*> expected;
    collect("", *message, expected);
    std::set<std::string> seen;
    std::map<std::string, std::set<std::string>> names;
    for (std::size_t number = 0; number < EdgesStory::variants(*message); ++number) {
      walk("", variantOf(*message, number)->dictionaryRepresentation(),
           [&](const std::string& path, const Value& value) {
             seen.insert(path);
             if (const auto text = value.text()) names[path].insert(std::string(*text));
           });
    }
    for (const auto& [path, field] : expected) {
      EXPECT_TRUE(seen.contains(path)) << message->name << path;
      if (field->enumeration == nullptr) continue;
      for (const EnumerationEntry& entry : field->enumeration->entries()) {
        EXPECT_TRUE(names[path].contains(std::string(entry.name))) << message->name << path << " " << entry.name;
      }
      const std::string beyond = "(unknown: " + std::to_string(field->enumeration->entries().back().value + 1) + ")";
      EXPECT_TRUE(names[path].contains(beyond)) << message->name << path << " " << beyond;
    }
  }
}

TEST(Edges, ShowListsThatAreEmptyAndListsThatAreLong) {
  for (const MessageDescriptor* message : toldMessages()) {
    std::map<std::string, std::pair<std::size_t, std::size_t>> lengths;  // shortest and longest of each list
    for (const FieldDescriptor& field : message->fields()) {
      if (!isRepeated(field.kind)) continue;
      std::size_t shortest = 1000, longest = 0;
      for (std::size_t number = 0; number < EdgesStory::variants(*message); ++number) {
        const Dictionary dictionary = variantOf(*message, number)->dictionaryRepresentation();
        const Value* value = dictionary.find(field.name);
        const std::size_t length = value != nullptr ? value->list()->size() : 0;
        shortest = std::min(shortest, length);
        longest = std::max(longest, length);
      }
      EXPECT_EQ(shortest, 0U) << message->name << " " << field.name;
      EXPECT_EQ(longest, 32U) << message->name << " " << field.name;
    }
  }
}

TEST(Edges, LeaveRoomForWhatReadersTakeAwayFromTheSmallestNumber) {
  for (const MessageDescriptor* message : toldMessages()) {
    for (std::size_t number = 0; number < EdgesStory::variants(*message); ++number) {
      walk("", variantOf(*message, number)->dictionaryRepresentation(),
           [&](const std::string& path, const Value& value) {
             if (value.kind() != ValueKind::Int32) return;
             EXPECT_GE(std::int64_t{value.rawInt32()}, std::int64_t{INT32_MIN} + 140) << message->name << path;
           });
    }
  }
}

TEST(Edges, TellEachMetricsVariantsInTurnAndBeginAnew) {
  Drive drive("edges");
  drive.listen();
  drive.forSeconds(130);
  for (const std::int64_t id : toldMetrics()) {
    const MetricIdentifier& metric = *metricWithId(id);
    std::size_t number = 0;
    for (const MetricRecord& record : drive.records) {
      if (record.metricId != metric.id) continue;
      ASSERT_EQ(record.payload,
                EdgesStory::variant(*metric.message, number, static_cast<std::uint64_t>(record.time.count())))
          << metric.name << " " << number;
      number = (number + 1) % EdgesStory::variants(*metric.message);
    }
    EXPECT_GT(drive.count(metric.id), EdgesStory::variants(*metric.message)) << metric.name;
  }
}

}  // namespace
}  // namespace probeview
