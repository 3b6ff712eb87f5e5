#pragma once

// "Detected Cells": cells the baseband detected but has not yet measured, one
// row per physical cell ID, listed right behind the measured neighbours of
// the same record.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class DetectedCells final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The detected cells of a record: the count at byte 28, then 2 bytes a cell
  // behind the measured neighbours.
  static BoundedList cells(const PacketView& packet);
};

}  // namespace corvane
