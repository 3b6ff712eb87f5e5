#include "LogGenerator/logcode/DisplayText.h"

#include <charconv>
#include <cmath>
#include <cstdio>

namespace corvane {

namespace {

// Puts the unit behind the number's characters and ends the text there. Every
// unit is short; the number leaves room for it.
void endWithUnit(Text& text, char* end, std::string_view unit) {
  if (unit.empty()) {
    text.setEnd(end);
    return;
  }
  const std::size_t room = Text::kCapacity - static_cast<std::size_t>(end - text.begin());
  text.setEnd(end + unit.copy(end, std::min(room, unit.size())));
}

// "%4.2f" of eighths / 8, followed by the unit, as printf writes it: to the
// nearest hundredth, exact ties to the even digit. Two decimals make at least
// four characters ("0.00"), so the field width of 4 never pads.
Text eighthsText(std::int64_t eighths, std::string_view unit) {
  const std::uint64_t magnitude =
      eighths < 0 ? static_cast<std::uint64_t>(-(eighths + 1)) + 1 : static_cast<std::uint64_t>(eighths);
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

// Eighths that a double holds exactly and whose hundredths fit the text.
constexpr double kLargestEighths = 1e15;

}  // namespace

Text decimalText(std::uint32_t value) { return decimalText(static_cast<std::int32_t>(value)); }
Text decimalText(std::int32_t value) {
  Text text;
  text.setEnd(std::to_chars(text.begin(), text.begin() + 11, value).ptr);
  return text;
}

Text wholeText(std::int64_t value, std::string_view unit) {
  Text text;
  char* end = std::to_chars(text.begin(), text.begin() + 20, value).ptr;
  endWithUnit(text, end, unit);
  return text;
}

Text fixedText(double value, std::string_view unit) {
  // Every fixed-point field of the records is a whole number of eighths once
  // converted, which these texts write with integer arithmetic, without a
  // printf pass; anything else goes through printf itself.
  const double eighths = value * 8;
  if (eighths == std::floor(eighths) && std::fabs(eighths) < kLargestEighths) {
    return eighthsText(static_cast<std::int64_t>(eighths), unit);
  }
  Text text;
  const int n = std::snprintf(text.begin(), Text::kCapacity, "%4.2f", value);
  char* end = text.begin() + std::min<std::size_t>(n < 0 ? 0 : static_cast<std::size_t>(n), Text::kCapacity - 1);
  endWithUnit(text, end, unit);
  return text;
}

Text conversionText(const records::Conversion& conversion, std::uint32_t raw) {
  using Kind = records::Conversion::Kind;
  if (conversion.isNotPresent(raw)) return Text(kNotPresentText);
  switch (conversion.kind) {
    case Kind::Decimal: return decimalText(raw);
    case Kind::Fixed: return fixedText(conversion.value(raw), conversion.unit);
    case Kind::Whole: return wholeText(conversion.wholeValue(raw), conversion.unit);
    case Kind::Table: return Text(textFor(conversion.table, raw, conversion.fallback));
    case Kind::Flag: return Text(trueFalseText(raw != 0));
  }
  return Text();
}

}  // namespace corvane
