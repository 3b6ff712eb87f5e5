#include "LogGenerator/lte/LteConversions.h"

#include <charconv>

namespace corvane::lte {

namespace {

// These texts are built for every row of every packet, so they are written
// with to_chars instead of a printf pass. to_chars with a precision rounds as
// printf does; the tests hold both against each other over every field value.

std::string withUnit(const char* begin, const char* end, std::string_view unit) {
  std::string text;
  text.reserve(static_cast<std::size_t>(end - begin) + unit.size());
  text.append(begin, end);
  text.append(unit);
  return text;
}

// "%4.2f" followed by the unit. Two decimals make at least four characters
// ("0.00"), so the field width never pads.
std::string fixedText(double value, std::string_view unit) {
  // Wide enough for any double in fixed notation.
  char digits[320];
  const auto result = std::to_chars(digits, digits + sizeof digits, value, std::chars_format::fixed, 2);
  return withUnit(digits, result.ptr, unit);
}

// "%d" followed by the unit.
std::string integerText(std::int32_t value, std::string_view unit) {
  char digits[16];
  const auto result = std::to_chars(digits, digits + sizeof digits, value);
  return withUnit(digits, result.ptr, unit);
}

}  // namespace

std::string decimalText(std::uint32_t value) { return integerText(static_cast<std::int32_t>(value), {}); }
std::string decimalText(std::int32_t value) { return integerText(value, {}); }
std::string dbmText(double value) { return fixedText(value, " dBm"); }
std::string dbText(double value) { return fixedText(value, " dB"); }
std::string wholeDbmText(std::int32_t value) { return integerText(value, " dBm"); }
std::string wholeDbText(std::int32_t value) { return integerText(value, " dB"); }

}  // namespace corvane::lte
