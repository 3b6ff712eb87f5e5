#include "LogGenerator/gsm_umts/ProcessCS.h"

#include "LogGenerator/gsm_umts/MobilityRows.h"
#include "LogGenerator/gsm_umts/records/MmStateRecord.h"
#include "platform/Log.h"

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
  log::write(log::kWarning, "ProcessCS");
  const PacketView packet(data);
  switch (logCode) {
    case mm_state::kCode: writeRecordRows<kMmRows>(*this, packet, mm_state::kMinimumLength); return;
    case plmn_selection::kCode: writeServiceState(*this, packet); return;
    default: logUnknownCode(logCode); return;
  }
}

}  // namespace corvane
