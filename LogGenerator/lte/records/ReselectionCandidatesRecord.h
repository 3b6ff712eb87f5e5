#pragma once

// 0xB186, the idle-mode reselection candidates: the serving cell they refer
// to ("Reselection Candidates") and the candidate cells of any radio
// technology ("Reselection Candidates List").
//
//   13  u8    version
//   15  le16  serving E-ARFCN
//   17  le16  serving cell id
//   19  le16  number of candidates (only the low byte is listed)
//   21        the candidates, one every 4 bytes:
//               +0 le16 priority, +2 le16 technology, then the
//               technology's own fields from +4:
//               LTE    +4 le16 E-ARFCN, +6 le16 bits 7-15 cell id
//               UTRAN  +4 le16 UARFCN,  +6 le16 PSC
//               GERAN  +4 le16 ARFCN,   +6 u8 band, +7 u8 BSIC
//               1xRTT and HRPD
//                      +4 u8 band, +8 le16 channel, +10 le16 pilot
//   ..21      record length the decoder requires
//
// A candidate's fields reach up to 12 bytes from its start while the next
// candidate begins 4 bytes later: candidates overlap. That is the layout the
// baseband sends, and it is read so.

#include "LogGenerator/lte/records/LteScales.h"

namespace corvane::lte::reselection {

inline constexpr std::uint32_t kCode = 0xB186;
inline constexpr std::size_t kMinimumLength = 21;

inline constexpr records::Field kVersion = records::u8(13);
inline constexpr records::Field kServingEarfcn = records::le16(15);
inline constexpr records::Field kServingCellId = records::le16(17);
inline constexpr records::Field kCount = records::le16(19);

inline constexpr records::EntryList kCandidates = {21, 4};
inline constexpr std::size_t kHeaderSize = 4;
inline constexpr records::Field kPriority = records::le16(0);
inline constexpr records::Field kTechnology = records::le16(2);

// Candidate technologies.
inline constexpr std::uint32_t kLte = 0;
inline constexpr std::uint32_t kUtran = 1;
inline constexpr std::uint32_t kGeran = 2;
inline constexpr std::uint32_t kCdma1xRtt = 3;
inline constexpr std::uint32_t kCdmaHrpd = 4;

inline constexpr records::Field kLteEarfcn = records::le16(4);
inline constexpr records::Field kLteCellId = records::le16(6).bits(7, 15);
inline constexpr std::size_t kLteSize = 8;
inline constexpr records::Field kUtranUarfcn = records::le16(4);
inline constexpr records::Field kUtranPsc = records::le16(6);
inline constexpr std::size_t kUtranSize = 8;
inline constexpr records::Field kGeranArfcn = records::le16(4);
inline constexpr records::Field kGeranBand = records::u8(6);
inline constexpr records::Field kGeranBsic = records::u8(7);
inline constexpr std::size_t kGeranSize = 8;
// 1xRTT and HRPD candidates share one layout.
inline constexpr records::Field kCdmaBand = records::u8(4);
inline constexpr records::Field kCdmaChannel = records::le16(8);
inline constexpr records::Field kCdmaPilot = records::le16(10);
inline constexpr std::size_t kCdmaSize = 12;

}  // namespace corvane::lte::reselection
