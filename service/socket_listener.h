// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/stat.h>
#include <sys/types.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/event_loop.h"
#include "platform/file_descriptor.h"
#include "radix/link.h"
#include "service/log.h"
#include "service/session.h"

namespace probeview {

// Who is at the other end of a socket, as the system vouches for it.
struct Credentials {
  pid_t process = 0;
  uid_t user = 0;
  gid_t group = 0;
  std::vector<gid_t> groups;  // the further groups
};

// Who may connect: the service's own user, root and, where the socket is a group's, that group.
struct Access {
  uid_t owner = 0;
  std::optional<gid_t> group;

  // Why not; absent if it may.
  std::optional<std::string> refusal(const Credentials& credentials) const;
  // Whether it is the service's own user or root, for whom some room is kept.
  bool isOwn(const Credentials& credentials) const { return credentials.user == 0 || credentials.user == owner; }
};

// Asks the system who is at the other end. Tests put their own answer in its place. Absent when the system gives none.
using CredentialReader = std::function<std::optional<Credentials>(int socket)>;
std::optional<Credentials> peerCredentials(int socket);

// A listening socket of ours, made at a path or handed over by a system manager.
class ListeningSocket {
 public:
  struct Result {
    std::unique_ptr<ListeningSocket> socket;
    std::string error;  // what, where and what to do
  };

  // Whose the socket is: the user's alone (mode 0600), or its group's, too (0660), as a system's service is. That group
  // is the one that the system gave the socket's file, which a folder may decide.
  enum class Sharing { User, Group };

  // Makes the socket at the path. What a service that is no more has left there is replaced; a service that lives, and
  // anything that is no socket, is not.
  static Result make(const std::string& path, Sharing sharing = Sharing::User);
  // Takes over an open descriptor.
  static Result adopt(int descriptor);

  // Removes the socket and the lock that it made from their paths; leaves alone what it was handed, and what somebody
  // else has put in their place.
  ~ListeningSocket();

  int descriptor() const { return socket_.number(); }
  const std::string& path() const { return path_; }
  const Access& access() const { return access_; }

 private:
  ListeningSocket() = default;

  FileDescriptor socket_;
  FileDescriptor lock_;
  std::string path_;
  std::string lockPath_;
  struct stat made_ {};  // the socket's file
  Access access_;
};

// The descriptors that a system manager has handed to this process (LISTEN_FDS), kept from its children.
std::vector<int> handedOverSockets();

// Accepts connections and hands them on, with who is at their other end.
class SocketListener {
 public:
  using Taker = std::function<void(std::unique_ptr<radix::Link> link, Peer peer)>;

  SocketListener(EventLoop& loop, ServiceLog& log, std::unique_ptr<ListeningSocket> socket,
                 CredentialReader credentials, Taker taker);

  // False when the loop cannot watch the socket, with the reason in errno.
  bool start();

 private:
  void acceptAll();

  EventLoop& loop_;
  ServiceLog& log_;
  std::unique_ptr<ListeningSocket> socket_;
  CredentialReader credentials_;
  Taker taker_;
  std::unique_ptr<DescriptorWatch> watch_;
  ScheduledTaskHandle retry_;
  std::uint64_t shortages_ = 0;
};

}  // namespace probeview
