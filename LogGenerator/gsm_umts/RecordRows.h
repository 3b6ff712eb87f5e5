#pragma once

// The rows of one baseband record of a section that reads several: written
// when the packet is long enough for the record, else the packet is dropped
// without a message and the rows keep their values.

#include <cstddef>
#include <span>

#include "LogGenerator/logcode/Rows.h"

namespace corvane {

inline void writeRecordRows(const Base& section, std::span<const RowField> table, const PacketView& packet,
                            std::size_t minimumLength) {
  if (packet.size() < minimumLength) return;
  RowWriter rows(section);
  writeRows(rows, table, packet);
}

}  // namespace corvane
