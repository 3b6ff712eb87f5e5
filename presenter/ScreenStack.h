#pragma once

// The stack of list screens: the root screen ("/") at the bottom, never
// popped, and one screen per section opened above it. Each screen knows its
// path in the display tree, the node it shows and its selected row. Before a
// screen becomes the visible one by a push or a pop, the "will show" callback
// is told (the front end updates that screen's status line then); the root
// appearing at launch is not a "will show".
//
// After each display update the stack is re-pointed at the fresh tree: the
// root gets the new root, every other screen the node at its path. When a
// screen's node has gone from the display, the stack pops back to the screen
// below it.

#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "model/CorvaneModelNode.h"

namespace corvane {

// For screens at `paths` (the root first): the fresh nodes of the screens that
// remain, the root's being `root`. The list stops before the first screen
// above the root whose path `nodeAtPath` no longer finds.
std::vector<NodeRef> refreshedScreenNodes(const std::vector<std::string>& paths, NodeRef root,
                                          const std::function<NodeRef(const std::string&)>& nodeAtPath);

class ScreenStack {
 public:
  struct Screen {
    std::string path;
    NodeRef node;
    std::size_t selectedRow = 0;
    std::string selectedKey;  // finds the selection again after a refresh
  };
  using WillShow = std::function<void(const Screen& screen)>;

  ScreenStack();

  void setWillShow(WillShow willShow) { willShow_ = std::move(willShow); }

  const Screen& top() const { return screens_.back(); }
  const std::vector<Screen>& screens() const { return screens_; }
  std::size_t depth() const { return screens_.size(); }

  std::string title() const;
  // The back button's text: the title of the screen below, or empty at the root.
  std::string backTitle() const;

  // Selects a row of the top screen (clamped to its rows; 0 when it has none).
  void select(std::size_t row);
  // Opens the selected row of the top screen when it is a section; false otherwise.
  bool openSelected();
  // Opens the section of the top screen whose path is `path` (a front end
  // that opens screens itself tells the stack so); false when the top screen
  // has no such section.
  bool openPath(const std::string& path);
  // Pops the top screen (never the root); false at the root.
  bool pop();
  // Pops until `depth` screens are left (at least the root); false when none was popped.
  bool popToDepth(std::size_t depth);

  // Re-points every screen at the fresh tree; the selection follows its row's key.
  void reload(NodeRef root, const std::function<NodeRef(const std::string&)>& nodeAtPath);

 private:
  void rememberSelection(Screen& screen, std::size_t row);
  std::size_t rowCount(const Screen& screen) const;

  std::vector<Screen> screens_;
  WillShow willShow_;
};

}  // namespace corvane
