#pragma once

// "Neighbor Cells List": the idle-mode neighbour cells of one carrier, one row
// per cell with its measurements and timing offsets. The carrier itself is in
// "Neighbor Measurements", from the same record.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class NeighborCellsList final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The cells of a record: bits 6-10 of the 16-bit value at 19 hold the count
  // less one, so a record always reports at least one cell; 20 bytes a cell
  // from offset 21.
  static BoundedList cells(const PacketView& packet);
};

}  // namespace corvane
