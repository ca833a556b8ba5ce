// SPDX-License-Identifier: Apache-2.0
#include "app/viewer.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstring>
#include <memory>
#include <ostream>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>

#include "app/application.h"
#include "platform/console_log.h"
#include "platform/file_descriptor.h"
#include "platform/system_log.h"
#include "platform/time_zone.h"
#include "ui/open_page.h"
#include "ui/print_front.h"
#include "ui/terminal/terminal_front.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// The descriptor of a log's file, or none with the reason in errno. A pipe is not waited for until somebody reads it.
int openLogFile(const std::string& path) {
  const int file = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC | O_NONBLOCK, 0600);
  if (file >= 0) ::fcntl(file, F_SETFL, ::fcntl(file, F_GETFL) & ~O_NONBLOCK);
  return file;
}

// Names standard output, where it is to have the log beside or instead of pages.
constexpr std::string_view standardOutput = "-";

// The logs live as long as the process: wrapper and store keep referring to them.
bool chooseLogs(const ViewerOptions& options, FrontKind front, std::ostream& errors) {
  const bool isTerminal = front == FrontKind::Terminal;
  if (options.logFile == standardOutput) {
    if (isTerminal) {
      errors << "the console log would be written across the pages in the terminal; name a file with --log\n";
      return false;
    }
    setConsoleLog(*new ConsoleLog(STDOUT_FILENO));
  } else if (options.logFile) {
    const int file = openLogFile(*options.logFile);
    if (file < 0) {
      errors << "the log file " << onOneLine(*options.logFile)
             << " cannot be written: " << (errno == ENXIO ? "nobody reads this pipe" : std::strerror(errno))
             << "; name another with --log\n";
      return false;
    }
    setConsoleLog(*new ConsoleLog(file));
  } else if (options.pagesOnly || front != FrontKind::Window) {
    // Who asks for pages is not given a log as well.
    setConsoleLog(*new DiscardingSink);
  }
  if (options.pagesOnly || isTerminal) setSystemLog(*new SystemLog("probeview", SystemLog::Echo::None));
  return true;
}

// The toolkit aborts without them.
constexpr std::size_t descriptorsOfAWindow = 64;

// A front, and what it is to know of the session before it shows it.
struct MadeFront {
  std::unique_ptr<Front> front;  // null, with the error, when there can be none
  BeforeShowing prepare;
};

MadeFront makePrintFront(std::ostream& errors) {
  auto front = std::make_unique<PrintFront>(STDOUT_FILENO);
  PrintFront& print = *front;
  return {std::move(front), [&print, &errors](MetricSession& session) {
            print.failWith([&session] { return session.serviceTrouble(); }, errors);
            print.waitUntil([&session] { return session.isFilled(); });
          }};
}

MadeFront makeFront(FrontKind kind, const MakeWindow& makeWindow, std::ostream& errors, std::string& error) {
  switch (kind) {
    case FrontKind::Window:
      if (makeWindow && mayOpenDescriptors(descriptorsOfAWindow)) return {makeWindow(), {}};
      error = makeWindow ? "a window needs " + std::to_string(descriptorsOfAWindow) +
                               " more open files than this process may have; raise the limit (ulimit -n)"
                         : "this build has no window; --terminal and --print show the pages without one";
      return {};
    case FrontKind::Terminal:
      return {terminal::TerminalFront::make(error), {}};
    case FrontKind::Print:
      return makePrintFront(errors);
  }
  return {};
}

int show(const ViewerOptions& options, const MakeWindow& makeWindow, std::ostream& errors) {
  const FrontKind kind = chooseFront(frontCircumstances(options.front, makeWindow != nullptr));
  if (!chooseLogs(options, kind, errors)) return 1;
  std::string error;
  const MadeFront made = makeFront(kind, makeWindow, errors, error);
  if (!made.front) {
    errors << error << "\n";
    return 1;
  }
  AppDelegate delegate;
  return applicationMain(delegate, *made.front, [&](MetricSession& session) {
    if (options.pageKey) openPage(session.navigation(), *options.pageKey);
    if (made.prepare) made.prepare(session);
  });
}

}  // namespace

int runViewer(const ViewerOptions& options, const MakeWindow& makeWindow, std::ostream& errors) {
  // A reader that goes away is an end, not an accident.
  std::signal(SIGPIPE, SIG_IGN);
  if (const auto trouble = settleTimeZone()) errors << *trouble << "\n";
  try {
    return show(options, makeWindow, errors);
  } catch (const std::system_error& error) {
    // No descriptors or no threads are left to this process.
    errors << "the pages cannot be shown: " << error.what() << "\n";
    return 1;
  }
}

}  // namespace probeview
