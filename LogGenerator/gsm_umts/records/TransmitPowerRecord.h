#pragma once

// 0x4031, the UMTS transmit power samples. "UMTS RR Info" shows their
// average.
//
//   14  u8    number of samples, n
//   16        n samples, 14 bytes each:
//               +4 le16 transmit power, raw (signed); 0: no measurement
//               the other bytes not read
//   ..16      record length the decoder requires

#include "LogGenerator/records/SignedField.h"

namespace corvane::gsm_umts::transmit_power {

inline constexpr std::uint32_t kCode = 0x4031;
inline constexpr std::size_t kMinimumLength = 16;

inline constexpr records::Field kCount = records::u8(14);
inline constexpr records::EntryList kSamples = {16, 14};
inline constexpr records::SignedField kPower = records::signedField(records::le16(4));
inline constexpr std::int32_t kNoMeasurement = 0;

// A sample's power in dBm: the raw value divided in whole numbers (toward
// zero), as the baseband's own conversion does.
constexpr int powerDbm(std::int32_t raw) { return (raw + 512) / 10 - 70; }

}  // namespace corvane::gsm_umts::transmit_power
