// SPDX-License-Identifier: Apache-2.0
#include "radix/arrived_event.h"

#include <string_view>
#include <utility>

#include "radix/object.h"
#include "values/plain_text.h"

namespace radix::client {

namespace {

using probeview::Value;
using std::chrono::milliseconds;

Value number(std::uint64_t travelled) { return signedOf(travelled); }
Value number(milliseconds span) { return std::int64_t{span.count()}; }

}  // namespace

ArrivedEvent arrivedEvent(const Event& event, std::optional<milliseconds> age) {
  // The service cuts it, too; but who says that it is ours?
  const std::string_view origin = probeview::beginningOf(event.origin(), longestOrigin);
  ArrivedEvent arrived{
      .kind = static_cast<EventKind>(event.kind()), .group = signedOf(event.group()), .foreignBytes = origin.size()};
  probeview::Dictionary& content = arrived.content;
  if (arrived.kind == EventKind::Trigger) {
    content.reserve(5);
    content.append(kKeyTriggerID, number(event.triggerId()));
    content.append(kKeyTriggerRef, number(event.triggerRef()));
    content.append(kKeyTriggerType, number(event.triggerType()));
  } else {
    content.reserve(7);
    content.append(kKeyMetricID, number(event.metricId()));
    content.append(kKeyPayload, Value::bytes(event.payload()));
    content.append(kKeyProfileID, number(event.profileId()));
    arrived.foreignBytes += event.payload().size();
  }
  content.append(kKeyTime, number(event.time()));
  content.append(kKeyOrigin, Value::text(origin));
  if (arrived.kind == EventKind::Metric) {
    if (age) content.append(kKeyAge, number(*age));
    if (event.hasPeriod()) content.append(kKeyPeriod, number(spanOf(event.period())));
  }
  return arrived;
}

ObjectHandle objectOf(ArrivedEvent event, std::chrono::nanoseconds waited, std::shared_ptr<const void> hold) {
  if (Value* age = event.content.find(kKeyAge)) {
    *age = number(boundedSpan(milliseconds(age->rawInt64()) + std::chrono::duration_cast<milliseconds>(waited)));
  }
  return std::make_shared<Object>(std::move(event.content), std::move(hold));
}

}  // namespace radix::client
