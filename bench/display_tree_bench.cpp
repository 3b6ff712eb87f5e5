// Time to build the display tree of a display object with 1,000 rows, the size
// of a busy log-code display.

#include <benchmark/benchmark.h>

#include "model/CorvaneModelNode.h"

namespace {

using corvane::Array;
using corvane::Dictionary;
using corvane::Value;

// 1,000 leaf rows: 50 sorted sections of 10 rows, and 50 lists of 10 rows.
Value thousandRowDisplay() {
  Dictionary display;
  display.set("_sorted", Value("1"));
  for (int s = 0; s < 50; ++s) {
    Dictionary section;
    for (int r = 0; r < 10; ++r) section.set("Row " + std::to_string(r), Value(std::to_string(-100 + r) + " dBm"));
    display.set(std::to_string(s) + ";Section " + std::to_string(s), Value(section));
  }
  for (int l = 0; l < 50; ++l) {
    Array list;
    for (int r = 0; r < 10; ++r) list.append(Value("Cell " + std::to_string(r)));
    display.set("List " + std::to_string(l), Value(list));
  }
  return Value(display);
}

void BM_DisplayTreeOfAThousandRows(benchmark::State& state) {
  const Value display = thousandRowDisplay();
  for (auto _ : state) {
    corvane::PathDictionary paths;
    auto root = corvane::CorvaneModelNode::makeTreeFromObject(display, paths);
    benchmark::DoNotOptimize(root);
  }
  state.SetItemsProcessed(state.iterations() * 1000);
}
BENCHMARK(BM_DisplayTreeOfAThousandRows)->Unit(benchmark::kMicrosecond);

}  // namespace
