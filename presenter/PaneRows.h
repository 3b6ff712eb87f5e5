#pragma once

// The rows of a list screen over one node of the display tree: a row per
// child, in the tree's order. A section opens a deeper screen and shows no
// value; a leaf shows its value beside its key.

#include <string>
#include <string_view>
#include <vector>

#include "model/CorvaneModelNode.h"

namespace corvane {

// The title of the screen before the first display update, when it has no node yet.
inline constexpr const char* kRootScreenTitle = "Corvane";

struct PaneRow {
  std::string key;
  std::string value;  // empty for a section
  bool opens = false;
  friend bool operator==(const PaneRow&, const PaneRow&) = default;
};

// The screen's title: the node's name, or kRootScreenTitle without a node.
std::string paneTitle(const CorvaneModelNode* node);
// The row of one child, and the rows of all children of `node`.
PaneRow paneRow(const CorvaneModelNode& child);
std::vector<PaneRow> paneRows(const CorvaneModelNode* node);
// The child shown in `row`; nullptr past the end or without children.
const NodeRef* paneChildAt(const CorvaneModelNode* node, std::size_t row);
// The indexes of the rows whose key or value holds `filter`, ignoring ASCII
// case; every row for an empty filter.
std::vector<std::size_t> rowsMatching(const std::vector<PaneRow>& rows, std::string_view filter);

}  // namespace corvane
