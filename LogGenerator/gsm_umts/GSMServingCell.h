#pragma once

// "GSM Serving Cell": the GSM cell the phone camps on, its level and
// reselection criteria, from three baseband records and from the telephony
// service's cell-monitor list. Rows of the same name from either source show
// whichever came last.

#include "LogGenerator/logcode/Base.h"

namespace corvane {

class GSMServingCell final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) override;
};

}  // namespace corvane
