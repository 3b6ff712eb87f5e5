#pragma once

// 0x12b6, EV-DO active-set pilots: at least 25 bytes, and 12 more per pilot.
//
//   13-14   (not read)
//   15      number of pilots n
//   16-24   (not read)
//   25-     n pilot entries of 12 bytes:
//             +0-1  pilot PN
//             +2-3  pilot energy, in 1/512 (10 log10(raw / 512) dB)
//             +4-11 (not read)

#include <cstdint>

#include "LogGenerator/records/Field.h"

namespace corvane::records::evdo_pilots {

inline constexpr std::uint16_t kCode = 0x12b6;
inline constexpr std::size_t kMinimumSize = 25;

inline constexpr Field kPilotCount = u8(15);
inline constexpr EntryList kPilots{25, 12};
inline constexpr Field kPilotPn = le16(0);
inline constexpr Field kPilotEnergy = le16(2);

}  // namespace corvane::records::evdo_pilots
