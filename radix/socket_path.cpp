// SPDX-License-Identifier: Apache-2.0
#include "radix/socket_path.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

namespace radix {

namespace {

std::optional<std::string> variable(const char* name) {
  const char* value = std::getenv(name);
  if (value == nullptr || *value == '\0') return std::nullopt;
  return value;
}

// A folder, no link to one, that belongs to the user.
bool isFolderOf(const std::string& path, uid_t user, struct stat& status) {
  return ::lstat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode) && status.st_uid == user;
}

}  // namespace

SocketSurroundings SocketSurroundings::ofThisProcess() {
  SocketSurroundings surroundings;
  surroundings.namedSocket = variable("RADIXD_SOCKET");
  surroundings.runtimeDirectory = variable("XDG_RUNTIME_DIR");
  if (auto temporary = variable("TMPDIR")) surroundings.temporaryDirectory = *std::move(temporary);
  surroundings.user = ::geteuid();
  return surroundings;
}

SocketPath userSocketPath(const SocketSurroundings& surroundings, bool create) {
  if (surroundings.runtimeDirectory) return {*surroundings.runtimeDirectory + "/radixd.sock", {}};
  struct stat status;
  const std::string user = std::to_string(surroundings.user);
  const std::string runUser = surroundings.runUserRoot + "/" + user;
  if (isFolderOf(runUser, surroundings.user, status)) return {runUser + "/radixd.sock", {}};

  const std::string folder = surroundings.temporaryDirectory + "/radixd-" + user;
  if (create && ::mkdir(folder.c_str(), 0700) != 0 && errno != EEXIST) {
    return {{},
            "cannot make the folder " + folder + " for the socket: " + std::strerror(errno) +
                "; set XDG_RUNTIME_DIR or name a socket"};
  }
  if (!isFolderOf(folder, surroundings.user, status)) {
    return {{}, "there is no folder for the user's socket: " + folder + " is missing or not ours alone; name a socket"};
  }
  if ((status.st_mode & 07777) != 0700) {
    return {{}, "the folder " + folder + " is open to others (its mode must be 0700): not used for the socket"};
  }
  return {folder + "/radixd.sock", {}};
}

std::string socketPathTrouble(const std::string& path) {
  return path.empty() ? "the socket's path is empty; name one, or leave the option away for the usual socket" : "";
}

std::vector<std::string> clientSocketPaths(const SocketSurroundings& surroundings) {
  if (surroundings.namedSocket) return {*surroundings.namedSocket};
  std::vector<std::string> paths;
  if (SocketPath own = userSocketPath(surroundings, false); !own.path.empty()) paths.push_back(std::move(own.path));
  paths.push_back(systemSocketPath);
  return paths;
}

}  // namespace radix
