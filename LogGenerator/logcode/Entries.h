#pragma once

// A walk over the entries of a list in a packet that makes no rows (a record
// whose entries fill a table or a sum rather than a list), under the same rule
// as the lists of Rows.h: the walk stops at the last entry that lies wholly
// inside the packet.

#include <cstddef>
#include <cstdint>

#include "LogGenerator/logcode/Base.h"
#include "LogGenerator/logcode/PacketView.h"

namespace corvane {

// visit(offset of the entry) for each entry, in order. The index is 8 bits
// wide, as the counts are.
template <class Visit>
void forEachEntry(const PacketView& packet, const BoundedList& entries, std::size_t entrySize, Visit visit) {
  for (std::uint8_t i = 0; i < entries.count(); ++i) {
    const std::size_t entry = entries.entryOffset(i);
    if (!packet.covers(entry, entrySize)) return;
    visit(entry);
  }
}

}  // namespace corvane
