// The display-tree builder over arbitrary display objects: dictionaries with and
// without "_sorted", keys with ";", arrays, strings, numbers and nulls. Every
// node built is registered under its path, and the lock is left as the builder
// leaves it.

#include <fuzzer/FuzzedDataProvider.h>

#include <cstdlib>

#include "LogGenerator/logcode/ArrayLock.h"
#include "model/CorvaneModelNode.h"

namespace {

using namespace corvane;

Value makeObject(FuzzedDataProvider& in, int depth) {
  const int kind = depth > 24 ? 0 : in.ConsumeIntegralInRange(0, 5);
  switch (kind) {
    case 0: return Value(in.ConsumeRandomLengthString(16));
    case 1: return Value::integer(in.ConsumeIntegral<std::int64_t>());
    case 2: return Value();
    case 3: {
      Array a;
      const int n = in.ConsumeIntegralInRange(0, 6);
      for (int i = 0; i < n && in.remaining_bytes() > 0; ++i) a.append(makeObject(in, depth + 1));
      return Value(a);
    }
    default: {
      Dictionary d;
      if (in.ConsumeBool()) d.set("_sorted", Value("1"));
      const int n = in.ConsumeIntegralInRange(0, 6);
      for (int i = 0; i < n && in.remaining_bytes() > 0; ++i) {
        d.set(in.ConsumeRandomLengthString(12), makeObject(in, depth + 1));
      }
      return Value(d);
    }
  }
}

std::size_t countNodes(const CorvaneModelNode& node) {
  std::size_t n = 1;
  if (const NodeArray* children = node.childNodes()) {
    for (const auto& c : *children) n += countNodes(*c);
  }
  return n;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzedDataProvider in(data, size);
  const Value object = makeObject(in, 0);
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(object, paths);
  if (!root || root->displayName() != "Corvane" || paths.at("/") != root) std::abort();
  if (paths.size() > countNodes(*root)) std::abort();
  if (ArrayLock::depth() != 0) std::abort();
  // Nested arrays leave the lock held once more by this thread; the builder
  // runs on one thread only, so that is harmless here.
  return 0;
}
