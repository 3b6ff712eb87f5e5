#include "presenter/PaneRows.h"

#include <algorithm>
#include <cctype>

namespace corvane {

std::string paneTitle(const CorvaneModelNode* node) { return node ? node->displayName() : kRootScreenTitle; }

PaneRow paneRow(const CorvaneModelNode& child) {
  PaneRow row{child.displayName(), {}, child.childNodes() != nullptr};
  if (!row.opens && child.value()) row.value = *child.value();
  return row;
}

std::vector<PaneRow> paneRows(const CorvaneModelNode* node) {
  std::vector<PaneRow> rows;
  const NodeArray* children = node ? node->childNodes() : nullptr;
  if (!children) return rows;
  rows.reserve(children->size());
  for (const NodeRef& child : *children) {
    rows.push_back(child ? paneRow(*child) : PaneRow{});
  }
  return rows;
}

const NodeRef* paneChildAt(const CorvaneModelNode* node, std::size_t row) {
  const NodeArray* children = node ? node->childNodes() : nullptr;
  if (!children || row >= children->size()) return nullptr;
  return &(*children)[row];
}

namespace {

bool containsIgnoringCase(std::string_view text, std::string_view part) {
  const auto lower = [](char c) { return static_cast<char>(std::tolower(static_cast<unsigned char>(c))); };
  return std::search(text.begin(), text.end(), part.begin(), part.end(),
                     [&](char a, char b) { return lower(a) == lower(b); }) != text.end();
}

}  // namespace

std::vector<std::size_t> rowsMatching(const std::vector<PaneRow>& rows, std::string_view filter) {
  std::vector<std::size_t> shown;
  for (std::size_t i = 0; i < rows.size(); ++i) {
    if (filter.empty() || containsIgnoringCase(rows[i].key, filter) || containsIgnoringCase(rows[i].value, filter)) {
      shown.push_back(i);
    }
  }
  return shown;
}

}  // namespace corvane
