#include "LogGenerator/utran/UTRANNeighbhorMeasurements.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/utran/UtranPackets.h"
#include "LogGenerator/utran/records/NeighborMeasurementRecord.h"

namespace corvane {

namespace {

using namespace utran::neighbor_measurement;

constexpr RowField kCellRows[] = {
    {"UARFCN", kUarfcn}, {"Cell ID", kCellId}, {"Filter RSCP", kFilteredRscp}, {"Status", kSet}, {"inJDCS", kInJdcs},
};
const RowShape kCellRow(kCellRows);

}  // namespace

BoundedList UTRANNeighbhorMeasurements::cells(const PacketView& packet) { return BoundedList(kCount.raw(packet), kCells); }

void UTRANNeighbhorMeasurements::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = utran::acceptPacket(log::kWarning, "NeighbhorMeasurements List", data, logCode, kCode,
                                          kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  list.install(rowsOfEntries(*packet, cells(*packet), kCellReadWidth, [&](std::size_t cell) {
    RowWriter row = kCellRow.makeRow();
    writeRows<kCellRows>(row, *packet, cell);
    // A cell in none of the sets has no status at all.
    if (kSet.raw(*packet, cell) == kNoSet) row.remove("Status");
    return row.value();
  }));
}

}  // namespace corvane
