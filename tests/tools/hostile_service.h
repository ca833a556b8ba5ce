// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "platform/loop_thread.h"
#include "radix/dictionary_bytes.h"
#include "radix/frames.h"
#include "service/socket_listener.h"
#include "tests/service/harness/scripted_source.h"
#include "tests/service/harness/temporary_folder.h"
#include "values/dictionary.h"

namespace probeview {

// Something at a socket that greets like a service and then answers whatever a test says.
class HostileService {
 public:
  struct Part {
    radix::Hello hello{"hostile"};
    std::int32_t status = 0;  // of each command
    std::string message{};
    Dictionary content{};
    std::vector<radix::Event> events{};  // sent when a client begins to listen
  };

  explicit HostileService(Part part) : part_(std::move(part)) {
    thread_.runAndWait([this] {
      auto socket = ListeningSocket::make(path());
      if (!socket.socket) throw std::runtime_error(socket.error);
      listener_ =
          std::make_unique<SocketListener>(thread_.loop(), log_, std::move(socket.socket), peerCredentials,
                                           [this](std::unique_ptr<radix::Link> link, Peer) {
                                             peers_.push_back(std::make_unique<Conversation>(part_, std::move(link)));
                                           });
      if (!listener_->start()) throw std::runtime_error("the socket cannot be watched");
    });
  }
  ~HostileService() {
    thread_.runAndWait([this] {
      listener_.reset();
      peers_.clear();
    });
  }

  std::string path() const { return folder_.path() + "/radixd.sock"; }

 private:
  class Conversation final : radix::LinkListener, radix::FrameHandler {
   public:
    Conversation(const Part& part, std::unique_ptr<radix::Link> link) : part_(part), link_(std::move(link)) {
      link_->start(*this);
    }

   private:
    template <typename Sentence>
    void say(const Sentence& sentence) {
      if (link_) link_->sendOne(radix::encode(sentence));
    }
    void onFrame(std::span<const std::uint8_t> frame) override { radix::decodeFrame(frame, *this); }
    void onOverlongFrame(std::size_t) override {}
    void onBatchEnd() override {}
    void onWritable() override {}
    void onClosed() override {}
    void onHello(const radix::Hello&) override { say(part_.hello); }
    void onCommand(const radix::Command& command) override {
      say(radix::Reply(command.sequence(), part_.status, part_.message, radix::encodeDictionary(part_.content)));
    }
    void onDelivery(const radix::Delivery& delivery) override {
      if (!delivery.on()) return;
      for (const radix::Event& event : part_.events) say(event);
    }

    const Part& part_;
    std::unique_ptr<radix::Link> link_;
  };

  const Part part_;
  TemporaryFolder folder_;
  KeptLines lines_;
  ServiceLog log_{lines_, LogLevel::Error};
  std::vector<std::unique_ptr<Conversation>> peers_;
  std::unique_ptr<SocketListener> listener_;
  LoopThread thread_{"test.hostile"};
};

}  // namespace probeview
