#include "LogGenerator/lte/LteConversions.h"

#include <charconv>

namespace corvane::lte {

namespace {

// These texts are made for every row of every packet, so they are written
// with integer arithmetic instead of a printf pass. The tests hold them
// against printf over every value a field can hold.

constexpr std::string_view kDbm = " dBm";
constexpr std::string_view kDb = " dB";

// Puts the unit behind the number's characters and ends the text there.
void endWithUnit(Text& text, char* end, std::string_view unit) { text.setEnd(end + unit.copy(end, unit.size())); }

// "%d" followed by the unit.
Text integerText(std::int64_t value, std::string_view unit) {
  Text text;
  char* end = std::to_chars(text.begin(), text.begin() + 20, value).ptr;
  endWithUnit(text, end, unit);
  return text;
}

// "%4.2f" of eighths / 8, followed by the unit, as printf writes it: to the
// nearest hundredth, exact ties to the even digit. Every fixed-point LTE field
// is a whole number of eighths once converted, which a double holds exactly.
// Two decimals make at least four characters ("0.00"), so the field width of
// 4 never pads.
Text eighthsText(std::int64_t eighths, std::string_view unit) {
  const std::uint64_t magnitude = static_cast<std::uint64_t>(eighths < 0 ? -eighths : eighths);
  // An eighth is 12.5 hundredths.
  const std::uint64_t twiceHundredths = magnitude * 25;
  std::uint64_t hundredths = twiceHundredths / 2;
  if (twiceHundredths % 2 != 0 && hundredths % 2 != 0) ++hundredths;
  Text text;
  char* end = text.begin();
  if (eighths < 0) *end++ = '-';
  end = std::to_chars(end, text.begin() + 20, hundredths / 100).ptr;
  *end++ = '.';
  *end++ = static_cast<char>('0' + hundredths / 10 % 10);
  *end++ = static_cast<char>('0' + hundredths % 10);
  endWithUnit(text, end, unit);
  return text;
}

// "%4.2f" of a converted field: every fixed-point conversion gives a whole
// number of eighths, which the double holds exactly.
Text fixedText(double value, std::string_view unit) { return eighthsText(static_cast<std::int64_t>(value * 8), unit); }

}  // namespace

Text decimalText(std::uint32_t value) { return integerText(static_cast<std::int32_t>(value), {}); }
Text decimalText(std::int32_t value) { return integerText(value, {}); }
Text wholeDbmText(std::int32_t value) { return integerText(value, kDbm); }
Text wholeDbText(std::int32_t value) { return integerText(value, kDb); }

Text rsrpText(std::uint32_t x) { return fixedText(rsrpDbm(x), kDbm); }
Text rssiText(std::uint32_t x) { return fixedText(rssiDbm(x), kDbm); }
Text neighborRsrpText(std::uint32_t x) { return fixedText(neighborRsrpDbm(x), kDbm); }
Text servingRsrqText(std::uint32_t x) { return fixedText(servingRsrqDb(x), kDb); }
Text rsrqText(std::uint32_t x) { return fixedText(rsrqDb(x), kDb); }

}  // namespace corvane::lte
