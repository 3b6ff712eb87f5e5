#include "LogGenerator/shared/CellChangeCounters.h"

#include "platform/Log.h"

namespace corvane {

void CellChangeCounters::updateWithData(std::span<const std::uint8_t>, std::uint32_t) {
  log::printf(log::kWarning, "CellChangeCounters");
}

}  // namespace corvane
