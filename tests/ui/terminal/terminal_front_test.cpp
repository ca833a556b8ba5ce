// SPDX-License-Identifier: Apache-2.0
//
// The real front in a real (pseudo) terminal: a child runs it, the test types and reads.
#include "ui/terminal/terminal_front.h"

#include <fcntl.h>
#include <poll.h>
#include <pty.h>
#include <sys/ioctl.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>
#include <utmp.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <map>

#include "platform/file_descriptor.h"
#include "tests/ui/testing.h"

namespace probeview::terminal {
namespace {

using namespace std::chrono_literals;

// A child whose terminal is ours.
class Screen {
 public:
  explicit Screen(const std::function<int()>& program, unsigned short width = 80, unsigned short height = 24,
                  const char* locale = "C.UTF-8") {
    winsize size{height, width, 0, 0};
    int master = -1;
    int slave = -1;
    EXPECT_EQ(::openpty(&master, &slave, nullptr, nullptr, &size), 0);
    // Before there is a child that could change them.
    ::tcgetattr(slave, &modesBefore_);
    child_ = ::fork();
    if (child_ == 0) {
      ::close(master);
      ::login_tty(slave);
      ::setenv("TERM", "xterm", 1);
      ::setenv("LC_ALL", locale, 1);
      ::_exit(program());
    }
    ::close(slave);
    terminal_ = FileDescriptor(master);
  }
  ~Screen() {
    if (child_ > 0) {
      ::kill(child_, SIGKILL);
      ::waitpid(child_, nullptr, 0);
    }
  }

  // Waits until the child has written the text, after what was waited for before. Whether it came.
  bool shows(const std::string& text) {
    const auto deadline = std::chrono::steady_clock::now() + 20s;
    while (true) {
      if (const auto found = written_.find(text, seen_); found != std::string::npos) {
        seen_ = found + text.size();
        return true;
      }
      if (std::chrono::steady_clock::now() > deadline || !readMore()) break;
    }
    ADD_FAILURE() << "the screen never showed: " << text;
    return false;
  }
  void type(const std::string& keys) {
    ASSERT_EQ(::write(terminal_.number(), keys.data(), keys.size()), static_cast<ssize_t>(keys.size()));
  }
  void resize(unsigned short width, unsigned short height) {
    const winsize size{height, width, 0, 0};
    ::ioctl(terminal_.number(), TIOCSWINSZ, &size);
  }
  void send(int signal) { ::kill(child_, signal); }
  void hangUp() { terminal_.close(); }

  // Waits for the child's end: its exit status, or minus the signal.
  int end() {
    while (terminal_ && readMore()) {
    }
    int status = 0;
    ::waitpid(child_, &status, 0);
    child_ = 0;
    return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
  }
  // After the end: whether the alternate screen was left and the line modes are as before.
  bool isGivenBack() const {
    termios modes{};
    ::tcgetattr(terminal_.number(), &modes);
    return written_.rfind("\x1b[?1049l") != std::string::npos &&
           written_.rfind("\x1b[?1049l") > written_.rfind("\x1b[?1049h") && modes.c_lflag == modesBefore_.c_lflag &&
           modes.c_iflag == modesBefore_.c_iflag && modes.c_oflag == modesBefore_.c_oflag;
  }
  const std::string& written() const { return written_; }

 private:
  bool readMore() {
    pollfd readable{terminal_.number(), POLLIN, 0};
    if (::poll(&readable, 1, 20000) <= 0) return false;
    char buffer[4096];
    const auto count = ::read(terminal_.number(), buffer, sizeof buffer);
    if (count <= 0) return false;
    written_.append(buffer, static_cast<std::size_t>(count));
    return true;
  }

  FileDescriptor terminal_;
  pid_t child_ = -1;
  termios modesBefore_{};
  std::string written_;
  std::size_t seen_ = 0;
};

// What the child runs: the front on the launch list over a store that is fed by hand.
int showPages(
    const std::function<void(TerminalFront&, testing_ui::HandFilledStore&)>& before = {},
    const StatusSource& status = [] {
      return Status{Status::Kind::Live, "the status"};
    }) {
  std::string error;
  const auto front = TerminalFront::make(error);
  if (!front) return 9;
  testing_ui::RememberedLines log;
  testing_ui::HandFilledStore store(log, log);
  store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"state", Value::text("KLTE_RRC_STATE_IDLE")}};
  NavigationStack stack(InterfaceDescription(PageEnvironment{front->mainQueue(), front->scheduler(), log, store}));
  if (before) before(*front, store);
  return front->run(stack, status);
}
const auto plainly = [] { return showPages(); };

TEST(Terminal, TheLaunchListIsShownWithTitleAndStatusAndQEndsIt) {
  Screen screen(plainly);
  EXPECT_TRUE(screen.shows("probeview"));
  EXPECT_TRUE(screen.shows("Device Info"));
  EXPECT_TRUE(screen.shows("UMTS"));
  EXPECT_TRUE(screen.shows("the status"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
  EXPECT_TRUE(screen.isGivenBack());
}

TEST(Terminal, ArrowsAndReturnGoInEscapeAndBackspaceGoOut) {
  Screen screen(plainly);
  ASSERT_TRUE(screen.shows("the status"));
  screen.type("\x1bOB\r");  // down, return
  EXPECT_TRUE(screen.shows("› LTE"));
  EXPECT_TRUE(screen.shows("C-DRX"));
  screen.type("\x1b[B\r");  // the same key as other terminals send it
  EXPECT_TRUE(screen.shows("RRC State"));
  EXPECT_TRUE(screen.shows("KLTE_RRC_STATE_IDLE"));
  screen.type("\x7f");
  EXPECT_TRUE(screen.shows("C-DRX"));
  screen.type("\x1b");
  EXPECT_TRUE(screen.shows("Device Info"));
  screen.type("\x1b");  // stays at the root
  screen.type("\x1bOC");
  EXPECT_TRUE(screen.shows("C-DRX")) << "the selection was kept";
  screen.type("\x1bOD");
  EXPECT_TRUE(screen.shows("Device Info"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, APageFollowsItsReload) {
  Screen screen([] {
    ScheduledTaskHandle change;
    return showPages([&](TerminalFront& front, testing_ui::HandFilledStore& store) {
      change = front.scheduler().after(2s, [&store] {
        store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"state", Value::text("CHANGED")}};
      });
    });
  });
  ASSERT_TRUE(screen.shows("the status"));
  screen.type("\x1bOB\r");
  ASSERT_TRUE(screen.shows("C-DRX"));
  screen.type("\x1bOB\r");
  EXPECT_TRUE(screen.shows("KLTE_RRC_STATE_IDLE"));
  EXPECT_TRUE(screen.shows("CHANGED"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, ATerminalThatChangesItsSizeIsDrawnAnew) {
  Screen screen(plainly);
  ASSERT_TRUE(screen.shows("the status"));
  screen.resize(30, 6);
  EXPECT_TRUE(screen.shows("the status"));
  screen.resize(3, 1);
  screen.resize(120, 40);
  EXPECT_TRUE(screen.shows("Device Info"));
  EXPECT_TRUE(screen.shows("the status"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, TheKeysThatMatterAreShownAt40ColumnsBesideAnyStatus) {
  const std::string status = "a status that is a good deal longer than the line that it stands on";
  Screen screen([&] { return showPages({}, [&] { return Status{Status::Kind::Live, status}; }); }, 40, 20);
  EXPECT_TRUE(screen.shows("↑↓ Return  ? keys  q quit"));
  EXPECT_TRUE(screen.shows("• " + status.substr(0, 35) + "…")) << "the status has a line of its own";
  screen.type("\r");
  ASSERT_TRUE(screen.shows("SIM Files"));
  // Only a change of size draws everything anew.
  screen.resize(39, 20);
  EXPECT_TRUE(screen.shows("Esc back"));
  screen.resize(40, 20);
  EXPECT_TRUE(screen.shows("↑↓ Return Esc back ? keys q quit"));
  EXPECT_TRUE(screen.shows("• " + status.substr(0, 35) + "…"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, AQuestionMarkShowsTheKeysUntilTheNextKeyWhichDoesNothingElse) {
  Screen screen(plainly, 40, 20);
  ASSERT_TRUE(screen.shows("the status"));
  screen.type("\r");
  ASSERT_TRUE(screen.shows("SIM Files"));
  for (const auto* key : {"\x1b", "q", "?", "\x1bOB", "\r"}) {
    screen.type("?");
    EXPECT_TRUE(screen.shows("Keys"));
    EXPECT_TRUE(screen.shows("Esc Backspace"));
    EXPECT_TRUE(screen.shows("back"));
    EXPECT_TRUE(screen.shows("the service is away"));
    EXPECT_TRUE(screen.shows("any key closes this"));
    screen.type(key);
    EXPECT_TRUE(screen.shows("IMEISV")) << "the same page as before";
  }
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, AChangeOfSizeLeavesTheListOfKeysOpen) {
  Screen screen(plainly);
  ASSERT_TRUE(screen.shows("the status"));
  screen.type("?");
  ASSERT_TRUE(screen.shows("any key closes this"));
  screen.resize(40, 20);
  EXPECT_TRUE(screen.shows("any key closes this"));
  // A second on, when the status line has been asked anew, it is still there: the page is drawn only after a key.
  screen.resize(60, 22);
  EXPECT_TRUE(screen.shows("any key closes this"));
  screen.type("x");
  EXPECT_TRUE(screen.shows("Device Info"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, WhereTheLocaleIsNotUtf8EverythingIsDrawnInAscii) {
  for (const auto* locale : {"C", "POSIX", "de_DE.ISO-8859-1", "no_SUCH"}) {
    Screen screen(
        [] {
          return showPages(
              [](TerminalFront&, testing_ui::HandFilledStore& store) {
                store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"state", Value::text("Zürich 信")}};
              },
              [] {
                return Status{Status::Kind::Stale, "scenario:city · 2 min ago, stale"};
              });
        },
        40, 8, locale);
    EXPECT_TRUE(screen.shows("^v Return")) << locale;
    EXPECT_TRUE(screen.shows("o scenario:city - 2 min ago, stale"));
    screen.type("\x1bOB\r");
    EXPECT_TRUE(screen.shows("> LTE"));
    ASSERT_TRUE(screen.shows("RRC State"));
    screen.resize(41, 8);
    EXPECT_TRUE(screen.shows("-v--")) << "there is more below";
    screen.type("\x1bOB\r");
    EXPECT_TRUE(screen.shows("Z?rich ??"));
    screen.type("?");
    EXPECT_TRUE(screen.shows("any key closes this"));
    screen.type("xq");
    EXPECT_EQ(screen.end(), 0);
    const auto& written = screen.written();
    EXPECT_TRUE(std::all_of(written.begin(), written.end(), [](char byte) { return (byte & 0x80) == 0; })) << locale;
    EXPECT_EQ(written.find("\x1b(0"), std::string::npos) << "nor by the terminal's own characters for lines";
  }
}

TEST(Terminal, ALocaleThatIsNotInstalledTellsItsEncodingByItsName) {
  Screen screen(plainly, 80, 24, "xx_XX.UTF-8");
  EXPECT_TRUE(screen.shows("↑↓ Return"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, TheEncodingIsAFactThatCanBeHandedIn) {
  Screen screen([] {
    std::string error;
    const auto front = TerminalFront::make(error, "KOI8-R");
    if (!front) return 9;
    testing_ui::RememberedLines log;
    testing_ui::HandFilledStore store(log, log);
    NavigationStack stack(InterfaceDescription(PageEnvironment{front->mainQueue(), front->scheduler(), log, store}));
    return front->run(stack, [] { return Status{Status::Kind::Live, "a · b"}; });
  });
  EXPECT_TRUE(screen.shows("* a - b"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, WhatIsAmissHasAColourAndAMarkOfItsOwn) {
  const std::map<Status::Kind, std::string> drawn = {
      {Status::Kind::Stale, "\x1b[33m○ the"},
      {Status::Kind::Ended, "\x1b[36m■ the"},
      {Status::Kind::Failed, "\x1b[31m! the"},
      {Status::Kind::Away, "\x1b[35m× the"},
  };
  for (const auto& [kind, text] : drawn) {
    Screen screen([kind = kind] { return showPages({}, [kind] { return Status{kind, "the status"}; }); });
    EXPECT_TRUE(screen.shows(text)) << statusKindName(kind);
    screen.type("q");
    EXPECT_EQ(screen.end(), 0);
  }
}

TEST(Terminal, ATerminalWithoutColoursShowsTheMark) {
  Screen screen([] {
    ::setenv("TERM", "vt100", 1);
    return showPages({}, [] { return Status{Status::Kind::Away, "the status"}; });
  });
  EXPECT_TRUE(screen.shows("× the status"));
  screen.type("q");
  EXPECT_EQ(screen.end(), 0);
  EXPECT_EQ(screen.written().find("\x1b[35m"), std::string::npos);
}

TEST(Terminal, ASignalToEndGivesTheTerminalBack) {
  for (const int signal : {SIGTERM, SIGINT, SIGHUP}) {
    Screen screen(plainly);
    ASSERT_TRUE(screen.shows("the status"));
    screen.send(signal);
    EXPECT_EQ(screen.end(), 0);
    EXPECT_TRUE(screen.isGivenBack()) << signal;
  }
}

TEST(Terminal, ControlCEndsIt) {
  Screen screen(plainly);
  ASSERT_TRUE(screen.shows("the status"));
  screen.type("\x03");
  EXPECT_EQ(screen.end(), 0);
  EXPECT_TRUE(screen.isGivenBack());
}

TEST(Terminal, ATerminalThatHangsUpEndsIt) {
  Screen screen(plainly);
  ASSERT_TRUE(screen.shows("the status"));
  screen.hangUp();
  EXPECT_EQ(screen.end(), 0);
}

TEST(Terminal, AStopForABrokenContractGivesTheTerminalBackAndThenSaysWhy) {
  Screen screen([] {
    return showPages([](TerminalFront& front, testing_ui::HandFilledStore&) {
      front.mainQueue().post([] { fatalError("broken on purpose"); });
    });
  });
  EXPECT_TRUE(screen.shows("broken on purpose"));
  EXPECT_EQ(screen.end(), -SIGABRT);
  EXPECT_TRUE(screen.isGivenBack());
  EXPECT_LT(screen.written().rfind("\x1b[?1049l"), screen.written().find("broken on purpose"));
}

TEST(Terminal, WhereThereIsNoTerminalTheReasonIsSaid) {
  int ends[2] = {};
  ASSERT_EQ(::pipe2(ends, O_CLOEXEC), 0);
  const FileDescriptor reading(ends[0]);
  const FileDescriptor writing(ends[1]);
  const pid_t child = ::fork();
  if (child == 0) {
    ::dup2(reading.number(), STDIN_FILENO);
    std::string error;
    const auto front = TerminalFront::make(error);
    ::_exit(!front && error.find("--print") != std::string::npos ? 0 : 1);
  }
  int status = -1;
  ::waitpid(child, &status, 0);
  EXPECT_EQ(status, 0);
}

TEST(Terminal, ATerminalOfAnUnknownKindIsRefusedWithItsName) {
  Screen screen([] {
    ::setenv("TERM", "no-such-terminal", 1);
    std::string error;
    const auto front = TerminalFront::make(error);
    return !front && error.find("no-such-terminal") != std::string::npos ? 0 : 1;
  });
  EXPECT_EQ(screen.end(), 0);
}

}  // namespace
}  // namespace probeview::terminal
