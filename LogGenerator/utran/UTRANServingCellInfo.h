#pragma once

// "Serving Cell Info" of a UTRAN phone: the serving cell's identity and
// frequencies, from the baseband's serving-cell record and from the telephony
// service's cell-monitor list. A row shows whichever source reported last.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class UTRANServingCellInfo final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

 private:
  void updateFromServingCell(const PacketView& packet) const;
  void updateFromCellList(std::span<const std::uint8_t> data) const;
};

}  // namespace corvane
