#pragma once

// 0x7132, the PLMN selection mode: how the phone chooses its network, and
// the state of its registration service. "Serving PLMN" shows the mode;
// "Process CO", "Process CS" and "Process PS" each show the service state.
// Offsets from the packet's type byte; the payload starts at 13.
//
//   13  u8    registration service state (service-state table)
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

inline constexpr std::array<records::ValueText, 7> kServiceStates = {{
    {0, "REG_STATE_INACTIVE"},
    {1, "REG_STATE_IDLE"},
    {2, "REG_STATE_REGISTERING"},
    {3, "REG_STATE_DEREGISTERING"},
    {4, "REG_STATE_MANUAL_SEARCH"},
    {5, "REG_STATE_AUTOMATIC_SEARCH"},
    {6, "REG_STATE_OFFLINE"},
}};

inline constexpr records::Field kServiceState = records::u8(13).as(records::valueTable(kServiceStates, "Unknown"));
inline constexpr records::Field kMode = records::u8(14).as(records::valueTable(kModes, "Unknown"));

}  // namespace corvane::gsm_umts::plmn_selection
