#pragma once

// The value tables of the CDMA2000 records: device and session states, band
// classes and the roaming indicator. A value outside a table shows its
// record's fallback text, with the value in place of %d.

#include <array>

#include "LogGenerator/records/Field.h"

namespace corvane::records::c2k {

inline constexpr std::array<ValueText, 12> k1xDeviceStates{{
    {0, "Inactive [0]"},
    {1, "Deep sleep in start state [1]"},
    {2, "Initial state for CDMA operation [2]"},
    {3, "Acquisition [3]"},
    {4, "Sync [4]"},
    {5, "Slew [5]"},
    {6, "Paging [6]"},
    {7, "Slotted mode sleep state [7]"},
    {8, "Traffic [8]"},
    {9, "UnSlew [9]"},
    {10, "Operation in PCG state [10]"},
    {11, "Powerup state [11]"},
}};

inline constexpr std::array<ValueText, 6> kEvdoDeviceStates{{
    {0, "Inactive [0]"},
    {1, "Acquisition [1]"},
    {2, "Sync [2]"},
    {3, "Idle [3]"},
    {4, "Access [4]"},
    {5, "Connected [5]"},
}};

inline constexpr std::array<ValueText, 5> kEvdoSessionStates{{
    {0, "Closed [0]"},
    {1, "AMP setup [1]"},
    {2, "AT-initiated neg [2]"},
    {3, "Initiated neg [3]"},
    {4, "Open [4]"},
}};

// "900 MHzband [9]" has always been written without the blank.
inline constexpr std::array<ValueText, 13> kBandClasses{{
    {0, "800 MHz cellular band [0]"},
    {1, "1.8 to 2.0GHz PCS band [1]"},
    {2, "872 to 960MHz TACS band [2]"},
    {3, "832 to 925MHz JTACS band [3]"},
    {4, "1.75 to 1.87GHz Korean PCS band [4]"},
    {5, "450MHz band [5]"},
    {6, "2GHz band [6]"},
    {7, "700MHz band [7]"},
    {8, "1800 MHz band [8]"},
    {9, "900 MHzband [9]"},
    {10, "Secondary 800 MHz band [10]"},
    {11, "400 MHz European PAMR band [11]"},
    {12, "800 MHz European PAMR band [12]"},
}};

// The roaming indicator is a signed 32-bit number; negative ones fall back.
inline constexpr std::array<ValueText, 13> kRoamingIndicators{{
    {0, "OFF [0]"},
    {1, "ON [1]"},
    {2, "Flashing [2]"},
    {3, "Out of Neighborhood [3]"},
    {4, "Out of Building [4]"},
    {5, "Preferred system [5]"},
    {6, "Available system [6]"},
    {7, "Alliance partner [7]"},
    {8, "Premium partner [8]"},
    {9, "Full service functionality [9]"},
    {10, "Partial service functionality [10]"},
    {11, "Banner ON [11]"},
    {12, "Banner OFF [12]"},
}};

}  // namespace corvane::records::c2k
