#pragma once

// What the LTE list sections share: the way a list is replaced, and the one
// rule for entries that a packet's count places past its end.
//
// The rule (docs/architecture.md): a list stops at its last entry that lies
// wholly inside the packet. An entry the packet does not hold is not shown at
// all, rather than shown with zeros as if the baseband had measured them.

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "LogGenerator/logcode/Base.h"

namespace corvane::lte {

// True when the entry's bytes all lie inside the packet.
inline bool entryInside(const PacketView& packet, std::size_t offset, std::size_t width) {
  return packet.covers(offset, width);
}

// One row per entry of a list of fixed-size entries, made by makeRow(offset of
// the entry), in order; the rows stop at the first entry not wholly inside the
// packet. The index is 8 bits wide, as the counts are.
template <class MakeRow>
Array rowsOfEntries(const PacketView& packet, const BoundedList& entries, std::size_t entrySize, MakeRow makeRow) {
  std::vector<Value> rows;
  rows.reserve(entries.count());
  for (std::uint8_t i = 0; i < entries.count(); ++i) {
    const std::size_t entry = entries.entryOffset(i);
    if (!entryInside(packet, entry, entrySize)) break;
    rows.push_back(makeRow(entry));
  }
  return Array(std::move(rows));
}

// The row array of a list section for the length of one packet. Made, it
// empties the list; install() puts the new rows in whole. Without a container
// (before the first display build) both go nowhere.
class SectionList {
 public:
  explicit SectionList(const Base& section) : list_(section.sectionArray()) {
    if (list_) Base::clearElementsInArray(*list_);
  }
  void install(const Array& rows) const {
    if (list_) Base::replaceArray(*list_, rows);
  }

 private:
  std::optional<Array> list_;
};

}  // namespace corvane::lte
