// SPDX-License-Identifier: Apache-2.0
#include "ui/status_line.h"

#include <gtest/gtest.h>

#include "platform/manual_loop.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

class Status : public testing::Test {
 protected:
  ManualLoop clock;  // 2024-03-05 12:00:00 UTC
  FixedTimeZone zone{3600, "CET"};
  StatusLine line{clock, zone};

  ServiceStatus connected() {
    ServiceStatus status;
    status.connection = {true, clock.wallTime(), true};
    return status;
  }
  ServiceStatus receiving(const std::string& origin) {
    auto status = connected();
    status.lastRecord = {origin, std::nullopt, clock.wallTime(), clock.monotonicTime()};
    return status;
  }
  ServiceStatus awaySince(std::chrono::milliseconds since, ServiceStatus status) {
    status.connection = {false, since, true};
    return status;
  }
};

TEST_F(Status, WhileRecordsComeItNamesTheirOriginAndTheAgeOfTheLastOne) {
  const auto status = receiving("scenario:city");
  clock.advance(449ms);
  EXPECT_EQ(line.text(status), "scenario:city · 0.4 s ago");
}

TEST_F(Status, ARecordWithoutOriginIsTheLastRecord) {
  const auto status = receiving("");
  EXPECT_EQ(line.text(status), "Last record 0.0 s ago");
}

TEST_F(Status, WhileTheServiceIsAwayItSaysSinceWhenInLocalTime) {
  const auto status = awaySince(clock.wallTime() + 190s, receiving("scenario:city"));
  clock.advance(300s);
  EXPECT_EQ(line.text(status), "Baseband service away since 13:03:10, showing what was last known");
}

TEST_F(Status, AServiceThatLeftBeforeAnythingCameLeftNothingToShow) {
  EXPECT_EQ(line.text(awaySince(clock.wallTime(), connected())),
            "Baseband service away since 13:00:00, nothing received yet");
}

TEST_F(Status, AServiceThatLeftOnAnotherDayIsAwaySinceThatDay) {
  const auto status = awaySince(clock.wallTime() - 13h - 1s, receiving("modem"));
  EXPECT_EQ(line.text(status), "Baseband service away since 2024-03-04 23:59:59, showing what was last known");
}

TEST_F(Status, BeforeTheServiceWasEverThereItWaits) {
  EXPECT_EQ(line.text(ServiceStatus{}), "Waiting for the baseband service");
}

TEST_F(Status, WhileItWaitsItSaysWhyIfItKnows) {
  ServiceStatus status;
  status.connection.trouble = "you may not connect to the baseband service at /run/radixd/radix.sock";
  EXPECT_EQ(line.text(status),
            "Waiting for the baseband service · you may not connect to the baseband service at "
            "/run/radixd/radix.sock");
}

TEST_F(Status, AServiceThatHasSentNothingYetIsConnected) {
  EXPECT_EQ(line.text(connected()), "Connected to the baseband service, nothing received yet");
}

TEST_F(Status, TheAgeIsThatOfItsArrivalAndIgnoresJumpsOfTheTimeOfDay) {
  const auto status = receiving("trace:drive-a.csv");
  clock.setWallTime(clock.wallTime() - 48h);
  clock.advance(2500ms);
  EXPECT_EQ(line.text(status), "trace:drive-a.csv · 2.5 s ago");
}

TEST(Age, AnAgeIsRoundedDownInTheUnitThatSuitsIt) {
  EXPECT_EQ(ageText(-1s), "0.0 s");
  EXPECT_EQ(ageText(0s), "0.0 s");
  EXPECT_EQ(ageText(999ms), "0.9 s");
  EXPECT_EQ(ageText(9999ms), "9.9 s");
  EXPECT_EQ(ageText(10s), "10 s");
  EXPECT_EQ(ageText(59999ms), "59 s");
  EXPECT_EQ(ageText(60s), "1 min");
  EXPECT_EQ(ageText(3599s), "59 min");
  EXPECT_EQ(ageText(1h), "1 h");
  EXPECT_EQ(ageText(47h), "47 h");
  EXPECT_EQ(ageText(48h), "2 d");
}

}  // namespace
}  // namespace probeview
