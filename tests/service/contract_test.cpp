// SPDX-License-Identifier: Apache-2.0
//
// What a client may rely on, proved twice: in process on a manual loop, and over a real socket between threads.
#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "messages/metric_identifiers.h"
#include "radix/client.h"
#include "radix/dictionary_bytes.h"
#include "radix/object.h"
#include "radix/service_commands.h"
#include "radix/source_states.h"
#include "radix/status.h"
#include "tests/service/harness/raw_client.h"
#include "tests/service/harness/test_service.h"
#include "tests/support/frames.h"

namespace probeview {
namespace {

using radix::Status;
using radix::client::ManagerHandle;
using radix::client::ObjectHandle;
using radix::client::Result;
using std::chrono::milliseconds;
using Bytes = std::vector<std::uint8_t>;

// An RRC state: timestamp 1, the state given.
Bytes rrcState(std::uint8_t state) { return {0x08, 0x01, 0x10, state}; }

using Factory = std::unique_ptr<TestService> (*)(Service::Settings);

class Contract : public ::testing::TestWithParam<Factory> {
 protected:
  // A client that keeps the events it gets.
  struct Client {
    ManagerHandle manager;
    std::vector<Dictionary> events;

    std::vector<std::int64_t> metrics() const {
      std::vector<std::int64_t> all;
      for (const Dictionary& event : events) all.push_back(event.find(radix::kKeyMetricID)->int64().value());
      return all;
    }
    std::vector<Bytes> payloads() const {
      std::vector<Bytes> all;
      for (const Dictionary& event : events) {
        const auto bytes = event.find(radix::kKeyPayload)->bytes().value();
        all.emplace_back(bytes.begin(), bytes.end());
      }
      return all;
    }
  };

  void SetUp() override { make({}); }

  void make(Service::Settings settings) {
    clients_.clear();
    world_ = GetParam()(settings);
    world_->script().metrics.clear();
    for (const MetricIdentifier& metric : metricIdentifiers()) world_->script().metrics.push_back(metric.id);
    std::sort(world_->script().metrics.begin(), world_->script().metrics.end());
    // The source has named its metrics when it was added; it is added anew with those above.
    world_->kill();
    world_->restart();
  }

  void TearDown() override {
    clients_.clear();
    world_.reset();
  }

  Client& connect(const std::string& name = "test", radix::client::ManagerOptions options = {}) {
    clients_.push_back(std::make_unique<Client>());
    Client& client = *clients_.back();
    client.manager = world_->manager(name, options);
    const auto take = [&client](const ObjectHandle& event, radix::client::Group) {
      client.events.push_back(radix::client::nativeDictionary(*event));
    };
    radix::client::RegisterEventHandler(client.manager, radix::kEventMetric, take);
    return client;
  }

  Client& observe(const std::string& name = "test") { return connect(name, {.observes = true}); }

  Result perform(const Client& client, std::string_view command, const Dictionary& arguments = {}) {
    ObjectHandle reply;
    Result result = radix::client::PerformCommand(client.manager, command, arguments, reply);
    if (reply) reply_ = radix::client::nativeDictionary(*reply);
    return result;
  }

  Result push(const Client& client, std::string_view text, std::string_view command = radix::kCommandAddConfiguration) {
    return perform(
        client, command,
        {{radix::kKeyAppID, std::int64_t{2}},
         {radix::kKeyPayload, Value::bytes({reinterpret_cast<const std::uint8_t*>(text.data()), text.size()})},
         {radix::kKeyPayloadType, std::int64_t{0}}});
  }

  Result query(const Client& client, std::int64_t trigger, std::int64_t metric) {
    return perform(client, radix::kCommandQueryMetric,
                   {{radix::kKeyAppID, std::int64_t{2}},
                    {radix::kKeyPayloadType, std::int64_t{0}},
                    {radix::kKeyTriggerRef, std::int64_t{9999}},
                    {radix::kKeyTriggerType, std::int64_t{0}},
                    {radix::kKeyTriggerID, trigger},
                    {radix::kKeyProfileID, std::int64_t{0}},
                    {radix::kKeyMetricID, metric}});
  }

  void listen(const Client& client) {
    radix::client::EventsOff(client.manager);
    radix::client::EventsOn(client.manager);
    world_->settle();
  }

  std::optional<MetricPlan> plan() {
    std::optional<MetricPlan> seen;
    world_->onService([&] { seen = world_->script().plan; });
    return seen;
  }

  bool sourceIsHeard() {
    bool seen = false;
    world_->onService([&] { seen = world_->script().listening; });
    return seen;
  }

  std::size_t logged(std::string_view text) {
    std::size_t count = 0;
    world_->onService([&] { count = world_->log().count(text); });
    return count;
  }

  bool until(const std::function<bool()>& condition) { return world_->until(condition); }

  std::unique_ptr<TestService> world_;
  std::vector<std::unique_ptr<Client>> clients_;
  Dictionary reply_;
};

INSTANTIATE_TEST_SUITE_P(, Contract, ::testing::Values(&makeInProcessService, &makeSocketService),
                         [](const auto& information) { return information.index == 0 ? "InProcess" : "Socket"; });

TEST_P(Contract, ARecordArrivesAsAnEventWithItsKeysInOrder) {
  Client& client = observe();
  listen(client);
  world_->emit(K_LTE_RRC_STATE, rrcState(3), milliseconds(1709640000123));
  ASSERT_TRUE(until([&] { return client.events.size() == 1; }));
  const Dictionary expected{
      {"kKeyMetricID", K_LTE_RRC_STATE},       {"kKeyPayload", Value::bytes(rrcState(3))},
      {"kKeyProfileID", std::int64_t{0}},      {"kKeyTime", std::int64_t{1709640000123}},
      {"kKeyOrigin", Value::text("scripted")}, {"kKeyAge", *client.events[0].find(radix::kKeyAge)},
      {"kKeyPeriod", std::int64_t{0}}};
  EXPECT_EQ(client.events[0], expected);
  EXPECT_GE(client.events[0].find(radix::kKeyAge)->int64().value(), 0);
  EXPECT_LT(client.events[0].find(radix::kKeyAge)->int64().value(), 30000);
  for (std::size_t index = 0; index < expected.size(); ++index) {
    EXPECT_EQ(client.events[0][index].key, expected[index].key);
  }
}

TEST_P(Contract, EventsArriveInTheirOrderAndEachOnce) {
  Client& client = observe();
  listen(client);
  world_->onService([&] {
    for (std::uint8_t state = 0; state < 7; ++state) world_->script().emit(K_LTE_RRC_STATE, rrcState(state));
  });
  ASSERT_TRUE(until([&] { return client.events.size() >= 7; }));
  world_->settle();
  ASSERT_EQ(client.events.size(), 7U);
  for (std::uint8_t state = 0; state < 7; ++state) EXPECT_EQ(client.payloads()[state], rrcState(state));
}

TEST_P(Contract, NothingIsDeliveredBeforeEventsOnAndAfterEventsOff) {
  Client& client = observe();
  world_->settle();
  world_->emit(K_LTE_TX_POWER, {});
  world_->settle();
  EXPECT_TRUE(client.events.empty());
  listen(client);
  EXPECT_EQ(client.metrics(), std::vector<std::int64_t>{K_LTE_TX_POWER});
  radix::client::EventsOff(client.manager);
  world_->settle();
  world_->emit(K_LTE_TX_POWER, {});
  world_->settle();
  EXPECT_EQ(client.events.size(), 1U);
}

TEST_P(Contract, ListeningTwiceDoesNotDeliverTwice) {
  Client& client = observe();
  listen(client);
  listen(client);
  world_->emit(K_LTE_RRC_STATE, rrcState(1));
  ASSERT_TRUE(until([&] { return !client.events.empty(); }));
  world_->settle();
  EXPECT_EQ(client.events.size(), 1U);
}

TEST_P(Contract, RegisteringAHandlerReplacesTheOneBefore) {
  Client& client = observe();
  listen(client);
  int second = 0;
  radix::client::RegisterEventHandler(client.manager, radix::kEventMetric,
                                      [&](const ObjectHandle&, radix::client::Group) { ++second; });
  world_->emit(K_LTE_RRC_STATE, rrcState(1));
  ASSERT_TRUE(until([&] { return second == 1; }));
  EXPECT_TRUE(client.events.empty());
}

TEST_P(Contract, ANewObserverGetsTheLastRecordOfEachMetricInTheOrderOfTheirArrival) {
  Client& first = observe();
  listen(first);
  world_->emit(K_LTE_RRC_STATE, rrcState(1));
  world_->emit(K_LTE_TX_POWER, {});
  world_->emit(K_LTE_RRC_STATE, rrcState(3));
  Client& second = observe();
  listen(second);
  EXPECT_EQ(second.metrics(), (std::vector<std::int64_t>{K_LTE_TX_POWER, K_LTE_RRC_STATE}));
  EXPECT_EQ(second.payloads()[1], rrcState(3));
}

TEST_P(Contract, TheLastRecordsComeOnceAndOnlyThoseThatTheConfigurationNames) {
  Client& client = connect();
  world_->emit(K_LTE_RRC_STATE, rrcState(1));
  world_->emit(K_LTE_TX_POWER, {});
  ASSERT_EQ(push(client, "[metrics]\nK_LTE_RRC_STATE = 1000\n").status, 0);
  world_->settle();
  EXPECT_TRUE(client.events.empty());
  listen(client);
  EXPECT_EQ(client.metrics(), std::vector<std::int64_t>{K_LTE_RRC_STATE});
  listen(client);
  EXPECT_EQ(client.events.size(), 1U);
  ASSERT_EQ(push(client, "[metrics]\nK_LTE_TX_POWER = 1000\n").status, 0);
  listen(client);
  EXPECT_EQ(client.metrics(), (std::vector<std::int64_t>{K_LTE_RRC_STATE, K_LTE_TX_POWER}));
}

TEST_P(Contract, AnObserverGetsEveryRecordThatFlowsAndOneWithAConfigurationOnlyItsOwn) {
  Client& open = observe("open");
  Client& narrow = connect("narrow");
  ASSERT_EQ(
      push(narrow, "[metrics]\nK_LTE_TX_POWER = \"on change\"\n[triggers]\n0x7F0013 = [\"K_SIM_FILE_INFO\"]\n").status,
      0);
  listen(open);
  listen(narrow);
  for (const std::int64_t metric : {K_LTE_RRC_STATE, K_LTE_TX_POWER, K_SIM_FILE_INFO}) world_->emit(metric, {});
  ASSERT_TRUE(until([&] { return open.events.size() >= 3 && narrow.events.size() >= 2; }));
  world_->settle();
  EXPECT_EQ(open.metrics(), (std::vector<std::int64_t>{K_LTE_RRC_STATE, K_LTE_TX_POWER, K_SIM_FILE_INFO}));
  EXPECT_EQ(narrow.metrics(), (std::vector<std::int64_t>{K_LTE_TX_POWER, K_SIM_FILE_INFO}));
}

// A record that is told from all others by the number in it.
Bytes numbered(std::uint8_t number) { return {0x08, number}; }

std::vector<int> numbersOf(const std::vector<Bytes>& payloads) {
  std::vector<int> numbers;
  for (const Bytes& payload : payloads) numbers.push_back(payload.at(1));
  return numbers;
}

constexpr std::string_view viewersConfiguration =
    "[metrics]\nK_LTE_RRC_STATE = \"on change\"\nK_LTE_TX_POWER = 1000\n[triggers]\n0x7F0013 = [\"K_SIM_FILE_INFO\"]\n";

TEST_P(Contract, AViewerThatStartsOnAWarmServiceGetsEachRecordOnce) {
  for (const bool inHaste : {false, true}) {
    SCOPED_TRACE(inHaste ? "in haste" : "with rests");
    make({});
    std::uint8_t number = 0;
    world_->onService([&] {
      world_->script().onQuery = [&](std::int64_t metric) {
        world_->script().emit(metric, numbered(++number));
        return true;
      };
    });
    // The service is warm: somebody has watched before, and goes on watching.
    Client& before = observe("before");
    listen(before);
    for (const std::int64_t metric : {K_LTE_RRC_STATE, K_LTE_TX_POWER, K_LTE_CDRX_CONFIG, K_LTE_RRC_STATE}) {
      world_->emit(metric, numbered(++number));
    }
    Client& viewer = connect("probeview");
    const auto rest = [&] {
      if (!inHaste) world_->settle();
    };
    const auto start = [&] {
      radix::client::EventsOff(viewer.manager);
      radix::client::EventsOn(viewer.manager);
      rest();
    };
    start();
    ASSERT_EQ(perform(viewer, radix::kCommandClearConfiguration, {{radix::kKeyAppID, std::int64_t{2}}}).status, 0);
    rest();
    EXPECT_TRUE(viewer.events.empty()) << "it has asked for nothing so far";
    ASSERT_EQ(push(viewer, viewersConfiguration).status, 0);
    start();
    ASSERT_EQ(query(viewer, 0x7F0013, 0).status, 0);
    start();
    world_->settle();
    EXPECT_EQ(numbersOf(viewer.payloads()), (std::vector<int>{2, 4, 5}));
    // What flows comes once, too, and what it has not named does not.
    world_->emit(K_LTE_CDRX_CONFIG, numbered(++number));
    world_->emit(K_LTE_RRC_STATE, numbered(++number));
    world_->settle();
    start();
    // A later push brings what was not sent so far.
    ASSERT_EQ(push(viewer, std::string(viewersConfiguration.substr(0, viewersConfiguration.find("[triggers]"))) +
                               "K_LTE_CDRX_CONFIG = 500\n")
                  .status,
              0);
    start();
    world_->settle();
    EXPECT_EQ(numbersOf(viewer.payloads()), (std::vector<int>{2, 4, 5, 7, 6}));

    // The next service knows nothing of all this; what it sends comes once as well.
    viewer.events.clear();
    world_->kill();
    ASSERT_TRUE(until([&] { return !radix::client::Connection(viewer.manager).connected; }));
    world_->restart();
    // Records that are there before the client is.
    for (const std::int64_t metric : {K_LTE_RRC_STATE, K_SIM_FILE_INFO, K_LTE_CDRX_CONFIG}) {
      world_->emit(metric, numbered(++number));
    }
    ASSERT_TRUE(until([&] { return viewer.events.size() >= 2; }));
    start();
    world_->emit(K_LTE_TX_POWER, numbered(++number));
    ASSERT_TRUE(until([&] { return viewer.events.size() >= 3; }));
    world_->settle();
    EXPECT_EQ(numbersOf(viewer.payloads()), (std::vector<int>{8, 10, 11}));
    clients_.clear();
    world_->settle();
  }
}

TEST_P(Contract, WhoeverHasPushedNothingGetsNothingAndKeepsNoSourceAwake) {
  Client& client = connect();
  listen(client);
  EXPECT_FALSE(sourceIsHeard());
  world_->emit(K_LTE_RRC_STATE, rrcState(1));
  world_->settle();
  EXPECT_TRUE(client.events.empty());
  // The push is enough where delivery is on.
  ASSERT_EQ(push(client, "[metrics]\nK_LTE_RRC_STATE = 1000\n").status, 0);
  EXPECT_TRUE(sourceIsHeard());
  ASSERT_TRUE(until([&] { return client.events.size() == 1; }));
  ASSERT_EQ(perform(client, radix::kCommandClearConfiguration).status, 0);
  EXPECT_FALSE(sourceIsHeard());
  world_->emit(K_LTE_RRC_STATE, rrcState(2));
  listen(client);
  EXPECT_EQ(client.events.size(), 1U);
  // One that is refused asks for nothing.
  EXPECT_NE(push(client, "[metrics]\nK_LTE_RRC_STATE = = 5\n").status, 0);
  listen(client);
  EXPECT_EQ(client.events.size(), 1U);
  EXPECT_FALSE(sourceIsHeard());
}

TEST_P(Contract, WhatWaitsForAClientThatReplacesItsConfigurationIsTakenBackAndIsNoLoss) {
  Client& other = connect("other");
  RawClient stuck(world_->rawLink());
  const auto pushNow = [&](std::uint32_t sequence, std::string_view text) {
    stuck.say(radix::Command(
        sequence, radix::kCommandAddConfiguration,
        radix::encodeDictionary(
            {{radix::kKeyPayload, Value::bytes({reinterpret_cast<const std::uint8_t*>(text.data()), text.size()})}})));
  };
  // Of the records that wait for it in the service.
  const auto queued = [&]() -> std::uint64_t {
    if (perform(other, radix::kCommandShowStatus).status != 0) return 0;
    for (const Value& client : *reply_.find("clients")->list()) {
      const Dictionary& entry = *client.dictionary();
      if (entry.find("name")->text() == "stuck") return entry.find("queued")->rawUInt64();
    }
    return 0;
  };
  stuck.say(radix::Hello("stuck"));
  stuck.say(radix::Delivery(true));
  pushNow(1, "[metrics]\nK_LTE_RRC_STATE = \"on change\"\nK_LTE_CDRX_CONFIG = \"on change\"\n");
  ASSERT_TRUE(until([&] { return stuck.replies.size() == 1; }));
  stuck.setReading(false);
  world_->emit(K_LTE_CDRX_CONFIG, numbered(0));
  world_->settle();
  std::size_t count = 0;
  std::uint8_t number = 0;
  // With 60 kB that nobody knows behind it, so that the transport is full soon. Up to 64 may wait for a moment although
  // there is room: records leave together.
  while (queued() <= 64 && count < 1000) {
    number = static_cast<std::uint8_t>(++count % 100);
    Bytes large = numbered(number);
    large.insert(large.end(), {0xA2, 0x1F, 0xE0, 0xD4, 0x03});
    large.resize(large.size() + 60'000);
    world_->emit(K_LTE_RRC_STATE, large);
    world_->settle();
  }
  const std::uint64_t waited = queued();
  ASSERT_GT(waited, 64U);
  // It does not want those any more, and has not had this one.
  world_->emit(K_LTE_CDRX_CONFIG, numbered(101));
  pushNow(2, "[metrics]\nK_LTE_CDRX_CONFIG = \"on change\"\nK_LTE_TX_POWER = 1000\n");
  ASSERT_TRUE(until([&] { return queued() == 1; }));
  stuck.setReading(true);
  ASSERT_TRUE(until([&] { return stuck.replies.size() == 2 && stuck.events.size() == count - waited + 2; }));
  EXPECT_EQ(radix::signedOf(stuck.events.back().metricId()), K_LTE_CDRX_CONFIG);
  EXPECT_EQ(radix::copyOf(stuck.events.back().payload()), numbered(101));
  EXPECT_EQ(stuck.dropped, 0U);
  // What was taken back was never sent: whoever wants it again gets the last of it.
  pushNow(3, "[metrics]\nK_LTE_RRC_STATE = 1000\n");
  ASSERT_TRUE(until([&] { return stuck.events.size() == count - waited + 3; }));
  EXPECT_EQ(stuck.events.back().payload()[1], number);
  stuck.hangUp();
}

TEST_P(Contract, AnAnswerGoesOnceToEachWhoAskedAndToThoseWhoTakeTheMetricAnyway) {
  world_->onService([&] { world_->script().onQuery = [](std::int64_t) { return true; }; });
  Client& first = connect("first");
  Client& second = connect("second");
  Client& silent = connect("silent");
  Client& watching = observe("watching");
  for (Client* client : {&first, &second, &silent, &watching}) listen(*client);
  ASSERT_EQ(query(first, 0, K_LTE_RRC_STATE).status, 0);
  ASSERT_EQ(query(second, 0, K_LTE_RRC_STATE).status, 0);
  ASSERT_EQ(query(watching, 0, K_LTE_RRC_STATE).status, 0);
  // Another metric is no answer, and after the answer the metric flows for others.
  world_->emit(K_LTE_TX_POWER, numbered(1));
  world_->emit(K_LTE_RRC_STATE, numbered(2));
  world_->emit(K_LTE_RRC_STATE, numbered(3));
  ASSERT_TRUE(until([&] { return watching.events.size() == 3; }));
  world_->settle();
  EXPECT_EQ(numbersOf(first.payloads()), std::vector<int>{2});
  EXPECT_EQ(numbersOf(second.payloads()), std::vector<int>{2});
  EXPECT_TRUE(silent.events.empty());
  EXPECT_EQ(numbersOf(watching.payloads()), (std::vector<int>{1, 2, 3}));
  // Asking keeps no source awake.
  watching.manager.reset();
  EXPECT_TRUE(until([&] { return !sourceIsHeard(); }));
}

TEST_P(Contract, EachQuestionIsAnsweredAndOneThatIsRefusedTakesNothingFromThoseBefore) {
  bool takes = true;
  world_->onService([&] { world_->script().onQuery = [&takes](std::int64_t) { return takes; }; });
  Client& client = connect();
  listen(client);
  ASSERT_EQ(query(client, 0, K_LTE_RRC_STATE).status, 0);
  ASSERT_EQ(query(client, 0, K_LTE_RRC_STATE).status, 0);
  world_->onService([&] { takes = false; });
  EXPECT_NE(query(client, 0, K_LTE_RRC_STATE).status, 0);
  for (std::uint8_t number = 1; number <= 3; ++number) world_->emit(K_LTE_RRC_STATE, numbered(number));
  ASSERT_TRUE(until([&] { return client.events.size() >= 2; }));
  world_->settle();
  EXPECT_EQ(numbersOf(client.payloads()), (std::vector<int>{1, 2}));
}

TEST_P(Contract, AQuestionThatIsRefusedOpensNothing) {
  world_->onService([&] { world_->script().onQuery = [](std::int64_t) { return false; }; });
  Client& client = connect();
  listen(client);
  EXPECT_NE(query(client, 0, K_LTE_RRC_STATE).status, 0);
  world_->emit(K_LTE_RRC_STATE, numbered(1));
  world_->settle();
  EXPECT_TRUE(client.events.empty());
}

TEST_P(Contract, AnAnswerThatComesWhileEventsAreOffIsThereWhenTheyAreOn) {
  world_->onService([&] { world_->script().onQuery = [](std::int64_t) { return true; }; });
  Client& client = connect();
  listen(client);
  ASSERT_EQ(query(client, 0, K_LTE_RRC_STATE).status, 0);
  radix::client::EventsOff(client.manager);
  world_->settle();
  world_->emit(K_LTE_RRC_STATE, numbered(1));
  world_->settle();
  EXPECT_TRUE(client.events.empty());
  listen(client);
  EXPECT_EQ(numbersOf(client.payloads()), std::vector<int>{1});
  listen(client);
  EXPECT_EQ(client.events.size(), 1U);
}

TEST_P(Contract, ForAnObserverSourcesRunAtTheirOwnPeriodsOrShorterWhereAConfigurationAsks) {
  Client& narrow = connect("narrow");
  ASSERT_EQ(push(narrow, "[metrics]\nK_LTE_RRC_STATE = 1000\n").status, 0);
  listen(narrow);
  EXPECT_FALSE(plan()->observed);
  Client& client = observe();
  world_->settle();
  EXPECT_FALSE(plan()->observed) << "it does not listen yet";
  listen(client);
  ASSERT_TRUE(plan());
  EXPECT_TRUE(plan()->observed);
  EXPECT_EQ(plan()->metrics.at(K_LTE_RRC_STATE), milliseconds(1000));
  narrow.manager.reset();
  EXPECT_TRUE(until([&] { return !plan(); })) << "alone it needs no plan";
}

TEST_P(Contract, TheClientIsToldWhatFeedsTheServiceAndWhenThatChanges) {
  Client& client = connect();
  const auto sources = [&] { return radix::client::Connection(client.manager).sources; };
  using State = radix::client::SourceState;
  ASSERT_TRUE(until([&] { return sources().has_value(); }));
  ASSERT_EQ(sources()->size(), 1U);
  EXPECT_EQ((*sources())[0].origin, "scripted");
  EXPECT_EQ((*sources())[0].phase, State::Phase::Running);
  EXPECT_EQ((*sources())[0].metrics, world_->script().metrics);
  world_->onService([&] { world_->script().sink->conditionChanged({.phase = State::Phase::Ended, .reason = {}}); });
  EXPECT_TRUE(until([&] { return (*sources())[0].phase == State::Phase::Ended; }));
  // It has more to say after all.
  world_->onService([&] { world_->script().sink->conditionChanged({}); });
  EXPECT_TRUE(until([&] { return (*sources())[0].phase == State::Phase::Running; }));
  world_->onService(
      [&] { world_->script().onQuery = [](std::int64_t) -> bool { throw std::runtime_error("out of order"); }; });
  query(client, 0, K_LTE_TX_POWER);
  ASSERT_TRUE(until([&] { return (*sources())[0].phase == State::Phase::Failed; }));
  EXPECT_EQ((*sources())[0].reason, "failed answering a query: out of order");
  // Nobody knows what feeds a service that is not there.
  world_->kill();
  EXPECT_TRUE(until([&] { return !sources(); }));
}

TEST_P(Contract, OfMoreSourcesThanAreToldTheClientKnowsThatTheyAreNotAll) {
  Client& client = connect();
  const auto state = [&] { return radix::client::Connection(client.manager); };
  ASSERT_TRUE(until([&] { return state().sources.has_value(); }));
  EXPECT_FALSE(state().areSourcesCut);
  std::vector<std::shared_ptr<TestService::Script>> scripts;
  world_->onService([&] {
    while (scripts.size() < radix::SourceStates::most) {
      scripts.push_back(std::make_shared<TestService::Script>());
      scripts.back()->origin = "source " + std::to_string(scripts.size());
      world_->service().addSource(std::make_unique<ScriptedSource>(scripts.back()));
    }
  });
  EXPECT_TRUE(until([&] { return state().areSourcesCut; }));
  EXPECT_EQ(state().sources->size(), radix::SourceStates::most);
  // Of a service that is not there nothing is known, and the next one has one source.
  world_->kill();
  EXPECT_TRUE(until([&] { return !state().connected; }));
  EXPECT_FALSE(state().areSourcesCut);
  world_->restart();
  EXPECT_TRUE(until([&] { return state().sources.has_value(); }));
  EXPECT_FALSE(state().areSourcesCut);
}

TEST_P(Contract, TheOutcomeOfTheConfigurationIsKnown) {
  Client& client = connect();
  using Outcome = radix::client::ConfigurationOutcome;
  const auto outcome = [&] { return radix::client::Connection(client.manager).configuration; };
  EXPECT_EQ(outcome(), Outcome::NotPushed);
  push(client, "[metrics]\n");
  EXPECT_EQ(outcome(), Outcome::Accepted);
  const Result refused = push(client, "[metrics\n");
  EXPECT_EQ(outcome(), Outcome::Refused);
  EXPECT_EQ(radix::client::Connection(client.manager).configurationTrouble, refused.message);
  perform(client, radix::kCommandClearConfiguration);
  EXPECT_EQ(outcome(), Outcome::NotPushed);
  EXPECT_EQ(radix::client::Connection(client.manager).configurationTrouble, "");
  const Result tooLarge = push(client, std::string(200000, '#'));
  EXPECT_TRUE(until([&] { return outcome() == Outcome::Refused; }));
  EXPECT_EQ(radix::client::Connection(client.manager).configurationTrouble, tooLarge.message);
  world_->kill();
  ASSERT_TRUE(until([&] { return !radix::client::Connection(client.manager).connected; }));
  push(client, "[metrics]\n");
  EXPECT_EQ(outcome(), Outcome::Unsent);
  world_->restart();
  EXPECT_TRUE(until([&] { return outcome() == Outcome::Accepted; }));
  world_->kill();
  ASSERT_TRUE(until([&] { return !radix::client::Connection(client.manager).connected; }));
  push(client, "[metrics\n");
  world_->restart();
  EXPECT_TRUE(until([&] { return outcome() == Outcome::Refused; }));
}

TEST_P(Contract, SourcesAreToldTheUnionOfAllConfigurationsAtTheShortestPeriod) {
  EXPECT_EQ(plan(), std::nullopt);
  Client& first = connect("first");
  Client& second = connect("second");
  ASSERT_EQ(push(first, "[metrics]\nK_LTE_RRC_STATE = 1000\nK_LTE_TX_POWER = 500\n").status, 0);
  ASSERT_EQ(push(second, "[metrics]\nK_LTE_RRC_STATE = 200\nK_LTE_TX_POWER = \"on change\"\n").status, 0);
  auto both = plan();
  ASSERT_TRUE(both);
  EXPECT_EQ(both->metrics.at(K_LTE_RRC_STATE), milliseconds(200));
  EXPECT_EQ(both->metrics.at(K_LTE_TX_POWER), std::nullopt);
  ASSERT_EQ(perform(second, radix::kCommandClearConfiguration, {{radix::kKeyAppID, std::int64_t{2}}}).status, 0);
  EXPECT_EQ(plan()->metrics.at(K_LTE_RRC_STATE), milliseconds(1000));
}

TEST_P(Contract, AConfigurationGoesWithItsConnection) {
  Client& client = connect();
  ASSERT_EQ(push(client, "[metrics]\nK_LTE_RRC_STATE = 1000\n").status, 0);
  ASSERT_TRUE(plan());
  client.manager.reset();
  EXPECT_TRUE(until([&] { return !plan(); }));
}

TEST_P(Contract, TheBaseConfigurationCountsAsThatOfOneMoreClientUntilItIsCleared) {
  Client& client = connect();
  ASSERT_EQ(push(client, "[metrics]\nK_LTE_RRC_STATE = 300\n", radix::kCommandSetBaseConfiguration).status, 0);
  EXPECT_EQ(plan()->metrics.at(K_LTE_RRC_STATE), milliseconds(300));
  client.manager.reset();
  Client& other = connect();
  world_->settle();
  ASSERT_TRUE(plan());
  ASSERT_EQ(perform(other, radix::kCommandClearBaseConfiguration).status, 0);
  EXPECT_EQ(plan(), std::nullopt);
}

TEST_P(Contract, AnEmptyConfigurationIsValidAndAsksForNothing) {
  Client& client = connect();
  EXPECT_EQ(push(client, "").status, 0);
  ASSERT_TRUE(plan());
  EXPECT_TRUE(plan()->metrics.empty());
}

TEST_P(Contract, AnUnknownMetricIsNotedAndIgnored) {
  Client& client = connect();
  EXPECT_EQ(push(client, "[metrics]\nK_NOBODY_KNOWS = 5\nK_LTE_RRC_STATE = 1000\n").status, 0);
  EXPECT_EQ(plan()->metrics.size(), 1U);
  EXPECT_EQ(logged("'test': line 2: the metric"), 1U);
  EXPECT_NE(push(client, "[metrics]\nK_NOBODY_KNOWS = 5\n").message.find("line 2"), std::string::npos);
}

TEST_P(Contract, ASyntaxErrorIsRefusedWithLineAndColumnAndChangesNothing) {
  Client& client = connect();
  ASSERT_EQ(push(client, "[metrics]\nK_LTE_RRC_STATE = 1000\n").status, 0);
  const Result result = push(client, "[metrics]\nK_LTE_RRC_STATE = = 5\n");
  EXPECT_EQ(result.status, static_cast<int>(Status::BadConfiguration));
  EXPECT_NE(result.message.find("line 2"), std::string::npos) << result.message;
  EXPECT_NE(result.message.find("column"), std::string::npos) << result.message;
  EXPECT_EQ(plan()->metrics.at(K_LTE_RRC_STATE), milliseconds(1000));
}

TEST_P(Contract, AConfigurationWithoutPayloadOrOfAnotherTypeIsRefused) {
  Client& client = connect();
  EXPECT_EQ(perform(client, radix::kCommandAddConfiguration, {{radix::kKeyAppID, std::int64_t{2}}}).status,
            static_cast<int>(Status::BadArguments));
  const Result result = perform(client, radix::kCommandAddConfiguration,
                                {{radix::kKeyPayload, Value::bytes({})}, {radix::kKeyPayloadType, std::int64_t{4}}});
  EXPECT_EQ(result.status, static_cast<int>(Status::BadArguments));
  EXPECT_NE(result.message.find("4"), std::string::npos);
}

// A configuration of exactly that many bytes.
std::string configurationOf(std::size_t size) { return std::string(size - 1, '#') + "\n"; }

TEST_P(Contract, AConfigurationUpToTheLimitOfAFrameIsTakenAndOneByteMoreIsRefusedByTheClientLibrary) {
  Client& client = connect();
  const Result refused = push(client, configurationOf(radix::longestFrame));
  EXPECT_EQ(refused.status, static_cast<int>(Status::TooLarge));
  // The message names the limit, which is what really fits.
  const std::string start = "the configuration has 131072 bytes; at most ";
  ASSERT_EQ(refused.message.substr(0, start.size()), start);
  const std::size_t limit = std::stoul(refused.message.substr(start.size()));
  EXPECT_GT(limit, 130000U);
  EXPECT_EQ(push(client, configurationOf(limit)).status, 0);
  EXPECT_EQ(push(client, configurationOf(limit + 1)).status, static_cast<int>(Status::TooLarge));
  EXPECT_TRUE(radix::client::Connection(client.manager).connected);
}

TEST_P(Contract, AnUnknownCommandIsRefused) {
  Client& client = connect();
  const Result result = perform(client, "kCommandMakeCoffee");
  EXPECT_EQ(result.status, static_cast<int>(Status::UnknownCommand));
  EXPECT_EQ(result.message, "the command 'kCommandMakeCoffee' is not known");
}

TEST_P(Contract, AQueryOfATriggerAsksForTheMetricsThatTheConfigurationNamesAndAnswersAsAnEvent) {
  Client& client = connect();
  world_->onService([&] {
    world_->script().onQuery = [this](std::int64_t metric) {
      world_->script().emit(metric, {});
      return true;
    };
  });
  EXPECT_EQ(query(client, 0x7F0013, 0).status, static_cast<int>(Status::CannotFill));
  ASSERT_EQ(push(client, "[metrics]\n[triggers]\n0x7F0013 = [\"K_SIM_FILE_INFO\"]\n").status, 0);
  listen(client);
  const Result result = query(client, 0x7F0013, 0);
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.message, "");
  ASSERT_TRUE(until([&] { return !client.events.empty(); }));
  EXPECT_EQ(client.metrics(), std::vector<std::int64_t>{K_SIM_FILE_INFO});
}

TEST_P(Contract, AQueriedMetricIsDeliveredAlsoWhenTheConfigurationDoesNotNameIt) {
  Client& client = connect();
  world_->onService([&] { world_->script().onQuery = [](std::int64_t) { return true; }; });
  ASSERT_EQ(push(client, "").status, 0);
  listen(client);
  ASSERT_EQ(query(client, 0, K_LTE_TX_POWER).status, 0);
  world_->emit(K_LTE_TX_POWER, {});
  EXPECT_TRUE(until([&] { return client.events.size() == 1; }));
}

TEST_P(Contract, AQueryThatNoSourceCanFillIsRefusedWithTheMetricsName) {
  world_->onService([&] { world_->script().metrics = {K_LTE_RRC_STATE}; });
  world_->kill();
  world_->restart();
  Client& client = connect();
  const Result result = query(client, 0, K_LTE_TX_POWER);
  EXPECT_EQ(result.status, static_cast<int>(Status::CannotFill));
  EXPECT_EQ(result.message, "no source can fill K_LTE_TX_POWER (0x3CD302)");
  EXPECT_EQ(query(client, 0, 77).message,
            "0x4D is no metric, and no configuration says which metrics a trigger of that number stands for: push one "
            "with it under [triggers]");
  EXPECT_EQ(query(client, 0, 0).status, static_cast<int>(Status::BadArguments));
  const Result unknown = query(client, 5, 0);
  EXPECT_EQ(unknown.status, static_cast<int>(Status::CannotFill));
  EXPECT_NE(unknown.message.find("0x5"), std::string::npos);
}

TEST_P(Contract, AQueryOfAMetricWithoutAValueYetSaysSo) {
  world_->onService([&] { world_->script().onQuery = [](std::int64_t) { return false; }; });
  const Result result = query(connect(), 0, K_LTE_TX_POWER);
  EXPECT_EQ(result.status, static_cast<int>(Status::CannotFill));
  EXPECT_EQ(result.message, "no source has a value of K_LTE_TX_POWER (0x3CD302) yet");
}

TEST_P(Contract, AnIdentifierThatIsNoMetricsIsTakenForThatOfATrigger) {
  Client& client = connect();
  std::vector<std::int64_t> asked;
  world_->onService([&] {
    world_->script().onQuery = [&asked](std::int64_t metric) {
      asked.push_back(metric);
      return true;
    };
  });
  const Result untold = query(client, 0, 0x7F0013);
  EXPECT_EQ(untold.status, static_cast<int>(Status::CannotFill));
  EXPECT_EQ(untold.message,
            "0x7F0013 is no metric, and no configuration says which metrics a trigger of that number stands for: push "
            "one with it under [triggers]");
  ASSERT_EQ(push(client, "[triggers]\n0x7F0013 = [\"K_SIM_FILE_INFO\"]\n").status, 0);
  EXPECT_EQ(query(client, 0, 0x7F0013).status, 0);
  world_->onService([&] { EXPECT_EQ(asked, std::vector<std::int64_t>{K_SIM_FILE_INFO}); });
}

TEST_P(Contract, ASourceIsToldWhetherAnybodyListens) {
  Client& client = observe();
  world_->settle();
  EXPECT_FALSE(sourceIsHeard());
  listen(client);
  EXPECT_TRUE(sourceIsHeard());
  radix::client::EventsOff(client.manager);
  world_->settle();
  EXPECT_FALSE(sourceIsHeard());
  listen(client);
  client.manager.reset();
  EXPECT_TRUE(until([&] { return !sourceIsHeard(); }));
}

TEST_P(Contract, APayloadThatDoesNotDecodeIsCountedLoggedAndWithheld) {
  Client& client = observe();
  listen(client);
  world_->emit(K_LTE_RRC_STATE, {0x08});
  world_->emit(K_LTE_RRC_STATE, rrcState(2));
  ASSERT_TRUE(until([&] { return !client.events.empty(); }));
  world_->settle();
  ASSERT_EQ(client.events.size(), 1U);
  EXPECT_EQ(client.payloads()[0], rrcState(2));
  EXPECT_EQ(logged("a record of K_LTE_RRC_STATE (0x3C4E04) was withheld"), 1U);
  ASSERT_EQ(perform(client, radix::kCommandShowStatus).status, 0);
  const Value& source = (*reply_.find("sources")->list())[0];
  EXPECT_EQ(source.dictionary()->find("withheld")->rawUInt64(), 1U);
}

TEST_P(Contract, TheStatusTellsSourcesClientsAndCounts) {
  Client& client = observe("somebody");
  listen(client);
  world_->emit(K_LTE_RRC_STATE, rrcState(2), milliseconds(5000));
  ASSERT_TRUE(until([&] { return client.events.size() == 1; }));
  ASSERT_EQ(perform(client, radix::kCommandShowStatus).status, 0);
  EXPECT_EQ(reply_.find("base_configuration")->boolean(), false);
  const Dictionary& source = *(*reply_.find("sources")->list())[0].dictionary();
  EXPECT_EQ(source.find("origin")->text(), "scripted");
  EXPECT_EQ(source.find("records")->rawUInt64(), 1U);
  EXPECT_EQ(source.find("last_record_ms")->int64(), 5000);
  const List& clients = *reply_.find("clients")->list();
  ASSERT_EQ(clients.size(), 1U);
  const Dictionary& entry = *clients[0].dictionary();
  EXPECT_EQ(entry.find("name")->text(), "somebody");
  EXPECT_EQ(entry.find("listening")->boolean(), true);
  EXPECT_EQ(entry.find("configured")->boolean(), false);
  EXPECT_EQ(entry.find("records")->rawUInt64(), 1U);
  EXPECT_EQ(entry.find("lost")->rawUInt64(), 0U);
}

TEST_P(Contract, ASourceThatThrowsEndsAndTheServiceGoesOn) {
  Client& client = connect();
  world_->onService(
      [&] { world_->script().onQuery = [](std::int64_t) -> bool { throw std::runtime_error("out of order"); }; });
  const Result result = query(client, 0, K_LTE_TX_POWER);
  EXPECT_EQ(result.status, static_cast<int>(Status::CannotFill));
  EXPECT_EQ(logged("scripted failed answering a query: out of order; it runs no more"), 1U);
  ASSERT_EQ(perform(client, radix::kCommandShowStatus).status, 0);
  const Dictionary& source = *(*reply_.find("sources")->list())[0].dictionary();
  EXPECT_EQ(source.find("failure")->text(), "failed answering a query: out of order");
  // It is asked no more.
  EXPECT_EQ(query(client, 0, K_LTE_TX_POWER).status, static_cast<int>(Status::CannotFill));
}

TEST_P(Contract, ASourceThatThrowsInATimerEndsAndTheServiceGoesOn) {
  Client& client = connect();
  ScheduledTaskHandle timer;
  world_->onService([&] { timer = world_->script().context->scheduler.after(milliseconds(1), [] { throw 7; }); });
  EXPECT_TRUE(until([&] { return logged("failed in a timer: something that is no exception") == 1; }));
  world_->onService([&] { timer.reset(); });
  EXPECT_EQ(perform(client, radix::kCommandShowStatus).status, 0);
}

TEST_P(Contract, WithoutAServiceEachCommandAnswersWithANonZeroStatusThatSaysSo) {
  Client& client = connect();
  world_->settle();
  world_->kill();
  ASSERT_TRUE(until([&] { return !radix::client::Connection(client.manager).connected; }));
  const Result result = perform(client, radix::kCommandQueryMetric);
  EXPECT_EQ(result.status, static_cast<int>(Status::NoService));
  EXPECT_NE(result.message.find("no baseband service"), std::string::npos) << result.message;
  EXPECT_FALSE(radix::client::Connection(client.manager).trouble.empty());
}

TEST_P(Contract, AClientStartedBeforeTheServiceConnectsWhenItComes) {
  world_->kill();
  Client& client = observe();
  EXPECT_EQ(perform(client, radix::kCommandShowStatus).status, static_cast<int>(Status::NoService));
  EXPECT_FALSE(radix::client::Connection(client.manager).everConnected);
  radix::client::EventsOn(client.manager);
  world_->restart();
  ASSERT_TRUE(until([&] { return radix::client::Connection(client.manager).connected; }));
  world_->settle();
  world_->emit(K_LTE_RRC_STATE, rrcState(2));
  EXPECT_TRUE(until([&] { return client.events.size() == 1; }));
}

TEST_P(Contract, AConfigurationPushedWhileTheServiceIsAwayIsRestoredWhenItComes) {
  world_->kill();
  Client& client = connect();
  EXPECT_EQ(push(client, "[metrics]\nK_LTE_RRC_STATE = 250\n").status, static_cast<int>(Status::NoService));
  world_->restart();
  ASSERT_TRUE(until([&] { return plan().has_value(); }));
  EXPECT_EQ(plan()->metrics.at(K_LTE_RRC_STATE), milliseconds(250));
}

TEST_P(Contract, AfterARestartOfTheServiceConfigurationAndDeliveryAreRestored) {
  Client& client = connect();
  ASSERT_EQ(push(client, "[metrics]\nK_LTE_RRC_STATE = 250\n").status, 0);
  listen(client);
  world_->kill();
  ASSERT_TRUE(until([&] { return !radix::client::Connection(client.manager).connected; }));
  world_->restart();
  ASSERT_TRUE(until([&] { return sourceIsHeard(); }));
  ASSERT_TRUE(plan());
  EXPECT_EQ(plan()->metrics.at(K_LTE_RRC_STATE), milliseconds(250));
  world_->emit(K_LTE_TX_POWER, {});
  world_->emit(K_LTE_RRC_STATE, rrcState(2));
  ASSERT_TRUE(until([&] { return !client.events.empty(); }));
  EXPECT_EQ(client.metrics(), std::vector<std::int64_t>{K_LTE_RRC_STATE});
}

TEST_P(Contract, WhatWasClearedOrSwitchedOffIsNotRestored) {
  Client& client = connect();
  ASSERT_EQ(push(client, "[metrics]\nK_LTE_RRC_STATE = 250\n").status, 0);
  listen(client);
  ASSERT_EQ(perform(client, radix::kCommandClearConfiguration).status, 0);
  radix::client::EventsOff(client.manager);
  world_->kill();
  world_->restart();
  ASSERT_TRUE(until([&] { return radix::client::Connection(client.manager).connected; }));
  world_->settle();
  EXPECT_EQ(plan(), std::nullopt);
  EXPECT_FALSE(sourceIsHeard());
}

TEST_P(Contract, AClientPastTheLimitIsRefusedWithAReasonAndTheOthersAreServed) {
  make({.mostClients = 3, .keptForOwn = 0});
  for (int number = 0; number < 3; ++number) {
    ASSERT_EQ(perform(connect(), radix::kCommandShowStatus).status, 0);
  }
  const Result result = perform(connect(), radix::kCommandShowStatus);
  EXPECT_EQ(result.status, static_cast<int>(Status::TooMany));
  EXPECT_EQ(result.message, "there are already 3 clients, more are not served");
  EXPECT_EQ(perform(*clients_[0], radix::kCommandShowStatus).status, 0);
}

TEST_P(Contract, AClientOlderThanTheServiceLikesIsRefusedAndToldWhichSideToUpdate) {
  make({.versions = {.spoken = 3, .oldest = 2}});
  const Result result = perform(connect(), radix::kCommandShowStatus);
  EXPECT_EQ(result.status, static_cast<int>(Status::VersionMismatch));
  EXPECT_NE(result.message.find("update the client"), std::string::npos) << result.message;
}

TEST_P(Contract, AServiceOfALaterVersionThatStillKnowsOursIsServed) {
  make({.versions = {.spoken = 3, .oldest = 1}});
  EXPECT_EQ(perform(connect(), radix::kCommandShowStatus).status, 0);
}

}  // namespace
}  // namespace probeview
