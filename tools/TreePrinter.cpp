#include "TreePrinter.h"

#include <nlohmann/json.hpp>

namespace corvane::tools {

namespace {

void appendText(const CorvaneModelNode& node, int depth, std::string& out) {
  out.append(static_cast<std::size_t>(depth) * 2, ' ');
  out.append(node.displayName());
  if (const std::string* value = node.value()) {
    out.append(": ");
    out.append(*value);
  }
  out.push_back('\n');
  if (const NodeArray* children = node.childNodes()) {
    for (const auto& child : *children) appendText(*child, depth + 1, out);
  }
}

nlohmann::ordered_json toJson(const CorvaneModelNode& node) {
  nlohmann::ordered_json j;
  j["name"] = node.displayName();
  if (const NodeArray* children = node.childNodes()) {
    auto array = nlohmann::ordered_json::array();
    for (const auto& child : *children) array.push_back(toJson(*child));
    j["children"] = std::move(array);
  } else if (const std::string* value = node.value()) {
    j["value"] = *value;
  }
  return j;
}

}  // namespace

std::string treeAsText(const CorvaneModelNode& root) {
  std::string out;
  appendText(root, 0, out);
  return out;
}

std::string treeAsJson(const CorvaneModelNode& root, bool compact) {
  return toJson(root).dump(compact ? -1 : 2, ' ', false, nlohmann::ordered_json::error_handler_t::replace) + "\n";
}

std::string formatTree(const CorvaneModelNode& root, TreeFormat format) {
  return format == TreeFormat::Json ? treeAsJson(root) : treeAsText(root);
}

}  // namespace corvane::tools
