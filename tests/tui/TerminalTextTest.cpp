#include "tui/TerminalText.h"

#include <gtest/gtest.h>

#include <clocale>

namespace corvane::tui {
namespace {

class TerminalText : public ::testing::Test {
 protected:
  void SetUp() override { ASSERT_NE(std::setlocale(LC_ALL, "C.UTF-8"), nullptr); }
  void TearDown() override { std::setlocale(LC_ALL, "C"); }
};

TEST_F(TerminalText, Utf8BecomesOneWideCharacterPerCharacter) {
  EXPECT_EQ(widen("RSRP -95 dBm"), L"RSRP -95 dBm");
  EXPECT_EQ(widen("Ω › é"), L"Ω › é");
}

TEST_F(TerminalText, InvalidBytesAndControlCharactersBecomeQuestionMarks) {
  EXPECT_EQ(widen("a\xff" "b"), L"a?b");
  EXPECT_EQ(widen("a\xe2\x80"), L"a??");  // cut off inside a character
  EXPECT_EQ(widen("tab\there"), L"tab?here");
}

TEST_F(TerminalText, WideCharactersTakeTwoColumns) {
  EXPECT_EQ(columns(L"abc"), 3);
  EXPECT_EQ(columns(L"日本"), 4);
}

TEST_F(TerminalText, SliceNeverSplitsAWideCharacter) {
  EXPECT_EQ(slice(L"日本語", 0, 3), L"日");
  EXPECT_EQ(slice(L"日本語", 1, 4), L"本");  // the character that starts inside the skip is left out
  EXPECT_EQ(slice(L"abcdef", 2, 3), L"cde");
  EXPECT_EQ(slice(L"abc", 5, 3), L"");
}

TEST_F(TerminalText, FitCutsWithTheEllipsisOnlyWhenTooLong) {
  EXPECT_EQ(fit(L"Serving Cell", 12, L"…"), L"Serving Cell");
  EXPECT_EQ(fit(L"Serving Cell", 8, L"…"), L"Serving…");
  EXPECT_EQ(fit(L"Serving Cell", 8, L"~"), L"Serving~");
  EXPECT_EQ(fit(L"Serving Cell", 0, L"…"), L"");
  EXPECT_EQ(fit(L"Serving Cell", 1, L"…"), L"S");  // only room for the ellipsis: a plain cut
  EXPECT_EQ(fit(L"Serving Cell", 3, L"...."), L"Ser");  // no room for the ellipsis
}

}  // namespace
}  // namespace corvane::tui
