#pragma once

// 0xB0C2, the LTE serving cell's identity and carrier; and 0xB0C1, the
// antenna information record, of which only the number of transmit antennas
// is read. Offsets from the packet's type byte; the payload starts at 13.
//
//   13  u8    version
//   14  le16  physical cell id
//   16  le16  downlink E-ARFCN (shown as the channel number itself)
//   18  le16  uplink E-ARFCN
//   20  u8    downlink bandwidth, resource blocks (bandwidth table)
//   21  u8    uplink bandwidth, resource blocks
//   22  le32  cell identity
//   26  le16  tracking area code
//   28  le32  frequency band indicator
//   ..38      record length the decoder requires
//
// 0xB0C1:
//   13  u8    version
//   20  u8    number of transmit antennas
//   ..22      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::lte {

namespace cell_identity {
inline constexpr std::uint32_t kCode = 0xB0C2;
inline constexpr std::size_t kMinimumLength = 38;

// Resource blocks of a carrier → its bandwidth.
inline constexpr std::array<records::ValueText, 6> kBandwidths = {{
    {6, "1.4 MHz"},
    {15, "3 MHz"},
    {25, "5 MHz"},
    {50, "10 MHz"},
    {75, "15 MHz"},
    {100, "20 MHz"},
}};
inline constexpr records::Conversion kBandwidth = records::valueTable(kBandwidths, "Unknown");

inline constexpr records::Field kVersion = records::u8(13);
inline constexpr records::Field kPhysicalCellId = records::le16(14);
inline constexpr records::Field kDownlinkEarfcn = records::le16(16);
inline constexpr records::Field kUplinkEarfcn = records::le16(18);
inline constexpr records::Field kDownlinkBandwidth = records::u8(20).as(kBandwidth);
inline constexpr records::Field kUplinkBandwidth = records::u8(21).as(kBandwidth);
inline constexpr records::Field kCellIdentity = records::le32(22);
inline constexpr records::Field kTrackingAreaCode = records::le16(26);
inline constexpr records::Field kBand = records::le32(28);
}  // namespace cell_identity

namespace antenna_info {
inline constexpr std::uint32_t kCode = 0xB0C1;
inline constexpr std::size_t kMinimumLength = 22;

inline constexpr records::Field kVersion = records::u8(13);
inline constexpr records::Field kTxAntennas = records::u8(20);
}  // namespace antenna_info

}  // namespace corvane::lte
