// SPDX-License-Identifier: Apache-2.0
#include "app/front_choice.h"

#include <gtest/gtest.h>

namespace probeview {
namespace {

TEST(FrontChoice, WhatIsAskedForIsTakenWhateverTheCircumstances) {
  for (const auto asked : {FrontKind::Window, FrontKind::Terminal, FrontKind::Print}) {
    EXPECT_EQ(chooseFront({asked, true, true, true}), asked);
    EXPECT_EQ(chooseFront({asked, false, false, false}), asked);
  }
}

TEST(FrontChoice, AWindowNeedsADisplayAndABuildThatHasIt) {
  EXPECT_EQ(chooseFront({std::nullopt, true, true, true}), FrontKind::Window);
  EXPECT_EQ(chooseFront({std::nullopt, true, false, true}), FrontKind::Terminal);
  EXPECT_EQ(chooseFront({std::nullopt, false, true, true}), FrontKind::Terminal);
}

TEST(FrontChoice, WithNeitherDisplayNorTerminalThePagesArePrinted) {
  EXPECT_EQ(chooseFront({std::nullopt, true, false, false}), FrontKind::Print);
}

}  // namespace
}  // namespace probeview
