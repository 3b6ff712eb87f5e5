#pragma once

// "UMTS Set": the UMTS neighbour cells, one row per cell, from the baseband's
// ranked idle-mode list (with the ranking) or from the telephony service's
// cell-monitor list, whichever came last. The two sources name the frequency
// differently: "Downlink Frequency" from the baseband, "UARFCN" from the
// service.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class UMTSSet final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The UMTS cells of a ranked list record: the count at 13, 10 bytes a cell
  // from 15.
  static BoundedList cells(const PacketView& packet);

 private:
  void updateFromRankedCells(const PacketView& packet) const;
};

}  // namespace corvane
