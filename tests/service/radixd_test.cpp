// SPDX-License-Identifier: Apache-2.0
//
// The real program, in a process of its own.
#include <gmock/gmock.h>
#include <grp.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <random>
#include <set>

#include "messages/metric_identifiers.h"
#include "platform/event_loop.h"
#include "radix/client.h"
#include "radix/service_commands.h"
#include "radix/socket_connector.h"
#include "radix/socket_manager.h"
#include "radix/status.h"
#include "tests/service/harness/radixd_process.h"
#include "tests/service/harness/raw_client.h"
#include "tests/service/harness/temporary_folder.h"
#include "tests/support/frames.h"

namespace probeview {
namespace {

using ::testing::HasSubstr;
using ::testing::Not;

constexpr std::chrono::seconds patience{20};

// Two rows of a log of our own making: PLMN 001/01, invented cells.
constexpr char drive[] =
    "Timestamp,Longitude,Latitude,Speed,Operatorname,CellID,NetworkMode,RSRP,RSRQ,SNR,CQI,RSSI,DL_bitrate,UL_bitrate,"
    "State,PINGAVG,PINGMIN,PINGMAX,PINGSTDEV,PINGLOSS,CELLHEX,NODEHEX,LACHEX,RAWCELLID,NRxRSRP,NRxRSRQ\n"
    "2024.03.05_12.00.00,0.0,0.0,0,A,1,LTE,-90,-10,12.0,10,-60,1,1,D,-,-,-,-,-,1,64,1A2B,25601,-100,-14\n"
    "2024.03.05_12.00.01,0.0,0.0,0,A,1,LTE,-91,-11,11.0,10,-61,1,1,I,-,-,-,-,-,1,64,1A2B,25601,-101,-15\n";

class Radixd : public ::testing::Test {
 protected:
  Radixd() { std::ofstream(trace_) << drive; }

  std::vector<std::string> arguments(std::vector<std::string> more = {}) const {
    std::vector<std::string> all{"--socket", socket_, "--source", "trace:" + trace_ + ",loop"};
    all.insert(all.end(), more.begin(), more.end());
    return all;
  }

  radix::SocketSurroundings surroundings() const {
    radix::SocketSurroundings surroundings;
    surroundings.namedSocket = socket_;
    return surroundings;
  }

  radix::client::ManagerHandle manager(radix::client::ManagerOptions options = {}) {
    return radix::client::makeSocketManager("test", {std::shared_ptr<void>(), &loop_}, surroundings(), options);
  }

  int status(const radix::client::ManagerHandle& manager) {
    radix::client::ObjectHandle reply;
    return radix::client::PerformCommand(manager, radix::kCommandShowStatus, {}, reply).status;
  }

  bool exists(const std::string& path) const {
    struct stat status;
    return ::lstat(path.c_str(), &status) == 0;
  }

  TemporaryFolder folder_;
  std::string socket_ = folder_.path() + "/radixd.sock";
  std::string trace_ = folder_.path() + "/drive.csv";
  EventLoop loop_;
};

TEST_F(Radixd, ListensSaysSoAndEndsCleanlyOnEitherSignal) {
  for (const int signal : {SIGTERM, SIGINT}) {
    RadixdProcess radixd(arguments());
    ASSERT_TRUE(radixd.waitForLog("listening at " + socket_)) << radixd.log();
    struct stat made;
    ASSERT_EQ(::lstat(socket_.c_str(), &made), 0);
    EXPECT_EQ(made.st_mode & 07777, 0600U);
    EXPECT_EQ(made.st_uid, ::geteuid());
    EXPECT_EQ(status(manager()), 0);
    radixd.send(signal);
    EXPECT_EQ(radixd.waitForEnd(), 0);
    EXPECT_THAT(radixd.log(), HasSubstr("radixd: info: ending\n"));
    EXPECT_FALSE(exists(socket_));
    EXPECT_FALSE(exists(socket_ + ".lock"));
  }
}

TEST_F(Radixd, ASecondInstanceOnALiveSocketRefusesWithAClearError) {
  RadixdProcess first(arguments());
  ASSERT_TRUE(first.waitForLog("listening"));
  RadixdProcess second(arguments());
  EXPECT_EQ(second.waitForEnd(), 1);
  EXPECT_EQ(second.log(),
            "radixd: error: another radixd already has " + socket_ + "; stop it or name another --socket\n");
  EXPECT_EQ(status(manager()), 0);
}

TEST_F(Radixd, AfterItWasKilledTheStaleSocketIsReplaced) {
  {
    RadixdProcess killed(arguments());
    ASSERT_TRUE(killed.waitForLog("listening"));
    killed.send(SIGKILL);
    EXPECT_EQ(killed.waitForEnd(), -SIGKILL);
  }
  EXPECT_TRUE(exists(socket_));
  RadixdProcess next(arguments());
  EXPECT_TRUE(next.waitForLog("listening")) << next.log();
  EXPECT_EQ(status(manager()), 0);
}

TEST_F(Radixd, KilledAndStartedAgainUnderARunningClientItGoesOnWithConfigurationAndDeliveryRestored) {
  auto radixd = std::make_unique<RadixdProcess>(arguments());
  ASSERT_TRUE(radixd->waitForLog("listening"));
  const auto client = manager();
  std::vector<std::int64_t> metrics;
  radix::client::RegisterEventHandler(client, radix::kEventMetric, [&](const auto& event, radix::client::Group) {
    metrics.push_back(*radix::client::nativeDictionary(*event).find(radix::kKeyMetricID)->int64());
  });
  const std::string configuration = "[metrics]\nK_LTE_RRC_STATE = \"on change\"\n";
  radix::client::ObjectHandle reply;
  ASSERT_EQ(radix::client::PerformCommand(
                client, radix::kCommandAddConfiguration,
                {{radix::kKeyPayload,
                  Value::bytes({reinterpret_cast<const std::uint8_t*>(configuration.data()), configuration.size()})}},
                reply)
                .status,
            0);
  radix::client::EventsOn(client);
  ASSERT_TRUE(loop_.runUntil([&] { return !metrics.empty(); }, patience));

  radixd->send(SIGKILL);
  radixd->waitForEnd();
  const auto look = loop_.every(std::chrono::milliseconds(5), [] {});
  ASSERT_TRUE(loop_.runUntil([&] { return !radix::client::Connection(client).connected; }, patience));
  EXPECT_EQ(status(client), static_cast<int>(radix::Status::NoService));

  metrics.clear();
  radixd = std::make_unique<RadixdProcess>(arguments());
  ASSERT_TRUE(radixd->waitForLog("listening"));
  const auto started = std::chrono::steady_clock::now();
  ASSERT_TRUE(loop_.runUntil([&] { return !metrics.empty(); }, patience));
  EXPECT_LT(std::chrono::steady_clock::now() - started, std::chrono::seconds(6));
  for (const std::int64_t metric : metrics) EXPECT_EQ(metric, 0x3C4E04);
}

// A log of so many seconds from the minute on; each row's records bear its time, so that none is like another.
std::string logFrom(const std::string& minute, int seconds) {
  std::string text(drive, std::string_view(drive).find('\n') + 1);
  for (int second = 0; second < seconds; ++second) {
    text += "2024.03.05_" + minute + (second < 10 ? ".0" : ".") + std::to_string(second) +
            ",0.0,0.0,0,A,1,LTE,-90,-10,12.0,10,-60,1,1," + (second % 2 == 0 ? "D" : "I") +
            ",-,-,-,-,-,1,64,1A2B,25601,-100,-14\n";
  }
  return text;
}

TEST_F(Radixd, AViewerOnAServiceThatHasPlayedItsTraceGetsEachRecordOnceWithItsAgeAndSoFromTheNextOne) {
  const auto look = loop_.every(std::chrono::milliseconds(5), [] {});
  std::ofstream(trace_) << logFrom("12.00", 20);
  const std::vector<std::string> words{"--socket", socket_, "--source", "trace:" + trace_ + ",speed=1000"};
  auto radixd = std::make_unique<RadixdProcess>(words);
  ASSERT_TRUE(radixd->waitForLog("listening"));
  {
    // Somebody has watched before, to the end.
    const auto before = manager({.observes = true});
    radix::client::EventsOn(before);
    ASSERT_TRUE(radixd->waitForLog("played to its end"));
  }
  const auto viewer = manager();
  std::vector<std::pair<std::int64_t, std::string>> records;
  std::int64_t youngest = INT64_MAX;
  radix::client::RegisterEventHandler(viewer, radix::kEventMetric, [&](const auto& event, radix::client::Group) {
    const Dictionary record = radix::client::nativeDictionary(*event);
    const auto payload = *record.find(radix::kKeyPayload)->bytes();
    records.emplace_back(*record.find(radix::kKeyMetricID)->int64(), std::string(payload.begin(), payload.end()));
    youngest = std::min(youngest, *record.find(radix::kKeyAge)->int64());
  });
  const auto perform = [&](const char* command, const Dictionary& arguments) {
    radix::client::ObjectHandle reply;
    return radix::client::PerformCommand(viewer, command, arguments, reply).status;
  };
  const auto listen = [&] {
    radix::client::EventsOff(viewer);
    radix::client::EventsOn(viewer);
  };
  const auto eachOnce = [&] {
    return std::set<std::pair<std::int64_t, std::string>>(records.begin(), records.end()).size() == records.size();
  };
  listen();
  ASSERT_EQ(perform(radix::kCommandClearConfiguration, {}), 0);
  const std::string configuration =
      "[metrics]\nK_LTE_RRC_STATE = \"on change\"\nK_LTE_RSRP_RSRQ_SINR = 1\n[triggers]\n1 = [\"K_LTE_SCELL_INFO\"]\n";
  ASSERT_EQ(perform(radix::kCommandAddConfiguration,
                    {{radix::kKeyPayload, Value::bytes({reinterpret_cast<const std::uint8_t*>(configuration.data()),
                                                        configuration.size()})}}),
            0);
  listen();
  ASSERT_EQ(perform(radix::kCommandQueryMetric, {{radix::kKeyTriggerID, std::int64_t{1}}}), 0);
  listen();
  ASSERT_EQ(status(viewer), 0);
  ASSERT_EQ(status(viewer), 0);
  // State, measurement and cell as they were kept, and the cell once more as it was asked for.
  ASSERT_TRUE(loop_.runUntil([&] { return records.size() >= 4; }, patience));
  EXPECT_EQ(records.size(), 4U);
  std::sort(records.begin(), records.end());
  EXPECT_EQ(records[0].first, 0x3C40C2) << "K_LTE_SCELL_INFO";
  EXPECT_EQ(records[0], records[1]) << "a question about what does not change is answered with the same content";
  records.erase(records.begin());
  EXPECT_TRUE(eachOnce());
  ASSERT_TRUE(radix::client::Connection(viewer).sources);
  EXPECT_EQ(radix::client::Connection(viewer).sources->at(0).phase, radix::client::SourceState::Phase::Ended);

  radixd->send(SIGKILL);
  radixd->waitForEnd();
  ASSERT_TRUE(loop_.runUntil([&] { return !radix::client::Connection(viewer).connected; }, patience));
  EXPECT_EQ(radix::client::Connection(viewer).sources, std::nullopt);
  records.clear();
  std::ofstream(trace_) << logFrom("13.00", 20);
  radixd = std::make_unique<RadixdProcess>(words);
  ASSERT_TRUE(radixd->waitForLog("played to its end"));
  // All twenty states. Of the twenty measurements a busy machine plays several within their period of a millisecond,
  // and then the last of those comes alone. The cell is the trigger's: nobody has asked for it here.
  const auto countOf = [&](std::int64_t metricId) {
    return std::count_if(records.begin(), records.end(), [&](const auto& record) { return record.first == metricId; });
  };
  ASSERT_TRUE(
      loop_.runUntil([&] { return countOf(K_LTE_RRC_STATE) == 20 && countOf(K_LTE_RSRP_RSRQ_SINR) >= 1; }, patience));
  listen();
  ASSERT_EQ(status(viewer), 0);
  ASSERT_EQ(status(viewer), 0);
  EXPECT_TRUE(eachOnce());
}

TEST_F(Radixd, FiftyClientsConnectAtOnceAndAllAreServed) {
  RadixdProcess radixd(arguments());
  ASSERT_TRUE(radixd.waitForLog("listening"));
  // Stopped, so that all of them stand in the queue of the socket before the first is accepted.
  radixd.send(SIGSTOP);
  std::vector<std::unique_ptr<RawClient>> crowd;
  for (int number = 0; number < 50; ++number) {
    auto result = radix::makeSocketConnector(loop_, surroundings())->connect();
    ASSERT_TRUE(result.link) << "client " << number << ": " << result.error;
    crowd.push_back(std::make_unique<RawClient>(std::move(result.link)));
    crowd.back()->say(radix::observer("crowd"));
    crowd.back()->say(radix::Delivery(true));
  }
  radixd.send(SIGCONT);
  for (const auto& client : crowd) {
    EXPECT_TRUE(loop_.runUntil([&] { return client->hello && !client->events.empty(); }, patience));
  }
}

TEST_F(Radixd, WithoutDescriptorsItStaysUpAndServesAgainWhenThereAreSome) {
#ifdef __SANITIZE_ADDRESS__
  GTEST_SKIP() << "the sanitizer opens a pipe to look at memory and reports a fault of its own when it gets none";
#endif
  RadixdProcess radixd(arguments(), [] {
    // Whatever ran this test may have left descriptors open.
    ::close_range(3, ~0U, 0);
    const rlimit few{16, 16};
    ::setrlimit(RLIMIT_NOFILE, &few);
  });
  ASSERT_TRUE(radixd.waitForLog("listening")) << radixd.log();
  std::vector<std::unique_ptr<RawClient>> crowd;
  for (int number = 0; number < 30; ++number) {
    crowd.push_back(std::make_unique<RawClient>(radix::makeSocketConnector(loop_, surroundings())->connect().link));
    crowd.back()->say(radix::observer("crowd"));
  }
  EXPECT_TRUE(radixd.waitForLog("cannot accept a connection: Too many open files; trying again soon"));
  crowd.erase(crowd.begin(), crowd.begin() + 25);
  for (const auto& client : crowd) {
    EXPECT_TRUE(loop_.runUntil([&] { return client->hello.has_value(); }, patience));
  }
}

TEST_F(Radixd, TakesTheSocketThatASystemManagerHandsOverAndLeavesItInPlace) {
  FileDescriptor socket(::socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0));
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::memcpy(address.sun_path, socket_.data(), socket_.size());
  ASSERT_EQ(::bind(socket.number(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
  ASSERT_EQ(::listen(socket.number(), 16), 0);
  const int handed = socket.number();
  RadixdProcess radixd({"--source", "trace:" + trace_}, [handed] {
    // As a system manager does: the first descriptor after the standard ones, and whom it is for.
    if (handed == 3) {
      ::fcntl(3, F_SETFD, 0);
    } else {
      ::dup2(handed, 3);
    }
    ::setenv("LISTEN_FDS", "1", 1);
    ::setenv("LISTEN_PID", std::to_string(::getpid()).c_str(), 1);
  });
  ASSERT_TRUE(radixd.waitForLog("listening at a socket of the system manager")) << radixd.log();
  EXPECT_EQ(status(manager()), 0);
  radixd.send(SIGTERM);
  EXPECT_EQ(radixd.waitForEnd(), 0);
  EXPECT_TRUE(exists(socket_));
}

TEST_F(Radixd, ATraceOfRandomBytesIsRefusedWithWhatIsWrong) {
  std::mt19937 random(5);
  std::ofstream noise(trace_, std::ios::binary);
  for (int count = 0; count < 100000; ++count) noise.put(static_cast<char>(random()));
  noise.close();
  RadixdProcess radixd(arguments());
  EXPECT_EQ(radixd.waitForEnd(), 1);
  EXPECT_THAT(radixd.log(), HasSubstr("radixd: error: the source 'trace:" + trace_ + ",loop' cannot be had: "));
  EXPECT_FALSE(exists(socket_));
}

TEST_F(Radixd, ACommandLineThatIsNotUnderstoodEndsWithStatusTwoAndASourceThatIsNotThereWithOne) {
  EXPECT_EQ(RadixdProcess({"--no-such-option"}).waitForEnd(), 2);
  EXPECT_EQ(RadixdProcess({"--log-level", "loud"}).waitForEnd(), 2);
  RadixdProcess unknown({"--socket", socket_, "--source", "crystal-ball"});
  EXPECT_EQ(unknown.waitForEnd(), 1);
  EXPECT_THAT(unknown.log(), HasSubstr("there is no source of the kind 'crystal-ball'"));
}

TEST_F(Radixd, TheLogLevelSaysHowMuchIsWritten) {
  RadixdProcess quiet(arguments({"--log-level", "error"}));
  // Nothing is written, so it is known to be there when it answers.
  const auto client = manager();
  const auto deadline = std::chrono::steady_clock::now() + patience;
  while (status(client) != 0) ASSERT_LT(std::chrono::steady_clock::now(), deadline);
  quiet.send(SIGTERM);
  EXPECT_EQ(quiet.waitForEnd(), 0);
  EXPECT_EQ(quiet.log(), "");
}

TEST_F(Radixd, GoesOnWhenNobodyCanTakeItsLog) {
  for (const char* where : {"/dev/full", "closed"}) {
    RadixdProcess radixd(arguments(), [where] {
      const std::string target = where;
      if (target == "closed") {
        // A pipe that nobody reads.
        int ends[2];
        if (::pipe(ends) != 0) ::_exit(1);
        ::close(ends[0]);
        ::dup2(ends[1], STDERR_FILENO);
        ::close(ends[1]);
      } else {
        const int full = ::open(where, O_WRONLY);
        ::dup2(full, STDERR_FILENO);
      }
    });
    const auto client = manager();
    const auto deadline = std::chrono::steady_clock::now() + patience;
    while (status(client) != 0) ASSERT_LT(std::chrono::steady_clock::now(), deadline) << where;
    radixd.send(SIGTERM);
    EXPECT_EQ(radixd.waitForEnd(), 0) << where;
  }
}

TEST_F(Radixd, GoesOnAndEndsWhenItsLogIsAPipeThatNobodyReads) {
  int ends[2];
  ASSERT_EQ(::pipe2(ends, O_CLOEXEC), 0);
  const FileDescriptor reading(ends[0]);
  FileDescriptor writing(ends[1]);
  ASSERT_EQ(::fcntl(writing.number(), F_SETPIPE_SZ, 4096), 4096);
  RadixdProcess radixd(arguments({"--log-level", "debug"}), [&writing] { ::dup2(writing.number(), STDERR_FILENO); });
  const auto client = manager();
  const auto deadline = std::chrono::steady_clock::now() + patience;
  while (status(client) != 0) ASSERT_LT(std::chrono::steady_clock::now(), deadline);
  // Each answer is a line of the log: far more than a pipe of 4096 bytes holds.
  for (int number = 0; number < 1000; ++number) ASSERT_EQ(status(client), 0) << number;
  // It is not that somebody has made the pipe non-blocking, which others may share.
  EXPECT_EQ(::fcntl(writing.number(), F_GETFL) & O_NONBLOCK, 0);
  writing.close();
  radixd.send(SIGTERM);
  EXPECT_EQ(radixd.waitForEnd(), 0);
}

// Connects as a program would that knows nothing of ours; the number of the descriptor, or -1.
int connectPlainly(const std::string& path) {
  const int socket = ::socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0);
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::memcpy(address.sun_path, path.data(), path.size());
  if (::connect(socket, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0) return socket;
  ::close(socket);
  return -1;
}

TEST_F(Radixd, ItsLastLineComesAlsoAfterMoreLinesThanAMinuteMayHave) {
  RadixdProcess radixd(arguments());
  ASSERT_TRUE(radixd.waitForLog("listening"));
  // Each comes and goes with a line.
  const auto hello = radix::encode(radix::Hello("guest"));
  for (int number = 0; number < 600; ++number) {
    const FileDescriptor guest(connectPlainly(socket_));
    ASSERT_TRUE(guest);
    ::send(guest.number(), hello->data(), hello->size(), MSG_NOSIGNAL);
    char answer[4096];
    ASSERT_GT(::recv(guest.number(), answer, sizeof answer, 0), 0);
  }
  radixd.send(SIGTERM);
  EXPECT_EQ(radixd.waitForEnd(), 0);
  const std::string& log = radixd.log();
  EXPECT_LE(std::count(log.begin(), log.end(), '\n'), 1002);
  EXPECT_THAT(log, HasSubstr(" lines were left out here, as there were more than 1000 in a minute\n"));
  EXPECT_TRUE(log.ends_with("\nradixd: info: ending\n"));
}

TEST_F(Radixd, ASocketWithAnEmptyPathIsRefused) {
  RadixdProcess radixd({"--socket", "", "--source", "trace:" + trace_});
  EXPECT_EQ(radixd.waitForEnd(), 2);
  EXPECT_THAT(radixd.log(), HasSubstr("the socket's path is empty"));
}

TEST_F(Radixd, SleepsWhileNobodyIsThere) {
  RadixdProcess radixd(arguments());
  ASSERT_TRUE(radixd.waitForLog("can fill"));
  const auto switches = [&] {
    long total = 0;
    // Of all its threads.
    for (const auto& thread :
         std::filesystem::directory_iterator("/proc/" + std::to_string(radixd.process()) + "/task")) {
#ifdef __SANITIZE_THREAD__
      // The sanitizer's own thread wakes ten times a second and cannot be told from the log's: the loop's alone counts.
      if (thread.path().filename() != std::to_string(radixd.process())) continue;
#endif
      std::ifstream file(thread.path() / "status");
      for (std::string line; std::getline(file, line);) {
        if (line.find("voluntary_ctxt_switches") == 0) total += std::stol(line.substr(line.find(':') + 1));
      }
    }
    return total;
  };
  // A moment to fall asleep in, then a second in which nothing may wake it.
  bool late = false;
  auto moment = loop_.after(std::chrono::milliseconds(200), [&] { late = true; });
  loop_.runUntil([&] { return late; }, patience);
  const long before = switches();
  late = false;
  moment = loop_.after(std::chrono::seconds(1), [&] { late = true; });
  loop_.runUntil([&] { return late; }, patience);
  EXPECT_EQ(switches(), before);
}

TEST_F(Radixd, AClientThatIsKilledWhileItTalksLeavesTheOthersServed) {
  RadixdProcess radixd(arguments());
  ASSERT_TRUE(radixd.waitForLog("listening"));
  const auto other = manager();
  ASSERT_EQ(status(other), 0);
  const auto hello = radix::encode(radix::Hello("victim"));
  const auto on = radix::encode(radix::Delivery(true));
  const auto command = radix::encode(radix::Command(1, radix::kCommandShowStatus, std::vector<std::uint8_t>(60'000)));
  for (int round = 1; round <= 5; ++round) {
    const pid_t victim = ::fork();
    if (victim == 0) {
      const int socket = connectPlainly(socket_);
      ::send(socket, hello->data(), hello->size(), 0);
      ::send(socket, on->data(), on->size(), 0);
      // Reads nothing, so that both directions fill, and never comes to an end by itself.
      while (::send(socket, command->data(), command->size(), MSG_NOSIGNAL) > 0) {
      }
      ::_exit(0);
    }
    const std::string who = "'victim' (process " + std::to_string(victim);
    ASSERT_TRUE(radixd.waitForLog(who)) << radixd.log();
    ::kill(victim, SIGKILL);
    int ended = 0;
    ::waitpid(victim, &ended, 0);
    EXPECT_TRUE(WIFSIGNALED(ended));
    const std::string gone = who + ", user " + std::to_string(::geteuid()) + ") has gone after ";
    EXPECT_TRUE(radixd.waitForLog(gone)) << radixd.log();
    EXPECT_EQ(status(other), 0);
  }
}

TEST_F(Radixd, AForeignUsersConnectionIsRefusedAndLogged) {
  if (::geteuid() != 0) GTEST_SKIP() << "only root may try as somebody else";
  constexpr uid_t nobody = 65534;
  // A socket that anybody may open, as a careless system manager makes it: who connects is looked at all the same.
  FileDescriptor socket(::socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0));
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  std::memcpy(address.sun_path, socket_.data(), socket_.size());
  ASSERT_EQ(::bind(socket.number(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
  ASSERT_EQ(::listen(socket.number(), 16), 0);
  ASSERT_EQ(::chmod(socket_.c_str(), 0606), 0);
  ASSERT_EQ(::chmod(folder_.path().c_str(), 0711), 0);
  const int handed = socket.number();
  RadixdProcess radixd({"--source", "trace:" + trace_}, [handed] {
    if (handed == 3) {
      ::fcntl(3, F_SETFD, 0);
    } else {
      ::dup2(handed, 3);
    }
    ::setenv("LISTEN_FDS", "1", 1);
    ::setenv("LISTEN_PID", std::to_string(::getpid()).c_str(), 1);
  });
  ASSERT_TRUE(radixd.waitForLog("listening at a socket of the system manager")) << radixd.log();
  const auto hello = radix::encode(radix::Hello("foreigner"));
  const pid_t foreigner = ::fork();
  if (foreigner == 0) {
    if (::setgroups(0, nullptr) != 0 || ::setgid(nobody) != 0 || ::setuid(nobody) != 0) ::_exit(3);
    const int connection = connectPlainly(socket_);
    if (connection < 0) ::_exit(4);
    ::send(connection, hello->data(), hello->size(), MSG_NOSIGNAL);
    // It is told something, and then comes the end.
    char answer[4096];
    if (::recv(connection, answer, sizeof answer, 0) <= 0) ::_exit(5);
    ::_exit(::recv(connection, answer, sizeof answer, 0) == 0 ? 0 : 6);
  }
  int ended = 0;
  ::waitpid(foreigner, &ended, 0);
  EXPECT_EQ(WIFEXITED(ended) ? WEXITSTATUS(ended) : -1, 0);
  EXPECT_TRUE(radixd.waitForLog("radixd: warning: client 1 (process " + std::to_string(foreigner) +
                                ", user 65534) was refused: only user 0 and root may connect, not user 65534\n"))
      << radixd.log();
  EXPECT_EQ(status(manager()), 0);
}

}  // namespace
}  // namespace probeview
