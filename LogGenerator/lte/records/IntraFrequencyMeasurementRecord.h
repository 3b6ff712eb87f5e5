#pragma once

// 0xB179, the connected-mode intra-frequency measurement: the serving cell's
// filtered measurement, the neighbours measured on its frequency, and the
// cells detected there but not yet measured. Three sections read it:
// "Connected mode LTE Intra-frequency Measurement" (the serving cell),
// "Measured Neighbor Cells" and "Detected Cells".
//
//   13  u8    version
//   17  le16  E-ARFCN
//   19  le16  serving physical cell id
//   21  le16  subframe number
//   23  le16  serving filtered RSRP
//   25  le16  serving filtered RSRQ
//   27  u8    number of measured neighbours, m
//   28  u8    number of detected cells, d
//   29        m measured neighbours of 6 bytes:
//               +0 le16 physical cell id, +2 le16 filtered RSRP,
//               +4 le16 filtered RSRQ
//   29 + 6m   d detected cells of 2 bytes: +0 le16 physical cell id
//   ..29      record length the decoder requires

#include "LogGenerator/lte/records/LteScales.h"

namespace corvane::lte::intra_frequency {

inline constexpr std::uint32_t kCode = 0xB179;
inline constexpr std::size_t kMinimumLength = 29;

inline constexpr records::Field kVersion = records::u8(13);
inline constexpr records::Field kEarfcn = records::le16(17);
inline constexpr records::Field kServingPhysicalCellId = records::le16(19);
inline constexpr records::Field kSubframeNumber = records::le16(21);
inline constexpr records::Field kServingFilteredRsrp = records::le16(23).as(kRsrpDbm);
inline constexpr records::Field kServingFilteredRsrq = records::le16(25).as(kRsrqDb);
inline constexpr records::Field kMeasuredCount = records::u8(27);
inline constexpr records::Field kDetectedCount = records::u8(28);

// The measured neighbours, from 29.
inline constexpr records::EntryList kMeasuredCells = {29, 6};
inline constexpr records::Field kNeighborPhysicalCellId = records::le16(0);
inline constexpr records::Field kNeighborFilteredRsrp = records::le16(2).as(kRsrpDbm);
inline constexpr records::Field kNeighborFilteredRsrq = records::le16(4).as(kRsrqDb);

// The detected cells, right behind the measured neighbours.
inline constexpr std::size_t kDetectedCellSize = 2;
inline constexpr records::Field kDetectedPhysicalCellId = records::le16(0);
constexpr records::EntryList detectedCells(std::size_t measuredCount) {
  return {kMeasuredCells.first + kMeasuredCells.entrySize * measuredCount, kDetectedCellSize};
}

}  // namespace corvane::lte::intra_frequency
