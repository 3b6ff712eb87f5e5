#include "LogGenerator/lte/ServingCellMeasurement.h"

#include "LogGenerator/lte/LteConversions.h"
#include "platform/Log.h"

namespace corvane {

namespace {

constexpr std::size_t kMinimumLength = 33;

// P_Max and Max UE Tx Power share this test. Max UE Tx Power is a 6-bit field,
// so it can never reach 64 and never shows "Not Present"; that is kept.
constexpr std::uint32_t kPowerNotPresent = 64;
constexpr std::uint32_t kSearchNotPresent = 32;

lte::Text powerText(std::uint32_t field) {
  return field == kPowerNotPresent ? lte::Text(lte::kNotPresent) : lte::offset30DbmText(field);
}

// The two search thresholds differ in their unit only: the intra-frequency one
// has always been shown in dB, the other in dBm.
lte::Text intraSearchText(std::uint32_t field) {
  return field == kSearchNotPresent ? lte::Text(lte::kNotPresent)
                                    : lte::wholeDbText(2 * static_cast<std::int32_t>(field));
}
lte::Text nonIntraSearchText(std::uint32_t field) {
  return field == kSearchNotPresent ? lte::Text(lte::kNotPresent)
                                    : lte::wholeDbmText(2 * static_cast<std::int32_t>(field));
}

}  // namespace

void ServingCellMeasurement::updateWithData(std::span<const std::uint8_t> data, std::uint32_t logCode) {
  const auto accepted =
      acceptPacket("Serving Cell Measurements", data, logCode, lte::kServingCellMeasurementCode, kMinimumLength);
  if (!accepted) return;
  const PacketView& packet = *accepted;
  lte::RowWriter rows(*this);
  rows.set("Version", lte::decimalText(packet.u8(13)));
  rows.set("E-ARFCN", lte::decimalText(packet.le16(17)));
  rows.set("Physical Cell ID", lte::decimalText(packet.bits16(19, 0, 8)));
  rows.set("Serving Layer Priority", lte::decimalText(packet.bits8(20, 1, 4)));
  rows.set("Measured RSRP", lte::rsrpText(packet.bits32(21, 0, 8)));
  rows.set("Average RSRP", lte::rsrpText(packet.bits32(21, 9, 17)));
  rows.set("Measured RSRQ", lte::servingRsrqText(packet.bits32(21, 18, 24)));
  rows.set("Average RSRQ", lte::servingRsrqText(packet.bits32(21, 25, 31)));
  rows.set("Measured RSSI", lte::rssiText(packet.bits16(25, 0, 8)));
  rows.set("Qrxlevmin", lte::qrxlevminText(packet.bits8(26, 1, 6)));
  rows.set("P_Max", powerText(packet.bits32(25, 15, 21)));
  rows.set("Max UE Tx Power", powerText(packet.bits32(25, 22, 27)));
  rows.set("Srxlev", lte::offset30DbmText(packet.bits8(29, 0, 6)));
  rows.set("Num of Consecutive DRX Cycles of S < 0", lte::decimalText(packet.bits16(29, 7, 12)));
  rows.set("S Intra Search", intraSearchText(packet.bits32(29, 13, 18)));
  rows.set("S Non Intra Search", nonIntraSearchText(packet.bits32(29, 19, 24)));
  rows.set("Measurement Rules Updated", lte::trueFalseText(packet.bits8(32, 1, 1) != 0));
  rows.set("Measurement Rules", lte::decimalText(packet.bits8(32, 2, 5)));
}

}  // namespace corvane
