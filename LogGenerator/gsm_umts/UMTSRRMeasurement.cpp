#include "LogGenerator/gsm_umts/UMTSRRMeasurement.h"

#include "platform/Log.h"

namespace corvane {

void UMTSRRMeasurement::updateWithData(std::span<const std::uint8_t>, std::uint32_t) { log::write(log::kWarning, "UMTSRRMeasurement"); }

}  // namespace corvane
