// SPDX-License-Identifier: Apache-2.0
#include <utility>

#include "platform/manual_loop.h"
#include "radix/connection_manager.h"
#include "radix/in_process_link.h"
#include "tests/service/harness/test_service.h"

namespace probeview {

namespace {

// How long a test's own time may run until something must have happened.
constexpr std::chrono::seconds servicePatience{60};

class InProcessService final : public TestService {
 public:
  explicit InProcessService(Service::Settings settings) {
    settings_ = std::move(settings);
    restart();
  }
  ~InProcessService() override {
    kill();
    loop_.run();
  }

  radix::client::ManagerHandle manager(const std::string& clientName, radix::client::ManagerOptions options) override {
    return radix::client::makeConnectionManager(loop_, std::make_unique<InProcessConnector>(*this),
                                                {.clientName = clientName, .observes = options.observes}, queue());
  }

  std::shared_ptr<TaskQueue> queue() override { return {std::shared_ptr<void>(), &loop_}; }

  bool until(const std::function<bool()>& condition) override {
    const auto deadline = loop_.monotonicTime() + servicePatience;
    while (!condition()) {
      if (loop_.runOne()) continue;
      const auto next = loop_.untilNextTimer();
      if (!next || loop_.monotonicTime() + *next > deadline) return false;
      loop_.advance(*next);
    }
    return true;
  }

  // Long enough for records that wait for company.
  void settle() override { loop_.advance(std::chrono::milliseconds(1)); }
  void onService(const std::function<void()>& task) override { task(); }

  void kill() override {
    service_.reset();
    loop_.run();
  }

  void restart() override {
    service_ = std::make_unique<Service>(loop_, ServiceLog(log_, LogLevel::Debug), settings_);
    service_->addSource(std::make_unique<ScriptedSource>(script_));
  }

  std::unique_ptr<radix::Link> rawLink() override {
    auto [near, far] = radix::makeInProcessLinks(loop_);
    service_->accept(std::move(far), {.process = 1, .user = 1000, .refusal = {}});
    return std::move(near);
  }

  std::string socketPath() const override { return {}; }
  Service& service() override { return *service_; }

 private:
  class InProcessConnector final : public radix::Connector {
   public:
    explicit InProcessConnector(InProcessService& world) : world_(world) {}
    radix::ConnectResult connect() override {
      if (!world_.service_) return {nullptr, false, "no baseband service in this process"};
      return {world_.rawLink(), false, {}};
    }

   private:
    InProcessService& world_;
  };

  ManualLoop loop_;
  std::unique_ptr<Service> service_;
};

}  // namespace

std::unique_ptr<TestService> makeInProcessService(Service::Settings settings) {
  return std::make_unique<InProcessService>(std::move(settings));
}

}  // namespace probeview
