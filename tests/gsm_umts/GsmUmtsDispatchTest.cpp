// The GSM/UMTS sections as the technology runs them: registered in the class
// index in the order of its table, given their containers by the "QND_GSM"
// display template, and reached through the generator's dispatch.

#include <gtest/gtest.h>

#include "LogGenerator/gsm_umts/QND_GSMClassIndex.h"
#include "LogGenerator/gsm_umts/QND_GSMLogGenerator.h"
#include "gsm_umts/GsmCellPackets.h"
#include "gsm_umts/GsmUmtsSectionFixture.h"
#include "support/GeneratorDisplay.h"

namespace corvane {
namespace {

using test::I;
using test::logPacket;
using test::monitorCell;
using test::put16;

using GsmUmtsDispatch = test::GeneratorDisplayTest<QND_GSMLogGenerator>;
using test::findSection;
using test::sectionNames;
using test::warningTexts;

TEST(GsmUmtsClassIndex, SectionsSharingACodeAreCalledInTheOrderOfTheTable) {
  log::ScopedCapture quiet;
  QND_GSMClassIndex index;
  EXPECT_EQ(sectionNames(index.getSubscribers(0x417A)),
            (std::vector<std::string>{"Active Set", "Detected Set", "Monitored Set", "Virtual Active Set"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0x5137)),
            (std::vector<std::string>{"GPRS Information", "GSM Serving Cell", "Neighboring Cells", "GSM RR Info"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0x7132)),
            (std::vector<std::string>{"Process PS", "Process CO", "Serving PLMN", "Process CS"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0x7131)), (std::vector<std::string>{"Process CO", "Process CS"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0x7135)),
            (std::vector<std::string>{"GPRS Information", "Serving PLMN"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0x51F6)),
            (std::vector<std::string>{"GPRS Information", "GSM RR Info"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0x4005)), (std::vector<std::string>{"GSM Set", "UMTS Set"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0xFF0001)),
            (std::vector<std::string>{"GSM Serving Cell", "Neighboring Cells", "Serving PLMN", "UMTS Set",
                                      "UMTS RR Info"}));
  EXPECT_EQ(index.sectionNames().size(), 26u);
}

TEST(GsmUmtsClassIndex, TheStartCommandListsTheSetLogOnceAndTheThreeExtraCodes) {
  log::ScopedCapture quiet;
  QND_GSMLogGenerator generator;
  const Dictionary command = generator.getStartCommand();
  std::vector<std::int64_t> codes;
  for (const Value& v : command.find("SetQuendraLogCodes")->asArray()->elements()) codes.push_back(*v.asInteger());
  EXPECT_EQ(std::count(codes.begin(), codes.end(), 0x417A), 1);
  std::vector<std::int64_t> extra;
  for (const Value& v : command.find("SetTsExtraCodes")->asArray()->elements()) extra.push_back(*v.asInteger());
  std::sort(extra.begin(), extra.end());
  EXPECT_EQ(extra, (std::vector<std::int64_t>{0, 1, 2}));
}

TEST_F(GsmUmtsDispatch, TheTemplateShowsEveryRowBeforeAnyPacket) {
  EXPECT_EQ(rowText("Serving PLMN", "PLMN Sel Mod"), "-");
  EXPECT_EQ(rowText("GSM Serving Cell", "MA Dedicated ARFCN"), "-");
  EXPECT_EQ(rowText("UMTS RR Info", "UARFCN"), "-");
  EXPECT_EQ(rowText("BLER", "Window Size"), "-");
  EXPECT_EQ(listSize("Active Set"), 0u);
  EXPECT_EQ(listSize("Non-Ranked GSM Set"), 0u);
}

// Edge case: C1 of -5 in bytes 16 to 19 is "-5" as a receive quality and
// 65531 as the serving cell's C1: each section keeps its own reading.
TEST_F(GsmUmtsDispatch, ACellMeasurementReachesTheServingCellTheNeighboursAndTheRadioResourceInfo) {
  log::ScopedCapture capture;
  Bytes p = test::gsmMeasurementPacket(60, -5, 3, {{62, 30, -5}});
  p[26] = 1;
  generator->updateWithData(p);
  EXPECT_EQ(warningTexts(capture),
            (std::vector<std::string>{"GPRSInformation", "GSMServingCell", "NeighboringCells", "GSMRRInfo"}));
  EXPECT_EQ(rowText("GSM Serving Cell", "C1 Value"), "65531");
  EXPECT_EQ(rowText("GSM RR Info", "Rx Quality Full"), "-5");
  EXPECT_EQ(rowText("GSM RR Info", "Rx Quality Sub"), "3");
  EXPECT_EQ(rowText("GSM RR Info", "Serving Rx Level"), "60");
  EXPECT_EQ(rowText("GPRS Information", "Cell Reselect Hysteresis"), "Applied");
  const Value* neighbours = findSection(display, "Neighboring Cells");
  ASSERT_TRUE(neighbours && neighbours->asArray() && neighbours->asArray()->size() == 1);
  EXPECT_EQ(*neighbours->asArray()->at(0).asDictionary()->find("C1 Value"), Value("-5"));
}

// The GSM list's count at 14 and the UMTS list's at 13 both count entries from 15.
TEST_F(GsmUmtsDispatch, ARankedListReachesTheGsmSetThenTheUmtsSetWhichReadTheSameBytes) {
  Bytes p = logPacket(0x4005, 15 + 10);
  p[13] = 1;
  p[14] = 1;
  put16(p, 15, 10700);
  put16(p, 17, 41);
  log::ScopedCapture capture;
  generator->updateWithData(p);
  EXPECT_EQ(warningTexts(capture), (std::vector<std::string>{"GSMSet", "UMTSSet"}));
  EXPECT_EQ(listSize("GSM Set"), 1u);
  EXPECT_EQ(listSize("UMTS Set"), 1u);
  const Value* gsm = findSection(display, "GSM Set");
  const Value* umts = findSection(display, "UMTS Set");
  EXPECT_EQ(*gsm->asArray()->at(0).asDictionary()->find("ARFCN"), Value("10700"));
  EXPECT_EQ(*umts->asArray()->at(0).asDictionary()->find("Downlink Frequency"), Value("10700"));
  EXPECT_EQ(*gsm->asArray()->at(0).asDictionary()->find("BSIC"), Value("41"));
  EXPECT_EQ(*umts->asArray()->at(0).asDictionary()->find("Scrambling Code"), Value("41"));
}

TEST_F(GsmUmtsDispatch, ACellListWhoseServingCellIsUmtsFillsServingPlmnButNotTheGsmServingCell) {
  log::ScopedCapture capture;
  generator->updateWithData(test::cellListPacket({monitorCell(
      test::kUmts, test::kServing,
      {{CellMonitorMCC, I(262)}, {CellMonitorMNC, I(1)}, {CellMonitorLAC, I(4660)}, {CellMonitorCellId, I(99)},
       {CellMonitorARFCN, I(10)}, {CellMonitorUARFCN, I(10713)}, {CellMonitorSCN, I(300)}})}));
  EXPECT_EQ(rowText("Serving PLMN", "Mobile Country Code"), "262");
  EXPECT_EQ(rowText("Serving PLMN", "Mobile Network Code"), "1");
  EXPECT_EQ(rowText("Serving PLMN", "Location Area Code"), "4660");
  EXPECT_EQ(rowText("GSM Serving Cell", "Cell ID"), "-");
  EXPECT_EQ(rowText("GSM Serving Cell", "ARFCN"), "-");
  EXPECT_EQ(rowText("UMTS RR Info", "Cell ID"), "99");
  EXPECT_EQ(rowText("UMTS RR Info", "UARFCN"), "10713");
}

// One service-state record reaches the three mobility sections (and the
// selection mode, one byte on, the serving PLMN).
TEST_F(GsmUmtsDispatch, AServiceStateReachesAllThreeMobilitySectionsInTheOrderOfTheTable) {
  Bytes p = logPacket(0x7132, 16);
  p[13] = 1;
  p[14] = 0;
  log::ScopedCapture capture;
  generator->updateWithData(p);
  EXPECT_EQ(warningTexts(capture), (std::vector<std::string>{"ProcessPS", "ProcessCS", "Serving PLMN", "ProcessCS"}));
  for (const char* section : {"Process CO", "Process CS", "Process PS"}) {
    EXPECT_EQ(rowText(section, "MM Service State"), "REG_STATE_IDLE") << section;
  }
  EXPECT_EQ(rowText("Serving PLMN", "PLMN Sel Mod"), "Automatic");
}

// 0x51F6's byte 16 is the DRX in seconds and the DRX timer maximum.
// Edge case: byte 16 = 4 shows "4 sec" and "4".
TEST_F(GsmUmtsDispatch, TheGprsCellOptionsReachTheGprsInformationThenTheRadioResourceInfo) {
  log::ScopedCapture capture;
  generator->updateWithData(test::gprsCellOptionsPacket(0, 4));
  EXPECT_EQ(warningTexts(capture), (std::vector<std::string>{"GPRSInformation", "GSMRRInfo"}));
  EXPECT_EQ(rowText("GPRS Information", "DRX Timer Max"), "4");
  EXPECT_EQ(rowText("GSM RR Info", "DRX Used"), "4 sec");
}

TEST_F(GsmUmtsDispatch, TheHsdpaStatisticsReachTheHsdpaInfo) {
  Bytes p = logPacket(0x4221, 27);
  p[13] = 2;
  p[16] = 1;
  p[18] = 3;
  generator->updateWithData(p);
  EXPECT_EQ(rowText("HSDPA Info", "Version"), "2");
  const Value* processes = findSection(display, "Primary HARQ Process");
  ASSERT_TRUE(processes && processes->asArray());
  ASSERT_EQ(processes->asArray()->size(), 1u);
  EXPECT_EQ(*processes->asArray()->at(0).asDictionary()->find("Process ID"), Value("3"));
}

}  // namespace
}  // namespace corvane
