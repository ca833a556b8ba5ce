// SPDX-License-Identifier: Apache-2.0
#include "radix/socket_connector.h"

#include <sys/socket.h>
#include <sys/un.h>

#include <cerrno>
#include <cstring>
#include <utility>

#include "platform/file_descriptor.h"
#include "radix/socket_link.h"

namespace radix {

namespace {

class SocketConnector final : public Connector {
 public:
  SocketConnector(probeview::EventLoop& loop, SocketSurroundings surroundings)
      : loop_(loop), surroundings_(std::move(surroundings)) {}

  ConnectResult connect() override {
    std::string absent;
    for (const std::string& path : clientSocketPaths(surroundings_)) {
      sockaddr_un address{};
      address.sun_family = AF_UNIX;
      if (path.size() >= sizeof address.sun_path) {
        return {nullptr, false,
                "the socket's path is too long (" + std::to_string(path.size()) + " bytes, at most " +
                    std::to_string(sizeof address.sun_path - 1) + "): " + path};
      }
      std::memcpy(address.sun_path, path.data(), path.size());
      probeview::FileDescriptor socket(::socket(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
      if (!socket) return {nullptr, false, std::string("cannot make a socket: ") + std::strerror(errno)};
      if (::connect(socket.number(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0) {
        return {makeSocketLink(loop_, std::move(socket)), false, {}};
      }
      switch (errno) {
        case EAGAIN:
          return {nullptr, true, "the baseband service at " + path + " takes no more connections at this moment"};
        case ENOENT:
        case ENOTDIR:
        case ECONNREFUSED:
          absent += (absent.empty() ? "" : " or ") + path;
          break;
        case EACCES:
        case EPERM:
          return {nullptr, false, "you may not connect to the baseband service at " + path};
        case EPROTOTYPE:
          return {nullptr, false, "what listens at " + path + " is no baseband service"};
        default:
          return {nullptr, false, "cannot connect to the baseband service at " + path + ": " + std::strerror(errno)};
      }
    }
    return {nullptr, false, "no baseband service at " + absent + "; start radixd or set RADIXD_SOCKET"};
  }

 private:
  probeview::EventLoop& loop_;
  SocketSurroundings surroundings_;
};

}  // namespace

std::unique_ptr<Connector> makeSocketConnector(probeview::EventLoop& loop, SocketSurroundings surroundings) {
  return std::make_unique<SocketConnector>(loop, std::move(surroundings));
}

}  // namespace radix
