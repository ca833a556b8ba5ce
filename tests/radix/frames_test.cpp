// SPDX-License-Identifier: Apache-2.0
#include "radix/frames.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "messages/runtime/data_reader.h"
#include "radix/dictionary_bytes.h"
#include "radix/source_states.h"
#include "tests/support/frames.h"

namespace radix {
namespace {

using probeview::Dictionary;
using probeview::List;
using probeview::Value;
using std::chrono::milliseconds;
using Bytes = std::vector<std::uint8_t>;

// Writes down what it is told.
class Recorder final : public FrameHandler {
 public:
  void onHello(const Hello& hello) override {
    said = "hello " + std::to_string(hello.version()) + " " + std::to_string(hello.oldestVersion()) + " " +
           std::string(hello.name()) + " " + std::to_string(hello.refusalStatus()) + " " +
           std::string(hello.refusal()) + (hello.observes() ? " observes" : "");
  }
  void onCommand(const Command& command) override {
    said = "command " + std::to_string(command.sequence()) + " " + std::string(command.name());
    bytes = copyOf(command.arguments());
  }
  void onReply(const Reply& reply) override {
    said = "reply " + std::to_string(reply.sequence()) + " " + std::to_string(reply.status()) + " " +
           std::string(reply.message());
    bytes = copyOf(reply.content());
  }
  void onDelivery(const Delivery& delivery) override { said = delivery.on() ? "delivery on" : "delivery off"; }
  void onEvent(const Event& one, std::optional<milliseconds> itsAge) override {
    said = "event";
    event = one;
    age = itsAge;
  }
  void onDropped(const Dropped& dropped) override { said = "dropped " + std::to_string(dropped.count()); }
  void onPing(const Ping& ping) override {
    said = "ping " + std::to_string(ping.number()) + (ping.isAnswer() ? " answer" : "");
  }
  void onSources(const Sources& all) override {
    sources = statesOf(all);
    said = "sources " + std::to_string(sources.states.size());
  }

  std::string said;
  Bytes bytes;
  Event event;
  std::optional<milliseconds> age;
  SourceStates sources;
};

template <typename Sentence>
Recorder roundTrip(const Sentence& sentence) {
  Recorder recorder;
  EXPECT_TRUE(decodeFrame(*encode(sentence), recorder));
  return recorder;
}

TEST(Frames, EachKindComesBackAsItWasSent) {
  EXPECT_EQ(roundTrip(Hello("probeview", {.spoken = 3, .oldest = 2})).said, "hello 3 2 probeview 0 ");
  EXPECT_EQ(roundTrip(observer("watch")).said, "hello 1 1 watch 0  observes");
  EXPECT_EQ(roundTrip(refusing(9, "no", "radixd")).said, "hello 1 1 radixd 9 no");
  const Recorder command = roundTrip(Command(4294967295U, "kCommandQueryMetric", Bytes{1, 2}));
  EXPECT_EQ(command.said, "command 4294967295 kCommandQueryMetric");
  EXPECT_EQ(command.bytes, (Bytes{1, 2}));
  const Recorder reply = roundTrip(Reply(7, -3, "why", Bytes{9}));
  EXPECT_EQ(reply.said, "reply 7 -3 why");
  EXPECT_EQ(reply.bytes, (Bytes{9}));
  EXPECT_EQ(roundTrip(Delivery(true)).said, "delivery on");
  EXPECT_EQ(roundTrip(Delivery(false)).said, "delivery off");
  EXPECT_EQ(roundTrip(Dropped(18446744073709551615U)).said, "dropped 18446744073709551615");
  EXPECT_EQ(roundTrip(Ping(5)).said, "ping 5");
  EXPECT_EQ(roundTrip(Ping(5, true)).said, "ping 5 answer");
}

TEST(Frames, AnEventKeepsEveryNumberIncludingNegativeOnes) {
  Event sent = metricEvent({.metricId = -1, .payload = {0, 255}, .time = 1709640000123, .origin = "scenario:city"});
  sent.setKind(static_cast<std::int32_t>(EventKind::Trigger));
  sent.setProfileId(unsignedOf(-2));
  sent.setGroup(4);
  sent.setTriggerId(0x7F0013);
  sent.setTriggerRef(9999);
  sent.setTriggerType(unsignedOf(-7));
  const Event got = roundTrip(sent).event;
  EXPECT_EQ(got, sent);
  EXPECT_TRUE(got.isOf(EventKind::Trigger));
  EXPECT_EQ(signedOf(got.metricId()), -1);
  EXPECT_EQ(copyOf(got.payload()), (Bytes{0, 255}));
  EXPECT_EQ(signedOf(got.profileId()), -2);
  EXPECT_EQ(got.time(), 1709640000123U);
  EXPECT_EQ(got.origin(), "scenario:city");
  EXPECT_EQ(got.group(), 4U);
  EXPECT_EQ(got.triggerId(), 0x7F0013U);
  EXPECT_EQ(got.triggerRef(), 9999U);
  EXPECT_EQ(signedOf(got.triggerType()), -7);
}

TEST(Frames, AnEventTellsItsPeriodAndBehindItsBytesItsAge) {
  EXPECT_FALSE(roundTrip(metricEvent()).event.hasPeriod());
  EXPECT_EQ(roundTrip(metricEvent()).age, std::nullopt);
  EXPECT_TRUE(roundTrip(metricEvent({.period = milliseconds(0)})).event.hasPeriod());
  EXPECT_EQ(roundTrip(metricEvent({.period = milliseconds(0)})).event.period(), 0U);
  EXPECT_EQ(roundTrip(metricEvent({.period = milliseconds(1500)})).event.period(), 1500U);
  const auto aged = [](std::chrono::nanoseconds age) {
    Recorder recorder;
    EXPECT_TRUE(decodeFrame(agedFrame(metricEvent({.metricId = 5}), age), recorder));
    EXPECT_EQ(recorder.event.metricId(), 5U);
    return recorder.age;
  };
  EXPECT_EQ(aged(std::chrono::nanoseconds(0)), milliseconds(0));
  EXPECT_EQ(aged(std::chrono::nanoseconds(-5)), milliseconds(0));
  EXPECT_EQ(aged(std::chrono::nanoseconds(999'999)), milliseconds(0));
  EXPECT_EQ(aged(milliseconds(127)), milliseconds(127));
  EXPECT_EQ(aged(milliseconds(128)), milliseconds(128));
  EXPECT_EQ(aged(std::chrono::minutes(3)), milliseconds(180'000));
  EXPECT_EQ(aged(std::chrono::nanoseconds(INT64_MAX)), longestSpan);
}

TEST(Frames, SourcesKeepWhatIsSaidOfThem) {
  using State = client::SourceState;
  const std::vector<State> sent{
      {.origin = "scenario:city", .phase = State::Phase::Running, .reason = "", .metrics = {0x3C4E04, -1}},
      {.origin = "trace:x.csv", .phase = State::Phase::Ended, .reason = "", .metrics = {}},
      {.origin = "modem", .phase = State::Phase::Failed, .reason = "gone; plug it in", .metrics = {7}}};
  EXPECT_EQ(roundTrip(SourceStates{sent}).sources.states, sent);
  const Recorder none = roundTrip(SourceStates{});
  EXPECT_EQ(none.said, "sources 0");
}

TEST(Frames, HoweverMuchIsSaidOfTheSourcesItFitsIntoAFrame) {
  client::SourceState state{.origin = std::string(100'000, 'o'),
                            .phase = client::SourceState::Phase::Failed,
                            .reason = std::string(100'000, 'r'),
                            .metrics = std::vector<std::int64_t>(100'000, -1)};
  const SourceStates many{std::vector<client::SourceState>(40, state)};
  EXPECT_LE(encode(many)->size(), longestFrame);
  const auto got = roundTrip(many).sources.states;
  ASSERT_FALSE(got.empty());
  EXPECT_LE(got.size(), SourceStates::most);
  EXPECT_EQ(got[0].origin, std::string(longestOrigin, 'o'));
  EXPECT_EQ(got[0].reason, std::string(longestReason, 'r'));
  EXPECT_EQ(got[0].metrics.size(), mostMetrics);
  // A peer that keeps to nothing of this is cut by whoever hears it.
  Sources rude;
  for (std::size_t count = 0; count < 100; ++count) {
    Source& source = rude.addSource();
    source.setOrigin(std::string(1200, 'o'));
    source.setPhase(77);
    if (count == 0) {
      for (int metric = 0; metric < 1000; ++metric) source.addMetric().setIdentifier(5);
    }
  }
  const Recorder recorder = roundTrip(rude);
  ASSERT_EQ(recorder.sources.states.size(), SourceStates::most);
  EXPECT_EQ(recorder.sources.states[0].origin.size(), longestOrigin);
  EXPECT_EQ(recorder.sources.states[0].metrics.size(), mostMetrics);
  EXPECT_EQ(recorder.sources.states[0].phase, client::SourceState::Phase::Running) << "of a later version";
  EXPECT_TRUE(recorder.sources.isCut);
}

TEST(Frames, SourcesSayWhetherTheyAreAll) {
  const auto isCut = [](std::size_t sources, std::size_t metrics, std::size_t reason = 0, bool before = false) {
    client::SourceState state;
    state.origin = std::string(longestOrigin, 'o');
    state.reason = std::string(reason, 'r');
    state.metrics.assign(metrics, -1);
    const auto got = roundTrip(SourceStates{std::vector<client::SourceState>(sources, state), before}).sources;
    EXPECT_LE(got.states.size(), sources);
    return got.isCut;
  };
  EXPECT_FALSE(isCut(0, 0));
  EXPECT_FALSE(isCut(SourceStates::most, 0));
  EXPECT_TRUE(isCut(SourceStates::most + 1, 0));
  EXPECT_FALSE(isCut(1, mostMetrics));
  EXPECT_TRUE(isCut(1, mostMetrics + 1));
  EXPECT_FALSE(isCut(1, 0, 100'000)) << "a shorter reason is the same source";
  EXPECT_TRUE(isCut(SourceStates::most, mostMetrics)) << "no frame holds them";
  EXPECT_TRUE(isCut(1, 0, 0, true)) << "whoever was not told all cannot tell all";
}

TEST(Frames, AnEmptyPayloadIsAPayload) { EXPECT_TRUE(roundTrip(metricEvent()).event.payload().empty()); }

TEST(Frames, UnknownFramesAndFieldsAreIgnored) {
  Recorder recorder;
  // Field 15, a frame of a later version with the content "x".
  EXPECT_TRUE(decodeFrame(Bytes{0x7A, 0x01, 'x'}, recorder));
  EXPECT_EQ(recorder.said, "");
  // A ping with a field 9 that nobody knows: 3A (ping) 04, 08 05 (number 5), 48 01.
  EXPECT_TRUE(decodeFrame(Bytes{0x3A, 0x04, 0x08, 0x05, 0x48, 0x01}, recorder));
  EXPECT_EQ(recorder.said, "ping 5");
  // An event of a kind that nobody knows: 2A (event) 02, 08 07.
  recorder.said.clear();
  EXPECT_TRUE(decodeFrame(Bytes{0x2A, 0x02, 0x08, 0x07}, recorder));
  EXPECT_EQ(recorder.said, "");
}

// A frame of a later version. In a metric's message 19 is the number of a metric, and dropped.
class LaterFrame final : public PBCodable {
  PB_MESSAGE(LaterFrame)
  PB_FIELD(1, "first", first, First, uint64);
  PB_OBJECT(19, "text", text, Text, string);
  PB_FIELD(63, "last", last, Last, uint64);
};
PB_DEFINE(LaterFrame)

TEST(Frames, AFrameMayHaveAFieldOfAnyNumberAlsoOfOneThatMetricsHave) {
  // Field 19, a text of one byte: 9A 01 01 'x'; field 63: F8 03 07.
  const Bytes inOrder{0x08, 5, 0x9A, 0x01, 1, 'x', 0xF8, 0x03, 7};
  const Bytes inAnotherOrder{0xF8, 0x03, 7, 0x9A, 0x01, 1, 'x', 0x08, 5};
  LaterFrame expected;
  expected.setFirst(5);
  expected.setText("x");
  expected.setLast(7);
  for (const Bytes& bytes : {inOrder, inAnotherOrder}) {
    LaterFrame frame;
    probeview::PBDataReader reader(bytes);
    EXPECT_TRUE(frame.readFrom(reader));
    EXPECT_EQ(frame, expected);
  }
  // In a frame that does not know it, it is skipped like all that is unknown, whatever it holds: a ping, 3A 08, with
  // the bytes FF FF FF in field 19 before its number.
  Recorder recorder;
  EXPECT_TRUE(decodeFrame(Bytes{0x3A, 8, 0x9A, 0x01, 3, 0xFF, 0xFF, 0xFF, 0x08, 5}, recorder));
  EXPECT_EQ(recorder.said, "ping 5");
}

TEST(Frames, NoBytesAreNoFrame) {
  Recorder recorder;
  EXPECT_FALSE(decodeFrame(Bytes{}, recorder));
  EXPECT_EQ(recorder.said, "");
}

TEST(Frames, BytesThatAreNoFrameAreRefusedAndNothingIsHandedOver) {
  for (const Bytes& bytes : {
           Bytes{0x3A, 0x7F, 0x08},        // a ping longer than the frame
           Bytes{0x0A},                    // a key without content
           Bytes{0x7B},                    // a group, which nobody sends
           Bytes{0x3A, 0x02, 0x08, 0x80},  // a number that does not end
           Bytes(64, 0xFF),
       }) {
    Recorder recorder;
    EXPECT_FALSE(decodeFrame(bytes, recorder));
    EXPECT_EQ(recorder.said, "");
  }
}

TEST(Frames, ADictionaryKeepsItsOrderAndTheTypeOfEachValue) {
  const Bytes bytes{1, 2, 255};
  const Dictionary sent{{"z", std::int64_t{-9999}},
                        {"a", std::int32_t{-5}},
                        {"unsigned", std::uint32_t{4294967295U}},
                        {"long", std::uint64_t{18446744073709551615U}},
                        {"truth", true},
                        {"float", 1.4F},
                        {"double", -0.1},
                        {"text", Value::text("grüße")},
                        {"bytes", Value::bytes(bytes)},
                        {"none", Value::bytes({})},
                        {"list", List{std::int64_t{1}, Value::text("x"), List{}}},
                        {"inner", Dictionary{{"deep", Dictionary{{"deeper", false}}}}}};
  const auto got = decodeDictionary(encodeDictionary(sent));
  ASSERT_TRUE(got);
  EXPECT_EQ(*got, sent);
  ASSERT_EQ(got->size(), sent.size());
  for (std::size_t index = 0; index < sent.size(); ++index) {
    EXPECT_EQ((*got)[index].key, sent[index].key);
    EXPECT_EQ((*got)[index].value.kind(), sent[index].value.kind());
  }
  EXPECT_EQ(decodeDictionary(encodeDictionary(Dictionary{})), Dictionary{});
}

TEST(Frames, AValueOfAnUnknownKindIsLeftOut) {
  // One item without kind, one of kind 99: 0A 03 0A 01 'a'; 0A 05 0A 01 'b' 10 63; then 0A 07 0A 01 'c' 10 03 18 02.
  const auto got = decodeDictionary(
      Bytes{0x0A, 3, 0x0A, 1, 'a', 0x0A, 5, 0x0A, 1, 'b', 0x10, 99, 0x0A, 7, 0x0A, 1, 'c', 0x10, 3, 0x18, 2});
  EXPECT_EQ(got, (Dictionary{{"c", std::int64_t{2}}}));
}

Dictionary nested(int levels) {
  Dictionary dictionary{{"bottom", true}};
  for (int level = 0; level < levels; ++level) dictionary = Dictionary{{"down", std::move(dictionary)}};
  return dictionary;
}

TEST(Frames, ADictionaryMayBeNestedSixteenLevelsDeepAndNoMore) {
  EXPECT_TRUE(decodeDictionary(encodeDictionary(nested(16))));
  EXPECT_FALSE(decodeDictionary(encodeDictionary(nested(17))));
}

TEST(Frames, BytesThatAreNoDictionaryAreRefused) {
  EXPECT_FALSE(decodeDictionary(Bytes{0x0A, 0x7F}));
  EXPECT_FALSE(decodeDictionary(Bytes{0x0A, 6, 0x10, 10, 0x22, 2, 0x0A, 0x7F}));  // a list whose content is cut off
}

}  // namespace
}  // namespace radix
