#include "LogGenerator/lte/ConnectedModeMeasurementMisc.h"

#include "LogGenerator/lte/LteConversions.h"
#include "platform/Log.h"

namespace corvane {

namespace {
constexpr std::size_t kMinimumLength = 29;
}  // namespace

void ConnectedModeMeasurementMisc::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto accepted =
      acceptPacket("Connected mode LTE Intra-frequency Measurement", data, logCode,
                   lte::kConnectedIntraFrequencyCode, kMinimumLength);
  if (!accepted) return;
  const PacketView& packet = *accepted;
  lte::RowWriter rows(*this);
  rows.set("E-ARFCN", lte::decimalText(packet.le16(17)));
  rows.set("Serving Physical Cell ID", lte::decimalText(packet.le16(19)));
  rows.set("Subframe Number", lte::decimalText(packet.le16(21)));
  rows.set("Serving Filtered RSRP", lte::rsrpText(packet.le16(23)));
  rows.set("Serving Filtered RSRQ", lte::rsrqText(packet.le16(25)));
}

}  // namespace corvane
