#pragma once

// "GSM Set": the GSM neighbour cells of the baseband's ranked idle-mode list,
// one row per cell with its level and ranking.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class GSMSet final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

  // The GSM cells of a ranked list record: the count at 14, 7 bytes a cell
  // from 15 (where the UMTS cells begin too).
  static BoundedList cells(const PacketView& packet);
};

}  // namespace corvane
