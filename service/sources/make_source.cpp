// SPDX-License-Identifier: Apache-2.0
//
// Which sources there are: one line for each kind.
#include "service/sources/make_source.h"

#include <string>
#include <string_view>

#include "scenario/scenario_source.h"
#include "service/sources/trace_source.h"
#include "source/metric_source.h"

namespace probeview {

namespace {

struct SourceKind {
  std::string_view name;
  // Takes what stands behind "name:"; empty when nothing does.
  SourceResult (*make)(std::string_view arguments);
};

constexpr SourceKind kinds[] = {
    {"scenario", makeScenarioSource},
    {"trace", makeTraceSource},
};

}  // namespace

SourceResult makeSource(std::string_view description) {
  const std::size_t end = description.find_first_of(":,");
  const std::string_view name = description.substr(0, end);
  // "scenario,seed=7" is "scenario:,seed=7": the name of what follows may be left out, its options stay.
  const std::size_t begin = end == std::string_view::npos ? description.size()
                            : description[end] == ':'     ? end + 1
                                                          : end;
  std::string known;
  for (const SourceKind& kind : kinds) {
    if (kind.name == name) return kind.make(description.substr(begin));
    known += (known.empty() ? "" : ", ") + std::string(kind.name);
  }
  return {nullptr, "there is no source of the kind '" + std::string(name) + "'; there are: " + known};
}

}  // namespace probeview
