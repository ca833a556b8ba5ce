// SPDX-License-Identifier: Apache-2.0
#include "radix/socket_path.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>

#include "tests/service/harness/temporary_folder.h"

namespace radix {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;

class SocketPathTest : public ::testing::Test {
 protected:
  SocketPathTest() {
    surroundings_.user = ::geteuid();
    surroundings_.runUserRoot = folder_.path() + "/run-user";
    surroundings_.temporaryDirectory = folder_.path();
    own_ = folder_.path() + "/radixd-" + std::to_string(::geteuid());
  }

  probeview::TemporaryFolder folder_;
  SocketSurroundings surroundings_;
  std::string own_;
};

TEST_F(SocketPathTest, IsInTheRuntimeDirectory) {
  surroundings_.runtimeDirectory = "/run/user/77";
  EXPECT_EQ(userSocketPath(surroundings_, true).path, "/run/user/77/radixd.sock");
}

TEST_F(SocketPathTest, WithoutThatVariableIsInTheUsersFolderUnderRunUser) {
  const std::string users = surroundings_.runUserRoot + "/" + std::to_string(::geteuid());
  std::filesystem::create_directories(users);
  EXPECT_EQ(userSocketPath(surroundings_, true).path, users + "/radixd.sock");
}

TEST_F(SocketPathTest, ElseIsInAFolderOfTheTemporaryDirectoryThatIsOursAlone) {
  EXPECT_EQ(userSocketPath(surroundings_, true).path, own_ + "/radixd.sock");
  struct stat status;
  ASSERT_EQ(::lstat(own_.c_str(), &status), 0);
  EXPECT_EQ(status.st_mode & 07777, 0700U);
  // Once it is there a client finds it, too.
  EXPECT_EQ(userSocketPath(surroundings_, false).path, own_ + "/radixd.sock");
}

TEST_F(SocketPathTest, AClientMakesNoFolder) {
  EXPECT_EQ(userSocketPath(surroundings_, false).path, "");
  EXPECT_FALSE(std::filesystem::exists(own_));
}

TEST_F(SocketPathTest, AFolderThatIsOpenToOthersIsNotUsed) {
  ASSERT_EQ(::mkdir(own_.c_str(), 0700), 0);
  ASSERT_EQ(::chmod(own_.c_str(), 0750), 0);
  const SocketPath path = userSocketPath(surroundings_, true);
  EXPECT_EQ(path.path, "");
  EXPECT_THAT(path.error, HasSubstr("is open to others"));
}

TEST_F(SocketPathTest, ALinkInTheFoldersPlaceIsNotUsed) {
  ASSERT_EQ(::mkdir((folder_.path() + "/real").c_str(), 0700), 0);
  ASSERT_EQ(::symlink((folder_.path() + "/real").c_str(), own_.c_str()), 0);
  EXPECT_EQ(userSocketPath(surroundings_, true).path, "");
}

TEST_F(SocketPathTest, AFolderOfSomebodyElseIsNotUsed) {
  surroundings_.user = ::geteuid() + 1;
  const std::string theirs = folder_.path() + "/radixd-" + std::to_string(surroundings_.user);
  // Made by us, it is not that user's.
  ASSERT_EQ(::mkdir(theirs.c_str(), 0700), 0);
  EXPECT_THAT(userSocketPath(surroundings_, true).error, HasSubstr("not ours alone"));
}

TEST_F(SocketPathTest, AnEmptyPathOnACommandLineIsNoSocket) {
  EXPECT_NE(socketPathTrouble(""), "");
  EXPECT_EQ(socketPathTrouble("radixd.sock"), "");
}

TEST_F(SocketPathTest, AClientTriesTheNamedSocketAloneElseTheUsersThenTheSystems) {
  surroundings_.runtimeDirectory = "/run/user/77";
  EXPECT_THAT(clientSocketPaths(surroundings_), ElementsAre("/run/user/77/radixd.sock", "/run/radixd/radix.sock"));
  surroundings_.namedSocket = "/elsewhere/s";
  EXPECT_THAT(clientSocketPaths(surroundings_), ElementsAre("/elsewhere/s"));
  surroundings_.namedSocket.reset();
  surroundings_.runtimeDirectory.reset();
  EXPECT_THAT(clientSocketPaths(surroundings_), ElementsAre("/run/radixd/radix.sock"));
}

}  // namespace
}  // namespace radix
