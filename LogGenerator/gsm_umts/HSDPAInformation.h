#pragma once

// "HSDPA Info": the HSDPA decoding statistics: the record's version, the
// sub-frames, the carrier configuration, and per HARQ process of the primary
// and the secondary carrier what it received, under "Primary HARQ Process"
// and "Secondary HARQ Process".

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class HSDPAInformation final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The primary entries of a record: p at 16, 9 bytes an entry from 18.
  static BoundedList primaryProcesses(const PacketView& packet);
  // The secondary entries: s at 17, 9 bytes an entry from 18 + 162 p.
  static BoundedList secondaryProcesses(const PacketView& packet);
};

}  // namespace corvane
