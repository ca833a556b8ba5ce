// SPDX-License-Identifier: Apache-2.0
//
// Metric configurations, as a client may push them. Any text is either understood or refused with its place, and a
// refusal is one line.
#include <cstdint>
#include <cstdlib>
#include <string_view>

#include "service/configuration.h"

using namespace probeview;

namespace {

void require(bool truth) {
  if (!truth) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string_view text(reinterpret_cast<const char*>(data), size);
  const ConfigurationResult result = parseConfiguration(text);
  require(result.configuration.has_value() == result.error.empty());
  if (!result.configuration) {
    require(result.line >= 1 && result.column >= 1);
    for (const char character : result.error) require(static_cast<unsigned char>(character) >= 32);
    return 0;
  }
  for (const auto& [metric, period] : result.configuration->plan.metrics) {
    require(!period || (period->count() >= 1 && period->count() <= 86'400'000));
  }
  return 0;
}
