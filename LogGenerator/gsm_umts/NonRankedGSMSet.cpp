#include "LogGenerator/gsm_umts/NonRankedGSMSet.h"

#include "platform/Log.h"

namespace corvane {

void NonRankedGSMSet::updateWithData(std::span<const std::uint8_t>, std::uint32_t) { log::write(log::kWarning, "NonRankedGSMSet"); }

}  // namespace corvane
