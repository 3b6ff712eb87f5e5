#include "LogGenerator/lte/MeasuredNeighborCells.h"

#include "LogGenerator/lte/LteConversions.h"
#include "LogGenerator/lte/LteLists.h"
#include "platform/Log.h"

namespace corvane {

namespace {
constexpr std::size_t kMinimumLength = 29;
constexpr std::size_t kCountOffset = 27;
}  // namespace

BoundedList MeasuredNeighborCells::cells(const PacketView& packet) {
  return BoundedList(packet.u8(kCountOffset), kFirstCell, kCellSize);
}

void MeasuredNeighborCells::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "Measured Neighbor Cells");
  if (logCode != lte::kConnectedIntraFrequencyCode) {
    logUnknownCode(logCode);
    return;
  }
  const PacketView packet(data);
  if (packet.size() < kMinimumLength) return;
  const lte::SectionList list(*this);
  const BoundedList measured = cells(packet);
  if (measured.count() == 0) return;
  Array rows;
  for (std::uint8_t i = 0; i < measured.count(); ++i) {
    const std::size_t cell = measured.entryOffset(i);
    if (!lte::entryInside(packet, cell, kCellSize)) break;
    Dictionary row;
    row.reserve(3);
    row.set("Physical Cell ID", lte::decimalText(packet.le16(cell)));
    row.set("Filtered RSRP", lte::rsrpText(packet.le16(cell + 2)));
    row.set("Filtered RSRQ", lte::rsrqText(packet.le16(cell + 4)));
    rows.append(Value(std::move(row)));
  }
  list.install(rows);
}

}  // namespace corvane
