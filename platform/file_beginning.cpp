// SPDX-License-Identifier: Apache-2.0
#include "platform/file_beginning.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <utility>

#include "platform/file_descriptor.h"

namespace probeview {

namespace {

FileBeginning systemError() { return {std::nullopt, std::strerror(errno)}; }

bool isPipe(int file) {
  struct stat status;
  return ::fstat(file, &status) == 0 && S_ISFIFO(status.st_mode);
}

// Whether something comes, or the end, within the time.
bool hasNews(int file, std::chrono::milliseconds atMost) {
  pollfd one{file, POLLIN, 0};
  return ::poll(&one, 1, static_cast<int>(atMost.count())) > 0;
}

}  // namespace

FileBeginning readBeginning(const std::string& path, std::size_t most, PipePatience patience) {
  // Without blocking: the opening of a pipe would wait for its other end.
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
  if (!file) return systemError();
  // An empty reading of a pipe that nobody has opened for writing so far is not its end.
  bool mayBeginLater = isPipe(file.number());
  bool hasWaited = false;
  std::vector<std::uint8_t> bytes;
  while (bytes.size() < most) {
    std::uint8_t block[4096];
    const ssize_t size = ::read(file.number(), block, std::min(sizeof block, most - bytes.size()));
    if (size > 0) {
      bytes.insert(bytes.end(), block, block + size);
      mayBeginLater = false;
    } else if (size == 0 && mayBeginLater) {
      if (hasWaited) return {std::nullopt, "it is a pipe, and nobody writes to it"};
      hasWaited = true;
      if (hasNews(file.number(), patience.writer)) mayBeginLater = false;
    } else if (size == 0) {
      break;
    } else if (errno == EAGAIN) {
      mayBeginLater = false;
      if (hasNews(file.number(), patience.word)) continue;
      const auto seconds = std::chrono::duration_cast<std::chrono::seconds>(patience.word).count();
      return {std::nullopt, "nothing more came from it within " + std::to_string(seconds) + " s"};
    } else if (errno != EINTR) {
      return systemError();
    }
  }
  return {std::move(bytes), {}};
}

}  // namespace probeview
