#pragma once

// 0x4005, the ranked idle-mode neighbour lists: the UMTS cells ("UMTS Set")
// and the GSM cells ("GSM Set") that the phone ranks for reselection.
//
//   13  u8    number of UMTS cells
//   14  u8    number of GSM cells
//   15        the UMTS cells, 10 bytes each:
//               +0 le16 downlink UARFCN (signed)
//               +2 le16 primary scrambling code
//               +4 u8   RSCP, raw (signed): x - 21 dB
//               +5 le16 ranking RSCP, dB (signed)
//               +7 u8   Ec/No in half-dB steps (signed)
//               +8 le16 ranking value (signed)
//   15        the GSM cells, 7 bytes each:
//               +0 le16 ARFCN
//               +2 le16 BSIC
//               +4 u8   received level, dBm (signed)
//               +5 le16 ranking value (signed)
//   ..15      record length the decoder requires
//
// Both lists begin at 15: the two sections read the same bytes, each with its
// own count and entry size. That is the record as the baseband sends it.

#include "LogGenerator/records/SignedField.h"

namespace corvane::gsm_umts::ranked_cells {

inline constexpr std::uint32_t kCode = 0x4005;
inline constexpr std::size_t kMinimumLength = 15;

inline constexpr records::Field kUmtsCount = records::u8(13);
inline constexpr records::Field kGsmCount = records::u8(14);

inline constexpr records::EntryList kUmtsCells = {15, 10};
inline constexpr records::SignedField kDownlinkUarfcn = records::signedField(records::le16(0));
inline constexpr records::Field kScramblingCode = records::le16(2);
// Kept to 16 bits signed, as the display has always shown it.
inline constexpr records::SignedField kRscp = records::signedField(records::u8(4).as(records::whole(1, -21, " dB")));
inline constexpr records::SignedField kRankRscp = records::signedField(records::le16(5).as(records::whole(1, 0, " dB")));
// Shown with six decimals ("-7.500000 dB"), not through the conversion's text.
inline constexpr records::SignedField kEcNo = records::signedField(records::u8(7).as(records::fixed(0.5, 0, " dB")));
inline constexpr records::SignedField kUmtsRankingValue = records::signedField(records::le16(8));

inline constexpr records::EntryList kGsmCells = {15, 7};
inline constexpr records::Field kArfcn = records::le16(0);
inline constexpr records::Field kBsic = records::le16(2);
inline constexpr records::SignedField kRssi = records::signedField(records::u8(4).as(records::whole(1, 0, " dBm")));
inline constexpr records::SignedField kGsmRankingValue = records::signedField(records::le16(5));

}  // namespace corvane::gsm_umts::ranked_cells
