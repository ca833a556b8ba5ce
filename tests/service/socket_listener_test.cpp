// SPDX-License-Identifier: Apache-2.0
#include "service/socket_listener.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>

#include <cstring>
#include <fstream>

#include "platform/event_loop.h"
#include "radix/service_commands.h"
#include "radix/socket_connector.h"
#include "radix/socket_manager.h"
#include "radix/status.h"
#include "service/service.h"
#include "tests/service/harness/raw_client.h"
#include "tests/service/harness/scripted_source.h"
#include "tests/service/harness/temporary_folder.h"

namespace probeview {
namespace {

using ::testing::HasSubstr;

constexpr std::chrono::seconds patience{20};

FileDescriptor boundSocket(const std::string& path, int type, bool listens) {
  FileDescriptor socket(::socket(AF_UNIX, type | SOCK_CLOEXEC, 0));
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::memcpy(address.sun_path, path.data(), path.size());
  EXPECT_EQ(::bind(socket.number(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
  if (listens) {
    EXPECT_EQ(::listen(socket.number(), 1), 0);
  }
  return socket;
}

struct stat statusOf(const std::string& path) {
  struct stat status {};
  EXPECT_EQ(::lstat(path.c_str(), &status), 0);
  return status;
}

bool exists(const std::string& path) {
  struct stat status;
  return ::lstat(path.c_str(), &status) == 0;
}

class ListeningSocketTest : public ::testing::Test {
 protected:
  TemporaryFolder folder_;
  std::string path_ = folder_.path() + "/radixd.sock";
};

TEST_F(ListeningSocketTest, IsTheUsersAloneWhateverTheUmask) {
  const mode_t before = ::umask(0);
  const auto result = ListeningSocket::make(path_);
  ::umask(before);
  ASSERT_TRUE(result.socket) << result.error;
  EXPECT_TRUE(S_ISSOCK(statusOf(path_).st_mode));
  EXPECT_EQ(statusOf(path_).st_mode & 07777, 0600U);
  EXPECT_EQ(statusOf(path_).st_uid, ::geteuid());
  EXPECT_EQ(result.socket->access().owner, ::geteuid());
  EXPECT_EQ(result.socket->access().group, std::nullopt);
}

TEST_F(ListeningSocketTest, OfASystemIsItsGroupsToo) {
  const auto result = ListeningSocket::make(path_, ListeningSocket::Sharing::Group);
  ASSERT_TRUE(result.socket) << result.error;
  EXPECT_EQ(statusOf(path_).st_mode & 07777, 0660U);
  EXPECT_EQ(statusOf(path_).st_gid, ::getegid());
  EXPECT_EQ(result.socket->access().group, ::getegid());
}

TEST_F(ListeningSocketTest, LeavesNothingBehind) {
  ListeningSocket::make(path_).socket.reset();
  EXPECT_FALSE(exists(path_));
  EXPECT_FALSE(exists(path_ + ".lock"));
}

TEST_F(ListeningSocketTest, ItsGroupIsTheOneThatTheFileHasAndNotTheProcesss) {
  if (::geteuid() != 0) GTEST_SKIP() << "only root may give a folder to a group of its choice";
  constexpr gid_t other = 54321;
  const std::string shared = folder_.path() + "/shared";
  ASSERT_EQ(::mkdir(shared.c_str(), 0700), 0);
  ASSERT_EQ(::chown(shared.c_str(), static_cast<uid_t>(-1), other), 0);
  // What is made in this folder gets the folder's group.
  ASSERT_EQ(::chmod(shared.c_str(), 02750), 0);
  const auto result = ListeningSocket::make(shared + "/radixd.sock", ListeningSocket::Sharing::Group);
  ASSERT_TRUE(result.socket) << result.error;
  EXPECT_EQ(statusOf(shared + "/radixd.sock").st_gid, other);
  EXPECT_EQ(result.socket->access().group, other);
}

TEST_F(ListeningSocketTest, WhatSomebodyElseHasPutInItsPlaceIsLeftThere) {
  auto first = ListeningSocket::make(path_);
  ASSERT_TRUE(first.socket);
  ASSERT_EQ(::unlink(path_.c_str()), 0);
  ASSERT_EQ(::unlink((path_ + ".lock").c_str()), 0);
  auto second = ListeningSocket::make(path_);
  ASSERT_TRUE(second.socket) << second.error;
  first.socket.reset();
  EXPECT_TRUE(exists(path_));
  EXPECT_TRUE(exists(path_ + ".lock"));
  second.socket.reset();
  EXPECT_FALSE(exists(path_));
  EXPECT_FALSE(exists(path_ + ".lock"));
}

TEST_F(ListeningSocketTest, ASecondOneAtALiveSocketIsRefused) {
  const auto first = ListeningSocket::make(path_);
  ASSERT_TRUE(first.socket);
  const auto second = ListeningSocket::make(path_);
  EXPECT_FALSE(second.socket);
  EXPECT_EQ(second.error, "another radixd already has " + path_ + "; stop it or name another --socket");
  EXPECT_TRUE(exists(path_));
}

TEST_F(ListeningSocketTest, ALiveSocketOfAnotherProgramIsNotReplaced) {
  const FileDescriptor alive = boundSocket(path_, SOCK_SEQPACKET, true);
  EXPECT_THAT(ListeningSocket::make(path_).error, HasSubstr("a service already listens at " + path_));
  EXPECT_TRUE(exists(path_));
}

TEST_F(ListeningSocketTest, ALiveSocketOfAnotherTypeIsNotReplaced) {
  const FileDescriptor alive = boundSocket(path_, SOCK_STREAM, true);
  EXPECT_THAT(ListeningSocket::make(path_).error, HasSubstr("not ours to replace"));
  EXPECT_TRUE(exists(path_));
}

TEST_F(ListeningSocketTest, AStaleSocketIsReplaced) {
  boundSocket(path_, SOCK_SEQPACKET, true).close();
  ASSERT_TRUE(exists(path_));
  // So is the lock of a service that was killed.
  std::ofstream(path_ + ".lock").close();
  const auto result = ListeningSocket::make(path_);
  EXPECT_TRUE(result.socket) << result.error;
}

TEST_F(ListeningSocketTest, WhatIsNoSocketIsNotReplaced) {
  std::ofstream(path_) << "precious";
  EXPECT_EQ(ListeningSocket::make(path_).error,
            path_ + " is no socket and is not replaced; remove it or name another --socket");
  EXPECT_TRUE(S_ISREG(statusOf(path_).st_mode));
}

TEST_F(ListeningSocketTest, ALinkInTheLocksPlaceIsNotFollowed) {
  ASSERT_EQ(::symlink((folder_.path() + "/elsewhere").c_str(), (path_ + ".lock").c_str()), 0);
  EXPECT_THAT(ListeningSocket::make(path_).error, HasSubstr("cannot make a socket at " + path_));
  EXPECT_FALSE(exists(folder_.path() + "/elsewhere"));
}

TEST_F(ListeningSocketTest, APathIsTakenUpToTheSystemsLimitAndOneByteMoreIsRefused) {
  constexpr std::size_t limit = sizeof(sockaddr_un::sun_path) - 1;
  std::string longest = folder_.path() + "/";
  longest += std::string(limit - longest.size(), 's');
  EXPECT_TRUE(ListeningSocket::make(longest).socket);
  EXPECT_THAT(ListeningSocket::make(longest + "s").error, HasSubstr("has 108 bytes, at most 107 are possible"));
  EXPECT_EQ(ListeningSocket::make("").error, "the socket's path is empty");
}

TEST_F(ListeningSocketTest, AFolderThatIsNotThereIsNamed) {
  EXPECT_THAT(ListeningSocket::make(folder_.path() + "/none/radixd.sock").error,
              HasSubstr("cannot make a socket at " + folder_.path() + "/none/radixd.sock: No such file or directory"));
}

TEST_F(ListeningSocketTest, ASocketHandedOverIsUsedAndLeftInPlace) {
  FileDescriptor handed = boundSocket(path_, SOCK_SEQPACKET, true);
  ASSERT_EQ(::chmod(path_.c_str(), 0660), 0);
  auto result = ListeningSocket::adopt(handed.release());
  ASSERT_TRUE(result.socket) << result.error;
  // The group that the system manager gave it may come in.
  EXPECT_EQ(result.socket->access().group, statusOf(path_).st_gid);
  result.socket.reset();
  EXPECT_TRUE(exists(path_));
}

TEST_F(ListeningSocketTest, ADescriptorThatIsNoListeningPacketSocketIsRefused) {
  EXPECT_THAT(ListeningSocket::adopt(boundSocket(path_, SOCK_SEQPACKET, false).release()).error,
              HasSubstr("does not listen for local sequential packets"));
  EXPECT_THAT(ListeningSocket::adopt(boundSocket(path_ + "2", SOCK_STREAM, true).release()).error,
              HasSubstr("does not listen for local sequential packets"));
  EXPECT_THAT(ListeningSocket::adopt(::open("/dev/null", O_RDONLY | O_CLOEXEC)).error, HasSubstr("is none"));
}

TEST(Access, OnlyTheSameUserRootAndTheGroupMayConnect) {
  const Access users{.owner = 1000, .group = {}};
  EXPECT_EQ(users.refusal({1, 1000, 50, {}}), std::nullopt);
  EXPECT_EQ(users.refusal({1, 0, 0, {}}), std::nullopt);
  EXPECT_EQ(users.refusal({1, 1001, 50, {1000}}), "only user 1000 and root may connect, not user 1001");
  const Access systems{.owner = 990, .group = 980};
  EXPECT_EQ(systems.refusal({1, 1001, 980, {}}), std::nullopt);
  EXPECT_EQ(systems.refusal({1, 1001, 50, {27, 980}}), std::nullopt);
  EXPECT_EQ(systems.refusal({1, 1001, 50, {27}}), "only user 990, root and group 980 may connect, not user 1001");
}

TEST(PeerCredentials, TellWhoIsAtTheOtherEnd) {
  int ends[2];
  ASSERT_EQ(::socketpair(AF_UNIX, SOCK_SEQPACKET, 0, ends), 0);
  const FileDescriptor near(ends[0]);
  const FileDescriptor far(ends[1]);
  const auto credentials = peerCredentials(near.number());
  ASSERT_TRUE(credentials);
  EXPECT_EQ(credentials->process, ::getpid());
  EXPECT_EQ(credentials->user, ::geteuid());
  EXPECT_EQ(credentials->group, ::getegid());
  EXPECT_EQ(static_cast<int>(credentials->groups.size()), ::getgroups(0, nullptr));
  EXPECT_EQ(peerCredentials(-1), std::nullopt);
}

// A service behind a listener on this test's own loop, with the credentials that the test says.
class ListenerTest : public ListeningSocketTest {
 protected:
  ListenerTest() : service_(loop_, ServiceLog(log_, LogLevel::Debug), {}) {
    auto made = ListeningSocket::make(path_);
    listener_ = std::make_unique<SocketListener>(
        loop_, service_.log(), std::move(made.socket), [this](int socket) { return credentials(socket); },
        [this](auto link, Peer peer) { service_.accept(std::move(link), std::move(peer)); });
    EXPECT_TRUE(listener_->start());
  }

  std::optional<Credentials> credentials(int socket) { return foreign_ ? *foreign_ : peerCredentials(socket); }

  std::unique_ptr<RawClient> connect() {
    radix::SocketSurroundings surroundings;
    surroundings.namedSocket = path_;
    return std::make_unique<RawClient>(radix::makeSocketConnector(loop_, surroundings)->connect().link);
  }

  EventLoop loop_;
  KeptLines log_;
  Service service_;
  std::unique_ptr<SocketListener> listener_;
  std::optional<std::optional<Credentials>> foreign_;
};

TEST_F(ListenerTest, AForeignUsersConnectionIsRefusedWithAReasonAndLogged) {
  foreign_ = Credentials{4711, ::geteuid() + 1, 12345, {}};
  const auto client = connect();
  client->say(radix::Hello("foreigner"));
  ASSERT_TRUE(loop_.runUntil([&] { return client->hello.has_value(); }, patience));
  EXPECT_EQ(client->hello->refusalStatus(), static_cast<std::int32_t>(radix::Status::NotPermitted));
  EXPECT_THAT(client->hello->refusal(), HasSubstr("may connect, not user " + std::to_string(::geteuid() + 1)));
  EXPECT_EQ(log_.count("(process 4711, user " + std::to_string(::geteuid() + 1) + ") was refused"), 1U);
  EXPECT_EQ(service_.clientCount(), 0U);
  // The others are served.
  foreign_.reset();
  const auto own = connect();
  own->say(radix::Hello("own"));
  ASSERT_TRUE(loop_.runUntil([&] { return own->hello.has_value(); }, patience));
  EXPECT_EQ(own->hello->refusalStatus(), 0);
}

TEST_F(ListenerTest, TheServicesOwnUserAndRootAreKnownAsSuch) {
  const auto made = ListeningSocket::make(path_ + "2");
  ASSERT_TRUE(made.socket);
  EXPECT_TRUE(made.socket->access().isOwn({1, ::geteuid(), 50, {}}));
  EXPECT_TRUE(made.socket->access().isOwn({1, 0, 0, {}}));
  EXPECT_FALSE(made.socket->access().isOwn({1, ::geteuid() + 1, ::getegid(), {}}));
  std::vector<bool> own;
  path_ += "3";
  auto socket = ListeningSocket::make(path_);
  SocketListener listener(
      loop_, service_.log(), std::move(socket.socket), [this](int one) { return credentials(one); },
      [&own](auto, const Peer& peer) { own.push_back(peer.isOwn); });
  ASSERT_TRUE(listener.start());
  const auto first = connect();
  ASSERT_TRUE(loop_.runUntil([&] { return own.size() == 1; }, patience));
  foreign_ = Credentials{4711, ::geteuid() + 1, 12345, {}};
  const auto second = connect();
  ASSERT_TRUE(loop_.runUntil([&] { return own.size() == 2; }, patience));
  EXPECT_EQ(own, (std::vector<bool>{true, false}));
}

TEST_F(ListenerTest, AConnectionWhoseUserTheSystemDoesNotTellIsRefused) {
  foreign_ = std::optional<Credentials>();
  const auto client = connect();
  ASSERT_TRUE(loop_.runUntil([&] { return client->hello.has_value(); }, patience));
  EXPECT_EQ(client->hello->refusalStatus(), static_cast<std::int32_t>(radix::Status::NotPermitted));
}

TEST_F(ListenerTest, AForeignUserWhoGoesOnTalkingIsNotHeard) {
  foreign_ = Credentials{4711, ::geteuid() + 1, 12345, {}};
  const auto client = connect();
  client->say(radix::Hello("foreigner"));
  client->say(radix::Delivery(true));
  client->say(radix::Command(1, radix::kCommandShowStatus));
  ASSERT_TRUE(loop_.runUntil([&] { return client->closed; }, patience));
  EXPECT_TRUE(client->replies.empty());
}

TEST_F(ListenerTest, WithoutDescriptorsItRestsBetweenTwoTriesAndTakesThoseWhoWaitWhenThereAreSome) {
#ifdef __SANITIZE_ADDRESS__
  GTEST_SKIP() << "the sanitizer opens a pipe to look at memory and reports a fault of its own when it gets none";
#endif
  const auto client = connect();
  client->say(radix::Hello("waits"));
  rlimit before{};
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &before), 0);
  const int next = ::dup(0);
  ::close(next);
  const rlimit none{static_cast<rlim_t>(next), before.rlim_max};
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  const auto shortages = [this] { return log_.count("cannot accept a connection: Too many open files"); };
  const auto start = std::chrono::steady_clock::now();
  EXPECT_TRUE(loop_.runUntil([&] { return shortages() == 2; }, patience));
  // A loop that turned as fast as it can would have come to the second try at once, and to hundreds by now.
  EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(240));
  EXPECT_EQ(log_.count("trying again soon (2 times so far)"), 1U);
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &before), 0);
  EXPECT_TRUE(loop_.runUntil([&] { return client->hello.has_value(); }, patience));
}

TEST_F(ListenerTest, SixtyFourConnectionsAreTakenBeforeOthersGetTheirTurn) {
  path_ += "2";
  auto made = ListeningSocket::make(path_);
  ASSERT_TRUE(made.socket) << made.error;
  int taken = 0;
  int takenInFirstTurn = 0;
  SocketListener listener(loop_, service_.log(), std::move(made.socket), peerCredentials, [&](auto, Peer) {
    if (++taken == 1) loop_.post([&] { takenInFirstTurn = taken; });
  });
  ASSERT_TRUE(listener.start());
  std::vector<std::unique_ptr<RawClient>> crowd;
  for (int number = 0; number < 65; ++number) crowd.push_back(connect());
  ASSERT_TRUE(loop_.runUntil([&] { return taken == 65; }, patience));
  EXPECT_EQ(takenInFirstTurn, 64);
}

}  // namespace
}  // namespace probeview
