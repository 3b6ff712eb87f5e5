#pragma once

// "Neighbor Cell List": the UTRAN cells the phone measures, one row
// dictionary each, with the set each belongs to.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class UTRANNeighbhorMeasurements final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The cells of a record: the count in bits 1-7 of byte 16, 16 bytes a cell
  // from 168.
  static BoundedList cells(const PacketView& packet);
};

}  // namespace corvane
