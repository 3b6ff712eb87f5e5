#include "LogGenerator/gsm_umts/NeighboringCells.h"

#include <algorithm>
#include <array>

#include "LogGenerator/gsm_umts/CellListRows.h"
#include "LogGenerator/gsm_umts/records/ArfcnBsicRecord.h"
#include "LogGenerator/gsm_umts/records/GsmCellMeasurementRecord.h"
#include "LogGenerator/logcode/Entries.h"
#include "LogGenerator/logcode/SignedRows.h"

namespace corvane {

namespace {

using namespace gsm_umts;
using gsm_cell_measurement::kNeighbors;

constexpr RowField kNeighborRows[] = {
    {"ARFCN", gsm_cell_measurement::kNeighborArfcn},
    // No unit, unlike the serving cell's level.
    {"RSSI", gsm_cell_measurement::kNeighborRssi},
};
constexpr SignedRowField kNeighborSignedRows[] = {
    {"C1 Value", gsm_cell_measurement::kNeighborC1},
};
// A neighbour whose frequency has a BSIC shows it; the others have no such row.
const RowShape kNeighborRow = {"ARFCN", "RSSI", "C1 Value"};
const RowShape kNeighborRowWithBsic = {"ARFCN", "RSSI", "C1 Value", "BSIC"};

// The service reports a GSM neighbour's level in units of 2 dBm.
constexpr std::array<cell_list::CellListRow, 2> kCellListRows = {{
    {CellMonitorARFCN, "ARFCN", "NeighboringCells: Failed to retrieve ARFCN\n"},
    {CellMonitorRSSI, "RSSI", "NeighboringCells: Failed to retrieve RSSI\n", true, 2, " dBm"},
}};

}  // namespace

BoundedList NeighboringCells::neighbors(const PacketView& packet) {
  return BoundedList(gsm_cell_measurement::kNeighborCount.raw(packet), kNeighbors);
}

BoundedList NeighboringCells::pairs(const PacketView& packet) {
  return BoundedList(arfcn_bsic::kCount.raw(packet), arfcn_bsic::kPairs);
}

void NeighboringCells::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "NeighboringCells");
  const PacketView packet(data);
  switch (logCode) {
    case gsm_cell_measurement::kCode: updateFromMeasurement(packet); return;
    case arfcn_bsic::kCode: updateFromArfcnBsic(packet); return;
    case kExtraCodeCellList:
      cell_list::installNeighborRows(*this, data, CellMonitorRadioAccessTechnologyGSM, kCellListRows);
      return;
    default: logUnknownCode(logCode); return;
  }
}

void NeighboringCells::updateFromArfcnBsic(const PacketView& packet) {
  if (packet.size() < arfcn_bsic::kMinimumLength) return;
  arfcnToBsic.clear();
  forEachEntry(packet, pairs(packet), arfcn_bsic::kPairs.entrySize, [&](std::size_t pair) {
    const auto arfcn = static_cast<std::uint16_t>(arfcn_bsic::kArfcn.raw(packet, pair));
    const auto bsic = static_cast<std::uint8_t>(arfcn_bsic::kBsic.raw(packet, pair));
    auto known = std::find_if(arfcnToBsic.begin(), arfcnToBsic.end(),
                              [&](const ArfcnBsic& entry) { return entry.arfcn == arfcn; });
    if (known != arfcnToBsic.end()) {
      known->bsic = bsic;
    } else {
      arfcnToBsic.push_back({arfcn, bsic});
    }
  });
}

int NeighboringCells::bsicOf(std::uint32_t arfcn) const {
  for (const ArfcnBsic& entry : arfcnToBsic) {
    if (entry.arfcn == arfcn) return entry.bsic;
  }
  return -1;
}

void NeighboringCells::updateFromMeasurement(const PacketView& packet) const {
  if (packet.size() < gsm_cell_measurement::kMinimumLength) return;
  const SectionList list(*this);
  const BoundedList cells = neighbors(packet);
  if (cells.count() == 0) return;
  list.install(rowsOfEntries(packet, cells, kNeighbors.entrySize, [&](std::size_t cell) {
    const std::uint32_t arfcn = gsm_cell_measurement::kNeighborArfcn.raw(packet, cell);
    const int bsic = bsicOf(arfcn);
    RowWriter row = (bsic < 0 ? kNeighborRow : kNeighborRowWithBsic).makeRow();
    writeRows<kNeighborRows>(row, packet, cell);
    writeSignedRows<kNeighborSignedRows>(row, packet, cell);
    if (bsic >= 0) row.set("BSIC", decimalText(bsic));
    return row.value();
  }));
}

}  // namespace corvane
