#include "LogGenerator/gsm_umts/ActiveSet.h"

#include <vector>

#include "LogGenerator/gsm_umts/CellSetLog.h"
#include "LogGenerator/gsm_umts/records/CellSetRecord.h"
#include "LogGenerator/logcode/Rows.h"

namespace corvane {

namespace {

using namespace gsm_umts::cell_set;

const RowShape kCellRow = {"Scrambling Code", "RSCP", "Energy Per Chip"};
constexpr std::string_view kDb = " dB";

}  // namespace

void ActiveSet::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("ActiveSet", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  const BoundedList cells = CellSetLog::cells(*packet);
  if (cells.count() == 0) return;
  const BoundedList blocks = CellSetLog::energyBlocks(*packet);
  // One wideband power for every cell of the record.
  const std::int32_t widebandPower = kWidebandPower.number(*packet);
  std::vector<Value> rows;
  rows.reserve(cells.count());
  for (std::uint8_t i = 0; i < cells.count(); ++i) {
    const std::size_t cell = cells.entryOffset(i);
    const std::size_t block = blocks.entryOffset(i);
    // A cell is its entry and its energy block; the list stops at the first
    // cell the packet does not hold whole.
    if (!entryInside(*packet, cell, kCells.entrySize) || !entryInside(*packet, block, kEnergyBlockSize)) break;
    if (kSetType.raw(*packet, cell) != kActiveSet) continue;
    const int ecIo = lookUpECNO(CellSetLog::energy(*packet, block));
    RowWriter row = kCellRow.makeRow();
    row.set("Scrambling Code", fieldText(kScramblingCode, *packet, cell));
    // Shown in "dB", as it always has been, although it is a power.
    row.set("RSCP", wholeText(receivedCodePower(widebandPower, ecIo), kDb));
    row.set("Energy Per Chip", wholeText(ecIo, kDb));
    rows.push_back(row.value());
  }
  list.install(Array(std::move(rows)));
}

}  // namespace corvane
