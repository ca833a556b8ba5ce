// SPDX-License-Identifier: Apache-2.0
#include "service/socket_listener.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "radix/socket_link.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// How long the listener rests when the system has no descriptors left.
constexpr std::chrono::milliseconds descriptorShortage{250};
// How many connections are taken before others get their turn; the rest still waits then.
constexpr int connectionsPerTurn = 64;

std::string systemError() { return std::strerror(errno); }

FileDescriptor makeSocket() {
  return FileDescriptor(::socket(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
}

bool isSameFile(const struct stat& left, const struct stat& right) {
  return left.st_dev == right.st_dev && left.st_ino == right.st_ino;
}

void removeIfSame(const std::string& path, const struct stat& made) {
  struct stat present;
  if (::lstat(path.c_str(), &present) == 0 && isSameFile(made, present)) ::unlink(path.c_str());
}

// Holds the lock of a socket's path for as long as it is open; without it two services that start at once could each
// take the other for a dead one. Not open, with errno, when it cannot be had (EWOULDBLOCK: somebody has it).
FileDescriptor lockPath(const std::string& path) {
  while (true) {
    FileDescriptor lock(::open(path.c_str(), O_RDWR | O_CREAT | O_NOFOLLOW | O_CLOEXEC, 0600));
    if (!lock || ::flock(lock.number(), LOCK_EX | LOCK_NB) != 0) return FileDescriptor();
    // The one before may have removed the file between the two calls.
    struct stat opened;
    struct stat present;
    if (::fstat(lock.number(), &opened) == 0 && ::stat(path.c_str(), &present) == 0 && isSameFile(opened, present)) {
      return lock;
    }
  }
}

// Makes room at the path; empty, or why that cannot be.
std::string removeStale(const std::string& path, const sockaddr_un& address) {
  struct stat status;
  if (::lstat(path.c_str(), &status) != 0)
    return errno == ENOENT ? "" : "cannot look at " + path + ": " + systemError();
  if (!S_ISSOCK(status.st_mode)) return path + " is no socket and is not replaced; remove it or name another --socket";
  const FileDescriptor probe = makeSocket();
  if (!probe) return "cannot make a socket: " + systemError();
  if (::connect(probe.number(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0 || errno == EAGAIN) {
    return "a service already listens at " + path + "; stop it or name another --socket";
  }
  if (errno != ECONNREFUSED && errno != ENOENT) {
    return "something listens at " + path + " that is not ours to replace (" + systemError() +
           "); name another --socket";
  }
  if (::unlink(path.c_str()) != 0 && errno != ENOENT) return "cannot replace the stale " + path + ": " + systemError();
  return "";
}

}  // namespace

std::optional<std::string> Access::refusal(const Credentials& credentials) const {
  if (isOwn(credentials)) return std::nullopt;
  std::string who = "only user " + std::to_string(owner) + " and root";
  if (group) {
    const auto& further = credentials.groups;
    if (credentials.group == *group || std::find(further.begin(), further.end(), *group) != further.end()) {
      return std::nullopt;
    }
    who = "only user " + std::to_string(owner) + ", root and group " + std::to_string(*group);
  }
  return who + " may connect, not user " + std::to_string(credentials.user);
}

std::optional<Credentials> peerCredentials(int socket) {
  ucred credentials{};
  socklen_t size = sizeof credentials;
  if (::getsockopt(socket, SOL_SOCKET, SO_PEERCRED, &credentials, &size) != 0) return std::nullopt;
  Credentials result{credentials.pid, credentials.uid, credentials.gid, {}};
  socklen_t groupsSize = 0;
  // Asked for nothing, the system says how much there is.
  if (::getsockopt(socket, SOL_SOCKET, SO_PEERGROUPS, nullptr, &groupsSize) != 0 && errno == ERANGE) {
    result.groups.resize(groupsSize / sizeof(gid_t));
    if (::getsockopt(socket, SOL_SOCKET, SO_PEERGROUPS, result.groups.data(), &groupsSize) != 0) groupsSize = 0;
    result.groups.resize(groupsSize / sizeof(gid_t));
  }
  return result;
}

ListeningSocket::Result ListeningSocket::make(const std::string& path, Sharing sharing) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (path.empty()) return {nullptr, "the socket's path is empty"};
  if (path.size() >= sizeof address.sun_path) {
    return {nullptr, "the socket's path has " + std::to_string(path.size()) + " bytes, at most " +
                         std::to_string(sizeof address.sun_path - 1) + " are possible: " + path};
  }
  std::memcpy(address.sun_path, path.data(), path.size());

  std::unique_ptr<ListeningSocket> made(new ListeningSocket);
  const std::string lockName = path + ".lock";
  made->lock_ = lockPath(lockName);
  if (!made->lock_) {
    if (errno == EWOULDBLOCK) {
      return {nullptr, "another radixd already has " + path + "; stop it or name another --socket"};
    }
    return {nullptr, "cannot make a socket at " + path + ": " + systemError()};
  }
  made->lockPath_ = lockName;
  if (const std::string error = removeStale(path, address); !error.empty()) return {nullptr, error};

  made->socket_ = makeSocket();
  if (!made->socket_) return {nullptr, "cannot make a socket: " + systemError()};
  // The mode is right from the first moment; this process has no other thread yet that makes files.
  const mode_t before = ::umask(sharing == Sharing::Group ? 0117 : 0177);
  const int bound = ::bind(made->socket_.number(), reinterpret_cast<const sockaddr*>(&address), sizeof address);
  const int trouble = errno;
  ::umask(before);
  if (bound != 0) return {nullptr, "cannot make a socket at " + path + ": " + std::strerror(trouble)};
  if (::lstat(path.c_str(), &made->made_) != 0 || !S_ISSOCK(made->made_.st_mode)) {
    return {nullptr, "the socket at " + path + " was taken away while it was made; name another --socket"};
  }
  made->path_ = path;
  if (::listen(made->socket_.number(), SOMAXCONN) != 0) {
    return {nullptr, "cannot listen at " + path + ": " + systemError()};
  }
  made->access_.owner = ::geteuid();
  if (sharing == Sharing::Group) made->access_.group = made->made_.st_gid;
  return {std::move(made), {}};
}

ListeningSocket::Result ListeningSocket::adopt(int descriptor) {
  std::unique_ptr<ListeningSocket> adopted(new ListeningSocket);
  adopted->socket_ = FileDescriptor(descriptor);
  const std::string what = "the socket handed over as descriptor " + std::to_string(descriptor);
  int type = 0;
  int listens = 0;
  socklen_t size = sizeof type;
  if (::getsockopt(descriptor, SOL_SOCKET, SO_TYPE, &type, &size) != 0) {
    return {nullptr, what + " is none: " + systemError()};
  }
  size = sizeof listens;
  sockaddr_un address{};
  socklen_t addressSize = sizeof address;
  if (::getsockname(descriptor, reinterpret_cast<sockaddr*>(&address), &addressSize) != 0 ||
      address.sun_family != AF_UNIX || type != SOCK_SEQPACKET ||
      ::getsockopt(descriptor, SOL_SOCKET, SO_ACCEPTCONN, &listens, &size) != 0 || listens == 0) {
    return {nullptr, what + " does not listen for local sequential packets (ListenSequentialPacket=)"};
  }
  ::fcntl(descriptor, F_SETFL, ::fcntl(descriptor, F_GETFL) | O_NONBLOCK);
  adopted->access_.owner = ::geteuid();
  // What the manager made the socket's group and mode say who else may come in.
  struct stat status;
  if (addressSize > sizeof(sa_family_t) && address.sun_path[0] != '\0' && ::stat(address.sun_path, &status) == 0 &&
      (status.st_mode & S_IWGRP) != 0) {
    adopted->access_.group = status.st_gid;
  }
  return {std::move(adopted), {}};
}

ListeningSocket::~ListeningSocket() {
  // In this order: whoever gets the lock next finds nothing to be replaced.
  if (!path_.empty()) removeIfSame(path_, made_);
  struct stat lock;
  if (lock_ && !lockPath_.empty() && ::fstat(lock_.number(), &lock) == 0) removeIfSame(lockPath_, lock);
}

std::vector<int> handedOverSockets() {
  constexpr int firstDescriptor = 3;
  std::vector<int> descriptors;
  const char* process = std::getenv("LISTEN_PID");
  const char* count = std::getenv("LISTEN_FDS");
  if (process != nullptr && count != nullptr && parseInteger64(process) == ::getpid()) {
    const std::int64_t number = parseInteger64(count).value_or(0);
    for (std::int64_t index = 0; index < number; ++index) {
      const int descriptor = firstDescriptor + static_cast<int>(index);
      if (::fcntl(descriptor, F_SETFD, FD_CLOEXEC) != 0) break;
      descriptors.push_back(descriptor);
    }
  }
  ::unsetenv("LISTEN_PID");
  ::unsetenv("LISTEN_FDS");
  ::unsetenv("LISTEN_FDNAMES");
  return descriptors;
}

SocketListener::SocketListener(EventLoop& loop, ServiceLog& log, std::unique_ptr<ListeningSocket> socket,
                               CredentialReader credentials, Taker taker)
    : loop_(loop),
      log_(log),
      socket_(std::move(socket)),
      credentials_(std::move(credentials)),
      taker_(std::move(taker)) {}

bool SocketListener::start() {
  watch_ = loop_.watch(socket_->descriptor(), {.readable = true}, [this](Readiness) { acceptAll(); });
  return watch_ != nullptr;
}

void SocketListener::acceptAll() {
  for (int count = 0; count < connectionsPerTurn; ++count) {
    FileDescriptor connection(::accept4(socket_->descriptor(), nullptr, nullptr, SOCK_NONBLOCK | SOCK_CLOEXEC));
    if (!connection) {
      if (errno == EINTR || errno == ECONNABORTED) continue;
      if (errno == EAGAIN || errno == EWOULDBLOCK) return;
      // Those who wait stay in the queue until there are descriptors again.
      const std::string trouble = systemError();
      if (isWorthTelling(++shortages_)) {
        log_.write(LogLevel::Error, "cannot accept a connection: " + trouble + "; trying again soon (" +
                                        std::to_string(shortages_) + " times so far)");
      }
      watch_->setInterest({});
      retry_ = loop_.after(descriptorShortage, [this] { watch_->setInterest({.readable = true}); });
      return;
    }
    Peer peer;
    if (const auto credentials = credentials_(connection.number())) {
      peer = {credentials->process, credentials->user, socket_->access().refusal(*credentials),
              socket_->access().isOwn(*credentials)};
    } else {
      peer.refusal = "the system does not say who connects";
    }
    taker_(radix::makeSocketLink(loop_, std::move(connection)), std::move(peer));
  }
}

}  // namespace probeview
