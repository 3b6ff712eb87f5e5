#pragma once

// "Mobile Allocation": the hopping sequence number and the list of
// frequencies the phone hops over.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class MobileAllocation final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The ARFCNs of a record: the count at 14, 2 bytes an ARFCN from 15.
  static BoundedList arfcns(const PacketView& packet);
};

}  // namespace corvane
