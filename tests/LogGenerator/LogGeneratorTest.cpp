#include "LogGenerator/LogGenerator.h"

#include <gtest/gtest.h>

#include <typeinfo>

#include "LogGenerator/GSM/GSMLogGenerator.h"
#include "platform/DateText.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::D;
using test::S;

class History : public ::testing::Test {
 protected:
  void SetUp() override {
    setDateSourceForTesting([this] { return Date{(INT64_C(1794816000) + seconds_++) * 1000000}; });
  }
  void TearDown() override { setDateSourceForTesting({}); }

  static Dictionary stateWithDisplay(const std::string& tag) {
    Dictionary state;
    state.set("DisplayState", S("raw " + tag));
    state.set("Display", D({{"Cell", S(tag)}}));
    state.set("ExtraInfo", D({}));
    return state;
  }

  static std::vector<std::string> historyTags(const Dictionary& state) {
    std::vector<std::string> tags;
    for (const Value& snapshot : state.find("History")->asArray()->elements()) {
      tags.push_back(*snapshot.asDictionary()->find("DisplayState")->asString());
    }
    return tags;
  }

  std::int64_t seconds_ = 0;
};

TEST_F(History, FiveGenerationsGiveFiveSnapshotsAndTheSixthEvictsTheOldest) {
  Dictionary state;
  for (int i = 1; i <= 5; ++i) {
    state.set("DisplayState", S("raw " + std::to_string(i)));
    state.set("Display", D({}));
    state.set("ExtraInfo", D({}));
    LogGenerator::updateHistoryInState(state);
  }
  EXPECT_EQ(historyTags(state), (std::vector<std::string>{"raw 1", "raw 2", "raw 3", "raw 4", "raw 5"}));
  state.set("DisplayState", S("raw 6"));
  LogGenerator::updateHistoryInState(state);
  EXPECT_EQ(historyTags(state), (std::vector<std::string>{"raw 2", "raw 3", "raw 4", "raw 5", "raw 6"}));
}

TEST_F(History, AHistoryOfSevenIsCutToTheNewestFourBeforeTheNewSnapshot) {
  Dictionary state = stateWithDisplay("new");
  Array history;
  for (int i = 1; i <= 7; ++i) history.append(D({{"DisplayState", S("old " + std::to_string(i))}}));
  state.set("History", Value(history));
  LogGenerator::updateHistoryInState(state);
  EXPECT_EQ(historyTags(state), (std::vector<std::string>{"old 4", "old 5", "old 6", "old 7", "raw new"}));
  EXPECT_TRUE(state.find("History")->asArray()->isSameObject(history)) << "the history array is changed in place";
}

TEST_F(History, AStateWithoutDisplayStateGivesAnEmptySnapshot) {
  Dictionary state;
  state.set("Display", D({}));
  state.set("ExtraInfo", D({}));
  LogGenerator::updateHistoryInState(state);
  const Array& history = *state.find("History")->asArray();
  ASSERT_EQ(history.size(), 1u);
  EXPECT_EQ(history.at(0), D({}));
}

TEST_F(History, TheFirstMissingValueEndsTheSnapshot) {
  Dictionary state;
  state.set("DisplayState", S("raw"));
  state.set("ExtraInfo", D({}));  // no "Display"
  LogGenerator::updateHistoryInState(state);
  EXPECT_EQ(state.find("History")->asArray()->at(0), D({{"DisplayState", S("raw")}}));

  Dictionary noExtra;
  noExtra.set("DisplayState", S("raw"));
  noExtra.set("Display", S("shown"));
  LogGenerator::updateHistoryInState(noExtra);
  EXPECT_EQ(noExtra.find("History")->asArray()->at(0), D({{"DisplayState", S("raw")}, {"Display", S("shown")}}));
}

TEST_F(History, ASnapshotHoldsShallowCopiesThenDateAndDescriptionInOrder) {
  Dictionary state = stateWithDisplay("A");
  LogGenerator::updateHistoryInState(state);
  const Dictionary& snapshot = *state.find("History")->asArray()->at(0).asDictionary();
  std::vector<std::string> keys;
  for (const auto& [k, v] : snapshot.entries()) keys.push_back(k);
  EXPECT_EQ(keys, (std::vector<std::string>{"DisplayState", "Display", "ExtraInfo", "Date", "Description"}));
  EXPECT_EQ(*snapshot.find("Date")->asString(), "2026-11-16 08:00:00 +0000");
  EXPECT_EQ(*snapshot.find("Description")->asString(), "Snapshot (2026-11-16 08:00:01 +0000)")
      << "the date is read once for each entry";

  // A copy, not the state's own dictionary: later changes to the state don't reach it.
  const Dictionary& display = *state.find("Display")->asDictionary();
  EXPECT_FALSE(snapshot.find("Display")->asDictionary()->isSameObject(display));
  display.set("Cell", S("changed"));
  EXPECT_EQ(*snapshot.find("Display")->asDictionary()->find("Cell")->asString(), "A");
}

TEST_F(History, AHistoryValueThatIsNoArrayIsReplaced) {
  Dictionary state = stateWithDisplay("A");
  state.set("History", S("not a list"));
  LogGenerator::updateHistoryInState(state);
  EXPECT_EQ(historyTags(state), std::vector<std::string>{"raw A"});
}

TEST(GeneratorFactory, IfxByValueEqualityGivesTheIfxGenerator) {
  std::string technology = "I";
  technology += "FX";  // equal to the constant, but another object
  ASSERT_NE(technology.data(), kLogChannelTechnologyIFX.data());
  auto generator = LogGenerator::generatorFromTechnology(technology);
  ASSERT_NE(generator, nullptr);
  const LogGenerator& g = *generator;
  EXPECT_EQ(typeid(g), typeid(GSMLogGenerator));
}

TEST(GeneratorFactory, UnknownTechnologiesGiveNoGenerator) {
  EXPECT_EQ(LogGenerator::generatorFromTechnology("ifx"), nullptr);
  EXPECT_EQ(LogGenerator::generatorFromTechnology(""), nullptr);
  EXPECT_EQ(LogGenerator::generatorFromTechnology("WiMAX"), nullptr);
}

TEST(GeneratorFactory, EachCallMakesANewGenerator) {
  auto a = LogGenerator::generatorFromTechnology(kLogChannelTechnologyIFX);
  auto b = LogGenerator::generatorFromTechnology(kLogChannelTechnologyIFX);
  EXPECT_NE(a.get(), b.get());
}

TEST(GeneratorFactory, CreatingAGeneratorLogsItsAddressAtWarningLevel) {
  log::ScopedCapture capture;
  auto generator = GSMLogGenerator::generator();
  const auto lines = capture.lines();
  ASSERT_EQ(lines.size(), 1u);
  EXPECT_EQ(lines[0].priority, 4);
  EXPECT_EQ(lines[0].text, "Creating Log object: " + log::pointerText(static_cast<LogGenerator*>(generator.get())));
}

}  // namespace
}  // namespace corvane
