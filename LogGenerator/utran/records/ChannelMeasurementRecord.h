#pragma once

// 0xD00C, the transport-channel BLER and coded composite transport channel
// SIR measurements. "TRCH BLER" and "CCTRCH SIR" both read it, in that order.
//
//   14  le16  bits 6-11: number of transport channels, t
//   15  u8    bits 4-7: number of CCTrCHs, c
//   17        t transport channels, 2 bytes each:
//               +0 u8 transport channel id, +1 u8 BLER
//   17+2t..288+34t  (not shown)
//   289+34t   c CCTrCHs, 8 bytes each:
//               +0 u8 CCTrCH id, +1 u8 timeslot number, +2..+7 six SIR values
//   ..17      record length the decoders require

#include "LogGenerator/records/Field.h"

namespace corvane::utran::channel_measurement {

inline constexpr std::uint32_t kCode = 0xD00C;
inline constexpr std::size_t kMinimumLength = 17;

inline constexpr records::Field kTransportChannelCount = records::le16(14).bits(6, 11);
inline constexpr records::Field kCctrchCount = records::u8(15).bits(4, 7);

inline constexpr records::EntryList kTransportChannels = {17, 2};
inline constexpr records::Field kTrchId = records::u8(0);
inline constexpr records::Field kTrchBler = records::u8(1);

// The CCTrCHs start behind 34 bytes per transport channel.
inline constexpr std::size_t kCctrchBase = 289;
inline constexpr std::size_t kCctrchStridePerTransportChannel = 34;
inline constexpr std::size_t kCctrchSize = 8;
constexpr records::EntryList cctrchs(std::uint32_t transportChannels) {
  return {kCctrchBase + kCctrchStridePerTransportChannel * transportChannels, kCctrchSize};
}
inline constexpr records::Field kCctrchId = records::u8(0);
inline constexpr records::Field kTimeslot = records::u8(1);
// Six SIR values of one byte each, from +2 of the CCTrCH.
inline constexpr std::size_t kSirCount = 6;
inline constexpr records::EntryList kSirValues = {2, 1};
inline constexpr records::Field kSir = records::u8(0);

}  // namespace corvane::utran::channel_measurement
