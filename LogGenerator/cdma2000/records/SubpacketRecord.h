#pragma once

// The 1x records made of sub-packets (0x119c, 0x119d): at least 17 bytes.
//
//   13      (not read)
//   14      number of sub-packets
//   15-16   (not read)
//   17-     the sub-packets, one after the other; each begins
//             +0    id
//             +1    (not read)
//             +2-3  size in bytes, these four included
//
// Offsets of a sub-packet's fields count from its first byte. The layouts of
// the sub-packets follow.

#include <cstdint>

#include "LogGenerator/cdma2000/records/C2KTables.h"
#include "LogGenerator/records/SignedField.h"

namespace corvane::records::subpackets {

inline constexpr std::size_t kMinimumSize = 17;
inline constexpr Field kCount = u8(14);
inline constexpr std::size_t kFirst = 17;
inline constexpr Field kId = u8(0);
inline constexpr Field kSize = le16(2);
inline constexpr std::size_t kHeaderSize = 4;

}  // namespace corvane::records::subpackets

// 0x119c, 1x status: sub-packets 1 to 4 must all be there (4, the fingers, is not read).
namespace corvane::records::onex_status {

inline constexpr std::uint16_t kCode = 0x119c;

inline constexpr std::uint8_t kSystemStateId = 1;
inline constexpr std::uint8_t kRadioId = 2;
inline constexpr std::uint8_t kActiveSetId = 3;
inline constexpr std::uint8_t kFingerId = 4;

// Sub-packet 1, system state: +4 the 1x device state.
inline constexpr Field kDeviceState = u8(4).as(valueTable(c2k::k1xDeviceStates, "[Bad Value %d]"));
// The device state in which the second receive chain and the transmitter report.
inline constexpr std::uint32_t kTrafficState = 8;

// Sub-packet 2, radio:
//   +4 band class, chain 0   +5 band class, chain 1
//   +6-7 channel, chain 0    +8-9 channel, chain 1
//   +10 s8 receive AGC 0     +11 s8 receive AGC 1     +12-13 s16 transmit AGC
// Receive AGC: raw × 0.334 − 63.248 dBm; transmit AGC: raw / 10 dBm.
inline constexpr Field kRx0BandClass = u8(4).as(valueTable(c2k::kBandClasses, "[Bad Value %d]"));
inline constexpr Field kRx1BandClass = u8(5).as(valueTable(c2k::kBandClasses, "[Bad Value %d]"));
inline constexpr Field kRx0Channel = le16(6);
inline constexpr Field kRx1Channel = le16(8);
inline constexpr SignedField kRxAgc0 = signedField(u8(10));
inline constexpr SignedField kRxAgc1 = signedField(u8(11));
inline constexpr SignedField kTxAgc = signedField(le16(12));

// Sub-packet 3, active set:
//   +4-5 N   +6 G   +7 X   +8 pilot count n   +9 m   +10-11 reference PN
//   +12- the pilot records, (6 m + 15) & ~3 bytes apart:
//          +0-1 pilot PN, +(12 + 4 m)-(13 + 4 m) pilot energy E
// Ec/Io = 10 log10(max(2^(2X − 3) E / (9 G N²) − 1/N, 0.00001)) dB.
inline constexpr Field kTotalEnergyN = le16(4);
inline constexpr Field kGainG = u8(6);
inline constexpr Field kExponentX = u8(7);
inline constexpr Field kPilotCount = u8(8);
inline constexpr Field kPilotM = u8(9);
inline constexpr Field kReferencePn = le16(10);
inline constexpr std::size_t kFirstPilot = 12;
inline constexpr Field kPilotPn = le16(0);
constexpr std::size_t pilotStride(std::uint32_t m) { return (6 * static_cast<std::size_t>(m) + 15) & ~std::size_t{3}; }
constexpr std::size_t pilotEnergyOffset(std::uint32_t m) { return 12 + 4 * static_cast<std::size_t>(m); }
constexpr Field pilotEnergy(std::uint32_t m) { return le16(pilotEnergyOffset(m)); }

}  // namespace corvane::records::onex_status

// 0x119d, 1x traffic frame-error rate: sub-packet 11, traffic demodulation:
// +24 non-zero when the frame was received in error.
namespace corvane::records::onex_traffic {

inline constexpr std::uint16_t kCode = 0x119d;
inline constexpr std::uint8_t kTrafficDemodId = 11;
inline constexpr Field kFrameError = u8(24);

}  // namespace corvane::records::onex_traffic
