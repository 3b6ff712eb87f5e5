#pragma once

// "BLER": the block error counts of the UMTS transport channels over the
// baseband's window, one dictionary per channel under "Transport Channels".

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class BLER final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The channels of a record: the count at 13, 9 bytes a channel from 16.
  static BoundedList channels(const PacketView& packet);
};

}  // namespace corvane
