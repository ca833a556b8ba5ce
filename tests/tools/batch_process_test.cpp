// SPDX-License-Identifier: Apache-2.0
//
// The real program at the other end of two pipes, as another program would use it.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <utility>

#include "platform/file_descriptor.h"

namespace probeview {
namespace {

class Conversation {
 public:
  explicit Conversation(const char* subcommand) {
    int toProgram[2];
    int fromProgram[2];
    if (pipe2(toProgram, O_CLOEXEC) != 0 || pipe2(fromProgram, O_CLOEXEC) != 0) std::abort();
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, toProgram[0], STDIN_FILENO);
    posix_spawn_file_actions_adddup2(&actions, fromProgram[1], STDOUT_FILENO);
    std::array<char*, 4> arguments = {const_cast<char*>(PROBECTL), const_cast<char*>(subcommand),
                                      const_cast<char*>("--batch"), nullptr};
    EXPECT_EQ(posix_spawn(&process_, PROBECTL, &actions, nullptr, arguments.data(), environ), 0);
    posix_spawn_file_actions_destroy(&actions);
    input_ = FileDescriptor(toProgram[1]);
    output_ = FileDescriptor(fromProgram[0]);
    ::close(toProgram[0]);
    ::close(fromProgram[1]);
  }
  ~Conversation() {
    if (process_ > 0) end();
  }

  void say(const std::string& line) {
    ASSERT_EQ(write(input_.number(), line.data(), line.size()), static_cast<ssize_t>(line.size()));
  }
  // The next line; empty if none comes within ten seconds.
  std::string hear() {
    while (true) {
      if (const std::size_t end = heard_.find('\n'); end != std::string::npos) {
        const std::string line = heard_.substr(0, end);
        heard_.erase(0, end + 1);
        return line;
      }
      pollfd readable{output_.number(), POLLIN, 0};
      if (poll(&readable, 1, 10'000) <= 0) return "";
      std::array<char, 4096> buffer;
      const ssize_t count = read(output_.number(), buffer.data(), buffer.size());
      if (count <= 0) return "";
      heard_.append(buffer.data(), static_cast<std::size_t>(count));
    }
  }
  // Ends the input; the exit status, or minus the signal.
  int end() {
    input_.close();
    int status = 0;
    waitpid(process_, &status, 0);
    process_ = 0;
    return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
  }

 private:
  pid_t process_ = 0;
  FileDescriptor input_;
  FileDescriptor output_;
  std::string heard_;
};

TEST(BatchProcess, EachAnswerComesBeforeTheNextQuestion) {
  Conversation decode("decode");
  for (int round = 0; round < 3; ++round) {
    decode.say("K_LTE_RRC_STATE 1003\n");
    EXPECT_EQ(decode.hear(), R"({"class":"KCellularLteRrcState","ok":true,"dict":{"state":"KLTE_RRC_STATE_CONNECTED"},)"
                             R"("reencoded":"1003","log":[]})");
  }
  EXPECT_EQ(decode.end(), 0);
}

TEST(BatchProcess, AFatalStopIsAnsweredAndEndsTheProgramWithStatusThree) {
  Conversation store("store");
  store.say("trigger\n");
  EXPECT_EQ(store.hear(), R"({"log":["I dont care for events"]})");
  store.say("event none -\ntrigger\n");
  EXPECT_EQ(store.hear(), R"({"fatal":"a metric event carries no identifier","log":[]})");
  EXPECT_EQ(store.hear(), "");
  EXPECT_EQ(store.end(), 3);
}

// What a shell prints of it, and its exit status.
std::pair<std::string, int> shell(const std::string& command) {
  FILE* const program = ::popen(command.c_str(), "re");
  std::string text;
  for (int character = 0; (character = std::fgetc(program)) != EOF;) text += static_cast<char>(character);
  return {text, WEXITSTATUS(::pclose(program))};
}

TEST(FullDisk, EndsWithStatusOneAndATextWhateverIsAnswered) {
  const std::string told = "probectl: not all of the answer could be written; is the disk full?\n";
  for (const char* arguments : {"decode K_LTE_RRC_STATE 1003", "--help", "--version"}) {
    EXPECT_EQ(shell(std::string(PROBECTL) + " " + arguments + " 2>&1 >/dev/full"), std::pair(told, 1)) << arguments;
  }
  for (const char* subcommand : {"decode", "store"}) {
    EXPECT_EQ(shell(std::string("echo nonsense | ") + PROBECTL + " " + subcommand + " --batch 2>&1 >/dev/full"),
              std::pair(told, 1));
  }
}

TEST(FullDisk, AReaderThatHasSeenEnoughIsNoFault) {
  // A pipe whose reader has gone before anything is written; shells name descriptors by one digit.
  int ends[2];
  ASSERT_EQ(::pipe2(ends, O_CLOEXEC), 0);
  ::close(ends[0]);
  ASSERT_EQ(::dup2(ends[1], 9), 9);
  ::close(ends[1]);
  // With the signal ignored, writing fails instead of ending the program.
  const auto [text, status] =
      shell(std::string("trap '' PIPE; ") + PROBECTL + " decode K_LTE_RRC_STATE 1003 2>&1 >&9; echo status $?");
  EXPECT_EQ(text, "status 0\n");
  ::close(9);
}

}  // namespace
}  // namespace probeview
