#pragma once

// 0x4116, the block error counts of the transport channels. "BLER" shows
// them.
//
//   13  u8    number of transport channels, n
//   14  le16  window size
//   16        n channels, 9 bytes each:
//               +0 u8 transport channel id, +1 le32 CRCs received,
//               +5 le32 CRCs received in error
//   ..16      record length the decoder requires

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::bler {

inline constexpr std::uint32_t kCode = 0x4116;
inline constexpr std::size_t kMinimumLength = 16;

inline constexpr records::Field kCount = records::u8(13);
inline constexpr records::Field kWindowSize = records::le16(14);
inline constexpr records::EntryList kChannels = {16, 9};
inline constexpr records::Field kChannelId = records::u8(0);
inline constexpr records::Field kCrcReceived = records::le32(1);
inline constexpr records::Field kCrcErrors = records::le32(5);

}  // namespace corvane::gsm_umts::bler
