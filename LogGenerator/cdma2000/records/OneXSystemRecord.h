#pragma once

// 0x134f, 1x system: at least 171 bytes, version 2 or later.
//
//   13      version
//   14-41   (not read)
//   42-45   s32 roaming indicator (ERI)
//   46-49   system type; 2: SID and NID below are valid
//   50-51   SID
//   52-53   NID
//   54-130  (not read)
//   131     packet zone id
//   132     (not read)
//   133     protocol revision
//   134-183 (not read)
//   184-185 base station id: beyond the 171 bytes that make a record
//           acceptable; a shorter record reads it as zero

#include <cstdint>

#include "LogGenerator/cdma2000/records/C2KTables.h"
#include "LogGenerator/records/Field.h"

namespace corvane::records::onex_system {

inline constexpr std::uint16_t kCode = 0x134f;
inline constexpr std::size_t kMinimumSize = 171;
inline constexpr std::uint32_t kFirstVersion = 2;
inline constexpr std::uint32_t kSystemTypeIs95 = 2;

inline constexpr Field kVersion = u8(13);
inline constexpr Field kRoamingIndicator = le32(42).as(valueTable(c2k::kRoamingIndicators, "ERI - %d"));
inline constexpr Field kSystemType = le32(46);
inline constexpr Field kSid = le16(50);
inline constexpr Field kNid = le16(52);
inline constexpr Field kPacketZone = u8(131);
inline constexpr Field kProtocolRevision = u8(133);
inline constexpr Field kBaseId = le16(184);
inline constexpr std::size_t kFullSize = 186;

}  // namespace corvane::records::onex_system
