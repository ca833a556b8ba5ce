// SPDX-License-Identifier: Apache-2.0
#include "tools/service_client.h"

#include <ostream>
#include <utility>

#include "radix/service_commands.h"
#include "radix/status.h"
#include "values/plain_text.h"

namespace probeview {

ServiceClient::ServiceClient(Tool& tool, radix::client::ManagerOptions options)
    : tool_(tool),
      loop_(std::make_shared<EventLoop>()),
      manager_(radix::client::CreateManager("probectl", loop_, options)) {}

ExitStatus ServiceClient::perform(std::string_view command, const Dictionary& arguments, Dictionary* reply,
                                  const std::string& subject) {
  radix::client::ObjectHandle answer;
  const radix::client::Result result = radix::client::PerformCommand(manager_, command, arguments, answer);
  // That there is no service has nothing to do with the subject.
  const auto status = static_cast<radix::Status>(result.status);
  const bool isAway = status == radix::Status::NoService || status == radix::Status::TimedOut;
  const std::string prefix = subject.empty() || isAway ? "probectl: " : "probectl: " + subject + ": ";
  const bool isDone = status == radix::Status::Ok;
  if (!isDone || !result.message.empty()) tool_.errors << onOneLine(prefix + result.message) << '\n';
  if (!isDone) return ExitStatus::Failure;
  if (reply != nullptr && answer) *reply = radix::client::nativeDictionary(*answer);
  return ExitStatus::Success;
}

void ServiceClient::listen(std::function<void(const Dictionary& event)> take) {
  radix::client::RegisterEventHandler(
      manager_, radix::kEventMetric,
      [take = std::move(take)](const radix::client::ObjectHandle& event, radix::client::Group) {
        take(radix::client::nativeDictionary(*event));
      });
  radix::client::EventsOn(manager_);
}

ExitStatus ServiceClient::drain() {
  // A reply may overtake events; the events that one has overtaken have come when the next but one has.
  for (int round = 0; round < 3; ++round) {
    if (const ExitStatus status = perform(radix::kCommandShowStatus, {}); status != ExitStatus::Success) return status;
  }
  bool done = false;
  loop_->post([&done] { done = true; });
  loop_->runUntil([&done] { return done; }, std::chrono::seconds(2));
  return ExitStatus::Success;
}

}  // namespace probeview
