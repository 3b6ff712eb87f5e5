#pragma once

// 0xD00A, the measured UTRAN neighbour cells. "Neighbor Cell List" shows
// them.
//
//   16  u8    bits 1-7: number of cells, n
//   17..167   (not shown)
//   168       n cells, 16 bytes each; the rows read the first 4:
//               +0 le16 bits 0-13  UARFCN
//               +1 le16 bits 6-12  cell identity (7 bits)
//               +2 le16 bits 5-12  filtered RSCP, shown as x / 256 ("%f")
//               +3 u8   bits 5-6   set (ASET, MSET, DSET; 3: none shown)
//               +3 u8   bit 7      in the JDCS list
//   ..21      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::utran::neighbor_measurement {

inline constexpr std::uint32_t kCode = 0xD00A;
inline constexpr std::size_t kMinimumLength = 21;

inline constexpr std::array<records::ValueText, 3> kSets = {{
    {0, "ASET"},
    {1, "MSET"},
    {2, "DSET"},
}};
// A cell in none of the sets has no "Status" row.
inline constexpr std::uint32_t kNoSet = 3;
inline constexpr std::array<records::ValueText, 2> kTrueFalse = {{
    {0, "FALSE"},
    {1, "TRUE"},
}};

inline constexpr records::Field kCount = records::u8(16).bits(1, 7);
inline constexpr records::EntryList kCells = {168, 16};
// The bytes of a cell that its rows read.
inline constexpr std::size_t kCellReadWidth = 4;
inline constexpr records::Field kUarfcn = records::le16(0).bits(0, 13);
inline constexpr records::Field kCellId = records::le16(1).bits(6, 12);
inline constexpr records::Field kFilteredRscp = records::le16(2).bits(5, 12).as(records::floating(0.00390625, 0));
inline constexpr records::Field kSet = records::u8(3).bits(5, 6).as(records::valueTable(kSets, ""));
inline constexpr records::Field kInJdcs = records::u8(3).bits(7, 7).as(records::valueTable(kTrueFalse, ""));

}  // namespace corvane::utran::neighbor_measurement
