#pragma once

// "Measured Neighbor Cells": the intra-frequency neighbours measured in
// connected mode, one row per cell, from the same record as
// "Connected mode LTE Intra-frequency Measurement".

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class MeasuredNeighborCells final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
  std::string getSectionName() const override { return "Measured Neighbor Cells"; }
  std::vector<std::uint32_t> getLogCodeArray() const override { return {0xB179}; }

  // The measured cells of a record: the count at byte 27, then 6 bytes a cell.
  static constexpr std::size_t kFirstCell = 29;
  static constexpr std::size_t kCellSize = 6;
  static BoundedList cells(const PacketView& packet);
};

}  // namespace corvane
