#pragma once

// "Neighbor Measurements": the carrier and Qrxlevmin of the idle-mode neighbour
// measurement record, whose cells "Neighbor Cells List" shows.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class NeighborMeasurementMisc final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
  std::string getSectionName() const override { return "Neighbor Measurements"; }
  std::vector<std::uint32_t> getLogCodeArray() const override { return {0xB180}; }
};

}  // namespace corvane
