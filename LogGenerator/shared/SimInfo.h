#pragma once

// "SIM Info": the elementary files of the SIM as the telephony service reports
// them (extra code 0xFF0000), each shown as it comes.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class SimInfo final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
