// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

namespace probeview {

// Takes whole log lines, without their line end. Who writes a line decides nothing about where it goes.
class LineSink {
 public:
  virtual ~LineSink() = default;
  virtual void line(std::string_view text) = 0;
  // The lines between the two belong to one event; a sink may hold them back until the group ends, so that they leave
  // in one piece. Groups may be nested; the outermost counts.
  virtual void beginGroup() {}
  virtual void endGroup() {}
};

// A group that ends with its scope, also when an exception leaves it.
class LineGroup {
 public:
  explicit LineGroup(LineSink& sink) : sink_(sink) { sink_.beginGroup(); }
  ~LineGroup() { sink_.endGroup(); }
  LineGroup(const LineGroup&) = delete;
  LineGroup& operator=(const LineGroup&) = delete;

 private:
  LineSink& sink_;
};

// Takes lines and keeps nothing.
class DiscardingSink final : public LineSink {
 public:
  void line(std::string_view) override {}
};

}  // namespace probeview
