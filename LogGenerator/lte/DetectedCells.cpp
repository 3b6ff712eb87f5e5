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
  const auto accepted =
      acceptPacket("Detected Cells", data, logCode, lte::kConnectedIntraFrequencyCode, kMinimumLength);
  if (!accepted) return;
  const PacketView& packet = *accepted;
  const lte::SectionList list(*this);
  const BoundedList detected = cells(packet);
  if (detected.count() == 0) return;
  list.install(lte::rowsOfEntries(packet, detected, kCellSize, [&](std::size_t cell) {
    lte::RowWriter row = kCellRow.makeRow();
    row.set("Physical Cell ID", lte::decimalText(packet.le16(cell)));
    return row.value();
  }));
}

}  // namespace corvane
