// SPDX-License-Identifier: Apache-2.0
#include "platform/resources.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>

namespace probeview {
namespace {

class Resources : public testing::Test {
 protected:
  void SetUp() override {
    folder_ = std::filesystem::path(testing::TempDir()) /
              ("resources_" + std::string(testing::UnitTest::GetInstance()->current_test_info()->name()) + "_" +
               std::to_string(::getpid()));
    std::filesystem::create_directories(folder_ / "first");
    std::filesystem::create_directories(folder_ / "second");
    setResourceFolders({(folder_ / "first").string(), (folder_ / "second").string()});
  }
  void TearDown() override {
    setResourceFolders({});
    std::filesystem::remove_all(folder_);
  }
  std::string put(const char* folder, const char* name) const {
    const std::filesystem::path path = folder_ / folder / name;
    std::ofstream(path) << "content";
    return path.string();
  }

  std::filesystem::path folder_;
};

TEST_F(Resources, AreFoundByNameAndType) {
  const std::string path = put("second", "kiv_test_lte.deviceconfig");
  EXPECT_EQ(resourcePath("kiv_test_lte", "deviceconfig"), path);
  EXPECT_EQ(resourcePath("kiv_test_lte", "toml"), std::nullopt);
  EXPECT_EQ(resourcePath("another", "deviceconfig"), std::nullopt);
}

TEST_F(Resources, AreTakenFromTheFirstFolderThatHasThem) {
  const std::string path = put("first", "a.txt");
  put("second", "a.txt");
  EXPECT_EQ(resourcePath("a", "txt"), path);
}

TEST_F(Resources, AFolderIsNoResource) {
  std::filesystem::create_directories(folder_ / "first" / "a.txt");
  EXPECT_EQ(resourcePath("a", "txt"), std::nullopt);
}

TEST_F(Resources, ATypeMayBeEmpty) {
  const std::string path = put("first", "NOTICE");
  EXPECT_EQ(resourcePath("NOTICE", ""), path);
}

}  // namespace
}  // namespace probeview
