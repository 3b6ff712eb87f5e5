#pragma once

// "Neighbor Measurements": the carrier and Qrxlevmin of the idle-mode neighbour
// measurement record, whose cells "Neighbor Cells List" shows.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class NeighborMeasurementMisc final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
