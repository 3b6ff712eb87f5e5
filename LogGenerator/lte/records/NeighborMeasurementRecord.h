#pragma once

// 0xB180, the idle-mode neighbour measurement of one E-ARFCN: the carrier's
// Qrxlevmin and its cells. "Neighbor Measurements" shows the carrier,
// "Neighbor Cells List" the cells.
//
//   13  u8    version
//   17  le16  E-ARFCN
//   19  u8    bits 0-5 Qrxlevmin
//   19  le16  bits 6-10 number of cells less one (1 to 32 cells)
//   21        the cells, 20 bytes each:
//               +0  le16 bits 0-8   physical cell id
//               +0  le32 bits 9-16  RSSI, 17-25 measured RSRP (half dB)
//               +4  le16 bits 0-8   average RSRP (half dB), 9-15 measured RSRQ
//               +6  u8   bits 0-6   average RSRQ
//               +4  le32 bits 23-29 Srxlev
//               +8  le16            frequency offset
//               +12 le16 bits 0-10  frame offset, le32 bits 11-29 sample offset
//   ..21      record length the decoder requires

#include "LogGenerator/lte/records/LteScales.h"

namespace corvane::lte::neighbor_measurement {

inline constexpr std::uint32_t kCode = 0xB180;
inline constexpr std::size_t kMinimumLength = 21;
inline constexpr std::size_t kMostCells = 32;

inline constexpr records::Field kVersion = records::u8(13);
inline constexpr records::Field kEarfcn = records::le16(17);
inline constexpr records::Field kQrxlevmin = records::u8(19).bits(0, 5).as(kQrxlevminDbm);
inline constexpr records::Field kCellsLessOne = records::le16(19).bits(6, 10);

inline constexpr records::EntryList kCells = {21, 20};
inline constexpr records::Field kPhysicalCellId = records::le16(0).bits(0, 8);
inline constexpr records::Field kRssi = records::le32(0).bits(9, 16).as(kRssiDbm);
// The neighbours' RSRP comes in half-dB steps, the serving cell's in quarters.
inline constexpr records::Field kMeasuredRsrp = records::le32(0).bits(17, 25).as(kNeighborRsrpDbm);
inline constexpr records::Field kAverageRsrp = records::le16(4).bits(0, 8).as(kNeighborRsrpDbm);
inline constexpr records::Field kMeasuredRsrq = records::le16(4).bits(9, 15).as(kServingRsrqDb);
inline constexpr records::Field kAverageRsrq = records::u8(6).bits(0, 6).as(kServingRsrqDb);
inline constexpr records::Field kSrxlev = records::le32(4).bits(23, 29).as(kOffset30Dbm);
inline constexpr records::Field kFrequencyOffset = records::le16(8);
inline constexpr records::Field kFrameOffset = records::le16(12).bits(0, 10);
inline constexpr records::Field kSampleOffset = records::le32(12).bits(11, 29);

}  // namespace corvane::lte::neighbor_measurement
