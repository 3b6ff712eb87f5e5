#include "LogGenerator/utran/CCTRCHSIRMeasurement.h"

#include <vector>

#include "LogGenerator/logcode/Rows.h"
#include "LogGenerator/utran/UtranPackets.h"
#include "LogGenerator/utran/records/ChannelMeasurementRecord.h"

namespace corvane {

namespace {

using namespace utran::channel_measurement;

constexpr RowField kChannelRows[] = {{"CCTRCH ID", kCctrchId}, {"TSNUM", kTimeslot}};
const RowShape kChannelRow{"CCTRCH ID", "TSNUM", "SIR"};

}  // namespace

BoundedList CCTRCHSIRMeasurement::cctrchs(const PacketView& packet) {
  return BoundedList(kCctrchCount.raw(packet), utran::channel_measurement::cctrchs(kTransportChannelCount.raw(packet)));
}

BoundedList CCTRCHSIRMeasurement::sirValues(std::size_t channel) {
  return BoundedList(kSirCount, channel + kSirValues.first, kSirValues.entrySize);
}

void CCTRCHSIRMeasurement::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = utran::acceptPacket(log::kWarning, "CCTRCH SIR Measurement", data, logCode, kCode,
                                          kMinimumLength);
  if (!packet) return;
  const SectionList list(*this);
  list.install(rowsOfEntries(*packet, cctrchs(*packet), kCctrchSize, [&](std::size_t channel) {
    RowWriter row = kChannelRow.makeRow();
    writeRows<kChannelRows>(row, *packet, channel);
    const BoundedList values = sirValues(channel);
    std::vector<Value> sir;
    sir.reserve(values.count());
    for (std::size_t i = 0; i < values.count(); ++i) sir.emplace_back(fieldText(kSir, *packet, values.entryOffset(i)).view());
    const Value made = row.value();
    made.asDictionary()->set("SIR", Value(Array(std::move(sir))));
    return made;
  }));
}

}  // namespace corvane
