#pragma once

// 0x51F5, who may use the GSM serving cell's packet service and how its
// reselection is controlled. "GPRS Information" shows it.
//
//   13  u8    packet flow context support (PFC table)
//   14  u8    priority access threshold (threshold table)
//   15  u8    network control order (NC table)
//   ..18      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::gprs_access {

inline constexpr std::uint32_t kCode = 0x51F5;
inline constexpr std::size_t kMinimumLength = 18;

inline constexpr std::array<records::ValueText, 4> kNetworkControlOrders = {{
    {0, "NC0"},
    {1, "NC1"},
    {2, "NC2"},
    {255, "Not Available"},
}};
// 255 has always read "Available", unlike its neighbours' "Not Available".
inline constexpr std::array<records::ValueText, 3> kPfcSupport = {{
    {0, "Not Supported"},
    {1, "Supported"},
    {255, "Available"},
}};
inline constexpr std::array<records::ValueText, 9> kPriorityAccessThresholds = {{
    {0, "Barred (PKT access not allowed in the Cell)"},
    {1, "Barred"},
    {2, "Barred"},
    {3, "1 Only"},
    {4, "1 to 2"},
    {5, "1 to 3"},
    {6, "1 to 4"},
    {7, "Allowed"},
    {255, "Not Available"},
}};

inline constexpr records::Field kPfcSupported = records::u8(13).as(records::valueTable(kPfcSupport, "Unknown"));
inline constexpr records::Field kPriorityAccessThreshold =
    records::u8(14).as(records::valueTable(kPriorityAccessThresholds, "Unknown"));
inline constexpr records::Field kNetworkControlOrder =
    records::u8(15).as(records::valueTable(kNetworkControlOrders, "Unknown"));

}  // namespace corvane::gsm_umts::gprs_access
