#include "presenter/ScreenStack.h"

#include <algorithm>

#include "presenter/PaneRows.h"

namespace corvane {

std::vector<NodeRef> refreshedScreenNodes(const std::vector<std::string>& paths, NodeRef root,
                                          const std::function<NodeRef(const std::string&)>& nodeAtPath) {
  std::vector<NodeRef> nodes;
  if (paths.empty()) return nodes;
  nodes.push_back(std::move(root));
  for (std::size_t i = 1; i < paths.size(); ++i) {
    NodeRef node = nodeAtPath(paths[i]);
    if (!node) break;
    nodes.push_back(std::move(node));
  }
  return nodes;
}

ScreenStack::ScreenStack() { screens_.push_back(Screen{"/", nullptr, 0, {}}); }

std::string ScreenStack::title() const { return paneTitle(top().node.get()); }

std::string ScreenStack::backTitle() const {
  if (screens_.size() < 2) return {};
  return paneTitle(screens_[screens_.size() - 2].node.get());
}

std::size_t ScreenStack::rowCount(const Screen& screen) const {
  const NodeArray* children = screen.node ? screen.node->childNodes() : nullptr;
  return children ? children->size() : 0;
}

void ScreenStack::rememberSelection(Screen& screen, std::size_t row) {
  const std::size_t count = rowCount(screen);
  screen.selectedRow = count == 0 ? 0 : std::min(row, count - 1);
  const NodeRef* child = paneChildAt(screen.node.get(), screen.selectedRow);
  screen.selectedKey = child && *child ? (*child)->displayName() : std::string();
}

void ScreenStack::select(std::size_t row) { rememberSelection(screens_.back(), row); }

bool ScreenStack::openSelected() {
  const Screen& current = screens_.back();
  const NodeRef* child = paneChildAt(current.node.get(), current.selectedRow);
  if (!child || !*child || !(*child)->childNodes()) return false;
  Screen opened{appendPathComponent(current.path, (*child)->displayName()), *child, 0, {}};
  rememberSelection(opened, 0);
  screens_.push_back(std::move(opened));
  if (willShow_) willShow_(screens_.back());
  return true;
}

bool ScreenStack::openPath(const std::string& path) {
  const Screen& current = screens_.back();
  const NodeArray* children = current.node ? current.node->childNodes() : nullptr;
  if (!children) return false;
  for (std::size_t row = 0; row < children->size(); ++row) {
    const NodeRef& child = (*children)[row];
    if (child && appendPathComponent(current.path, child->displayName()) == path) {
      select(row);
      return openSelected();
    }
  }
  return false;
}

bool ScreenStack::pop() { return popToDepth(screens_.size() - 1); }

bool ScreenStack::popToDepth(std::size_t depth) {
  depth = std::max<std::size_t>(depth, 1);
  if (depth >= screens_.size()) return false;
  screens_.resize(depth);
  if (willShow_) willShow_(screens_.back());
  return true;
}

void ScreenStack::reload(NodeRef root, const std::function<NodeRef(const std::string&)>& nodeAtPath) {
  std::vector<std::string> paths;
  for (const Screen& screen : screens_) paths.push_back(screen.path);
  std::vector<NodeRef> nodes = refreshedScreenNodes(paths, std::move(root), nodeAtPath);
  const bool popped = nodes.size() < screens_.size();
  screens_.resize(nodes.size());
  for (std::size_t i = 0; i < nodes.size(); ++i) {
    Screen& screen = screens_[i];
    screen.node = std::move(nodes[i]);
    std::size_t row = screen.selectedRow;
    const NodeArray* children = screen.node ? screen.node->childNodes() : nullptr;
    if (children && !screen.selectedKey.empty()) {
      const auto same = std::find_if(children->begin(), children->end(), [&](const NodeRef& child) {
        return child && child->displayName() == screen.selectedKey;
      });
      if (same != children->end()) row = static_cast<std::size_t>(same - children->begin());
    }
    rememberSelection(screen, row);
  }
  if (popped && willShow_) willShow_(screens_.back());
}

}  // namespace corvane
