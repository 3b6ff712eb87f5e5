#pragma once

// "GSM RR Info": the GSM radio resource layer: its state, the serving cell's
// receive level and qualities, DTX and DRX.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class GSMRRInfo final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
