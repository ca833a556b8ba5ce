// SPDX-License-Identifier: Apache-2.0
#include "service/outbox.h"

#include <gtest/gtest.h>

#include <array>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "radix/frames.h"

namespace probeview {
namespace {

using Bytes = std::vector<std::uint8_t>;

radix::FrameBytes frame(std::uint8_t mark, std::size_t size = 1) {
  return std::make_shared<const Bytes>(Bytes(size, mark));
}

// Notes the losses that it is told of.
class Losses final : public radix::FrameHandler {
 public:
  void onDropped(const radix::Dropped& dropped) override { count += dropped.count(); }
  std::uint64_t count = 0;
};

// Takes up to so many frames; records as their marks, words as they are told.
std::string take(Outbox& outbox, std::size_t most, Losses* losses = nullptr) {
  std::array<radix::OutgoingFrame, 64> frames;
  const std::size_t count = outbox.next({frames.data(), std::min<std::size_t>(most, frames.size())}, {});
  std::string taken;
  for (std::size_t index = 0; index < count; ++index) {
    const Bytes& bytes = *frames[index].frame;
    Losses heard;
    if (bytes.size() == 1) {
      taken += static_cast<char>(bytes[0]);
    } else if (radix::decodeFrame(bytes, heard) && heard.count > 0) {
      taken += '!';
      if (losses != nullptr) losses->count += heard.count;
    } else {
      taken += static_cast<char>(bytes[0]);
    }
  }
  outbox.sent(count);
  return taken;
}

TEST(Outbox, RecordsLeaveInTheirOrderAndWordsGoFirst) {
  Outbox outbox({});
  EXPECT_TRUE(outbox.empty());
  outbox.addRecord({1, frame('a')});
  outbox.addRecord({2, frame('b')});
  outbox.addWord(frame('W'));
  outbox.addRecord({1, frame('c')});
  EXPECT_EQ(take(outbox, 2), "Wa");
  EXPECT_EQ(take(outbox, 64), "bc");
  EXPECT_TRUE(outbox.empty());
  EXPECT_EQ(outbox.sentRecords(), 3U);
  EXPECT_EQ(outbox.lostRecords(), 0U);
}

TEST(Outbox, WhatWasNotSentIsOfferedAgain) {
  Outbox outbox({});
  outbox.addRecord({1, frame('a')});
  outbox.addRecord({1, frame('b')});
  std::array<radix::OutgoingFrame, 2> frames;
  EXPECT_EQ(outbox.next(frames, {}), 2U);
  outbox.sent(1);
  EXPECT_EQ(take(outbox, 64), "b");
}

TEST(Outbox, AtTheLimitNothingIsLostAndOneRecordPastItTheOldestOfTheSameMetricIs) {
  Outbox outbox({.records = 4, .bytes = 1000});
  outbox.addRecord({1, frame('a')});
  outbox.addRecord({2, frame('b')});
  outbox.addRecord({1, frame('c')});
  outbox.addRecord({2, frame('d')});
  EXPECT_EQ(outbox.lostRecords(), 0U);
  outbox.addRecord({2, frame('e')});
  EXPECT_EQ(outbox.lostRecords(), 1U);
  EXPECT_EQ(outbox.records(), 4U);
  Losses losses;
  EXPECT_EQ(take(outbox, 64, &losses), "!acde");
  EXPECT_EQ(losses.count, 1U);
}

TEST(Outbox, AMetricOfWhichNothingWaitsTakesThePlaceOfTheOldestOfTheMostFrequentOne) {
  Outbox outbox({.records = 4, .bytes = 1000});
  outbox.addRecord({1, frame('a')});
  outbox.addRecord({2, frame('b')});
  outbox.addRecord({2, frame('c')});
  outbox.addRecord({3, frame('d')});
  outbox.addRecord({4, frame('e')});
  EXPECT_EQ(take(outbox, 64), "!acde");
}

TEST(Outbox, TheBytesAreLimitedToo) {
  Outbox outbox({.records = 100, .bytes = 10});
  outbox.addRecord({1, frame('a', 5)});
  outbox.addRecord({2, frame('b', 5)});
  EXPECT_EQ(outbox.lostRecords(), 0U);
  outbox.addRecord({2, frame('c', 6)});
  // The oldest of the same metric goes first, and then as much more as is needed.
  EXPECT_EQ(outbox.lostRecords(), 2U);
  EXPECT_EQ(take(outbox, 64), "!c");
}

TEST(Outbox, ARecordLargerThanAllRoomIsTheOnlyOneThatWaits) {
  Outbox outbox({.records = 100, .bytes = 10});
  outbox.addRecord({1, frame('a')});
  outbox.addRecord({1, frame('b', 50)});
  EXPECT_EQ(take(outbox, 64), "!b");
}

TEST(Outbox, LossesAreToldOnceAndExactly) {
  Outbox outbox({.records = 2, .bytes = 1000});
  Losses losses;
  for (int number = 0; number < 5; ++number) outbox.addRecord({1, frame('x')});
  EXPECT_EQ(take(outbox, 1, &losses), "!");
  EXPECT_EQ(losses.count, 3U);
  outbox.addRecord({1, frame('y')});
  EXPECT_EQ(take(outbox, 64, &losses), "!xy");
  EXPECT_EQ(losses.count, 4U);
  EXPECT_EQ(take(outbox, 64, &losses), "");
  EXPECT_EQ(outbox.sentRecords() + outbox.lostRecords(), 6U);
}

TEST(Outbox, AMetricThatFloodsBehindOneThatWaitsDoesNotMakeItGrow) {
  Outbox outbox({.records = 8, .bytes = 1000});
  outbox.addRecord({1, frame('a')});
  for (int number = 0; number < 10000; ++number) outbox.addRecord({2, frame('f')});
  EXPECT_EQ(outbox.records(), 8U);
  EXPECT_EQ(outbox.lostRecords(), 10001U - 8U);
  EXPECT_EQ(take(outbox, 64), "!afffffff");
}

// Against a model that is as simple as can be: a list, searched.
TEST(Outbox, ManyRandomStepsAgreeWithAPlainModel) {
  std::mt19937 random(7);
  for (int round = 0; round < 200; ++round) {
    constexpr std::size_t room = 6;
    Outbox outbox({.records = room, .bytes = 1000});
    std::vector<std::pair<std::int64_t, char>> model;
    std::uint64_t lost = 0;
    Losses told;
    std::string got;
    std::string expected;
    for (int step = 0; step < 200; ++step) {
      if (random() % 3 != 0) {
        const auto metric = static_cast<std::int64_t>(random() % 4);
        const char mark = static_cast<char>('a' + random() % 26);
        if (model.size() == room) {
          auto victim = std::find_if(model.begin(), model.end(), [&](const auto& one) { return one.first == metric; });
          if (victim == model.end()) {
            // Which of equally frequent metrics loses is open: the outbox decides, the model follows by the count.
            break;
          }
          model.erase(victim);
          ++lost;
        }
        model.emplace_back(metric, mark);
        outbox.addRecord({metric, frame(static_cast<std::uint8_t>(mark))});
      } else {
        const std::size_t most = 1 + random() % 4;
        std::string taken = take(outbox, most, &told);
        const bool said = !taken.empty() && taken[0] == '!';
        const std::size_t records = std::min(model.size(), said ? most - 1 : most);
        if (said) taken.erase(0, 1);
        got += taken;
        for (std::size_t index = 0; index < records; ++index) expected += model[index].second;
        model.erase(model.begin(), model.begin() + static_cast<std::ptrdiff_t>(records));
        ASSERT_EQ(told.count, lost);
      }
      ASSERT_EQ(outbox.records(), model.size());
      ASSERT_EQ(outbox.lostRecords(), lost);
    }
    EXPECT_EQ(got, expected) << "round " << round;
  }
}

TEST(Outbox, HoldsFourThousandAndNinetySixRecordsAndNotOneMore) {
  Outbox outbox({});
  for (int number = 0; number < 4096; ++number) outbox.addRecord({number % 30, frame('r')});
  EXPECT_EQ(outbox.records(), 4096U);
  EXPECT_EQ(outbox.lostRecords(), 0U);
  outbox.addRecord({7, frame('r')});
  EXPECT_EQ(outbox.records(), 4096U);
  EXPECT_EQ(outbox.lostRecords(), 1U);
}

TEST(Outbox, HoldsEightMebibytesAndNotOneByteMore) {
  Outbox outbox({});
  for (int number = 0; number < 64; ++number) outbox.addRecord({number % 3, frame('r', 128 * 1024)});
  EXPECT_EQ(outbox.lostRecords(), 0U);
  outbox.addRecord({2, frame('r')});
  EXPECT_EQ(outbox.records(), 64U);
  EXPECT_EQ(outbox.lostRecords(), 1U);
}

}  // namespace
}  // namespace probeview
