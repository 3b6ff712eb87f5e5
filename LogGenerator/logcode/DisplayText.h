#pragma once

// Display texts of decoded fields. A text is short and lives in the object
// until it is copied, once, into the display's string: a row costs no heap
// allocation of its own on the way.

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "LogGenerator/records/Field.h"

namespace corvane {

class Text {
 public:
  static constexpr std::size_t kCapacity = 32;
  Text() = default;
  // A constant text (a value table's, "Not Present"): kept as a view, of any
  // length, so it must outlive the Text, as the tables' texts do.
  explicit Text(std::string_view constant) : constant_(constant) {}
  std::string_view view() const { return constant_.data() ? constant_ : std::string_view(chars_.data(), size_); }
  operator std::string_view() const { return view(); }

  // For the text makers: the characters are written in place, then counted.
  char* begin() { return chars_.data(); }
  void setEnd(const char* end) { size_ = static_cast<std::uint8_t>(end - chars_.data()); }

 private:
  std::string_view constant_{};
  std::array<char, kCapacity> chars_{};
  std::uint8_t size_ = 0;
};

inline constexpr std::string_view kNotPresentText = "Not Present";

// "%d". A 32-bit field with its top bit set shows negative, as "%d" of the
// field always has.
Text decimalText(std::uint32_t value);
Text decimalText(std::int32_t value);
// "%d" followed by the unit ("%d dBm").
Text wholeText(std::int64_t value, const records::Unit& unit);
// "%4.2f" followed by the unit, exactly as printf writes the double.
Text fixedText(double value, const records::Unit& unit);
// "%f": six decimals, no unit.
Text floatText(double value);
// fixedText of eighths / 8, in integer arithmetic.
Text eighthsText(std::int64_t eighths, const records::Unit& unit);
inline std::string_view trueFalseText(bool value) { return value ? "True" : "False"; }

// The text of the value in the table, or the fallback.
constexpr std::string_view textFor(std::span<const records::ValueText> table, std::uint32_t value,
                                   std::string_view fallback) {
  for (const auto& entry : table) {
    if (entry.value == value) return entry.text;
  }
  return fallback;
}

// What a raw value shows through its conversion.
[[gnu::always_inline]] inline Text conversionText(const records::Conversion& conversion, std::uint32_t raw) {
  using Kind = records::Conversion::Kind;
  if (conversion.isNotPresent(raw)) return Text(kNotPresentText);
  switch (conversion.kind) {
    case Kind::Decimal: return decimalText(raw);
    case Kind::Unsigned: return wholeText(raw, records::Unit());
    case Kind::Fixed:
      return conversion.inEighths ? eighthsText(conversion.eighths(raw), conversion.unit)
                                  : fixedText(conversion.value(raw), conversion.unit);
    case Kind::Whole: return wholeText(conversion.wholeValue(raw), conversion.unit);
    case Kind::Table: return Text(textFor(conversion.table, raw, conversion.fallback));
    case Kind::Flag: return Text(trueFalseText(raw != 0));
    case Kind::Float: return floatText(conversion.value(raw));
  }
  return Text();
}

// What a field of a packet shows, in the list entry that begins `entry` bytes in.
[[gnu::always_inline]] inline Text fieldText(const records::Field& field, const PacketView& packet,
                                             std::size_t entry = 0) {
  return conversionText(field.conversion, field.raw(packet, entry));
}

}  // namespace corvane
