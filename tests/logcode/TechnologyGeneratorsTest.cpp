#include "LogGenerator/gsm_umts/QND_GSMLogGenerator.h"
#include "LogGenerator/lte/LTELogGenerator.h"
#include "LogGenerator/utran/UTRANClassIndex.h"
#include "LogGenerator/utran/UTRANLogGenerator.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

#include "LogGenerator/LogGenerator.h"
#include "logcode/TestSections.h"
#include "platform/Log.h"
#include "platform/LogChannelTechnology.h"
#include "support/ResourceDirectory.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::D;
using test::S;

std::set<std::int64_t> numbers(const Value& list) {
  std::set<std::int64_t> out;
  for (const Value& v : list.asArray()->elements()) out.insert(*v.asInteger());
  return out;
}

std::size_t countOf(const Value& list, std::int64_t n) {
  std::size_t c = 0;
  for (const Value& v : list.asArray()->elements()) c += (*v.asInteger() == n);
  return c;
}

TEST(TechnologyGenerators, EachLogCodeTechnologyHasItsGenerator) {
  auto gsm = LogGenerator::generatorFromTechnology(kLogChannelTechnologyQuendraGSM);
  auto lte = LogGenerator::generatorFromTechnology(kLogChannelTechnologyQuendraLTE);
  auto utran = LogGenerator::generatorFromTechnology(kLogChannelTechnologyQuendraUTRAN2);
  ASSERT_NE(dynamic_cast<QND_GSMLogGenerator*>(gsm.get()), nullptr);
  ASSERT_NE(dynamic_cast<LTELogGenerator*>(lte.get()), nullptr);
  ASSERT_NE(dynamic_cast<UTRANLogGenerator*>(utran.get()), nullptr);
  EXPECT_EQ(dynamic_cast<QND_GSMLogGenerator*>(gsm.get())->templateName(), "QND_GSM");
  EXPECT_EQ(dynamic_cast<LTELogGenerator*>(lte.get())->templateName(), "LTE");
  EXPECT_EQ(dynamic_cast<UTRANLogGenerator*>(utran.get())->templateName(), "UTRAN");
}

// The GSM index subscribes four sections to 0x417A and asks for the three
// extra codes; the start command names each code once. This index lists the
// same subscriptions.
TEST(TechnologyGenerators, AStartCommandNamesACodeOnceHoweverManySectionsWantIt) {
  auto index = std::make_unique<test::RecordingIndex>(
      std::vector<std::pair<std::string, std::vector<std::uint32_t>>>{
          {"Active Set", {0x417A}},
          {"GSM Serving Cell", {0x5134, 0x5137, 0x5076, 0xFF0001}},
          {"PDP Context Info", {0xFF0002}},
          {"Detected Set", {0x417A}},
          {"Monitored Set", {0x417A}},
          {"Virtual Active Set", {0x417A}},
          {"SIM Info", {0xFF0000}}},
      nullptr);
  QNDLogGenerator2 gen(QNDLogGenerator2::Configuration{"QND_GSM", std::move(index)});
  const Dictionary command = gen.getStartCommand();
  EXPECT_EQ(countOf(*command.find("SetQuendraLogCodes"), 0x417A), 1u);
  EXPECT_EQ(numbers(*command.find("SetTsExtraCodes")), (std::set<std::int64_t>{0, 1, 2}));
}

TEST(TechnologyGenerators, TheGsmStartCommandAsksForTheSimFilesAndPdpContexts) {
  QND_GSMLogGenerator gen;
  const Dictionary command = gen.getStartCommand();
  const auto extra = numbers(*command.find("SetTsExtraCodes"));
  EXPECT_TRUE(extra.count(0));
  EXPECT_TRUE(extra.count(2));
  for (std::int64_t code : numbers(*command.find("SetQuendraLogCodes"))) EXPECT_LT(code, 0xFF0000);
}

TEST(TechnologyGenerators, GsmTracesItsCreationBeforeTheGeneratorsOwnLines) {
  log::ScopedCapture capture;
  testing::internal::CaptureStdout();
  { QND_GSMLogGenerator gen; }
  const std::string out = testing::internal::GetCapturedStdout();
  const auto texts = capture.texts();
  ASSERT_GE(texts.size(), 4u);
  EXPECT_EQ(texts.front(), "Creating QND_GSMLogGenerator object");
  // The index's sections register before the generator is made.
  auto created = std::find_if(texts.begin(), texts.end(),
                              [](const std::string& t) { return t.rfind("Creating QNDLogGenerator2 object with", 0) == 0; });
  ASSERT_NE(created, texts.end());
  EXPECT_GT(std::count_if(texts.begin(), created, [](const std::string& t) { return t.rfind("Array Count:", 0) == 0; }),
            0);
  // Teardown: the technology's line, then the shared one, then the index on standard output.
  EXPECT_EQ(texts[texts.size() - 2].rfind("QND_GSMLogGenerator is destructed 0x", 0), 0u);
  EXPECT_EQ(texts.back().rfind("QND_GSMLogGenerator is destructed 0x", 0), 0u);
  EXPECT_EQ(out, "Deallocing QND_GSMClassIndex\nDeallocing ClassIndex\n");
}

TEST(TechnologyGenerators, LteTracesItsOwnNameAndItsIndexsTeardown) {
  log::ScopedCapture capture;
  testing::internal::CaptureStdout();
  { LTELogGenerator gen; }
  const std::string out = testing::internal::GetCapturedStdout();
  const auto texts = capture.texts();
  EXPECT_EQ(texts.front(), "Creating LTELogGenerator object");
  EXPECT_EQ(texts[texts.size() - 2].rfind("LTELogGenerator is destructed 0x", 0), 0u);
  EXPECT_EQ(texts.back().rfind("QND_GSMLogGenerator is destructed 0x", 0), 0u);
  EXPECT_EQ(out, "Deallocing LTEClassIndex\nDeallocing ClassIndex\n");
}

TEST(TechnologyGenerators, TheUtranTemplateIsTheFirstPlistWhoseNameSaysUtranInAnyCase) {
  test::ScopedResourceDirectory resources;
  resources.writeTemplate("LTE", D({}));
  resources.writeTemplate("UTRAN", D({}));
  resources.writeTemplate("a-utran", D({}));
  EXPECT_EQ(UTRANLogGenerator::findTemplateName(), "a-utran");
  log::ScopedCapture capture;
  testing::internal::CaptureStdout();
  {
    auto gen = UTRANLogGenerator::generator();
    EXPECT_EQ(dynamic_cast<UTRANLogGenerator*>(gen.get())->templateName(), "a-utran");
  }
  const std::string out = testing::internal::GetCapturedStdout();
  const auto texts = capture.texts();
  EXPECT_NE(std::find(texts.begin(), texts.end(), "Created UTRANLogGenerator object"), texts.end());
  // The UTRAN index prints nothing of its own.
  EXPECT_EQ(out, "Deallocing ClassIndex\n");
}

TEST(TechnologyGenerators, TheUtranIndexMakesTheSectionsOfItsTableAndPrintsNoTeardownLineOfItsOwn) {
  log::ScopedCapture quiet;
  testing::internal::CaptureStdout();
  {
    const UTRANClassIndex index;
    ASSERT_EQ(index.sectionNames().size(), UTRANClassIndex::sections().size());
    for (const SectionDescriptor& row : UTRANClassIndex::sections()) {
      ASSERT_NE(index.getClass(row.name), nullptr) << row.name;
      for (std::uint32_t code : row.codes) {
        const auto* subscribers = index.getSubscribers(static_cast<std::int32_t>(code));
        ASSERT_NE(subscribers, nullptr) << code;
        // Two sections read the channel measurement: each is among its subscribers.
        EXPECT_TRUE(std::any_of(subscribers->begin(), subscribers->end(),
                                [&](const auto& s) { return s.get() == index.getClass(row.name); }))
            << row.name;
      }
    }
  }
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "Deallocing ClassIndex\n");
}

TEST(TechnologyGenerators, WithoutAUtranTemplateTheGeneratorStaysEmpty) {
  test::ScopedResourceDirectory resources;
  resources.writeTemplate("LTE", D({}));
  EXPECT_FALSE(UTRANLogGenerator::findTemplateName().has_value());
  log::ScopedCapture capture;
  auto gen = UTRANLogGenerator::generator();
  auto* utran = dynamic_cast<UTRANLogGenerator*>(gen.get());
  ASSERT_NE(utran, nullptr);
  EXPECT_EQ(utran->classIndex(), nullptr);
  const auto texts = capture.texts();
  EXPECT_EQ(std::find(texts.begin(), texts.end(), "Created UTRANLogGenerator object"), texts.end());
  const Dictionary command = gen->getStartCommand();
  EXPECT_TRUE(command.find("SetQuendraLogCodes")->asArray()->empty());
  EXPECT_TRUE(command.find("SetTsExtraCodes")->asArray()->empty());
  Dictionary state;
  EXPECT_TRUE(gen->generateLogUsingState(state).isNull());
}

}  // namespace
}  // namespace corvane
