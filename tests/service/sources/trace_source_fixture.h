// SPDX-License-Identifier: Apache-2.0
//
// A trace source on a file of the test's own, a loop that the test moves, and what it has reported.
#pragma once

#include <gtest/gtest.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "platform/manual_loop.h"
#include "service/sources/trace_source.h"
#include "tests/service/sources/trace_rows.h"

namespace probeview {

class Sink final : public MetricSink {
 public:
  void emit(MetricRecord record) override { records.push_back(std::move(record)); }
  void conditionChanged(SourceCondition condition) override { phases.push_back(condition.phase); }
  std::vector<MetricRecord> records;
  std::vector<SourceCondition::Phase> phases;
};

class Lines final : public LineSink {
 public:
  void line(std::string_view text) override { lines.emplace_back(text); }
  std::vector<std::string> lines;
};

class TraceSourceTest : public ::testing::Test {
 protected:
  void SetUp() override {
    folder = std::filesystem::path(::testing::TempDir()) / ("trace_source_test." + std::to_string(getpid()));
    std::filesystem::create_directories(folder);
  }
  void TearDown() override {
    source.reset();
    std::filesystem::remove_all(folder);
  }

  std::string write(const std::string& content, const std::string& name = "drive.csv") {
    std::ofstream(folder / name, std::ios::binary) << content;
    return (folder / name).string();
  }
  // Starts a source on rows of our own.
  void start(const std::string& rows, const std::string& options = "") {
    SourceResult result = makeTraceSource(write(traceHeader + rows) + options);
    ASSERT_EQ(result.error, "");
    source = std::move(result.source);
    source->start(SourceContext{loop, loop, log}, sink);
  }
  void listen() {
    source->setListening(true);
    loop.advance(std::chrono::milliseconds(0));
  }
  static std::string measurement(const std::string& time, int level) {
    return TraceLine{.time = "2024.03.05_" + time, .mode = "LTE", .level = std::to_string(level)}.text();
  }

  std::filesystem::path folder;
  ManualLoop loop;
  Sink sink;
  Lines log;
  std::unique_ptr<MetricSource> source;
};

}  // namespace probeview
