#include "LogGenerator/gsm_umts/GSMSet.h"

#include "LogGenerator/gsm_umts/records/RankedCellsRecord.h"
#include "LogGenerator/logcode/SignedRows.h"

namespace corvane {

namespace {

using namespace gsm_umts::ranked_cells;

constexpr RowField kCellRows[] = {{"ARFCN", kArfcn}, {"BSIC", kBsic}};
constexpr SignedRowField kCellSignedRows[] = {{"RSSI", kRssi}, {"Ranking Value", kGsmRankingValue}};
const RowShape kCellRow = {"ARFCN", "BSIC", "RSSI", "Ranking Value"};

}  // namespace

BoundedList GSMSet::cells(const PacketView& packet) { return BoundedList(kGsmCount.raw(packet), kGsmCells); }

void GSMSet::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("GSMSet", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  const BoundedList gsmCells = cells(*packet);
  if (gsmCells.count() == 0) return;
  list.install(rowsOfEntries(*packet, gsmCells, kGsmCells.entrySize, [&](std::size_t cell) {
    RowWriter row = kCellRow.makeRow();
    writeRows<kCellRows>(row, *packet, cell);
    writeSignedRows<kCellSignedRows>(row, *packet, cell);
    return row.value();
  }));
}

}  // namespace corvane
