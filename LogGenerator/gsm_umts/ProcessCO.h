#pragma once

// "Process CO": the common part of mobility management, the MM state and the
// registration service state.

#include "LogGenerator/gsm_umts/MobilityStateSection.h"

namespace corvane {

class ProcessCO final : public MobilityStateSection {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
