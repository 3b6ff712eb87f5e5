#pragma once

// 0x5134, the GSM serving cell's identity. "GSM Serving Cell" shows it.
//
//   13  le16  ARFCN
//   15  le16  BSIC
//   17  le16  cell id
//   ..26      record length the decoder requires

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::gsm_cell_identity {

inline constexpr std::uint32_t kCode = 0x5134;
inline constexpr std::size_t kMinimumLength = 26;

inline constexpr records::Field kArfcn = records::le16(13);
inline constexpr records::Field kBsic = records::le16(15);
inline constexpr records::Field kCellId = records::le16(17);

}  // namespace corvane::gsm_umts::gsm_cell_identity
