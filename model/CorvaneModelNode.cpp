#include "model/CorvaneModelNode.h"

#include <algorithm>

#include "LogGenerator/logcode/ArrayLock.h"

namespace corvane {

namespace {

constexpr std::string_view kSortedKey = "_sorted";
constexpr std::string_view kUnknownValueText = "(unknown)";

// Under "_sorted", a key of exactly two ";"-separated parts shows as its second part.
std::string_view sortedDisplayName(std::string_view key) {
  const auto first = key.find(';');
  if (first == std::string_view::npos) return key;
  if (key.find(';', first + 1) != std::string_view::npos) return key;
  return key.substr(first + 1);
}

NodeRef BuildNode(std::string name, const Value& object, PathDictionary& paths, const std::string& path);

NodeRef buildDictionaryNode(std::string name, const Dictionary& dict, PathDictionary& paths, const std::string& path) {
  NodeArray children;
  const bool sorted = dict.contains(kSortedKey);

  std::vector<const Dictionary::Entry*> entries;
  entries.reserve(dict.size());
  for (const auto& entry : dict.entries()) entries.push_back(&entry);
  if (sorted) {
    std::sort(entries.begin(), entries.end(), [](const auto* a, const auto* b) { return a->first < b->first; });
  }

  children.reserve(entries.size());
  for (const auto* entry : entries) {
    const std::string& key = entry->first;
    if (key == kSortedKey) continue;
    if (entry->second.isNull()) continue;
    std::string childName(sorted ? sortedDisplayName(key) : std::string_view(key));
    std::string childPath = appendPathComponent(path, childName);
    if (NodeRef child = BuildNode(std::move(childName), entry->second, paths, childPath)) {
      children.push_back(std::move(child));
    }
  }
  return std::make_shared<CorvaneModelTreeNode>(std::move(name), std::move(children));
}

NodeRef buildArrayNode(std::string name, const Array& array, PathDictionary& paths, const std::string& path) {
  NodeArray children;
  ArrayLock::lockArray();
  try {
    children.reserve(array.size());
    for (const Value& element : array.elements()) {
      std::string childName = std::to_string(children.size());
      std::string childPath = appendPathComponent(path, childName);
      if (NodeRef child = BuildNode(std::move(childName), element, paths, childPath)) {
        children.push_back(std::move(child));
      }
    }
  } catch (...) {
    ArrayLock::unlockArray();
    throw;
  }
  ArrayLock::unlockArray();
  return std::make_shared<CorvaneModelTreeNode>(std::move(name), std::move(children));
}

NodeRef BuildNode(std::string name, const Value& object, PathDictionary& paths, const std::string& path) {
  NodeRef node;
  if (const std::string* s = object.asString()) {
    node = std::make_shared<CorvaneModelLeafNode>(std::move(name), *s);
  } else if (const Dictionary* d = object.asDictionary()) {
    node = buildDictionaryNode(std::move(name), *d, paths, path);
  } else if (const Array* a = object.asArray()) {
    node = buildArrayNode(std::move(name), *a, paths, path);
  } else {
    node = std::make_shared<CorvaneModelLeafNode>(std::move(name), std::string(kUnknownValueText));
  }
  paths.insert_or_assign(path, node);
  return node;
}

}  // namespace

NodeRef CorvaneModelNode::makeTreeFromObject(const Value& object, PathDictionary& paths) {
  return BuildNode("Corvane", object, paths, "/");
}

std::string appendPathComponent(std::string_view path, std::string_view name) {
  std::string out;
  out.reserve(path.size() + name.size() + 1);
  out.append(path);
  out.push_back('/');
  out.append(name);
  // Collapse doubled separators and drop a trailing one (except for the root itself).
  std::string clean;
  clean.reserve(out.size());
  for (char c : out) {
    if (c == '/' && !clean.empty() && clean.back() == '/') continue;
    clean.push_back(c);
  }
  if (clean.size() > 1 && clean.back() == '/') clean.pop_back();
  return clean;
}

}  // namespace corvane
