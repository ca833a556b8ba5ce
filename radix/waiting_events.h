// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <atomic>
#include <cstddef>
#include <memory>
#include <vector>

#include "platform/detachable_queue.h"
#include "radix/arrived_event.h"
#include "radix/service_connection.h"

namespace radix::client {

// Counts the events that came from the service and that somebody in this process still has to do with, and stops the
// connection's reading when there are too many: the rest then waits in the service, which drops the oldest of each
// metric instead of letting the memory of this process grow.
class WaitingEvents : public std::enable_shared_from_this<WaitingEvents> {
 public:
  // The worker is the connection's, and must live until close().
  explicit WaitingEvents(probeview::TaskQueue& worker) : worker_(worker) {}

  // They count until the last copy of what this returns has gone, on whatever thread. On the worker.
  std::shared_ptr<const void> add(const std::vector<ArrivedEvent>& events,
                                  const std::shared_ptr<ServiceConnection>& connection);
  // Whether there are any. Any thread.
  bool any() const { return weight_ > 0; }
  // Tells the connection nothing any more. Any thread.
  void close() { worker_.detach(); }

 private:
  class Share;

  void release(std::size_t weight, const std::weak_ptr<ServiceConnection>& connection);
  // On the worker.
  void update(ServiceConnection& connection);

  probeview::DetachableQueue worker_;
  std::atomic<std::size_t> weight_ = 0;
  std::atomic<bool> isFewAwaited_ = false;
  Appetite appetite_ = Appetite::Everything;  // the worker's
};

}  // namespace radix::client
