#pragma once

// "Serving Cell Info" of LTE: identity and carrier of the serving cell, from
// two baseband records and from the telephony service's cell-monitor list.
// Rows of the same name from either source show whichever came last.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class LTEServingCellInfo final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

 private:
  void updateFromAntennaInfo(const PacketView& packet) const;
  void updateFromCellIdentity(const PacketView& packet) const;
  void updateFromCellList(std::span<const std::uint8_t> data) const;
};

}  // namespace corvane
