#include "LogGenerator/logcode/ClassIndex.h"

#include <gtest/gtest.h>

#include "logcode/TestSections.h"
#include "platform/Log.h"

namespace corvane {
namespace {

using test::RecordingIndex;

TEST(ClassIndex, ACodeNoSectionListsHasNoSubscribers) {
  RecordingIndex index({{"A", {0xD0E0}}}, nullptr);
  EXPECT_EQ(index.getSubscribers(0xD0E2), nullptr);
  EXPECT_NE(index.getSubscribers(0xD0E0), nullptr);
}

TEST(ClassIndex, ExtraCodesAreLookedUpByTheDecimalTextOfTheSum) {
  RecordingIndex index({{"Cells", {0xFF0000 + 1}}}, nullptr);
  const auto* subscribers = index.getSubscribers(0xFF0001);
  ASSERT_NE(subscribers, nullptr);
  EXPECT_EQ(subscribers->front()->getSectionName(), "Cells");
  EXPECT_EQ(index.getAllLogCodes(), std::vector<std::string>{"16711681"});
}

TEST(ClassIndex, AnIndexWithoutSectionsHasNoCodes) {
  RecordingIndex index({}, nullptr);
  EXPECT_TRUE(index.getAllLogCodes().empty());
  EXPECT_EQ(index.getClass("anything"), nullptr);
}

TEST(ClassIndex, AllLogCodesListEachCodeOnce) {
  RecordingIndex index({{"A", {0x417A}}, {"B", {0x417A, 0x4005}}, {"C", {0x417A}}}, nullptr);
  EXPECT_EQ(index.getAllLogCodes(), (std::vector<std::string>{"16762", "16389"}));
}

TEST(ClassIndex, StatusOnAHealthyIndexReportsADictionaryThatIsNoString) {
  RecordingIndex index({{"A", {1}}}, nullptr);
  log::ScopedCapture capture;
  index.status();
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Dictionary = 1"}, {log::kWarning, "String = 0"}}));
}

TEST(ClassIndex, ALaterSectionOfTheSameNameReplacesTheFirstButBothStaySubscribed) {
  RecordingIndex index({{"Same", {1}}, {"Same", {1}}}, nullptr);
  EXPECT_EQ(index.getClass("Same"), index.made[1].get());
  EXPECT_EQ(index.getSubscribers(1)->size(), 2u);
}

TEST(ClassIndex, TeardownPrintsOnStandardOutput) {
  testing::internal::CaptureStdout();
  { RecordingIndex index({{"A", {1}}}, nullptr); }
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "Deallocing ClassIndex\n");
}

}  // namespace
}  // namespace corvane
