#include "LogGenerator/gsm_umts/ProcessCO.h"

#include "LogGenerator/gsm_umts/MobilityRows.h"
#include "LogGenerator/gsm_umts/records/MmStateRecord.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using namespace gsm_umts;

constexpr RowField kMmRows[] = {{"MM State", mm_state::kState}};

}  // namespace

void ProcessCO::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  // The common part has always traced itself as the circuit-switched one.
  log::write(log::kWarning, "ProcessCS");
  const PacketView packet(data);
  switch (logCode) {
    case mm_state::kCode: writeRecordRows<kMmRows>(*this, packet, mm_state::kMinimumLength); return;
    case plmn_selection::kCode: writeServiceState(*this, packet); return;
    default: logUnknownCode(logCode); return;
  }
}

}  // namespace corvane
