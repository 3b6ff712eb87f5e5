#pragma once

// "GPRS Information": the GSM serving cell's packet service parameters:
// network control order, PFC, priority access threshold, network operating
// mode, T3192, access burst type, DRX timer, PBCCH, PSI/SI status, SI13
// position and reselection hysteresis.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class GPRSInformation final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
