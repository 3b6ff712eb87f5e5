#pragma once

// "Measured Neighbor Cells": the intra-frequency neighbours measured in
// connected mode, one row per cell, from the same record as
// "Connected mode LTE Intra-frequency Measurement".

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class MeasuredNeighborCells final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The measured cells of a record: the count at byte 27, then 6 bytes a cell.
  static BoundedList cells(const PacketView& packet);
};

}  // namespace corvane
