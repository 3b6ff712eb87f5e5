#pragma once

// How the LTE sections turn raw baseband fields into display texts. Each
// conversion lives here once, so that every row showing, say, an RSRP names the
// same function, and a reviewer checks one formula instead of six.
//
// The numeric conversions are separate from the texts because one section also
// logs the converted numbers.

#include <array>
#include <cstdint>
#include <string>
#include <string_view>

#include "LogGenerator/logcode/Base.h"

namespace corvane::lte {

// --- Log codes ---

inline constexpr std::uint32_t kAntennaInfoCode = 0xB0C1;
inline constexpr std::uint32_t kServingCellIdentityCode = 0xB0C2;
inline constexpr std::uint32_t kConnectedIntraFrequencyCode = 0xB179;
inline constexpr std::uint32_t kServingCellMeasurementCode = 0xB17F;
inline constexpr std::uint32_t kNeighborMeasurementCode = 0xB180;
inline constexpr std::uint32_t kReselectionCandidatesCode = 0xB186;

// --- Numbers ---

// RSRP of the serving cell, quarter-dB steps from -140 dBm.
constexpr double rsrpDbm(std::uint32_t x) { return x * 0.25 - 140.0; }
// RSSI, and the neighbours' RSRP, which the baseband reports in half-dB steps.
constexpr double rssiDbm(std::uint32_t x) { return x * 0.5 - 140.0; }
constexpr double neighborRsrpDbm(std::uint32_t x) { return rssiDbm(x); }
// RSRQ as the serving-cell measurement (and the neighbour list) reports it.
constexpr double servingRsrqDb(std::uint32_t x) { return x * 0.25 - 30.0; }
// RSRQ of the connected-mode intra-frequency measurement, eighth-dB steps.
constexpr double rsrqDb(std::uint32_t x) { return x * 0.125 - 20.0; }
// Srxlev, P_Max and Max UE Tx Power. Kept as a signed 16-bit result, which is
// what the display has always shown.
constexpr std::int16_t offset30Dbm(std::uint32_t x) { return static_cast<std::int16_t>(static_cast<std::int32_t>(x) - 30); }
// Qrxlevmin, 2 dB steps from -140 dBm; signed 16-bit like offset30Dbm.
constexpr std::int16_t qrxlevminDbm(std::uint32_t x) {
  return static_cast<std::int16_t>(2 * static_cast<std::int32_t>(x) - 140);
}

// --- Texts ---

inline constexpr std::string_view kNotPresent = "Not Present";

// "%d". A 32-bit field with its top bit set shows negative, as "%d" of the
// field always has.
std::string decimalText(std::uint32_t value);
std::string decimalText(std::int32_t value);
// "%4.2f dBm" and "%4.2f dB".
std::string dbmText(double value);
std::string dbText(double value);
// "%d dBm" and "%d dB".
std::string wholeDbmText(std::int32_t value);
std::string wholeDbText(std::int32_t value);

inline std::string rsrpText(std::uint32_t x) { return dbmText(rsrpDbm(x)); }
inline std::string rssiText(std::uint32_t x) { return dbmText(rssiDbm(x)); }
inline std::string neighborRsrpText(std::uint32_t x) { return dbmText(neighborRsrpDbm(x)); }
inline std::string servingRsrqText(std::uint32_t x) { return dbText(servingRsrqDb(x)); }
inline std::string rsrqText(std::uint32_t x) { return dbText(rsrqDb(x)); }
inline std::string offset30DbmText(std::uint32_t x) { return wholeDbmText(offset30Dbm(x)); }
inline std::string qrxlevminText(std::uint32_t x) { return wholeDbmText(qrxlevminDbm(x)); }
inline std::string trueFalseText(bool value) { return value ? "True" : "False"; }

// --- Value tables ---

struct ValueText {
  std::uint32_t value;
  std::string_view text;
};

// The text of the value in the table, or the fallback.
template <std::size_t N>
constexpr std::string_view textFor(const std::array<ValueText, N>& table, std::uint32_t value,
                                   std::string_view fallback) {
  for (const auto& entry : table) {
    if (entry.value == value) return entry.text;
  }
  return fallback;
}

// --- Rows ---

// The rows of a dictionary section for the length of one packet: the container
// is looked up once, and without one (before the first display build) the rows
// go nowhere.
class SectionRows {
 public:
  explicit SectionRows(const Base& section) : rows_(section.sectionDictionary()) {}
  void set(std::string_view key, std::string text) const {
    if (rows_) rows_->set(key, Value(std::move(text)));
  }
  void set(std::string_view key, std::string_view text) const { set(key, std::string(text)); }
  void remove(std::string_view key) const {
    if (rows_) rows_->remove(key);
  }

 private:
  std::optional<Dictionary> rows_;
};

}  // namespace corvane::lte
