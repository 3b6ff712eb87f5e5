// Packets of arbitrary bytes dispatched through one log-code technology's
// generator: every section subscribed to the packet's code decodes it, then the
// display, its node tree and the saved contents (with the DLF) are made. Built
// once per technology (CORVANE_FUZZ_TECHNOLOGY).
//
// Input: a sequence of packets, each a 16-bit little-endian length followed by
// that many bytes (a short last packet takes what is left).

#include <cstdint>
#include <cstdlib>
#include <memory>
#include <span>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "model/CorvaneModelNode.h"
#include "platform/Log.h"

namespace {

class DiscardingSink final : public corvane::log::Sink {
 public:
  void write(int, std::string_view) override {}
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  using namespace corvane;
  static const bool quiet = [] {
    log::setSink(std::make_shared<DiscardingSink>());
    return true;
  }();
  (void)quiet;
  static std::unique_ptr<LogGenerator> generator = LogGenerator::generatorFromTechnology(CORVANE_FUZZ_TECHNOLOGY);
  static Dictionary state;
  if (!generator) std::abort();

  std::span<const std::uint8_t> rest(data, size);
  while (rest.size() >= 2) {
    const std::size_t length = std::min<std::size_t>(rest[0] | (rest[1] << 8), rest.size() - 2);
    const auto packet = rest.subspan(2, length);
    rest = rest.subspan(2 + length);
    try {
      generator->updateState(state, packet);
    } catch (const LogCode_0xFF0000::UnknownDataException&) {
      // A SIM-file record that does not parse is reported by throwing.
    }
  }
  PathDictionary paths;
  CorvaneModelNode::makeTreeFromObject(generator->generateLogUsingState(state), paths);
  generator->getSaveContentsFromState(state);
  return 0;
}
