#include "LogGenerator/lte/NeighborMeasurementMisc.h"

#include "LogGenerator/lte/LteConversions.h"
#include "platform/Log.h"

namespace corvane {

namespace {
constexpr std::size_t kMinimumLength = 21;
}  // namespace

void NeighborMeasurementMisc::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  log::write(log::kWarning, "Neighbor Measurements");
  if (logCode != lte::kNeighborMeasurementCode) {
    logUnknownCode(logCode);
    return;
  }
  const PacketView packet(data);
  if (packet.size() < kMinimumLength) return;
  lte::RowWriter rows(*this);
  rows.set("Version", lte::decimalText(packet.u8(13)));
  rows.set("E-ARFCN", lte::decimalText(packet.le16(17)));
  rows.set("Qrxlevmin", lte::qrxlevminText(packet.bits8(19, 0, 5)));
}

}  // namespace corvane
