#include "LogGenerator/utran/TRCHBLERMeasurement.h"

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/utran/UtranPackets.h"
#include "LogGenerator/utran/records/ChannelMeasurementRecord.h"

namespace corvane {

namespace {

using namespace utran::channel_measurement;

constexpr RowField kChannelRows[] = {{"TRCH ID", kTrchId}, {"TRCH BLER Measurement", kTrchBler}};
const RowShape kChannelRow(kChannelRows);

}  // namespace

BoundedList TRCHBLERMeasurement::transportChannels(const PacketView& packet) {
  return BoundedList(kTransportChannelCount.raw(packet), kTransportChannels);
}

void TRCHBLERMeasurement::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = utran::acceptPacket(log::kNotice, "TRCH BLER Measurement", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  list.install(rowsOfEntries(*packet, transportChannels(*packet), kTransportChannels.entrySize, [&](std::size_t channel) {
    RowWriter row = kChannelRow.makeRow();
    writeRows<kChannelRows>(row, *packet, channel);
    return row.value();
  }));
}

}  // namespace corvane
