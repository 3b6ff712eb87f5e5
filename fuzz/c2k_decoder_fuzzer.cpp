// Each CDMA2000 decoder on its own, over packets of arbitrary bytes: the first
// input byte picks the decoder (of the eight, in the start command's order),
// the rest is the packet, decoded twice into a display made from the
// installed template, so that the second run meets the memory the first left
// in the state (frame-error filter, byte counters).
//
// Besides the sanitizers' checks: no exception leaves a decoder, every
// display value is a string or a per-pilot list of strings that holds no
// more pilots than the packet has bytes for, the state's memory has the types
// it is read back with, and nothing but the decoders' own keys is added.

#include <cstdint>
#include <cstdlib>
#include <memory>
#include <span>
#include <string_view>

#include "LogGenerator/cdma2000/C2KDecoders.h"
#include "LogGenerator/cdma2000/C2KLogGenerator.h"
#include "platform/Log.h"

namespace {

using namespace corvane;

class DiscardingSink final : public log::Sink {
 public:
  void write(int, std::string_view) override {}
};

void require(bool condition) {
  if (!condition) std::abort();
}

// A per-pilot list: "_sorted" and "index;PN" keys, string values.
void checkValue(const Value& value, std::size_t packetSize) {
  if (value.isString()) return;
  const Dictionary* list = value.asDictionary();
  require(list != nullptr);
  require(list->contains("_sorted"));
  // The smallest pilot entry of any list is 12 bytes (EV-DO pilots), past a
  // header of at least 17.
  require(list->size() - 1 <= packetSize / 12);
  for (const auto& [key, text] : list->entries()) {
    require(text.isString());
    require(key == "_sorted" || key.find(';') != std::string::npos);
  }
}

void checkDisplay(const Value& node, std::size_t packetSize) {
  const Dictionary* d = node.asDictionary();
  require(d != nullptr);
  for (const auto& [label, value] : d->entries()) {
    if (label == "_sorted") continue;
    // Sub-sections of the template hold only labels; a decoded list holds "_sorted".
    if (const Dictionary* sub = value.asDictionary(); sub && !sub->contains("_sorted")) {
      checkDisplay(value, packetSize);
    } else {
      checkValue(value, packetSize);
    }
  }
}

bool isNumber(const Value& v) { return v.asInteger() || v.asReal(); }

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const bool quiet = [] {
    log::setSink(std::make_shared<DiscardingSink>());
    return true;
  }();
  (void)quiet;
  if (size < 1) return 0;
  const c2k::CodeDecoder& row = c2k::kDecoders[data[0] % std::size(c2k::kDecoders)];
  const std::span<const std::uint8_t> packet(data + 1, size - 1);

  // The installed template, read once; each input gets a display of its own from it.
  static const Value kTemplate = [] {
    Dictionary first;
    if (!C2KLogGenerator::getDisplayFromState(first).isDictionary()) std::abort();
    return first.get("Template");
  }();
  Dictionary state;
  state.set("Template", kTemplate);
  if (!C2KLogGenerator::getDisplayFromState(state).isDictionary()) std::abort();
  const Value lookup = state.get("Lookup");
  const std::size_t entries = state.size();
  for (int run = 0; run < 2; ++run) row.decoder(packet, state, lookup.asDictionary());

  checkDisplay(state.get("Display"), packet.size());
  for (std::string_view key : {c2k::kTrafficFER, c2k::kFLDataSeqNum, c2k::kFLDataSent, c2k::kRLDataSeqNum,
                               c2k::kRLDataSent}) {
    if (const Value* v = state.find(key)) require(isNumber(*v));
  }
  // At most a sequence and a total per link, or the filter.
  require(state.size() <= entries + 2);
  if (const Value* fer = state.find(c2k::kTrafficFER)) require(*fer->asReal() >= 0 && *fer->asReal() <= 1);
  return 0;
}
