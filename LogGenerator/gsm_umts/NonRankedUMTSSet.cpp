#include "LogGenerator/gsm_umts/NonRankedUMTSSet.h"

#include "platform/Log.h"

namespace corvane {

void NonRankedUMTSSet::updateWithData(std::span<const std::uint8_t>, std::uint32_t) { log::write(log::kWarning, "NonRankedUMTSSet"); }

}  // namespace corvane
