#pragma once

// 0xB17F, the LTE serving cell measurement: the serving cell's RSRP, RSRQ and
// RSSI and the idle-mode reselection parameters it was measured against.
// Offsets from the packet's type byte; bit ranges count from bit 0 of the
// value's first byte.
//
//   13  u8    version
//   17  le16  E-ARFCN
//   19  le16  bits 0-8 physical cell id
//   20  u8    bits 1-4 serving layer priority
//   21  le32  bits 0-8 measured RSRP, 9-17 average RSRP,
//             18-24 measured RSRQ, 25-31 average RSRQ
//   25  le16  bits 0-8 RSSI
//   26  u8    bits 1-6 Qrxlevmin
//   25  le32  bits 15-21 P-Max, 22-27 maximum UE transmit power
//   29  u8    bits 0-6 Srxlev
//   29  le16  bits 7-12 consecutive DRX cycles with S < 0
//   29  le32  bits 13-18 S-IntraSearch, 19-24 S-NonIntraSearch
//   32  u8    bit 1 measurement rules updated, bits 2-5 measurement rules
//   ..33      record length the decoder requires

#include "LogGenerator/lte/records/LteScales.h"

namespace corvane::lte::serving_measurement {

inline constexpr std::uint32_t kCode = 0xB17F;
inline constexpr std::size_t kMinimumLength = 33;

// P-Max and the UE's maximum power share this "not present" value. The UE's
// power is a 6-bit field, so it can never reach 64 and never shows "Not
// Present"; the baseband's layout is kept so.
inline constexpr std::uint32_t kPowerNotPresent = 64;
inline constexpr std::uint32_t kSearchNotPresent = 32;
inline constexpr records::Conversion kPower = records::orNotPresent(kOffset30Dbm, kPowerNotPresent);
// The two search thresholds differ in their unit only: the intra-frequency one
// has always been shown in dB, the other in dBm.
inline constexpr records::Conversion kIntraSearch = records::orNotPresent(records::whole(2, 0, " dB"), kSearchNotPresent);
inline constexpr records::Conversion kNonIntraSearch =
    records::orNotPresent(records::whole(2, 0, " dBm"), kSearchNotPresent);

inline constexpr records::Field kVersion = records::u8(13);
inline constexpr records::Field kEarfcn = records::le16(17);
inline constexpr records::Field kPhysicalCellId = records::le16(19).bits(0, 8);
inline constexpr records::Field kLayerPriority = records::u8(20).bits(1, 4);
inline constexpr records::Field kMeasuredRsrp = records::le32(21).bits(0, 8).as(kRsrpDbm);
inline constexpr records::Field kAverageRsrp = records::le32(21).bits(9, 17).as(kRsrpDbm);
inline constexpr records::Field kMeasuredRsrq = records::le32(21).bits(18, 24).as(kServingRsrqDb);
inline constexpr records::Field kAverageRsrq = records::le32(21).bits(25, 31).as(kServingRsrqDb);
inline constexpr records::Field kRssi = records::le16(25).bits(0, 8).as(kRssiDbm);
inline constexpr records::Field kQrxlevmin = records::u8(26).bits(1, 6).as(kQrxlevminDbm);
inline constexpr records::Field kPMax = records::le32(25).bits(15, 21).as(kPower);
inline constexpr records::Field kMaxUeTxPower = records::le32(25).bits(22, 27).as(kPower);
inline constexpr records::Field kSrxlev = records::u8(29).bits(0, 6).as(kOffset30Dbm);
inline constexpr records::Field kDrxCyclesBelowZero = records::le16(29).bits(7, 12);
inline constexpr records::Field kSIntraSearch = records::le32(29).bits(13, 18).as(kIntraSearch);
inline constexpr records::Field kSNonIntraSearch = records::le32(29).bits(19, 24).as(kNonIntraSearch);
inline constexpr records::Field kRulesUpdated = records::u8(32).bits(1, 1).as(records::flag());
inline constexpr records::Field kRules = records::u8(32).bits(2, 5);

}  // namespace corvane::lte::serving_measurement
