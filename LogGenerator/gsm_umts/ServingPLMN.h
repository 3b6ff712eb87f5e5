#pragma once

// "Serving PLMN": the network the phone is registered on, from the baseband's
// registration and PLMN selection records and from the telephony service's
// cell-monitor list. Rows of the same name from either source show whichever
// came last.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class ServingPLMN final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;

 private:
  void updateFromRegistration(const PacketView& packet) const;
};

}  // namespace corvane
