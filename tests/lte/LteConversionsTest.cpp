// The LTE conversions write their texts without printf; they must read exactly
// as the printf formats they stand for, over every value a field can hold.

#include "LogGenerator/lte/LteConversions.h"

#include <gtest/gtest.h>

#include <cstdio>

namespace corvane {
namespace {

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

TEST(LteConversions, DecibelTextsMatchTheirPrintfFormatsForEveryFieldValue) {
  for (std::uint32_t x = 0; x < 1024; ++x) {
    EXPECT_EQ(lte::rsrpText(x), printedDbm(x * 0.25 - 140)) << x;
    EXPECT_EQ(lte::rssiText(x), printedDbm(x * 0.5 - 140)) << x;
    EXPECT_EQ(lte::servingRsrqText(x), printedDb(x * 0.25 - 30)) << x;
    EXPECT_EQ(lte::rsrqText(x), printedDb(x * 0.125 - 20)) << x;
  }
  // Sixteen-bit fields reach far past the scales' ends.
  for (std::uint32_t x : {4096u, 65535u}) {
    EXPECT_EQ(lte::rsrpText(x), printedDbm(x * 0.25 - 140)) << x;
    EXPECT_EQ(lte::rsrqText(x), printedDb(x * 0.125 - 20)) << x;
  }
}

TEST(LteConversions, HalvesOfACentRoundAsPrintfDoes) {
  EXPECT_EQ(lte::rsrqText(1), "-19.88 dB");
  EXPECT_EQ(lte::rsrqText(3), "-19.62 dB");
  EXPECT_EQ(lte::rsrqText(161), "0.12 dB");
  EXPECT_EQ(lte::dbText(0.0), "0.00 dB");
  EXPECT_EQ(lte::dbText(-0.0), "-0.00 dB");
}

TEST(LteConversions, AnyDoubleReadsAsPrintfWouldWriteIt) {
  for (double v : {1e-300, 0.004, 0.005, 5.0, -1e300, 1.7976931348623157e308}) {
    EXPECT_EQ(lte::dbmText(v), printedDbm(v)) << v;
  }
}

TEST(LteConversions, WholeDecibelsAreSigned16BitResults) {
  EXPECT_EQ(lte::offset30DbmText(0), "-30 dBm");
  EXPECT_EQ(lte::offset30DbmText(127), "97 dBm");
  EXPECT_EQ(lte::qrxlevminText(0), "-140 dBm");
  EXPECT_EQ(lte::qrxlevminText(63), "-14 dBm");
  // Wider fields than any row holds wrap as signed 16-bit numbers would.
  EXPECT_EQ(lte::offset30Dbm(0x10000 + 40), 10);
  EXPECT_EQ(lte::qrxlevminDbm(0x8000), -140);
  for (int x = 0; x < 128; ++x) {
    EXPECT_EQ(lte::offset30DbmText(static_cast<std::uint32_t>(x)), printedWholeDbm(x - 30));
    EXPECT_EQ(lte::qrxlevminText(static_cast<std::uint32_t>(x)), printedWholeDbm(2 * x - 140));
  }
}

TEST(LteConversions, DecimalsAreSigned32Bit) {
  EXPECT_EQ(lte::decimalText(std::uint32_t{0}), "0");
  EXPECT_EQ(lte::decimalText(std::uint32_t{65535}), "65535");
  EXPECT_EQ(lte::decimalText(std::uint32_t{0xFFFFFFFF}), "-1");
  EXPECT_EQ(lte::decimalText(std::int32_t{-2147483647 - 1}), "-2147483648");
  EXPECT_EQ(lte::wholeDbText(10), "10 dB");
  EXPECT_EQ(lte::wholeDbmText(10), "10 dBm");
}

TEST(LteConversions, AValueTableFallsBackForValuesItDoesNotHold) {
  constexpr std::array<lte::ValueText, 2> table = {{{1, "one"}, {2, "two"}}};
  EXPECT_EQ(lte::textFor(table, 2, "Unknown"), "two");
  EXPECT_EQ(lte::textFor(table, 3, "Unknown"), "Unknown");
}

}  // namespace
}  // namespace corvane
