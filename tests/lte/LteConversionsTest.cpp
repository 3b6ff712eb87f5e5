// The LTE conversions write their texts without printf; they must read exactly
// as the printf formats they stand for, over every value a field can hold.

#include "LogGenerator/logcode/DisplayText.h"
#include "LogGenerator/lte/records/LteScales.h"
#include "LogGenerator/lte/records/ServingCellMeasurementRecord.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <string>

namespace corvane {
namespace {

// The texts of the LTE scales, by the name of what they show.
Text rsrpText(std::uint32_t x) { return conversionText(lte::kRsrpDbm, x); }
Text rssiText(std::uint32_t x) { return conversionText(lte::kRssiDbm, x); }
Text neighborRsrpText(std::uint32_t x) { return conversionText(lte::kNeighborRsrpDbm, x); }
Text servingRsrqText(std::uint32_t x) { return conversionText(lte::kServingRsrqDb, x); }
Text rsrqText(std::uint32_t x) { return conversionText(lte::kRsrqDb, x); }
Text offset30DbmText(std::uint32_t x) { return conversionText(lte::kOffset30Dbm, x); }
Text qrxlevminText(std::uint32_t x) { return conversionText(lte::kQrxlevminDbm, x); }

// What printf writes for each format the conversions stand for.
std::string printedDbm(double value) {
  char buffer[400];
  std::snprintf(buffer, sizeof buffer, "%4.2f dBm", value);
  return buffer;
}
std::string printedDb(double value) {
  char buffer[400];
  std::snprintf(buffer, sizeof buffer, "%4.2f dB", value);
  return buffer;
}
std::string printedWholeDbm(int value) {
  char buffer[32];
  std::snprintf(buffer, sizeof buffer, "%d dBm", value);
  return buffer;
}

// Sixteen-bit fields and beyond: the scales' ends, zero crossed from both
// sides, and the largest field any row reads.
TEST(LteConversions, DecibelTextsMatchTheirPrintfFormatsForEverySixteenBitField) {
  for (std::uint32_t x = 0; x <= 0xFFFF; ++x) {
    ASSERT_EQ(rsrpText(x).view(), printedDbm(x * 0.25 - 140)) << x;
    ASSERT_EQ(rssiText(x).view(), printedDbm(x * 0.5 - 140)) << x;
    ASSERT_EQ(neighborRsrpText(x).view(), printedDbm(x * 0.5 - 140)) << x;
    ASSERT_EQ(servingRsrqText(x).view(), printedDb(x * 0.25 - 30)) << x;
    ASSERT_EQ(rsrqText(x).view(), printedDb(x * 0.125 - 20)) << x;
  }
  for (std::uint32_t x : {0x10000u, 0x7FFFFFFFu, 0xFFFFFFFFu}) {
    EXPECT_EQ(rsrpText(x).view(), printedDbm(x * 0.25 - 140)) << x;
    EXPECT_EQ(rssiText(x).view(), printedDbm(x * 0.5 - 140)) << x;
    EXPECT_EQ(rsrqText(x).view(), printedDb(x * 0.125 - 20)) << x;
  }
}

TEST(LteConversions, HalvesOfACentRoundAsPrintfDoes) {
  EXPECT_EQ(rsrqText(1).view(), "-19.88 dB");
  EXPECT_EQ(rsrqText(3).view(), "-19.62 dB");
  EXPECT_EQ(rsrqText(159).view(), "-0.12 dB");
  EXPECT_EQ(rsrqText(160).view(), "0.00 dB");
  EXPECT_EQ(rsrqText(161).view(), "0.12 dB");
  EXPECT_EQ(rsrqText(163).view(), "0.38 dB");
}

TEST(LteConversions, NumbersAreTheFormulasInDoublePrecision) {
  EXPECT_EQ(lte::kRsrpDbm.value(100), -115.0);
  EXPECT_EQ(lte::kRssiDbm.value(1), -139.5);
  EXPECT_EQ(lte::kNeighborRsrpDbm.value(1), -139.5);
  EXPECT_EQ(lte::kServingRsrqDb.value(1), -29.75);
  EXPECT_EQ(lte::kRsrqDb.value(1), -19.875);
}

TEST(LteConversions, WholeDecibelsAreSigned16BitResults) {
  EXPECT_EQ(offset30DbmText(0).view(), "-30 dBm");
  EXPECT_EQ(offset30DbmText(127).view(), "97 dBm");
  EXPECT_EQ(qrxlevminText(0).view(), "-140 dBm");
  EXPECT_EQ(qrxlevminText(63).view(), "-14 dBm");
  // Wider fields than any row holds wrap as signed 16-bit numbers would.
  EXPECT_EQ(lte::kOffset30Dbm.wholeValue(0x10000 + 40), 10);
  EXPECT_EQ(lte::kQrxlevminDbm.wholeValue(0x8000), -140);
  for (int x = 0; x < 128; ++x) {
    EXPECT_EQ(offset30DbmText(static_cast<std::uint32_t>(x)).view(), printedWholeDbm(x - 30));
    EXPECT_EQ(qrxlevminText(static_cast<std::uint32_t>(x)).view(), printedWholeDbm(2 * x - 140));
  }
}

TEST(LteConversions, DecimalsAreSigned32Bit) {
  EXPECT_EQ(decimalText(std::uint32_t{0}).view(), "0");
  EXPECT_EQ(decimalText(std::uint32_t{65535}).view(), "65535");
  EXPECT_EQ(decimalText(std::uint32_t{0xFFFFFFFF}).view(), "-1");
  EXPECT_EQ(decimalText(std::int32_t{-2147483647 - 1}).view(), "-2147483648");
  EXPECT_EQ(wholeText(10, " dB").view(), "10 dB");
  EXPECT_EQ(wholeText(-2147483647 - 1, " dBm").view(), "-2147483648 dBm");
}

TEST(LteConversions, AConstantTextIsKeptWhole) {
  EXPECT_EQ(Text(kNotPresentText).view(), "Not Present");
  EXPECT_EQ(Text().view(), "");
}

TEST(LteConversions, AValueTableFallsBackForValuesItDoesNotHold) {
  constexpr std::array<records::ValueText, 2> table = {{{1, "one"}, {2, "two"}}};
  EXPECT_EQ(textFor(table, 2, "Unknown"), "two");
  EXPECT_EQ(textFor(table, 3, "Unknown"), "Unknown");
  EXPECT_EQ(conversionText(records::valueTable(table, "Unknown"), 1).view(), "one");
}

}  // namespace
}  // namespace corvane
