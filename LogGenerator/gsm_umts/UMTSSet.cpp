#include "LogGenerator/gsm_umts/UMTSSet.h"

#include <array>
#include <cstdio>

#include "LogGenerator/gsm_umts/CellListRows.h"
#include "LogGenerator/gsm_umts/records/RankedCellsRecord.h"
#include "LogGenerator/logcode/SignedRows.h"

namespace corvane {

namespace {

using namespace gsm_umts::ranked_cells;

constexpr RowField kCellRows[] = {{"Scrambling Code", kScramblingCode}};
constexpr SignedRowField kCellSignedRows[] = {
    {"RSCP", kRscp},
    {"Downlink Frequency", kDownlinkUarfcn},
    {"Ranking Value", kUmtsRankingValue},
    {"Rank Cell RSCP", kRankRscp},
};
const RowShape kCellRow = {"Scrambling Code",    "RSCP",          "Energy Per Chip",
                           "Downlink Frequency", "Ranking Value", "Rank Cell RSCP"};

// The Ec/No has always been shown with printf's "%f": six decimals.
Text sixDecimalsText(double value, std::string_view unit) {
  Text text;
  const int n = std::snprintf(text.begin(), Text::kCapacity, "%f", value);
  const auto written = std::min<std::size_t>(n < 0 ? 0 : static_cast<std::size_t>(n), Text::kCapacity - 1);
  text.setEnd(text.begin() + written + unit.copy(text.begin() + written, Text::kCapacity - written));
  return text;
}

// The service's neighbours: RSCP in dBm, Ec/No in dB.
constexpr std::array<cell_list::CellListRow, 4> kCellListRows = {{
    {CellMonitorUARFCN, "UARFCN", "UMTSSet: Failed to retrieve UARFCN\n"},
    {CellMonitorSCN, "Scrambling Code", "UMTSSet: Failed to retrieve Scrambling Code\n"},
    {CellMonitorRSCP, "RSCP", "UMTSSet: Failed to retrieve RSCP\n", true, 1, " dBm"},
    {CellMonitorECN0, "Energy Per Chip", "UMTSSet: Failed to retrieve Energy Per Chip\n", true, 1, " dB"},
}};

}  // namespace

BoundedList UMTSSet::cells(const PacketView& packet) { return BoundedList(kUmtsCount.raw(packet), kUmtsCells); }

void UMTSSet::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "UMTSSet");
  switch (logCode) {
    case kCode: updateFromRankedCells(PacketView(data)); return;
    case kExtraCodeCellList:
      cell_list::installNeighborRows(*this, data, CellMonitorRadioAccessTechnologyUMTS, kCellListRows);
      return;
    default: logUnknownCode(logCode); return;
  }
}

void UMTSSet::updateFromRankedCells(const PacketView& packet) const {
  if (packet.size() < kMinimumLength) return;
  const SectionList list(*this);
  const BoundedList umtsCells = cells(packet);
  if (umtsCells.count() == 0) return;
  list.install(rowsOfEntries(packet, umtsCells, kUmtsCells.entrySize, [&](std::size_t cell) {
    RowWriter row = kCellRow.makeRow();
    writeRows<kCellRows>(row, packet, cell);
    writeSignedRows<kCellSignedRows>(row, packet, cell);
    row.set("Energy Per Chip", sixDecimalsText(kEcNo.value(packet, cell), kEcNo.field.conversion.unit));
    return row.value();
  }));
}

}  // namespace corvane
