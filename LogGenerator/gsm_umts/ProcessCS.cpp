#include "LogGenerator/gsm_umts/ProcessCS.h"

#include "LogGenerator/gsm_umts/records/MmStateRecord.h"

namespace corvane {

namespace {

using namespace gsm_umts;

// The update status has always been shown under "LU Reject Cause".
constexpr RowField kMmRows[] = {
    {"MM State", mm_state::kState},
    {"MM Sub State", mm_state::kSubstate},
    {"LU Reject Cause", mm_state::kUpdateStatus},
};

}  // namespace

void ProcessCS::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  updateStates<kMmRows>("ProcessCS", mm_state::kCode, mm_state::kMinimumLength, data, logCode);
}

}  // namespace corvane
