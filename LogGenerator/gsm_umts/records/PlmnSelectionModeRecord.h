#pragma once

// 0x7132, the PLMN selection mode: how the phone chooses its network.
// "Serving PLMN" shows it. Offsets from the packet's type byte; the payload
// starts at 13.
//
//   14  u8    selection mode (mode table)
//   ..16      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::plmn_selection {

inline constexpr std::uint32_t kCode = 0x7132;
inline constexpr std::size_t kMinimumLength = 16;

inline constexpr std::array<records::ValueText, 5> kModes = {{
    {0, "Automatic"},
    {1, "Manual"},
    {2, "Limited"},
    {3, "LIMITED_ROUTINE_ACQ"},
    {4, "LIMITED_MANUAL_ACQ"},
}};

inline constexpr records::Field kMode = records::u8(14).as(records::valueTable(kModes, "Unknown"));

}  // namespace corvane::gsm_umts::plmn_selection
