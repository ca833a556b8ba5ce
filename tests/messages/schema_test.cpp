// SPDX-License-Identifier: Apache-2.0
//
// The published schema says what the field tables say.
#include <google/protobuf/descriptor.h>
#include <gtest/gtest.h>

#include <fstream>
#include <set>
#include <sstream>

#include "messages/registry.h"
#include "schema/facts.h"
#include "schema/pages.h"

namespace probeview {
namespace {

using google::protobuf::DescriptorPool;
using PeerField = google::protobuf::FieldDescriptor;

std::string contentOf(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  std::ostringstream content;
  content << file.rdbuf();
  return content.str();
}

TEST(Schema, ThePagesThatAreCommittedAreCurrent) {
  for (const Page& page : schemaPages()) {
    // Tests run in the root of the repository.
    EXPECT_TRUE(contentOf(page.path) == page.content) << page.path << " is out of date: run build/dev/bin/metrics_page";
  }
}

TEST(Schema, EveryFieldAndMessageIsExplainedAndNothingElse) {
  std::size_t fields = 0;
  for (const MessageDescriptor* descriptor : messageClasses()) {
    ASSERT_NE(factsOfMessage(descriptor->name), nullptr) << descriptor->name;
    EXPECT_FALSE(factsOfMessage(descriptor->name)->meaning.empty());
    for (const FieldDescriptor& field : descriptor->fields()) {
      ASSERT_NE(factsOfField(descriptor->name, field.name), nullptr) << descriptor->name << "." << field.name;
      EXPECT_FALSE(factsOfField(descriptor->name, field.name)->meaning.empty());
      ++fields;
    }
  }
  EXPECT_EQ(allFieldFacts().size(), fields);
  EXPECT_EQ(allMessageFacts().size(), messageClasses().size());
}

PeerField::Type peerType(FieldKind kind) {
  switch (kind) {
    case FieldKind::UInt64:
      return PeerField::TYPE_UINT64;
    case FieldKind::UInt32:
    case FieldKind::RepeatedUInt32:
      return PeerField::TYPE_UINT32;
    case FieldKind::Int32:
      return PeerField::TYPE_INT32;
    case FieldKind::Enumeration:
      return PeerField::TYPE_ENUM;
    case FieldKind::SInt32:
    case FieldKind::RepeatedSInt32:
      return PeerField::TYPE_SINT32;
    case FieldKind::Bool:
      return PeerField::TYPE_BOOL;
    case FieldKind::Bytes:
      return PeerField::TYPE_BYTES;
    case FieldKind::Text:
      return PeerField::TYPE_STRING;
    case FieldKind::Message:
    case FieldKind::RepeatedMessage:
      return PeerField::TYPE_MESSAGE;
  }
  return PeerField::TYPE_GROUP;
}

TEST(Schema, EqualsTheFieldTables) {
  for (const MessageDescriptor* ours : messageClasses()) {
    SCOPED_TRACE(std::string(ours->name));
    const auto* theirs =
        DescriptorPool::generated_pool()->FindMessageTypeByName("cellular_metrics." + std::string(ours->name));
    ASSERT_NE(theirs, nullptr);
    ASSERT_EQ(theirs->field_count(), ours->rowCount);
    for (const FieldDescriptor& field : ours->fields()) {
      SCOPED_TRACE(std::string(field.name));
      const PeerField* peer = theirs->FindFieldByNumber(field.number);
      ASSERT_NE(peer, nullptr);
      EXPECT_EQ(peer->name(), field.name);
      EXPECT_EQ(peer->type(), peerType(field.kind));
      EXPECT_EQ(peer->is_repeated(), isRepeated(field.kind));
      EXPECT_EQ(peer->has_presence(), !isRepeated(field.kind));
      EXPECT_EQ(peer->is_packed(), field.kind == FieldKind::RepeatedUInt32 || field.kind == FieldKind::RepeatedSInt32);
      if (field.element != nullptr) {
        EXPECT_EQ(peer->message_type()->name(), field.element->name);
      }
      if (field.enumeration == nullptr) continue;
      const auto* names = peer->enum_type();
      const bool hasNoZero = field.enumeration->name(0).empty();
      EXPECT_EQ(names->value_count(), static_cast<int>(field.enumeration->entries().size()) + (hasNoZero ? 1 : 0));
      for (const EnumerationEntry& entry : field.enumeration->entries()) {
        ASSERT_NE(names->FindValueByNumber(entry.value), nullptr);
        EXPECT_EQ(names->FindValueByNumber(entry.value)->name(), entry.name);
      }
      if (hasNoZero) {
        EXPECT_EQ(names->FindValueByNumber(0)->name(), unnamedZero(names->name()));
      }
    }
  }
}

}  // namespace
}  // namespace probeview
