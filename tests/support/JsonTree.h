#pragma once

// Readers of the tree that corvane-decode --format json writes: nodes with a
// "name" and either a "value" or "children".

#include <map>
#include <string>
#include <utility>
#include <vector>

#include <nlohmann/json.hpp>

namespace corvane::test {

using JsonTree = nlohmann::ordered_json;

// The node of that name anywhere in the tree, depth first.
inline const JsonTree* findJsonNode(const JsonTree& node, const std::string& name) {
  if (node.value("name", "") == name) return &node;
  if (!node.contains("children")) return nullptr;
  for (const JsonTree& child : node["children"]) {
    if (const JsonTree* found = findJsonNode(child, name)) return found;
  }
  return nullptr;
}

// The node's rows that hold a value, by name.
inline std::map<std::string, std::string> jsonRowsOf(const JsonTree& section) {
  std::map<std::string, std::string> rows;
  for (const JsonTree& child : section.value("children", JsonTree::array())) {
    if (child.contains("value")) rows[child["name"].get<std::string>()] = child["value"].get<std::string>();
  }
  return rows;
}

// Every value below the node, with its path.
inline void collectJsonValues(const JsonTree& node, const std::string& path,
                              std::vector<std::pair<std::string, std::string>>& out) {
  const std::string here = path + "/" + node["name"].get<std::string>();
  if (node.contains("value")) {
    out.emplace_back(here, node["value"].get<std::string>());
    return;
  }
  for (const JsonTree& child : node.value("children", JsonTree::array())) collectJsonValues(child, here, out);
}

}  // namespace corvane::test
