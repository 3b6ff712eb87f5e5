#include "LogGenerator/logcode/QNDLogGenerator2.h"

#include <gtest/gtest.h>

#include "logcode/TestSections.h"
#include "platform/Log.h"
#include "support/Packets.h"
#include "support/ResourceDirectory.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::Delivery;
using test::logPacket;
using test::S;

class TemplateGenerator : public ::testing::Test {
 protected:
  void SetUp() override {
    const Value secA = D({{"Row", S("-")}});
    const Value group = D({{"Sec A", secA}});
    resources_.writeTemplate("Test", D({{"Group", group}, {"Sec B", A({})}, {"Static", S("text")}}));
  }

  std::unique_ptr<QNDLogGenerator2> makeGenerator(
      std::vector<std::pair<std::string, std::vector<std::uint32_t>>> sections) {
    auto index = std::make_unique<test::RecordingIndex>(std::move(sections), &journal_);
    index_ = index.get();
    return std::make_unique<QNDLogGenerator2>(QNDLogGenerator2::Configuration{"Test", std::move(index)});
  }

  test::ScopedResourceDirectory resources_;
  std::vector<Delivery> journal_;
  test::RecordingIndex* index_ = nullptr;
};

TEST_F(TemplateGenerator, APacketOfThirteenBytesIsDispatchedOneOfTwelveIsNot) {
  auto gen = makeGenerator({{"Sec A", {0x4005}}});
  gen->updateWithData(logPacket(0x4005, 13));
  ASSERT_EQ(journal_.size(), 1u);
  EXPECT_EQ(journal_[0].code, 0x4005u);
  EXPECT_EQ(journal_[0].size, 13u);
  log::ScopedCapture capture;
  gen->updateWithData(logPacket(0x4005, 12));
  EXPECT_EQ(journal_.size(), 1u);
  EXPECT_TRUE(capture.lines().empty());
}

TEST_F(TemplateGenerator, ThePrefixIsDroppedBeforeDispatch) {
  auto gen = makeGenerator({{"Sec A", {0x4005}}});
  Bytes prefixed = {0x81, 0x00};
  const Bytes packet = logPacket(0x4005, 20);
  prefixed.insert(prefixed.end(), packet.begin(), packet.end());
  gen->updateWithData(prefixed);
  ASSERT_EQ(journal_.size(), 1u);
  EXPECT_EQ(journal_[0].size, 20u);
  EXPECT_EQ(journal_[0].firstByte, 0x01);
}

TEST_F(TemplateGenerator, AThirteenBytePacketWithThePrefixIsStillDispatchedAsElevenBytes) {
  auto gen = makeGenerator({{"Sec A", {0x4005}}});
  // After the two prefix bytes: type 0x01, length, code 0x4005, then 6 timestamp bytes.
  Bytes p = {0x81, 0x00, 0x01, 0x0A, 0x00, 0x05, 0x40, 0, 0, 0, 0, 0, 0};
  ASSERT_EQ(p.size(), 13u);
  gen->updateWithData(p);
  ASSERT_EQ(journal_.size(), 1u);
  EXPECT_EQ(journal_[0].size, 11u);
  EXPECT_EQ(journal_[0].code, 0x4005u);
}

TEST_F(TemplateGenerator, TypeFFPlacesTheCodeInTheExtraCodeSpace) {
  auto gen = makeGenerator({{"Sec A", {0xFF0001}}, {"Sec B", {0x0001}}});
  gen->updateWithData(logPacket(0x0001, 13, 0xFF));
  ASSERT_EQ(journal_.size(), 1u);
  EXPECT_EQ(journal_[0].section, "Sec A");
  EXPECT_EQ(journal_[0].code, 0xFF0001u);
}

TEST_F(TemplateGenerator, AnUnknownTypeIsLoggedAndDroppedButStillKeptForTheDlf) {
  auto gen = makeGenerator({{"Sec A", {0x4005}}});
  Dictionary state;
  gen->getDisplayFromState(state);
  log::ScopedCapture capture;
  gen->updateState(state, logPacket(0x4005, 13, 0x02));
  EXPECT_TRUE(journal_.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kError, "Invalid log type: 2. Dropping."}}));
  gen->generateLogUsingState(state);
  EXPECT_EQ(state.find("DisplayState")->asData()->size(), 13u);
}

TEST_F(TemplateGenerator, ACodeWithoutSubscribersIsDroppedSilently) {
  auto gen = makeGenerator({{"Sec A", {0x4005}}});
  log::ScopedCapture capture;
  gen->updateWithData(logPacket(0x4006, 20));
  EXPECT_TRUE(journal_.empty());
  EXPECT_TRUE(capture.lines().empty());
}

TEST_F(TemplateGenerator, TheFirstDisplayRequestBuildsTheDisplayAndReturnsNothing) {
  auto gen = makeGenerator({{"Sec A", {1}}});
  Dictionary state;
  EXPECT_TRUE(gen->getDisplayFromState(state).isNull());
  EXPECT_TRUE(state.contains("Template"));
  EXPECT_TRUE(state.contains("Display"));
  ASSERT_TRUE(state.contains("ExtraInfo"));
  EXPECT_TRUE(state.find("ExtraInfo")->asDictionary()->empty());
  const Value second = gen->getDisplayFromState(state);
  ASSERT_TRUE(second.isDictionary());
  EXPECT_TRUE(second.asDictionary()->isSameObject(*state.find("Display")->asDictionary()));
}

TEST_F(TemplateGenerator, SectionsGetTheirContainerAtAnyDepth) {
  auto gen = makeGenerator({{"Sec A", {1}}, {"Sec B", {2}}});
  Dictionary state;
  gen->getDisplayFromState(state);
  const Dictionary display = *state.find("Display")->asDictionary();
  auto a = index_->made[0]->sectionDictionary();
  ASSERT_TRUE(a.has_value());
  EXPECT_TRUE(a->isSameObject(*display.find("Group")->asDictionary()->find("Sec A")->asDictionary()));
  auto b = index_->made[1]->sectionArray();
  ASSERT_TRUE(b.has_value());
  EXPECT_TRUE(b->isSameObject(*display.find("Sec B")->asArray()));
  // The display is a copy: the template stays as loaded.
  gen->updateWithData(logPacket(1, 13));
  EXPECT_EQ(*a->find("Last Code")->asString(), "1");
  EXPECT_FALSE(state.find("Template")->asDictionary()->find("Group")->asDictionary()->find("Sec A")->asDictionary()->contains(
      "Last Code"));
}

TEST_F(TemplateGenerator, AMissingTemplateIsLoggedOnEveryAttempt) {
  auto gen = std::make_unique<QNDLogGenerator2>(
      QNDLogGenerator2::Configuration{"Absent", std::make_unique<test::RecordingIndex>(
                                                     std::vector<std::pair<std::string, std::vector<std::uint32_t>>>{},
                                                     nullptr)});
  Dictionary state;
  log::ScopedCapture capture;
  EXPECT_TRUE(gen->getDisplayFromState(state).isNull());
  EXPECT_TRUE(gen->getDisplayFromState(state).isNull());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kError, "Cannot load template for display"},
                                                     {log::kError, "Cannot load template for display"}}));
  EXPECT_FALSE(state.contains("Display"));
}

TEST_F(TemplateGenerator, GenerateMovesThePacketsIntoTheStateAndStartsAFreshBuffer) {
  auto gen = makeGenerator({{"Sec A", {0x4005}}});
  Dictionary state;
  gen->updateState(state, logPacket(0x4005, 14));
  gen->updateState(state, logPacket(0x4005, 15));
  const Value display = gen->generateLogUsingState(state);
  EXPECT_TRUE(display.isDictionary());
  EXPECT_EQ(state.find("DisplayState")->asData()->size(), 29u);
  ASSERT_EQ(state.find("History")->asArray()->size(), 1u);
  gen->generateLogUsingState(state);
  EXPECT_TRUE(state.find("DisplayState")->asData()->empty());
  EXPECT_EQ(state.find("History")->asArray()->size(), 2u);
}

TEST_F(TemplateGenerator, PacketsAreKeptExactlyAsReceivedPrefixIncluded) {
  auto gen = makeGenerator({});
  Dictionary state;
  Bytes prefixed = {0x81, 0x00};
  const Bytes packet = logPacket(0x4005, 13);
  prefixed.insert(prefixed.end(), packet.begin(), packet.end());
  gen->updateState(state, prefixed);
  gen->generateLogUsingState(state);
  EXPECT_EQ(*state.find("DisplayState")->asData(), prefixed);
}

TEST_F(TemplateGenerator, TheStartCommandOfAnIndexWithoutCodesHasTwoEmptyLists) {
  auto gen = makeGenerator({{"Placeholder", {}}});
  const Dictionary command = gen->getStartCommand();
  ASSERT_EQ(command.size(), 3u);
  EXPECT_EQ(*command.find("SetState")->asString(), "Streaming");
  EXPECT_TRUE(command.find("SetQuendraLogCodes")->asArray()->empty());
  EXPECT_TRUE(command.find("SetTsExtraCodes")->asArray()->empty());
}

TEST_F(TemplateGenerator, TheStartCommandSplitsLogCodesFromExtraCodes) {
  auto gen = makeGenerator({{"RRC", {0xD0E0}}, {"Cell", {0xD0E2, 0xFF0001}}});
  const Dictionary command = gen->getStartCommand();
  EXPECT_EQ(command.find("SetQuendraLogCodes")->asArray()->elements(),
            (std::vector<Value>{Value::integer(53472), Value::integer(53474)}));
  EXPECT_EQ(command.find("SetTsExtraCodes")->asArray()->elements(), std::vector<Value>{Value::integer(1)});
}

TEST_F(TemplateGenerator, ATemplateNodeOfAnotherTypeIsLoggedAndLeftOut) {
  auto gen = makeGenerator({});
  log::ScopedCapture capture;
  const Value copy = gen->processTemplate(D({{"Number", Value::integer(3)}, {"Text", S("t")}}));
  EXPECT_EQ(copy, D({{"Text", S("t")}}));
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kError, "Received an object of unknown type"},
                                                     {log::kWarning, "Processing the template"}}));
}

TEST_F(TemplateGenerator, CreationAndTeardownTraceInOrder) {
  log::ScopedCapture capture;
  testing::internal::CaptureStdout();
  {
    auto gen = makeGenerator({});
  }
  const std::string out = testing::internal::GetCapturedStdout();
  const auto texts = capture.texts();
  ASSERT_EQ(texts.size(), 4u);
  EXPECT_EQ(texts[0].rfind("Creating QNDLogGenerator2 object with 0x", 0), 0u);
  EXPECT_EQ(texts[1].rfind("Creating Log object: 0x", 0), 0u);
  EXPECT_EQ(texts[2], "Class Index: 1");
  EXPECT_EQ(texts[3].rfind("QND_GSMLogGenerator is destructed 0x", 0), 0u);
  EXPECT_EQ(out, "Deallocing ClassIndex\n");
}

}  // namespace
}  // namespace corvane
