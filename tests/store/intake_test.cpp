// SPDX-License-Identifier: Apache-2.0
//
// How a metric event reaches its handler, and what stops the program on the way.
#include <gtest/gtest.h>

#include <functional>
#include <map>

#include "client/radix_wrapper.h"
#include "messages/metric_identifiers.h"
#include "platform/manual_loop.h"
#include "radix/manager.h"
#include "tests/store/store_fixture.h"

namespace probeview {
namespace {

using IntakeTest = StoreTest;

std::size_t presentDictionaries(const MetricValidator& store) {
  std::size_t count = 0;
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    if (store.displayDictionary(static_cast<DisplayDictionary>(index))) ++count;
  }
  return count;
}

TEST_F(IntakeTest, ANewStoreHasNoDictionaryNoIdentifierAndNoWrapper) {
  EXPECT_EQ(presentDictionaries(store_), 0u);
  EXPECT_EQ(store_.metricID(), std::nullopt);
  EXPECT_EQ(store_.mySharedRadixInstance(), nullptr);
  EXPECT_EQ(console_.lines, Lines{});
}

TEST_F(IntakeTest, TheKeysOfAnEventAreTheServicesOwn) {
  EXPECT_EQ(MetricValidator::metricIDKey, "kKeyMetricID");
  EXPECT_EQ(MetricValidator::payloadKey, "kKeyPayload");
  EXPECT_EQ(MetricValidator::profileIDKey, "kKeyProfileID");
}

TEST_F(IntakeTest, RadioLinkFailureLogsItsIdentifierThenThatNobodyCaresAndReturnsFalse) {
  EXPECT_FALSE(send(0x3C4E25, timed()));
  EXPECT_EQ(console_.lines, (Lines{"Metric ID in Hex = 3C4E25", "I dont care for this Metric"}));
  EXPECT_EQ(presentDictionaries(store_), 0u);
  EXPECT_EQ(store_.metricID(), 0x3C4E25);
}

TEST_F(IntakeTest, LteServingCellMeasurementIsUnhandledAndItsDictionaryStaysAbsentForEver) {
  EXPECT_FALSE(send(0x3CD301, timed()));
  EXPECT_EQ(console_.lines, (Lines{"Metric ID in Hex = 3CD301", "I dont care for this Metric"}));
  EXPECT_EQ(store_.myLTESCellMeasDict(), std::nullopt);
}

TEST_F(IntakeTest, AnIdentifierBelow0x10IsPrintedWithOneLeadingSpace) {
  send(0xA, {});
  send(0, {});
  send(0x10, {});
  EXPECT_EQ(console_.lines,
            (Lines{"Metric ID in Hex =  A", "I dont care for this Metric", "Metric ID in Hex =  0",
                   "I dont care for this Metric", "Metric ID in Hex = 10", "I dont care for this Metric"}));
}

TEST_F(IntakeTest, TheIdentifierIsPrintedInItsLow32BitsAndComparedInAll64) {
  EXPECT_FALSE(send(0x1003C4E04, timed()));
  EXPECT_FALSE(send(-1, timed()));
  EXPECT_FALSE(send(std::int64_t{K_LTE_RRC_STATE} - (std::int64_t{1} << 32), timed()));
  EXPECT_EQ(console_.lines,
            (Lines{"Metric ID in Hex = 3C4E04", "I dont care for this Metric", "Metric ID in Hex = FFFFFFFF",
                   "I dont care for this Metric", "Metric ID in Hex = 3C4E04", "I dont care for this Metric"}));
}

TEST_F(IntakeTest, AHandledMetricLogsItsIdentifierItsLineAndThatItWasValid) {
  EXPECT_TRUE(send(K_LTE_RRC_STATE, timed().varint(2, 3)));
  EXPECT_EQ(console_.lines, (Lines{"Metric ID in Hex = 3C4E04",
                                   "Current RRC state is [\"timestamp\": \"2024-03-05 12:00:00 UTC\", \"state\": "
                                   "\"KLTE_RRC_STATE_CONNECTED\"]",
                                   "Received Valid Metric"}));
  EXPECT_EQ(console_.groups, 1);
}

TEST_F(IntakeTest, TheLinesOfOneEventAreOneGroup) {
  send(K_LTE_RRC_STATE, timed());
  send(0x3C4E25, timed());
  EXPECT_EQ(console_.groups, 2);
}

TEST_F(IntakeTest, OfTwoSuccessiveTxPowersTheSecondWhollyReplacesTheFirst) {
  send(K_LTE_TX_POWER, timed().message(2, Wire().sint(1, -5)));
  ASSERT_TRUE(store_.myLTETxPowerDict()->contains("tx_power_info"));
  send(K_LTE_TX_POWER, timed(0));
  EXPECT_EQ(printed(*store_.myLTETxPowerDict()), R"(["timestamp": "1970-01-01 00:00:00 UTC"])");
}

TEST_F(IntakeTest, ATimestampOfZeroFormatsAsTheUnixEpochInTheDevicesTimeZone) {
  const FixedTimeZone kathmandu(5 * 3600 + 45 * 60, "+0545");
  MetricValidator there({.console = console_, .systemLog = systemLog_, .timeZone = kathmandu});
  there.metricsDidUpdate(metricEvent(K_LTE_RRC_STATE, timed(0)));
  EXPECT_EQ(printed(*there.myLTERRCStateDict()), R"(["timestamp": "1970-01-01 05:45:00 +0545"])");
}

TEST_F(IntakeTest, ADictionaryWithoutTimestampSkipsTheRewriteAndGoesOnToTheLogLine) {
  EXPECT_EQ(linesOf(K_LTE_RRC_STATE, Wire().varint(2, 1)),
            (Lines{R"(Current RRC state is ["state": "KLTE_RRC_STATE_IDLE"])"}));
  EXPECT_EQ(linesOf(K_LTE_RRC_STATE, {}), (Lines{"Current RRC state is []"}));
  EXPECT_TRUE(store_.myLTERRCStateDict().has_value());
}

TEST_F(IntakeTest, ATriggerEventChangesNothingAndOnlyLogsThatNobodyCares) {
  const Dictionary trigger{{"kKeyMetricID", std::int64_t{K_LTE_RRC_STATE}}};
  store_.eventsDidUpdate(trigger);
  store_.eventsDidUpdate(&trigger);
  store_.eventsDidUpdate(nullptr);
  EXPECT_EQ(console_.lines, (Lines(3, "I dont care for events")));
  EXPECT_EQ(presentDictionaries(store_), 0u);
  EXPECT_EQ(store_.metricID(), std::nullopt);
}

TEST_F(IntakeTest, AnAbsentMetricEventStopsTheProgram) {
  EXPECT_TRUE(reasonOfStop([this] { store_.metricsDidUpdate(nullptr); }).has_value());
}

TEST_F(IntakeTest, AnIdentifierThatIsMissingOrNotAnIntegerStopsTheProgramWithoutALogLine) {
  send(0x10, {});
  console_.lines.clear();
  const Dictionary events[] = {
      {},
      {{"kKeyMetricID", Value::text("3952132")}},
      {{"kKeyMetricID", std::uint64_t{K_LTE_RRC_STATE}}},
      {{"kKeyMetricID", std::int32_t{K_LTE_RRC_STATE}}},
      {{"kKeyMetricID", double{K_LTE_RRC_STATE}}},
      {{"kKeyMetricID", true}},
  };
  for (const Dictionary& event : events) {
    EXPECT_TRUE(reasonOfStop([&] { store_.metricsDidUpdate(event); }).has_value()) << printed(event);
    EXPECT_EQ(store_.metricID(), std::nullopt);
  }
  EXPECT_EQ(console_.lines, Lines{});
}

TEST_F(IntakeTest, APayloadThatIsMissingNotBytesOrUndecodableStopsTheProgramAfterTheIdentifiersLine) {
  const std::int64_t id = K_LTE_RRC_STATE;
  const std::uint8_t truncated[] = {0x08};
  const Dictionary events[] = {
      {{"kKeyMetricID", id}},
      {{"kKeyMetricID", id}, {"kKeyPayload", Value::text("\x08\x01")}},
      {{"kKeyMetricID", id}, {"kKeyPayload", Value::bytes(truncated)}},
  };
  for (const Dictionary& event : events) {
    console_.lines.clear();
    EXPECT_TRUE(reasonOfStop([&] { store_.metricsDidUpdate(event); }).has_value()) << printed(event);
    EXPECT_EQ(console_.lines, (Lines{"Metric ID in Hex = 3C4E04"}));
  }
  EXPECT_EQ(presentDictionaries(store_), 0u);
}

TEST_F(IntakeTest, AMetricThatNobodyHandlesNeedsNoPayload) {
  EXPECT_FALSE(store_.metricsDidUpdate(Dictionary{{"kKeyMetricID", std::int64_t{0x3C4E25}}}));
}

TEST_F(IntakeTest, TheDecodersLinesGoToTheSystemLog) {
  send(K_LTE_RRC_STATE, timed().varint(19, 5));
  EXPECT_EQ(systemLog_.lines, (Lines{"valid metricId tag", "Unknown tag: 13:5"}));
}

TEST(IntakeDeathTest, AStopEndsTheProcessWithOneLineOnStandardError) {
  const FixedTimeZone utc(0, "UTC");
  CollectingSink sink;
  MetricValidator store({.console = sink, .systemLog = sink, .timeZone = utc});
  EXPECT_DEATH(store.metricsDidUpdate(Dictionary{}), "probeview: stopped: .*identifier");
}

// What a subclass may take into its own hands.

class OverridingStore final : public MetricValidator {
 public:
  explicit OverridingStore(LineSink& sink) : MetricValidator({.console = sink, .systemLog = sink}) {}
  std::function<bool(const Dictionary&)> recognise;
  std::function<std::optional<Dictionary>&(std::optional<Dictionary>&)> instead;

 protected:
  bool handleMetric(const Dictionary& event) override {
    return recognise ? recognise(event) : MetricValidator::handleMetric(event);
  }
  std::optional<Dictionary>& mutableDisplayDictionary(DisplayDictionary which) override {
    std::optional<Dictionary>& own = MetricValidator::mutableDisplayDictionary(which);
    return instead ? instead(own) : own;
  }
};

TEST(OverriddenStore, ThePerMetricFunctionDecidesWhetherTheMetricWasValid) {
  CollectingSink console;
  OverridingStore store(console);
  store.recognise = [](const Dictionary&) { return true; };
  EXPECT_TRUE(store.metricsDidUpdate(Dictionary{}));
  EXPECT_EQ(console.lines, (Lines{"Received Valid Metric"}));
  store.recognise = [](const Dictionary&) { return false; };
  EXPECT_FALSE(store.metricsDidUpdate(Dictionary{}));
  EXPECT_EQ(console.lines.size(), 1u);
}

TEST(OverriddenStore, ADictionaryThatIsAbsentWhenItIsReadBackStopsTheProgram) {
  CollectingSink console;
  OverridingStore store(console);
  std::optional<Dictionary> absent;
  int calls = 0;
  store.instead = [&](std::optional<Dictionary>& own) -> std::optional<Dictionary>& {
    return ++calls == 1 ? own : absent;
  };
  const auto reason = reasonOfStop([&] { store.metricsDidUpdate(metricEvent(K_LTE_RRC_STATE, timed())); });
  EXPECT_EQ(reason, "myLTERRCStateDict is absent when it is read back");
}

TEST(OverriddenStore, ATimestampThatIsPresentButNotANumberStopsTheProgram) {
  for (const Value& wrong : {Value::text("1709640000123"), Value(true), Value(List{})}) {
    CollectingSink console;
    OverridingStore store(console);
    int calls = 0;
    store.instead = [&](std::optional<Dictionary>& own) -> std::optional<Dictionary>& {
      if (++calls == 2) own->set("timestamp", wrong);
      return own;
    };
    const auto reason = reasonOfStop([&] { store.metricsDidUpdate(metricEvent(K_LTE_RRC_STATE, timed())); });
    EXPECT_EQ(reason, "myLTERRCStateDict has a timestamp that is not a number");
    EXPECT_EQ(console.lines.size(), 1u);
  }
}

TEST(OverriddenStore, AListThatHoldsMoreThanDictionariesIsSkipped) {
  CollectingSink console;
  OverridingStore store(console);
  int calls = 0;
  store.instead = [&](std::optional<Dictionary>& own) -> std::optional<Dictionary>& {
    if (++calls == 2) own->set("scc_list", List{Dictionary{{"rsrp", std::int32_t{-100}}}, std::int32_t{1}});
    return own;
  };
  store.metricsDidUpdate(metricEvent(K_LTE_CA_STATUS, timed()));
  EXPECT_EQ(printed(store.myLTE().CAStatusList), placeholder);
}

TEST(OverriddenStore, AnEntryThatIsNotOfTheStatedTypeIsLeftAsItIs) {
  CollectingSink console;
  OverridingStore store(console);
  int calls = 0;
  store.instead = [&](std::optional<Dictionary>& own) -> std::optional<Dictionary>& {
    if (++calls == 2) {
      own->set(
          "scc_list",
          List{Dictionary{{"dl_bandwidth", 3.0}, {"rsrp", Value::text("-9550")}, {"rssi", true}, {"rsrq", false}}});
    }
    return own;
  };
  store.metricsDidUpdate(metricEvent(K_LTE_CA_STATUS, {}));
  EXPECT_EQ(printed(store.myLTE().CAStatusList), R"([["dl_bandwidth": 3.0, "rsrp": "-9550", "rssi": 1, "rsrq": 0]])");
}

// Between a wrapper and a store.

class QuietManager final : public radix::client::Manager {
 public:
  radix::client::Result performCommand(std::string_view, const Dictionary&, radix::client::ObjectHandle&) override {
    return {};
  }
  void registerEventHandler(std::string_view event, radix::client::EventHandler handler) override {
    handlers[std::string(event)] = std::move(handler);
  }
  void eventsOn() override {
    ++starts;
    if (onStart) onStart();
  }
  void eventsOff() override {}
  radix::client::ConnectionState connection() const override { return {}; }

  void send(const char* event, const Dictionary& content) { handlers.at(event)(radix::client::makeObject(content), 0); }

  int starts = 0;
  std::function<void()> onStart;
  std::map<std::string, radix::client::EventHandler> handlers;
};

class WiredStoreTest : public testing::Test {
 protected:
  std::shared_ptr<QuietManager> manager_ = std::make_shared<QuietManager>();
  ManualLoop main_;
  CollectingSink systemLog_;
  CollectingSink console_;
  RadixWrapper wrapper_{manager_, {.mainQueue = main_, .systemLog = systemLog_, .clock = main_}};
};

TEST_F(WiredStoreTest, ConstructionListensFirstAndThenBecomesTheDelegate) {
  // An event that arrives before the delegate is set is dropped by the wrapper.
  manager_->onStart = [this] { manager_->send(radix::kEventMetric, metricEvent(K_LTE_RRC_STATE, timed())); };
  MetricValidator store({.wrapper = &wrapper_, .console = console_, .systemLog = systemLog_});
  EXPECT_EQ(store.mySharedRadixInstance(), &wrapper_);
  EXPECT_EQ(manager_->starts, 1);
  EXPECT_EQ(wrapper_.delegate().get(), &store);
  EXPECT_EQ(main_.run(), 0u);
  EXPECT_EQ(presentDictionaries(store), 0u);
  ASSERT_EQ(systemLog_.lines.size(), 2u);
  EXPECT_TRUE(systemLog_.lines[0].starts_with("-[RadixWrapper listen]_block_invoke: MetricsTrigger dict="));
  EXPECT_EQ(systemLog_.lines[1], "-[RadixWrapper listen]: listening for events");
}

TEST_F(WiredStoreTest, MetricsAndTriggersArriveOnTheMainQueue) {
  const FixedTimeZone utc(0, "UTC");
  MetricValidator store({.wrapper = &wrapper_, .console = console_, .systemLog = systemLog_, .timeZone = utc});
  manager_->send(radix::kEventMetric, metricEvent(K_LTE_RRC_STATE, timed()));
  manager_->send(radix::kEventTrigger, {});
  EXPECT_EQ(console_.lines, Lines{});
  main_.run();
  EXPECT_EQ(console_.lines,
            (Lines{"Metric ID in Hex = 3C4E04", "Current RRC state is [\"timestamp\": \"2024-03-05 12:00:00 UTC\"]",
                   "Received Valid Metric", "I dont care for events"}));
  EXPECT_TRUE(wrapper_.serviceStatus().lastRecord.has_value());
}

TEST_F(WiredStoreTest, AStoreThatIsGoneIsNobodysDelegate) {
  {
    const MetricValidator store({.wrapper = &wrapper_, .console = console_, .systemLog = systemLog_});
    manager_->send(radix::kEventMetric, metricEvent(K_LTE_RRC_STATE, timed()));
  }
  EXPECT_EQ(wrapper_.delegate(), nullptr);
  main_.run();
  EXPECT_EQ(console_.lines, Lines{});
}

}  // namespace
}  // namespace probeview
