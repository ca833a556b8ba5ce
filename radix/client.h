// SPDX-License-Identifier: Apache-2.0
//
// The client library of the baseband manager service, radixd: the one public header.
//
// A manager is a connection under a client name. Commands are synchronous, wait at most two seconds and may be called
// from any thread but the manager's own queue; handlers run on that queue, one event at a time, in the order in which
// the service sent them. While no service is there each command answers with a non-zero status and a message that says
// so; the manager reconnects by itself and then restores its configuration and its event delivery.
#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "platform/task_queue.h"
#include "values/dictionary.h"

namespace radix {

// Keys of command and event dictionaries; the string of each is its own name.
inline constexpr char kKeyAppID[] = "kKeyAppID";              // 64-bit integer
inline constexpr char kKeyPayload[] = "kKeyPayload";          // bytes
inline constexpr char kKeyPayloadType[] = "kKeyPayloadType";  // 64-bit integer
inline constexpr char kKeyMetricID[] = "kKeyMetricID";        // 64-bit integer
inline constexpr char kKeyProfileID[] = "kKeyProfileID";      // 64-bit integer
inline constexpr char kKeyTriggerID[] = "kKeyTriggerID";      // 64-bit integer
inline constexpr char kKeyTriggerRef[] = "kKeyTriggerRef";    // 64-bit integer
inline constexpr char kKeyTriggerType[] = "kKeyTriggerType";  // 64-bit integer
// Events of this service also say when and by whom they were measured.
inline constexpr char kKeyTime[] = "kKeyTime";      // 64-bit integer, milliseconds since 1970-01-01 UTC
inline constexpr char kKeyOrigin[] = "kKeyOrigin";  // text, such as "scenario:city"

// What our programs call themselves in kKeyAppID.
inline constexpr std::int64_t serviceAppId = 2;

inline constexpr char kCommandAddConfiguration[] = "kCommandAddConfiguration";
inline constexpr char kCommandClearConfiguration[] = "kCommandClearConfiguration";
inline constexpr char kCommandQueryMetric[] = "kCommandQueryMetric";
inline constexpr char kEventMetric[] = "kEventMetric";
inline constexpr char kEventTrigger[] = "kEventTrigger";

namespace client {

class Manager;
using ManagerHandle = std::shared_ptr<Manager>;

// The service's typed message object: what goes over the connection, before it becomes a native dictionary.
class Object;
using ObjectHandle = std::shared_ptr<const Object>;
// A deep conversion to plain dictionaries, strings, numbers and data.
probeview::Dictionary nativeDictionary(const Object& object);
ObjectHandle makeObject(const probeview::Dictionary& dictionary);

// The source group of an event; zero unless a service uses groups.
using Group = std::int64_t;

struct Result {
  std::int32_t status = 0;  // 0 is success
  std::string message;
};

using EventHandler = std::function<void(const ObjectHandle& event, Group group)>;

ManagerHandle CreateManager(std::string clientName, std::shared_ptr<probeview::TaskQueue> queue);
Result PerformCommand(const ManagerHandle& manager, std::string_view command, const probeview::Dictionary& arguments,
                      ObjectHandle& reply);
// Replaces the handler registered for the event name before.
void RegisterEventHandler(const ManagerHandle& manager, std::string_view event, EventHandler handler);
void EventsOn(const ManagerHandle& manager);
void EventsOff(const ManagerHandle& manager);

// Whether a service answers, and since when; for showing why values stand still.
struct ConnectionState {
  bool connected = false;
  std::chrono::milliseconds since{};  // wall time of the last change
  bool everConnected = false;
  std::string serviceName{};     // what the service last called itself, such as "radixd 0.1.0"
  std::string trouble{};         // why there is no connection, for people; empty while there is one
  std::uint64_t lostEvents = 0;  // events that the service could not deliver because this client was too slow
};
ConnectionState Connection(const ManagerHandle& manager);

}  // namespace client
}  // namespace radix
