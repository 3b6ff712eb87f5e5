#include "LogGenerator/lte/MeasuredNeighborCells.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/lte/records/IntraFrequencyMeasurementRecord.h"

namespace corvane {

namespace {

using namespace lte::intra_frequency;

constexpr RowField kCellRows[] = {
    {"Physical Cell ID", kNeighborPhysicalCellId},
    {"Filtered RSRP", kNeighborFilteredRsrp},
    {"Filtered RSRQ", kNeighborFilteredRsrq},
};
const RowShape kCellRow(kCellRows);

}  // namespace

BoundedList MeasuredNeighborCells::cells(const PacketView& packet) {
  return BoundedList(kMeasuredCount.raw(packet), kMeasuredCells);
}

void MeasuredNeighborCells::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("Measured Neighbor Cells", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  const BoundedList measured = cells(*packet);
  if (measured.count() == 0) return;
  list.install(rowsOfEntries(*packet, measured, kMeasuredCells.entrySize, [&](std::size_t cell) {
    RowWriter row = kCellRow.makeRow();
    writeRows<kCellRows>(row, *packet, cell);
    return row.value();
  }));
}

}  // namespace corvane
