#pragma once

// A display tree as the model builds it, from a display object written with
// the test builders.

#include "model/CorvaneModelNode.h"
#include "support/Values.h"

namespace corvane::test {

struct Tree {
  PathDictionary paths;
  NodeRef root;

  explicit Tree(const Value& display) { root = CorvaneModelNode::makeTreeFromObject(display, paths); }
  NodeRef at(const std::string& path) const {
    const auto found = paths.find(path);
    return found == paths.end() ? nullptr : found->second;
  }
};

// Two sections and a leaf at the root; the serving cell has three rows.
inline Value radioDisplay() {
  return D({{"Serving Cell", D({{"MCC", S("262")}, {"MNC", S("01")}, {"Cell Id", S("0x1A2B")}})},
            {"Neighbours", D({{"Count", S("2")}})},
            {"Technology", S("LTE")}});
}

}  // namespace corvane::test
