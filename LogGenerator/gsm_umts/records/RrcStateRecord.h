#pragma once

// 0x4125, the UMTS RRC state. "UMTS RR Info" shows it.
//
//   13  u8    RRC state (state table)
//   ..14      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::rrc_state {

inline constexpr std::uint32_t kCode = 0x4125;
inline constexpr std::size_t kMinimumLength = 14;

inline constexpr std::array<records::ValueText, 6> kStates = {{
    {0, "Disconnected"},
    {1, "Connecting"},
    {2, "CELL_FACH"},
    {3, "CELL_DCH"},
    {4, "CELL_PCH"},
    {5, "URA_PCH"},
}};

inline constexpr records::Field kState = records::u8(13).as(records::valueTable(kStates, "Unknown"));

}  // namespace corvane::gsm_umts::rrc_state
