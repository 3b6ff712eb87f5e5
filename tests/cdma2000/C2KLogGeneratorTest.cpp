// The CDMA2000 generator: the display and lookup built from the label
// template, the dispatch of packets by code, what it keeps for the history,
// and its start command.

#include "LogGenerator/cdma2000/C2KLogGenerator.h"

#include "cdma2000/C2KTestSupport.h"
#include "LogGenerator/LogGenerator.h"
#include "support/ResourceDirectory.h"

namespace corvane {
namespace {

using test::C2KTest;
using test::logPacket;
using test::put16;

// A 0x1183 record of 50 bytes with colour code 7.
Bytes evdoStatus() {
  Bytes p = logPacket(0x1183, 50);
  p[41] = 7;
  return p;
}

TEST_F(C2KTest, APacketOf12BytesIsIgnoredAndOneOf13IsDispatched) {
  log::ScopedCapture capture;
  Bytes twelve = logPacket(0x1183, 12);
  feed(twelve);
  EXPECT_TRUE(capture.texts().empty());
  EXPECT_TRUE(generator.binData().empty());

  Bytes thirteen = logPacket(0x1183, 13);
  feed(thirteen);
  EXPECT_EQ(capture.texts(), std::vector<std::string>{"Log code 0x1183 is 13 bytes long but should be 50 bytes."});
  // Rejected by its decoder, kept all the same.
  EXPECT_EQ(generator.binData(), thirteen);
}

TEST_F(C2KTest, APrefixedPacketIsDecodedFromItsThirdByteAndKeptWithoutThePrefix) {
  const Bytes record = evdoStatus();
  Bytes prefixed = {0x81, 0x42};
  prefixed.insert(prefixed.end(), record.begin(), record.end());
  log::ScopedCapture capture;
  feed(prefixed);
  EXPECT_EQ(row("kColorCode"), "7");
  EXPECT_EQ(generator.binData(), record);
  EXPECT_TRUE(capture.texts().empty());
}

TEST_F(C2KTest, AnotherLogTypeIsReportedAndStillDecoded) {
  Bytes p = evdoStatus();
  p[0] = 2;
  log::ScopedCapture capture;
  feed(p);
  EXPECT_EQ(capture.sink().lines(), (std::vector<log::Line>{{3, "Invalid log type: 2. Dropping."}}));
  EXPECT_EQ(row("kColorCode"), "7");
  EXPECT_EQ(generator.binData(), p);
}

TEST_F(C2KTest, AnExtraCodeOrAnUnknownCodeIsNeitherDecodedNorKept) {
  Bytes extra = evdoStatus();
  extra[0] = 0xFF;
  Bytes unknown = logPacket(0x1184, 50);
  log::ScopedCapture capture;
  feed(extra);
  feed(unknown);
  EXPECT_EQ(row("kColorCode"), "");
  EXPECT_TRUE(generator.binData().empty());
  EXPECT_EQ(capture.texts(), std::vector<std::string>{"Invalid log type: ff. Dropping."});
}

Dictionary templateOf(std::initializer_list<std::pair<std::string, Value>> entries) {
  Dictionary d;
  for (const auto& [k, v] : entries) d.set(k, v);
  return d;
}

TEST(C2KTemplate, ALookupKeyUnderTwoSubSectionsFillsBothRows) {
  const Dictionary tmpl = templateOf({
      {"1x", Value(templateOf({{"Colour", Value("kColorCode")}}))},
      {"EV-DO", Value(templateOf({{"_sorted", Value("_sorted")}, {"CC", Value("kColorCode")}}))},
  });
  Dictionary display;
  Dictionary lookup;
  log::ScopedCapture capture;
  C2KLogGenerator::processTemplate(tmpl, display, lookup);
  // Once per dictionary level.
  EXPECT_EQ(capture.sink().count("Processing the template"), 3u);
  const Value records = lookup.get("kColorCode");
  ASSERT_TRUE(records.isArray());
  ASSERT_EQ(records.asArray()->size(), 2u);

  SetLookupValue("kColorCode", "12", &lookup);
  const Value x1 = display.get("1x");
  const Value evdo = display.get("EV-DO");
  EXPECT_EQ(x1.asDictionary()->get("Colour"), Value("12"));
  EXPECT_EQ(evdo.asDictionary()->get("CC"), Value("12"));
  EXPECT_EQ(evdo.asDictionary()->get("_sorted"), Value("_sorted"));
}

TEST(C2KTemplate, ANumberInTheTemplateMakesNoRow) {
  const Dictionary tmpl =
      templateOf({{"Count", Value::integer(3)}, {"Flag", Value::boolean(true)}, {"Channel", Value("kChannel")}});
  Dictionary display;
  Dictionary lookup;
  log::ScopedCapture quiet;
  C2KLogGenerator::processTemplate(tmpl, display, lookup);
  EXPECT_EQ(display, templateOf({{"Channel", Value("")}}));
  EXPECT_EQ(lookup.size(), 1u);
}

TEST(C2KTemplate, AKeyTheTemplateDoesNotUseIsDroppedAndABrokenRecordEndsTheWrites) {
  Dictionary display;
  Dictionary lookup;
  log::ScopedCapture quiet;
  C2KLogGenerator::processTemplate(templateOf({{"A", Value("kBaseId")}, {"B", Value("kBaseId")}}), display, lookup);
  SetLookupValue("kNoSuchKey", "1", &lookup);
  EXPECT_EQ(display, templateOf({{"A", Value("")}, {"B", Value("")}}));
  // The first record loses its label: neither it nor the records behind it are served.
  const Value records = lookup.get("kBaseId");
  records.asArray()->at(0).asDictionary()->set("key", Value::integer(1));
  SetLookupValue("kBaseId", "9", &lookup);
  EXPECT_EQ(display, templateOf({{"A", Value("")}, {"B", Value("")}}));
  SetLookupValue("kBaseId", "9", nullptr);
}

TEST_F(C2KTest, TwoDisplayGenerationsWithoutPacketsStoreAnEmptyByteStringTheSecondTime) {
  log::ScopedCapture quiet;
  feed(evdoStatus());
  generator.generateLogUsingState(state);
  EXPECT_EQ(state.get("DisplayState"), Value(evdoStatus()));
  const Value display = generator.generateLogUsingState(state);
  EXPECT_EQ(state.get("DisplayState"), Value(Bytes()));
  EXPECT_TRUE(display.isDictionary());
  const Value history = state.get("History");
  ASSERT_EQ(history.asArray()->size(), 2u);
  const Value last = history.asArray()->at(1);
  EXPECT_TRUE(last.asDictionary()->contains("ExtraInfo"));
}

TEST(C2KGenerator, TheDisplayIsBuiltOnceFromTheResourceAndRemembered) {
  test::ScopedResourceDirectory resources;
  resources.writeTemplate("C2KTemplate", Value(templateOf({{"Base", Value("kBaseId")}})));
  Dictionary state;
  log::ScopedCapture quiet;
  const Value display = C2KLogGenerator::getDisplayFromState(state);
  ASSERT_TRUE(display.isDictionary());
  EXPECT_TRUE(state.get("Template").isDictionary());
  EXPECT_TRUE(state.get("Lookup").isDictionary());
  EXPECT_EQ(state.get("ExtraInfo"), Value(Dictionary()));
  const Value again = C2KLogGenerator::getDisplayFromState(state);
  EXPECT_TRUE(again.asDictionary()->isSameObject(*display.asDictionary()));
}

TEST(C2KGenerator, WithoutItsTemplateItSaysSoAndItsDecodersStillKeepTheirMemory) {
  test::ScopedResourceDirectory emptyResources;
  Dictionary state;
  C2KLogGenerator generator;
  log::ScopedCapture capture;
  Bytes fer = test::subpacketRecord(0x119d, {test::subpacket(11, 28)});
  fer[17 + 24] = 1;
  generator.updateState(state, fer);
  EXPECT_EQ(capture.sink().count("Cannot load C2K template for display"), 1u);
  EXPECT_FALSE(state.contains("Display"));
  EXPECT_FALSE(state.contains("Lookup"));
  EXPECT_TRUE(state.contains("TrafficFER"));
  EXPECT_TRUE(generator.generateLogUsingState(state).isNull());
}

TEST(C2KGenerator, TheStartCommandAsksForTheEightCodesInItsOrderAndNoExtraCodes) {
  log::ScopedCapture quiet;
  C2KLogGenerator generator;
  const Dictionary command = generator.getStartCommand();
  ASSERT_EQ(command.size(), 2u);
  EXPECT_EQ(command.get("SetState"), Value("Streaming"));
  std::vector<std::int64_t> codes;
  const Value array = command.get("SetQuendraLogCodes");
  for (const Value& v : array.asArray()->elements()) codes.push_back(*v.asInteger());
  EXPECT_EQ(codes, (std::vector<std::int64_t>{4234, 4483, 4498, 4790, 4508, 4509, 4734, 4943}));
}

TEST(C2KGenerator, TheFactoryGivesItForQuendraCDMA) {
  log::ScopedCapture quiet;
  const std::string technology = "Quendra_CDMA";
  auto generator = LogGenerator::generatorFromTechnology(technology);
  EXPECT_NE(dynamic_cast<C2KLogGenerator*>(generator.get()), nullptr);
}

TEST(C2KGenerator, TheInstalledTemplateUsesEveryLookupKeyAndOnlyThose) {
  Dictionary state;
  log::ScopedCapture quiet;
  ASSERT_TRUE(C2KLogGenerator::getDisplayFromState(state).isDictionary());
  const Value lookup = state.get("Lookup");
  std::vector<std::string> used;
  for (const auto& entry : lookup.asDictionary()->entries()) used.push_back(entry.first);
  std::vector<std::string> expected = test::c2kLookupKeys();
  std::sort(used.begin(), used.end());
  std::sort(expected.begin(), expected.end());
  EXPECT_EQ(used, expected);
}

}  // namespace
}  // namespace corvane
