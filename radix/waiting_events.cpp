// SPDX-License-Identifier: Apache-2.0
#include "radix/waiting_events.h"

#include <utility>

namespace radix::client {

namespace {

// Events that wait before no more are read, and before reading goes on.
constexpr std::size_t most = 4096;
constexpr std::size_t few = 1024;
// While a command waits for its reply, which stands behind events: all that a service may have on its way, and more.
constexpr std::size_t mostBesideReplies = 4 * most;
// A large event counts as several: what waits stays below some megabytes.
constexpr std::size_t bytesOfOneEvent = 2048;

std::size_t weightOf(const std::vector<ArrivedEvent>& events) {
  std::size_t weight = 0;
  // What every event holds beside its payload and origin is within the one.
  for (const ArrivedEvent& event : events) weight += 1 + event.foreignBytes / bytesOfOneEvent;
  return weight;
}

}  // namespace

class WaitingEvents::Share {
 public:
  Share(std::shared_ptr<WaitingEvents> all, std::size_t weight, std::weak_ptr<ServiceConnection> connection)
      : all_(std::move(all)), weight_(weight), connection_(std::move(connection)) {}
  ~Share() { all_->release(weight_, connection_); }
  Share(const Share&) = delete;
  Share& operator=(const Share&) = delete;

 private:
  std::shared_ptr<WaitingEvents> all_;
  std::size_t weight_;
  std::weak_ptr<ServiceConnection> connection_;
};

std::shared_ptr<const void> WaitingEvents::add(const std::vector<ArrivedEvent>& events,
                                               const std::shared_ptr<ServiceConnection>& connection) {
  const std::size_t weight = weightOf(events);
  weight_ += weight;
  auto hold = std::make_shared<const Share>(shared_from_this(), weight, connection);
  update(*connection);
  return hold;
}

void WaitingEvents::release(std::size_t weight, const std::weak_ptr<ServiceConnection>& connection) {
  if (weight_.fetch_sub(weight) - weight > few || !isFewAwaited_.exchange(false)) return;
  worker_.post([self = shared_from_this(), connection] {
    if (const auto here = connection.lock()) self->update(*here);
  });
}

void WaitingEvents::update(ServiceConnection& connection) {
  do {
    const std::size_t now = weight_;
    const bool goesOn = now <= (appetite_ == Appetite::Everything ? most : few);
    appetite_ = goesOn ? Appetite::Everything : now <= mostBesideReplies ? Appetite::Replies : Appetite::Nothing;
    isFewAwaited_ = !goesOn;
    // It may have become few before anybody knew that this is waited for.
  } while (weight_ <= few && isFewAwaited_.exchange(false));
  connection.setAppetite(appetite_);
}

}  // namespace radix::client
