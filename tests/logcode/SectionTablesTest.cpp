// Every technology's section table against what it drives: the display
// template (each section once, in a container of its kind, at most one group
// below the top), the class index (each code subscribed by exactly the rows
// that list it, in table order) and the start command (each code once).

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <iterator>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "LogGenerator/LogCodeTechnologies.h"
#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/logcode/ExtraCodePayloads.h"
#include "LogGenerator/logcode/QNDLogGenerator2.h"
#include "platform/Log.h"
#include "platform/PropertyList.h"
#include "platform/ResourceLocator.h"

namespace corvane {
namespace {

Value loadTemplate(std::string_view name) {
  const auto path = resources::pathForResource(std::string(name), "plist");
  if (!path) return Value();
  std::ifstream in(*path, std::ios::binary);
  const Bytes contents((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  auto parsed = plist::parse(contents);
  return parsed ? *parsed : Value();
}

struct Place {
  Value container;
  int depth;  // 0: a key of the root; 1: a key of a group
};

// Every place a key stands in the template, at any depth.
void findKey(const Value& node, std::string_view key, int depth, std::vector<Place>& found) {
  if (const Dictionary* d = node.asDictionary()) {
    for (const auto& [name, value] : d->entries()) {
      if (name == key) found.push_back({value, depth});
      findKey(value, key, depth + 1, found);
    }
  } else if (const Array* a = node.asArray()) {
    for (const Value& element : a->elements()) findKey(element, key, depth + 1, found);
  }
}

// Keys the display tree would read as something else: ";" splits a sorted
// key, "_sorted" asks for sorting; the template's order is the screen's.
void collectBadKeys(const Value& node, std::vector<std::string>& bad) {
  if (const Dictionary* d = node.asDictionary()) {
    for (const auto& [name, value] : d->entries()) {
      if (name.find(';') != std::string::npos || name == "_sorted") bad.push_back(name);
      collectBadKeys(value, bad);
    }
  } else if (const Array* a = node.asArray()) {
    for (const Value& element : a->elements()) collectBadKeys(element, bad);
  }
}

}  // namespace

// Failure messages name the technology rather than dump the row's bytes.
void PrintTo(const LogCodeTechnology& technology, std::ostream* os) { *os << technology.technology; }

namespace {

class SectionTables : public ::testing::TestWithParam<LogCodeTechnology> {
 protected:
  SectionTables() { ClassIndex::setTeardownStream(nullptr); }
  ~SectionTables() override { ClassIndex::setTeardownStream(stdout); }
  log::ScopedCapture quiet_;
};

TEST_P(SectionTables, EachSectionStandsOnceInTheTemplateInAContainerOfItsKind) {
  const Value root = loadTemplate(GetParam().templateName);
  ASSERT_TRUE(root.isDictionary()) << GetParam().templateName;
  ASSERT_FALSE(GetParam().sections().empty());
  for (const SectionDescriptor& row : GetParam().sections()) {
    std::vector<Place> places;
    findKey(root, row.name, 0, places);
    ASSERT_EQ(places.size(), 1u) << row.name;
    const Place& place = places.front();
    EXPECT_LE(place.depth, 1) << row.name << " lies more than one group below the top";
    switch (row.container) {
      case SectionContainer::Rows:
        EXPECT_TRUE(place.container.isDictionary()) << row.name;
        break;
      case SectionContainer::List:
        ASSERT_TRUE(place.container.isArray()) << row.name;
        EXPECT_TRUE(place.container.asArray()->empty()) << row.name << ": a list starts empty";
        break;
      case SectionContainer::Placeholder:
        EXPECT_TRUE(place.container.isDictionary() || place.container.isArray()) << row.name;
        break;
    }
  }
  std::vector<std::string> bad;
  collectBadKeys(root, bad);
  EXPECT_TRUE(bad.empty()) << bad.front();
}

TEST_P(SectionTables, EachCodeIsSubscribedByExactlyTheRowsThatListItInTableOrder) {
  auto generator = LogGenerator::generatorFromTechnology(GetParam().technology);
  auto* logCode = dynamic_cast<QNDLogGenerator2*>(generator.get());
  ASSERT_NE(logCode, nullptr);
  ASSERT_NE(logCode->classIndex(), nullptr);
  const ClassIndex& index = *logCode->classIndex();

  std::map<std::uint32_t, std::vector<std::string>> expected;
  for (const SectionDescriptor& row : GetParam().sections()) {
    for (std::uint32_t code : row.codes) expected[code].push_back(std::string(row.name));
    EXPECT_NE(index.getClass(row.name), nullptr) << row.name;
  }
  for (const auto& [code, names] : expected) {
    const auto* subscribers = index.getSubscribers(static_cast<std::int32_t>(code));
    ASSERT_NE(subscribers, nullptr) << code;
    std::vector<std::string> subscribed;
    for (const auto& section : *subscribers) subscribed.push_back(section->getSectionName());
    EXPECT_EQ(subscribed, names) << code;
  }
  EXPECT_EQ(index.getAllLogCodes().size(), expected.size());
}

TEST_P(SectionTables, TheStartCommandListsEachCodeOnce) {
  auto generator = LogGenerator::generatorFromTechnology(GetParam().technology);
  auto* logCode = dynamic_cast<QNDLogGenerator2*>(generator.get());
  ASSERT_NE(logCode, nullptr);
  const Dictionary command = logCode->getStartCommand();

  std::set<std::int64_t> logCodes;
  std::set<std::int64_t> extraCodes;
  for (const SectionDescriptor& row : GetParam().sections()) {
    for (std::uint32_t code : row.codes) {
      if (code >= kExtraCodeBase) {
        extraCodes.insert(code - kExtraCodeBase);
      } else {
        logCodes.insert(code);
      }
    }
  }
  auto listed = [&](std::string_view key) {
    std::vector<std::int64_t> values;
    for (const Value& v : command.find(key)->asArray()->elements()) values.push_back(*v.asInteger());
    return values;
  };
  const auto listedCodes = listed(kStartLogCodes);
  const auto listedExtraCodes = listed(kStartExtraCodes);
  EXPECT_EQ(std::set<std::int64_t>(listedCodes.begin(), listedCodes.end()), logCodes);
  EXPECT_EQ(listedCodes.size(), logCodes.size()) << "a code listed twice";
  EXPECT_EQ(std::set<std::int64_t>(listedExtraCodes.begin(), listedExtraCodes.end()), extraCodes);
  EXPECT_EQ(listedExtraCodes.size(), extraCodes.size()) << "an extra code listed twice";
}

TEST_P(SectionTables, NamesAndOwningMembersAreUniqueWithinATechnology) {
  std::set<std::string_view> names;
  std::set<std::string_view> fields;
  for (const SectionDescriptor& row : GetParam().sections()) {
    EXPECT_TRUE(names.insert(row.name).second) << row.name;
    EXPECT_TRUE(fields.insert(row.field).second) << row.field;
  }
}

INSTANTIATE_TEST_SUITE_P(LogCodeTechnologies, SectionTables, ::testing::ValuesIn(logCodeTechnologies().begin(),
                                                                                  logCodeTechnologies().end()),
                         [](const auto& param) { return std::string(param.param.templateName); });

}  // namespace
}  // namespace corvane
