#pragma once

// 0x7131, the circuit-switched mobility management state. "Process CO" shows
// the state, "Process CS" the state, its substate and the update status.
//
//   13  u8    MM state (state table, numbered as the MM states of the
//             core network protocol, with gaps)
//   14  u8    MM idle substate (substate table)
//   15  u8    update status (update-status table)
//   ..16      record length the decoders require

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::mm_state {

inline constexpr std::uint32_t kCode = 0x7131;
inline constexpr std::size_t kMinimumLength = 16;

// The values missing here (1, 2, 4, 11, 12, 16, 24) are no MM state. The
// texts of 20 and 21 hold a blank after their last underscore but one.
inline constexpr std::array<records::ValueText, 19> kStates = {{
    {0, "MM_NULL"},
    {3, "MM_LOCATION_UPDATE_INITIATED"},
    {5, "MM_WAIT_FOR_OUTGOING_MM_CONNECTION"},
    {6, "MM_CONNECTION_ACTIVE"},
    {7, "MM_IMSI_DETACH_INITIATED"},
    {8, "MM_PROCESS_CM_SERVICE_PROMPT"},
    {9, "MM_WAIT_FOR_NETWORK_COMMAND"},
    {10, "MM_LOCATION_UPDATE_REJECTED"},
    {13, "MM_WAIT_FOR_RR_CONNECTION_LU"},
    {14, "MM_WAIT_FOR_RR_CONNECTION_MM"},
    {15, "MM_WAIT_FOR_RR_CONNECTION_IMSI_DETACH"},
    {17, "MM_REESTABLISHMENT_INITIATED"},
    {18, "MM_WAIT_FOR_RR_ACTIVE"},
    {19, "MM_IDLE"},
    {20, "MM_WAIT_FOR_ADDITIONAL_OUTGOING_MM_ CONNECTION"},
    {21, "MM_WAIT_FOR_RR_CONNECTION_ REESTABLISHMENT"},
    {22, "MM_WAIT_FOR_REESTABLISH_DECISION"},
    {23, "MM_LOCATION_UPDATING_PENDING"},
    {25, "MM_RR_CONNECTION_RELEASE_NOT_ALLOWED"},
}};

inline constexpr std::array<records::ValueText, 9> kSubstates = {{
    {0, "MM_NULL_SUBSTATE"},
    {1, "MM_NO_IMSI"},
    {2, "MM_PLMN_SEARCH"},
    {3, "MM_LIMITED_SERVICE"},
    {4, "MM_ATTEMPTING_TO_UPDATE"},
    {5, "MM_LOCATION_UPDATE_NEEDED"},
    {6, "MM_NO_CELL_AVAILABLE"},
    {7, "MM_PLMN_SEARCH_NORMAL_SERVICE"},
    {8, "MM_NORMAL_SERVICE"},
}};

inline constexpr std::array<records::ValueText, 4> kUpdateStatuses = {{
    {0, "UPDATED"},
    {1, "NOT_UPDATED"},
    {2, "ROAMING_NOT_ALLOWED"},
    {3, "LOCATION_AREA_NOT_ALLOWED"},
}};

inline constexpr records::Field kState = records::u8(13).as(records::valueTable(kStates, "Unknown"));
inline constexpr records::Field kSubstate = records::u8(14).as(records::valueTable(kSubstates, "Unknown"));
inline constexpr records::Field kUpdateStatus = records::u8(15).as(records::valueTable(kUpdateStatuses, "Unknown"));

}  // namespace corvane::gsm_umts::mm_state
