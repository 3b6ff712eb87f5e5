#pragma once

// "Connected mode LTE Intra-frequency Measurement": the serving cell's filtered
// measurement from the connected-mode intra-frequency record. The same record
// feeds "Measured Neighbor Cells" and "Detected Cells".

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class ConnectedModeMeasurementMisc final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
