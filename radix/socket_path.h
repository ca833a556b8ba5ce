// SPDX-License-Identifier: Apache-2.0
//
// Where the service's socket is. The rules stand here once, for the service that makes it and the clients that look.
#pragma once

#include <sys/types.h>

#include <optional>
#include <string>
#include <vector>

namespace radix {

// The socket of a system's service.
inline constexpr char systemSocketPath[] = "/run/radixd/radix.sock";

// What the rules depend on.
struct SocketSurroundings {
  std::optional<std::string> namedSocket;       // RADIXD_SOCKET
  std::optional<std::string> runtimeDirectory;  // XDG_RUNTIME_DIR
  std::string runUserRoot = "/run/user";
  std::string temporaryDirectory = "/tmp";  // TMPDIR
  uid_t user = 0;

  static SocketSurroundings ofThisProcess();
};

// A path, or why there is none.
struct SocketPath {
  std::string path;
  std::string error;
};

// The socket of a user's own service: in the runtime directory; without that variable in the user's folder under
// /run/user; else in a folder of the temporary directory that is ours alone (mode 0700); else nowhere. With `create`
// that last folder is made where it is missing.
SocketPath userSocketPath(const SocketSurroundings& surroundings, bool create);

// Why what a command line names cannot be a socket's path; empty if it may be one. An empty path, as a script gives it
// whose variable is not set, names nothing and must not stand for the usual socket.
std::string socketPathTrouble(const std::string& path);

// Where a client looks, in this order: the socket that RADIXD_SOCKET names and no other; else the user's, the system's.
std::vector<std::string> clientSocketPaths(const SocketSurroundings& surroundings);

}  // namespace radix
