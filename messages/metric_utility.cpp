// SPDX-License-Identifier: Apache-2.0
#include "messages/metric_utility.h"

#include "messages/placed.h"

namespace probeview {

namespace {

// The name that a row gives, or else that of its class.
constexpr std::string_view nameOr(std::string_view className, std::string_view given = {}) {
  return given.empty() ? className : given;
}

constexpr auto table = arranged<KBBMetricUtility::Row>({
#define METRIC(constant, identifier, Class, dictionary, place, tag, ...) \
  {tag, {identifier & 0xFFFF, nameOr(#Class __VA_OPT__(, ) __VA_ARGS__)}},
#define METRIC_WITHOUT_HANDLER METRIC
#define METRIC_WITHOUT_CLASS(constant, identifier, tag, name) {tag, {identifier & 0xFFFF, name}},
#include "messages/metrics.inc"
});

}  // namespace

std::span<const KBBMetricUtility::Row> KBBMetricUtility::rows() noexcept { return table; }

}  // namespace probeview
