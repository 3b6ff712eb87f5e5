#include "LogGenerator/lte/LTEServingCellInfo.h"

#include <array>

#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "LogGenerator/lte/LteConversions.h"
#include "platform/CellMonitor.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using lte::RowWriter;

constexpr std::size_t kAntennaInfoMinimumLength = 22;
constexpr std::size_t kCellIdentityMinimumLength = 38;

// Resource blocks of a carrier → its bandwidth.
constexpr std::array<lte::ValueText, 6> kBandwidths = {{
    {6, "1.4 MHz"},
    {15, "3 MHz"},
    {25, "5 MHz"},
    {50, "10 MHz"},
    {75, "15 MHz"},
    {100, "20 MHz"},
}};

std::string_view bandwidthText(std::uint32_t resourceBlocks) {
  return lte::textFor(kBandwidths, resourceBlocks, "Unknown");
}

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
    case lte::kAntennaInfoCode: updateFromAntennaInfo(packet); return;
    case lte::kServingCellIdentityCode: updateFromCellIdentity(packet); return;
    case kExtraCodeCellList: updateFromCellList(data); return;
    default: logUnknownCode(logCode); return;
  }
}

void LTEServingCellInfo::updateFromAntennaInfo(const PacketView& packet) const {
  if (packet.size() < kAntennaInfoMinimumLength) return;
  RowWriter(*this).set("Num Tx Antennas", lte::decimalText(packet.u8(20)));
  // The rest of this record is not decoded, and the trace has always said so.
  logUnknownCode(lte::kAntennaInfoCode);
}

void LTEServingCellInfo::updateFromCellIdentity(const PacketView& packet) const {
  if (packet.size() < kCellIdentityMinimumLength) return;
  RowWriter rows(*this);
  rows.set("Physical Cell ID", lte::decimalText(packet.le16(14)));
  rows.set("Download Frequency", lte::decimalText(packet.le16(16)));
  rows.set("Upload Frequency", lte::decimalText(packet.le16(18)));
  // A UARFCN comes only with the cell-monitor list; a fresh baseband record of
  // the carrier makes the last one stale.
  rows.remove("UARFCN");
  rows.set("Download Bandwidth", bandwidthText(packet.u8(20)));
  rows.set("Upload Bandwidth", bandwidthText(packet.u8(21)));
  rows.set("Cell Identity", lte::decimalText(packet.le32(22)));
  rows.set("Tracking Area Code", lte::decimalText(packet.le16(26)));
  rows.set("Freq Band Indicator", lte::decimalText(packet.le32(28)));
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
      rows.set(row.row, lte::decimalText(*value));
    } else {
      log::write(log::kError, row.failure);
    }
  }
}

}  // namespace corvane
