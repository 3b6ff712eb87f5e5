#include "presenter/PaneRows.h"

#include <gtest/gtest.h>

#include "TreeFixture.h"

namespace corvane {
namespace {

using test::D;
using test::S;

TEST(PaneRows, ScreenWithoutNodeIsTitledCorvaneAndHasNoRows) {
  EXPECT_EQ(paneTitle(nullptr), "Corvane");
  EXPECT_TRUE(paneRows(nullptr).empty());
  EXPECT_EQ(paneChildAt(nullptr, 0), nullptr);
}

TEST(PaneRows, SectionsOpenAndLeavesShowTheirValuesInTreeOrder) {
  const test::Tree tree(test::radioDisplay());
  const std::vector<PaneRow> rows = paneRows(tree.root.get());
  const std::vector<PaneRow> expected{
      {"Serving Cell", "", true}, {"Neighbours", "", true}, {"Technology", "LTE", false}};
  EXPECT_EQ(rows, expected);
  EXPECT_EQ(paneTitle(tree.root.get()), "Corvane");
  EXPECT_EQ(paneTitle(tree.at("/Serving Cell").get()), "Serving Cell");
}

TEST(PaneRows, EmptySectionStillOpensAndHasNoRows) {
  const test::Tree tree(D({{"Neighbor Cells", Value(Array())}}));
  const std::vector<PaneRow> rows = paneRows(tree.root.get());
  ASSERT_EQ(rows.size(), 1u);
  EXPECT_TRUE(rows[0].opens);
  EXPECT_TRUE(paneRows(tree.at("/Neighbor Cells").get()).empty());
}

TEST(PaneRows, LeafHasNoRowsAndChildPastTheEndIsNone) {
  const test::Tree tree(test::radioDisplay());
  EXPECT_TRUE(paneRows(tree.at("/Technology").get()).empty());
  EXPECT_NE(paneChildAt(tree.root.get(), 2), nullptr);
  EXPECT_EQ(paneChildAt(tree.root.get(), 3), nullptr);
}

TEST(PaneRows, ValuesKeepTheirTextExactlyBlanksIncluded) {
  const test::Tree tree(D({{"RSRP ", S("  -95.25 dBm ")}}));
  const std::vector<PaneRow> rows = paneRows(tree.root.get());
  ASSERT_EQ(rows.size(), 1u);
  EXPECT_EQ(rows[0].key, "RSRP ");
  EXPECT_EQ(rows[0].value, "  -95.25 dBm ");
}

TEST(PaneRows, FilterMatchesKeyOrValueIgnoringCase) {
  const std::vector<PaneRow> rows{{"MCC", "262", false}, {"Cell Id", "0x1A2B", false}, {"Band", "3", false}};
  EXPECT_EQ(rowsMatching(rows, ""), (std::vector<std::size_t>{0, 1, 2}));
  EXPECT_EQ(rowsMatching(rows, "cell"), (std::vector<std::size_t>{1}));
  EXPECT_EQ(rowsMatching(rows, "1a2b"), (std::vector<std::size_t>{1}));
  EXPECT_EQ(rowsMatching(rows, "2"), (std::vector<std::size_t>{0, 1}));
  EXPECT_TRUE(rowsMatching(rows, "nothing").empty());
}

}  // namespace
}  // namespace corvane
