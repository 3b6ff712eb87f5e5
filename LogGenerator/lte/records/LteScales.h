#pragma once

// How the LTE records' raw fields become display values. Each scale lives here
// once; every field that shows, say, an RSRP names the same one, and the
// simulator writes its values through the same scale.

#include "LogGenerator/records/Field.h"

namespace corvane::lte {

// RSRP of the serving cell and of the connected-mode measurement, quarter-dB
// steps from -140 dBm.
inline constexpr records::Conversion kRsrpDbm = records::fixed(0.25, -140, " dBm");
// RSSI, and the neighbours' RSRP of 0xB180, which the baseband reports in
// half-dB steps.
inline constexpr records::Conversion kRssiDbm = records::fixed(0.5, -140, " dBm");
inline constexpr records::Conversion kNeighborRsrpDbm = kRssiDbm;
// RSRQ as the serving-cell measurement (and the neighbour list) reports it.
inline constexpr records::Conversion kServingRsrqDb = records::fixed(0.25, -30, " dB");
// RSRQ of the connected-mode intra-frequency measurement, eighth-dB steps.
inline constexpr records::Conversion kRsrqDb = records::fixed(0.125, -20, " dB");
// Srxlev, P-Max and the UE's maximum power: x − 30 dBm, signed 16-bit.
inline constexpr records::Conversion kOffset30Dbm = records::whole(1, -30, " dBm");
// Qrxlevmin: 2x − 140 dBm, signed 16-bit.
inline constexpr records::Conversion kQrxlevminDbm = records::whole(2, -140, " dBm");


}  // namespace corvane::lte
