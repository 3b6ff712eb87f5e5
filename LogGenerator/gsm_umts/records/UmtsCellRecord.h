#pragma once

// 0x4127, the UMTS serving cell and its frequencies. "UMTS RR Info" shows it.
//
//   13  le32  uplink UARFCN
//   17  le32  downlink UARFCN
//   21  le32  cell identity
//   25  le16  URA identity
//   ..29      record length the decoder requires

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::umts_cell {

inline constexpr std::uint32_t kCode = 0x4127;
inline constexpr std::size_t kMinimumLength = 29;

inline constexpr records::Field kUplinkUarfcn = records::le32(13);
inline constexpr records::Field kDownlinkUarfcn = records::le32(17);
inline constexpr records::Field kCellId = records::le32(21);
inline constexpr records::Field kUraId = records::le16(25);

}  // namespace corvane::gsm_umts::umts_cell
