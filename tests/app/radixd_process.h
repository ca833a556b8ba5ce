// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <string>
#include <vector>

#include "platform/file_descriptor.h"
#include "tests/service/harness/temporary_folder.h"

namespace probeview {

// The real service on a private socket, which the client library of this process is pointed to.
class RadixdProcess {
 public:
  explicit RadixdProcess(std::string source) : source_(std::move(source)) {
    ::setenv("RADIXD_SOCKET", socket().c_str(), 1);
  }
  ~RadixdProcess() { kill(); }

  std::string socket() const { return folder_.path() + "/radixd.sock"; }

  // Returns when it listens; whether it does.
  bool start() {
    int ends[2] = {};
    if (::pipe2(ends, O_CLOEXEC) != 0) return false;
    errors_ = FileDescriptor(ends[0]);
    const FileDescriptor writing(ends[1]);
    std::vector<std::string> arguments{RADIXD, "--socket", socket(), "--source", source_};
    std::vector<char*> pointers;
    for (auto& argument : arguments) pointers.push_back(argument.data());
    pointers.push_back(nullptr);
    process_ = ::fork();
    if (process_ == 0) {
      // Also when the test itself is killed.
      ::prctl(PR_SET_PDEATHSIG, SIGKILL);
      ::dup2(writing.number(), STDERR_FILENO);
      ::execv(RADIXD, pointers.data());
      ::_exit(127);
    }
    if (process_ < 0) {
      process_ = 0;
      return false;
    }
    std::string said;
    while (said.find("listening at") == std::string::npos) {
      pollfd readable{errors_.number(), POLLIN, 0};
      char buffer[1024];
      if (::poll(&readable, 1, 20'000) <= 0) return false;
      const auto count = ::read(errors_.number(), buffer, sizeof buffer);
      if (count <= 0) return false;
      said.append(buffer, static_cast<std::size_t>(count));
    }
    return true;
  }
  // As if it had crashed.
  void kill() {
    if (process_ == 0) return;
    ::kill(process_, SIGKILL);
    ::waitpid(process_, nullptr, 0);
    process_ = 0;
  }

 private:
  TemporaryFolder folder_;
  std::string source_;
  pid_t process_ = 0;
  // Kept open and unread: what the service says further fits into the pipe.
  FileDescriptor errors_;
};

}  // namespace probeview
