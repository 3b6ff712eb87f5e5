#include "LogGenerator/gsm_umts/ProcessCO.h"

#include "LogGenerator/gsm_umts/records/MmStateRecord.h"

namespace corvane {

namespace {

using namespace gsm_umts;

constexpr RowField kMmRows[] = {{"MM State", mm_state::kState}};

}  // namespace

void ProcessCO::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  // The common part has always traced itself as the circuit-switched one.
  updateStates<kMmRows>("ProcessCS", mm_state::kCode, mm_state::kMinimumLength, data, logCode);
}

}  // namespace corvane
