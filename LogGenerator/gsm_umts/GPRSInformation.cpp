#include "LogGenerator/gsm_umts/GPRSInformation.h"

#include "LogGenerator/gsm_umts/RecordRows.h"
#include "LogGenerator/gsm_umts/records/GprsCellAccessRecord.h"
#include "LogGenerator/gsm_umts/records/GprsCellOptionsRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellMeasurementRecord.h"
#include "LogGenerator/gsm_umts/records/PacketSystemInfoRecord.h"
#include "LogGenerator/gsm_umts/records/PbcchRecord.h"
#include "LogGenerator/gsm_umts/records/RegistrationRecord.h"
#include "LogGenerator/gsm_umts/records/Si13PositionRecord.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using namespace gsm_umts;

// Each record's rows in the order they have always been written, which is
// not the order of their bytes.
constexpr RowField kAccessRows[] = {
    {"Network Control Order", gprs_access::kNetworkControlOrder},
    {"PFC Supported", gprs_access::kPfcSupported},
    {"Priority Access Threshold", gprs_access::kPriorityAccessThreshold},
};
constexpr RowField kRegistrationRows[] = {{"Network Operating Mode", registration::kNetworkOperatingMode}};
constexpr RowField kCellOptionRows[] = {
    {"T3192", gprs_cell_options::kT3192Code},
    {"Access Burst Type", gprs_cell_options::kAccessBurstType},
    {"DRX Timer Max", gprs_cell_options::kDrxTimerMax},
};
constexpr RowField kPbcchRows[] = {{"PBCCH Present", pbcch::kPresent}};
constexpr RowField kSystemInfoRows[] = {
    {"Ext Measurement Order", packet_system_info::kExtMeasurementOrder},
    {"Packet PSI Status", packet_system_info::kPsiStatus},
    {"Packet SI Status", packet_system_info::kSiStatus},
    {"Count LR", packet_system_info::kCountLowRate},
    {"Count HR", packet_system_info::kCountHighRate},
};
constexpr RowField kSi13Rows[] = {{"SI13 Position", si13_position::kPosition}};
constexpr RowField kMeasurementRows[] = {{"Cell Reselect Hysteresis", gsm_cell_measurement::kCellReselectHysteresis}};

}  // namespace

void GPRSInformation::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "GPRSInformation");
  const PacketView packet(data);
  switch (logCode) {
    case gprs_access::kCode: writeRecordRows<kAccessRows>(*this, packet, gprs_access::kMinimumLength); return;
    case registration::kCode:
      writeRecordRows<kRegistrationRows>(*this, packet, registration::kMinimumLength);
      return;
    case gprs_cell_options::kCode:
      writeRecordRows<kCellOptionRows>(*this, packet, gprs_cell_options::kMinimumLength);
      return;
    case pbcch::kCode: writeRecordRows<kPbcchRows>(*this, packet, pbcch::kMinimumLength); return;
    case packet_system_info::kCode:
      writeRecordRows<kSystemInfoRows>(*this, packet, packet_system_info::kMinimumLength);
      return;
    case si13_position::kCode: writeRecordRows<kSi13Rows>(*this, packet, si13_position::kMinimumLength); return;
    case gsm_cell_measurement::kCode:
      writeRecordRows<kMeasurementRows>(*this, packet, gsm_cell_measurement::kMinimumLength);
      return;
    default: logUnknownCode(logCode); return;
  }
}

}  // namespace corvane
