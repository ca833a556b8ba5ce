// SPDX-License-Identifier: Apache-2.0
#include "client/radix_wrapper.h"

#include <algorithm>
#include <charconv>
#include <span>
#include <utility>
#include <vector>

#include "platform/file_beginning.h"
#include "platform/serial_queue.h"
#include "radix/link.h"
#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

namespace {

// Only this application may use the door.
constexpr std::string_view applicationId = "probeview";

constexpr std::string_view blockName = "-[RadixWrapper listen]_block_invoke";

Value widened(std::int32_t number) { return static_cast<std::int64_t>(number); }

void appendInteger(std::int32_t number, std::string& out) { printNumber(static_cast<std::int64_t>(number), out); }

}  // namespace

struct RadixWrapper::Shared {
  // Which operation of the delegate an event is for, and the word of its log line.
  using Operation = void (RadixWrapperDelegate::*)(const Dictionary*);

  TaskQueue& mainQueue;
  LineSink& systemLog;
  const Clock& clock;
  Guarded<std::weak_ptr<RadixWrapperDelegate>> delegate;
  ServiceStatus status;  // main thread

  // On the wrapper's queue.
  static void take(const std::shared_ptr<Shared>& shared, const radix::client::ObjectHandle& event,
                   std::string_view eventName, Operation operation, bool isRecord) {
    std::string line(blockName);
    line += ": ";
    line += eventName;
    line += " dict=";
    print(radix::client::nativeDictionary(*event), line);
    shared->systemLog.line(line);
    if (shared->delegate.get().expired()) return;
    // It waits until the main thread has had it.
    shared->mainQueue.post([shared, event, operation, isRecord] {
      const std::shared_ptr<RadixWrapperDelegate> receiver = shared->delegate.get().lock();
      if (receiver == nullptr) return;
      const Dictionary& content = radix::client::nativeDictionary(*event);
      if (isRecord) shared->noteRecord(content);
      (*receiver.*operation)(&content);
    });
  }

  void noteRecord(const Dictionary& event) {
    ServiceStatus::LastRecord record;
    if (const Value* metric = event.find(radix::kKeyMetricID)) record.metricId = metric->int64().value_or(0);
    if (const Value* origin = event.find(radix::kKeyOrigin)) record.origin = origin->text().value_or("");
    record.time = milliseconds(event, radix::kKeyTime);
    record.age = span(event, radix::kKeyAge);
    record.period = span(event, radix::kKeyPeriod);
    record.receivedWallTime = clock.wallTime();
    record.receivedAgeTime = clock.ageTime();
    if (const auto known = status.lastRecords.find(record.metricId); known != status.lastRecords.end()) {
      known->second = record;
    } else if (status.lastRecords.size() < radix::mostMetrics) {
      status.lastRecords.emplace(record.metricId, record);
    }
    status.lastRecord = std::move(record);
  }

  static std::optional<std::chrono::milliseconds> milliseconds(const Dictionary& event, std::string_view key) {
    const Value* value = event.find(key);
    if (value == nullptr || !value->int64()) return std::nullopt;
    return std::chrono::milliseconds(*value->int64());
  }

  // Whatever the library in use has let pass, sums of spans must not overflow.
  static std::optional<std::chrono::milliseconds> span(const Dictionary& event, std::string_view key) {
    const std::optional<std::chrono::milliseconds> given = milliseconds(event, key);
    if (!given) return std::nullopt;
    return radix::boundedSpan(*given);
  }
};

const std::shared_ptr<TaskQueue>& RadixWrapper::queue() {
  // Never destroyed: the library may still hand it work while the process ends.
  static const auto& theQueue =
      *new std::shared_ptr<TaskQueue>(onceCreatedQueue("probeview.RadixWrapper.serialQ.queue"));
  return theQueue;
}

RadixWrapper::RadixWrapper(radix::client::ManagerHandle manager, const Surroundings& surroundings)
    : radixManager_(std::move(manager)),
      shared_(new Shared{surroundings.mainQueue, surroundings.systemLog, surroundings.clock, {}, {}}) {}

RadixWrapper::~RadixWrapper() = default;

bool RadixWrapper::addTelemConfigForAppId(std::string_view appId, const std::string& protofFilePath) {
  if (appId != applicationId) return false;
  // One byte more than could ever be sent is enough to be refused with the limit.
  const FileBeginning content = readBeginning(protofFilePath, radix::longestFrame + 1);
  if (!content.bytes) return false;
  return perform("-[RadixWrapper addTelemConfigForAppId:andProtofFilePath:]", radix::kCommandAddConfiguration,
                 {{radix::kKeyAppID, radix::serviceAppId},
                  {radix::kKeyPayload, Value::bytes(*content.bytes)},
                  {radix::kKeyPayloadType, radix::configurationPayloadType}});
}

bool RadixWrapper::removeTelemConfigForAppid(std::string_view appId) {
  if (appId != applicationId) return false;
  return perform("-[RadixWrapper removeTelemConfigForAppid:]", radix::kCommandClearConfiguration,
                 {{radix::kKeyAppID, radix::serviceAppId}});
}

bool RadixWrapper::querySpecificMetric(std::string_view appId, std::int32_t triggerRef, std::int32_t triggerType,
                                       std::int32_t triggerID, std::int32_t profileID, std::int32_t metricID) {
  if (appId != applicationId) return false;
  return perform("-[RadixWrapper querySpecificMetric:triggerRef:triggerType:triggerID:profileID:metricID:]",
                 radix::kCommandQueryMetric,
                 {{radix::kKeyAppID, radix::serviceAppId},
                  {radix::kKeyPayloadType, radix::configurationPayloadType},
                  {radix::kKeyTriggerRef, widened(triggerRef)},
                  {radix::kKeyTriggerType, widened(triggerType)},
                  {radix::kKeyTriggerID, widened(triggerID)},
                  {radix::kKeyProfileID, widened(profileID)},
                  {radix::kKeyMetricID, widened(metricID)}});
}

bool RadixWrapper::perform(std::string_view operation, std::string_view command, const Dictionary& arguments) {
  // The call keeps the manager alive by itself.
  const radix::client::ManagerHandle manager = radixManager_;
  radix::client::ObjectHandle reply;
  const radix::client::Result result = radix::client::PerformCommand(manager, command, arguments, reply);
  std::string line(operation);
  line += ": error=";
  appendInteger(result.status, line);
  line += " msg=";
  // The words are the service's.
  appendOnOneLine(result.message, line);
  shared_->systemLog.line(line);
  return result.status == 0;
}

void RadixWrapper::listen() {
  const radix::client::ManagerHandle manager = radixManager_;
  radix::client::RegisterEventHandler(
      manager, radix::kEventTrigger,
      [shared = shared_](const radix::client::ObjectHandle& event, radix::client::Group) {
        Shared::take(shared, event, "EventTrigger", &RadixWrapperDelegate::eventsDidUpdate, false);
      });
  radix::client::RegisterEventHandler(
      manager, radix::kEventMetric, [shared = shared_](const radix::client::ObjectHandle& event, radix::client::Group) {
        Shared::take(shared, event, "MetricsTrigger", &RadixWrapperDelegate::metricsDidUpdate, true);
      });
  radix::client::EventsOff(manager);
  radix::client::EventsOn(manager);
  shared_->systemLog.line("-[RadixWrapper listen]: listening for events");
}

std::shared_ptr<RadixWrapperDelegate> RadixWrapper::delegate() const { return shared_->delegate.get().lock(); }

void RadixWrapper::setDelegate(std::weak_ptr<RadixWrapperDelegate> delegate) {
  shared_->delegate.set(std::move(delegate));
}

const ServiceStatus& RadixWrapper::serviceStatus() const {
  shared_->status.connection = radix::client::Connection(radixManager_);
  return shared_->status;
}

std::optional<std::set<std::int64_t>> RadixWrapper::fillableMetrics() const {
  const auto& connection = serviceStatus().connection;
  const auto& sources = connection.sources;
  if (!sources || connection.areSourcesCut) return std::nullopt;
  std::set<std::int64_t> metrics;
  for (const radix::client::SourceState& source : *sources) {
    if (source.phase == radix::client::SourceState::Phase::Failed) continue;
    metrics.insert(source.metrics.begin(), source.metrics.end());
  }
  return metrics;
}

}  // namespace probeview
