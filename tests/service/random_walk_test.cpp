// SPDX-License-Identifier: Apache-2.0
//
// Random interleavings of all that clients, sources and the service can do, with the promises of the socket as
// invariants: order kept, nothing delivered twice, losses counted exactly, others unharmed. Each failure names its
// seed.
#include <gtest/gtest.h>

#include <cstdlib>
#include <map>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "messages/metric_identifiers.h"
#include "platform/system_log.h"
#include "radix/client.h"
#include "radix/service_commands.h"
#include "radix/status.h"
#include "tests/service/harness/raw_client.h"
#include "tests/service/harness/test_service.h"
#include "tests/support/frames.h"

namespace probeview {
namespace {

using Factory = std::unique_ptr<TestService> (*)(Service::Settings);
using radix::client::ManagerHandle;

constexpr std::int64_t metricsUsed[] = {K_LTE_RRC_STATE, K_LTE_TX_POWER, K_LTE_CDRX_CONFIG, K_GSM_SCELL_INFO};

class Silence final : public LineSink {
 public:
  void line(std::string_view) override {}
};

// A record bears its number as its time, so that each can be told from all others.
class RandomWalk : public ::testing::TestWithParam<Factory> {
 protected:
  struct Client {
    ManagerHandle manager;
    std::vector<std::pair<std::int64_t, std::int64_t>> events;  // number, metric
    bool observes = false;
    bool on = false;
    std::optional<std::set<std::int64_t>> configured;
    std::set<std::int64_t> answers;  // the records that it has asked for
    // Its promises hold for the stretch since the last EventsOn: what was emitted from here on must come.
    std::size_t begin = 0;         // index into its events
    std::int64_t firstNumber = 0;  // the first record that must come
    std::uint64_t lostBefore = 0;
    int brokenInARow = 0;
  };

  // A client that reads when it likes, and is owed every record since it came.
  struct SlowClient {
    std::unique_ptr<RawClient> raw;
    std::set<std::int64_t> owed;   // the last records that there were, by their numbers
    std::int64_t firstNumber = 0;  // and all from here on
    bool reading = true;
  };

  void start(std::uint32_t seed) {
    clients_.clear();
    slowClients_.clear();
    world_.reset();
    random_.seed(seed);
    number_ = 0;
    world_ = GetParam()({.outbox = {.records = 40, .bytes = 1 << 20}});
    world_->script().metrics.assign(std::begin(metricsUsed), std::end(metricsUsed));
    std::sort(world_->script().metrics.begin(), world_->script().metrics.end());
    world_->script().onQuery = [this](std::int64_t metric) {
      emitted_.emplace_back(++number_, metric);
      world_->script().emit(metric, {}, std::chrono::milliseconds(number_));
      return true;
    };
    emitted_.clear();
    world_->kill();
    world_->restart();
    startedAt_ = number_ + 1;
  }

  std::size_t pick(std::size_t below) { return random_() % below; }

  void connect() {
    clients_.push_back(std::make_unique<Client>());
    Client& client = *clients_.back();
    client.observes = pick(3) == 0;
    client.manager = world_->manager("walker", {.observes = client.observes});
    radix::client::RegisterEventHandler(client.manager, radix::kEventMetric,
                                        [&client](const radix::client::ObjectHandle& object, radix::client::Group) {
                                          const Dictionary event = radix::client::nativeDictionary(*object);
                                          client.events.emplace_back(*event.find(radix::kKeyTime)->int64(),
                                                                     *event.find(radix::kKeyMetricID)->int64());
                                        });
  }

  std::int32_t perform(Client& client, std::string_view command, const Dictionary& arguments = {}) {
    radix::client::ObjectHandle reply;
    return radix::client::PerformCommand(client.manager, command, arguments, reply).status;
  }

  void push(Client& client, bool serviceIsThere = true) {
    std::string text = "[metrics]\n";
    std::set<std::int64_t> chosen;
    for (const std::int64_t metric : metricsUsed) {
      if (pick(2) == 0) continue;
      chosen.insert(metric);
      text += std::string(metricWithId(metric)->name) + " = " + std::to_string(1 + pick(5000)) + "\n";
    }
    // Of those that nobody has judged the last four are kept: a good one among them.
    const bool broken = pick(5) == 0 && client.brokenInARow < 3;
    client.brokenInARow = broken ? client.brokenInARow + 1 : 0;
    if (broken) text += "[[[";
    const std::int32_t status = perform(
        client, radix::kCommandAddConfiguration,
        {{radix::kKeyPayload, Value::bytes({reinterpret_cast<const std::uint8_t*>(text.data()), text.size()})}});
    EXPECT_EQ(status == 0, !broken && serviceIsThere);
    if (!serviceIsThere) {
      // It is pushed again when the service comes; where it is refused then, the one before it goes on to count.
      if (!broken) client.configured = std::move(chosen);
      return;
    }
    if (status == 0) {
      client.configured = std::move(chosen);
    }
    // From here on it gets something else.
    restartStretch(client);
  }

  void restartStretch(Client& client) {
    world_->settle();
    client.begin = client.events.size();
    client.firstNumber = number_ + 1;
    client.lostBefore = radix::client::Connection(client.manager).lostEvents;
  }

  void emit(std::size_t count) {
    world_->onService([&] {
      for (std::size_t index = 0; index < count; ++index) {
        const std::int64_t metric = metricsUsed[pick(std::size(metricsUsed))];
        emitted_.emplace_back(++number_, metric);
        world_->script().emit(metric, {}, std::chrono::milliseconds(number_));
      }
    });
  }

  // What came since the stretch began is what was emitted for it, in order, each once, but for what it was told to have
  // lost.
  void check(Client& client) {
    world_->settle();
    std::vector<std::int64_t> expected;
    for (const auto& [number, metric] : emitted_) {
      if (number < client.firstNumber || !client.on) continue;
      const bool flows = client.observes || (client.configured && client.configured->contains(metric));
      if (!flows && !client.answers.contains(number)) continue;
      expected.push_back(number);
    }
    const auto lost = [&] { return radix::client::Connection(client.manager).lostEvents - client.lostBefore; };
    EXPECT_TRUE(world_->until([&] { return client.events.size() - client.begin + lost() >= expected.size(); }));
    EXPECT_EQ(client.events.size() - client.begin + lost(), expected.size());
    std::int64_t last = 0;
    std::set<std::int64_t> wanted(expected.begin(), expected.end());
    for (std::size_t index = client.begin; index < client.events.size(); ++index) {
      EXPECT_GT(client.events[index].first, last) << "out of order or twice";
      last = client.events[index].first;
      EXPECT_TRUE(wanted.contains(last)) << "nobody emitted this for it";
    }
    // Numbers are never used again, whatever service runs.
    std::set<std::int64_t> all;
    for (const auto& [number, metric] : client.events) EXPECT_TRUE(all.insert(number).second) << number << " twice";
  }

  void connectSlow() {
    SlowClient client;
    client.raw = std::make_unique<RawClient>(world_->rawLink());
    client.raw->say(radix::observer("slow"));
    client.raw->say(radix::Delivery(true));
    client.raw->say(radix::Ping(1));
    EXPECT_TRUE(world_->until([&] { return !client.raw->pings.empty(); }));
    std::map<std::int64_t, std::int64_t> last;
    for (const auto& [number, metric] : emitted_) {
      if (number >= startedAt_) last[metric] = number;
    }
    for (const auto& [metric, number] : last) client.owed.insert(number);
    client.firstNumber = number_ + 1;
    slowClients_.push_back(std::move(client));
  }

  void checkSlow(SlowClient& client) {
    client.reading = true;
    client.raw->setReading(true);
    std::set<std::int64_t> owed = client.owed;
    for (const auto& [number, metric] : emitted_) {
      if (number >= client.firstNumber) owed.insert(number);
    }
    const RawClient& raw = *client.raw;
    EXPECT_TRUE(world_->until([&] { return raw.events.size() + raw.dropped >= owed.size(); }));
    EXPECT_EQ(raw.events.size() + raw.dropped, owed.size());
    std::int64_t last = 0;
    for (const radix::Event& event : raw.events) {
      const std::int64_t time = radix::signedOf(event.time());
      EXPECT_GT(time, last) << "out of order or twice";
      last = time;
      EXPECT_TRUE(owed.contains(last)) << "nobody emitted this for it";
    }
    EXPECT_FALSE(raw.closed);
  }

  void stepSlow(std::size_t what) {
    if (slowClients_.empty() || (what == 0 && slowClients_.size() < 3)) return connectSlow();
    const std::size_t index = pick(slowClients_.size());
    SlowClient& client = slowClients_[index];
    if (what == 1) {
      slowClients_.erase(slowClients_.begin() + static_cast<std::ptrdiff_t>(index));
    } else if (what == 2) {
      checkSlow(client);
    } else {
      client.reading = !client.reading;
      client.raw->setReading(client.reading);
    }
  }

  void step() {
    if (pick(5) == 0) return stepSlow(pick(6));
    const std::size_t what = pick(20);
    if (clients_.empty() || (what == 0 && clients_.size() < 5)) return connect();
    const std::size_t index = pick(clients_.size());
    Client& client = *clients_[index];
    switch (what) {
      case 1:
        clients_.erase(clients_.begin() + static_cast<std::ptrdiff_t>(index));
        break;
      case 2:
        push(client);
        break;
      case 3:
        EXPECT_EQ(perform(client, radix::kCommandClearConfiguration), 0);
        client.configured.reset();
        restartStretch(client);
        break;
      case 4:
      case 5: {
        const std::int64_t metric = metricsUsed[pick(std::size(metricsUsed))];
        // The answer goes to whoever takes the metric, and to the asker, who gets no more of it than that.
        restartStretch(client);
        client.answers.insert(number_ + 1);
        EXPECT_EQ(perform(client, radix::kCommandQueryMetric, {{radix::kKeyMetricID, metric}}), 0);
        break;
      }
      case 6:
      case 7:
      case 8:
        radix::client::EventsOff(client.manager);
        radix::client::EventsOn(client.manager);
        client.on = true;
        restartStretch(client);
        break;
      case 9:
        radix::client::EventsOff(client.manager);
        client.on = false;
        restartStretch(client);
        break;
      case 10:
        EXPECT_NE(perform(client, "kCommandOfNobody"), 0);
        break;
      case 11:
        if (pick(4) == 0) killAndRestart();
        break;
      case 12:
        rude();
        break;
      case 13:
        check(client);
        break;
      case 14:
        emit(100 + pick(200));
        break;
      default:
        emit(1 + pick(10));
        break;
    }
  }

  // A peer that misbehaves and goes; nobody else must notice.
  void rude() {
    RawClient client(world_->rawLink());
    if (pick(2) == 0) client.say(radix::Hello("rude"));
    if (pick(2) == 0) client.say(radix::Delivery(true));
    std::vector<std::uint8_t> bytes(1 + pick(100));
    for (auto& byte : bytes) byte = static_cast<std::uint8_t>(random_());
    client.sayBytes(std::move(bytes));
    if (pick(2) == 0) world_->settle();
  }

  // What a client may do while there is no service: all of it holds when the next one comes.
  void stepAway(Client& client) {
    switch (pick(6)) {
      case 0:
        return push(client, false);
      case 1:
        EXPECT_NE(perform(client, radix::kCommandClearConfiguration), 0);
        client.configured.reset();
        break;
      case 2:
        EXPECT_NE(perform(client, radix::kCommandQueryMetric, {{radix::kKeyMetricID, metricsUsed[0]}}), 0);
        break;
      case 3:
        radix::client::EventsOff(client.manager);
        client.on = false;
        break;
      case 4:
        radix::client::EventsOn(client.manager);
        client.on = true;
        break;
      default:
        break;
    }
  }

  void killAndRestart() {
    // Also in the middle of much that is on its way.
    if (pick(2) == 0) emit(pick(300));
    world_->kill();
    slowClients_.clear();
    for (const auto& client : clients_) {
      EXPECT_TRUE(world_->until([&] { return !radix::client::Connection(client->manager).connected; }));
    }
    for (const auto& client : clients_) stepAway(*client);
    startedAt_ = number_ + 1;
    world_->restart();
    for (const auto& client : clients_) {
      EXPECT_TRUE(world_->until([&] { return radix::client::Connection(client->manager).connected; }));
    }
    for (const auto& client : clients_) restartStretch(*client);
  }

  std::unique_ptr<TestService> world_;
  std::vector<std::unique_ptr<Client>> clients_;
  std::vector<SlowClient> slowClients_;
  std::vector<std::pair<std::int64_t, std::int64_t>> emitted_;
  std::int64_t number_ = 0;
  std::int64_t startedAt_ = 1;  // the first number of the service that runs now
  std::mt19937 random_;
};

INSTANTIATE_TEST_SUITE_P(, RandomWalk, ::testing::Values(&makeInProcessService, &makeSocketService),
                         [](const auto& information) { return information.index == 0 ? "InProcess" : "Socket"; });

TEST_P(RandomWalk, KeepsEveryPromise) {
  // Refused configurations are told there.
  static auto& silence = *new Silence;
  setSystemLog(silence);
  // PROBEVIEW_SEED says where to begin, RANDOM_WALKS how many; a failure is walked again with its seed and 1.
  const auto chosen = [](const char* name, std::uint32_t otherwise) {
    const char* value = std::getenv(name);
    return value != nullptr ? static_cast<std::uint32_t>(std::strtoul(value, nullptr, 10)) : otherwise;
  };
  const std::uint32_t first = chosen("PROBEVIEW_SEED", 1);
  const std::uint32_t walks = chosen("RANDOM_WALKS", GetParam() == &makeInProcessService ? 200 : 12);
  for (std::uint32_t seed = first; seed < first + walks; ++seed) {
    SCOPED_TRACE("PROBEVIEW_SEED=" + std::to_string(seed));
    start(seed);
    for (int count = 0; count < 150 && !HasFailure(); ++count) step();
    for (const auto& client : clients_) check(*client);
    for (SlowClient& client : slowClients_) checkSlow(client);
    if (HasFailure()) break;
  }
  clients_.clear();
  slowClients_.clear();
  world_.reset();
}

}  // namespace
}  // namespace probeview
