// SPDX-License-Identifier: Apache-2.0
//
// The stock protobuf library, made from the published schema, as a witness: both must agree on every well-formed
// payload, and the places where ours differs on purpose are listed one by one.
#include <google/protobuf/descriptor.h>
#include <google/protobuf/dynamic_message.h>
#include <google/protobuf/message.h>
#include <google/protobuf/unknown_field_set.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <memory>
#include <random>

#include "gsm.pb.h"
#include "lte.pb.h"
#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "messages/registry.h"
#include "nas.pb.h"
#include "tests/messages/support.h"
#include "umts.pb.h"

namespace probeview {
namespace {

namespace peer = cellular_metrics;
using Peer = google::protobuf::Message;
using PeerField = google::protobuf::FieldDescriptor;

std::unique_ptr<Peer> makePeer(std::string_view name) {
  using google::protobuf::DescriptorPool;
  using google::protobuf::MessageFactory;
  const auto* descriptor =
      DescriptorPool::generated_pool()->FindMessageTypeByName("cellular_metrics." + std::string(name));
  return std::unique_ptr<Peer>(MessageFactory::generated_factory()->GetPrototype(descriptor)->New());
}

std::string serialized(const Peer& message) { return message.SerializeAsString(); }

std::span<const std::uint8_t> bytesOfText(const std::string& text) {
  return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
}

bool parse(Peer& message, std::span<const std::uint8_t> payload) {
  return message.ParseFromArray(payload.data(), static_cast<int>(payload.size()));
}

bool parse(Peer& message, std::string_view hexadecimal) { return parse(message, bytesOf(hexadecimal)); }

// What our dictionary form must be, read from the other implementation.
Dictionary dictionaryOf(const Peer& message) {
  const auto* reflection = message.GetReflection();
  Dictionary dictionary;
  std::vector<const PeerField*> fields;
  reflection->ListFields(message, &fields);
  for (const PeerField* field : fields) {
    if (field->number() == 19) continue;  // dropped on reading
    const Key key = Key::copy(field->name());
    if (field->is_repeated()) {
      List list;
      for (int index = 0; index < reflection->FieldSize(message, field); ++index) {
        switch (field->cpp_type()) {
          case PeerField::CPPTYPE_MESSAGE:
            list.append(dictionaryOf(reflection->GetRepeatedMessage(message, field, index)));
            break;
          case PeerField::CPPTYPE_UINT32:
            list.append(reflection->GetRepeatedUInt32(message, field, index));
            break;
          case PeerField::CPPTYPE_INT32:
            list.append(reflection->GetRepeatedInt32(message, field, index));
            break;
          default:
            ADD_FAILURE() << field->full_name();
        }
      }
      dictionary.append(key, std::move(list));
      continue;
    }
    switch (field->cpp_type()) {
      case PeerField::CPPTYPE_UINT64:
        dictionary.append(key, reflection->GetUInt64(message, field));
        break;
      case PeerField::CPPTYPE_UINT32:
        dictionary.append(key, reflection->GetUInt32(message, field));
        break;
      case PeerField::CPPTYPE_INT32:
        dictionary.append(key, reflection->GetInt32(message, field));
        break;
      case PeerField::CPPTYPE_BOOL:
        dictionary.append(key, reflection->GetBool(message, field));
        break;
      case PeerField::CPPTYPE_ENUM: {
        const int value = reflection->GetEnumValue(message, field);
        const auto* name = field->enum_type()->FindValueByNumber(value);
        const bool isNamed = name != nullptr && !name->name().ends_with("_UNNAMED");
        dictionary.append(key, Value::text(isNamed ? name->name() : "(unknown: " + std::to_string(value) + ")"));
        break;
      }
      case PeerField::CPPTYPE_STRING: {
        const std::string text = reflection->GetString(message, field);
        dictionary.append(key,
                          field->type() == PeerField::TYPE_BYTES ? Value::bytes(bytesOfText(text)) : Value::text(text));
        break;
      }
      case PeerField::CPPTYPE_MESSAGE:
        dictionary.append(key, dictionaryOf(reflection->GetMessage(message, field)));
        break;
      default:
        ADD_FAILURE() << field->full_name();
    }
  }
  return dictionary;
}

class Generator {
 public:
  explicit Generator(std::uint64_t seed) : random_(seed) {}

  void fill(Peer& message, bool withField19) {
    const auto* reflection = message.GetReflection();
    const auto* descriptor = message.GetDescriptor();
    const std::uint64_t density = below(5);
    for (int index = 0; index < descriptor->field_count(); ++index) {
      const PeerField* field = descriptor->field(index);
      if (below(4) >= density) continue;
      if (field->number() == 19 && !withField19) continue;
      if (field->is_repeated()) {
        const std::uint64_t count = below(8) == 0 ? 20 + below(200) : below(5);
        for (std::uint64_t element = 0; element < count; ++element) {
          switch (field->cpp_type()) {
            case PeerField::CPPTYPE_MESSAGE:
              fill(*reflection->AddMessage(&message, field), withField19);
              break;
            case PeerField::CPPTYPE_UINT32:
              reflection->AddUInt32(&message, field, static_cast<std::uint32_t>(number()));
              break;
            case PeerField::CPPTYPE_INT32:
              reflection->AddInt32(&message, field, static_cast<std::int32_t>(number()));
              break;
            default:
              ADD_FAILURE() << field->full_name();
          }
        }
        continue;
      }
      switch (field->cpp_type()) {
        case PeerField::CPPTYPE_UINT64:
          reflection->SetUInt64(&message, field, number());
          break;
        case PeerField::CPPTYPE_UINT32:
          reflection->SetUInt32(&message, field, static_cast<std::uint32_t>(number()));
          break;
        case PeerField::CPPTYPE_INT32:
          reflection->SetInt32(&message, field, static_cast<std::int32_t>(number()));
          break;
        case PeerField::CPPTYPE_BOOL:
          reflection->SetBool(&message, field, below(2) != 0);
          break;
        case PeerField::CPPTYPE_ENUM:
          reflection->SetEnumValue(&message, field,
                                   below(4) == 0 ? static_cast<int>(number()) : static_cast<int>(below(260)));
          break;
        case PeerField::CPPTYPE_STRING:
          reflection->SetString(&message, field, text(field->type() == PeerField::TYPE_BYTES));
          break;
        case PeerField::CPPTYPE_MESSAGE:
          fill(*reflection->MutableMessage(&message, field), withField19);
          break;
        default:
          ADD_FAILURE() << field->full_name();
      }
    }
  }

  // The same message in another well-formed encoding: fields in any order, repeated numbers packed or not, unknown
  // fields in between. Elements of a list keep their order, and no scalar comes twice.
  Bytes shuffled(const Peer& message) {
    const auto* reflection = message.GetReflection();
    std::vector<const PeerField*> fields;
    reflection->ListFields(message, &fields);
    std::vector<Bytes> pieces;
    for (const PeerField* field : fields) {
      if (!field->is_repeated() && field->cpp_type() == PeerField::CPPTYPE_MESSAGE) {
        PBDataWriter writer;
        PBDataWriterWriteDataField(writer, shuffled(reflection->GetMessage(message, field)), number(*field));
        pieces.push_back(writer.takeBytes());
      } else if (!field->is_repeated()) {
        std::unique_ptr<Peer> alone(message.New());
        copyField(*alone, message, *field);
        const std::string bytes = serialized(*alone);
        pieces.emplace_back(bytes.begin(), bytes.end());
      } else {
        pieces.push_back(shuffledList(message, *field));
      }
    }
    for (std::uint64_t count = below(3); count > 0; --count) pieces.push_back(unknownField(message));
    std::shuffle(pieces.begin(), pieces.end(), random_);
    Bytes all;
    for (const Bytes& piece : pieces) all.insert(all.end(), piece.begin(), piece.end());
    return all;
  }

  std::uint64_t below(std::uint64_t limit) { return random_() % limit; }

 private:
  static std::uint32_t number(const PeerField& field) { return static_cast<std::uint32_t>(field.number()); }

  std::uint64_t number() {
    switch (below(6)) {
      case 0:
        return 0;
      case 1:
        return std::numeric_limits<std::uint64_t>::max();
      case 2:
        return std::uint64_t{1} << below(64);
      case 3:
        return (std::uint64_t{1} << below(64)) - 1;
      case 4:
        return below(200);
      default:
        return random_();
    }
  }

  std::string text(bool anyByte) {
    std::string text;
    for (std::uint64_t length = below(10) == 0 ? 100 + below(300) : below(20); length > 0; --length) {
      text += static_cast<char>(anyByte ? below(256) : 1 + below(127));
    }
    return text;
  }

  static void copyField(Peer& target, const Peer& source, const PeerField& field) {
    std::unique_ptr<Peer> rest(source.New());
    rest->CopyFrom(source);
    std::vector<const PeerField*> fields;
    rest->GetReflection()->ListFields(*rest, &fields);
    for (const PeerField* other : fields) {
      if (other != &field) rest->GetReflection()->ClearField(rest.get(), other);
    }
    target.CopyFrom(*rest);
  }

  Bytes shuffledList(const Peer& message, const PeerField& field) {
    const auto* reflection = message.GetReflection();
    PBDataWriter writer;
    const int count = reflection->FieldSize(message, &field);
    PBWriterMark mark;
    bool isOpen = false;
    for (int index = 0; index < count; ++index) {
      if (field.cpp_type() == PeerField::CPPTYPE_MESSAGE) {
        const Bytes element = shuffled(reflection->GetRepeatedMessage(message, &field, index));
        PBDataWriterWriteDataField(writer, element, number(field));
        continue;
      }
      if (below(3) == 0 && isOpen) {
        PBDataWriterRecallMark(writer, mark);
        isOpen = false;
      }
      if (below(3) == 0 && !isOpen) {
        PBDataWriterPlaceMark(writer, mark, number(field));
        isOpen = true;
      }
      const std::uint32_t key = isOpen ? PBDataWriterNoField : number(field);
      if (field.cpp_type() == PeerField::CPPTYPE_INT32) {
        PBDataWriterWriteSint32Field(writer, reflection->GetRepeatedInt32(message, &field, index), key);
      } else {
        PBDataWriterWriteUint32Field(writer, reflection->GetRepeatedUInt32(message, &field, index), key);
      }
    }
    if (isOpen) PBDataWriterRecallMark(writer, mark);
    return writer.takeBytes();
  }

  Bytes unknownField(const Peer& message) {
    std::uint32_t field = 0;
    do {
      field = static_cast<std::uint32_t>(1 + below(below(2) == 0 ? 50 : 0xFFFF));
    } while (KBBMetricUtility::isMetricId(field) ||
             message.GetDescriptor()->FindFieldByNumber(static_cast<int>(field)) != nullptr);
    PBDataWriter writer;
    if (below(2) == 0) {
      PBDataWriterWriteUint64Field(writer, number(), field);
    } else {
      PBDataWriterWriteStringField(writer, text(true), field);
    }
    return writer.takeBytes();
  }

  std::mt19937_64 random_;
};

constexpr std::uint64_t rounds = 200;

TEST(SecondImplementation, AgreesOnWhatItEncodesForAllClasses) {
  for (const MessageDescriptor* descriptor : messageClasses()) {
    for (std::uint64_t seed = 0; seed < rounds; ++seed) {
      Generator generator(seed);
      const auto theirs = makePeer(descriptor->name);
      generator.fill(*theirs, true);
      const std::string payload = serialized(*theirs);
      const auto ours = descriptor->make();
      ASSERT_TRUE(decode(*ours, bytesOfText(payload))) << descriptor->name << " seed " << seed;
      ASSERT_EQ(shown(*ours), printed(dictionaryOf(*theirs))) << descriptor->name << " seed " << seed;
    }
  }
}

TEST(SecondImplementation, ReadsWhatWeEncodeForAllClasses) {
  for (const MessageDescriptor* descriptor : messageClasses()) {
    for (std::uint64_t seed = 0; seed < rounds; ++seed) {
      Generator generator(seed);
      const auto theirs = makePeer(descriptor->name);
      generator.fill(*theirs, false);
      const std::string payload = serialized(*theirs);
      const auto ours = descriptor->make();
      ASSERT_TRUE(decode(*ours, bytesOfText(payload))) << descriptor->name << " seed " << seed;
      ASSERT_EQ(encodedHex(*ours), hexOf(bytesOfText(payload))) << descriptor->name << " seed " << seed;
      const auto back = makePeer(descriptor->name);
      ASSERT_TRUE(parse(*back, encoded(*ours)));
      ASSERT_EQ(serialized(*back), payload) << descriptor->name << " seed " << seed;
    }
  }
}

TEST(SecondImplementation, AgreesOnShuffledFieldsPackedOrNotWithUnknownOnesBetween) {
  for (const MessageDescriptor* descriptor : messageClasses()) {
    for (std::uint64_t seed = 0; seed < rounds; ++seed) {
      Generator generator(seed);
      const auto original = makePeer(descriptor->name);
      generator.fill(*original, false);
      const Bytes payload = generator.shuffled(*original);
      const auto theirs = makePeer(descriptor->name);
      ASSERT_TRUE(parse(*theirs, payload)) << descriptor->name << " seed " << seed;
      const auto ours = descriptor->make();
      ASSERT_TRUE(decode(*ours, payload)) << descriptor->name << " seed " << seed << " " << hexOf(payload);
      ASSERT_EQ(shown(*ours), printed(dictionaryOf(*theirs))) << descriptor->name << " seed " << seed;
      ASSERT_EQ(encodedHex(*ours), hexOf(bytesOfText(serialized(*original)))) << descriptor->name << " seed " << seed;
    }
  }
}

TEST(SecondImplementation, CopiesMergesAndComparesAlike) {
  for (const MessageDescriptor* descriptor : messageClasses()) {
    for (std::uint64_t seed = 0; seed < rounds; seed += 2) {
      const auto one = makePeer(descriptor->name);
      const auto other = makePeer(descriptor->name);
      Generator(seed).fill(*one, false);
      Generator(seed + 1).fill(*other, false);
      const auto oursOne = descriptor->make();
      const auto oursOther = descriptor->make();
      ASSERT_TRUE(decode(*oursOne, bytesOfText(serialized(*one))));
      ASSERT_TRUE(decode(*oursOther, bytesOfText(serialized(*other))));
      ASSERT_EQ(oursOne->isEqual(*oursOther), serialized(*one) == serialized(*other));
      const auto copy = oursOne->copyWithZone();
      ASSERT_TRUE(copy->isEqual(*oursOne));
      ASSERT_EQ(copy->hash(), oursOne->hash());
      copy->mergeFrom(*oursOther);
      one->MergeFrom(*other);
      ASSERT_EQ(encodedHex(*copy), hexOf(bytesOfText(serialized(*one)))) << descriptor->name << " seed " << seed;
    }
  }
}

// From here on: every place where ours differs on purpose.

TEST(Difference, AFieldWithTheNumberOfAMetricIsDropped) {
  peer::KCellularGsmIdleConfig theirs;
  KCellularGsmIdleConfig ours;
  ASSERT_TRUE(parse(theirs, "980107"));
  ASSERT_TRUE(decode(ours, "980107"));
  EXPECT_EQ(theirs.cr_offset(), 7U);
  EXPECT_FALSE(ours.hasCrOffset());
}

TEST(Difference, TheWireTypeOfAKnownFieldIsIgnored) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  ASSERT_TRUE(parse(theirs, "22 00"));  // the duration as bytes without content
  ASSERT_TRUE(decode(ours, "22 00"));
  EXPECT_FALSE(theirs.has_prev_state_dur_ms());
  EXPECT_TRUE(ours.hasPrevStateDurMs());
}

TEST(Difference, AFieldNumberIsCutTo16Bits) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  ASSERT_TRUE(parse(theirs, "908020 03"));
  ASSERT_TRUE(decode(ours, "908020 03"));
  EXPECT_FALSE(theirs.has_state());
  EXPECT_EQ(ours.state(), 3);
}

TEST(Difference, AnEndGroupEndsDecoding) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  EXPECT_FALSE(parse(theirs, "08 05 0c 10 01"));
  EXPECT_TRUE(decode(ours, "08 05 0c 10 01"));
  EXPECT_FALSE(ours.hasState());
}

TEST(Difference, AGroupCannotBeSkipped) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  EXPECT_TRUE(parse(theirs, "33 34 08 05"));
  EXPECT_FALSE(decode(ours, "33 34 08 05"));
}

TEST(Difference, AnOverlongVarintReadsAsZero) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  EXPECT_FALSE(parse(theirs, "20 ffffffffffffffffffff 10 03"));
  ASSERT_TRUE(decode(ours, "20 ffffffffffffffffffff 10 03"));
  EXPECT_EQ(shown(ours), R"(["state": "KLTE_RRC_STATE_CONNECTED", "prev_state_dur_ms": 0])");
}

TEST(Difference, FieldZeroIsUnknownAndSkipped) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  EXPECT_FALSE(parse(theirs, "00 01 08 05"));
  EXPECT_TRUE(decode(ours, "00 01 08 05"));
  EXPECT_EQ(ours.timestamp(), 5U);
}

TEST(Difference, AKeyMayTakeTenBytes) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  EXPECT_FALSE(parse(theirs, "88808080808000 05"));
  EXPECT_TRUE(decode(ours, "88808080808000 05"));
  EXPECT_EQ(ours.timestamp(), 5U);
}

TEST(Difference, ASecondSingleNestedMessageReplacesTheFirst) {
  peer::KCellularEmmContext theirs;
  KCellularEmmContext ours;
  ASSERT_TRUE(parse(theirs, "32 02 08 01 32 02 10 02"));
  ASSERT_TRUE(decode(ours, "32 02 08 01 32 02 10 02"));
  EXPECT_TRUE(theirs.guti().has_mmegi());
  EXPECT_FALSE(ours.guti()->hasMmegi());
}

TEST(Difference, UnknownFieldsAreNotKept) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  ASSERT_TRUE(parse(theirs, "30 01"));
  ASSERT_TRUE(decode(ours, "30 01"));
  EXPECT_EQ(serialized(theirs).size(), 2U);
  EXPECT_EQ(encodedHex(ours), "");
}

TEST(Difference, PartialContentsAreKeptToTheLastByte) {
  peer::KCellularLteTxPower theirs;
  KCellularLteTxPower ours;
  EXPECT_FALSE(parse(theirs, "08 05 12 04 08 02 18 80"));
  EXPECT_FALSE(decode(ours, "08 05 12 04 08 02 18 80"));
  EXPECT_EQ(shown(ours), R"(["timestamp": 5, "tx_power_info": [["pucch_tx_power": 1, "subframe_index": 0]]])");
}

TEST(Difference, ATruncatedRepeatedNumberIsAddedAsZero) {
  peer::KCellularGsmCsRfMeasurement theirs;
  KCellularGsmCsRfMeasurement ours;
  EXPECT_FALSE(parse(theirs, "2a 02 02 80"));
  EXPECT_FALSE(decode(ours, "2a 02 02 80"));
  EXPECT_EQ(shown(ours), R"(["cs_tx_pwr": [1, 0]])");
}

TEST(Difference, TextThatIsNotUtf8IsTaken) {
  peer::KCellularLteRsrpRsrqSinr theirs;
  KCellularLteRsrpRsrqSinr ours;
  EXPECT_FALSE(parse(theirs, "1a 02 c328"));
  EXPECT_TRUE(decode(ours, "1a 02 c328"));
  EXPECT_EQ(ours.callId(), "\xC3(");
}

TEST(Difference, DecodingIntoAMessageDoesNotClearIt) {
  peer::KCellularLteRrcState theirs;
  KCellularLteRrcState ours;
  ASSERT_TRUE(parse(theirs, "08 05"));
  ASSERT_TRUE(parse(theirs, "10 03"));
  ASSERT_TRUE(decode(ours, "08 05"));
  ASSERT_TRUE(decode(ours, "10 03"));
  EXPECT_FALSE(theirs.has_timestamp());
  EXPECT_TRUE(ours.hasTimestamp());
}

}  // namespace
}  // namespace probeview
