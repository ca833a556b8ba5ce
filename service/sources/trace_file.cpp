// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <system_error>

#include "platform/file_descriptor.h"

namespace probeview {

namespace {

std::string systemError(int number) { return std::generic_category().message(number); }

}  // namespace

TraceTextResult readTraceFile(const std::string& path) {
  // Without blocking, in case somebody names a pipe that nobody writes to.
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
  if (!file) return {std::nullopt, systemError(errno)};
  struct stat status {};
  std::string error;
  std::string text;
  if (::fstat(file.number(), &status) != 0) {
    error = systemError(errno);
  } else if (!S_ISREG(status.st_mode)) {
    error = "it is no regular file";
  } else if (static_cast<std::uint64_t>(status.st_size) > traceFileSizeLimit) {
    error = "it has " + std::to_string(status.st_size) + " bytes, more than the " + std::to_string(traceFileSizeLimit) +
            " that a trace may have; split it";
  } else {
    text.resize(static_cast<std::size_t>(status.st_size));
    std::size_t length = 0;
    while (length < text.size()) {
      const ssize_t count = ::read(file.number(), text.data() + length, text.size() - length);
      if (count < 0 && errno == EINTR) continue;
      if (count < 0) error = systemError(errno);
      if (count <= 0) break;
      length += static_cast<std::size_t>(count);
    }
    text.resize(length);
  }
  if (!error.empty()) return {std::nullopt, std::move(error)};
  return {std::move(text), {}};
}

}  // namespace probeview
