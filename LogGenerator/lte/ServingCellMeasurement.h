#pragma once

// "Serving Cell Measurements": the serving cell's RSRP, RSRQ and RSSI and the
// idle-mode reselection parameters the baseband measured them against.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class ServingCellMeasurement final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
