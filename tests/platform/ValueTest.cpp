#include "platform/Value.h"

#include <gtest/gtest.h>

#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::S;

TEST(Dictionary, TwoHoldersOfOneDictionarySeeTheSameChanges) {
  Dictionary first;
  Dictionary second = first;
  second.set("Cell", S("Serving"));
  EXPECT_EQ(first.size(), 1u);
  EXPECT_EQ(*first.find("Cell")->asString(), "Serving");
  EXPECT_TRUE(first.isSameObject(second));
}

TEST(Dictionary, KeepsInsertionOrder) {
  Dictionary d;
  for (const char* key : {"zeta", "alpha", "mu", "beta"}) d.set(key, S(key));
  std::vector<std::string> keys;
  for (const auto& [k, v] : d.entries()) keys.push_back(k);
  EXPECT_EQ(keys, (std::vector<std::string>{"zeta", "alpha", "mu", "beta"}));
}

TEST(Dictionary, SettingAnExistingKeyReplacesTheValueInPlace) {
  Dictionary d;
  d.set("a", S("1"));
  d.set("b", S("2"));
  d.set("a", S("3"));
  ASSERT_EQ(d.size(), 2u);
  EXPECT_EQ(d.entries()[0].first, "a");
  EXPECT_EQ(*d.entries()[0].second.asString(), "3");
}

TEST(Dictionary, RemoveKeepsTheOrderAndTheLookupOfTheOthers) {
  Dictionary d;
  for (const char* key : {"a", "b", "c", "d"}) d.set(key, S(key));
  EXPECT_TRUE(d.remove("b"));
  EXPECT_FALSE(d.remove("b"));
  EXPECT_EQ(d.entries()[1].first, "c");
  EXPECT_EQ(*d.find("d")->asString(), "d");
  EXPECT_EQ(*d.find("c")->asString(), "c");
  EXPECT_TRUE(d.get("b").isNull());
}

TEST(Dictionary, LargeDictionariesFindEveryKeyAfterSetsRemovesAndCopies) {
  Dictionary d;
  for (int i = 0; i < 40; ++i) d.set("key " + std::to_string(i), Value::integer(i));
  d.set("key 7", Value::integer(700));
  for (int i = 0; i < 40; i += 3) EXPECT_TRUE(d.remove("key " + std::to_string(i)));
  const Dictionary copy = d.shallowCopy();
  for (const Dictionary& each : {d, copy}) {
    for (int i = 0; i < 40; ++i) {
      const Value* v = each.find("key " + std::to_string(i));
      if (i % 3 == 0) {
        EXPECT_EQ(v, nullptr) << i;
      } else {
        ASSERT_NE(v, nullptr) << i;
        EXPECT_EQ(*v->asInteger(), i == 7 ? 700 : i);
      }
    }
  }
  EXPECT_EQ(d.entries().front().first, "key 1");
  while (d.size() > 2) d.remove(d.entries().back().first);
  EXPECT_EQ(*d.find("key 2")->asInteger(), 2);
  EXPECT_EQ(copy.size(), 26u);
}

TEST(Dictionary, ShallowCopyIsANewDictionarySharingNestedContainers) {
  Dictionary inner;
  Dictionary outer = test::Dict({{"inner", Value(inner)}});
  Dictionary copy = outer.shallowCopy();
  EXPECT_FALSE(copy.isSameObject(outer));
  copy.set("extra", S("x"));
  EXPECT_FALSE(outer.contains("extra"));
  inner.set("seen", S("yes"));
  EXPECT_TRUE(copy.find("inner")->asDictionary()->contains("seen"));
}

TEST(Dictionary, DeepCopySharesNothing) {
  Dictionary inner;
  Dictionary outer = test::Dict({{"inner", Value(inner)}});
  Dictionary copy = outer.deepCopy();
  inner.set("seen", S("yes"));
  EXPECT_FALSE(copy.find("inner")->asDictionary()->contains("seen"));
  EXPECT_EQ(copy.get("inner"), Value(Dictionary()));
}

TEST(Array, TwoHoldersSeeTheSameChangesAndRemoveFirstStopsAtTheEnd) {
  Array a;
  Array b = a;
  b.append(S("x"));
  b.append(S("y"));
  EXPECT_EQ(a.size(), 2u);
  a.removeFirst(1);
  EXPECT_EQ(*b.at(0).asString(), "y");
  a.removeFirst(10);
  EXPECT_TRUE(b.empty());
  EXPECT_THROW((void)a.at(0), std::out_of_range);
}

TEST(Value, ASetWithAPositionHintEndsAsAPlainSetWould) {
  Dictionary hinted;
  Dictionary plain;
  for (const char* key : {"a", "b", "c", "d", "e", "f", "g", "h", "i", "j", "k", "l", "m", "n"}) {
    hinted.set(key, S("-"));
    plain.set(key, S("-"));
  }
  // In order, out of order, a new key, after a removal, with the index built.
  const std::vector<std::string> writes = {"a", "b", "c", "n", "d", "new", "a", "e", "m", "f"};
  std::size_t next = 0;
  for (std::size_t i = 0; i < writes.size(); ++i) {
    if (writes[i] == "d") {
      hinted.remove("c");
      plain.remove("c");
    }
    hinted.set(writes[i], S(std::to_string(i)), next);
    plain.set(writes[i], S(std::to_string(i)));
    EXPECT_EQ(hinted.entries()[next - 1].first, writes[i]);
  }
  EXPECT_EQ(Value(hinted), Value(plain));
  EXPECT_EQ(*hinted.find("new")->asString(), "5");
  EXPECT_EQ(*hinted.find("a")->asString(), "6");
}

TEST(Value, SetStringWritesIntoTheStringThereOrReplacesAnythingElse) {
  Dictionary d;
  d.set("text", S("old"));
  d.set("number", Value::integer(4));
  const Dictionary shared = d;
  std::size_t next = 0;
  d.setString("text", "a longer text than fits in place", next);
  EXPECT_EQ(next, 1u);
  d.setString("number", "4 dBm", next);
  d.setString("new", "x", next);
  EXPECT_EQ(next, 3u);
  EXPECT_EQ(Value(shared),
            D({{"text", S("a longer text than fits in place")}, {"number", S("4 dBm")}, {"new", S("x")}}));
  // Same length, into an empty string, and shorter.
  d.set("empty", S(""));
  next = 0;
  d.setString("text", "A LONGER TEXT THAN FITS IN PLACE", next);
  d.setString("number", "5", next);
  d.setString("new", "y", next);
  d.setString("empty", "now full", next);
  EXPECT_EQ(Value(shared), D({{"text", S("A LONGER TEXT THAN FITS IN PLACE")},
                              {"number", S("5")},
                              {"new", S("y")},
                              {"empty", S("now full")}}));
}

TEST(Value, EqualityIsStructural) {
  EXPECT_EQ(D({{"a", A({S("x"), Value::integer(3)})}}), D({{"a", A({S("x"), Value::integer(3)})}}));
  EXPECT_NE(D({{"a", S("x")}}), D({{"a", S("y")}}));
  EXPECT_NE(Value::integer(1), Value::real(1.0));
  EXPECT_NE(Value::boolean(true), Value::integer(1));
  EXPECT_NE(Value(), S(""));
}

TEST(Value, TypeNamesAreTheClassNamesShownInDiagnostics) {
  EXPECT_STREQ(Value::integer(1).typeName(), "Integer");
  EXPECT_STREQ(Value::real(1).typeName(), "Real");
  EXPECT_STREQ(Value::boolean(true).typeName(), "Boolean");
  EXPECT_STREQ(Value(Date{0}).typeName(), "Date");
  EXPECT_STREQ(Value(Bytes{1}).typeName(), "Data");
  EXPECT_STREQ(S("x").typeName(), "String");
  EXPECT_STREQ(Value().typeName(), "Null");
}

}  // namespace
}  // namespace corvane
