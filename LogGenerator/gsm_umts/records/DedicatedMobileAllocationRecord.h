#pragma once

// 0x5076, the mobile allocation of a dedicated channel. "GSM Serving Cell"
// shows its ARFCN.
//
//   13  le16  ARFCN
//   ..17      record length the decoder requires

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::dedicated_allocation {

inline constexpr std::uint32_t kCode = 0x5076;
inline constexpr std::size_t kMinimumLength = 17;

inline constexpr records::Field kArfcn = records::le16(13);
// The row has always shown the ARFCN's low byte only (0x0123 shows 35).
inline constexpr records::Field kArfcnShown = kArfcn.bits(0, 7);

}  // namespace corvane::gsm_umts::dedicated_allocation
