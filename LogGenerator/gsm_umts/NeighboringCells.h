#pragma once

// "Neighboring Cells": the measured GSM neighbour cells, one row per cell,
// from the baseband's cell measurement (with the BSIC its last ARFCN-to-BSIC
// record gave for the cell's frequency) or from the telephony service's
// cell-monitor list, whichever came last.

#include <cstdint>
#include <vector>

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class NeighboringCells final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The neighbours of a cell measurement record: the count at 28, 14 bytes
  // a neighbour from 29.
  static BoundedList neighbors(const PacketView& packet);
  // The ARFCN-BSIC pairs of their record: the count at 14, 4 bytes a pair
  // from 15.
  static BoundedList pairs(const PacketView& packet);

 private:
  void updateFromArfcnBsic(const PacketView& packet);
  void updateFromMeasurement(const PacketView& packet) const;
  // The BSIC last given for the ARFCN, or -1.
  int bsicOf(std::uint32_t arfcn) const;

  struct ArfcnBsic {
    std::uint16_t arfcn;
    std::uint8_t bsic;
  };
  // ARFCN → BSIC from the last 0x51FF record, in the order given; a later pair
  // for the same ARFCN replaces the earlier one. Emptied, not reallocated, by
  // each such record.
  std::vector<ArfcnBsic> arfcnToBsic;
};

}  // namespace corvane
