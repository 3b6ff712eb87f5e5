#pragma once

// 0xD0E2, the UTRAN serving cell. "Serving Cell Info" shows it.
//
//   13  u8    (not shown)
//   14  u8    cell access restrictions
//   15  u8    URA identity
//   16  u8    (not shown)
//   17  le16  uplink UARFCN
//   19  le16  downlink UARFCN
//   21  le32  cell identity ("%d": the top bit set shows negative)
//   25  u8    bit 0: access class barred to all but emergency calls
//   ..26      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::utran::serving_cell {

inline constexpr std::uint32_t kCode = 0xD0E2;
inline constexpr std::size_t kMinimumLength = 26;

inline constexpr std::array<records::ValueText, 2> kAccess = {{
    {0, "All Calls"},
    {1, "Emergency Calls Only"},
}};

inline constexpr records::Field kAccessRestrictions = records::u8(14);
inline constexpr records::Field kUraId = records::u8(15);
inline constexpr records::Field kUplinkUarfcn = records::le16(17);
inline constexpr records::Field kDownlinkUarfcn = records::le16(19);
inline constexpr records::Field kCellId = records::le32(21);
inline constexpr records::Field kAllowedAccess = records::u8(25).bits(0, 0).as(records::valueTable(kAccess, ""));

}  // namespace corvane::utran::serving_cell
