// SPDX-License-Identifier: Apache-2.0
//
// The client library of the baseband manager service, radixd: the one public header.
//
// A manager is a connection under a client name. Commands are synchronous, wait at most two seconds and may be called
// from any thread but the manager's own queue; handlers run on that queue, one event at a time, in the order in which
// the service sent them. While no service is there each command answers with a non-zero status and a message that says
// so; the manager reconnects by itself and then restores its configuration and its event delivery.
#pragma once

#include <algorithm>
#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

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
// How old the record is, by a clock that is never set: when it left the service, and what it has waited for its handler
// since. 64-bit integer, milliseconds, 0 to longestSpan. Absent when the service is older than this key.
inline constexpr char kKeyAge[] = "kKeyAge";
// How often its source reports the metric as things are: 64-bit integer, milliseconds, 0 to longestSpan; 0: on change,
// or because it was asked for. Absent when the service is older than this key.
inline constexpr char kKeyPeriod[] = "kKeyPeriod";

// Thirty years. What a service says beyond that is cut to it, so that sums of some of them fit into nanoseconds.
inline constexpr std::chrono::milliseconds longestSpan{std::int64_t{30} * 365 * 24 * 3600 * 1000};

// An age or a period as it is taken: not less than nothing, not more than longestSpan. Durations in nanoseconds or
// coarser.
template <typename Duration>
constexpr Duration boundedSpan(Duration given) {
  return std::clamp(given, Duration::zero(), Duration(longestSpan));
}

// More metrics than there are. Whatever is kept by metric has room for so many, so that a peer or a source that invents
// identifiers does not fill the memory.
inline constexpr std::size_t mostMetrics = 256;

// What our programs call themselves in kKeyAppID.
inline constexpr std::int64_t serviceAppId = 2;
// What kKeyPayload of a configuration holds, as kKeyPayloadType says it: the text of a configuration file.
inline constexpr std::int64_t configurationPayloadType = 0;

inline constexpr char kCommandAddConfiguration[] = "kCommandAddConfiguration";
inline constexpr char kCommandClearConfiguration[] = "kCommandClearConfiguration";
inline constexpr char kCommandQueryMetric[] = "kCommandQueryMetric";
inline constexpr char kEventMetric[] = "kEventMetric";
inline constexpr char kEventTrigger[] = "kEventTrigger";

namespace client {

class Manager;
using ManagerHandle = std::shared_ptr<Manager>;

// The service's typed message object. It never changes, and any thread may read it. A handler that hands an event on to
// another queue hands on the object: until the last handle has gone the event counts among those that wait, of which a
// manager takes only so many; the rest waits in the service.
class Object;
using ObjectHandle = std::shared_ptr<const Object>;
// The object as plain dictionaries, strings, numbers and data; lives as long as the object.
const probeview::Dictionary& nativeDictionary(const Object& object);
ObjectHandle makeObject(const probeview::Dictionary& dictionary);

// The source group of an event; zero unless a service uses groups.
using Group = std::int64_t;

struct Result {
  std::int32_t status = 0;  // 0 is success
  std::string message;
};

using EventHandler = std::function<void(const ObjectHandle& event, Group group)>;

ManagerHandle CreateManager(std::string clientName, std::shared_ptr<probeview::TaskQueue> queue);

struct ManagerOptions {
  // An observer needs no configuration: it is given the last record of each metric when it first switches events on,
  // then every record that flows, and for it sources run at their own periods. Others are given what the configuration
  // that they have pushed names, and the answers to their queries. A service older than this option gives everything
  // to whoever has pushed nothing.
  bool observes = false;
};
ManagerHandle CreateManager(std::string clientName, std::shared_ptr<probeview::TaskQueue> queue,
                            ManagerOptions options);

Result PerformCommand(const ManagerHandle& manager, std::string_view command, const probeview::Dictionary& arguments,
                      ObjectHandle& reply);
// Replaces the handler registered for the event name before.
void RegisterEventHandler(const ManagerHandle& manager, std::string_view event, EventHandler handler);
// Off: no event begins to be handed over once this has returned. What was on its way by then is handed over when events
// are on again: a service sends each record once, so that off and on again loses nothing.
void EventsOn(const ManagerHandle& manager);
void EventsOff(const ManagerHandle& manager);

// What the service says of one of its sources.
struct SourceState {
  enum class Phase : std::uint8_t { Running, Ended, Failed };
  std::string origin;                 // as in kKeyOrigin; at most 1024 bytes
  Phase phase = Phase::Running;       // Ended: it has told all that it had, such as a trace that was played
  std::string reason;                 // why it failed, for people; at most 512 bytes
  std::vector<std::int64_t> metrics;  // the identifiers of those it can fill, or could; at most mostMetrics
  friend bool operator==(const SourceState&, const SourceState&) = default;
};

// What has become of the configuration that was pushed last, on this connection or restored on it.
enum class ConfigurationOutcome : std::uint8_t {
  NotPushed,  // none was, or it was cleared
  Accepted,
  Refused,  // by the service, or by this library, as it fits into no frame
  Unsent,   // no service has judged it so far; it is pushed when one comes
};

// Whether a service answers, and since when; for showing why values stand still.
struct ConnectionState {
  bool connected = false;
  std::chrono::milliseconds since{};  // wall time of the last change
  bool everConnected = false;
  std::string serviceName{};     // what the service last called itself, such as "radixd 0.1.0"
  std::string trouble{};         // why there is no connection, for people; empty while there is one
  std::uint64_t lostEvents = 0;  // events that the service could not deliver because this client was too slow
  // What feeds the service, at most 32 of them; absent while there is no connection and when the service does not say.
  std::optional<std::vector<SourceState>> sources{};
  // There are more sources than these, or one of them can fill more than it names: nobody can conclude anything from
  // what is not among them.
  bool areSourcesCut = false;
  ConfigurationOutcome configuration = ConfigurationOutcome::NotPushed;
  std::string configurationTrouble{};  // why it was refused or is unsent, for people; empty otherwise
};
ConnectionState Connection(const ManagerHandle& manager);

}  // namespace client
}  // namespace radix
