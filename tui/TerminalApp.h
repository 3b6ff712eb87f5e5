#pragma once

// The terminal front end: the stack of list screens, the status line and the
// save screen of the application, drawn with ncurses over the presenter layer.
// It draws into the whole terminal: a title line, the rows of the top screen
// (key left, value right), a detail line with the selected row whole, and the
// status line with an activity spinner. Input and redraws run on the model's
// run loop.

#include <cstddef>
#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "model/CorvaneModel.h"
#include "presenter/PaneRows.h"
#include "presenter/ScreenStack.h"
#include "presenter/SignalStrengthPreference.h"
#include "presenter/SnapshotSaver.h"
#include "presenter/StatusLine.h"

namespace corvane::tui {

struct TerminalOptions {
  bool colour = true;   // false under NO_COLOR
  bool unicode = true;  // false on a terminal that is not UTF-8
  std::filesystem::path deviceRoot = "/";
};

class TerminalApp final : public CorvaneModelDelegate {
 public:
  // `quit` ends the program's event loop; `preferences` must outlive this object.
  TerminalApp(CorvaneModelEnvironment environment, TerminalOptions options, PreferenceStore& preferences,
              std::function<void()> quit);
  ~TerminalApp() override;
  TerminalApp(const TerminalApp&) = delete;
  TerminalApp& operator=(const TerminalApp&) = delete;

  // Takes the terminal over, turns the status bar's numeric signal strength
  // on and starts the model.
  void start();
  // Gives the terminal back and the preference too.
  void stop();

  void updateViewControllerFromModel() override;

 private:
  enum class Mode { Browse, Filter, Help, Save, Alert };

  // Handles the keys that are waiting; false when there was none.
  bool onInput();
  static bool terminalHungUp();
  void tick();
  void handleKey(int result, wint_t key);
  void handleBrowseKey(int result, wint_t key);
  void handleFilterKey(int result, wint_t key);
  void handleSaveKey(int result, wint_t key);
  void handleMouse();

  void moveSelection(long delta);
  void selectVisible(std::size_t visibleIndex);
  void open();
  void back();
  void openSaveScreen();
  void finishSave();
  void clearFilter();

  std::vector<std::size_t> visibleRows() const;
  std::size_t visibleSelection(const std::vector<std::size_t>& visible) const;
  StatusState status() const;

  void draw();
  void drawTitle(int width);
  void drawRows(int top, int height, int width);
  void drawDetail(int y, int width);
  void drawStatus(int y, int width);
  void drawHelp(int height, int width);
  void drawSave(int height, int width);
  void drawAlert(int height, int width);

  CorvaneModelEnvironment environment_;
  TerminalOptions options_;
  std::function<void()> quit_;
  std::unique_ptr<CorvaneModel> model_;
  ScreenStack stack_;
  StatusLine statusLine_;
  SignalStrengthPreference signalStrength_;
  bool updated_ = false;  // a display update has come
  bool started_ = false;

  Mode mode_ = Mode::Browse;
  std::string filter_;
  std::size_t scrollTop_ = 0;
  int detailScroll_ = 0;
  std::string message_;  // shown on the detail line until the next key
  std::unique_ptr<SnapshotSaver> saver_;
  std::string description_;
  int spinnerStep_ = 0;
  RunLoop::Handle inputWatch_ = 0;
  RunLoop::Handle ticker_ = 0;
  int rowsTop_ = 1;
  int rowsHeight_ = 0;
};

}  // namespace corvane::tui
