#pragma once

// "Non-Ranked UMTS Set": a placeholder section that takes no packets; it shows what the
// display template gives it.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class NonRankedUMTSSet final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
