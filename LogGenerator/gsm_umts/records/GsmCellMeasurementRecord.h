#pragma once

// 0x5137, the GSM cell measurement: the serving cell's level and its C1 and
// C2 reselection criteria, then the measured neighbour cells. "GSM Serving
// Cell" shows the serving cell, "Neighboring Cells" the neighbours; "GSM RR
// Info" shows the same serving-cell bytes as receive level and qualities, and
// "GPRS Information" the reselection hysteresis.
//
//   15  u8    serving cell RSSI, dBm as an unsigned number
//   16  le32  serving cell C1, signed
//   20  le32  serving cell C2, signed
//   26  u8    cell reselect hysteresis: 0 not applied, anything else applied
//   28  u8    number of neighbours
//   29        the neighbours, 14 bytes each:
//               +0 le16 ARFCN, +2 u8 RSSI, +3 le32 C1 (signed),
//               +7 to +13 not shown
//   ..29      record length the decoder requires

#include <array>

#include "LogGenerator/records/SignedField.h"

namespace corvane::gsm_umts::gsm_cell_measurement {

inline constexpr std::uint32_t kCode = 0x5137;
inline constexpr std::size_t kMinimumLength = 29;

// The serving cell's level has always shown as the unsigned byte in dBm,
// without a sign or an offset.
inline constexpr records::Field kServingRssi = records::u8(15).as(records::whole(1, 0, " dBm"));
inline constexpr records::SignedField kServingC1 = records::signedField(records::le32(16));
inline constexpr records::SignedField kServingC2 = records::signedField(records::le32(20));
// What the serving cell's rows show of C1 and C2: their low 16 bits as an
// unsigned number, so a C1 of -5 shows as 65531.
inline constexpr records::Field kServingC1Shown = kServingC1.field.bits(0, 15);
inline constexpr records::Field kServingC2Shown = kServingC2.field.bits(0, 15);

// "GSM RR Info"'s reading of the same bytes: the level as a plain number, C1
// and C2 whole, as "%d" of their 32 bits.
inline constexpr records::Field kServingRxLevel = records::u8(15);
inline constexpr records::Field kRxQualityFull = kServingC1.field;
inline constexpr records::Field kRxQualitySub = kServingC2.field;

inline constexpr std::array<records::ValueText, 1> kHysteresisNotApplied = {{{0, "Not Applied"}}};
inline constexpr records::Field kCellReselectHysteresis =
    records::u8(26).as(records::valueTable(kHysteresisNotApplied, "Applied"));

inline constexpr records::Field kNeighborCount = records::u8(28);
inline constexpr records::EntryList kNeighbors = {29, 14};
inline constexpr records::Field kNeighborArfcn = records::le16(0);
// A neighbour's level is the plain byte, without the serving cell's unit.
inline constexpr records::Field kNeighborRssi = records::u8(2);
inline constexpr records::SignedField kNeighborC1 = records::signedField(records::le32(3));

}  // namespace corvane::gsm_umts::gsm_cell_measurement
