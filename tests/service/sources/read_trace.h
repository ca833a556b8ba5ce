// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <utility>

#include "service/sources/trace_reader.h"

namespace probeview {

// The log that a text is.
inline TraceLog read(const std::string& text) {
  TraceLogResult result = readTraceLog(text);
  EXPECT_EQ(result.error, "");
  return result.log ? std::move(*result.log) : TraceLog{};
}

// Why a text is none.
inline std::string refusal(std::string_view text) {
  const TraceLogResult result = readTraceLog(text);
  EXPECT_FALSE(result.log.has_value());
  return result.error;
}

}  // namespace probeview
