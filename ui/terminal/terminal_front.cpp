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

// The widths of characters come from a locale whose encoding is UTF-8, also where none but ASCII is written; nothing
// else of the locale is taken over.
void chooseCharacters() {
  if (std::setlocale(LC_CTYPE, "") != nullptr && characterSetOf(::nl_langinfo(CODESET)) == CharacterSet::Unicode)
    return;
  std::setlocale(LC_CTYPE, "C.UTF-8");
}

void leaveScreen() {
  if (!::isendwin()) ::endwin();
}

// What is amiss has a colour that can be read on a dark ground and on a light one; 0 is the terminal's own.
short colorOf(Status::Kind kind) {
  switch (kind) {
    case Status::Kind::Live:
    case Status::Kind::Waiting:
    case Status::Kind::Unfillable:
      return 0;
    case Status::Kind::Stale:
      return COLOR_YELLOW;
    case Status::Kind::Ended:
      return COLOR_CYAN;
    case Status::Kind::Failed:
      return COLOR_RED;
    case Status::Kind::Away:
      return COLOR_MAGENTA;
  }
  return 0;
}

void prepareColors() {
  if (!::has_colors()) return;
  ::start_color();
  ::use_default_colors();
  // A pair is named by its colour.
  for (const short color : std::initializer_list<short>{COLOR_YELLOW, COLOR_CYAN, COLOR_RED, COLOR_MAGENTA}) {
    ::init_pair(color, color, -1);
  }
}

attr_t attributesOf(Status::Kind kind) {
  const short color = colorOf(kind);
  if (color == 0) return A_NORMAL;
  return ::has_colors() ? static_cast<attr_t>(COLOR_PAIR(color)) : A_BOLD;
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

std::string TerminalFront::localeEncoding() {
  if (std::setlocale(LC_CTYPE, "") != nullptr) return ::nl_langinfo(CODESET);
  // A locale that is not installed, as it often is behind a remote shell: its name tells the encoding all the same.
  for (const char* variable : {"LC_ALL", "LC_CTYPE", "LANG"}) {
    const char* const value = std::getenv(variable);
    if (value == nullptr || *value == '\0') continue;
    const std::string_view name(value);
    const auto point = name.find('.');
    return std::string(point == std::string_view::npos ? "" : name.substr(point + 1, name.find('@') - point - 1));
  }
  return {};
}

std::unique_ptr<TerminalFront> TerminalFront::make(std::string& error, std::string_view encoding) {
  if (::isatty(STDIN_FILENO) == 0 || ::isatty(STDOUT_FILENO) == 0) {
    error = "standard input and output are no terminal; --print writes the pages as plain text";
    return nullptr;
  }
  const char* kind = std::getenv("TERM");
  if (kind == nullptr || *kind == '\0') {
    error = "the environment variable TERM does not say what kind of terminal this is; set it, or use --print";
    return nullptr;
  }
  if (!isKnownTerminal(kind)) {
    error = std::string("nothing is known about a terminal of the kind \"") + kind +
            "\"; set TERM to one that is known, such as xterm, or use --print";
    return nullptr;
  }
  return std::unique_ptr<TerminalFront>(new TerminalFront(characterSetOf(encoding)));
}

TerminalFront::TerminalFront(CharacterSet characterSet) : characterSet_(characterSet) {
  loop_.onSignals({SIGWINCH, SIGINT, SIGTERM, SIGHUP}, [this](int signal) {
    if (signal == SIGWINCH) {
      resize();
    } else {
      loop_.stop();
    }
  });
}

TerminalFront::~TerminalFront() = default;

int TerminalFront::run(NavigationStack& navigation, const StatusSource& status) {
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
  prepareColors();
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
  // The news that the size has changed is no key of a person's.
  if (key == KEY_RESIZE) return;
  // Any key closes the list of keys and does nothing else.
  if (std::exchange(showsKeys_, false)) return;
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
    case '?':
      showsKeys_ = true;
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

void TerminalFront::write(int line, int column, std::wstring_view text) const {
  const auto written = characterSet_ == CharacterSet::Ascii ? inAscii(text) : std::wstring(text);
  ::mvaddnwstr(line, column, written.data(), static_cast<int>(written.size()));
}

void TerminalFront::drawLine(int y) const {
  ::mvhline(y, 0, characterSet_ == CharacterSet::Ascii ? '-' : ACS_HLINE, COLS);
}

void TerminalFront::draw() {
  ::erase();
  const int width = COLS;
  const int bottom = 2 + Views::listHeight();

  // Where one is: the titles of the pages, one below the other.
  ::attron(A_BOLD);
  write(0, 1, shortened(showsKeys_ ? L"Keys" : characters(navigationPath(*navigation_)), width - 2));
  ::attroff(A_BOLD);
  drawLine(1);
  drawLine(bottom);
  showsKeys_ ? drawKeys() : drawPage(views_->top());

  // The keys stand in the line above the status, so that neither takes the other's room. The line shows on both sides,
  // and at its end the mark that there is more below.
  const auto keys = showsKeys_ ? std::wstring(L"any key closes this") : keyHints(navigation_->depth() > 1, width - 8);
  if (!keys.empty() && columns(keys) <= width - 8) {
    const int column = width - 6 - columns(keys);
    write(bottom, column, L" ");
    ::attron(A_DIM);
    write(bottom, column + 1, keys);
    ::attroff(A_DIM);
    write(bottom, width - 5, L" ");
  }
  drawStatus(bottom + 1);
  ::refresh();
}

void TerminalFront::drawPage(const ListView& view) const {
  const auto& layout = view.layout();
  const int width = COLS;
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
  if (view.hasMoreAbove()) write(1, width - 3, L"↑");
  if (view.hasMoreBelow()) write(2 + height, width - 3, L"↓");
}

void TerminalFront::drawKeys() const {
  const auto lines = helpLines(characterSet_);
  for (int y = 0; y < Views::listHeight() && y < static_cast<int>(lines.size()); ++y) {
    const auto& [sign, meaning] = lines[static_cast<std::size_t>(y)];
    write(2 + y, 2, shortened(sign, COLS - 3));
    write(2 + y, 2 + helpColumn, shortened(meaning, COLS - 3 - helpColumn));
  }
}

void TerminalFront::drawStatus(int y) const {
  const auto status = status_();
  const auto attributes = attributesOf(status.kind);
  ::attr_on(attributes, nullptr);
  const auto line = std::wstring(1, statusMark(status.kind, characterSet_)) + L' ' + characters(status.text);
  write(y, 1, shortened(line, COLS - 2));
  ::attr_off(attributes, nullptr);
}

}  // namespace probeview::terminal
