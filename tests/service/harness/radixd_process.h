// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <functional>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "platform/file_descriptor.h"

namespace probeview {

// A real radixd (the program at RADIXD_PROGRAM), whose log is read as it comes.
class RadixdProcess {
 public:
  // What is done in the child before the program runs, such as lowering a limit or handing over a socket.
  using Preparation = std::function<void()>;

  explicit RadixdProcess(std::vector<std::string> arguments, const Preparation& prepare = {}) {
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
    log_ = FileDescriptor(ends[0]);
    const FileDescriptor childEnd(ends[1]);
    arguments.insert(arguments.begin(), RADIXD_PROGRAM);
    std::vector<char*> words;
    for (std::string& argument : arguments) words.push_back(argument.data());
    words.push_back(nullptr);
    process_ = ::fork();
    if (process_ < 0) throw std::runtime_error("cannot fork");
    if (process_ == 0) {
      // Also when the test itself is killed.
      ::prctl(PR_SET_PDEATHSIG, SIGKILL);
      ::dup2(childEnd.number(), STDERR_FILENO);
      if (prepare) prepare();
      ::execv(words[0], words.data());
      ::_exit(127);
    }
  }
  ~RadixdProcess() {
    if (process_ > 0) {
      ::kill(process_, SIGKILL);
      ::waitpid(process_, nullptr, 0);
    }
  }
  RadixdProcess(const RadixdProcess&) = delete;
  RadixdProcess& operator=(const RadixdProcess&) = delete;

  pid_t process() const { return process_; }
  void send(int signal) const { ::kill(process_, signal); }
  const std::string& log() const { return text_; }

  // Reads the log until it holds the text; false when the program ends or the deadline comes first.
  bool waitForLog(const std::string& text, std::chrono::milliseconds atMost = std::chrono::seconds(20)) {
    const auto deadline = std::chrono::steady_clock::now() + atMost;
    while (text_.find(text) == std::string::npos) {
      const auto left =
          std::chrono::duration_cast<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now());
      if (left.count() <= 0 || !readLog(static_cast<int>(left.count()))) return false;
    }
    return true;
  }

  // Reads the log to its end and waits for the program; its exit status, or minus the signal that ended it.
  int waitForEnd() {
    constexpr int longest = 20000;
    while (readLog(longest)) {
    }
    int status = 0;
    ::waitpid(process_, &status, 0);
    process_ = -1;
    return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
  }

 private:
  bool readLog(int atMost) {
    pollfd one{log_.number(), POLLIN, 0};
    if (::poll(&one, 1, atMost) <= 0) return false;
    char block[4096];
    const ssize_t size = ::read(log_.number(), block, sizeof block);
    if (size <= 0) return false;
    text_.append(block, static_cast<std::size_t>(size));
    return true;
  }

  pid_t process_ = -1;
  FileDescriptor log_;
  std::string text_;
};

}  // namespace probeview
