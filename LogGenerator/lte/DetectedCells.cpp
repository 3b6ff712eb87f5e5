#include "LogGenerator/lte/DetectedCells.h"

#include "LogGenerator/lte/LteConversions.h"
#include "LogGenerator/lte/LteLists.h"
#include "LogGenerator/lte/MeasuredNeighborCells.h"
#include "platform/Log.h"

namespace corvane {

namespace {
constexpr std::size_t kMinimumLength = 29;
constexpr std::size_t kCountOffset = 28;
constexpr std::size_t kCellSize = 2;
const lte::RowShape kCellRow = {"Physical Cell ID"};
}  // namespace

BoundedList DetectedCells::cells(const PacketView& packet) {
  const BoundedList measured = MeasuredNeighborCells::cells(packet);
  const std::size_t behindMeasured =
      MeasuredNeighborCells::kFirstCell + MeasuredNeighborCells::kCellSize * measured.count();
  return BoundedList(packet.u8(kCountOffset), behindMeasured, kCellSize);
}

void DetectedCells::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "Detected Cells");
  if (logCode != lte::kConnectedIntraFrequencyCode) {
    logUnknownCode(logCode);
    return;
  }
  const PacketView packet(data);
  if (packet.size() < kMinimumLength) return;
  const lte::SectionList list(*this);
  const BoundedList detected = cells(packet);
  if (detected.count() == 0) return;
  std::vector<Value> rows;
  rows.reserve(detected.count());
  for (std::uint8_t i = 0; i < detected.count(); ++i) {
    const std::size_t cell = detected.entryOffset(i);
    if (!lte::entryInside(packet, cell, kCellSize)) break;
    lte::RowWriter row = kCellRow.makeRow();
    row.set("Physical Cell ID", lte::decimalText(packet.le16(cell)));
    rows.push_back(row.value());
  }
  list.install(Array(std::move(rows)));
}

}  // namespace corvane
