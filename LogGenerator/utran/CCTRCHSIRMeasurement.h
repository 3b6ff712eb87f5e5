#pragma once

// "CCTRCH SIR": the SIR of each coded composite transport channel, one row
// dictionary per channel with its six SIR values as a list.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class CCTRCHSIRMeasurement final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The CCTrCHs of a record: the count in bits 4-7 of byte 15, 8 bytes a
  // channel behind the transport channels' part of the record.
  static BoundedList cctrchs(const PacketView& packet);
  // The six SIR values of the CCTrCH at `channel`.
  static BoundedList sirValues(std::size_t channel);
};

}  // namespace corvane
