// One LTE section over packets of arbitrary bytes, reached the way the
// generator reaches it: registered in a class index of its own, with a display
// container of its kind attached, and handed the packet under each of its log
// codes (and under one it does not own). Built once per section:
// CORVANE_FUZZ_SECTION names the class, CORVANE_FUZZ_SECTION_HEADER its header,
// CORVANE_FUZZ_LIST whether it shows a list.
//
// Besides the sanitizers' checks: no exception leaves the section (a bounded
// accessor asked out of range would throw), every row is a string, a list holds
// no more rows than the packet has bytes for, and the array lock is free again.

#include <cstdint>
#include <cstdlib>
#include <memory>
#include <span>

#include "LogGenerator/logcode/ArrayLock.h"
#include "LogGenerator/logcode/ClassIndex.h"
#include "platform/Log.h"
#include CORVANE_FUZZ_SECTION_HEADER

namespace {

using namespace corvane;

class DiscardingSink final : public log::Sink {
 public:
  void write(int, std::string_view) override {}
};

class OneSectionIndex final : public ClassIndex {
 public:
  OneSectionIndex() : section(makeSection<CORVANE_FUZZ_SECTION>()) {}
  std::shared_ptr<CORVANE_FUZZ_SECTION> section;
};

bool onlyStringRows(const Dictionary& rows) {
  for (const auto& entry : rows.entries()) {
    if (!entry.second.isString()) return false;
  }
  return true;
}

// Every LTE list starts at offset 21 or later, with entries of 2 bytes or more.
constexpr std::size_t kFirstEntry = 21;
constexpr std::size_t kSmallestEntry = 2;

void check(const Value& container, std::size_t packetSize) {
  if (ArrayLock::depth() != 0) std::abort();
  if (const Dictionary* rows = container.asDictionary()) {
    if (!onlyStringRows(*rows)) std::abort();
    return;
  }
  const Array& list = *container.asArray();
  if (list.empty()) return;
  if (packetSize < kFirstEntry + list.size() * kSmallestEntry) std::abort();
  for (const Value& row : list.elements()) {
    const Dictionary* d = row.asDictionary();
    if (!d || !onlyStringRows(*d)) std::abort();
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const bool quiet = [] {
    log::setSink(std::make_shared<DiscardingSink>());
    return true;
  }();
  (void)quiet;
  static OneSectionIndex index;
  static const Value container = CORVANE_FUZZ_LIST ? Value(Array()) : Value(Dictionary());
  static const bool attached = [] {
    index.section->updateSectionRef(container);
    return true;
  }();
  (void)attached;

  const std::span<const std::uint8_t> packet(data, size);
  auto codes = index.section->getLogCodeArray();
  codes.push_back(0xB0C0);  // a code the section does not own
  for (std::uint32_t code : codes) {
    // What a list shows must come from this packet, not an earlier one.
    if (const Array* list = container.asArray()) list->clear();
    const auto* subscribers = index.getSubscribers(static_cast<std::int32_t>(code));
    if (!subscribers) {
      index.section->updateWithData(packet, code);
    } else {
      for (const auto& section : *subscribers) section->updateWithData(packet, code);
    }
    check(container, size);
  }
  return 0;
}
