#pragma once

// 0xD0E0, the UTRAN RRC state. "RRC Info" shows it.
//
//   13  u8    record version; only 1 is understood
//   14  u8    RRC state (state table); a record of another version reads as
//             state 255, which no line of the table holds
//   ..15      record length the decoder expects (a shorter one is traced and
//             read all the same)

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::utran::rrc_state {

inline constexpr std::uint32_t kCode = 0xD0E0;
inline constexpr std::size_t kExpectedLength = 15;

inline constexpr std::uint32_t kUnderstoodVersion = 1;
inline constexpr std::uint32_t kUnknownState = 255;

inline constexpr std::array<records::ValueText, 6> kStates = {{
    {0, "Disconnected"},
    {1, "Connecting"},
    {2, "Cell Fach"},
    {3, "Cell DCH"},
    {4, "Cell PCH"},
    {5, "Cell URA PCH"},
}};
inline constexpr std::string_view kUnknownStateText = "Unknown RRC Mode";

inline constexpr records::Field kVersion = records::u8(13);
inline constexpr records::Field kState = records::u8(14).as(records::valueTable(kStates, kUnknownStateText));

}  // namespace corvane::utran::rrc_state
