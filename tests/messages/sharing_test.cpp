// SPDX-License-Identifier: Apache-2.0
//
// Copies, merges, equality and hash, and who owns the nested messages.
#include <gtest/gtest.h>

#include <optional>
#include <utility>

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "tests/messages/support.h"

namespace probeview {
namespace {

KCellularLteTxPower twoPowers() {
  KCellularLteTxPower message;
  EXPECT_TRUE(decode(message, "08 05 12 02 08 02 12 02 08 04"));
  return message;
}

TEST(Sharing, CopyToSharesTheElementsAndReplacesTheTargetsList) {
  const KCellularLteTxPower source = twoPowers();
  KCellularLteTxPower target;
  target.addTxPowerInfo().setSubframeIndex(9);
  source.copyTo(target);
  EXPECT_EQ(target, source);
  EXPECT_EQ(target.txPowerInfoAtIndex(1), source.txPowerInfoAtIndex(1));
  source.txPowerInfoAtIndex(1)->setPuschTxPower(23);
  EXPECT_EQ(target.txPowerInfoAtIndex(1)->puschTxPower(), 23);
}

TEST(Sharing, CopyToLeavesTheTargetsFieldsThatTheSourceLacks) {
  KCellularLteTxPower source;
  KCellularLteTxPower target = twoPowers();
  source.copyTo(target);
  EXPECT_EQ(target, twoPowers());
}

TEST(Sharing, CopyWithZoneSharesNothing) {
  const KCellularLteTxPower source = twoPowers();
  const auto copy = source.copyWithZone();
  EXPECT_EQ(*copy, source);
  copy->txPowerInfoAtIndex(0)->setPucchTxPower(-5);
  EXPECT_EQ(source.txPowerInfoAtIndex(0)->pucchTxPower(), 1);
  KCellularEmmContext context;
  context.setGuti(Guti());
  const KCellularEmmContext contextCopy = context;
  context.guti()->setMmec(3);
  EXPECT_FALSE(contextCopy.guti()->hasMmec());
}

TEST(Sharing, MergeAppendsTheSameElements) {
  const KCellularLteTxPower source = twoPowers();
  KCellularLteTxPower target = twoPowers();
  target.mergeFrom(source);
  ASSERT_EQ(target.txPowerInfosCount(), 4U);
  EXPECT_EQ(target.txPowerInfoAtIndex(2), source.txPowerInfoAtIndex(0));
  EXPECT_EQ(target.txPowerInfoAtIndex(3), source.txPowerInfoAtIndex(1));
}

TEST(Sharing, MergeGoesIntoASingleNestedMessageThatIsThere) {
  KCellularEmmContext target;
  KCellularEmmContext source;
  ASSERT_TRUE(decode(target, "32 04 08 01 10 02"));
  ASSERT_TRUE(decode(source, "32 04 10 07 18 03"));
  const Shared<Guti> before = target.guti();
  target.mergeFrom(source);
  EXPECT_EQ(target.guti(), before);
  EXPECT_EQ(shown(target), R"(["guti": ["mmegi": 1, "mmec": 7, "m_tmsi": 3]])");
  EXPECT_EQ(shown(source), R"(["guti": ["mmec": 7, "m_tmsi": 3]])");
}

TEST(Sharing, MergeTakesOverASingleNestedMessageThatIsNotThere) {
  KCellularEmmContext source;
  ASSERT_TRUE(decode(source, "32 02 10 07"));
  KCellularEmmContext target;
  target.mergeFrom(source);
  EXPECT_EQ(target.guti(), source.guti());
}

TEST(Sharing, MergeReplacesScalarsBytesAndTextsAndAppendsNumbers) {
  BearerContext target;
  target.setCid(1);
  target.setNsapi(5);
  target.setApn("one");
  BearerContext source;
  source.setCid(2);
  source.setApn("two");
  const Bytes address = bytesOf("0a000001");
  source.setPdpAddr(address);
  target.mergeFrom(source);
  EXPECT_EQ(shown(target), R"(["cid": 2, "nsapi": 5, "apn": "two", "pdp_addr": <0a000001>])");
  KCellularGsmCsRfMeasurement numbers;
  numbers.addCsTxPwr(1);
  KCellularGsmCsRfMeasurement more;
  more.addCsTxPwr(2);
  numbers.mergeFrom(more);
  EXPECT_EQ(shown(numbers), R"(["cs_tx_pwr": [1, 2]])");
}

TEST(Sharing, MergingAMessageIntoItselfDoublesItsLists) {
  KCellularLteTxPower message = twoPowers();
  message.mergeFrom(message);
  EXPECT_EQ(message.txPowerInfosCount(), 4U);
  KCellularGsmCsRfMeasurement numbers;
  for (int value = 0; value < 8; ++value) numbers.addCsTxPwr(value);
  numbers.mergeFrom(numbers);
  EXPECT_EQ(numbers.csTxPwrsCount(), 16U);
  EXPECT_EQ(numbers.csTxPwrAtIndex(15), 7);
  BearerContext bearer;
  bearer.setApn("internet");
  bearer.mergeFrom(bearer);
  EXPECT_EQ(bearer.apn(), "internet");
}

TEST(Sharing, AnElementOutlivesTheMessageThatItCameWith) {
  std::optional<KCellularSimCardFiles> message(std::in_place);
  ASSERT_TRUE(decode(*message, "12 07 08 01 12 03 aabbcc"));
  const Shared<ElementaryFile> file = message->efListAtIndex(0);
  message.reset();
  EXPECT_EQ(shown(*file), R"(["ef_id": 1, "content": <aabbcc>])");
}

TEST(Sharing, AnElementOutlivesItsMessageInAnotherMessage) {
  KCellularSimCardFiles target;
  {
    KCellularSimCardFiles source;
    ASSERT_TRUE(decode(source, "12 07 08 01 12 03 aabbcc 12 02 08 02"));
    target.addEfList(source.efListAtIndex(0));
    target.mergeFrom(source);
  }
  EXPECT_EQ(shown(target),
            R"(["ef_list": [["ef_id": 1, "content": <aabbcc>], ["ef_id": 1, "content": <aabbcc>], ["ef_id": 2]]])");
}

TEST(Sharing, AnElementThatIsChangedAfterDecodingOwnsWhatItIsGiven) {
  Shared<ElementaryFile> file(nullptr);
  {
    KCellularSimCardFiles message;
    ASSERT_TRUE(decode(message, "12 07 08 01 12 03 aabbcc"));
    file = message.efListAtIndex(0);
    file->setContent(bytesOf("0102030405060708"));
    file->setContent(bytesOf("010203"));
  }
  EXPECT_EQ(hexOf(file->content()), "010203");
  file->setContent(nullptr);
  EXPECT_FALSE(file->hasContent());
}

TEST(Sharing, AddingAMessageCopiesItAndAddingAHandleSharesIt) {
  KCellularLteTxPower message;
  TxPowerInfo value;
  value.setSubframeIndex(1);
  message.addTxPowerInfo(value);
  value.setSubframeIndex(2);
  EXPECT_EQ(message.txPowerInfoAtIndex(0)->subframeIndex(), 1U);
  auto handle = Shared<TxPowerInfo>::make();
  message.addTxPowerInfo(handle);
  handle->setSubframeIndex(3);
  EXPECT_EQ(message.txPowerInfoAtIndex(1)->subframeIndex(), 3U);
  message.addTxPowerInfo(Shared<TxPowerInfo>(nullptr));
  EXPECT_EQ(message.txPowerInfosCount(), 2U);
}

TEST(Sharing, AListIsSetFromAnotherListFromHandlesAndFromItself) {
  const KCellularLteTxPower source = twoPowers();
  KCellularLteTxPower target;
  target.setTxPowerInfos(source.txPowerInfos());
  EXPECT_EQ(target.txPowerInfoAtIndex(1), source.txPowerInfoAtIndex(1));
  target.setTxPowerInfos(target.txPowerInfos());
  EXPECT_EQ(target.txPowerInfosCount(), 2U);
  const std::vector<Shared<TxPowerInfo>> handles = {Shared<TxPowerInfo>::make()};
  target.setTxPowerInfos(handles);
  EXPECT_EQ(target.txPowerInfoAtIndex(0), handles[0]);
  target.clearTxPowerInfos();
  EXPECT_EQ(target, KCellularLteTxPower());
}

TEST(Sharing, ListsCanBeWalked) {
  std::int32_t sum = 0;
  const KCellularLteTxPower message = twoPowers();
  for (const TxPowerInfo& info : message.txPowerInfos()) sum += info.pucchTxPower();
  EXPECT_EQ(sum, 3);
  EXPECT_EQ(message.txPowerInfos().size(), 2U);
  EXPECT_EQ(message.txPowerInfos()[1].pucchTxPower(), 2);
}

TEST(Sharing, AMovedMessageTakesItsContentAlong) {
  KCellularLteTxPower source = twoPowers();
  source.addTxPowerInfo().setSubframeIndex(4);
  const KCellularLteTxPower moved = std::move(source);
  EXPECT_EQ(moved.txPowerInfosCount(), 3U);
  EXPECT_EQ(source, KCellularLteTxPower());  // NOLINT(bugprone-use-after-move): a moved-from message is empty
  KCellularSimCardFiles files;
  ASSERT_TRUE(decode(files, "12 07 08 01 12 03 aabbcc"));
  // An element stays where its message is; what is moved out of it is a copy.
  const ElementaryFile element = std::move(*files.efListAtIndex(0));
  EXPECT_EQ(hexOf(element.content()), "aabbcc");
  EXPECT_EQ(files.efListAtIndex(0)->efId(), 1U);
}

// Moves the message around and takes all of it along, whoever owns the memory of it.
template <typename Message>
void expectToMoveWhole(Message& source) {
  const Message copy = source;
  Message moved = std::move(source);
  EXPECT_EQ(moved, copy);
  EXPECT_EQ(source, Message());  // NOLINT(bugprone-use-after-move): a moved-from message is empty
  source = std::move(moved);
  EXPECT_EQ(source, copy);
  EXPECT_EQ(encodedHex(source), encodedHex(copy));
}

TEST(Sharing, EveryKindOfFieldMovesWhole) {
  for (const bool isDecoded : {true, false}) {
    KCellularLteRsrpRsrqSinr texts;  // a text, a single nested message and a list
    KCellularMmCommonInfo bytes;
    KCellularGsmCsRfMeasurement numbers;
    KCellularLteSelReselCellInfo unsignedNumbers;
    if (isDecoded) {
      ASSERT_TRUE(decode(texts, "08 05 1a 08 696e7465726e6574 72 02 20 01 7a 02 20 03"));
      ASSERT_TRUE(decode(bytes, "12 02 aabb 1a 05 0a 03 00f110"));
      ASSERT_TRUE(decode(numbers, "2a 03 02 04 06"));
      ASSERT_TRUE(decode(unsignedNumbers, "12 02 0307 20 01"));
    } else {
      texts.setCallId("internet");
      texts.setAvgValues(RsrpRsrqSinr());
      texts.addInstValues(RsrpRsrqSinr());
      bytes.setImsi(bytesOf("aabb"));
      bytes.addEplmnList(Plmn());
      for (int value = 0; value < 20; ++value) numbers.addCsTxPwr(value);
      for (unsigned value = 0; value < 20; ++value) unsignedNumbers.addMultiBandInfo(value);
    }
    expectToMoveWhole(texts);
    expectToMoveWhole(bytes);
    expectToMoveWhole(numbers);
    expectToMoveWhole(unsignedNumbers);
  }
}

TEST(Sharing, ASingleNestedMessageIsSetFromAnotherFromItselfAndFromNothing) {
  KCellularEmmContext source;
  ASSERT_TRUE(decode(source, "32 02 08 01"));
  KCellularEmmContext target;
  target.setGuti(source.guti());
  EXPECT_EQ(target.guti(), source.guti());
  target.setGuti(target.guti());
  source.setGuti(source.guti());
  source.reset();
  EXPECT_EQ(shown(target), R"(["guti": ["mmegi": 1]])");
  ASSERT_TRUE(decode(source, "32 02 08 02"));
  source.setGuti(source.guti());
  EXPECT_EQ(shown(source), R"(["guti": ["mmegi": 2]])");
  target.setGuti(nullptr);
  EXPECT_FALSE(target.hasGuti());
  EXPECT_EQ(target, KCellularEmmContext());
}

TEST(Sharing, AListThatWasDecodedGrowsByHandAndDecodesOn) {
  KCellularGsmCsRfMeasurement numbers;
  ASSERT_TRUE(decode(numbers, "2a 02 00 02"));
  for (std::int32_t value = 2; value < 20; ++value) numbers.addCsTxPwr(value);
  ASSERT_TRUE(decode(numbers, "28 28 2a 01 2a"));
  ASSERT_EQ(numbers.csTxPwrsCount(), 22U);
  for (std::int32_t value = 0; value < 22; ++value) {
    EXPECT_EQ(numbers.csTxPwrAtIndex(static_cast<std::size_t>(value)), value);
  }
  KCellularLteTxPower elements = twoPowers();
  for (unsigned count = 2; count < 20; ++count) elements.addTxPowerInfo().setSubframeIndex(count);
  ASSERT_TRUE(decode(elements, "12 02 18 14"));
  ASSERT_EQ(elements.txPowerInfosCount(), 21U);
  EXPECT_EQ(elements.txPowerInfoAtIndex(1)->pucchTxPower(), 2);
  for (unsigned index = 2; index < 21; ++index) EXPECT_EQ(elements.txPowerInfoAtIndex(index)->subframeIndex(), index);
  elements.clearTxPowerInfos();
  elements.addTxPowerInfo();
  EXPECT_EQ(shown(elements), R"(["timestamp": 5, "tx_power_info": [[]]])");
}

TEST(Sharing, AMessageCopiedToItselfStaysAsItIs) {
  KCellularLteTxPower message = twoPowers();
  message.copyTo(message);
  EXPECT_EQ(message, twoPowers());
}

TEST(Sharing, AssignmentReplacesTheWholeContent) {
  KCellularLteTxPower message;
  message.setTimestamp(9);
  message = twoPowers();
  EXPECT_EQ(message, twoPowers());
  const KCellularLteTxPower& same = message;
  message = same;
  EXPECT_EQ(message, twoPowers());
  KCellularSimCardFiles files;
  ASSERT_TRUE(decode(files, "12 07 08 01 12 03 aabbcc"));
  ElementaryFile other;
  other.setContent(bytesOf("dd"));
  *files.efListAtIndex(0) = other;
  EXPECT_EQ(shown(files), R"(["ef_list": [["content": <dd>]]])");
}

TEST(Sharing, ResetMakesAnEmptyMessageAndLeavesSharedElementsAlone) {
  KCellularLteTxPower message = twoPowers();
  const Shared<TxPowerInfo> kept = message.txPowerInfoAtIndex(1);
  message.reset();
  EXPECT_EQ(message, KCellularLteTxPower());
  message.setHasTimestamp(true);
  EXPECT_EQ(message.timestamp(), 0U);
  message.setHasTimestamp(false);
  ASSERT_TRUE(decode(message, "12 02 08 06"));
  EXPECT_EQ(kept->pucchTxPower(), 2);
  message.reset();
  ASSERT_TRUE(decode(message, "12 02 08 08"));
  EXPECT_EQ(shown(message), R"(["tx_power_info": [["pucch_tx_power": 4]]])");
  message.txPowerInfoAtIndex(0)->reset();
  EXPECT_EQ(shown(message), R"(["tx_power_info": [[]]])");
}

TEST(Sharing, AnElementCanDecodeByItself) {
  KCellularSimCardFiles message;
  ASSERT_TRUE(decode(message, "12 02 08 01"));
  ASSERT_TRUE(decode(*message.efListAtIndex(0), "12 02 abcd"));
  EXPECT_EQ(shown(message), R"(["ef_list": [["ef_id": 1, "content": <abcd>]]])");
}

TEST(Sharing, OnlyMessagesOfExactlyTheSameClassAreEqualOrMerge) {
  KCellularLocationAreaId location;
  KCellularTrackingAreaId tracking;
  EXPECT_FALSE(static_cast<const PBCodable&>(location).isEqual(tracking));
  PBCodable& base = location;
  EXPECT_FALSE(base.mergeFrom(tracking));
  EXPECT_FALSE(base.copyTo(tracking));
}

TEST(Sharing, AnEmptiedListEqualsAListNeverMade) {
  KCellularLteTxPower message = twoPowers();
  message.clearTxPowerInfos();
  message.setHasTimestamp(false);
  EXPECT_EQ(message, KCellularLteTxPower());
  EXPECT_EQ(message.hash(), KCellularLteTxPower().hash());
  EXPECT_EQ(shown(message), "[]");
  KCellularGsmCsRfMeasurement numbers;
  numbers.addCsTxPwr(1);
  numbers.clearCsTxPwrs();
  EXPECT_EQ(numbers, KCellularGsmCsRfMeasurement());
  EXPECT_EQ(numbers.hash(), 0U);
}

TEST(Sharing, PresentAndEmptyIsNotAbsent) {
  KCellularMmCommonInfo present;
  ASSERT_TRUE(decode(present, "12 00"));
  EXPECT_NE(present, KCellularMmCommonInfo());
  EXPECT_EQ(encodedHex(present), "1200");
  KCellularEmmContext nested;
  ASSERT_TRUE(decode(nested, "32 00"));
  EXPECT_NE(nested, KCellularEmmContext());
  KCellularLteTxPower list;
  ASSERT_TRUE(decode(list, "12 00"));
  EXPECT_NE(list, KCellularLteTxPower());
}

TEST(Sharing, AClearedBitReadsZeroAndSetAgainTheStoredValueIsBack) {
  KCellularLteRrcState message;
  message.setPrevStateDurMs(7);
  message.setHasPrevStateDurMs(false);
  EXPECT_EQ(message.prevStateDurMs(), 0U);
  EXPECT_EQ(encodedHex(message), "");
  KCellularLteRrcState copy = message;
  message.setHasPrevStateDurMs(true);
  EXPECT_EQ(message.prevStateDurMs(), 7U);
  EXPECT_NE(copy, message);
  // Only what is present is copied.
  copy.setHasPrevStateDurMs(true);
  EXPECT_EQ(copy.prevStateDurMs(), 0U);
}

TEST(Sharing, ValuesBehindAClearedBitDoNotCountInEqualityAndHash) {
  KCellularLteRrcState one;
  one.setPrevStateDurMs(7);
  one.setHasPrevStateDurMs(false);
  EXPECT_EQ(one, KCellularLteRrcState());
  EXPECT_EQ(one.hash(), 0U);
}

TEST(Sharing, TheHashOfScalarsIsTheXorOfTheirProductsWithTheFactor) {
  KCellularLteServingCellMeasurement message;
  message.setTimestamp(0xFFFFFFFFFFFFFFFF);
  message.setIsConnectedMode(true);
  EXPECT_EQ(message.hash(), (0xFFFFFFFFFFFFFFFFU * 2654435761U) ^ 2654435761U);
  TxPowerInfo negative;
  negative.setPucchTxPower(-3);
  EXPECT_EQ(negative.hash(), static_cast<std::uint64_t>(-3LL) * 2654435761U);
}

TEST(Sharing, TheDescriptionIsTheClassNameABlankAndTheDictionary) {
  EXPECT_EQ(twoPowers().description(),
            R"(KCellularLteTxPower ["timestamp": 5, "tx_power_info": [["pucch_tx_power": 1], ["pucch_tx_power": 2]]])");
  EXPECT_EQ(Guti().description(), "Guti []");
}

}  // namespace
}  // namespace probeview
