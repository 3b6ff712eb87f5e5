#pragma once

// "UMTS RR Info": the UMTS radio resource control state, the serving cell and
// its frequencies, the ciphering and the average transmit power, from four
// baseband records and from the telephony service's cell-monitor list. Rows
// of the same name from either source show whichever came last.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class UMTSRRInfo final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The samples of a transmit power record: the count at 14, 14 bytes a
  // sample from 16.
  static BoundedList samples(const PacketView& packet);

 private:
  void updateFromTransmitPower(const PacketView& packet) const;
  void updateFromCell(const PacketView& packet) const;
};

}  // namespace corvane
