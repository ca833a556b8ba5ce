// SPDX-License-Identifier: Apache-2.0
#include "platform/file_beginning.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <thread>

#include "platform/file_descriptor.h"
#include "platform/time_zone.h"

namespace probeview {
namespace {

using std::chrono::milliseconds;

class FileBeginningTest : public testing::Test {
 protected:
  FileBeginningTest() {
    std::string name = testing::TempDir() + "file_beginning_XXXXXX";
    if (::mkdtemp(name.data()) == nullptr) throw std::runtime_error("mkdtemp");
    folder_ = name;
  }
  ~FileBeginningTest() override { std::filesystem::remove_all(folder_); }

  std::string pipe() const {
    const std::string path = folder_ + "/pipe";
    EXPECT_EQ(::mkfifo(path.c_str(), 0600), 0);
    return path;
  }
  static std::string text(const FileBeginning& beginning) {
    return beginning.bytes ? std::string(beginning.bytes->begin(), beginning.bytes->end()) : "none";
  }

  std::string folder_;
};

TEST_F(FileBeginningTest, AFileIsReadWholeByteForByteUpToTheLimitAndNoFurther) {
  using namespace std::string_literals;
  std::ofstream(folder_ + "/file", std::ios::binary) << "a\0\xff\r\n"s;
  EXPECT_EQ(text(readBeginning(folder_ + "/file", 100)), "a\0\xff\r\n"s);
  EXPECT_EQ(text(readBeginning(folder_ + "/file", 5)), "a\0\xff\r\n"s);
  EXPECT_EQ(text(readBeginning(folder_ + "/file", 4)), "a\0\xff\r"s);
}

TEST_F(FileBeginningTest, OfADeviceWithoutAnEndNoMoreThanTheLimitIsRead) {
  EXPECT_EQ(text(readBeginning("/dev/zero", 100'001)), std::string(100'001, '\0'));
  EXPECT_EQ(text(readBeginning("/dev/null", 10)), "");
}

TEST_F(FileBeginningTest, WhatCannotBeReadIsNamed) {
  EXPECT_EQ(readBeginning(folder_ + "/none", 10).error, "No such file or directory");
  EXPECT_EQ(readBeginning(folder_, 10).error, "Is a directory");
}

TEST_F(FileBeginningTest, APipeToWhichNobodyWritesIsGivenUp) {
  const auto result = readBeginning(pipe(), 10, {.writer = milliseconds(20), .word = milliseconds(60'000)});
  EXPECT_FALSE(result.bytes.has_value());
  EXPECT_EQ(result.error, "it is a pipe, and nobody writes to it");
}

TEST_F(FileBeginningTest, APipeWhoseWriterSaysNothingIsGivenUp) {
  const std::string path = pipe();
  const FileDescriptor both(::open(path.c_str(), O_RDWR | O_CLOEXEC));
  const auto result = readBeginning(path, 10, {.writer = milliseconds(60'000), .word = milliseconds(20)});
  EXPECT_FALSE(result.bytes.has_value());
  EXPECT_EQ(result.error, "nothing more came from it within 0 s");
}

TEST_F(FileBeginningTest, APipeIsReadToItsEndHoweverSlowlyItIsFilled) {
  const std::string path = pipe();
  std::thread writer([&path] {
    // Opens when the other end has.
    const FileDescriptor end(::open(path.c_str(), O_WRONLY | O_CLOEXEC));
    const std::string content(100'000, 'x');
    for (std::size_t at = 0; at < content.size();) {
      const ssize_t size = ::write(end.number(), content.data() + at, 1000);
      if (size > 0) at += static_cast<std::size_t>(size);
    }
  });
  const auto result = readBeginning(path, 200'000, {.writer = milliseconds(60'000), .word = milliseconds(60'000)});
  writer.join();
  EXPECT_EQ(text(result), std::string(100'000, 'x'));
}

TEST_F(FileBeginningTest, ATimeZoneThatIsNoRegularFileBecomesUtcAndIsTold) {
  const char* present = std::getenv("TZ");
  const std::string before = present == nullptr ? "" : present;
  const std::string path = pipe();
  for (const std::string& setting : {path, ":" + path}) {
    ::setenv("TZ", setting.c_str(), 1);
    EXPECT_EQ(settleTimeZone(), "TZ names " + path + ", which is no regular file; times are shown in UTC");
    EXPECT_STREQ(std::getenv("TZ"), "UTC0");
  }
  for (const char* setting : {"", "UTC", "CET-1CEST", ":Europe/Nowhere", "/nowhere"}) {
    ::setenv("TZ", setting, 1);
    EXPECT_EQ(settleTimeZone(), std::nullopt) << setting;
    EXPECT_STREQ(std::getenv("TZ"), setting);
  }
  ::setenv("TZDIR", folder_.c_str(), 1);
  ::setenv("TZ", "pipe", 1);
  EXPECT_NE(settleTimeZone(), std::nullopt);
  ::unsetenv("TZDIR");
  present == nullptr ? ::unsetenv("TZ") : ::setenv("TZ", before.c_str(), 1);
}

}  // namespace
}  // namespace probeview
