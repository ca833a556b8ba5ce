// SPDX-License-Identifier: Apache-2.0
//
// service_road RATE SECONDS             a service in a process of its own, its socket, and here the client library, the
//                                       wrapper and the store, both logs discarded: what RATE events a second cost,
//                                       what is lost, how long each takes from the source into the store. One JSON
//                                       object.
// service_road --serve SOCKET RATE [CLASS]   only the service, until SIGTERM; of one kind alone if a class is named
#include <signal.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <string>
#include <vector>

#include "bench/road/processor_time.h"
#include "bench/road/steady_service.h"
#include "client/radix_wrapper.h"
#include "platform/clock.h"
#include "platform/event_loop.h"
#include "radix/socket_manager.h"
#include "store/metric_validator.h"

namespace {

using namespace probeview;
using std::chrono::nanoseconds;

// What comes after the source has fallen silent has this long.
constexpr std::chrono::seconds patience{10};

double secondsOfThisProcess() {
  rusage usage{};
  ::getrusage(RUSAGE_SELF, &usage);
  return bench::processorSeconds(usage);
}

// The store, which notes when each event has been stored.
class TimedStore final : public MetricValidator {
 public:
  TimedStore(const Surroundings& surroundings, std::size_t most) : MetricValidator(surroundings) {
    latencies_.reserve(most);
  }
  void metricsDidUpdate(const Dictionary* event) override {
    MetricValidator::metricsDidUpdate(event);
    latencies_.push_back(systemClock().monotonicTime() - nanoseconds(*event->find(radix::kKeyTime)->int64()));
  }
  std::vector<nanoseconds>& latencies() { return latencies_; }

 private:
  std::vector<nanoseconds> latencies_;
};

void report(TimedStore& store, std::uint64_t sent, std::uint64_t lost, double seconds, double ownSeconds,
            double serviceSeconds) {
  std::vector<nanoseconds>& latencies = store.latencies();
  std::sort(latencies.begin(), latencies.end());
  const auto share = [&](double part) {
    if (latencies.empty()) return 0.0;
    const auto index = static_cast<std::size_t>(part * static_cast<double>(latencies.size() - 1));
    return static_cast<double>(latencies[index].count()) * 1e-6;
  };
  std::printf("{\"sent\": %llu, \"stored\": %zu, \"told lost\": %llu, \"seconds\": %.3f, ",
              static_cast<unsigned long long>(sent), latencies.size(), static_cast<unsigned long long>(lost), seconds);
  std::printf("\"service core\": %.4f, \"viewer core\": %.4f, ", serviceSeconds / seconds, ownSeconds / seconds);
  std::printf(
      "\"latency ms\": {\"minimum\": %.3f, \"median\": %.3f, \"p99\": %.3f, \"p99.9\": %.3f, \"maximum\": %.3f}}\n",
      share(0), share(0.5), share(0.99), share(0.999), share(1));
}

int measure(double rate, double seconds) {
  char folder[] = "/tmp/service_road_XXXXXX";
  if (::mkdtemp(folder) == nullptr) {
    std::fprintf(stderr, "service_road: no folder can be made in /tmp\n");
    return 1;
  }
  bench::SteadyService service{.socket = std::string(folder) + "/radixd.sock",
                               .stream = bench::mixedStream(),
                               .perSecond = rate,
                               .most = static_cast<std::uint64_t>(rate * seconds)};
  // Before this process has any thread.
  const pid_t child = ::fork();
  if (child == 0) ::_exit(service.serve());

  EventLoop loop;
  DiscardingSink nowhere;
  radix::SocketSurroundings surroundings;
  surroundings.namedSocket = service.socket;
  RadixWrapper wrapper(
      radix::client::makeSocketManager("probeview", RadixWrapper::queue(), surroundings, {.observes = true}),
      {.mainQueue = loop, .systemLog = nowhere});
  // The manager tries to connect until the service is there.
  TimedStore store({.wrapper = &wrapper, .console = nowhere, .systemLog = nowhere}, service.most);
  loop.runUntil([&store] { return !store.latencies().empty(); }, patience);
  const nanoseconds begin = systemClock().monotonicTime();
  const double ownBegin = secondsOfThisProcess();
  const auto total = [&] { return store.latencies().size() + wrapper.serviceStatus().connection.lostEvents; };
  const auto look = loop.every(std::chrono::milliseconds(100), [] {});
  // Only looked at now and then: asking for the connection's state takes a lock.
  nanoseconds nextLook = begin;
  loop.runUntil(
      [&] {
        const nanoseconds now = systemClock().monotonicTime();
        if (now < nextLook) return false;
        nextLook = now + std::chrono::milliseconds(100);
        return total() >= service.most;
      },
      std::chrono::duration_cast<nanoseconds>(std::chrono::duration<double>(seconds)) + patience);
  const double passed = std::chrono::duration<double>(systemClock().monotonicTime() - begin).count();
  const double ownSeconds = secondsOfThisProcess() - ownBegin;
  const std::uint64_t lost = wrapper.serviceStatus().connection.lostEvents;
  ::kill(child, SIGTERM);
  rusage usage{};
  int status = 0;
  ::wait4(child, &status, 0, &usage);
  std::filesystem::remove_all(folder);
  report(store, service.most, lost, passed, ownSeconds, bench::processorSeconds(usage));
  std::fflush(stdout);
  // The manager's threads are still at work; nothing is left to be done.
  ::_exit(status == 0 && !store.latencies().empty() ? 0 : 1);
}

int serve(const char* socket, double rate, const char* message) {
  const bench::SteadyService service{.socket = socket,
                                     .stream = message != nullptr ? bench::streamOf(message) : bench::mixedStream(),
                                     .perSecond = rate};
  if (service.stream.empty()) {
    std::fprintf(stderr, "service_road: there is no class %s among those that the viewer takes\n", message);
    return 2;
  }
  return service.serve();
}

}  // namespace

int main(int argc, char** argv) {
  if (argc >= 4 && std::strcmp(argv[1], "--serve") == 0) {
    if (const double rate = std::atof(argv[3]); rate > 0) return serve(argv[2], rate, argc > 4 ? argv[4] : nullptr);
  } else if (argc == 3) {
    const double rate = std::atof(argv[1]);
    const double seconds = std::atof(argv[2]);
    if (rate > 0 && seconds > 0) return measure(rate, seconds);
  }
  std::fprintf(stderr, "usage: service_road RATE SECONDS | service_road --serve SOCKET RATE [CLASS]\n");
  return 2;
}
