#pragma once

// "Process PS": packet-switched mobility management, the GMM state, its
// substate and the update status, under the keys of the circuit-switched
// section ("MM State", "MM Sub State") and "Attach Reject Cause", with the
// registration service state.

#include "LogGenerator/gsm_umts/MobilityStateSection.h"

namespace corvane {

class ProcessPS final : public MobilityStateSection {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
