#pragma once

// 0x7130, the packet-switched (GPRS) mobility management state. "Process PS"
// shows it.
//
//   13  u8    GMM state (state table)
//   14  u8    GMM substate (substate table)
//   15  u8    update status (update-status table)
//   ..16      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::gmm_state {

inline constexpr std::uint32_t kCode = 0x7130;
inline constexpr std::size_t kMinimumLength = 16;

inline constexpr std::array<records::ValueText, 7> kStates = {{
    {0, "GMM_NULL"},
    {1, "GMM_DEREGISTERED"},
    {2, "GMM_REGISTERED_INITIATED"},
    {3, "GMM_REGISTERED"},
    {4, "GMM_DEREGISTERED_INITIATED"},
    {5, "GMM_ROUTING_AREA_UPDATE_INITIATED"},
    {6, "GMM_SERVICE_REQUEST_INITIATED"},
}};

// 9 has always been spelt without the T of its neighbours.
inline constexpr std::array<records::ValueText, 13> kSubstates = {{
    {0, "GMM_NORMAL_SERVICE"},
    {1, "GMM_LIMITED_SERVICE"},
    {2, "GMM_ATTACH_NEEDED"},
    {3, "GMM_ATTEMPTING_TO_ATTACH"},
    {4, "GMM_NO_IMSI"},
    {5, "GMM_NO_CELL_AVAILABLE"},
    {6, "GMM_PLMN_SEARCH"},
    {7, "GMM_SUSPENDED"},
    {8, "GMM_UPDATE_NEEDED"},
    {9, "GMM_ATTEMPING_TO_UPDATE"},
    {10, "GMM_ATTEMPTING_TO_UPDATE_MM"},
    {11, "GMM_IMSI_DETACH_INITIATED"},
    {12, "GMM_NULL_SUBSTATE"},
}};

inline constexpr std::array<records::ValueText, 4> kUpdateStatuses = {{
    {0, "GMM_GU1_UPDATED"},
    {1, "GMM_GU2_NOT_UPDATED"},
    {2, "GMM_GU3_PLMN_NOT_ALLOWED"},
    {3, "GMM_GU3_ROUTING_AREA_NOT_ALLOWED"},
}};

inline constexpr records::Field kState = records::u8(13).as(records::valueTable(kStates, "Unknown"));
inline constexpr records::Field kSubstate = records::u8(14).as(records::valueTable(kSubstates, "Unknown"));
inline constexpr records::Field kUpdateStatus = records::u8(15).as(records::valueTable(kUpdateStatuses, "Unknown"));

}  // namespace corvane::gsm_umts::gmm_state
