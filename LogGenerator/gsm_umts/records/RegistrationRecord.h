#pragma once

// 0x7135, the registration: the network the phone is registered on, its
// location and routing area, and the service it has there. "Serving PLMN"
// shows it; "GPRS Information" shows the network operating mode.
//
//   13  u8    network operating mode (mode table)
//   14  u8    service type (service table)
//   15  3 bytes PLMN identity, two BCD digits a byte, low nibble first:
//         15  bits 0-3 MCC digit 1, bits 4-7 MCC digit 2
//         16  bits 0-3 MCC digit 3, bits 4-7 MNC digit 3 (0xF: two-digit MNC)
//         17  bits 0-3 MNC digit 1, bits 4-7 MNC digit 2
//   18  u8    location area code, high byte
//   19  u8    location area code, low byte
//   20  u8    routing area code
//   ..32      record length the decoder requires
//
// The location area code is the one big-endian value of these records: the
// baseband passes on the network's own encoding of it.

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::gsm_umts::registration {

inline constexpr std::uint32_t kCode = 0x7135;
inline constexpr std::size_t kMinimumLength = 32;

inline constexpr std::array<records::ValueText, 5> kServiceTypes = {{
    {0, "NO_SERVICE"},
    {1, "CS_ONLY"},
    {2, "PS_ONLY"},
    {3, "CS_PS_SERVICE"},
    {4, "LIMITED_SERVICE"},
}};

inline constexpr std::array<records::ValueText, 3> kNetworkOperatingModes = {{
    {0, "Class 1"},
    {1, "Class 2"},
    {2, "Class 3"},
}};

// A BCD digit shows as itself; a nibble of 10 or more (the 0xF filler of a
// two-digit MNC among them) shows as a blank.
inline constexpr std::array<records::ValueText, 10> kDigits = {{
    {0, "0"}, {1, "1"}, {2, "2"}, {3, "3"}, {4, "4"}, {5, "5"}, {6, "6"}, {7, "7"}, {8, "8"}, {9, "9"},
}};
inline constexpr records::Conversion kDigit = records::valueTable(kDigits, " ");

inline constexpr records::Field kNetworkOperatingMode =
    records::u8(13).as(records::valueTable(kNetworkOperatingModes, "Unknown"));
inline constexpr records::Field kServiceType = records::u8(14).as(records::valueTable(kServiceTypes, "Unknown"));

// The identity's digits, each shown in the order of its code.
inline constexpr records::Field kMccDigits[] = {
    records::u8(15).bits(0, 3).as(kDigit),
    records::u8(15).bits(4, 7).as(kDigit),
    records::u8(16).bits(0, 3).as(kDigit),
};
inline constexpr records::Field kMncDigits[] = {
    records::u8(17).bits(0, 3).as(kDigit),
    records::u8(17).bits(4, 7).as(kDigit),
    records::u8(16).bits(4, 7).as(kDigit),
};

inline constexpr records::Field kLocationAreaCodeHigh = records::u8(18);
inline constexpr records::Field kLocationAreaCodeLow = records::u8(19);
inline constexpr records::Field kRoutingAreaCode = records::u8(20);

}  // namespace corvane::gsm_umts::registration
