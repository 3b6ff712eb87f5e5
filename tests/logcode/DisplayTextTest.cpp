// Display texts of converted fields read exactly as the printf formats they
// stand for, whichever way they are made: in integer arithmetic for scalings
// in whole eighths, through printf for any other.

#include "LogGenerator/logcode/DisplayText.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <stdexcept>
#include <string>

namespace corvane {
namespace {

// What printf's "%4.2f" writes, and the unit.
std::string printed(double value, const char* unit) {
  char buffer[400];
  std::snprintf(buffer, sizeof buffer, "%4.2f", value);
  return std::string(buffer) + unit;
}

TEST(DisplayText, AScalingInWholeEighthsIsWrittenWithoutPrintfAndReadsTheSame) {
  constexpr records::Conversion kQuarters = records::fixed(0.25, -140, " dBm");
  static_assert(kQuarters.inEighths && kQuarters.eighthStep == 2 && kQuarters.eighthOrigin == -1120);
  for (std::uint32_t x : {0u, 1u, 559u, 560u, 561u, 0xFFFFu, 0xFFFFFFFFu}) {
    EXPECT_EQ(conversionText(kQuarters, x).view(), printed(x * 0.25 - 140, " dBm")) << x;
  }
}

TEST(DisplayText, AnyOtherScalingGoesThroughPrintf) {
  constexpr records::Conversion kTenths = records::fixed(0.1, -5, " dB");
  static_assert(!kTenths.inEighths);
  for (std::uint32_t x : {0u, 1u, 49u, 50u, 51u, 12345u, 0xFFFFFFFFu}) {
    EXPECT_EQ(conversionText(kTenths, x).view(), printed(x * 0.1 - 5, " dB")) << x;
  }
}

TEST(DisplayText, EighthsTooManyForIntegerHundredthsGoThroughPrintf) {
  // A million per step: whole eighths, but 0xFFFFFFFF steps are more
  // hundredths than the integer path writes.
  constexpr records::Conversion kMillions = records::fixed(1e6, 0, " dB");
  static_assert(kMillions.inEighths);
  EXPECT_EQ(conversionText(kMillions, 0xFFFFFFFF).view(), printed(0xFFFFFFFF * 1e6, " dB"));
  EXPECT_EQ(conversionText(kMillions, 3).view(), "3000000.00 dB");
}

TEST(DisplayText, AStepTooLargeForEighthsIsScaledInDoublePrecision) {
  constexpr records::Conversion kHuge = records::fixed(1 << 28, 0, "");
  static_assert(!kHuge.inEighths);
  EXPECT_EQ(conversionText(kHuge, 2).view(), "536870912.00");
}

TEST(DisplayText, TheLongestNumbersKeepTheirUnit) {
  EXPECT_EQ(wholeText(-9223372036854775807 - 1, " dBm").view(), "-9223372036854775808 dBm");
  EXPECT_EQ(eighthsText(-(1'000'000'000'000'000 - 1), " dBm").view(),
            printed(-(1e15 - 1) / 8, " dBm"));
  EXPECT_EQ(wholeText(7, "12345678901").view(), "712345678901");
}

TEST(DisplayText, AUnitHoldsElevenCharactersAtMost) {
  const std::string twelve = "123456789012";
  EXPECT_THROW(records::Unit{std::string_view(twelve)}, std::logic_error);
  EXPECT_EQ(records::Unit(std::string_view(twelve).substr(1)).view(), "23456789012");
  EXPECT_TRUE(records::Unit().empty());
}

// "%u": a 32-bit field with its top bit set stays positive.
TEST(DisplayText, AnUnsignedConversionShowsAll32BitsPositive) {
  constexpr records::Conversion kUnsigned = records::unsignedDecimal();
  EXPECT_EQ(conversionText(kUnsigned, 0xFFFFFFFF).view(), "4294967295");
  EXPECT_EQ(conversionText(kUnsigned, 0).view(), "0");
  EXPECT_EQ(conversionText(records::decimal(), 0xFFFFFFFF).view(), "-1");
  EXPECT_EQ(kUnsigned.rawFor(4294967295.0), 0xFFFFFFFFu);
}

// A value table's texts are shown whole, however long.
TEST(DisplayText, ATableTextLongerThanAMadeTextIsShownWhole) {
  static constexpr records::ValueText kTexts[] = {{0, "Barred (PKT access not allowed in the Cell)"}};
  constexpr records::Conversion kTable = records::valueTable(kTexts, "MM_WAIT_FOR_ADDITIONAL_OUTGOING_MM_ CONNECTION");
  static_assert(std::string_view("Barred (PKT access not allowed in the Cell)").size() > Text::kCapacity);
  EXPECT_EQ(conversionText(kTable, 0).view(), "Barred (PKT access not allowed in the Cell)");
  EXPECT_EQ(conversionText(kTable, 1).view(), "MM_WAIT_FOR_ADDITIONAL_OUTGOING_MM_ CONNECTION");
}

// "%f" rounds to six decimals as printf does: 1/256 and 255/256 are cut.
TEST(DisplayText, FloatTextWritesWhatPrintfWritesWithSixDecimals) {
  for (std::uint32_t raw : {0u, 1u, 77u, 128u, 255u}) {
    char printed[32];
    std::snprintf(printed, sizeof printed, "%f", raw * 0.00390625);
    EXPECT_EQ(conversionText(records::floating(0.00390625, 0), raw).view(), std::string_view(printed)) << raw;
  }
  EXPECT_EQ(floatText(-2.5).view(), "-2.500000");
}

}  // namespace
}  // namespace corvane
