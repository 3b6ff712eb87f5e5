#pragma once

// The vocabulary of record layouts. A layout header names every field of one
// log record once: where it lies (offset from the packet's type byte, so the
// payload starts at 13), how wide it is, which of its bits hold the value, and
// how the raw value becomes what the display shows. The section decoders read
// through these fields and the simulator's encoders write through them, so a
// layout and its conversions exist in one place.
//
// Header-only: the simulator uses it without linking the decoders.

#include <array>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>

#include "LogGenerator/logcode/PacketView.h"

namespace corvane::records {

// One line of a value table: a raw value and its display text.
struct ValueText {
  std::uint32_t value;
  std::string_view text;
};

// The unit written behind a number (" dBm"). Units are short and kept in
// place, so that a display text takes one whole in a single move.
struct Unit {
  static constexpr std::size_t kCapacity = 11;
  std::array<char, kCapacity> chars{};
  std::uint8_t size = 0;

  constexpr Unit() = default;
  // Throws std::logic_error (a compile error for a constant) for a unit longer
  // than kCapacity.
  constexpr Unit(std::string_view text) {  // NOLINT: a unit is written as its text
    if (text.size() > kCapacity) throw std::logic_error("a unit holds at most 11 characters");
    for (std::size_t i = 0; i < text.size(); ++i) chars[i] = text[i];
    size = static_cast<std::uint8_t>(text.size());
  }
  template <std::size_t N>
  constexpr Unit(const char (&text)[N]) : Unit(std::string_view(text, N - 1)) {}  // NOLINT: as above
  constexpr std::string_view view() const { return {chars.data(), size}; }
  constexpr operator std::string_view() const { return view(); }
  constexpr bool empty() const { return size == 0; }
};

// How a raw field value becomes a display value.
struct Conversion {
  enum class Kind : std::uint8_t {
    Decimal,  // "%d" of the value as a signed 32-bit number
    Unsigned, // "%u" of the value as an unsigned 32-bit number
    Fixed,    // "%4.2f<unit>" of x × step + origin, in double precision
    Whole,    // "%d<unit>" of x × step + origin, taken as a signed 16-bit number
    Table,    // the text of a value table, or the fallback
    Flag,     // "True" for any bit set, else "False"
    Float,    // "%f" of x × step + origin, in double precision
  };

  Kind kind = Kind::Decimal;
  double step = 1;
  double origin = 0;
  Unit unit{};
  // A raw value that means "not present" rather than a measurement.
  bool hasNotPresent = false;
  std::uint32_t notPresent = 0;
  std::span<const ValueText> table{};
  std::string_view fallback{};
  // For Fixed: when step and origin are whole numbers of eighths (every
  // scaling the basebands use), x × step + origin counted in eighths, so the
  // display text is made with integer arithmetic alone.
  bool inEighths = false;
  std::int64_t eighthStep = 0;
  std::int64_t eighthOrigin = 0;

  // x × step + origin in eighths; only for conversions inEighths.
  constexpr std::int64_t eighths(std::uint32_t raw) const {
    return static_cast<std::int64_t>(raw) * eighthStep + eighthOrigin;
  }

  bool isNotPresent(std::uint32_t raw) const { return hasNotPresent && raw == notPresent; }

  // The display value as a number: what Fixed and Whole show, the raw value
  // (signed) otherwise.
  double value(std::uint32_t raw) const {
    switch (kind) {
      case Kind::Fixed:
      case Kind::Float: return raw * step + origin;
      case Kind::Whole: return wholeValue(raw);
      case Kind::Unsigned: return raw;
      default: return static_cast<std::int32_t>(raw);
    }
  }
  std::int32_t wholeValue(std::uint32_t raw) const {
    // Computed wide, then cut to 16 bits as the display has always shown it.
    // A whole step and origin are whole numbers of eighths too.
    return static_cast<std::int16_t>(eighths(raw) / 8);
  }

  // The raw value that shows as `value`: the inverse that encoders use.
  // Throws std::logic_error for a value that is no whole number of steps from
  // the origin, a negative one, or a conversion that has no inverse (a table, a
  // flag: write those raw).
  std::uint32_t rawFor(double wanted) const {
    if (kind == Kind::Table || kind == Kind::Flag) {
      throw std::logic_error("a table or flag field is written with its raw value");
    }
    const double x = kind == Kind::Decimal || kind == Kind::Unsigned ? wanted : (wanted - origin) / step;
    if (x < 0 || x != std::floor(x) || x > 4294967295.0) {
      throw std::logic_error(std::to_string(wanted) + " is no whole number of " + std::to_string(step) +
                             " steps from " + std::to_string(origin));
    }
    return static_cast<std::uint32_t>(x);
  }
};

constexpr Conversion decimal() { return Conversion(); }
constexpr Conversion unsignedDecimal() {
  Conversion c;
  c.kind = Conversion::Kind::Unsigned;
  return c;
}
constexpr Conversion fixed(double step, double origin, std::string_view unit) {
  Conversion c;
  c.kind = Conversion::Kind::Fixed;
  c.step = step;
  c.origin = origin;
  c.unit = unit;
  // Small enough that any 32-bit raw value times the step, plus the origin,
  // fits 63 bits.
  constexpr double kStepLimit = 1 << 30;
  constexpr double kOriginLimit = 1e12;
  const double eighthStep = step * 8;
  const double eighthOrigin = origin * 8;
  if (eighthStep > -kStepLimit && eighthStep < kStepLimit && eighthOrigin > -kOriginLimit &&
      eighthOrigin < kOriginLimit &&
      eighthStep == static_cast<double>(static_cast<std::int64_t>(eighthStep)) &&
      eighthOrigin == static_cast<double>(static_cast<std::int64_t>(eighthOrigin))) {
    c.inEighths = true;
    c.eighthStep = static_cast<std::int64_t>(eighthStep);
    c.eighthOrigin = static_cast<std::int64_t>(eighthOrigin);
  }
  return c;
}
constexpr Conversion floating(double step, double origin) {
  Conversion c;
  c.kind = Conversion::Kind::Float;
  c.step = step;
  c.origin = origin;
  return c;
}
constexpr Conversion whole(int step, int origin, std::string_view unit) {
  Conversion c = fixed(step, origin, unit);
  c.kind = Conversion::Kind::Whole;
  return c;
}
constexpr Conversion valueTable(std::span<const ValueText> table, std::string_view fallback) {
  Conversion c;
  c.kind = Conversion::Kind::Table;
  c.table = table;
  c.fallback = fallback;
  return c;
}
constexpr Conversion flag() {
  Conversion c;
  c.kind = Conversion::Kind::Flag;
  return c;
}
// The same conversion, with one raw value that shows "Not Present".
constexpr Conversion orNotPresent(Conversion c, std::uint32_t raw) {
  c.hasNotPresent = true;
  c.notPresent = raw;
  return c;
}

// A field of a record layout: `bytes` (1, 2 or 4) little-endian bytes at
// `offset`, of which bits first..last (bit 0 the lowest bit of the first
// byte) hold the value, shown through `conversion`.
struct Field {
  std::size_t offset = 0;
  unsigned bytes = 1;
  unsigned first = 0;
  unsigned last = 8 * bytes - 1;
  Conversion conversion{};

  // The same field in a list entry that begins `entry` bytes into the record.
  constexpr Field at(std::size_t entry) const { return {offset + entry, bytes, first, last, conversion}; }
  constexpr Field bits(unsigned firstBit, unsigned lastBit) const {
    return {offset, bytes, firstBit, lastBit, conversion};
  }
  constexpr Field as(Conversion c) const { return {offset, bytes, first, last, c}; }
  // One past the field's last byte.
  constexpr std::size_t end() const { return offset + bytes; }

  // The raw value in a packet, in the entry that begins `entry` bytes in.
  // Bytes beyond the end of the packet read as zero.
  std::uint32_t raw(const PacketView& packet, std::size_t entry = 0) const {
    // The bit range lies within the field's own bytes, so the 32 bits from
    // its offset hold it whatever its width; bytes past the end read as zero.
    return PacketView::bits(packet.le32(offset + entry), first, last);
  }
  double value(const PacketView& packet, std::size_t entry = 0) const { return conversion.value(raw(packet, entry)); }
};

constexpr Field u8(std::size_t offset) { return {offset, 1, 0, 7, {}}; }
constexpr Field le16(std::size_t offset) { return {offset, 2, 0, 15, {}}; }
constexpr Field le32(std::size_t offset) { return {offset, 4, 0, 31, {}}; }

// A list in a record: fixed-size entries from a first offset, as many as a
// count field says.
struct EntryList {
  std::size_t first;
  std::size_t entrySize;
};

}  // namespace corvane::records
