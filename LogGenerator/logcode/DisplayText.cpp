#include "LogGenerator/logcode/DisplayText.h"

#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstring>

namespace corvane {

namespace {

// The longest number a text writes: "%d" of a 64-bit value, or "%4.2f" of
// fewer than kLargestEighths eighths.
constexpr std::size_t kLongestNumber = 20;

// Puts the unit behind the number's characters and ends the text there. A
// number leaves room for a whole unit, which is copied in one move.
void endWithUnit(Text& text, char* end, const records::Unit& unit) {
  static_assert(Text::kCapacity >= kLongestNumber + records::Unit::kCapacity);
  std::memcpy(end, unit.chars.data(), records::Unit::kCapacity);
  text.setEnd(end + unit.size);
}

// Eighths that a double holds exactly and whose hundredths fit the text.
constexpr std::uint64_t kLargestEighths = 1'000'000'000'000'000;

// "%4.2f" and the unit, through printf itself; a number longer than any a
// field can make is cut at kLongestNumber characters.
Text printedText(double value, const records::Unit& unit) {
  Text text;
  const int n = std::snprintf(text.begin(), Text::kCapacity, "%4.2f", value);
  char* end = text.begin() + std::min<std::size_t>(n < 0 ? 0 : static_cast<std::size_t>(n), kLongestNumber);
  endWithUnit(text, end, unit);
  return text;
}

}  // namespace

// "%4.2f" of eighths / 8, followed by the unit, as printf writes it: to the
// nearest hundredth, exact ties to the even digit. Two decimals make at least
// four characters ("0.00"), so the field width of 4 never pads.
Text eighthsText(std::int64_t eighths, const records::Unit& unit) {
  const std::uint64_t magnitude =
      eighths < 0 ? static_cast<std::uint64_t>(-(eighths + 1)) + 1 : static_cast<std::uint64_t>(eighths);
  if (magnitude >= kLargestEighths) return printedText(static_cast<double>(eighths) / 8, unit);
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

Text decimalText(std::uint32_t value) { return decimalText(static_cast<std::int32_t>(value)); }
Text decimalText(std::int32_t value) {
  Text text;
  text.setEnd(std::to_chars(text.begin(), text.begin() + 11, value).ptr);
  return text;
}

Text wholeText(std::int64_t value, const records::Unit& unit) {
  Text text;
  char* end = std::to_chars(text.begin(), text.begin() + 20, value).ptr;
  endWithUnit(text, end, unit);
  return text;
}

Text floatText(double value) {
  // to_chars rounds to six decimals as printf's "%f" does; a number too long
  // for the text is cut at its capacity.
  Text text;
  const auto result = std::to_chars(text.begin(), text.begin() + Text::kCapacity, value, std::chars_format::fixed, 6);
  text.setEnd(result.ec == std::errc() ? result.ptr : text.begin() + Text::kCapacity);
  return text;
}

Text fixedText(double value, const records::Unit& unit) {
  // Every fixed-point field of the records is a whole number of eighths once
  // converted, which these texts write with integer arithmetic, without a
  // printf pass; anything else goes through printf itself.
  const double eighths = value * 8;
  if (eighths == std::floor(eighths) && std::fabs(eighths) < static_cast<double>(kLargestEighths)) {
    return eighthsText(static_cast<std::int64_t>(eighths), unit);
  }
  return printedText(value, unit);
}

}  // namespace corvane
