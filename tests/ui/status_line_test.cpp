// SPDX-License-Identifier: Apache-2.0
#include "ui/status_line.h"

#include <gtest/gtest.h>

#include <ostream>

#include "platform/manual_loop.h"
#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

// For the messages of a test that fails.
static std::ostream& operator<<(std::ostream& out, const Status& status) {
  return out << statusKindName(status.kind) << ": " << status.text;
}

namespace {

using namespace std::chrono_literals;

using StatusKind = Status::Kind;
using radix::client::SourceState;
using Phase = SourceState::Phase;

constexpr std::int64_t rrcState = 0x3C4E04;
constexpr std::int64_t servingCell = 0x3C40C2;

class StatusLines : public testing::Test {
 protected:
  ManualLoop clock;  // 2024-03-05 12:00:00 UTC
  FixedTimeZone zone{3600, "CET"};
  StatusLine line{clock, zone};
  ServiceStatus service = connected();

  ServiceStatus connected() {
    ServiceStatus status;
    status.connection.connected = true;
    status.connection.since = clock.wallTime();
    status.connection.everConnected = true;
    status.connection.configuration = ConfigurationOutcome::Accepted;
    return status;
  }
  void goAway(std::chrono::milliseconds since) {
    service.connection.connected = false;
    service.connection.since = since;
    service.connection.sources.reset();
  }
  void setSources(std::vector<SourceState> sources) { service.connection.sources = std::move(sources); }
  // A record arrives now, so old already.
  void receive(std::int64_t metric, const std::string& origin,
               std::optional<std::chrono::milliseconds> period = std::nullopt,
               std::optional<std::chrono::milliseconds> age = std::chrono::milliseconds(0)) {
    ServiceStatus::LastRecord record;
    record.metricId = metric;
    record.origin = origin;
    record.receivedWallTime = clock.wallTime();
    record.receivedAgeTime = clock.ageTime();
    record.age = age;
    record.period = period;
    service.lastRecords[metric] = record;
    service.lastRecord = record;
  }
  // On the lists, and on a page that the metrics fill.
  Status onLists() { return line.status({.service = service}); }
  Status onPage(PageFeed feed) { return line.status({.service = service, .feed = std::move(feed)}); }

  static SourceState source(std::string origin, Phase phase = Phase::Running, std::string reason = "",
                            std::vector<std::int64_t> metrics = {rrcState, servingCell}) {
    SourceState state;
    state.origin = std::move(origin);
    state.phase = phase;
    state.reason = std::move(reason);
    state.metrics = std::move(metrics);
    return state;
  }
};

TEST_F(StatusLines, WhileRecordsComeItNamesTheirOriginAndTheAgeOfTheLastOne) {
  receive(rrcState, "scenario:city");
  clock.advance(449ms);
  EXPECT_EQ(onLists(), (Status{StatusKind::Live, "scenario:city · 0.4 s ago"}));
}

TEST_F(StatusLines, ARecordWithoutOriginIsTheLastRecord) {
  receive(rrcState, "");
  setSources({source("scenario:city")});
  EXPECT_EQ(onLists(), (Status{StatusKind::Live, "Last record 0.0 s ago"}));
}

TEST_F(StatusLines, TheAgeOfARecordIsHowOldItWasWhenItLeftTheServiceAndWhatHasGoneBySince) {
  receive(rrcState, "trace:drive.csv", 0ms, 180s);
  EXPECT_EQ(onLists().text, "trace:drive.csv · 3 min ago");
  clock.setWallTime(clock.wallTime() - 48h);
  clock.advance(60s);
  EXPECT_EQ(onLists().text, "trace:drive.csv · 4 min ago") << "whatever happens to the time of day";
}

TEST_F(StatusLines, ValuesGrowOlderWhileTheDeviceSleeps) {
  setSources({source("scenario:city"), source("trace:drive.csv", Phase::Ended)});
  receive(rrcState, "scenario:city", 1s);
  receive(servingCell, "trace:drive.csv", 0ms);
  clock.sleep(8h);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · source silent for 8 h"}));
  EXPECT_EQ(onPage({servingCell}), (Status{StatusKind::Ended, "trace:drive.csv · 8 h ago · trace ended"}));
}

TEST_F(StatusLines, OfARecordWhoseAgeTheServiceDoesNotTellItSaysOnlyWhenItWasReceived) {
  receive(rrcState, "scenario:city", std::nullopt, std::nullopt);
  clock.advance(400ms);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Live, "scenario:city · received 0.4 s ago"}));
  receive(rrcState, "", std::nullopt, std::nullopt);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Live, "Last record received 0.0 s ago"}));
}

TEST_F(StatusLines, OnAPageItSpeaksOfTheMetricThatFillsThePageAndOnTheListsOfTheLastRecordOfAll) {
  receive(rrcState, "scenario:city", 0ms);
  clock.advance(5s);
  receive(servingCell, "trace:drive.csv", 0ms);
  clock.advance(1s);
  EXPECT_EQ(onLists().text, "trace:drive.csv · 1.0 s ago");
  EXPECT_EQ(onPage({servingCell}).text, "trace:drive.csv · 1.0 s ago");
  EXPECT_EQ(onPage({rrcState}).text, "scenario:city · 6.0 s ago") << "of two sources the one that filled the page";
  EXPECT_EQ(onPage({0x3C0013}),
            (Status{StatusKind::Waiting, "Connected to the baseband service, nothing received yet for this page"}));
}

TEST_F(StatusLines, WhereSeveralMetricsFillAPageTheYoungestRecordCounts) {
  receive(rrcState, "scenario:city", 0ms);
  clock.advance(5s);
  // Comes last and yet is older.
  receive(servingCell, "trace:drive.csv", 0ms, 60s);
  EXPECT_EQ(onPage({servingCell, rrcState}).text, "scenario:city · 5.0 s ago");
  EXPECT_EQ(onPage({rrcState, servingCell}).text, "scenario:city · 5.0 s ago");
}

TEST_F(StatusLines, APageThatNoMetricFillsSaysSoWhateverComes) {
  receive(rrcState, "scenario:city");
  setSources({source("scenario:city")});
  EXPECT_EQ(onPage({}), (Status{StatusKind::Unfillable, "no metric fills this page"}));
}

TEST_F(StatusLines, ARecordIsStaleWhenItIsOlderThanTenSecondsAndThanThreePeriods) {
  const auto kindAfter = [&](std::chrono::milliseconds period, std::chrono::milliseconds age) {
    receive(rrcState, "scenario:city", period, age);
    return onPage({rrcState}).kind;
  };
  setSources({source("scenario:city")});
  EXPECT_EQ(kindAfter(1s, 10s), StatusKind::Live);
  EXPECT_EQ(kindAfter(1s, 10001ms), StatusKind::Stale);
  EXPECT_EQ(kindAfter(3333ms, 10s), StatusKind::Live);
  EXPECT_EQ(kindAfter(3333ms, 10001ms), StatusKind::Stale);
  EXPECT_EQ(kindAfter(10s, 30s), StatusKind::Live);
  EXPECT_EQ(kindAfter(10s, 30001ms), StatusKind::Stale);
  EXPECT_EQ(kindAfter(radix::longestSpan, radix::longestSpan), StatusKind::Live);
}

TEST_F(StatusLines, WhatComesOnChangeOrIsAskedForOnceIsNeverStaleWhileItsSourceRuns) {
  setSources({source("scenario:city")});
  receive(rrcState, "scenario:city", 0ms);
  clock.advance(1000h);
  EXPECT_EQ(onLists(), (Status{StatusKind::Live, "scenario:city · 41 d ago"}));
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Live, "scenario:city · 41 d ago"}));
}

TEST_F(StatusLines, WhereTheServiceNamesNoPeriodNothingIsCalledStale) {
  receive(rrcState, "scenario:city");
  clock.advance(1000h);
  EXPECT_EQ(onPage({rrcState}).kind, StatusKind::Live);
}

TEST_F(StatusLines, ASourceOfWhichNothingComesIsSilentForAsLongAsItsYoungestRecordIsOld) {
  setSources({source("scenario:city"), source("trace:drive.csv")});
  receive(rrcState, "scenario:city", 1s);
  clock.advance(180s);
  receive(servingCell, "scenario:city", 0ms);
  clock.advance(125s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · 5 min ago · source silent for 2 min"}));
  receive(rrcState, "scenario:city", 1s);
  clock.advance(120s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · source silent for 2 min"}));
  EXPECT_EQ(onLists(), (Status{StatusKind::Stale, "scenario:city · source silent for 2 min"}));
  // Another source is another matter.
  receive(servingCell, "trace:drive.csv", 1s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · source silent for 2 min"}));
  EXPECT_EQ(onLists(), (Status{StatusKind::Live, "trace:drive.csv · 0.0 s ago"}));
}

TEST_F(StatusLines, AMetricThatStopsWhileItsSourceGoesOnIsStaleAndTheSourceIsNotCalledSilent) {
  setSources({source("scenario:city")});
  receive(rrcState, "scenario:city", 1s);
  clock.advance(120s);
  receive(servingCell, "scenario:city", 1s);
  clock.advance(10s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · 2 min ago, stale"}));
}

TEST_F(StatusLines, ASourceThatKeepsToALongPeriodIsNotCalledSilentWhenAShortOneStops) {
  setSources({source("scenario:city")});
  receive(servingCell, "scenario:city", 60s);
  receive(rrcState, "scenario:city", 1s);
  clock.advance(20s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · 20 s ago, stale"}));
  EXPECT_EQ(onPage({servingCell}), (Status{StatusKind::Live, "scenario:city · 20 s ago"}));
  clock.advance(160s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · 3 min ago, stale"})) << "three periods";
  clock.advance(1s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · source silent for 3 min"}));
}

TEST_F(StatusLines, ASourceThatHasJustToldAChangeIsNotSilent) {
  setSources({source("scenario:city")});
  receive(rrcState, "scenario:city", 1s);
  clock.advance(30s);
  receive(servingCell, "scenario:city", 0ms);
  clock.advance(10s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · 40 s ago, stale"}));
  clock.advance(1ms);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "scenario:city · 40 s ago · source silent for 10 s"}));
}

TEST_F(StatusLines, ATraceThatHasEndedIsSaidToHaveEndedHoweverYoungItsLastRecordIs) {
  setSources({source("trace:drive.csv", Phase::Ended)});
  receive(rrcState, "trace:drive.csv", 0ms);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Ended, "trace:drive.csv · 0.0 s ago · trace ended"}));
  clock.advance(180s);
  EXPECT_EQ(onLists(), (Status{StatusKind::Ended, "trace:drive.csv · 3 min ago · trace ended"}));
}

TEST_F(StatusLines, AnotherSourceThatEndsIsNoTrace) {
  setSources({source("modem", Phase::Ended)});
  receive(rrcState, "modem", 1s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Ended, "modem · 0.0 s ago · source ended"}));
}

TEST_F(StatusLines, ASourceThatHasFailedSaysWhy) {
  setSources({source("trace:drive.csv", Phase::Failed, "row 7 is no row")});
  receive(rrcState, "trace:drive.csv", 1s, 120s);
  EXPECT_EQ(onPage({rrcState}),
            (Status{StatusKind::Failed, "trace:drive.csv · 2 min ago · source failed: row 7 is no row"}));
  setSources({source("trace:drive.csv", Phase::Failed)});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Failed, "trace:drive.csv · 2 min ago · source failed"}));
}

TEST_F(StatusLines, OfTwoSourcesOfOneNameTheOneThatRunsCounts) {
  for (const bool runsFirst : {false, true}) {
    setSources({source("scenario:city", runsFirst ? Phase::Running : Phase::Failed),
                source("scenario:city", runsFirst ? Phase::Failed : Phase::Running)});
    receive(rrcState, "scenario:city", 1s);
    EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Live, "scenario:city · 0.0 s ago"}));
  }
}

TEST_F(StatusLines, WhatASourceLeftThatTheServiceNoLongerHasIsNotLive) {
  setSources({source("scenario:city")});
  receive(rrcState, "trace:drive.csv", 0ms, 60s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Ended, "trace:drive.csv · 1 min ago · no longer a source"}));
}

TEST_F(StatusLines, APageThatNothingHasFilledYetNamesTheSourceThatMay) {
  setSources({source("scenario:city")});
  EXPECT_EQ(onLists(), (Status{StatusKind::Waiting, "nothing received yet from scenario:city"}));
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Waiting, "nothing received yet from scenario:city"}));
  setSources({source("trace:drive.csv", Phase::Running, "", {servingCell}), source("scenario:city")});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Waiting, "nothing received yet from scenario:city"}));
  EXPECT_EQ(onPage({servingCell}),
            (Status{StatusKind::Waiting, "nothing received yet from trace:drive.csv and scenario:city"}));
  setSources({source("a"), source("b"), source("c")});
  EXPECT_EQ(onLists(), (Status{StatusKind::Waiting, "nothing received yet from any of 3 sources"}));
}

TEST_F(StatusLines, APageThatNoSourceCanFillSaysSo) {
  setSources({source("trace:x.csv", Phase::Running, "", {servingCell})});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Unfillable, "trace:x.csv cannot fill this page"}));
  EXPECT_EQ(onPage({rrcState, servingCell}), (Status{StatusKind::Waiting, "nothing received yet from trace:x.csv"}));
  EXPECT_EQ(onLists(), (Status{StatusKind::Waiting, "nothing received yet from trace:x.csv"}));
  setSources({source("trace:x.csv", Phase::Ended, "", {servingCell}), source("trace:y.csv", Phase::Running, "", {})});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Unfillable, "trace:x.csv and trace:y.csv cannot fill this page"}));
  setSources(
      {source("a", Phase::Running, "", {}), source("b", Phase::Running, "", {}), source("c", Phase::Running, "", {})});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Unfillable, "none of the 3 sources can fill this page"}));
  setSources({});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Unfillable, "the baseband service has no source"}));
}

TEST_F(StatusLines, WhereTheOnlySourceIsGoneBeforeAnythingCameItSaysHow) {
  setSources({source("trace:x.csv", Phase::Ended)});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Ended, "trace:x.csv · trace ended, nothing received"}));
  setSources({source("trace:x.csv", Phase::Ended), source("trace:y.csv", Phase::Failed, "it is a folder")});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Failed, "trace:y.csv · source failed: it is a folder"}));
}

TEST_F(StatusLines, WhereNotAllSourcesAreToldNothingIsConcludedFromThoseThatAre) {
  service.connection.areSourcesCut = true;
  setSources({source("scenario:city", Phase::Running, "", {servingCell})});
  const Status nothingOnPage{StatusKind::Waiting,
                             "Connected to the baseband service, nothing received yet for this page"};
  EXPECT_EQ(onPage({rrcState}), nothingOnPage) << "another may fill it";
  EXPECT_EQ(onPage({servingCell}), (Status{StatusKind::Waiting, "nothing received yet from scenario:city"}));
  setSources({source("scenario:city", Phase::Ended)});
  EXPECT_EQ(onPage({rrcState}), nothingOnPage) << "another may run";
  setSources({});
  EXPECT_EQ(onPage({rrcState}), nothingOnPage);
  EXPECT_EQ(onLists(), (Status{StatusKind::Waiting, "Connected to the baseband service, nothing received yet"}));
  receive(rrcState, "trace:drive.csv", 1s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Live, "trace:drive.csv · 0.0 s ago"}));
  clock.advance(60s);
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Stale, "trace:drive.csv · source silent for 1 min"}));
  setSources({source("trace:drive.csv", Phase::Ended)});
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Ended, "trace:drive.csv · 1 min ago · trace ended"}));
}

TEST_F(StatusLines, AServiceThatDoesNotSayWhatFeedsItHasSentNothingYet) {
  EXPECT_EQ(onLists(), (Status{StatusKind::Waiting, "Connected to the baseband service, nothing received yet"}));
}

TEST_F(StatusLines, ARefusedConfigurationIsSaidWithItsReasonWhateverIsKnown) {
  setSources({source("scenario:city")});
  receive(rrcState, "scenario:city", 1s);
  service.connection.configuration = ConfigurationOutcome::Refused;
  service.connection.configurationTrouble = "line 3, column 7: an equals sign is missing";
  const Status refused{StatusKind::Failed, "configuration refused: line 3, column 7: an equals sign is missing"};
  EXPECT_EQ(onLists(), refused);
  EXPECT_EQ(onPage({rrcState}), refused);
  EXPECT_EQ(onPage({}), refused);
}

TEST_F(StatusLines, AConfigurationThatIsNotAmongTheResourcesIsMissing) {
  service.connection.configuration = ConfigurationOutcome::NotPushed;
  setSources({source("scenario:city")});
  EXPECT_EQ(line.status({.service = service, .feed = PageFeed{rrcState}, .isConfigurationMissing = true}),
            (Status{StatusKind::Failed, "no configuration: resource missing"}));
}

TEST_F(StatusLines, WithoutAnAcceptedConfigurationItDoesNotPromiseThatSomethingComesFromASource) {
  setSources({source("scenario:city")});
  service.connection.configuration = ConfigurationOutcome::NotPushed;
  EXPECT_EQ(onLists(), (Status{StatusKind::Waiting, "no configuration pushed, nothing received yet"}));
  service.connection.configuration = ConfigurationOutcome::Unsent;
  service.connection.configurationTrouble = "no answer within 2 s";
  EXPECT_EQ(onLists(), (Status{StatusKind::Waiting, "configuration not taken yet: no answer within 2 s"}));
  // A service of an older kind sends all the same.
  receive(rrcState, "scenario:city", 1s);
  EXPECT_EQ(onLists(), (Status{StatusKind::Live, "scenario:city · 0.0 s ago"}));
}

TEST_F(StatusLines, WhileTheServiceIsAwayItSaysSinceWhenInLocalTime) {
  receive(rrcState, "scenario:city", 1s);
  goAway(clock.wallTime() + 190s);
  clock.advance(300s);
  EXPECT_EQ(onLists(), (Status{StatusKind::Away, "Baseband service away since 13:03:10, showing what was last known"}));
  EXPECT_EQ(onPage({rrcState}).text, "Baseband service away since 13:03:10, showing what was last known");
  EXPECT_EQ(onPage({servingCell}).text, "Baseband service away since 13:03:10, nothing received yet");
}

TEST_F(StatusLines, AServiceThatLeftBeforeAnythingCameLeftNothingToShow) {
  goAway(clock.wallTime());
  EXPECT_EQ(onLists(), (Status{StatusKind::Away, "Baseband service away since 13:00:00, nothing received yet"}));
}

TEST_F(StatusLines, AServiceThatLeftOnAnotherDayIsAwaySinceThatDay) {
  receive(rrcState, "modem");
  goAway(clock.wallTime() - 13h - 1s);
  EXPECT_EQ(onLists().text, "Baseband service away since 2024-03-04 23:59:59, showing what was last known");
}

TEST_F(StatusLines, BeforeTheServiceWasEverThereItWaits) {
  service = {};
  EXPECT_EQ(onLists(), (Status{StatusKind::Waiting, "Waiting for the baseband service"}));
}

TEST_F(StatusLines, WhileItWaitsItSaysWhyIfItKnows) {
  service = {};
  service.connection.trouble = "you may not connect to the baseband service at /run/radixd/radix.sock";
  EXPECT_EQ(onPage({rrcState}), (Status{StatusKind::Away,
                                        "Waiting for the baseband service · you may not connect to the baseband "
                                        "service at /run/radixd/radix.sock"}));
}

// Whatever a service says, the line stays one line of well-formed text, neither steers a terminal nor fills the window.
TEST_F(StatusLines, WhatAServiceSaysCannotBreakTheLine) {
  const std::string steering = "a\x1b[31m\n\xff\xc2\x9b";
  const std::string hostile = steering + std::string(5000, '\x1b') + steering;
  const auto expectTame = [](const Status& status) {
    EXPECT_TRUE(isValidUtf8(status.text));
    EXPECT_EQ(onOneLine(status.text), status.text);
    EXPECT_LT(status.text.size(), 400u);
    EXPECT_NE(status.text.find("…"), std::string::npos) << "what was cut is seen to be cut";
  };
  receive(rrcState, hostile, 1s);
  expectTame(onPage({rrcState}));
  for (const auto phase : {Phase::Running, Phase::Ended, Phase::Failed}) {
    setSources({source(hostile, phase, hostile)});
    expectTame(onPage({rrcState}));
    service.lastRecords.clear();
    expectTame(onPage({rrcState}));
    receive(rrcState, hostile, 1s);
    clock.advance(1h);
    expectTame(onPage({rrcState}));
  }
  service.connection.configuration = ConfigurationOutcome::Refused;
  service.connection.configurationTrouble = hostile;
  expectTame(onLists());
  service = {};
  service.connection.trouble = hostile;
  expectTame(onLists());
}

TEST_F(StatusLines, WhatWouldSteerATerminalShowsAsItsEscape) {
  receive(rrcState, "trace:\x1b[2Ja\nb.csv");
  EXPECT_EQ(onLists().text, "trace:\\u{1b}[2Ja\\nb.csv · 0.0 s ago");
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
