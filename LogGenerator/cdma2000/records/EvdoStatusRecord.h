#pragma once

// 0x1183, EV-DO status: exactly 50 bytes.
//
//   13      channel, bits 0-7
//   14      bits 0-2: channel bits 8-10; bits 3-7: band class
//   15      s8  receive AGC, antenna 0 (dBm)
//   16      s8  receive AGC, antenna 1 (dBm)
//   17      s8  transmit AGC (dBm)
//   18-19   serving pilot's PN offset in units of 64 chips; 0xFFFF invalid
//   20-35   (not read)
//   36      EV-DO device state
//   37      session state
//   38-40   UATI, low 24 bits (38-39 little-endian, 40 bits 16-23)
//   41      colour code
//   42-49   (not read)

#include <cstdint>

#include "LogGenerator/cdma2000/records/C2KTables.h"
#include "LogGenerator/records/SignedField.h"

namespace corvane::records::evdo_status {

inline constexpr std::uint16_t kCode = 0x1183;
inline constexpr std::size_t kSize = 50;

inline constexpr Field kChannelLow = u8(13);
inline constexpr Field kChannelHigh = u8(14).bits(0, 2);
inline constexpr Field kBandClass = u8(14).bits(3, 7).as(valueTable(c2k::kBandClasses, "[Bad Value %d]"));
inline constexpr SignedField kRxAgc0 = signedField(u8(15));
inline constexpr SignedField kRxAgc1 = signedField(u8(16));
inline constexpr SignedField kTxAgc = signedField(u8(17));
inline constexpr Field kPnOffset = le16(18);
inline constexpr std::uint16_t kInvalidPnOffset = 0xFFFF;
inline constexpr Field kDeviceState = u8(36).as(valueTable(c2k::kEvdoDeviceStates, "[Reserved %d]"));
// From this device state on (Access, Connected) antenna 1 and the transmitter report.
inline constexpr std::uint32_t kFirstTransmittingState = 4;
inline constexpr Field kSessionState = u8(37).as(valueTable(c2k::kEvdoSessionStates, "[Reserved %d]"));
inline constexpr Field kUatiLow = le16(38);
inline constexpr Field kUatiHigh = u8(40);
inline constexpr Field kColorCode = u8(41);

}  // namespace corvane::records::evdo_status
