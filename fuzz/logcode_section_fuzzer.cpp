// Every section of every log-code technology on its own, over packets of
// arbitrary bytes, reached the way the generator reaches it: made from its
// row of its technology's table in a class index of its own, with a display
// container of the row's kind attached, and handed the packet under each of
// its log codes (and under one it does not own). The first input byte picks
// the technology, the second the row of its table; the rest is the packet. A
// new section is fuzzed as soon as its table row exists.
//
// Besides the sanitizers' checks: no exception leaves the section but the
// SIM files' UnknownDataException (a bounded accessor asked out of range
// would throw), every row a section makes is a string or a list of strings or
// of string rows (in a list's row: a string or a list of strings), a list
// read from packet bytes holds no more rows than the packet has bytes for,
// and the array lock is free again.

#include <cstdint>
#include <cstdlib>
#include <memory>
#include <span>
#include <vector>

#include "LogGenerator/LogCodeTechnologies.h"
#include "LogGenerator/logcode/ArrayLock.h"
#include "LogGenerator/logcode/ClassIndex.h"
#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "platform/Log.h"

namespace {

using namespace corvane;

class DiscardingSink final : public log::Sink {
 public:
  void write(int, std::string_view) override {}
};

// One section in an index of its own, with its container attached.
struct FuzzedSection {
  explicit FuzzedSection(const SectionDescriptor& row)
      : descriptor(&row),
        index(SectionTable(&row, 1)),
        container(row.container == SectionContainer::List ? Value(Array()) : Value(Dictionary())) {
    index.getClass(row.name)->updateSectionRef(container);
  }
  const SectionDescriptor* descriptor;
  ClassIndex index;
  Value container;
};

// Per technology, one fuzzed section per table row.
using Sections = std::vector<std::unique_ptr<FuzzedSection>>;

std::vector<Sections> makeAllSections() {
  std::vector<Sections> all;
  for (const LogCodeTechnology& technology : logCodeTechnologies()) {
    Sections sections;
    for (const SectionDescriptor& row : technology.sections()) sections.push_back(std::make_unique<FuzzedSection>(row));
    all.push_back(std::move(sections));
  }
  return all;
}

bool onlyStringRows(const Dictionary& rows) {
  for (const auto& entry : rows.entries()) {
    if (!entry.second.isString()) return false;
  }
  return true;
}

// A list's row holds strings, or a list of strings ("SIR").
bool stringOrStringListRows(const Dictionary& rows) {
  for (const auto& entry : rows.entries()) {
    if (entry.second.isString()) continue;
    const Array* list = entry.second.asArray();
    if (!list) return false;
    for (const Value& element : list->elements()) {
      if (!element.isString()) return false;
    }
  }
  return true;
}

// A row of a dictionary section is a string, or a list of its own: of
// strings ("ARFCNs") or of row dictionaries of strings ("Transport Channels").
bool wellFormedRows(const Dictionary& rows) {
  for (const auto& entry : rows.entries()) {
    if (entry.second.isString()) continue;
    const Array* list = entry.second.asArray();
    if (!list) return false;
    for (const Value& element : list->elements()) {
      const Dictionary* d = element.asDictionary();
      if (!element.isString() && !(d && onlyStringRows(*d))) return false;
    }
  }
  return true;
}

// A list read from an ordinary record has its entries in the payload, one
// byte or more each. The SIM files and the PDP contexts are shown as the
// service sends them, values of any kind.
void check(const Value& container, std::size_t packetSize, bool fromPacketBytes, bool asTheServiceSends) {
  if (ArrayLock::depth() != 0) std::abort();
  if (asTheServiceSends) return;
  if (const Dictionary* rows = container.asDictionary()) {
    if (!wellFormedRows(*rows)) std::abort();
    return;
  }
  const Array& list = *container.asArray();
  if (fromPacketBytes && !list.empty() && packetSize < kLogRecordHeaderSize + list.size()) std::abort();
  for (const Value& row : list.elements()) {
    const Dictionary* d = row.asDictionary();
    if (!d || !stringOrStringListRows(*d)) std::abort();
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const bool quiet = [] {
    log::setSink(std::make_shared<DiscardingSink>());
    ClassIndex::setTeardownStream(nullptr);
    return true;
  }();
  (void)quiet;
  static const auto technologies = makeAllSections();
  if (size < 2) return 0;
  const Sections& sections = technologies[data[0] % technologies.size()];
  if (sections.empty()) return 0;
  FuzzedSection& fuzzed = *sections[data[1] % sections.size()];
  const std::span<const std::uint8_t> packet(data + 2, size - 2);

  std::vector<std::uint32_t> codes(fuzzed.descriptor->codes.begin(), fuzzed.descriptor->codes.end());
  const bool asTheServiceSends = fuzzed.descriptor->codes.contains(kExtraCodeSimFiles) ||
                                 fuzzed.descriptor->codes.contains(kExtraCodePDPContexts);
  codes.push_back(0xB0C0);  // a code the section does not own
  for (std::uint32_t code : codes) {
    // What a list shows must come from this packet, not an earlier one.
    if (const Array* list = fuzzed.container.asArray()) list->clear();
    const auto* subscribers = fuzzed.index.getSubscribers(static_cast<std::int32_t>(code));
    try {
      if (!subscribers) {
        fuzzed.index.getClass(fuzzed.descriptor->name)->updateWithData(packet, code);
      } else {
        for (const auto& section : *subscribers) section->updateWithData(packet, code);
      }
    } catch (const LogCode_0xFF0000::UnknownDataException&) {
      // The one exception a section may raise: SIM files that are not a
      // property list. The generator reports it and goes on.
      if (code != 0xFF0000) std::abort();
    }
    check(fuzzed.container, packet.size(), code < kExtraCodeBase, asTheServiceSends);
  }
  return 0;
}
