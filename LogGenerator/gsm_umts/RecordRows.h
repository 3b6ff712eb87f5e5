#pragma once

// The rows of one baseband record of a section that reads several: written
// when the packet is long enough for the record, else the packet is dropped
// without a message and the rows keep their values.

#include <cstddef>

#include "LogGenerator/logcode/Rows.h"

namespace corvane {

//
//   writeRecordRows<kRows>(*this, packet, layout::kMinimumLength);
template <const auto& Table>
void writeRecordRows(const Base& section, const PacketView& packet, std::size_t minimumLength) {
  if (packet.size() < minimumLength) return;
  RowWriter rows(section);
  writeRows<Table>(rows, packet);
}

}  // namespace corvane
