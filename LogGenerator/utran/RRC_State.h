#pragma once

// "RRC Info": the radio resource control state of the UTRAN connection.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class RRC_State final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The state a record reports: its state number when the record is of the
  // one version understood, else 255.
  static std::uint32_t stateNumber(const PacketView& packet);
};

}  // namespace corvane
