// SPDX-License-Identifier: Apache-2.0
#include "ui/terminal/terminal_front.h"

#include <curses.h>
#include <langinfo.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <clocale>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "platform/fatal_error.h"
#include "ui/status_line.h"
#include "ui/terminal/terminal_kind.h"

namespace probeview::terminal {

namespace {

constexpr int escapeKey = 27;
constexpr int deleteKey = 127;
constexpr int backspaceKey = 8;
// How long a lone Esc waits for the rest of a key's sequence.
constexpr int escapeDelayMilliseconds = 25;

// Characters need a locale whose encoding is UTF-8; nothing else of the locale is taken over.
void chooseCharacters() {
  if (std::setlocale(LC_CTYPE, "") && std::strcmp(::nl_langinfo(CODESET), "UTF-8") == 0) return;
  std::setlocale(LC_CTYPE, "C.UTF-8");
}

void leaveScreen() {
  if (!::isendwin()) ::endwin();
}

void write(int line, int column, std::wstring_view text) {
  ::mvaddnwstr(line, column, text.data(), static_cast<int>(text.size()));
}

}  // namespace

// One list view per page of the stack, the topmost last.
class TerminalFront::Views final : public NavigationObserver {
 public:
  explicit Views(TerminalFront& front) : front_(front) {
    for (std::size_t index = 0; index < front_.navigation_->depth(); ++index) add(front_.navigation_->page(index));
    front_.navigation_->setObserver(this);
  }
  ~Views() override { front_.navigation_->setObserver(nullptr); }

  void didPush(ListPage& page) override { add(page); }
  void willPop(ListPage&) override { views_.pop_back(); }

  ListView& top() const { return *views_.back(); }
  void resize() {
    for (const auto& view : views_) view->resize(COLS, listHeight());
  }
  // Below the title and its line, above the status line and its line.
  static int listHeight() { return LINES > 5 ? LINES - 4 : 1; }

 private:
  void add(ListPage& page) {
    views_.push_back(std::make_unique<ListView>(page, [this, &page] {
      if (&top().page() == &page) front_.draw();
    }));
    top().resize(COLS, listHeight());
  }

  TerminalFront& front_;
  std::vector<std::unique_ptr<ListView>> views_;
};

std::unique_ptr<TerminalFront> TerminalFront::make(std::string& error) {
  if (!::isatty(STDIN_FILENO) || !::isatty(STDOUT_FILENO)) {
    error = "standard input and output are no terminal; --print writes the pages as plain text";
    return nullptr;
  }
  const char* kind = std::getenv("TERM");
  if (!kind || !*kind) {
    error = "the environment variable TERM does not say what kind of terminal this is; set it, or use --print";
    return nullptr;
  }
  if (!isKnownTerminal(kind)) {
    error = std::string("nothing is known about a terminal of the kind \"") + kind +
            "\"; set TERM to one that is known, such as xterm, or use --print";
    return nullptr;
  }
  return std::unique_ptr<TerminalFront>(new TerminalFront);
}

TerminalFront::TerminalFront() {
  loop_.onSignals({SIGWINCH, SIGINT, SIGTERM, SIGHUP}, [this](int signal) {
    if (signal == SIGWINCH) {
      resize();
    } else {
      loop_.stop();
    }
  });
}

TerminalFront::~TerminalFront() = default;

int TerminalFront::run(NavigationStack& navigation, const StatusText& status) {
  navigation_ = &navigation;
  status_ = status;
  chooseCharacters();
  ::initscr();
  ::cbreak();
  ::noecho();
  ::nonl();
  ::keypad(stdscr, TRUE);
  ::nodelay(stdscr, TRUE);
  ::set_escdelay(escapeDelayMilliseconds);
  // Some terminals send arrows this way whatever they are told; read as a lone Esc they would lead back.
  ::define_key("\x1b[A", KEY_UP);
  ::define_key("\x1b[B", KEY_DOWN);
  ::define_key("\x1b[C", KEY_RIGHT);
  ::define_key("\x1b[D", KEY_LEFT);
  ::curs_set(0);
  addFatalErrorFlush(leaveScreen);

  views_ = std::make_unique<Views>(*this);
  const auto keys = loop_.watch(STDIN_FILENO, {.readable = true}, [this](Readiness) { readKeys(); });
  const auto statusTimer = loop_.every(StatusLine::refreshInterval, [this] { draw(); });
  draw();
  loop_.run();
  views_.reset();
  leaveScreen();
  return 0;
}

void TerminalFront::readKeys() {
  int key = ::getch();
  // Readable and yet nothing to read: the terminal is gone.
  if (key == ERR) return loop_.stop();
  for (; key != ERR; key = ::getch()) handleKey(key);
  draw();
}

void TerminalFront::handleKey(int key) {
  auto& view = views_->top();
  switch (key) {
    case KEY_UP:
      return view.moveSelection(-1);
    case KEY_DOWN:
      return view.moveSelection(1);
    case KEY_PPAGE:
      return view.moveByScreens(-1);
    case KEY_NPAGE:
    case ' ':
      return view.moveByScreens(1);
    case KEY_HOME:
      return view.selectFirst();
    case KEY_END:
      return view.selectLast();
    case '\r':
    case '\n':
    case KEY_ENTER:
    case KEY_RIGHT:
      if (const auto* cell = view.selectedCell()) navigation_->tap(ListCell(*cell));
      return;
    case escapeKey:
    case backspaceKey:
    case deleteKey:
    case KEY_BACKSPACE:
    case KEY_LEFT:
      navigation_->pop();
      return;
    case 'q':
    case 'Q':
      return loop_.stop();
    default:
      return;
  }
}

void TerminalFront::resize() {
  winsize size{};
  if (::ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) != 0 || size.ws_row == 0 || size.ws_col == 0) return;
  ::resizeterm(size.ws_row, size.ws_col);
  if (!views_) return;
  views_->resize();
  ::clear();
  draw();
}

void TerminalFront::draw() {
  ::erase();
  const int width = COLS;
  const auto line = [&](int y) { ::mvhline(y, 0, ACS_HLINE, width); };

  // Where one is: the titles of the pages, one below the other.
  ::attron(A_BOLD);
  write(0, 1, shortened(characters(navigationPath(*navigation_)), width - 2));
  ::attroff(A_BOLD);
  line(1);

  const auto& view = views_->top();
  const auto& layout = view.layout();
  const int height = Views::listHeight();
  for (int y = 0; y < height; ++y) {
    const auto index = view.firstLine() + static_cast<std::size_t>(y);
    if (index >= layout.lines.size()) break;
    const auto& shown = layout.lines[index];
    const int top = 2 + y;
    switch (shown.kind) {
      case LaidOutLine::Kind::Blank:
        break;
      case LaidOutLine::Kind::Header:
        ::attron(A_BOLD);
        write(top, 1, shown.text);
        ::attroff(A_BOLD);
        break;
      case LaidOutLine::Kind::Row: {
        const bool isSelected = view.selection() == shown.place;
        if (isSelected) ::attron(A_REVERSE);
        if (isSelected) ::mvhline(top, 0, ' ', width);
        write(top, 2, shown.text);
        write(top, 2 + layout.detailColumn, shown.detail);
        if (shown.disclosure) write(top, width - 2, L"›");
        if (isSelected) ::attroff(A_REVERSE);
        break;
      }
    }
  }
  line(2 + height);
  if (view.hasMoreAbove()) write(1, width - 3, L"↑");
  if (view.hasMoreBelow()) write(2 + height, width - 3, L"↓");

  const std::wstring keys = navigation_->depth() > 1 ? L"↑↓ Return  Esc back  q quit" : L"↑↓ Return  q quit";
  const int keysWidth = columns(keys);
  const auto status = characters(status_());
  // The status goes first; the keys show where there is room beside it.
  const bool hasRoom = columns(status) + keysWidth + 4 <= width;
  write(3 + height, 1, shortened(status, width - 2));
  if (hasRoom) {
    ::attron(A_DIM);
    write(3 + height, width - 1 - keysWidth, keys);
    ::attroff(A_DIM);
  }
  ::refresh();
}

}  // namespace probeview::terminal
