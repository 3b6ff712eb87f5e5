#include "LogGenerator/gsm_umts/BLER.h"

#include "LogGenerator/gsm_umts/records/BlerRecord.h"
#include "LogGenerator/logcode/Rows.h"

namespace corvane {

namespace {

using namespace gsm_umts::bler;

constexpr RowField kRows[] = {{"Window Size", kWindowSize}};
constexpr RowField kChannelRows[] = {
    {"Transport Channel ID", kChannelId},
    {"CRC Received", kCrcReceived},
    {"CRC Received in Error", kCrcErrors},
};
const RowShape kChannelRow(kChannelRows);

}  // namespace

BoundedList BLER::channels(const PacketView& packet) { return BoundedList(kCount.raw(packet), kChannels); }

void BLER::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto packet = acceptPacket("BLER", data, logCode, kCode, kMinimumLength);
  if (!packet) return;
  RowWriter rows(*this);
  writeRows<kRows>(rows, *packet);
  // The channels are the value of one row, replaced whole (not a section list).
  setRow("Transport Channels", Value(rowsOfEntries(*packet, channels(*packet), kChannels.entrySize, [&](std::size_t channel) {
           RowWriter row = kChannelRow.makeRow();
           writeRows<kChannelRows>(row, *packet, channel);
           return row.value();
         })));
}

}  // namespace corvane
