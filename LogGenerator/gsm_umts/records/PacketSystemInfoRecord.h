#pragma once

// 0x51FD, the state of the GSM serving cell's packet system information.
// "GPRS Information" shows it.
//
//   13  u8    packet PSI status, a plain number
//   14  u8    count of the low-rate PSI messages
//   15  u8    count of the high-rate PSI messages
//   16  u8    extended measurement order, a plain number
//   33  u8    packet SI status: 0 not supported, anything else supported
//   ..35      record length the decoder requires

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::packet_system_info {

inline constexpr std::uint32_t kCode = 0x51FD;
inline constexpr std::size_t kMinimumLength = 35;

inline constexpr std::array<records::ValueText, 1> kNotSupported = {{{0, "Not Supported"}}};

inline constexpr records::Field kPsiStatus = records::u8(13);
inline constexpr records::Field kCountLowRate = records::u8(14);
inline constexpr records::Field kCountHighRate = records::u8(15);
inline constexpr records::Field kExtMeasurementOrder = records::u8(16);
inline constexpr records::Field kSiStatus = records::u8(33).as(records::valueTable(kNotSupported, "Supported"));

}  // namespace corvane::gsm_umts::packet_system_info
