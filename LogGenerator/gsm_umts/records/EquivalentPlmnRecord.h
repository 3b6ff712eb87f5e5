#pragma once

// 0x7150, the equivalent PLMN list: the networks the phone may treat as its
// own. "Equivalent PLMN List" shows one row per network.
//
//   16  u8    number of networks
//   17        the networks, one every 3 bytes, each read as 6 bytes of one
//             decimal digit apiece:
//               +0 MCC hundreds, +1 MNC hundreds, +2 MCC tens,
//               +3 MNC tens,     +4 MCC units,    +5 MNC units
//   ..17      record length the decoder requires
//
// A network's digits reach 6 bytes from its start while the next network
// begins 3 bytes later: networks overlap, and the last one reaches 3 bytes
// past its own 3. That is how the baseband's list is read.

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::equivalent_plmn {

inline constexpr std::uint32_t kCode = 0x7150;
inline constexpr std::size_t kMinimumLength = 17;

inline constexpr records::Field kCount = records::u8(16);
inline constexpr records::EntryList kNetworks = {17, 3};
// How far from a network's start its digits reach.
inline constexpr std::size_t kNetworkExtent = 6;

inline constexpr records::Field kMccHundreds = records::u8(0);
inline constexpr records::Field kMncHundreds = records::u8(1);
inline constexpr records::Field kMccTens = records::u8(2);
inline constexpr records::Field kMncTens = records::u8(3);
inline constexpr records::Field kMccUnits = records::u8(4);
inline constexpr records::Field kMncUnits = records::u8(5);

}  // namespace corvane::gsm_umts::equivalent_plmn
