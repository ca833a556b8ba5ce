// SPDX-License-Identifier: Apache-2.0
//
// probeview-pictures as a person starts it.
#include <gtest/gtest.h>
#include <sys/wait.h>

#include <QImage>
#include <QString>
#include <cstdio>
#include <filesystem>
#include <string>

#include "tests/app/radixd_process.h"

namespace probeview {
namespace {

struct Outcome {
  int status;
  std::string output;  // standard output and standard error
};

Outcome run(const std::string& arguments) {
  std::FILE* pipe = ::popen((std::string(PROBEVIEW_PICTURES " ") + arguments + " 2>&1 </dev/null").c_str(), "r");
  if (!pipe) return {-1, ""};
  std::string output;
  char buffer[4096];
  for (std::size_t count = 0; (count = std::fread(buffer, 1, sizeof buffer, pipe)) > 0;) output.append(buffer, count);
  const int status = ::pclose(pipe);
  return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, output};
}

TEST(PicturesProgram, DrawsThePagesOfALiveService) {
  RadixdProcess radixd("scenario:city,seed=1");
  ASSERT_TRUE(radixd.start());
  const TemporaryFolder folder;
  const std::string live = folder.path() + "/live.png";
  const std::string socket = radixd.socket();
  ::unsetenv("RADIXD_SOCKET");
  const auto drawn = run(live + " --socket " + socket);
  EXPECT_EQ(drawn.status, 0) << drawn.output;
  const QImage picture(QString::fromStdString(live));
  // Launch list, category list and three pages; light and dark.
  EXPECT_EQ(picture.size(), QSize(5 * (360 + 28) + 28, 2 * (720 + 28) + 28));
  // A page with values is drawn: the card of the serving cell reaches far down.
  const int servingCell = 28 + 3 * (360 + 28);
  EXPECT_NE(picture.pixelColor(servingCell + 180, 28 + 400), picture.pixelColor(28 + 180, 28 + 400));
}

TEST(PicturesProgram, ShowsItsVersion) {
  const auto shown = run("--version");
  EXPECT_EQ(shown.status, 0);
  EXPECT_EQ(shown.output, "probeview-pictures " PROBEVIEW_VERSION "\n");
}

TEST(PicturesProgram, RefusesACommandLineThatItDoesNotUnderstand) {
  EXPECT_EQ(run("").status, 2);
  EXPECT_EQ(run("a.png --look sepia").status, 2);
  EXPECT_EQ(run("a.png --frame gold").status, 2);
}

}  // namespace
}  // namespace probeview
