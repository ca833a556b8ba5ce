// SPDX-License-Identifier: Apache-2.0
//
// Golden files: what a program said once, looked at by a person and kept. A difference is shown as a diff;
// tests/rewrite_golden rewrites every one, so that a wanted change is one command and a look at git diff.
#pragma once

#include <gtest/gtest.h>

#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <string_view>

#include "tests/support/output_of.h"

namespace probeview {

inline std::string contentOf(const std::filesystem::path& path) {
  std::ifstream file(path, std::ios::binary);
  std::ostringstream content;
  content << file.rdbuf();
  return content.str();
}

// What `diff -u` says of the golden file and the text.
inline std::string differenceTo(const std::filesystem::path& golden, std::string_view actual) {
  const std::filesystem::path other =
      std::filesystem::path(::testing::TempDir()) / (golden.filename().string() + "." + std::to_string(getpid()));
  std::ofstream(other, std::ios::binary) << actual;
  const std::string command = "diff -u '" + golden.string() + "' '" + other.string() + "' | cut -c 1-400";
  const std::string difference = outputOf(command);
  std::filesystem::remove(other);
  return difference;
}

// Paths are told from the top of the repository, which is where tests run.
inline void expectGolden(const std::filesystem::path& golden, std::string_view actual) {
  if (std::getenv("PROBEVIEW_REWRITE_GOLDEN") != nullptr) {
    std::filesystem::create_directories(golden.parent_path());
    std::ofstream(golden, std::ios::binary) << actual;
    return;
  }
  ASSERT_TRUE(std::filesystem::exists(golden)) << golden << " is missing; tests/rewrite_golden makes it";
  if (contentOf(golden) == actual) return;
  ADD_FAILURE() << golden << " differs; if that is wanted: tests/rewrite_golden\n" << differenceTo(golden, actual);
}

}  // namespace probeview
