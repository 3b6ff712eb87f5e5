#include "LogGenerator/utran/GSMNeighbhorMeasurements.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/logcode/SignedRows.h"
#include "LogGenerator/utran/UtranPackets.h"
#include "LogGenerator/utran/records/GsmNeighborRecord.h"

namespace corvane {

namespace {

using namespace utran::gsm_neighbor;

constexpr RowField kCellRows[] = {
    {"Cell ID", kCellId}, {"Band Indicator", kBandIndicator}, {"BSIC Valid", kBsicValid},
    {"NCC", kNcc},        {"BCC", kBcc},                      {"ARFCN", kArfcn},
};
constexpr SignedRowField kSignedCellRows[] = {{"RSSI", kRssi}};
const RowShape kCellRow{"Cell ID", "Band Indicator", "BSIC Valid", "NCC", "BCC", "ARFCN", "RSSI"};

}  // namespace

BoundedList GSMNeighbhorMeasurements::cells(const PacketView& packet) {
  return BoundedList(kCount.raw(packet), kCells);
}

Array GSMNeighbhorMeasurements::cellRows(const PacketView& packet) {
  return rowsOfEntries(packet, cells(packet), kCells.entrySize, [&](std::size_t cell) {
    RowWriter row = kCellRow.makeRow();
    writeRows<kCellRows>(row, packet, cell);
    writeSignedRows<kSignedCellRows>(row, packet, cell);
    return row.value();
  });
}

void GSMNeighbhorMeasurements::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = utran::acceptPacket(log::kWarning, "GSM Neighbor Cell List", data, logCode, kCode,
                                          kMinimumLength);
  if (!packet) return;
  // Emptied, and never filled: the list has always stayed empty here, so the
  // cells' rows are not even made.
  const SectionList list(*this);
}

}  // namespace corvane
