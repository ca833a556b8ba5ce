// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>

#include "platform/worker.h"
#include "radix/manager.h"
#include "radix/service_connection.h"

namespace radix::client {

// A manager whose connection lives on the given worker, which must outlive it. Its commands wait at a gate of that
// worker, so that on a manual worker nothing ever blocks.
std::shared_ptr<Manager> makeConnectionManager(probeview::Worker& worker, std::unique_ptr<Connector> connector,
                                               ServiceConnection::Identity identity,
                                               std::shared_ptr<probeview::TaskQueue> queue);

}  // namespace radix::client
