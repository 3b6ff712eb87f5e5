#include "LogGenerator/lte/DetectedCells.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/lte/records/IntraFrequencyMeasurementRecord.h"

namespace corvane {

namespace {

using namespace lte::intra_frequency;

constexpr RowField kCellRows[] = {
    {"Physical Cell ID", kDetectedPhysicalCellId},
};
const RowShape kCellRow(kCellRows);

}  // namespace

BoundedList DetectedCells::cells(const PacketView& packet) {
  return BoundedList(kDetectedCount.raw(packet), detectedCells(kMeasuredCount.raw(packet)));
}

void DetectedCells::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("Detected Cells", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  const BoundedList detected = cells(*packet);
  if (detected.count() == 0) return;
  list.install(rowsOfEntries(*packet, detected, kDetectedCellSize, [&](std::size_t cell) {
    RowWriter row = kCellRow.makeRow();
    writeRows<kCellRows>(row, *packet, cell);
    return row.value();
  }));
}

}  // namespace corvane
