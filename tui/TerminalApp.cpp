#include "tui/TerminalApp.h"

#include <ncurses.h>
#include <poll.h>

#include <algorithm>
#include <array>

#include "platform/DateText.h"
#include "platform/DevicePaths.h"
#include "tui/TerminalText.h"

namespace corvane::tui {

namespace {

constexpr auto kTickInterval = std::chrono::milliseconds(100);
constexpr int kWheelRows = 3;
constexpr short kConnectingPair = 1;
constexpr int kEscape = 27;
constexpr int kBackspaceCharacter = 127;
constexpr int kControlH = 8;

constexpr std::array<const wchar_t*, 10> kUnicodeSpinner{L"⠋", L"⠙", L"⠹", L"⠸", L"⠼",
                                                          L"⠴", L"⠦", L"⠧", L"⠇", L"⠏"};
constexpr std::array<const wchar_t*, 4> kAsciiSpinner{L"|", L"/", L"-", L"\\"};

const char* const kHelpLines[] = {
    "Keys",
    "",
    "Up, Down             move the selection",
    "PgUp, PgDn           a page up or down",
    "Home, End            the first or the last row",
    "Enter, Right         open the selected section",
    "Left, Backspace, Esc back to the screen below",
    "[ and ]              scroll the detail line sideways",
    "/                    filter the rows of this screen",
    "s                    save a snapshot",
    "q                    quit",
    "?                    this help",
    "",
    "A click selects a row, a click on the selected row opens it,",
    "a click on the title line goes back; the wheel scrolls.",
    "",
    "Any key closes this help.",
};

void put(int y, int x, std::wstring_view text) {
  mvaddnwstr(y, x, text.data(), static_cast<int>(text.size()));
}

void blankLine(int y, int width) {
  move(y, 0);
  for (int i = 0; i < width; ++i) addch(' ');
}

bool isBackKey(int result, wint_t key) {
  if (result == KEY_CODE_YES) return key == KEY_LEFT || key == KEY_BACKSPACE;
  return key == kEscape || key == kBackspaceCharacter || key == kControlH;
}

bool isEnterKey(int result, wint_t key) {
  if (result == KEY_CODE_YES) return key == KEY_ENTER;
  return key == L'\n' || key == L'\r';
}

bool isEraseKey(int result, wint_t key) {
  if (result == KEY_CODE_YES) return key == KEY_BACKSPACE;
  return key == kBackspaceCharacter || key == kControlH;
}

std::string narrow(wint_t key) {
  std::mbstate_t state{};
  char bytes[MB_LEN_MAX];
  const std::size_t length = std::wcrtomb(bytes, static_cast<wchar_t>(key), &state);
  if (length == static_cast<std::size_t>(-1)) return {};
  return std::string(bytes, length);
}

void eraseLastCharacter(std::string& text) {
  // Back over UTF-8 continuation bytes to the start of the last character.
  while (!text.empty()) {
    const unsigned char last = static_cast<unsigned char>(text.back());
    text.pop_back();
    if ((last & 0xC0) != 0x80) break;
  }
}

}  // namespace

TerminalApp::TerminalApp(CorvaneModelEnvironment environment, TerminalOptions options, PreferenceStore& preferences,
                         std::function<void()> quit)
    : environment_(std::move(environment)), options_(std::move(options)), quit_(std::move(quit)),
      signalStrength_(preferences) {}

TerminalApp::~TerminalApp() { stop(); }

void TerminalApp::start() {
  if (started_) return;
  started_ = true;
  signalStrength_.applicationDidFinishLaunching();
  initscr();
  cbreak();
  noecho();
  nonl();
  keypad(stdscr, TRUE);
  nodelay(stdscr, TRUE);
  set_escdelay(25);
  curs_set(0);
  mousemask(BUTTON1_CLICKED | BUTTON1_DOUBLE_CLICKED | BUTTON4_PRESSED | BUTTON5_PRESSED, nullptr);
  mouseinterval(200);
  if (options_.colour && has_colors()) {
    start_color();
    use_default_colors();
    init_pair(kConnectingPair, COLOR_RED, -1);
  } else {
    options_.colour = false;
  }

  stack_.setWillShow([this](const ScreenStack::Screen&) {
    scrollTop_ = 0;
    detailScroll_ = 0;
    filter_.clear();
  });
  model_ = std::make_unique<CorvaneModel>(environment_, this);
  inputWatch_ = environment_.runLoop.watchReadable(0, [this] {
    if (!onInput() && terminalHungUp()) quit_();
  });
  // Resizes come as keys too, and the spinner turns: both on a short tick.
  ticker_ = environment_.runLoop.scheduleRepeatingTimer(kTickInterval, [this] { tick(); });
  environment_.runLoop.dispatchAsync([this] {
    if (model_) model_->restartMonitor();
  });
  draw();
}

void TerminalApp::stop() {
  if (!started_) return;
  started_ = false;
  environment_.runLoop.cancel(inputWatch_);
  environment_.runLoop.cancel(ticker_);
  model_.reset();
  endwin();
  signalStrength_.applicationWillTerminate();
}

void TerminalApp::updateViewControllerFromModel() {
  if (!model_) return;
  stack_.reload(model_->topLevelNodes(), [this](const std::string& path) { return model_->nodeAtPath(path); });
  statusLine_.displayUpdated(model_->isConnected(), currentDate());
  updated_ = true;
  draw();
}

StatusState TerminalApp::status() const {
  const bool connected = model_ && model_->isConnected();
  if (!updated_ && !connected) return StatusLine::launching();
  return statusLine_.current(connected);
}

bool TerminalApp::onInput() {
  wint_t key = 0;
  int result = 0;
  bool any = false;
  while ((result = get_wch(&key)) != ERR) {
    any = true;
    handleKey(result, key);
    if (!started_) return true;
  }
  if (any) draw();
  return any;
}

bool TerminalApp::terminalHungUp() {
  // A terminal that has gone (the SSH connection dropped) stays readable for
  // ever without giving a key.
  pollfd input{0, POLLIN, 0};
  return ::poll(&input, 1, 0) > 0 && (input.revents & (POLLHUP | POLLERR | POLLNVAL)) != 0;
}

void TerminalApp::tick() {
  ++spinnerStep_;
  onInput();
  if (started_ && status().isLoading) draw();
}

void TerminalApp::handleKey(int result, wint_t key) {
  if (result == KEY_CODE_YES && key == KEY_RESIZE) return;
  if (result == KEY_CODE_YES && key == KEY_MOUSE) {
    handleMouse();
    return;
  }
  message_.clear();
  switch (mode_) {
    case Mode::Browse:
      handleBrowseKey(result, key);
      break;
    case Mode::Filter:
      handleFilterKey(result, key);
      break;
    case Mode::Save:
      handleSaveKey(result, key);
      break;
    case Mode::Help:
    case Mode::Alert:
      mode_ = Mode::Browse;
      break;
  }
}

void TerminalApp::handleBrowseKey(int result, wint_t key) {
  const long page = std::max(1, rowsHeight_ - 1);
  if (result == KEY_CODE_YES) {
    switch (key) {
      case KEY_UP: moveSelection(-1); return;
      case KEY_DOWN: moveSelection(1); return;
      case KEY_PPAGE: moveSelection(-page); return;
      case KEY_NPAGE: moveSelection(page); return;
      case KEY_HOME: selectVisible(0); return;
      case KEY_END: selectVisible(visibleRows().size() - 1); return;
      case KEY_RIGHT: open(); return;
      default: break;
    }
  }
  if (isEnterKey(result, key)) return open();
  if (isBackKey(result, key)) {
    if (key == kEscape && result != KEY_CODE_YES && !filter_.empty()) return clearFilter();
    return back();
  }
  if (result == KEY_CODE_YES) return;
  switch (key) {
    case L'q': quit_(); return;
    case L'?': mode_ = Mode::Help; return;
    case L'/': mode_ = Mode::Filter; return;
    case L's': openSaveScreen(); return;
    case L'[': detailScroll_ = std::max(0, detailScroll_ - 8); return;
    case L']': detailScroll_ += 8; return;
    default: return;
  }
}

void TerminalApp::handleFilterKey(int result, wint_t key) {
  if (isEnterKey(result, key)) {
    mode_ = Mode::Browse;
  } else if (result != KEY_CODE_YES && key == kEscape) {
    clearFilter();
    mode_ = Mode::Browse;
  } else if (isEraseKey(result, key)) {
    eraseLastCharacter(filter_);
  } else if (result != KEY_CODE_YES && ::iswprint(static_cast<wint_t>(key))) {
    filter_ += narrow(key);
  } else {
    return;
  }
  scrollTop_ = 0;
  // The selection stays on a row the filter shows.
  const std::vector<std::size_t> visible = visibleRows();
  if (!visible.empty() && std::find(visible.begin(), visible.end(), stack_.top().selectedRow) == visible.end()) {
    stack_.select(visible.front());
  }
}

void TerminalApp::handleSaveKey(int result, wint_t key) {
  if (isEnterKey(result, key)) return finishSave();
  if (result != KEY_CODE_YES && key == kEscape) {
    saver_.reset();
    mode_ = Mode::Browse;
  } else if (isEraseKey(result, key)) {
    eraseLastCharacter(description_);
  } else if (result != KEY_CODE_YES && ::iswprint(static_cast<wint_t>(key))) {
    description_ += narrow(key);
  }
}

void TerminalApp::handleMouse() {
  MEVENT event{};
  if (getmouse(&event) != OK) return;
  if (mode_ == Mode::Help || mode_ == Mode::Alert) {
    mode_ = Mode::Browse;
    return;
  }
  if (mode_ != Mode::Browse) return;
  if (event.bstate & BUTTON4_PRESSED) return moveSelection(-kWheelRows);
  if (event.bstate & BUTTON5_PRESSED) return moveSelection(kWheelRows);
  if (!(event.bstate & (BUTTON1_CLICKED | BUTTON1_DOUBLE_CLICKED))) return;
  if (event.y == 0) return back();
  if (event.y < rowsTop_ || event.y >= rowsTop_ + rowsHeight_) return;
  const std::size_t index = scrollTop_ + static_cast<std::size_t>(event.y - rowsTop_);
  const std::vector<std::size_t> visible = visibleRows();
  if (index >= visible.size()) return;
  const bool again = visible[index] == stack_.top().selectedRow;
  selectVisible(index);
  if (again || (event.bstate & BUTTON1_DOUBLE_CLICKED)) open();
}

std::vector<std::size_t> TerminalApp::visibleRows() const {
  return rowsMatching(paneRows(stack_.top().node.get()), filter_);
}

std::size_t TerminalApp::visibleSelection(const std::vector<std::size_t>& visible) const {
  const auto found = std::find(visible.begin(), visible.end(), stack_.top().selectedRow);
  return found == visible.end() ? 0 : static_cast<std::size_t>(found - visible.begin());
}

void TerminalApp::moveSelection(long delta) {
  const std::vector<std::size_t> visible = visibleRows();
  if (visible.empty()) return;
  const long at = static_cast<long>(visibleSelection(visible)) + delta;
  selectVisible(static_cast<std::size_t>(std::clamp(at, 0L, static_cast<long>(visible.size()) - 1)));
}

void TerminalApp::selectVisible(std::size_t visibleIndex) {
  const std::vector<std::size_t> visible = visibleRows();
  if (visible.empty()) return;
  stack_.select(visible[std::min(visibleIndex, visible.size() - 1)]);
  detailScroll_ = 0;
}

void TerminalApp::open() {
  if (visibleRows().empty()) return;
  stack_.openSelected();
}

void TerminalApp::back() { stack_.pop(); }

void TerminalApp::clearFilter() {
  filter_.clear();
  scrollTop_ = 0;
}

void TerminalApp::openSaveScreen() {
  if (!saveOffered(options_.deviceRoot)) {
    message_ = "Saving is not offered on this device";
    return;
  }
  if (!model_) return;
  saver_ = std::make_unique<SnapshotSaver>(model_->getSaveContents(),
                                           devicePath(kSnapshotDirectoryPath, options_.deviceRoot), currentDate());
  description_.clear();
  mode_ = Mode::Save;
}

void TerminalApp::finishSave() {
  std::string file;
  const bool saved = saver_ && saver_->save(description_, currentDate(), &file);
  saver_.reset();
  if (saved) {
    message_ = "Saved " + std::filesystem::path(file).filename().string();
    mode_ = Mode::Browse;
  } else {
    mode_ = Mode::Alert;
  }
}

// --- Drawing -----------------------------------------------------------------

void TerminalApp::draw() {
  if (!started_) return;
  int height = 0;
  int width = 0;
  getmaxyx(stdscr, height, width);
  // erase() and one refresh(): curses sends only what changed, so nothing flickers.
  erase();
  if (mode_ == Mode::Help) {
    drawHelp(height, width);
  } else if (mode_ == Mode::Save) {
    drawSave(height, width);
  } else if (mode_ == Mode::Alert) {
    drawAlert(height, width);
  } else {
    drawTitle(width);
    rowsTop_ = 1;
    rowsHeight_ = std::max(0, height - 3);
    drawRows(rowsTop_, rowsHeight_, width);
    if (height >= 3) drawDetail(height - 2, width);
    if (height >= 2) drawStatus(height - 1, width);
  }
  refresh();
}

void TerminalApp::drawTitle(int width) {
  attron(A_REVERSE);
  blankLine(0, width);
  const std::wstring title = widen(stack_.title());
  const std::wstring back = stack_.depth() > 1 ? std::wstring(options_.unicode ? L"‹ " : L"< ") + widen(stack_.backTitle())
                                               : std::wstring();
  const std::wstring shownBack = fit(back, std::min(20, width / 3), options_.unicode ? L"…" : L"~");
  const int backWidth = columns(shownBack);
  put(0, 1, shownBack);
  const int room = width - backWidth - 4;
  const std::wstring shownTitle = fit(title, std::max(0, room), options_.unicode ? L"…" : L"~");
  const int titleWidth = columns(shownTitle);
  const int centred = (width - titleWidth) / 2;
  attron(A_BOLD);
  put(0, std::max(centred, backWidth + 3), shownTitle);
  attroff(A_BOLD);
  // A filter in force shows at the right end, over the title if need be.
  if (mode_ != Mode::Filter && !filter_.empty()) {
    const std::wstring shownFilter = fit(L"/" + widen(filter_), width / 3, options_.unicode ? L"…" : L"~");
    put(0, width - 1 - columns(shownFilter), shownFilter);
  }
  attroff(A_REVERSE);
}

void TerminalApp::drawRows(int top, int height, int width) {
  const std::vector<PaneRow> rows = paneRows(stack_.top().node.get());
  const std::vector<std::size_t> visible = rowsMatching(rows, filter_);
  if (visible.empty()) {
    const char* empty = !stack_.top().node ? "No data yet" : filter_.empty() ? "No rows" : "No row matches the filter";
    if (height > 0) put(top, 2, fit(widen(empty), width - 2, L""));
    return;
  }
  const std::size_t selected = visibleSelection(visible);
  const std::size_t page = static_cast<std::size_t>(std::max(1, height));
  if (selected < scrollTop_) scrollTop_ = selected;
  if (selected >= scrollTop_ + page) scrollTop_ = selected - page + 1;
  if (scrollTop_ + page > visible.size()) scrollTop_ = visible.size() > page ? visible.size() - page : 0;
  const std::wstring ellipsis = options_.unicode ? L"…" : L"~";
  const std::wstring arrow = options_.unicode ? L"›" : L">";

  for (int line = 0; line < height; ++line) {
    const std::size_t index = scrollTop_ + static_cast<std::size_t>(line);
    if (index >= visible.size()) break;
    const PaneRow& row = rows[visible[index]];
    const bool isSelected = index == selected;
    const int y = top + line;
    if (isSelected) {
      attron(A_REVERSE);
      blankLine(y, width);
    }
    const int inner = width - 2;  // a column of margin on either side
    const std::wstring key = widen(row.key);
    if (row.opens) {
      attron(A_BOLD);
      put(y, 1, fit(key, inner - 2, ellipsis));
      attroff(A_BOLD);
      put(y, width - 2, arrow);
    } else {
      const std::wstring value = widen(row.value);
      const int valueWidth = columns(value);
      // The key keeps at least half the row; the value, right-aligned, takes the rest.
      const int keyRoom = std::max(std::min(columns(key), inner - valueWidth - 1), std::min(columns(key), inner / 2));
      attron(A_BOLD);
      put(y, 1, fit(key, keyRoom, ellipsis));
      attroff(A_BOLD);
      const int valueRoom = inner - keyRoom - 1;
      const std::wstring shown = fit(value, valueRoom, ellipsis);
      if (valueRoom > 0) put(y, 1 + inner - columns(shown), shown);
    }
    if (isSelected) attroff(A_REVERSE);
  }
}

void TerminalApp::drawDetail(int y, int width) {
  std::wstring text;
  if (!message_.empty()) {
    text = widen(message_);
  } else if (mode_ == Mode::Filter) {
    text = widen("Filter: " + filter_) + L"_";
  } else {
    const NodeRef* child = paneChildAt(stack_.top().node.get(), stack_.top().selectedRow);
    if (child && *child) {
      const PaneRow row = paneRow(**child);
      text = widen(row.opens ? row.key : row.key + ": " + row.value);
    }
  }
  const int room = width - 2;
  const int total = columns(text);
  detailScroll_ = std::clamp(detailScroll_, 0, std::max(0, total - room));
  attron(A_DIM);
  put(y, 1, slice(text, detailScroll_, room));
  attroff(A_DIM);
}

void TerminalApp::drawStatus(int y, int width) {
  const StatusState state = status();
  std::wstring spinner = L" ";
  if (state.isLoading) {
    spinner = options_.unicode ? kUnicodeSpinner[static_cast<std::size_t>(spinnerStep_) % kUnicodeSpinner.size()]
                               : kAsciiSpinner[static_cast<std::size_t>(spinnerStep_) % kAsciiSpinner.size()];
  }
  attron(A_REVERSE);
  blankLine(y, width);
  const std::wstring hints = widen("/ filter  s save  ? keys  q quit");
  const std::wstring text = widen(state.text);
  const bool connecting = state.isLoading && options_.colour;
  put(y, 1, spinner);
  if (connecting) attron(COLOR_PAIR(kConnectingPair));
  put(y, 3, fit(text, width - 4, L""));
  if (connecting) attroff(COLOR_PAIR(kConnectingPair));
  // All the hints where they fit, else only the one that leads to the others.
  const int textEnd = 3 + columns(text) + 2;
  for (const std::wstring& shown : {hints, std::wstring(L"? keys")}) {
    const int at = width - columns(shown) - 1;
    if (at > textEnd) {
      put(y, at, shown);
      break;
    }
  }
  attroff(A_REVERSE);
}

void TerminalApp::drawHelp(int height, int width) {
  int y = 0;
  for (const char* line : kHelpLines) {
    if (y >= height) break;
    if (y == 0) attron(A_BOLD);
    put(y, 2, fit(widen(line), width - 2, L""));
    if (y == 0) attroff(A_BOLD);
    ++y;
  }
}

void TerminalApp::drawSave(int height, int width) {
  const std::wstring ellipsis = options_.unicode ? L"…" : L"~";
  attron(A_REVERSE);
  blankLine(0, width);
  attron(A_BOLD);
  const std::wstring title = L"Save Snapshot";
  put(0, std::max(0, (width - columns(title)) / 2), title);
  attroff(A_BOLD);
  attroff(A_REVERSE);
  if (height < 6) return;
  put(2, 1, L"Description:");
  const std::wstring typed = widen(description_) + L"_";
  // The end of a long description stays in view while typing.
  const int room = width - 3;
  const int skip = std::max(0, columns(typed) - room);
  attron(A_UNDERLINE);
  put(3, 2, slice(typed, skip, room));
  attroff(A_UNDERLINE);
  put(5, 1, L"Contents (every entry is saved):");
  const std::vector<std::string> entries = saver_ ? saver_->entryDescriptions() : std::vector<std::string>();
  const std::wstring mark = options_.unicode ? L"[✓] " : L"[x] ";
  int y = 6;
  const int last = height - 4;
  for (std::size_t i = 0; i < entries.size() && y <= last; ++i, ++y) {
    if (y == last && i + 1 < entries.size()) {
      put(y, 2, widen("... and " + std::to_string(entries.size() - i) + " more"));
      break;
    }
    put(y, 2, fit(mark + widen(entries[i]), width - 3, ellipsis));
  }
  if (entries.empty()) put(y, 2, L"(nothing collected yet)");
  attron(A_DIM);
  put(height - 2, 1, fit(widen(saver_ ? saver_->destinationText() : std::string()), width - 2, ellipsis));
  attroff(A_DIM);
  attron(A_REVERSE);
  blankLine(height - 1, width);
  put(height - 1, 1, fit(L"Enter save   Esc cancel", width - 2, L""));
  attroff(A_REVERSE);
}

void TerminalApp::drawAlert(int height, int width) {
  const int y = std::max(0, height / 2 - 2);
  attron(A_BOLD);
  put(y, 2, fit(widen(kFileErrorTitle), width - 2, L""));
  attroff(A_BOLD);
  put(y + 1, 2, fit(widen(kFileErrorMessage), width - 2, L""));
  attron(A_REVERSE);
  put(y + 3, 2, widen(std::string("[ ") + kFileErrorButton + " ]"));
  attroff(A_REVERSE);
}

}  // namespace corvane::tui
