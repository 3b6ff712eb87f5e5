#include "LogGenerator/lte/MeasuredNeighborCells.h"

#include "LogGenerator/lte/LteConversions.h"
#include "LogGenerator/lte/LteLists.h"
#include "platform/Log.h"

namespace corvane {

namespace {
constexpr std::size_t kMinimumLength = 29;
constexpr std::size_t kCountOffset = 27;
const lte::RowShape kCellRow = {"Physical Cell ID", "Filtered RSRP", "Filtered RSRQ"};
}  // namespace

BoundedList MeasuredNeighborCells::cells(const PacketView& packet) {
  return BoundedList(packet.u8(kCountOffset), kFirstCell, kCellSize);
}

void MeasuredNeighborCells::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto accepted =
      acceptPacket("Measured Neighbor Cells", data, logCode, lte::kConnectedIntraFrequencyCode, kMinimumLength);
  if (!accepted) return;
  const PacketView& packet = *accepted;
  const lte::SectionList list(*this);
  const BoundedList measured = cells(packet);
  if (measured.count() == 0) return;
  list.install(lte::rowsOfEntries(packet, measured, kCellSize, [&](std::size_t cell) {
    lte::RowWriter row = kCellRow.makeRow();
    row.set("Physical Cell ID", lte::decimalText(packet.le16(cell)));
    row.set("Filtered RSRP", lte::rsrpText(packet.le16(cell + 2)));
    row.set("Filtered RSRQ", lte::rsrqText(packet.le16(cell + 4)));
    return row.value();
  }));
}

}  // namespace corvane
