#include "LogGenerator/lte/NeighborCellsList.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/lte/records/NeighborMeasurementRecord.h"
#include "platform/Log.h"

namespace corvane {

namespace {

using namespace lte::neighbor_measurement;

constexpr RowField kCellRows[] = {
    {"Physical Cell ID", kPhysicalCellId},
    {"Measured RSSI", kRssi},
    {"Measured RSRP", kMeasuredRsrp},
    {"Average RSRP", kAverageRsrp},
    {"Measured RSRQ", kMeasuredRsrq},
    {"Average RSRQ", kAverageRsrq},
    {"Srxlev", kSrxlev},
    {"Frequency Offset", kFrequencyOffset},
    {"Ant 0 Frame Offset", kFrameOffset},
    {"Ant 0 Sample Offset", kSampleOffset},
    // Both antennas' rows read antenna 0's bits; the display has always shown them so.
    {"Ant 1 Frame Offset", kFrameOffset},
    {"Ant 1 Sample Offset", kSampleOffset},
};
const RowShape kCellRow(kCellRows);

// The decibel values of a cell, each traced under one label.
constexpr records::Field kTracedDecibels[] = {kRssi, kMeasuredRsrp, kAverageRsrp, kMeasuredRsrq, kAverageRsrq,
                                              kSrxlev};

// Seven traces a cell are worth skipping whole when nobody records them; the
// logging layer would drop each of them anyway, one at a time.
void traceCell(const PacketView& packet, std::size_t cell) {
  log::printf(log::kWarning, "Physical Cell ID: %d\n", static_cast<int>(kPhysicalCellId.raw(packet, cell)));
  for (const records::Field& field : kTracedDecibels) {
    log::printf(log::kWarning, "Measured RSSI: %lf\n", field.value(packet, cell));
  }
}

}  // namespace

BoundedList NeighborCellsList::cells(const PacketView& packet) {
  return BoundedList(kCellsLessOne.raw(packet) + 1, kCells);
}

void NeighborCellsList::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("Neighbor Cells List", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  const BoundedList neighbors = cells(*packet);
  log::printf(log::kWarning, "Number of neighboring cells being reported: %d\n", static_cast<int>(neighbors.count()));
  const bool traced = log::wants(log::kWarning);
  list.install(rowsOfEntries(*packet, neighbors, kCells.entrySize, [&](std::size_t cell) {
    if (traced) traceCell(*packet, cell);
    RowWriter row = kCellRow.makeRow();
    writeRows<kCellRows>(row, *packet, cell);
    return row.value();
  }));
}

}  // namespace corvane
