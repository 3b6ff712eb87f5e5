#pragma once

// "TRCH BLER": the block error rate of each transport channel, one row
// dictionary per channel.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class TRCHBLERMeasurement final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The transport channels of a record: the count in bits 6-11 of the 16-bit
  // value at 14, 2 bytes a channel from 17.
  static BoundedList transportChannels(const PacketView& packet);
};

}  // namespace corvane
