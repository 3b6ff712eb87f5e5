#pragma once

// "GSM Neighbor Cell List": the GSM cells a UTRAN phone measures. Every
// record read empties the list, and the list stays empty: the rows made of
// its cells are never shown.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class GSMNeighbhorMeasurements final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The cells of a record: the count at 16, 8 bytes a cell from 17.
  static BoundedList cells(const PacketView& packet);
  // The rows of a record's cells, one row dictionary each.
  static Array cellRows(const PacketView& packet);
};

}  // namespace corvane
