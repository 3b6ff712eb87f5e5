#include "presenter/ScreenStack.h"

#include <gtest/gtest.h>

#include "TreeFixture.h"

namespace corvane {
namespace {

using test::D;
using test::S;

struct StackFixture {
  test::Tree tree{test::radioDisplay()};
  ScreenStack stack;
  std::vector<std::string> shown;  // the paths told to "will show", in order

  StackFixture() {
    stack.setWillShow([this](const ScreenStack::Screen& screen) { shown.push_back(screen.path); });
    reload();
  }
  void reload() {
    stack.reload(tree.root, [this](const std::string& path) { return tree.at(path); });
  }
  // Shows a tree three sections deep and opens down to "/A/B/C".
  bool openThreeDeep() {
    tree = test::Tree(D({{"A", D({{"B", D({{"C", D({{"x", S("1")}})}})}})}}));
    reload();
    return stack.openSelected() && stack.openSelected() && stack.openSelected();
  }
};

TEST(ScreenStack, StartsWithTheRootWithoutNodeTitledCorvane) {
  ScreenStack stack;
  ASSERT_EQ(stack.depth(), 1u);
  EXPECT_EQ(stack.top().path, "/");
  EXPECT_EQ(stack.top().node, nullptr);
  EXPECT_EQ(stack.title(), "Corvane");
  EXPECT_EQ(stack.backTitle(), "");
  EXPECT_FALSE(stack.openSelected());
  EXPECT_FALSE(stack.pop());
}

TEST(ScreenStack, OpeningSectionPushesItsScreenAndTellsWillShow) {
  StackFixture f;
  EXPECT_TRUE(f.shown.empty());
  ASSERT_TRUE(f.stack.openSelected());
  EXPECT_EQ(f.stack.depth(), 2u);
  EXPECT_EQ(f.stack.top().path, "/Serving Cell");
  EXPECT_EQ(f.stack.title(), "Serving Cell");
  EXPECT_EQ(f.stack.backTitle(), "Corvane");
  EXPECT_EQ(f.shown, std::vector<std::string>{"/Serving Cell"});
}

TEST(ScreenStack, LeafDoesNotOpen) {
  StackFixture f;
  f.stack.select(2);
  EXPECT_FALSE(f.stack.openSelected());
  EXPECT_EQ(f.stack.depth(), 1u);
  EXPECT_TRUE(f.shown.empty());
}

TEST(ScreenStack, BackReturnsToTheSameSelectionAndTellsWillShow) {
  StackFixture f;
  f.stack.select(1);
  ASSERT_TRUE(f.stack.openSelected());
  EXPECT_EQ(f.stack.top().path, "/Neighbours");
  ASSERT_TRUE(f.stack.pop());
  EXPECT_EQ(f.stack.top().selectedRow, 1u);
  EXPECT_EQ(f.shown, (std::vector<std::string>{"/Neighbours", "/"}));
  EXPECT_FALSE(f.stack.pop());  // the root stays
  EXPECT_EQ(f.shown.size(), 2u);
}

TEST(ScreenStack, OpeningByPathSelectsThatRowAndPushesItsScreen) {
  StackFixture f;
  ASSERT_TRUE(f.stack.openPath("/Neighbours"));
  EXPECT_EQ(f.stack.depth(), 2u);
  EXPECT_EQ(f.stack.top().path, "/Neighbours");
  EXPECT_EQ(f.stack.screens()[0].selectedRow, 1u);
  EXPECT_EQ(f.shown, std::vector<std::string>{"/Neighbours"});
  // Only a section of the top screen opens.
  EXPECT_FALSE(f.stack.openPath("/Serving Cell"));
  EXPECT_FALSE(f.stack.openPath("/Neighbours/Nowhere"));
  EXPECT_EQ(f.stack.depth(), 2u);
}

TEST(ScreenStack, OpeningByPathRefusesLeavesAndUnknownRows) {
  StackFixture f;
  EXPECT_FALSE(f.stack.openPath("/Technology"));  // a value, not a section
  EXPECT_FALSE(f.stack.openPath("/Elsewhere"));
  EXPECT_EQ(f.stack.depth(), 1u);
  EXPECT_TRUE(f.shown.empty());
  ScreenStack empty;  // no node yet: nothing to open
  EXPECT_FALSE(empty.openPath("/Serving Cell"));
}

TEST(ScreenStack, PoppingToADepthTellsWillShowOnceForTheScreenUncovered) {
  StackFixture f;
  ASSERT_TRUE(f.openThreeDeep());
  f.shown.clear();
  EXPECT_FALSE(f.stack.popToDepth(4));  // already there
  ASSERT_TRUE(f.stack.popToDepth(2));
  EXPECT_EQ(f.stack.top().path, "/A");
  EXPECT_EQ(f.shown, std::vector<std::string>{"/A"});
  ASSERT_TRUE(f.stack.popToDepth(0));  // the root always stays
  EXPECT_EQ(f.stack.depth(), 1u);
  EXPECT_FALSE(f.stack.popToDepth(0));
  EXPECT_EQ(f.shown, (std::vector<std::string>{"/A", "/"}));
}

TEST(ScreenStack, SelectionIsClampedToTheRows) {
  StackFixture f;
  f.stack.select(99);
  EXPECT_EQ(f.stack.top().selectedRow, 2u);
  EXPECT_EQ(f.stack.top().selectedKey, "Technology");
}

TEST(ScreenStack, RefreshKeepsTheSelectedRowByItsKeyWhenRowsMove) {
  StackFixture f;
  f.stack.select(1);  // "Neighbours"
  f.tree = test::Tree(D({{"Alerts", D({})}, {"Serving Cell", D({})}, {"Neighbours", D({})}}));
  f.reload();
  EXPECT_EQ(f.stack.top().selectedRow, 2u);
  EXPECT_EQ(f.stack.top().selectedKey, "Neighbours");
}

TEST(ScreenStack, RefreshKeepsTheRowNumberWhenTheKeyHasGone) {
  StackFixture f;
  f.stack.select(2);
  f.tree = test::Tree(D({{"Serving Cell", D({})}, {"Neighbours", D({})}, {"Other", S("x")}}));
  f.reload();
  EXPECT_EQ(f.stack.top().selectedRow, 2u);
  EXPECT_EQ(f.stack.top().selectedKey, "Other");
}

TEST(ScreenStack, RefreshRepointsEveryScreenAtTheFreshTree) {
  StackFixture f;
  ASSERT_TRUE(f.stack.openSelected());
  const NodeRef before = f.stack.top().node;
  f.tree = test::Tree(test::radioDisplay());
  f.reload();
  ASSERT_EQ(f.stack.depth(), 2u);
  EXPECT_NE(f.stack.top().node, before);
  EXPECT_EQ(f.stack.top().node, f.tree.at("/Serving Cell"));
  EXPECT_EQ(f.stack.screens()[0].node, f.tree.root);
  EXPECT_EQ(f.shown.size(), 1u);  // no screen changed
}

TEST(ScreenStack, SectionGoneFromTheDisplayPopsToTheScreenBelow) {
  StackFixture f;
  ASSERT_TRUE(f.openThreeDeep());
  EXPECT_EQ(f.stack.top().path, "/A/B/C");
  f.shown.clear();
  f.tree = test::Tree(D({{"A", D({{"Other", S("2")}})}}));
  f.reload();
  EXPECT_EQ(f.stack.depth(), 2u);
  EXPECT_EQ(f.stack.top().path, "/A");
  EXPECT_EQ(f.shown, std::vector<std::string>{"/A"});
}

TEST(RefreshedScreenNodes, RootAlwaysStaysAndTheListStopsAtTheFirstMissingPath) {
  const test::Tree tree(test::radioDisplay());
  const auto find = [&](const std::string& path) { return tree.at(path); };
  EXPECT_TRUE(refreshedScreenNodes({}, tree.root, find).empty());
  EXPECT_EQ(refreshedScreenNodes({"/"}, nullptr, find), std::vector<NodeRef>{nullptr});
  const std::vector<NodeRef> nodes = refreshedScreenNodes({"/", "/Serving Cell", "/Gone", "/Neighbours"}, tree.root, find);
  EXPECT_EQ(nodes, (std::vector<NodeRef>{tree.root, tree.at("/Serving Cell")}));
}

}  // namespace
}  // namespace corvane
