// SPDX-License-Identifier: Apache-2.0
#include "ui/print_front.h"

#include <fcntl.h>

#include <algorithm>
#include <csignal>
#include <sstream>

#include "platform/file_descriptor.h"
#include "tests/support/harmless.h"
#include "tests/ui/testing.h"
#include "ui/open_page.h"
#include "ui/varnet_view_items.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

struct Pipe {
  Pipe() {
    int ends[2] = {};
    EXPECT_EQ(::pipe2(ends, O_CLOEXEC), 0);
    reading = FileDescriptor(ends[0]);
    writing = FileDescriptor(ends[1]);
    // All pages fit, so that nobody needs to read meanwhile.
    ::fcntl(writing.number(), F_SETPIPE_SZ, 1 << 18);
  }
  FileDescriptor reading;
  FileDescriptor writing;
};

class Printing : public testing_ui::PagesTest {
 protected:
  std::string printed() {
    pipe.writing.close();
    std::string text;
    char buffer[4096];
    for (ssize_t count = 0; (count = ::read(pipe.reading.number(), buffer, sizeof buffer)) > 0;) {
      text.append(buffer, static_cast<std::size_t>(count));
    }
    return text;
  }

  Pipe pipe;
  PrintFront front{pipe.writing.number()};
  NavigationStack stack{InterfaceDescription(PageEnvironment{front.mainQueue(), front.scheduler(), console, store})};
  const StatusSource status = [] { return Status{Status::Kind::Live, "the status"}; };
};

TEST_F(Printing, EveryPageIsPrintedOnceInTheOrderOfTheListsAndThenTheStatus) {
  EXPECT_EQ(front.run(stack, status), 0);
  EXPECT_EQ(stack.depth(), 1u);
  const auto text = printed();
  std::size_t at = 0;
  std::size_t headings = 0;
  for (const auto& technology : launchViewItems().launchViewItemNames) {
    for (const auto& category : launchViewItems().firstLevelViewItems.at(technology)) {
      at = text.find("probeview › " + technology + " › " + category + "\n", at);
      ASSERT_NE(at, std::string::npos) << technology << " " << category;
      ++at;
    }
  }
  for (std::size_t place = text.find("probeview › "); place != std::string::npos;
       place = text.find("probeview › ", place + 1)) {
    ++headings;
  }
  EXPECT_EQ(headings, navigablePageKeys().size());
  EXPECT_NE(text.find("probeview › LTE › Tx Power\n"
                      "TxPowerInfo 0\n"
                      "  Waiting for Update  Waiting for Update\n\n"),
            std::string::npos);
  EXPECT_TRUE(text.ends_with("\n\nthe status\n"));
}

TEST_F(Printing, AStackThatStandsOnAPagePrintsThatPageAlone) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"state", Value::text("IDLE")}};
  ASSERT_TRUE(openPage(stack, "LTE RRC State"));
  EXPECT_EQ(front.run(stack, status), 0);
  EXPECT_EQ(printed(),
            "probeview › LTE › RRC State\n"
            "  state  IDLE\n\n"
            "the status\n");
}

TEST_F(Printing, WhatAPeerSaysSteersNoTerminal) {
  store.filled[DisplayDictionary::myLTERRCStateDict] =
      Dictionary{{Key::copy(hostileText()), Value::text(hostileText())}, {"state", Value::text("a\x1b[2J\nb")}};
  ASSERT_TRUE(openPage(stack, "LTE RRC State"));
  EXPECT_EQ(front.run(stack, status), 0);
  const std::string text = printed();
  EXPECT_TRUE(areHarmless(text)) << text;
  EXPECT_NE(text.find("  a\\u{1b}[2J\\nb\n"), std::string::npos) << text;
}

TEST_F(Printing, AReasonOfTheServiceSteersNoTerminal) {
  std::ostringstream errors;
  front.failWith([] { return hostileText(); }, errors);
  EXPECT_EQ(front.run(stack, status), 1);
  EXPECT_TRUE(areHarmless(errors.str())) << errors.str();
  EXPECT_EQ(std::ranges::count(errors.str(), '\n'), 1);
}

TEST_F(Printing, NothingIsPrintedBeforeTheStoreIsFilled) {
  ASSERT_TRUE(openPage(stack, "LTE RRC State"));
  front.mainQueue().post([this] {
    store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"came", Value::text("late")}};
  });
  front.waitUntil([this] { return store.myLTERRCStateDict().has_value(); });
  EXPECT_EQ(front.run(stack, status), 0);
  EXPECT_NE(printed().find("came  late"), std::string::npos);
}

TEST_F(Printing, WhenNothingCanComeTheReasonIsToldInsteadOfPagesAndNothingIsWaitedFor) {
  std::ostringstream errors;
  front.failWith([] { return "nobody is there"; }, errors);
  bool waited = false;
  front.waitUntil([&waited] { return waited = true; });
  EXPECT_EQ(front.run(stack, status), 1);
  EXPECT_EQ(errors.str(), "nobody is there\n");
  EXPECT_EQ(printed(), "");
  EXPECT_FALSE(waited);
}

TEST_F(Printing, ThatNothingCanComeIsAlsoSeenAfterTheWait) {
  std::ostringstream errors;
  std::string reason;
  front.failWith([&reason] { return reason; }, errors);
  front.waitUntil([&reason] {
    reason = "nobody came";
    return true;
  });
  EXPECT_EQ(front.run(stack, status), 1);
  EXPECT_EQ(errors.str(), "nobody came\n");
  EXPECT_EQ(printed(), "");
}

TEST_F(Printing, AReaderThatWentAwayEndsThePrintingInPeace) {
  std::signal(SIGPIPE, SIG_IGN);
  pipe.reading.close();
  EXPECT_EQ(front.run(stack, status), 0);
  EXPECT_EQ(stack.depth(), 1u);
  std::signal(SIGPIPE, SIG_DFL);
}

TEST_F(Printing, AKeyThatNoRowsJoinToOpensNothing) {
  EXPECT_FALSE(openPage(stack, "LTE"));
  EXPECT_FALSE(openPage(stack, "Connected Serv Cell Meas"));
  EXPECT_FALSE(openPage(stack, "lte tx power"));
  EXPECT_EQ(stack.depth(), 1u);
  for (const auto& key : navigablePageKeys()) {
    EXPECT_TRUE(openPage(stack, key)) << key;
    EXPECT_EQ(stack.depth(), 3u);
  }
}

TEST_F(Printing, PagesThatFindNoRoomOnTheDiskEndWithStatusOneAndTheReason) {
  const FileDescriptor full(::open("/dev/full", O_WRONLY | O_CLOEXEC));
  PrintFront toFull(full.number());
  std::ostringstream errors;
  toFull.failWith([] { return std::string(); }, errors);
  EXPECT_EQ(toFull.run(stack, status), 1);
  EXPECT_EQ(errors.str(), "the pages could not be written: No space left on device\n");
}

}  // namespace
}  // namespace probeview
