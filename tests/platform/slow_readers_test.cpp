// SPDX-License-Identifier: Apache-2.0
//
// Logs whose readers are slow, or read nothing: who logs goes on, and what is missing is counted.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <semaphore>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "platform/console_log.h"
#include "platform/fatal_error.h"
#include "platform/file_descriptor.h"
#include "platform/system_log.h"

namespace probeview {
namespace {

using Writes = std::vector<std::string>;

// The two ends of a pipe that holds as little as the system allows, 4096 bytes.
struct SmallPipe {
  SmallPipe() {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("pipe");
    reading = FileDescriptor(ends[0]);
    writing = FileDescriptor(ends[1]);
    ::fcntl(writing.number(), F_SETPIPE_SZ, 4096);
  }
  // Until the other end is closed.
  std::string readAll(std::size_t atOnce = 65536) const {
    std::string text;
    std::vector<char> buffer(atOnce);
    for (ssize_t size; (size = ::read(reading.number(), buffer.data(), buffer.size())) > 0;) {
      text.append(buffer.data(), static_cast<std::size_t>(size));
    }
    return text;
  }
  FileDescriptor reading;
  FileDescriptor writing;
};

// A line of 100 bytes that bears its number.
std::string numberedLine(int number) {
  std::string line = std::to_string(number) + " ";
  line.resize(99, 'x');
  return line;
}

// How many lines are there or told to be missing; they must be in their order.
int linesAccountedFor(const std::string& text, int& missing) {
  int next = 0;
  missing = 0;
  for (std::size_t at = 0; at < text.size();) {
    const std::size_t end = text.find('\n', at);
    if (end == std::string::npos) return -1;
    const std::string line = text.substr(at, end - at);
    const std::string told = "probeview: warning: ";
    if (line.starts_with(told)) {
      EXPECT_NE(line.find(" lines were left out here"), std::string::npos) << line;
      const int lost = std::stoi(line.substr(told.size()));
      missing += lost;
      next += lost;
    } else if (line != numberedLine(next++)) {
      return -1;
    }
    at = end + 1;
  }
  return next;
}

TEST(ConsoleLog, AReaderThatTakesNothingStopsNobodyAndIsToldHowManyLinesAreMissingWhenItReads) {
  constexpr int lines = 200'000;
  SmallPipe pipe;
  std::string text;
  std::thread reader;
  {
    ConsoleLog log(pipe.writing.number(), {.mostBytes = 512 * 1024, .patience = std::chrono::milliseconds(50)});
    const auto begin = std::chrono::steady_clock::now();
    for (int number = 0; number < lines; ++number) log.line(numberedLine(number));
    // Were a line waited for each time, this would take hours.
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20));
    EXPECT_FALSE(log.closed());
    reader = std::thread([&] { text = pipe.readAll(); });
    awaitLogsAt(pipe.writing.number());
    // Here there is room again.
    log.line(numberedLine(lines));
  }
  pipe.writing.close();
  reader.join();
  int missing = 0;
  EXPECT_EQ(linesAccountedFor(text, missing), lines + 1);
  // What the pipe and the bound hold is there, and no more was kept in memory.
  EXPECT_GT(missing, lines - 512 * 1024 / 100);
  EXPECT_LT(missing, lines - 256 * 1024 / 100);
}

TEST(ConsoleLog, AReaderThatReadsGetsEveryLineInItsOrderHoweverFastTheyCome) {
  constexpr int lines = 200'000;
  SmallPipe pipe;
  std::string text;
  std::thread reader([&] { text = pipe.readAll(4096); });
  {
    // So patient that a machine on which the reader hardly gets its turn proves the same.
    ConsoleLog log(pipe.writing.number(), {.mostBytes = 256 * 1024, .patience = std::chrono::seconds(60)});
    for (int number = 0; number < lines; ++number) log.line(numberedLine(number));
    awaitLogsAt(pipe.writing.number());
  }
  pipe.writing.close();
  reader.join();
  int missing = 0;
  EXPECT_EQ(linesAccountedFor(text, missing), lines);
  EXPECT_EQ(missing, 0);
}

TEST(ConsoleLog, AReaderThatComesLateLosesNothingOfFourMebibytesAndOfMoreItIsToldHowMuch) {
  // With the memory around them, 30000 lines of 100 bytes are below.
  for (const int lines : {30'000, 45'000}) {
    SmallPipe pipe;
    std::string text;
    std::thread reader;
    {
      ConsoleLog log(pipe.writing.number());
      for (int number = 0; number < lines; ++number) log.line(numberedLine(number));
      reader = std::thread([&] { text = pipe.readAll(); });
      awaitLogsAt(pipe.writing.number());
    }
    pipe.writing.close();
    reader.join();
    int missing = 0;
    EXPECT_EQ(linesAccountedFor(text, missing), lines);
    EXPECT_EQ(missing > 0, lines == 45'000) << missing;
  }
}

TEST(ConsoleLog, ARegularFileLosesNothingHoweverFastTheLinesCome) {
  constexpr int lines = 200'000;
  char name[] = "/tmp/probeview-log-XXXXXX";
  const FileDescriptor file(::mkstemp(name));
  ASSERT_TRUE(file);
  ::unlink(name);
  {
    // A bound far below what comes, and no patience: for a file that counts for nothing.
    ConsoleLog log(file.number(), {.mostBytes = 192 * 1024, .patience = std::chrono::nanoseconds::zero()});
    for (int number = 0; number < lines; ++number) log.line(numberedLine(number));
    awaitLogsAt(file.number());
  }
  std::string text(static_cast<std::size_t>(lines) * 100, ' ');
  ASSERT_EQ(::pread(file.number(), text.data(), text.size() + 1, 0), static_cast<ssize_t>(text.size()));
  int missing = 0;
  EXPECT_EQ(linesAccountedFor(text, missing), lines);
  EXPECT_EQ(missing, 0);
}

TEST(ConsoleLog, ALineLongerThanAllRoomIsWrittenWholeWhenNothingElseWaits) {
  SmallPipe pipe;
  const std::string longLine(300'000, 'x');
  std::string text;
  std::thread reader([&] { text = pipe.readAll(); });
  {
    ConsoleLog log(pipe.writing.number(), {.mostBytes = 192 * 1024});
    log.line(longLine);
    awaitLogsAt(pipe.writing.number());
  }
  pipe.writing.close();
  reader.join();
  EXPECT_EQ(text, longLine + "\n");
}

TEST(ConsoleLog, DoesNotMakeADescriptorNonBlockingThatOthersShare) {
  SmallPipe pipe;
  const int before = ::fcntl(pipe.writing.number(), F_GETFL);
  {
    ConsoleLog log(pipe.writing.number());
    log.line("a line");
    log.flush();
    EXPECT_EQ(::fcntl(pipe.writing.number(), F_GETFL), before);
  }
}

TEST(LogWriter, WhatGathersWhileTheOutputIsBusyGoesTogetherUpToWhatAPipeTakesInOnePiece) {
  std::counting_semaphore<> busy(0);
  std::binary_semaphore entered(0);
  Writes pieces;
  {
    LogWriter writer({.label = "test", .prefix = {}}, [&](std::string_view text) {
      if (pieces.empty()) entered.release();
      pieces.emplace_back(text);
      busy.acquire();
      return LogWriter::Outcome::Taken;
    });
    writer.append("first\n");
    entered.acquire();
    for (int number = 0; number < 100; ++number) writer.append(std::string(99, 'x') + "\n");
    busy.release(100);
  }
  ASSERT_EQ(pieces.size(), 4U);
  EXPECT_EQ(pieces[0], "first\n");
  EXPECT_EQ(pieces[1].size(), 4000U);
  EXPECT_EQ(pieces[2].size(), 4000U);
  EXPECT_EQ(pieces[3].size(), 2000U);
}

TEST(SystemLog, ALoggerThatStandsStillStopsNeitherWhoLogsNorTheEcho) {
  constexpr int lines = 100'000;
  // What the system's logger is: a socket, here one that nobody reads.
  int ends[2];
  ASSERT_EQ(::socketpair(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0, ends), 0);
  FileDescriptor sending(ends[0]);
  const FileDescriptor receiving(ends[1]);
  SmallPipe standardError;
  std::string echoed;
  std::thread reader([&] { echoed = standardError.readAll(); });
  const FileDescriptor before(::dup(STDERR_FILENO));
  ASSERT_GE(::dup2(standardError.writing.number(), STDERR_FILENO), 0);
  int received = 0;
  int missing = 0;
  std::thread logger;
  {
    SystemLog log([&](std::string_view text) { ::send(sending.number(), text.data(), text.size(), 0); },
                  SystemLog::Echo::StandardError);
    const auto begin = std::chrono::steady_clock::now();
    for (int number = 0; number < lines; ++number) log.line(numberedLine(number));
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20));
    logger = std::thread([&] {
      char message[256];
      for (ssize_t size; (size = ::recv(receiving.number(), message, sizeof message, 0)) > 0;) {
        const std::string line(message, static_cast<std::size_t>(size));
        if (line.starts_with("probeview: warning: ")) {
          missing += std::stoi(line.substr(20));
        } else {
          EXPECT_EQ(line, numberedLine(received + missing));
          ++received;
        }
        if (received + missing == lines) break;
      }
    });
    logger.join();
  }
  ::dup2(before.number(), STDERR_FILENO);
  standardError.writing.close();
  reader.join();
  EXPECT_EQ(received + missing, lines);
  EXPECT_GT(missing, 0);
  EXPECT_LE(received * 99, static_cast<int>(SystemLog::mostBytes) + 1024 * 1024);
  int echoMissing = 0;
  EXPECT_EQ(linesAccountedFor(echoed, echoMissing), lines);
}

TEST(FatalStop, EndsWithinMomentsAlsoWhenNobodyReadsTheLogsNorStandardError) {
  const SmallPipe pipe;
  ASSERT_EQ(::write(pipe.writing.number(), std::string(4096, 'x').data(), 4096), 4096);
  const auto begin = std::chrono::steady_clock::now();
  const pid_t child = ::fork();
  if (child == 0) {
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    ::dup2(pipe.writing.number(), STDERR_FILENO);
    auto* log = new ConsoleLog(pipe.writing.number());
    log->line("nobody reads this");
    fatalError("a broken contract");
  }
  int status = 0;
  ASSERT_EQ(::waitpid(child, &status, 0), child);
  EXPECT_TRUE(WIFSIGNALED(status));
  // One second, and what a busy machine takes.
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20));
}

}  // namespace
}  // namespace probeview
