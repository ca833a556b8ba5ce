// SPDX-License-Identifier: Apache-2.0
//
// One field of a drive-test log, as text.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "values/plain_text.h"

namespace probeview {

// How much of a field a line of a log may quote, in bytes.
inline constexpr std::size_t traceFieldShown = 40;

// Loggers write "-" where they have no value.
inline bool isNoValue(std::string_view field) { return field.empty() || field == "-"; }

// A field fit for a line of a log: short, and without what a terminal would act upon.
inline std::string shownField(std::string_view field) {
  return quotedExcerpt(field, beginningOf(field, traceFieldShown).size());
}

// The same for a field that has been read as a number, which needs no quotes.
inline std::string shownNumber(std::string_view field) {
  std::string text(field.substr(0, traceFieldShown));
  return field.size() > traceFieldShown ? text + "…" : text;
}

}  // namespace probeview
