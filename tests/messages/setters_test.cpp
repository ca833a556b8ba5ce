// SPDX-License-Identifier: Apache-2.0
//
// What may be handed to the setters of bytes, texts and nested messages, as the compiler sees it.
#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <span>

#include "messages/lte_messages.h"
#include "messages/nas_messages.h"

namespace probeview {
namespace {

template <typename Message>
concept BytesTakeBraces = requires(Message message) {
  message.setEncodedPlmn({});
};
template <typename Message>
concept TextTakesBraces = requires(Message message) {
  message.setCallId({});
};
template <typename Message>
concept MessageTakesBraces = requires(Message message) {
  message.setAvgValues({});
};

TEST(Setters, OfBytesTextsAndMessagesDoNotCompileWithEmptyBraces) {
  EXPECT_FALSE(BytesTakeBraces<Plmn>);
  EXPECT_FALSE(TextTakesBraces<KCellularLteRsrpRsrqSinr>);
  EXPECT_FALSE(MessageTakesBraces<KCellularLteRsrpRsrqSinr>);
}

TEST(Setters, TakeAValueOrAnEmptyOneAndNullTakesTheFieldAway) {
  Plmn plmn;
  plmn.setEncodedPlmn(std::array<std::uint8_t, 3>{1, 2, 3});
  EXPECT_EQ(plmn.encodedPlmn().size(), 3U);
  plmn.setEncodedPlmn(std::span<const std::uint8_t>());
  EXPECT_TRUE(plmn.hasEncodedPlmn());
  EXPECT_TRUE(plmn.encodedPlmn().empty());
  plmn.setEncodedPlmn(nullptr);
  EXPECT_FALSE(plmn.hasEncodedPlmn());

  KCellularLteRsrpRsrqSinr levels;
  levels.setCallId("");
  EXPECT_TRUE(levels.hasCallId());
  levels.setCallId(nullptr);
  EXPECT_FALSE(levels.hasCallId());
  levels.setAvgValues(RsrpRsrqSinr());
  EXPECT_TRUE(levels.hasAvgValues());
  levels.setAvgValues(nullptr);
  EXPECT_FALSE(levels.hasAvgValues());
}

}  // namespace
}  // namespace probeview
