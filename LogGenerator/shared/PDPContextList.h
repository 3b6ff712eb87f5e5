#pragma once

// "PDP Context Info": the packet data contexts as the telephony service reports
// them (extra code 0xFF0002), one row dictionary per context, shown as they come.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class PDPContextList final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
