#include "LogGenerator/lte/NeighborMeasurementMisc.h"

#include "LogGenerator/lte/LteConversions.h"
#include "platform/Log.h"

namespace corvane {

namespace {
constexpr std::size_t kMinimumLength = 21;
}  // namespace

void NeighborMeasurementMisc::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto accepted =
      acceptPacket("Neighbor Measurements", data, logCode, lte::kNeighborMeasurementCode, kMinimumLength);
  if (!accepted) return;
  const PacketView& packet = *accepted;
  lte::RowWriter rows(*this);
  rows.set("Version", lte::decimalText(packet.u8(13)));
  rows.set("E-ARFCN", lte::decimalText(packet.le16(17)));
  rows.set("Qrxlevmin", lte::qrxlevminText(packet.bits8(19, 0, 5)));
}

}  // namespace corvane
