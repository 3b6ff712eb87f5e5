#include "LogGenerator/gsm_umts/CellSetLog.h"

#include "LogGenerator/gsm_umts/records/CellSetRecord.h"
#include "LogGenerator/logcode/Entries.h"
#include "LogGenerator/logcode/Rows.h"

namespace corvane {

using namespace gsm_umts::cell_set;

namespace {

// What these sections install after every walk; never written to.
const Array kNoRows;

}  // namespace

BoundedList CellSetLog::cells(const PacketView& packet) { return BoundedList(kCount.raw(packet), kCells); }

BoundedList CellSetLog::energyBlocks(const PacketView& packet) {
  const std::uint32_t count = kCount.raw(packet);
  return BoundedList(count, gsm_umts::cell_set::energyBlocks(count));
}

std::uint32_t CellSetLog::energy(const PacketView& packet, std::size_t block) {
  for (const records::Field& value : kEnergies) {
    if (const std::uint32_t raw = value.raw(packet, block); raw != 0) return raw;
  }
  return 0;
}

void UnlistedCellSet::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket(trace_, data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  const BoundedList cells = CellSetLog::cells(*packet);
  if (cells.count() == 0) return;
  // Each cell's set type is read; whatever it is, no row.
  forEachEntry(*packet, cells, kCells.entrySize, [&](std::size_t cell) { (void)kSetType.raw(*packet, cell); });
  list.install(kNoRows);
}

}  // namespace corvane
