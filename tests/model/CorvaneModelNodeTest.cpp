#include "model/CorvaneModelNode.h"

#include <gtest/gtest.h>

#include <chrono>
#include <future>
#include <thread>

#include "LogGenerator/logcode/ArrayLock.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::S;

std::vector<std::string> childNames(const CorvaneModelNode& node) {
  std::vector<std::string> names;
  if (const NodeArray* children = node.childNodes()) {
    for (const auto& c : *children) names.push_back(c->displayName());
  }
  return names;
}

const CorvaneModelNode& child(const CorvaneModelNode& node, std::size_t i) { return *node.childNodes()->at(i); }

TEST(DisplayTree, ASingleStringIsARootLeafNamedCorvane) {
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(S("No service"), paths);
  EXPECT_EQ(root->displayName(), "Corvane");
  ASSERT_NE(root->value(), nullptr);
  EXPECT_EQ(*root->value(), "No service");
  EXPECT_EQ(root->childNodes(), nullptr) << "a leaf has no rows to show";
  ASSERT_EQ(paths.size(), 1u);
  EXPECT_EQ(paths.at("/"), root);
}

Value sortedSample(bool sorted) {
  Dictionary d;
  if (sorted) d.set("_sorted", S("yes"));
  d.set("02;Beta", S("b"));
  d.set("01;Alpha", S("a"));
  d.set("Gamma", S("g"));
  return Value(d);
}

TEST(DisplayTree, SortedDictionaryOrdersByFullKeyAndShowsTheSecondPart) {
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(sortedSample(true), paths);
  EXPECT_EQ(childNames(*root), (std::vector<std::string>{"Alpha", "Beta", "Gamma"}));
  EXPECT_EQ(paths.at("/Alpha")->displayName(), "Alpha");
  EXPECT_EQ(*paths.at("/Beta")->value(), "b");
  EXPECT_EQ(*paths.at("/Gamma")->value(), "g");
  EXPECT_EQ(paths.count("/_sorted"), 0u);
  EXPECT_EQ(paths.size(), 4u);
}

TEST(DisplayTree, WithoutSortedTheDictionaryOrderAndWholeKeysAreKept) {
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(sortedSample(false), paths);
  EXPECT_EQ(childNames(*root), (std::vector<std::string>{"02;Beta", "01;Alpha", "Gamma"}));
  EXPECT_EQ(paths.count("/02;Beta"), 1u);
}

TEST(DisplayTree, AnyValueUnderSortedSetsTheFlag) {
  for (const Value& flag : {Value::boolean(false), Value::integer(0), S(""), A({})}) {
    Dictionary d;
    d.set("b;Second", S("2"));
    d.set("_sorted", flag);
    d.set("a;First", S("1"));
    PathDictionary paths;
    NodeRef root = CorvaneModelNode::makeTreeFromObject(Value(d), paths);
    EXPECT_EQ(childNames(*root), (std::vector<std::string>{"First", "Second"})) << flag.typeName();
  }
}

TEST(DisplayTree, AKeyWithTwoSemicolonsKeepsItsWholeText) {
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(D({{"_sorted", S("1")}, {"x;y;z", S("v")}}), paths);
  EXPECT_EQ(childNames(*root), std::vector<std::string>{"x;y;z"});
  EXPECT_EQ(paths.count("/x;y;z"), 1u);
}

TEST(DisplayTree, SortingComparesTextNotNumbers) {
  PathDictionary paths;
  NodeRef root =
      CorvaneModelNode::makeTreeFromObject(D({{"_sorted", S("1")}, {"2;Two", S("2")}, {"10;Ten", S("10")}}), paths);
  EXPECT_EQ(childNames(*root), (std::vector<std::string>{"Ten", "Two"}));

  // Rows numbered "%d;%d" come in character order: "10;0" before "1;0" (as '0' < ';'), then "2;0".
  NodeRef numbered = CorvaneModelNode::makeTreeFromObject(
      D({{"_sorted", S("1")}, {"2;0", S("c")}, {"1;0", S("a")}, {"10;0", S("b")}}), paths);
  std::vector<std::string> values;
  for (const auto& c : *numbered->childNodes()) values.push_back(*c->value());
  EXPECT_EQ(values, (std::vector<std::string>{"b", "a", "c"}));
}

TEST(DisplayTree, SortingIsCaseSensitive) {
  PathDictionary paths;
  NodeRef root =
      CorvaneModelNode::makeTreeFromObject(D({{"_sorted", S("1")}, {"b", S("")}, {"a", S("")}, {"B", S("")}}), paths);
  EXPECT_EQ(childNames(*root), (std::vector<std::string>{"B", "a", "b"}));
}

TEST(DisplayTree, ANumberShowsAsUnknown) {
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(
      D({{"RSSI", Value::integer(-70)}, {"On", Value::boolean(true)}, {"Raw", Value(Bytes{1})}}), paths);
  for (const auto& c : *root->childNodes()) {
    ASSERT_NE(c->value(), nullptr);
    EXPECT_EQ(*c->value(), "(unknown)") << c->displayName();
  }
  EXPECT_EQ(*CorvaneModelNode::makeTreeFromObject(Value(), paths)->value(), "(unknown)");
}

TEST(DisplayTree, AnArrayOfThreeStringsGivesLeavesNamedZeroOneTwo) {
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(D({{"Serving Cell", A({S("x"), S("y"), S("z")})}}), paths);
  const CorvaneModelNode& list = child(*root, 0);
  EXPECT_EQ(childNames(list), (std::vector<std::string>{"0", "1", "2"}));
  for (const auto& c : *list.childNodes()) EXPECT_EQ(c->childNodes(), nullptr);
  EXPECT_EQ(*paths.at("/Serving Cell/0")->value(), "x");
  EXPECT_EQ(*paths.at("/Serving Cell/2")->value(), "z");
}

TEST(DisplayTree, EmptyContainersAreInnerNodesWithNoChildren) {
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(D({{"Empty dict", D({})}, {"Empty array", A({})}}), paths);
  for (const auto& c : *root->childNodes()) {
    ASSERT_NE(c->childNodes(), nullptr) << c->displayName();
    EXPECT_TRUE(c->childNodes()->empty());
    EXPECT_EQ(c->value(), nullptr);
  }
}

TEST(DisplayTree, TwoSortedKeysWithOneNameKeepOnlyTheLaterInThePathDictionary) {
  PathDictionary paths;
  NodeRef root =
      CorvaneModelNode::makeTreeFromObject(D({{"_sorted", S("1")}, {"2;Cell", S("second")}, {"1;Cell", S("first")}}), paths);
  EXPECT_EQ(childNames(*root), (std::vector<std::string>{"Cell", "Cell"}));
  EXPECT_EQ(*paths.at("/Cell")->value(), "second");
  EXPECT_EQ(paths.at("/Cell"), root->childNodes()->at(1));
}

TEST(DisplayTree, NullValuesAreSkippedAndDoNotUseUpAnArrayNumber) {
  PathDictionary paths;
  Dictionary d;
  d.set("gone", Value());
  d.set("kept", S("k"));
  EXPECT_EQ(childNames(*CorvaneModelNode::makeTreeFromObject(Value(d), paths)), std::vector<std::string>{"kept"});
}

TEST(DisplayTree, PathsJoinNamesOfNestedNodes) {
  PathDictionary paths;
  CorvaneModelNode::makeTreeFromObject(
      D({{"Serving Cell", A({D({{"ARFCN", S("62")}}), A({S("deep")})})}}), paths);
  EXPECT_EQ(*paths.at("/Serving Cell/0/ARFCN")->value(), "62");
  EXPECT_EQ(*paths.at("/Serving Cell/1/0")->value(), "deep");
  EXPECT_EQ(paths.size(), 6u);
  ArrayLock::mutex().unlock();  // the nested array left the lock held once more; give it back
}

// Holds the array lock on another thread until release() or destruction.
class ArrayLockHeldElsewhere {
 public:
  ArrayLockHeldElsewhere()
      : holder_([this] {
          ArrayLock::lockArray();
          locked_.set_value();
          released_.get_future().wait();
          ArrayLock::unlockArray();
        }) {
    locked_.get_future().wait();
  }
  ~ArrayLockHeldElsewhere() { release(); }
  void release() {
    if (!holder_.joinable()) return;
    released_.set_value();
    holder_.join();
  }

 private:
  std::promise<void> locked_, released_;
  std::thread holder_;
};

TEST(DisplayTree, ArraysAreWalkedUnderTheArrayLock) {
  // While another thread holds the lock, building a tree with an array waits.
  ArrayLockHeldElsewhere held;
  auto build = std::async(std::launch::async, [] {
    PathDictionary paths;
    return CorvaneModelNode::makeTreeFromObject(A({S("x")}), paths);
  });
  EXPECT_EQ(build.wait_for(std::chrono::milliseconds(100)), std::future_status::timeout);
  held.release();
  EXPECT_EQ(childNames(*build.get()), std::vector<std::string>{"0"});
  EXPECT_EQ(ArrayLock::depth(), 0);
}

TEST(DisplayTree, DictionariesAloneDoNotTakeTheArrayLock) {
  ArrayLockHeldElsewhere held;
  PathDictionary paths;
  NodeRef root = CorvaneModelNode::makeTreeFromObject(D({{"a", D({{"b", S("c")}})}}), paths);
  EXPECT_EQ(paths.size(), 3u);
}

TEST(PathJoining, JoinsWithOneSeparatorAndNoTrailingOne) {
  EXPECT_EQ(appendPathComponent("/", "Serving Cell"), "/Serving Cell");
  EXPECT_EQ(appendPathComponent("/Serving Cell", "0"), "/Serving Cell/0");
  EXPECT_EQ(appendPathComponent("/a/", "b"), "/a/b");
  EXPECT_EQ(appendPathComponent("/a", "b/"), "/a/b");
  EXPECT_EQ(appendPathComponent("/a", ""), "/a");
  EXPECT_EQ(appendPathComponent("/", ""), "/");
}

}  // namespace
}  // namespace corvane
