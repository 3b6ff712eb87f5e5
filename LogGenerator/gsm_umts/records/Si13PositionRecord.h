#pragma once

// 0x51F4, where the GSM serving cell broadcasts its system information 13.
// "GPRS Information" shows it.
//
//   14  u8    SI13 position (position table)
//   ..15      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::si13_position {

inline constexpr std::uint32_t kCode = 0x51F4;
inline constexpr std::size_t kMinimumLength = 15;

inline constexpr std::array<records::ValueText, 3> kPositions = {{
    {0, "Located on BCCH"},
    {1, "Located on Extended BCCH"},
    {255, "Not Available"},
}};

inline constexpr records::Field kPosition = records::u8(14).as(records::valueTable(kPositions, "Unknown"));

}  // namespace corvane::gsm_umts::si13_position
