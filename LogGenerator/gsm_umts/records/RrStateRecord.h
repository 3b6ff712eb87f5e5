#pragma once

// 0x512C, the GSM radio resource state. "GSM RR Info" shows it.
//
//   13  u8    RR state (state table)
//   14  u8    RR substate, a plain number
//   15  u8    RR status, a plain number
//   16  u8    RR mode: 0 voice, anything else data
//   ..17      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::rr_state {

inline constexpr std::uint32_t kCode = 0x512C;
inline constexpr std::size_t kMinimumLength = 17;

// 13, 19 and 21 hold a blank before "PROGRESS".
inline constexpr std::array<records::ValueText, 22> kStates = {{
    {0, "RR_INACTIVE"},
    {1, "RR_GOING_ACTIVE"},
    {2, "RR_GOING_INACTIVE"},
    {3, "RR_CELL_SELECTION"},
    {4, "RR_PLMN_LIST_CONSTRUCTION"},
    {5, "RR_IDLE"},
    {6, "RR_CELL_RESELECTION"},
    {7, "RR_CONNECTION_PENDING"},
    {8, "RR_CHOOSE_CELL"},
    {9, "RR_DATA_TRANSFER"},
    {10, "RR_NO_CHANNELS"},
    {11, "RR_CONNECTION_RELEASE"},
    {12, "RR_EARLY_CAMPED_WAIT_FOR_SI"},
    {13, "RR_W2G_INTERRAT_HANDOVER_ PROGRESS"},
    {14, "RR_W2G_INTERRAT_RESELECTION_PROGRESS"},
    {15, "RR_WAIT_FOR_EARLY_PSCAN"},
    {16, "GRR51"},
    {17, "GRR52"},
    {18, "RR_G2W_INTERRAT_RESELECTION_PROGRESS"},
    {19, "RR_G2W_INTERRAT_HANDOVER_ PROGRESS"},
    {20, "RR_CELL_REEST"},
    {21, "RR_W2G_INTERRAT_CC_ORDER_ PROGRESS"},
}};

inline constexpr std::array<records::ValueText, 1> kModes = {{{0, "Voice"}}};

inline constexpr records::Field kState = records::u8(13).as(records::valueTable(kStates, "Unknown"));
inline constexpr records::Field kSubstate = records::u8(14);
inline constexpr records::Field kStatus = records::u8(15);
inline constexpr records::Field kMode = records::u8(16).as(records::valueTable(kModes, "Data"));

}  // namespace corvane::gsm_umts::rr_state
