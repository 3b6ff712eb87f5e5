#pragma once

// 0x51F8, the mobile allocation: the hopping sequence number and the
// frequencies the phone hops over. "Mobile Allocation" shows it.
//
//   13  u8    hopping sequence number (HSN)
//   14  u8    number of ARFCNs
//   15        the ARFCNs, le16 each
//   ..15      record length the decoder requires

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::mobile_allocation {

inline constexpr std::uint32_t kCode = 0x51F8;
inline constexpr std::size_t kMinimumLength = 15;

inline constexpr records::Field kHsn = records::u8(13);
inline constexpr records::Field kCount = records::u8(14);
inline constexpr records::EntryList kArfcns = {15, 2};
inline constexpr records::Field kArfcn = records::le16(0);

}  // namespace corvane::gsm_umts::mobile_allocation
