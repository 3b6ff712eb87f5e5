#include "LogGenerator/gsm_umts/ProcessPS.h"

#include "LogGenerator/gsm_umts/MobilityRows.h"
#include "LogGenerator/gsm_umts/records/GmmStateRecord.h"
#include "platform/Log.h"

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
  log::write(log::kWarning, "ProcessPS");
  const PacketView packet(data);
  switch (logCode) {
    case gmm_state::kCode: writeRecordRows<kGmmRows>(*this, packet, gmm_state::kMinimumLength); return;
    case plmn_selection::kCode: writeServiceState(*this, packet); return;
    default: logUnknownCode(logCode); return;
  }
}

}  // namespace corvane
