#pragma once

// 0x51FF, the BSIC of each neighbour frequency the phone has decoded.
// "Neighboring Cells" keeps the pairs and shows a neighbour's BSIC beside its
// measurement of 0x5137.
//
//   14  u8    number of pairs
//   15        the pairs, 4 bytes each:
//               +0 le16 ARFCN, +2 u8 BSIC, +3 not read
//   ..15      record length the decoder requires

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::arfcn_bsic {

inline constexpr std::uint32_t kCode = 0x51FF;
inline constexpr std::size_t kMinimumLength = 15;

inline constexpr records::Field kCount = records::u8(14);
inline constexpr records::EntryList kPairs = {15, 4};
inline constexpr records::Field kArfcn = records::le16(0);
inline constexpr records::Field kBsic = records::u8(2);

}  // namespace corvane::gsm_umts::arfcn_bsic
