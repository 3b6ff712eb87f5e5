#pragma once

// The display tree that the screens read: named nodes built from a generator's
// display object (dictionaries, arrays and strings), with a dictionary from
// "/"-rooted path to node. Nodes are immutable; the tree is rebuilt whole.

#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "platform/Value.h"

namespace corvane {

class CorvaneModelNode;
using NodeRef = std::shared_ptr<const CorvaneModelNode>;
using NodeArray = std::vector<NodeRef>;
using PathDictionary = std::unordered_map<std::string, NodeRef>;

class CorvaneModelNode {
 public:
  virtual ~CorvaneModelNode() = default;
  CorvaneModelNode(const CorvaneModelNode&) = delete;
  CorvaneModelNode& operator=(const CorvaneModelNode&) = delete;

  const std::string& displayName() const { return _name; }
  // The children of an inner node (possibly empty); nullptr for a leaf.
  virtual const NodeArray* childNodes() const { return nullptr; }
  // The value text of a leaf; nullptr for an inner node.
  virtual const std::string* value() const { return nullptr; }

  // Builds the tree of a display object: the root is named "Corvane" and is
  // registered under "/". Every node made is registered in `paths` under its path.
  static NodeRef makeTreeFromObject(const Value& object, PathDictionary& paths);

 protected:
  explicit CorvaneModelNode(std::string name) : _name(std::move(name)) {}

  std::string _name;
};

class CorvaneModelLeafNode final : public CorvaneModelNode {
 public:
  CorvaneModelLeafNode(std::string name, std::string value)
      : CorvaneModelNode(std::move(name)), _string(std::move(value)) {}
  const std::string* value() const override { return &_string; }

 private:
  std::string _string;
};

class CorvaneModelTreeNode final : public CorvaneModelNode {
 public:
  CorvaneModelTreeNode(std::string name, NodeArray children)
      : CorvaneModelNode(std::move(name)), _childNodes(std::move(children)) {}
  const NodeArray* childNodes() const override { return &_childNodes; }

 private:
  NodeArray _childNodes;
};

// Joins a path and a name as file-path components are joined: one "/" between
// components, no doubled and no trailing separator ("/" + "Serving Cell" is
// "/Serving Cell"). An empty name leaves the path as it is.
std::string appendPathComponent(std::string_view path, std::string_view name);

}  // namespace corvane
