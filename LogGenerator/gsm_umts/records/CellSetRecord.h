#pragma once

// 0x417A, the UMTS cell sets: every cell the phone searches in connected mode,
// with the set it belongs to, and the energy the searcher found on each.
// "Active Set" shows the cells of the active set; "Detected Set", "Monitored
// Set" and "Virtual Active Set" read the same record.
//
//   13  le16  received wideband power, raw, signed
//   15  u8    number of cells, n
//   16        n cells, 15 bytes each:
//               +7 le16 bits 0-12  primary scrambling code
//               +8 u8   bits 5-7   set type (0: the active set)
//               the other bytes not read
//   16 + 15n  n energy blocks, 44 bytes each, one per cell in the same order:
//               +32 le32, +36 le32, +40 le32  Ec/Io, linear in units of 2^-19;
//               the cell's value is the first of the three that is not 0
//   ..16      record length the decoder requires
//
// The energy blocks begin right behind the last cell, so where block i lies
// depends on the number of cells.

#include <array>

#include "LogGenerator/records/SignedField.h"

namespace corvane::gsm_umts::cell_set {

inline constexpr std::uint32_t kCode = 0x417A;
inline constexpr std::size_t kMinimumLength = 16;

inline constexpr records::SignedField kWidebandPower = records::signedField(records::le16(13));
inline constexpr records::Field kCount = records::u8(15);

inline constexpr records::EntryList kCells = {16, 15};
inline constexpr records::Field kScramblingCode = records::le16(7).bits(0, 12);
inline constexpr records::Field kSetType = records::u8(8).bits(5, 7);
inline constexpr std::uint32_t kActiveSet = 0;

inline constexpr std::size_t kEnergyBlockSize = 44;
constexpr records::EntryList energyBlocks(std::size_t cellCount) {
  return {kCells.first + kCells.entrySize * cellCount, kEnergyBlockSize};
}
inline constexpr std::array<records::Field, 3> kEnergies = {records::le32(32), records::le32(36), records::le32(40)};

// A cell's RSCP in dB from the record's wideband power and the cell's Ec/Io
// in whole dB: the power divided in whole numbers (toward zero), as the
// baseband's own conversion does.
constexpr int receivedCodePower(std::int32_t widebandPower, int ecIoDb) {
  return (widebandPower + 512) / 10 - 106 + ecIoDb;
}

}  // namespace corvane::gsm_umts::cell_set
