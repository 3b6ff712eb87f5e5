#include "LogGenerator/gsm_umts/GSMServingCell.h"

#include <array>

#include "LogGenerator/gsm_umts/CellListRows.h"
#include "LogGenerator/gsm_umts/RecordRows.h"
#include "LogGenerator/gsm_umts/records/DedicatedMobileAllocationRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellIdentityRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellMeasurementRecord.h"

namespace corvane {

namespace {

using namespace gsm_umts;

constexpr RowField kIdentityRows[] = {
    {"Cell ID", gsm_cell_identity::kCellId},
    {"ARFCN", gsm_cell_identity::kArfcn},
    {"BSIC", gsm_cell_identity::kBsic},
};
constexpr RowField kMeasurementRows[] = {
    {"RSSI", gsm_cell_measurement::kServingRssi},
    {"C1 Value", gsm_cell_measurement::kServingC1Shown},
    {"C2 Value", gsm_cell_measurement::kServingC2Shown},
};
constexpr RowField kDedicatedAllocationRows[] = {
    {"MA Dedicated ARFCN", dedicated_allocation::kArfcnShown},
};

constexpr std::array<cell_list::CellListRow, 2> kCellListRows = {{
    {CellMonitorCellId, "Cell ID", "GSMServingCell: Failed to retrieve Cell ID\n"},
    {CellMonitorARFCN, "ARFCN", "GSMServingCell: Failed to retrieve ARFCN\n"},
}};

}  // namespace

void GSMServingCell::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "GSMServingCell");
  const PacketView packet(data);
  switch (logCode) {
    case gsm_cell_identity::kCode:
      writeRecordRows<kIdentityRows>(*this, packet, gsm_cell_identity::kMinimumLength);
      return;
    case gsm_cell_measurement::kCode:
      writeRecordRows<kMeasurementRows>(*this, packet, gsm_cell_measurement::kMinimumLength);
      return;
    case dedicated_allocation::kCode:
      writeRecordRows<kDedicatedAllocationRows>(*this, packet, dedicated_allocation::kMinimumLength);
      return;
    case kExtraCodeCellList:
      // A UMTS serving cell is not a GSM serving cell.
      cell_list::writeServingCellRows(*this, data, {CellMonitorRadioAccessTechnologyGSM}, kCellListRows);
      return;
    default: logUnknownCode(logCode); return;
  }
}

}  // namespace corvane
