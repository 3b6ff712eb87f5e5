#pragma once

// 0xD00E, the measured GSM neighbour cells of a UTRAN phone. "GSM Neighbor
// Cell List" reads them.
//
//   16  u8    number of cells, n
//   17        n cells, 8 bytes each:
//               +0 le16 bits 0-13  cell identity
//               +1 u8   bit 6      band indicator
//               +1 u8   bit 7      BSIC valid
//               +2 u8   NCC
//               +3 u8   BCC
//               +4 le16 ARFCN
//               +6 le16 RSSI, signed
//   ..17      record length the decoder requires

#include "LogGenerator/records/Field.h"
#include "LogGenerator/records/SignedField.h"

namespace corvane::utran::gsm_neighbor {

inline constexpr std::uint32_t kCode = 0xD00E;
inline constexpr std::size_t kMinimumLength = 17;

inline constexpr records::Field kCount = records::u8(16);
inline constexpr records::EntryList kCells = {17, 8};
inline constexpr records::Field kCellId = records::le16(0).bits(0, 13);
inline constexpr records::Field kBandIndicator = records::u8(1).bits(6, 6);
inline constexpr records::Field kBsicValid = records::u8(1).bits(7, 7);
inline constexpr records::Field kNcc = records::u8(2);
inline constexpr records::Field kBcc = records::u8(3);
inline constexpr records::Field kArfcn = records::le16(4);
inline constexpr records::SignedField kRssi = records::signedField(records::le16(6));

}  // namespace corvane::utran::gsm_neighbor
