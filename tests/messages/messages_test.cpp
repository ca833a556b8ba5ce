// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>

#include <cstdint>
#include <span>
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

TEST(Messages, AnEmptyPayloadWithoutAnAddressDecodesSuccessfully) {
  KCellularLteTxPower message;
  PBDataReader reader(std::span<const std::uint8_t>{});
  EXPECT_TRUE(message.readFrom(reader));
  EXPECT_TRUE(message.dictionaryRepresentation().empty());
}

TEST(Messages, AKeyOfAllOnesIsAnUnknownFieldWhereverItStands) {
  // Field 65535 with a wire type that cannot be skipped, behind the last field and in the place of one never read.
  const std::uint8_t behindTheLast[] = {0x18, 0x7f, 0xff, 0xff, 0xff, 0xff, 0x0f, 0x01};
  TxPowerInfo info;
  PBDataReader reader(behindTheLast);
  EXPECT_FALSE(info.readFrom(reader));
  EXPECT_EQ(info.subframeIndex(), 127u);
  const std::uint8_t behindField18[] = {0x90, 0x01, 0x01, 0xff, 0xff, 0xff, 0xff, 0x0f, 0x05};
  KCellularGsmIdleConfig config;
  PBDataReader configReader(behindField18);
  EXPECT_FALSE(config.readFrom(configReader));
  EXPECT_FALSE(config.hasCrOffset());
}

}  // namespace
}  // namespace probeview
