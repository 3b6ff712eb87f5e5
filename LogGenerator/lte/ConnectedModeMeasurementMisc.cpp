#include "LogGenerator/lte/ConnectedModeMeasurementMisc.h"

#include "LogGenerator/lte/LteConversions.h"
#include "platform/Log.h"

namespace corvane {

namespace {
constexpr std::size_t kMinimumLength = 29;
}  // namespace

void ConnectedModeMeasurementMisc::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "Connected mode LTE Intra-frequency Measurement");
  if (logCode != lte::kConnectedIntraFrequencyCode) {
    logUnknownCode(logCode);
    return;
  }
  const PacketView packet(data);
  if (packet.size() < kMinimumLength) return;
  lte::RowWriter rows(*this);
  rows.set("E-ARFCN", lte::decimalText(packet.le16(17)));
  rows.set("Serving Physical Cell ID", lte::decimalText(packet.le16(19)));
  rows.set("Subframe Number", lte::decimalText(packet.le16(21)));
  rows.set("Serving Filtered RSRP", lte::rsrpText(packet.le16(23)));
  rows.set("Serving Filtered RSRQ", lte::rsrqText(packet.le16(25)));
}

}  // namespace corvane
