#include "LogGenerator/lte/NeighborCellsList.h"

#include <initializer_list>

#include "LogGenerator/lte/LteConversions.h"
#include "LogGenerator/lte/LteLists.h"
#include "platform/Log.h"

namespace corvane {

namespace {

constexpr std::size_t kMinimumLength = 21;

const lte::RowShape kCellRow = {
    "Physical Cell ID",   "Measured RSSI",      "Measured RSRP",      "Average RSRP",
    "Measured RSRQ",      "Average RSRQ",       "Srxlev",             "Frequency Offset",
    "Ant 0 Frame Offset", "Ant 0 Sample Offset", "Ant 1 Frame Offset", "Ant 1 Sample Offset",
};

// Every decibel value of a cell is traced under this one label.
void traceDecibels(double value) { log::printf(log::kWarning, "Measured RSSI: %lf\n", value); }

// Seven traces a cell are worth skipping whole when nobody records them; the
// logging layer would drop each of them anyway, one at a time.
void traceCell(std::uint32_t physicalCellId, std::initializer_list<double> decibels) {
  log::printf(log::kWarning, "Physical Cell ID: %d\n", static_cast<int>(physicalCellId));
  for (double value : decibels) traceDecibels(value);
}

}  // namespace

BoundedList NeighborCellsList::cells(const PacketView& packet) {
  return BoundedList(packet.bits16(19, 6, 10) + 1, kFirstCell, kCellSize);
}

void NeighborCellsList::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto accepted =
      acceptPacket("Neighbor Cells List", data, logCode, lte::kNeighborMeasurementCode, kMinimumLength);
  if (!accepted) return;
  const PacketView& packet = *accepted;
  const lte::SectionList list(*this);
  const BoundedList neighbors = cells(packet);
  log::printf(log::kWarning, "Number of neighboring cells being reported: %d\n", static_cast<int>(neighbors.count()));
  const bool traced = log::wants(log::kWarning);
  list.install(lte::rowsOfEntries(packet, neighbors, kCellSize, [&](std::size_t cell) {
    const std::uint32_t physicalCellId = packet.bits16(cell, 0, 8);
    const std::uint32_t measuredRssi = packet.bits32(cell, 9, 16);
    const std::uint32_t measuredRsrp = packet.bits32(cell, 17, 25);
    const std::uint32_t averageRsrp = packet.bits16(cell + 4, 0, 8);
    const std::uint32_t measuredRsrq = packet.bits16(cell + 4, 9, 15);
    const std::uint32_t averageRsrq = packet.bits8(cell + 6, 0, 6);
    const std::uint32_t srxlev = packet.bits32(cell + 4, 23, 29);
    // Both antennas' rows read antenna 0's bits; the display has always shown them so.
    const std::uint32_t frameOffset = packet.bits16(cell + 12, 0, 10);
    const std::uint32_t sampleOffset = packet.bits32(cell + 12, 11, 29);

    if (traced) {
      traceCell(physicalCellId, {lte::rssiDbm(measuredRssi), lte::neighborRsrpDbm(measuredRsrp),
                                 lte::neighborRsrpDbm(averageRsrp), lte::servingRsrqDb(measuredRsrq),
                                 lte::servingRsrqDb(averageRsrq), static_cast<double>(lte::offset30Dbm(srxlev))});
    }

    lte::RowWriter row = kCellRow.makeRow();
    row.set("Physical Cell ID", lte::decimalText(physicalCellId));
    row.set("Measured RSSI", lte::rssiText(measuredRssi));
    row.set("Measured RSRP", lte::neighborRsrpText(measuredRsrp));
    row.set("Average RSRP", lte::neighborRsrpText(averageRsrp));
    row.set("Measured RSRQ", lte::servingRsrqText(measuredRsrq));
    row.set("Average RSRQ", lte::servingRsrqText(averageRsrq));
    row.set("Srxlev", lte::offset30DbmText(srxlev));
    row.set("Frequency Offset", lte::decimalText(packet.le16(cell + 8)));
    row.set("Ant 0 Frame Offset", lte::decimalText(frameOffset));
    row.set("Ant 0 Sample Offset", lte::decimalText(sampleOffset));
    row.set("Ant 1 Frame Offset", lte::decimalText(frameOffset));
    row.set("Ant 1 Sample Offset", lte::decimalText(sampleOffset));
    return row.value();
  }));
}

}  // namespace corvane
