#pragma once

// How the LTE sections turn raw baseband fields into display texts. Each
// conversion lives here once, so that every row showing, say, an RSRP names the
// same function, and a reviewer checks one formula instead of six.
//
// The numeric conversions are separate from the texts because one section also
// logs the converted numbers.

#include <array>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <optional>
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
constexpr std::int16_t offset30Dbm(std::uint32_t x) {
  return static_cast<std::int16_t>(static_cast<std::int32_t>(x) - 30);
}
// Qrxlevmin, 2 dB steps from -140 dBm; signed 16-bit like offset30Dbm.
constexpr std::int16_t qrxlevminDbm(std::uint32_t x) {
  return static_cast<std::int16_t>(2 * static_cast<std::int32_t>(x) - 140);
}

// --- Texts ---

// A display text, made where it is used: every LTE text is short, so it lives
// in the object and is copied once, into the display's string.
class Text {
 public:
  static constexpr std::size_t kCapacity = 32;
  Text() = default;
  // A constant text; longer ones are cut at kCapacity.
  explicit Text(std::string_view text) : size_(static_cast<std::uint8_t>(text.copy(chars_.data(), kCapacity))) {}
  std::string_view view() const { return {chars_.data(), size_}; }
  operator std::string_view() const { return view(); }

  // For the text makers: the characters are written in place, then counted.
  char* begin() { return chars_.data(); }
  void setEnd(const char* end) { size_ = static_cast<std::uint8_t>(end - chars_.data()); }

 private:
  std::array<char, kCapacity> chars_{};
  std::uint8_t size_ = 0;
};

inline constexpr std::string_view kNotPresent = "Not Present";

// "%d". A 32-bit field with its top bit set shows negative, as "%d" of the
// field always has.
Text decimalText(std::uint32_t value);
Text decimalText(std::int32_t value);
// "%d dBm" and "%d dB".
Text wholeDbmText(std::int32_t value);
Text wholeDbText(std::int32_t value);

// "%4.2f dBm" or "%4.2f dB" of the conversions above, exactly as printf writes
// the double each gives.
Text rsrpText(std::uint32_t x);
Text rssiText(std::uint32_t x);
Text neighborRsrpText(std::uint32_t x);
Text servingRsrqText(std::uint32_t x);
Text rsrqText(std::uint32_t x);

inline Text offset30DbmText(std::uint32_t x) { return wholeDbmText(offset30Dbm(x)); }
inline Text qrxlevminText(std::uint32_t x) { return wholeDbmText(qrxlevminDbm(x)); }
inline std::string_view trueFalseText(bool value) { return value ? "True" : "False"; }

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

// Writes the rows of one dictionary for the length of one packet: a section's
// container, looked up once (without one, before the first display build, the
// rows go nowhere), or a list's new row. Rows are written in the order the
// dictionary holds them, so each is first looked for right behind the one
// before.
class RowWriter {
 public:
  explicit RowWriter(const Base& section) : rows_(section.sectionDictionary()) {}
  explicit RowWriter(Dictionary rows) : rows_(std::move(rows)) {}
  void set(std::string_view key, std::string_view text) {
    if (rows_) rows_->setString(key, text, next_);
  }
  void remove(std::string_view key) const {
    if (rows_) rows_->remove(key);
  }
  // The dictionary written, for a list's row.
  Value value() const { return rows_ ? Value(*rows_) : Value(); }

 private:
  std::optional<Dictionary> rows_;
  std::size_t next_ = 0;
};

// The keys of a list's rows, in the order they are written. A new row is a
// copy of a prototype that holds them already, so filling it never searches.
class RowShape {
 public:
  RowShape(std::initializer_list<std::string_view> keys) {
    // Empty strings, which the row's texts are then written into.
    for (std::string_view key : keys) prototype_.set(key, Value(std::string()));
  }
  RowWriter makeRow() const { return RowWriter(prototype_.shallowCopy()); }

 private:
  Dictionary prototype_;
};

}  // namespace corvane::lte
