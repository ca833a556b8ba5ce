// SPDX-License-Identifier: Apache-2.0
//
// The memory that decoded messages lie in.
#include <gtest/gtest.h>

#include <memory>
#include <thread>

#include "messages/lte_messages.h"
#include "tests/messages/support.h"

namespace probeview {
namespace {

TEST(Blocks, AThreadThatEndsGivesBackWhatItKept) {
  std::thread([] {
    for (int round = 0; round < 3; ++round) {
      std::vector<KCellularLteTxPower> messages(10);
      for (KCellularLteTxPower& message : messages) EXPECT_TRUE(decode(message, "12 02 08 02"));
    }
  }).join();
}

TEST(Blocks, ADeepCopyMayGoToAnotherThread) {
  KCellularLteTxPower message;
  ASSERT_TRUE(decode(message, "12 02 08 02"));
  std::unique_ptr<KCellularLteTxPower> copy = message.copyWithZone();
  std::thread([moved = std::move(copy)]() mutable {
    EXPECT_EQ(moved->txPowerInfosCount(), 1U);
    moved.reset();
  }).join();
}

}  // namespace
}  // namespace probeview
