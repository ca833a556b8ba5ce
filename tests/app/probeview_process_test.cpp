// SPDX-License-Identifier: Apache-2.0
//
// The real programs, as a person starts them.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/syscall.h>

#include <chrono>
#include <cstdio>
#include <fstream>
#include <string>
#include <vector>

#include "tests/app/radixd_process.h"
#include "ui/varnet_view_items.h"

namespace probeview {
namespace {

struct Outcome {
  int status;
  std::string output;
};

// Runs a shell command; what it writes to standard output.
Outcome run(const std::string& command) {
  std::FILE* pipe = ::popen(("exec </dev/null; " + command).c_str(), "r");
  if (!pipe) return {-1, ""};
  std::string output;
  char buffer[4096];
  for (std::size_t count = 0; (count = std::fread(buffer, 1, sizeof buffer, pipe)) > 0;) output.append(buffer, count);
  const int status = ::pclose(pipe);
  return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, output};
}

const std::string probeview = PROBEVIEW;
const std::string probectl = PROBECTL;

TEST(Programs, PrintShowsEveryPageOnceWhenEveryMetricHasComeAndEndsWell) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const auto shown = run(probeview + " --print 2>/dev/null");
  EXPECT_EQ(shown.status, 0);
  std::size_t headings = 0;
  for (std::size_t at = shown.output.find("probeview › "); at != std::string::npos;
       at = shown.output.find("probeview › ", at + 1)) {
    ++headings;
  }
  EXPECT_EQ(headings, navigablePageKeys().size());
  EXPECT_EQ(shown.output.find("probeview › Device Info › IMSI\n"), 0u) << "no console log";
  EXPECT_EQ(shown.output.find("Received Valid Metric"), std::string::npos);
  EXPECT_NE(shown.output.find("\n  state "), std::string::npos);
  EXPECT_NE(shown.output.find("\nscenario:city · "), std::string::npos);
}

TEST(Programs, TheLineBelowAPageSpeaksOfThatPage) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  EXPECT_NE(run(probectl + " pages 'LTE RRC State'").output.find("\n\nscenario:city · "), std::string::npos);
  EXPECT_TRUE(run(probectl + " pages 'LTE Tx Power'").output.ends_with("\n\nno metric fills this page\n"));
}

TEST(Programs, TheConsoleLogGoesToTheFileThatIsNamed) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const TemporaryFolder folder;
  const auto shown = run(probeview + " --print --log " + folder.path() + "/log 2>/dev/null");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output.find("probeview › Device Info › IMSI\n"), 0u);
  EXPECT_EQ(run("head -n 2 " + folder.path() + "/log").output, "pushing metric file\nQuerying SIM files\n");
}

TEST(Programs, AConsoleLogThatNobodyReadsKeepsNoPageFromBeingPrinted) {
  RadixdProcess radixd("scenario:city,seed=1,speed=20");
  ASSERT_TRUE(radixd.start());
  const TemporaryFolder folder;
  const std::string log = folder.path() + "/log";
  ASSERT_EQ(::mkfifo(log.c_str(), 0600), 0);
  const FileDescriptor idle(::open(log.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
  ASSERT_EQ(::fcntl(idle.number(), F_SETPIPE_SZ, 4096), 4096);
  const auto shown = run("timeout 60 " + probeview + " --print --log " + log + " 2>/dev/null");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output.find("probeview › Device Info › IMSI\n"), 0u);
}

TEST(Programs, ALogFileThatIsAPipeWithoutAReaderIsRefusedInsteadOfWaitedFor) {
  const TemporaryFolder folder;
  const std::string log = folder.path() + "/log";
  ASSERT_EQ(::mkfifo(log.c_str(), 0600), 0);
  const auto shown = run("timeout 60 " + probeview + " --print --log " + log + " 2>&1");
  EXPECT_EQ(shown.status, 1);
  EXPECT_EQ(shown.output,
            "the log file " + log + " cannot be written: nobody reads this pipe; name another with --log\n");
}

TEST(Programs, WithHardlyAnyDescriptorsEachSaysSoAndEndsWithStatusOne) {
#ifdef __SANITIZE_ADDRESS__
  GTEST_SKIP() << "the sanitizer opens a pipe to look at memory and reports a fault of its own when it gets none";
#endif
  const TemporaryFolder folder;
  const std::string socket = folder.path() + "/radixd.sock";
  const std::vector<std::string> commands{
      RADIXD " --socket " + socket,
      probectl + " --socket " + socket + " status",
      probectl + " --socket " + socket + " watch",
      probectl + " --socket " + socket + " query K_SIM_FILE_INFO",
      probectl + " --socket " + socket + " config clear",
      probectl + " --socket " + socket + " pages",
      probeview + " --print",
      probeview + " --window",
#ifdef PICTURES
      PICTURES " " + folder.path() + "/pages.png",
#endif
  };
  const std::string surroundings =
      "export RADIXD_SOCKET=" + socket + " QT_QPA_PLATFORM=offscreen TERM=xterm; timeout 20 ";
  const auto expectReason = [](const Outcome& shown, const std::string& command) {
    EXPECT_EQ(shown.status, 1) << command << "\n" << shown.output;
    EXPECT_NE(shown.output, "") << command;
    EXPECT_EQ(shown.output.find("terminate called"), std::string::npos) << shown.output;
  };
  // What the surroundings of a test leave open must not take the few places.
  const std::string closing = "for n in 3 4 5 6 7 8 9; do eval \"exec $n>&-\"; done; ";
  for (const std::string limit : {"4", "6"}) {
    for (const std::string& command : commands) {
      expectReason(run(surroundings + "bash -c '" + closing + "ulimit -n " + limit + "; exec " + command + "' 2>&1"),
                   command);
    }
    // On a terminal of its own.
    const std::string terminal = probeview + " --terminal";
    expectReason(run(surroundings + "script -qec '" + closing + "ulimit -n " + limit + "; exec " + terminal +
                     "' /dev/null 2>&1"),
                 terminal);
  }
}

TEST(Programs, ASocketWithAnEmptyPathIsRefused) {
  const std::vector<std::string> commands{
      probectl + " --socket '' status",
#ifdef PICTURES
      PICTURES " x.png --socket ''",
#endif
  };
  for (const std::string& command : commands) {
    const auto shown = run(command + " 2>&1");
    EXPECT_EQ(shown.status, 2) << command;
    EXPECT_NE(shown.output.find("the socket's path is empty"), std::string::npos) << shown.output;
  }
}

#ifdef PICTURES
TEST(Programs, WhatTheToolkitSaysToAStandardErrorThatNobodyReadsKeepsNoPictureFromBeingDrawn) {
  RadixdProcess radixd("scenario:city,seed=1,speed=20");
  ASSERT_TRUE(radixd.start());
  const TemporaryFolder folder;
  const std::string pipe = folder.path() + "/pipe";
  ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
  const FileDescriptor idle(::open(pipe.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
  const FileDescriptor filler(::open(pipe.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC));
  ASSERT_TRUE(idle && filler);
  while (::write(filler.number(), "x", 1) == 1) {
  }
  // Without that folder the toolkit warns.
  const std::string command =
      "env -u XDG_RUNTIME_DIR timeout 60 " PICTURES " " + folder.path() + "/pages.png 2>" + pipe;
  EXPECT_EQ(run(command).status, 0);
}
#endif

TEST(Programs, ATimeZoneOrAConfigurationThatIsAPipeWithoutAWriterHangsNoProgram) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const TemporaryFolder folder;
  const std::string pipe = folder.path() + "/pipe";
  ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
  const std::string zone = "TZ=" + pipe + " timeout 60 ";
  const std::string told = "TZ names " + pipe + ", which is no regular file; times are shown in UTC\n";
  const auto shown = run(zone + probeview + " --print --log " + folder.path() + "/log 2>&1 >/dev/null");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output.find(told), 0u) << shown.output;
  const auto page = run(zone + probectl + " pages LTE RRC State 2>&1");
  EXPECT_EQ(page.status, 0);
  EXPECT_EQ(page.output.find("probectl: " + told), 0u) << page.output;
  EXPECT_NE(page.output.find(" UTC\n"), std::string::npos) << page.output;
  const auto pushed = run("timeout 60 " + probectl + " config push " + pipe + " 2>&1");
  EXPECT_EQ(pushed.status, 1);
  EXPECT_EQ(pushed.output, "probectl: cannot read " + pipe + ": it is a pipe, and nobody writes to it\n");
  // What somebody writes is read to its end, and of what never ends no more than is refused.
  const auto piped = run("echo '[metrics]' | timeout 60 " + probectl + " config push /dev/stdin 2>&1");
  EXPECT_EQ(piped.status, 0) << piped.output;
  const auto endless = run("timeout 60 " + probectl + " config push /dev/zero 2>&1");
  EXPECT_EQ(endless.status, 1);
  EXPECT_NE(endless.output.find("the configuration has more than 131072 bytes; at most "), std::string::npos)
      << endless.output;
}

TEST(Programs, TheConsoleLogComesBeforeThePagesWhereStandardOutputIsNamed) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const auto shown = run(probeview + " --print --log - 2>/dev/null");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output.find("pushing metric file\n"), 0u);
  EXPECT_NE(shown.output.find("\nQuerying SIM files\n"), std::string::npos);
  EXPECT_NE(shown.output.find("\nReceived Valid Metric\n"), std::string::npos);
  EXPECT_NE(shown.output.find("\nprobeview › Device Info › IMSI\n"), std::string::npos);
}

// Whether the process stands in a write, as far as the system tells.
bool isWriting(pid_t process) {
  std::ifstream file("/proc/" + std::to_string(process) + "/syscall");
  long call = 0;
  return (file >> call) && (call == SYS_write || call == SYS_writev);
}

TEST(Programs, ASignalEndsAWatchWhoseReaderTakesNothing) {
  RadixdProcess radixd("scenario:city,seed=1,speed=20");
  ASSERT_TRUE(radixd.start());
  int ends[2] = {};
  ASSERT_EQ(::pipe2(ends, O_CLOEXEC), 0);
  const FileDescriptor reading(ends[0]);
  const FileDescriptor writing(ends[1]);
  ASSERT_EQ(::fcntl(writing.number(), F_SETPIPE_SZ, 4096), 4096);
  const pid_t process = ::fork();
  if (process == 0) {
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    ::dup2(writing.number(), STDOUT_FILENO);
    ::execl(PROBECTL, PROBECTL, "watch", nullptr);
    ::_exit(127);
  }
  ASSERT_GT(process, 0);
  const auto within = [](auto condition) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (!condition()) {
      if (std::chrono::steady_clock::now() > end) return false;
      ::poll(nullptr, 0, 5);
    }
    return true;
  };
  EXPECT_TRUE(within([&] { return isWriting(process); }));
  ::kill(process, SIGTERM);
  int status = 0;
  const bool hasEnded = within([&] { return ::waitpid(process, &status, WNOHANG) == process; });
  EXPECT_TRUE(hasEnded);
  if (!hasEnded) {
    ::kill(process, SIGKILL);
    ::waitpid(process, &status, 0);
  }
}

TEST(Programs, AReaderThatGoesAwayEndsThePrintingInPeace) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  // bash: the status of the first program of the pipe.
  const auto shown = run("bash -c '" + probeview + " --print --log - 2>/dev/null | head -n 1; exit ${PIPESTATUS[0]}'");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output, "pushing metric file\n");
}

TEST(Programs, ProbectlPrintsOnePageAndNothingElse) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const auto shown = run(probectl + " --socket " + radixd.socket() + " pages lte RRC  state 2>&1");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output.find("probeview › LTE › RRC State\n  timestamp "), 0u);
}

TEST(Programs, ProbectlNamesThePagesThatThereAre) {
  const auto shown = run(probectl + " pages LTE Tx Pwr 2>&1");
  EXPECT_EQ(shown.status, 2);
  EXPECT_EQ(shown.output.find("probectl: there is no page \"LTE Tx Pwr\"; did you mean LTE Tx Power"), 0u)
      << shown.output;
  for (const auto& key : navigablePageKeys()) EXPECT_NE(shown.output.find("  " + key + "\n"), std::string::npos);
}

TEST(Programs, WithoutAServicePrintingSaysWhyAndEndsWithStatusOne) {
  const TemporaryFolder folder;
  const std::string socket = folder.path() + "/radixd.sock";
  const std::string reason = "no baseband service at " + socket + "; start radixd or set RADIXD_SOCKET\n";
  const auto pages = run(probectl + " --socket " + socket + " pages 2>&1");
  EXPECT_EQ(pages.status, 1);
  EXPECT_EQ(pages.output, reason);
  const auto page = run(probectl + " --socket " + socket + " pages LTE RRC State 2>&1 >/dev/null");
  EXPECT_EQ(page.status, 1);
  EXPECT_EQ(page.output, reason);
  const auto shown = run("RADIXD_SOCKET=" + socket + " " + probeview + " --print --log " + folder.path() + "/log 2>&1");
  EXPECT_EQ(shown.status, 1);
  // The system's log goes there, too.
  EXPECT_TRUE(shown.output.ends_with("\n" + reason)) << shown.output;
  EXPECT_EQ(shown.output.find("probeview › "), std::string::npos);
}

TEST(Programs, WatchEndsWhenItsReaderHasGoneAlsoWhileNothingComes) {
  const TemporaryFolder folder;
  // No service, hence no record whose writing would fail. The reader that ends at once is bash's own.
  const auto shown = run("timeout 60 bash -c 'timeout 50 " + probectl + " --socket " + folder.path() +
                         "/radixd.sock watch 2>/dev/null | :; exit ${PIPESTATUS[0]}'");
  EXPECT_EQ(shown.status, 0);
}

TEST(Programs, TheTerminalPagesNeedATerminal) {
  const auto shown = run(probeview + " --terminal 2>&1");
  EXPECT_EQ(shown.status, 1);
  EXPECT_NE(shown.output.find("--print"), std::string::npos);
}

}  // namespace
}  // namespace probeview
