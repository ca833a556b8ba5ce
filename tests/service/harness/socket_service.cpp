// SPDX-License-Identifier: Apache-2.0
#include <stdexcept>
#include <utility>

#include "platform/loop_thread.h"
#include "platform/manual_loop.h"
#include "radix/socket_connector.h"
#include "radix/socket_manager.h"
#include "service/socket_listener.h"
#include "tests/service/harness/temporary_folder.h"
#include "tests/service/harness/test_service.h"

namespace probeview {

namespace {

constexpr std::chrono::seconds patience{30};

// The service on a thread of its own behind a real socket, its clients with their real connections. Handlers and raw
// links run on the test's own loop.
class SocketService final : public TestService {
 public:
  explicit SocketService(Service::Settings settings) {
    settings_ = std::move(settings);
    restart();
  }
  ~SocketService() override { kill(); }

  radix::client::ManagerHandle manager(const std::string& clientName, radix::client::ManagerOptions options) override {
    auto made = radix::client::makeSocketManager(clientName, queue(), surroundings(), options);
    managers_.push_back(made);
    return made;
  }

  std::shared_ptr<TaskQueue> queue() override { return {std::shared_ptr<void>(), &loop_}; }

  bool until(const std::function<bool()>& condition) override {
    // Conditions may look at what the service's thread does; it tells nobody, so they are looked at now and then.
    const auto look = loop_.every(std::chrono::milliseconds(5), [] {});
    return loop_.runUntil(condition, patience);
  }

  void settle() override {
    // Whoever asks is answered after all that it said before; what the service had for it follows the answer, and has
    // been handed over when the next but one has come.
    for (int round = 0; round < 3; ++round) {
      for (const auto& weak : managers_) {
        const auto manager = weak.lock();
        if (!manager) continue;
        radix::client::ObjectHandle reply;
        radix::client::PerformCommand(manager, "kCommandOfNobody", {}, reply);
      }
    }
    bool done = false;
    loop_.post([&done] { done = true; });
    until([&done] { return done; });
  }

  void onService(const std::function<void()>& task) override {
    std::exception_ptr trouble;
    thread_->runAndWait([&] {
      try {
        task();
      } catch (...) {
        // Thrown again in the test's thread.
        trouble = std::current_exception();
      }
    });
    if (trouble) std::rethrow_exception(trouble);
  }

  void kill() override {
    if (!service_) return;
    thread_->runAndWait([this] {
      listener_.reset();
      service_.reset();
    });
    thread_.reset();
  }

  void restart() override {
    thread_ = std::make_unique<LoopThread>("test.service");
    onService([this] {
      ServiceLog log(log_, LogLevel::Debug);
      auto socket = ListeningSocket::make(socketPath());
      if (!socket.socket) throw std::runtime_error(socket.error);
      service_ = std::make_unique<Service>(thread_->loop(), log, settings_);
      service_->addSource(std::make_unique<ScriptedSource>(script_));
      listener_ = std::make_unique<SocketListener>(
          thread_->loop(), service_->log(), std::move(socket.socket), peerCredentials,
          [this](auto link, Peer peer) { service_->accept(std::move(link), std::move(peer)); });
      if (!listener_->start()) throw std::runtime_error("the socket cannot be watched");
    });
  }

  std::unique_ptr<radix::Link> rawLink() override {
    return std::move(radix::makeSocketConnector(loop_, surroundings())->connect().link);
  }

  std::string socketPath() const override { return folder_.path() + "/radixd.sock"; }
  Service& service() override { return *service_; }

 private:
  radix::SocketSurroundings surroundings() const {
    radix::SocketSurroundings surroundings;
    surroundings.namedSocket = socketPath();
    return surroundings;
  }

  TemporaryFolder folder_;
  EventLoop loop_;
  std::unique_ptr<LoopThread> thread_;
  std::unique_ptr<Service> service_;
  std::unique_ptr<SocketListener> listener_;
  std::vector<std::weak_ptr<radix::client::Manager>> managers_;
};

}  // namespace

std::unique_ptr<TestService> makeSocketService(Service::Settings settings) {
  return std::make_unique<SocketService>(std::move(settings));
}

}  // namespace probeview
