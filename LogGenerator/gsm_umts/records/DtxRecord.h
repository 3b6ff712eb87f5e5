#pragma once

// 0x5072, the GSM dedicated channel's mode, of which "GSM RR Info" shows
// whether discontinuous transmission is on.
//
//   19  u8    DTX: 0 off, anything else on
//   ..20      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::dtx {

inline constexpr std::uint32_t kCode = 0x5072;
inline constexpr std::size_t kMinimumLength = 20;

inline constexpr std::array<records::ValueText, 1> kOff = {{{0, "OFF"}}};

inline constexpr records::Field kDtxUsed = records::u8(19).as(records::valueTable(kOff, "ON"));

}  // namespace corvane::gsm_umts::dtx
