// The IFX decoder over arbitrary packets: a packet decodes, or raises the
// decoder's assertion failure; it never crashes or reads out of bounds.

#include <cstdlib>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "model/CorvaneModelNode.h"
#include "platform/Assertion.h"
#include "platform/Log.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace corvane;
  static const bool quiet = [] {
    log::setSink(std::make_shared<log::CapturingSink>());
    return true;
  }();
  (void)quiet;
  static GSMLogGenerator generator;
  Dictionary state;
  try {
    generator.updateState(state, std::span(data, size));
  } catch (const AssertionFailure&) {
    return 0;
  }
  PathDictionary paths;
  CorvaneModelNode::makeTreeFromObject(generator.generateLogUsingState(state), paths);
  return 0;
}
