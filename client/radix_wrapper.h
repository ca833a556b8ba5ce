// SPDX-License-Identifier: Apache-2.0
//
// The program's only door to the baseband manager service: configurations go in, events come out.
#pragma once

#include <chrono>
#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>

#include "client/radix_wrapper_delegate.h"
#include "platform/clock.h"
#include "platform/guarded.h"
#include "platform/task_queue.h"
#include "radix/client.h"
#include "values/line_sink.h"

namespace probeview {

using radix::client::ConfigurationOutcome;

// Whether the service is there, what feeds it, what it made of the configuration and how old the last records are; for
// saying why values stand still.
struct ServiceStatus {
  struct LastRecord {
    std::string origin;                             // such as "scenario:city"; empty when the event names none
    std::optional<std::chrono::milliseconds> time;  // when it was measured, since 1970-01-01 UTC
    std::chrono::milliseconds receivedWallTime{};   // when it reached the main thread, since 1970-01-01 UTC
    std::chrono::nanoseconds receivedAgeTime{};     // the same moment on the clock by which things grow older
    // How old it was when it left the service, 0 to radix::longestSpan; absent when the service does not say. From then
    // on it has grown older by what has gone by since receivedAgeTime.
    std::optional<std::chrono::milliseconds> age{};
    // Its source's period for the metric, 0 to radix::longestSpan; 0: on change, or asked for once. Absent when the
    // service does not say.
    std::optional<std::chrono::milliseconds> period{};
    std::int64_t metricId = 0;  // such as 0x3C4E04; 0 when the event names none
  };
  radix::client::ConnectionState connection;
  std::optional<LastRecord> lastRecord{};  // the last metric event that was handed to a delegate
  // The last one of each metric, by its identifier; at most radix::mostMetrics.
  std::map<std::int64_t, LastRecord> lastRecords{};
};

// Commands run on the caller's thread and return whether the service's status is 0. Events come on the wrapper's queue,
// are converted and logged there, and reach the delegate on the main queue.
class RadixWrapper {
 public:
  // Where the wrapper stands; the references must outlive it.
  struct Surroundings {
    TaskQueue& mainQueue;
    LineSink& systemLog;  // takes lines from any thread
    const Clock& clock = systemClock();
  };

  // The wrapper of the process, made on the first call and never destroyed: it opens a manager under the client name
  // "probeview". Main thread; the program must have named its main queue.
  static RadixWrapper& sharedInstance();

  // A wrapper over a manager of the caller's.
  RadixWrapper(radix::client::ManagerHandle manager, const Surroundings& surroundings);
  ~RadixWrapper();
  RadixWrapper(const RadixWrapper&) = delete;
  RadixWrapper& operator=(const RadixWrapper&) = delete;

  // The serial queue on which the library runs its event handlers; made once per process.
  static const std::shared_ptr<TaskQueue>& queue();

  // Pushes the whole content of the file as this client's configuration. False, with nothing sent and nothing logged,
  // for an application other than "probeview" and for a file that cannot be read. Of a file that is too large no more
  // is read than shows that it is; the client library refuses it.
  bool addTelemConfigForAppId(std::string_view appId, const std::string& protofFilePath);
  // Clears this client's configuration.
  bool removeTelemConfigForAppid(std::string_view appId);
  // Asks the service to report one metric now.
  bool querySpecificMetric(std::string_view appId, std::int32_t triggerRef, std::int32_t triggerType,
                           std::int32_t triggerID, std::int32_t profileID, std::int32_t metricID);
  // Registers the event handlers and restarts delivery with them. Calling it again does not deliver events twice.
  void listen();

  std::shared_ptr<RadixWrapperDelegate> delegate() const;
  // Kept weakly. Set on the main thread.
  void setDelegate(std::weak_ptr<RadixWrapperDelegate> delegate);

  // Main thread. As it is now; the reference holds until the next call, and nothing but the connection's few words is
  // copied.
  const ServiceStatus& serviceStatus() const;
  // The identifiers of the metrics that the service's sources can fill, those that have failed apart; absent while
  // there is no service and when it does not say, or not of all of them.
  std::optional<std::set<std::int64_t>> fillableMetrics() const;

 private:
  // What the event handlers need; they may still run while the wrapper is being destroyed.
  struct Shared;

  bool perform(std::string_view operation, std::string_view command, const Dictionary& arguments);

  radix::client::ManagerHandle radixManager_;
  std::shared_ptr<Shared> shared_;
};

}  // namespace probeview
