#pragma once

// 0x108a, finger C/I: 23 bytes and exactly 14 more per finger.
//
//   13-21   (not read)
//   22      number of fingers n
//   23-     n finger entries of 14 bytes:
//             +0-1   pilot PN; 0xFFFF: the finger is not assigned
//             +2-5   (not read)
//             +6-7   C/I, in 1/512 (10 log10(raw / 512) dB)
//             +8-13  (not read)

#include <cstdint>

#include "LogGenerator/records/Field.h"

namespace corvane::records::finger {

inline constexpr std::uint16_t kCode = 0x108a;
inline constexpr std::size_t kMinimumSize = 23;

inline constexpr Field kFingerCount = u8(22);
inline constexpr EntryList kFingers{23, 14};
inline constexpr Field kPilotPn = le16(0);
inline constexpr std::uint16_t kUnassignedPn = 0xFFFF;
inline constexpr Field kCarrierToInterference = le16(6);

}  // namespace corvane::records::finger
