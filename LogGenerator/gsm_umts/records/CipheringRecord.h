#pragma once

// 0x4157, the UMTS ciphering state. "UMTS RR Info" shows it.
//
//   13  u8    ciphering: 0 disabled, any other value enabled
//   ..19      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::ciphering {

inline constexpr std::uint32_t kCode = 0x4157;
inline constexpr std::size_t kMinimumLength = 19;

inline constexpr std::array<records::ValueText, 1> kStates = {{{0, "Disabled"}}};

inline constexpr records::Field kCiphering = records::u8(13).as(records::valueTable(kStates, "Enabled"));

}  // namespace corvane::gsm_umts::ciphering
