#include "LogGenerator/gsm_umts/GSMRRInfo.h"

#include "LogGenerator/gsm_umts/RecordRows.h"
#include "LogGenerator/gsm_umts/records/DtxRecord.h"
#include "LogGenerator/gsm_umts/records/GprsCellOptionsRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellMeasurementRecord.h"
#include "LogGenerator/gsm_umts/records/RrStateRecord.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using namespace gsm_umts;

constexpr RowField kStateRows[] = {
    {"RR State", rr_state::kState},
    {"RR Sub State", rr_state::kSubstate},
    {"RR Status", rr_state::kStatus},
    {"RR Mode", rr_state::kMode},
};
// The bytes "GSM Serving Cell" shows as RSSI, C1 and C2.
constexpr RowField kMeasurementRows[] = {
    {"Serving Rx Level", gsm_cell_measurement::kServingRxLevel},
    {"Rx Quality Full", gsm_cell_measurement::kRxQualityFull},
    {"Rx Quality Sub", gsm_cell_measurement::kRxQualitySub},
};
constexpr RowField kDtxRows[] = {{"DTX Used", dtx::kDtxUsed}};
constexpr RowField kDrxRows[] = {{"DRX Used", gprs_cell_options::kDrxUsed}};

}  // namespace

void GSMRRInfo::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "GSMRRInfo");
  const PacketView packet(data);
  switch (logCode) {
    case rr_state::kCode: writeRecordRows<kStateRows>(*this, packet, rr_state::kMinimumLength); return;
    case gsm_cell_measurement::kCode:
      writeRecordRows<kMeasurementRows>(*this, packet, gsm_cell_measurement::kMinimumLength);
      return;
    case dtx::kCode: writeRecordRows<kDtxRows>(*this, packet, dtx::kMinimumLength); return;
    case gprs_cell_options::kCode:
      writeRecordRows<kDrxRows>(*this, packet, gprs_cell_options::kMinimumLength);
      return;
    default: logUnknownCode(logCode); return;
  }
}

}  // namespace corvane
