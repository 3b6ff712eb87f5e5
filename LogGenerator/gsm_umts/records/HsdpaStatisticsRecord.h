#pragma once

// 0x4221, the HSDPA decoding statistics: the sub-frames decoded and, per HARQ
// process, what it received. "HSDPA Info" shows them. Numbers show unsigned.
//
//   13  u8    record version
//   14  le16  bits 0-9: number of sub-frames
//   15  u8    bits 2-3: carrier configuration (carrier table)
//   16  u8    number of primary HARQ entries, p
//   17  u8    number of secondary HARQ entries, s
//   18        p primary entries, 9 bytes each
//   18 + 162 p  s secondary entries, 9 bytes each: the secondary list has
//             always been placed 162 bytes (not 9) a primary entry on
//   entry:    +0 u8 process id, +1 le32 bits received, +5 le16 new
//             transmissions, +7 le16 block errors
//   ..18      record length the decoder requires; the counts are not
//             checked against it

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::hsdpa_statistics {

inline constexpr std::uint32_t kCode = 0x4221;
inline constexpr std::size_t kMinimumLength = 18;

inline constexpr std::array<records::ValueText, 4> kCarriers = {{
    {0, "Single Carrier"},
    {1, "MIMO"},
    {2, "Dual Carrier"},
    {3, "Reserved"},
}};

inline constexpr records::Conversion kNumber = records::unsignedDecimal();

inline constexpr records::Field kVersion = records::u8(13).as(kNumber);
inline constexpr records::Field kSubFrames = records::le16(14).bits(0, 9).as(kNumber);
inline constexpr records::Field kCarrier = records::u8(15).bits(2, 3).as(records::valueTable(kCarriers, "Unknown"));
inline constexpr records::Field kPrimaryCount = records::u8(16);
inline constexpr records::Field kSecondaryCount = records::u8(17);

inline constexpr std::size_t kEntrySize = 9;
inline constexpr records::EntryList kPrimaryEntries = {18, kEntrySize};
// Where the secondary entries begin behind p primary ones.
inline constexpr std::size_t kSecondaryStridePerPrimary = 162;
constexpr records::EntryList secondaryEntries(std::size_t primaryCount) {
  return {kPrimaryEntries.first + kSecondaryStridePerPrimary * primaryCount, kEntrySize};
}

inline constexpr records::Field kProcessId = records::u8(0).as(kNumber);
inline constexpr records::Field kReceivedBits = records::le32(1).as(kNumber);
inline constexpr records::Field kNewTransmissions = records::le16(5).as(kNumber);
inline constexpr records::Field kBlockErrors = records::le16(7).as(kNumber);

}  // namespace corvane::gsm_umts::hsdpa_statistics
