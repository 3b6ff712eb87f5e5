#pragma once

// "Process CS": circuit-switched mobility management, the MM state, its
// substate and the update status (shown as "LU Reject Cause"), with the
// registration service state.

#include "LogGenerator/gsm_umts/MobilityStateSection.h"

namespace corvane {

class ProcessCS final : public MobilityStateSection {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
