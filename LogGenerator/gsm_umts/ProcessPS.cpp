#include "LogGenerator/gsm_umts/ProcessPS.h"

#include "LogGenerator/gsm_umts/records/GmmStateRecord.h"

namespace corvane {

namespace {

using namespace gsm_umts;

// The GMM rows have always borne the circuit-switched keys, and the update
// status "Attach Reject Cause".
constexpr RowField kGmmRows[] = {
    {"MM State", gmm_state::kState},
    {"MM Sub State", gmm_state::kSubstate},
    {"Attach Reject Cause", gmm_state::kUpdateStatus},
};

}  // namespace

void ProcessPS::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  updateStates<kGmmRows>("ProcessPS", gmm_state::kCode, gmm_state::kMinimumLength, data, logCode);
}

}  // namespace corvane
