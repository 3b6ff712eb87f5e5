// The UTRAN sections as the technology runs them: registered in the class
// index in the order of its table, given their containers by the "UTRAN"
// display template, and reached through the generator's dispatch.

#include <gtest/gtest.h>

#include "LogGenerator/utran/UTRANClassIndex.h"
#include "LogGenerator/utran/UTRANLogGenerator.h"
#include "support/GeneratorDisplay.h"
#include "utran/UtranSectionFixture.h"

namespace corvane {
namespace {

using test::findSection;
using test::logPacket;
using test::put16;
using test::sectionNames;

class UtranDispatch : public ::testing::Test {
 protected:
  UtranDispatch() {
    log::ScopedCapture quiet;
    owned = UTRANLogGenerator::generator();
    generator = dynamic_cast<UTRANLogGenerator*>(owned.get());
    generator->getDisplayFromState(state);
    display = state.get("Display");
  }
  std::size_t listSize(std::string_view section) const {
    const Value* list = findSection(display, section);
    return list && list->asArray() ? list->asArray()->size() : 9999;
  }
  std::string rowText(std::string_view section, std::string_view row) const {
    const Value* rows = findSection(display, section);
    return rows && rows->asDictionary() ? test::rowText(*rows->asDictionary(), row) : "<none>";
  }

  std::unique_ptr<LogGenerator> owned;
  UTRANLogGenerator* generator = nullptr;
  Dictionary state;
  Value display;
};

TEST(UtranClassIndex, MakesItsEightSectionsWithTheChannelMeasurementsInTheirOrder) {
  log::ScopedCapture quiet;
  UTRANClassIndex index;
  EXPECT_EQ(index.sectionNames().size(), 8u);
  EXPECT_EQ(sectionNames(index.getSubscribers(0xD00C)), (std::vector<std::string>{"TRCH BLER", "CCTRCH SIR"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0xFF0001)), std::vector<std::string>{"Serving Cell Info"});
}

// TRCH BLER traces at level 5, CCTRCH SIR at level 4: the order of the lines
// is the order of the calls.
TEST_F(UtranDispatch, AChannelMeasurementReachesTrchBlerBeforeCctrchSir) {
  Bytes p = logPacket(0xD00C, 289 + 34 + 8);
  put16(p, 14, 0x1040);  // one transport channel, one CCTrCH
  p[17] = 9;
  p[289 + 34] = 4;
  log::ScopedCapture capture;
  generator->updateWithData(p);
  const std::vector<log::Line> expected = {{log::kNotice, "TRCH BLER Measurement"},
                                           {log::kWarning, "CCTRCH SIR Measurement"}};
  EXPECT_EQ(capture.lines(), expected);
  EXPECT_EQ(listSize("TRCH BLER"), 1u);
  EXPECT_EQ(listSize("CCTRCH SIR"), 1u);
}

TEST_F(UtranDispatch, TheTemplateGivesEverySectionItsContainer) {
  EXPECT_EQ(rowText("RRC Info", "State"), "-");
  EXPECT_EQ(rowText("Serving Cell Info", "Cell Scrambling Code"), "-");
  for (const char* list : {"Neighbor Cell List", "GSM Neighbor Cell List", "TRCH BLER", "CCTRCH SIR"}) {
    EXPECT_EQ(listSize(list), 0u) << list;
  }
}

TEST_F(UtranDispatch, AnRrcRecordReachesRrcInfo) {
  Bytes p = logPacket(0xD0E0, 15);
  p[13] = 1;
  p[14] = 2;
  log::ScopedCapture quiet;
  generator->updateWithData(p);
  EXPECT_EQ(rowText("RRC Info", "State"), "Cell Fach");
}

}  // namespace
}  // namespace corvane
