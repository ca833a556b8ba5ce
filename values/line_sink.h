// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace probeview {

// Takes whole log lines, without their line end. Who writes a line decides nothing about where it goes.
class LineSink {
 public:
  virtual ~LineSink() = default;
  virtual void line(std::string_view text) = 0;
};

}  // namespace probeview
