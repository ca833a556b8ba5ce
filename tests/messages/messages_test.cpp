// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/registry.h"
#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"

namespace probeview {
namespace {

TEST(Messages, ATxPowerMessageReadsBackAsItWasWritten) {
  KCellularLteTxPower message;
  message.setTimestamp(1700000000000);
  TxPowerInfo& first = message.addTxPowerInfo();
  first.setPucchTxPower(-12);
  first.setSubframeIndex(3);
  TxPowerInfo second;
  second.setPuschTxPower(23);
  message.addTxPowerInfo(second);
  PBDataWriter writer;
  message.writeTo(writer);
  KCellularLteTxPower decoded;
  PBDataReader reader(writer.bytes());
  ASSERT_TRUE(decoded.readFrom(reader));
  EXPECT_EQ(decoded, message);
  EXPECT_EQ(decoded.hash(), message.hash());
  EXPECT_EQ(decoded.description(),
            R"(KCellularLteTxPower ["timestamp": 1700000000000, "tx_power_info": [["pucch_tx_power": -12, )"
            R"("subframe_index": 3], ["pusch_tx_power": 23]]])");
  EXPECT_EQ(decoded.txPowerInfoAtIndex(1)->puschTxPower(), 23);
}

}  // namespace
}  // namespace probeview
