// SPDX-License-Identifier: Apache-2.0
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <unistd.h>

#include <stdexcept>
#include <string>
#include <vector>

#include "platform/console_log.h"
#include "platform/fatal_error.h"
#include "platform/system_log.h"
#include "tests/support/harmless.h"

namespace probeview {
namespace {

// Keeps each write apart: a datagram socket's records are the writes.
class WriteWatch {
 public:
  WriteWatch() {
    if (::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK, 0, ends_) != 0) throw std::runtime_error("socketpair");
  }
  ~WriteWatch() {
    ::close(ends_[0]);
    if (ends_[1] >= 0) ::close(ends_[1]);
  }
  int writingEnd() const { return ends_[0]; }
  void closeReadingEnd() {
    ::close(ends_[1]);
    ends_[1] = -1;
  }
  std::vector<std::string> writes() const {
    std::vector<std::string> all;
    char buffer[65536];
    for (ssize_t size; (size = ::read(ends_[1], buffer, sizeof buffer)) > 0;) {
      all.emplace_back(buffer, static_cast<std::size_t>(size));
    }
    return all;
  }

 private:
  int ends_[2];
};

using Writes = std::vector<std::string>;

TEST(ConsoleLog, ALineOnItsOwnIsWrittenAtOnce) {
  const WriteWatch watch;
  ConsoleLog log(watch.writingEnd());
  log.line("pushing metric file");
  log.flush();
  EXPECT_EQ(watch.writes(), (Writes{"pushing metric file\n"}));
  log.line("");
  log.flush();
  EXPECT_EQ(watch.writes(), (Writes{"\n"}));
}

TEST(ConsoleLog, ALineStaysALineAndSteersNoTerminal) {
  const WriteWatch watch;
  ConsoleLog log(watch.writingEnd());
  log.line(
      "apn \xc2\x9b"
      "31m\x1b[2J\nb");
  log.flush();
  EXPECT_EQ(watch.writes(), (Writes{"apn \\u{9b}31m\\u{1b}[2J\\nb\n"}));
  log.line(hostileText());
  log.flush();
  const Writes writes = watch.writes();
  ASSERT_EQ(writes.size(), 1u);
  EXPECT_TRUE(areHarmless(writes[0]));
  EXPECT_EQ(writes[0].find('\n'), writes[0].size() - 1);
}

TEST(ConsoleLog, TheLinesOfAGroupLeaveInOneWrite) {
  const WriteWatch watch;
  ConsoleLog log(watch.writingEnd());
  {
    const LineGroup outer(log);
    log.line("one");
    {
      const LineGroup inner(log);
      log.line("two");
    }
    log.line("three");
  }
  log.flush();
  EXPECT_EQ(watch.writes(), (Writes{"one\ntwo\nthree\n"}));
}

TEST(ConsoleLog, AFatalStopWritesWhatAGroupHeldBack) {
  const WriteWatch watch;
  ConsoleLog log(watch.writingEnd());
  setFatalErrorObserver([&watch](std::string_view) {
    EXPECT_EQ(watch.writes(), (Writes{"Metric ID in Hex = 3C4E04\n"}));
    throw std::runtime_error("stopped");
  });
  {
    const LineGroup group(log);
    log.line("Metric ID in Hex = 3C4E04");
    EXPECT_THROW(fatalError("a broken contract"), std::runtime_error);
  }
  setFatalErrorObserver({});
  EXPECT_EQ(watch.writes(), Writes{});
}

TEST(ConsoleLog, ALogThatIsGoneIsNotFlushedByAFatalStop) {
  const WriteWatch watch;
  { ConsoleLog log(watch.writingEnd()); }
  setFatalErrorObserver([](std::string_view) { throw std::runtime_error("stopped"); });
  EXPECT_THROW(fatalError("a broken contract"), std::runtime_error);
  setFatalErrorObserver({});
}

TEST(ConsoleLog, SurvivesAClosedPipe) {
  int ends[2];
  ASSERT_EQ(::pipe(ends), 0);
  ::close(ends[0]);
  {
    ConsoleLog log(ends[1]);
    log.line("nobody reads this");
    log.flush();
    EXPECT_TRUE(log.closed());
    log.line("nor this");
  }
  ::close(ends[1]);
}

TEST(ConsoleLog, OnAFullDiskLinesAreLostAndThoseThatFindRoomAgainAreWritten) {
  char name[] = "/tmp/probeview-log-XXXXXX";
  const int file = ::mkstemp(name);
  ASSERT_GE(file, 0);
  rlimit before{};
  ASSERT_EQ(::getrlimit(RLIMIT_FSIZE, &before), 0);
  const auto allow = [&](rlim_t bytes) {
    const rlimit now{bytes, before.rlim_max};
    return ::setrlimit(RLIMIT_FSIZE, &now);
  };
  {
    ConsoleLog log(file);
    log.line("first");
    log.flush();
    ASSERT_EQ(allow(10), 0);
    log.line("second");
    log.flush();
    log.line("lost");
    log.flush();
    EXPECT_FALSE(log.closed());
    ASSERT_EQ(allow(before.rlim_cur), 0);
    log.line("third");
    log.line("fourth");
  }
  char text[64] = {};
  EXPECT_GT(::pread(file, text, sizeof text - 1, 0), 0);
  EXPECT_STREQ(text, "first\nseco\nthird\nfourth\n");
  ::close(file);
  ::unlink(name);
}

TEST(ConsoleLog, OnADeviceWithoutRoomEveryLineIsLostAndNothingElseHappens) {
  const int full = ::open("/dev/full", O_WRONLY | O_CLOEXEC);
  ASSERT_GE(full, 0);
  {
    ConsoleLog log(full);
    for (int count = 0; count < 1000; ++count) log.line("no room");
    log.flush();
    EXPECT_FALSE(log.closed());
  }
  ::close(full);
}

TEST(ConsoleLog, WaitsForASlowReaderInsteadOfLosingLines) {
  int ends[2];
  ASSERT_EQ(::pipe2(ends, O_NONBLOCK), 0);
  const std::string line(100'000, 'x');  // more than a pipe holds
  std::string read;
  const pid_t child = ::fork();
  if (child == 0) {
    ::close(ends[0]);
    {
      ConsoleLog log(ends[1]);
      log.line(line);
    }
    ::_exit(0);
  }
  ::close(ends[1]);
  ::fcntl(ends[0], F_SETFL, 0);
  char buffer[4096];
  for (ssize_t size; (size = ::read(ends[0], buffer, sizeof buffer)) > 0;) {
    read.append(buffer, static_cast<std::size_t>(size));
  }
  EXPECT_EQ(read, line + "\n");
  ::close(ends[0]);
}

TEST(ConsoleLog, AProgramMayChooseAnotherSink) {
  class Collected final : public LineSink {
   public:
    void line(std::string_view text) override { lines.emplace_back(text); }
    std::vector<std::string> lines;
  };
  static Collected collected;
  setConsoleLog(collected);
  collected.lines.clear();
  consoleLog().line("Querying SIM files");
  EXPECT_EQ(collected.lines, (Writes{"Querying SIM files"}));
}

TEST(SystemLog, EachLineIsEchoedToStandardErrorInOneWrite) {
  const WriteWatch watch;
  const int before = ::dup(STDERR_FILENO);
  ASSERT_GE(::dup2(watch.writingEnd(), STDERR_FILENO), 0);
  // Lines that wait at the same time leave together; the end of a log waits until its own have left.
  { SystemLog("probeview").line("-[RadixWrapper listen]: listening for %s events"); }
  { SystemLog("probeview").line("dict=[\"apn\": \"\u009b31m\"]\n\x1b[2J"); }
  ::dup2(before, STDERR_FILENO);
  ::close(before);
  EXPECT_EQ(watch.writes(), (Writes{"-[RadixWrapper listen]: listening for %s events\n",
                                    "dict=[\"apn\": \"\\u{9b}31m\"]\\n\\u{1b}[2J\n"}));
}

TEST(SystemLog, SurvivesAClosedStandardError) {
  WriteWatch watch;
  watch.closeReadingEnd();
  const int before = ::dup(STDERR_FILENO);
  ASSERT_GE(::dup2(watch.writingEnd(), STDERR_FILENO), 0);
  SystemLog("probeview").line("nobody reads this");
  ::dup2(before, STDERR_FILENO);
  ::close(before);
}

}  // namespace
}  // namespace probeview
