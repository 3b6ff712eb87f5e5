#pragma once

// Printing a display tree: as an indented text tree (a row per node, "name: value"
// for leaves) or as nested JSON objects {"name", "value"} / {"name", "children"}.

#include <string>

#include "model/CorvaneModelNode.h"

namespace corvane::tools {

enum class TreeFormat { Text, Json };

std::string treeAsText(const CorvaneModelNode& root);
// Pretty-printed over several lines, or `compact` on one line (one document per line).
std::string treeAsJson(const CorvaneModelNode& root, bool compact = false);
std::string formatTree(const CorvaneModelNode& root, TreeFormat format);

}  // namespace corvane::tools
