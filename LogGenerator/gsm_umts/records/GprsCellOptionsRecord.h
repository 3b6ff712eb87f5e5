#pragma once

// 0x51F6, the GPRS cell options of the GSM serving cell. "GSM RR Info" shows
// its DRX timer as the DRX in use, "GPRS Information" all three fields.
//
//   15  u8    T3192 (T3192 table, the codings of the RLC/MAC protocol)
//   16  u8    DRX timer maximum, seconds
//   17  u8    access burst type: 0 8-bit, anything else 11-bit
//   ..24      record length the decoders require

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::gprs_cell_options {

inline constexpr std::uint32_t kCode = 0x51F6;
inline constexpr std::size_t kMinimumLength = 24;

inline constexpr std::array<records::ValueText, 8> kT3192 = {{
    {0, "500 ms"},
    {1, "1000 ms"},
    {2, "1500 ms"},
    {3, "0 ms"},
    {4, "80 ms"},
    {5, "120 ms"},
    {6, "160 ms"},
    {7, "200 ms"},
}};
inline constexpr std::array<records::ValueText, 1> kAccessBurstTypes = {{{0, "8-bit format"}}};

inline constexpr records::Field kT3192Code = records::u8(15).as(records::valueTable(kT3192, "?? ms"));
inline constexpr records::Field kDrxTimerMax = records::u8(16);
// The same byte as the DRX in use, in seconds.
inline constexpr records::Field kDrxUsed = kDrxTimerMax.as(records::whole(1, 0, " sec"));
inline constexpr records::Field kAccessBurstType =
    records::u8(17).as(records::valueTable(kAccessBurstTypes, "11-bit format"));

}  // namespace corvane::gsm_umts::gprs_cell_options
