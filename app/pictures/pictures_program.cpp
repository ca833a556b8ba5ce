// SPDX-License-Identifier: Apache-2.0
#include "app/pictures/pictures_program.h"

#include <cstdlib>
#include <optional>
#include <ostream>

#include "app/application.h"
#include "platform/command_line.h"
#include "platform/console_log.h"
#include "platform/file_descriptor.h"
#include "platform/system_log.h"
#include "platform/time_zone.h"
#include "radix/socket_path.h"
#include "ui/qt/pictures.h"
#include "ui/qt/toolkit_messages.h"

namespace probeview {

namespace {

// The toolkit aborts without them.
constexpr std::size_t descriptorsNeeded = 64;

}  // namespace

int runPicturesProgram(int argc, char** argv, std::ostream& output, std::ostream& errors) {
  CommandLine program(
      "probeview-pictures",
      "Draws pages of the viewer into one PNG file, without a display: the launch list, a category list and category\n"
      "pages, in a light and a dark look. Waits until every metric has come once, at most 15 s.");
  qt::PicturesOptions options;
  options.pageKeys = {"LTE RRC State", "LTE Serving Cell Info", "LTE EUTRA Neighbor Info"};
  program.option("OUTPUT", options.outputPath, "The PNG file").required();
  std::optional<std::string> socketPath;
  program
      .option("--socket", socketPath, "The service's socket; otherwise $RADIXD_SOCKET, the user's, then the system's")
      .typeName("PATH")
      .check(radix::socketPathTrouble);
  program
      .option("--page", options.pageKeys,
              "A category page, such as \"LTE Serving Cell Info\"; may be given several times (default: three "
              "pages of LTE)")
      .typeName("KEY")
      .oneEachTime();
  std::string look = "both";
  program.option("--look", look, "light, dark or both").oneOf({"light", "dark", "both"}).showDefault();
  if (const std::optional<int> status = program.parse(argumentsOf(argc, argv), output, errors)) return *status;
  options.light = look != "dark";
  options.dark = look != "light";
  if (socketPath) setenv("RADIXD_SOCKET", socketPath->c_str(), 1);
  if (const auto trouble = settleTimeZone()) errors << *trouble << "\n";
  if (!mayOpenDescriptors(descriptorsNeeded)) {
    errors << "the pictures need " << descriptorsNeeded
           << " more open files than this process may have; raise the limit (ulimit -n)\n";
    return 1;
  }
  // The picture is the only output.
  setConsoleLog(*new DiscardingSink);
  setSystemLog(*new SystemLog("probeview", SystemLog::Echo::None));
  qt::logToolkitMessages();
  int noArguments = 1;
  const auto front = qt::makePicturesFront(noArguments, argv, options, errors);
  AppDelegate delegate;
  return applicationMain(delegate, *front,
                         [&](MetricSession& session) { front->waitUntil([&session] { return session.isFilled(); }); });
}

}  // namespace probeview
