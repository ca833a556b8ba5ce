// SPDX-License-Identifier: Apache-2.0
#include "radix/socket_link.h"

#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <utility>

namespace radix {

namespace {

using probeview::EventLoop;
using probeview::FileDescriptor;
using probeview::Readiness;

// How many frames are read before others get their turn.
constexpr int framesPerTurn = 256;
// How many frames leave with one system call.
constexpr std::size_t framesPerCall = 64;

class SocketLink final : public Link {
 public:
  SocketLink(EventLoop& loop, FileDescriptor socket) : loop_(loop), socket_(std::move(socket)) {}
  ~SocketLink() override { *alive_ = false; }

  void start(LinkListener& listener) override {
    listener_ = &listener;
    watch_ = loop_.watch(socket_.number(), interest(), [this](Readiness ready) { onReady(ready); });
    // Without a watch nothing would ever be heard of this peer; it is told like one that has gone.
    if (!watch_) {
      watchFailure_ = loop_.after(std::chrono::nanoseconds::zero(), [this] { close(); });
    }
  }

  std::size_t send(std::span<const OutgoingFrame> frames) override {
    std::size_t sent = 0;
    while (sent < frames.size()) {
      // Frame and trailer of each; they meet in the system's memory.
      std::array<std::array<iovec, 2>, framesPerCall> contents;
      std::array<mmsghdr, framesPerCall> headers{};
      const std::size_t count = std::min(framesPerCall, frames.size() - sent);
      for (std::size_t index = 0; index < count; ++index) {
        const std::vector<std::uint8_t>& bytes = *frames[sent + index].frame;
        const Trailer& trailer = frames[sent + index].trailer;
        // The system only reads what it sends.
        contents[index][0] = {const_cast<std::uint8_t*>(bytes.data()), bytes.size()};
        contents[index][1] = {const_cast<std::uint8_t*>(trailer.bytes.data()), trailer.size};
        headers[index].msg_hdr.msg_iov = contents[index].data();
        headers[index].msg_hdr.msg_iovlen = trailer.size == 0 ? 1 : 2;
      }
      const int taken =
          ::sendmmsg(socket_.number(), headers.data(), static_cast<unsigned>(count), MSG_NOSIGNAL | MSG_DONTWAIT);
      if (taken > 0) {
        sent += static_cast<std::size_t>(taken);
        continue;
      }
      if (errno == EINTR) continue;
      if (errno != EAGAIN && errno != EWOULDBLOCK && errno != ENOBUFS) {
        // The peer has gone, or the connection is of no use: either way the watch tells the listener.
        ::shutdown(socket_.number(), SHUT_RDWR);
        return sent;
      }
      waiting_ = true;
      if (watch_) watch_->setInterest(interest());
      return sent;
    }
    return sent;
  }

  void setReading(bool reading) override {
    reading_ = reading;
    if (watch_) watch_->setInterest(interest());
  }

 private:
  Readiness interest() const { return {.readable = reading_, .writable = waiting_}; }

  void onReady(Readiness ready) {
    // A handler may destroy this link.
    const std::shared_ptr<const bool> alive = alive_;
    if (ready.writable && waiting_) {
      waiting_ = false;
      watch_->setInterest(interest());
      listener_->onWritable();
    }
    // While reading is switched off, only a peer that has gone makes a socket readable.
    if (*alive && ready.readable) read(*alive);
  }

  void read(const bool& alive) {
    if (buffer_ == nullptr) buffer_.reset(new std::uint8_t[longestFrame]);
    bool any = false;
    bool ended = false;
    for (int count = 0; count < framesPerTurn; ++count) {
      // Asked for the true length, so that a frame that is too long is known as such.
      const ssize_t size = ::recv(socket_.number(), buffer_.get(), longestFrame, MSG_DONTWAIT | MSG_TRUNC);
      if (size < 0) {
        if (errno == EINTR) continue;
        ended = errno != EAGAIN && errno != EWOULDBLOCK;
        break;
      }
      // This kind of socket reports its end as an empty record; whether it is one, only the socket's state says.
      if (size == 0 && hasPeerGone()) {
        ended = true;
        break;
      }
      any = true;
      if (static_cast<std::size_t>(size) > longestFrame) {
        listener_->onOverlongFrame(static_cast<std::size_t>(size));
      } else {
        listener_->onFrame({buffer_.get(), static_cast<std::size_t>(size)});
      }
      if (!alive) return;
      if (!reading_) break;
    }
    if (any) {
      listener_->onBatchEnd();
      if (!alive) return;
    }
    if (ended) close();
  }

  bool hasPeerGone() const {
    pollfd socket{socket_.number(), POLLRDHUP, 0};
    return ::poll(&socket, 1, 0) > 0;
  }

  void close() {
    watch_.reset();
    listener_->onClosed();
  }

  EventLoop& loop_;
  FileDescriptor socket_;
  LinkListener* listener_ = nullptr;
  std::unique_ptr<probeview::DescriptorWatch> watch_;
  probeview::ScheduledTaskHandle watchFailure_;
  // Uninitialised on purpose: only the pages that frames really touch become resident.
  std::unique_ptr<std::uint8_t[]> buffer_;
  bool reading_ = true;
  bool waiting_ = false;
  std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace

std::unique_ptr<Link> makeSocketLink(EventLoop& loop, FileDescriptor socket) {
  return std::make_unique<SocketLink>(loop, std::move(socket));
}

}  // namespace radix
