#pragma once

// "Active Set": the UMTS cells of the active set, one row per cell with its
// scrambling code, RSCP and Ec/Io, from the set log.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class ActiveSet final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
