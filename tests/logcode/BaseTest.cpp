#include "LogGenerator/logcode/Base.h"

#include <gtest/gtest.h>

#include "LogGenerator/logcode/ArrayLock.h"
#include "logcode/TestSections.h"
#include "platform/Assertion.h"
#include "platform/Log.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::Delivery;
using test::RecordingSection;
using test::S;

TEST(Base, ASectionWithTwoCodesIsEnteredUnderBoth) {
  ClassDictionary classDict;
  CodeDictionary codeDict;
  log::ScopedCapture capture;
  auto section = Base::initWithDict<RecordingSection>(classDict, codeDict, "Two", std::vector<std::uint32_t>{0xB0C2, 0xFF0001},
                                                      nullptr);
  ASSERT_NE(codeDict.find("45250"), nullptr);
  ASSERT_NE(codeDict.find("16711681"), nullptr);
  EXPECT_EQ(codeDict.find("45250")->front().get(), section.get());
  EXPECT_EQ(codeDict.find("16711681")->front().get(), section.get());
  EXPECT_EQ(classDict.at("Two").get(), section.get());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Array Count: 2"}}));
}

TEST(Base, SectionsSharingACodeAreCalledInCreationOrder) {
  std::vector<Delivery> journal;
  test::RecordingIndex index({{"First", {0x417A}}, {"Second", {0x4005, 0x417A}}}, &journal);
  const auto* subscribers = index.getSubscribers(0x417A);
  ASSERT_NE(subscribers, nullptr);
  ASSERT_EQ(subscribers->size(), 2u);
  const std::uint8_t packet[13] = {1};
  for (const auto& s : *subscribers) s->updateWithData(packet, 0x417A);
  ASSERT_EQ(journal.size(), 2u);
  EXPECT_EQ(journal[0].section, "First");
  EXPECT_EQ(journal[1].section, "Second");
}

// A section that neither comes from a table row nor names itself.
class NamelessSection final : public Base {
 public:
  void updateWithData(std::span<const std::uint8_t>, std::uint32_t) override {}
};

TEST(Base, ASectionWithoutATableRowOrItsOwnNameIsAProgrammingError) {
  NamelessSection section;
  EXPECT_THROW(section.getSectionName(), AssertionFailure);
  EXPECT_THROW(section.getLogCodeArray(), AssertionFailure);
}

TEST(Base, ASectionMadeFromATableRowTakesItsNameAndCodesFromTheRow) {
  static constexpr SectionDescriptor kRow =
      section<NamelessSection>("objNameless", "Nameless", {0xB0C2, 0xFF0001}, SectionContainer::Rows);
  ClassDictionary classDict;
  CodeDictionary codeDict;
  const auto made = Base::initWithDict(kRow, classDict, codeDict);
  EXPECT_EQ(made->getSectionName(), "Nameless");
  EXPECT_EQ(made->getLogCodeArray(), (std::vector<std::uint32_t>{0xB0C2, 0xFF0001}));
  EXPECT_EQ(classDict.at("Nameless"), made);
  ASSERT_NE(codeDict.find("16711681"), nullptr);
  EXPECT_EQ(codeDict.find("16711681")->front(), made);
}

TEST(Base, ACodeListedTwiceSubscribesTwice) {
  ClassDictionary classDict;
  CodeDictionary codeDict;
  Base::initWithDict<RecordingSection>(classDict, codeDict, "Twice", std::vector<std::uint32_t>{0x4005, 0x4005}, nullptr);
  EXPECT_EQ(codeDict.find("16389")->size(), 2u);
}

TEST(Base, LookUpECNOFollowsItsTableAtEveryBoundary) {
  EXPECT_EQ(Base::lookUpECNO(524288), 0);
  EXPECT_EQ(Base::lookUpECNO(4294967295u), 0);
  EXPECT_EQ(Base::lookUpECNO(524287), -1);
  EXPECT_EQ(Base::lookUpECNO(417648), -1);
  EXPECT_EQ(Base::lookUpECNO(417647), -2);
  EXPECT_EQ(Base::lookUpECNO(331809), -2);
  EXPECT_EQ(Base::lookUpECNO(331808), -3);
  EXPECT_EQ(Base::lookUpECNO(2241), -24);
  EXPECT_EQ(Base::lookUpECNO(2240), -25);
  EXPECT_EQ(Base::lookUpECNO(814), -30);
  EXPECT_EQ(Base::lookUpECNO(813), -31);
  EXPECT_EQ(Base::lookUpECNO(757), -31);
  EXPECT_EQ(Base::lookUpECNO(756), -31);
  EXPECT_EQ(Base::lookUpECNO(706), -31);
  EXPECT_EQ(Base::lookUpECNO(705), 0);
  EXPECT_EQ(Base::lookUpECNO(0), 0);
}

TEST(Base, LookUpECNONeverGivesMinus32) {
  for (std::uint32_t v = 0; v < 600000; v += 7) {
    const auto db = Base::lookUpECNO(v);
    EXPECT_LE(db, 0);
    EXPECT_GE(db, -31);
  }
}

TEST(Base, ReplaceArrayWithItselfLeavesItEmpty) {
  Array list(std::vector<Value>{S("a"), S("b")});
  Base::replaceArray(list, list);
  EXPECT_TRUE(list.empty());
  EXPECT_EQ(ArrayLock::depth(), 0);
}

TEST(Base, ReplaceArrayInstallsTheOtherArraysElementsWhole) {
  Array list(std::vector<Value>{S("old")});
  Array fresh(std::vector<Value>{S("x"), S("y")});
  Base::replaceArray(list, fresh);
  EXPECT_EQ(list.elements(), fresh.elements());
  EXPECT_FALSE(list.isSameObject(fresh));
  Base::clearElementsInArray(list);
  EXPECT_TRUE(list.empty());
  EXPECT_EQ(fresh.size(), 2u);
  EXPECT_EQ(ArrayLock::depth(), 0);
}

TEST(Base, UpdateSectionRefTracesTheSectionNameAndPointsItsWrites) {
  ClassDictionary classDict;
  CodeDictionary codeDict;
  auto section = Base::initWithDict<RecordingSection>(classDict, codeDict, "Serving Cell Info",
                                                      std::vector<std::uint32_t>{1}, nullptr);
  Dictionary container;
  log::ScopedCapture capture;
  section->updateSectionRef(Value(container));
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Serving Cell Info"}}));
  const std::uint8_t packet[13] = {1};
  section->updateWithData(packet, 7);
  EXPECT_EQ(*container.find("Last Code")->asString(), "7");
}

TEST(Base, WritesBeforeTheFirstDisplayOrAfterItIsGoneGoNowhere) {
  ClassDictionary classDict;
  CodeDictionary codeDict;
  auto section = Base::initWithDict<RecordingSection>(classDict, codeDict, "S", std::vector<std::uint32_t>{1}, nullptr);
  const std::uint8_t packet[13] = {1};
  section->updateWithData(packet, 1);  // no container yet
  EXPECT_FALSE(section->sectionDictionary().has_value());
  {
    Dictionary display;
    section->updateSectionRef(Value(display));
    EXPECT_TRUE(section->sectionDictionary().has_value());
  }
  // The section does not keep the display alive.
  EXPECT_FALSE(section->sectionDictionary().has_value());
  section->updateWithData(packet, 1);
}

TEST(Base, BoundedListThrowsAtAndBeyondItsCount) {
  BoundedList list(2, 29, 6);
  EXPECT_EQ(list.entryOffset(0), 29u);
  EXPECT_EQ(list.entryOffset(1), 35u);
  EXPECT_THROW(list.entryOffset(2), ArrayOutOfBoundsException);
  EXPECT_THROW(BoundedList(0, 0, 1).entryOffset(0), ArrayOutOfBoundsException);
}

}  // namespace
}  // namespace corvane
