#include "LogGenerator/lte/LTEServingCellInfo.h"

#include <array>

#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/lte/records/ServingCellIdentityRecord.h"
#include "platform/CellMonitor.h"
#include "platform/Log.h"

namespace corvane {

namespace {

constexpr RowField kCarrierRowsBeforeUarfcn[] = {
    {"Physical Cell ID", lte::cell_identity::kPhysicalCellId},
    {"Download Frequency", lte::cell_identity::kDownlinkEarfcn},
    {"Upload Frequency", lte::cell_identity::kUplinkEarfcn},
};
constexpr RowField kCarrierRowsAfterUarfcn[] = {
    {"Download Bandwidth", lte::cell_identity::kDownlinkBandwidth},
    {"Upload Bandwidth", lte::cell_identity::kUplinkBandwidth},
    {"Cell Identity", lte::cell_identity::kCellIdentity},
    {"Tracking Area Code", lte::cell_identity::kTrackingAreaCode},
    {"Freq Band Indicator", lte::cell_identity::kBand},
};

struct CellListRow {
  std::string_view cellMonitorKey;
  std::string_view row;
  const char* failure;
};

// In the order the rows are read from the serving cell.
constexpr std::array<CellListRow, 5> kCellListRows = {{
    {CellMonitorTAC, "Tracking Area Code", "Serving Cell Info: Failed to retrieve TAC\n"},
    {CellMonitorCellId, "Cell Identity", "Serving Cell Info: Failed to retrieve Cell ID\n"},
    {CellMonitorPID, "Physical Cell ID", "Serving Cell Info: Failed to retrieve Physical Cell ID\n"},
    {CellMonitorBandInfo, "Freq Band Indicator", "Serving Cell Info: Failed to retrieve Freq Band Indicator\n"},
    {CellMonitorUARFCN, "UARFCN", "Serving Cell Info: Failed to retrieve UARFCN\n"},
}};

bool hasStringValue(const Dictionary& cell, std::string_view key, std::string_view expected) {
  const Value* v = cell.find(key);
  const std::string* text = v ? v->asString() : nullptr;
  return text && *text == expected;
}

// The first LTE cell of type serving; cells without a technology or a type do not count.
const Dictionary* findServingCell(const Array& cells) {
  for (const Value& element : cells.elements()) {
    const Dictionary* cell = element.asDictionary();
    if (!cell || !cell->contains(CellMonitorCellRadioAccessTechnology) || !cell->contains(CellMonitorCellType)) {
      continue;
    }
    if (hasStringValue(*cell, CellMonitorCellRadioAccessTechnology, CellMonitorRadioAccessTechnologyLTE) &&
        hasStringValue(*cell, CellMonitorCellType, CellMonitorCellTypeServing)) {
      return cell;
    }
  }
  return nullptr;
}

}  // namespace

void LTEServingCellInfo::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "LTE Serving Cell Info");
  const PacketView packet(data);
  switch (logCode) {
    case lte::antenna_info::kCode: updateFromAntennaInfo(packet); return;
    case lte::cell_identity::kCode: updateFromCellIdentity(packet); return;
    case kExtraCodeCellList: updateFromCellList(data); return;
    default: logUnknownCode(logCode); return;
  }
}

void LTEServingCellInfo::updateFromAntennaInfo(const PacketView& packet) const {
  if (packet.size() < lte::antenna_info::kMinimumLength) return;
  RowWriter(*this).set("Num Tx Antennas", fieldText(lte::antenna_info::kTxAntennas, packet));
  // The rest of this record is not decoded, and the trace has always said so.
  logUnknownCode(lte::antenna_info::kCode);
}

void LTEServingCellInfo::updateFromCellIdentity(const PacketView& packet) const {
  if (packet.size() < lte::cell_identity::kMinimumLength) return;
  RowWriter rows(*this);
  writeRows<kCarrierRowsBeforeUarfcn>(rows, packet);
  // A UARFCN comes only with the cell-monitor list; a fresh baseband record of
  // the carrier makes the last one stale.
  rows.remove("UARFCN");
  writeRows<kCarrierRowsAfterUarfcn>(rows, packet);
}

void LTEServingCellInfo::updateFromCellList(std::span<const std::uint8_t> data) const {
  const CellInfoArray cellList(data);
  const Array* cells = cellList.array();
  if (!cells) {
    log::write(log::kError, "Failed to get Cell Array\n");
    return;
  }
  const Dictionary* serving = findServingCell(*cells);
  if (!serving) return;
  RowWriter rows(*this);
  // One missing value never hides the others.
  for (const auto& row : kCellListRows) {
    if (const auto value = CellInfoArray::integerValue(*serving, row.cellMonitorKey)) {
      rows.set(row.row, decimalText(*value));
    } else {
      log::write(log::kError, row.failure);
    }
  }
}

}  // namespace corvane
