#pragma once

// 0x51FB, the GSM serving cell's packet broadcast control channel. "GPRS
// Information" shows whether the cell has one.
//
//   13  u8    PBCCH present, a plain number
//   ..34      record length the decoder requires

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::pbcch {

inline constexpr std::uint32_t kCode = 0x51FB;
inline constexpr std::size_t kMinimumLength = 34;

inline constexpr records::Field kPresent = records::u8(13);

}  // namespace corvane::gsm_umts::pbcch
