// The LTE sections as the technology runs them: registered in the LTE class
// index in its order, given their containers by the LTE display template, and
// reached through the real generator's dispatch.

#include <gtest/gtest.h>

#include "LogGenerator/lte/LTEClassIndex.h"
#include "LogGenerator/gsm_umts/QND_GSMLogGenerator.h"
#include "LogGenerator/lte/LTELogGenerator.h"
#include "LogGenerator/utran/UTRANLogGenerator.h"
#include "platform/Log.h"
#include "support/GeneratorDisplay.h"
#include "support/Packets.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::logPacket;
using test::put16;

using LteDispatch = test::GeneratorDisplayTest<LTELogGenerator>;
using test::sectionNames;
using test::warningTexts;

TEST(LteClassIndex, MakesTheElevenSectionsInTheOrderOfItsTable) {
  log::ScopedCapture quiet;
  LTEClassIndex index;
  EXPECT_EQ(index.getAllLogCodes(), (std::vector<std::string>{"45250", "45249", "16711681", "45433", "45439",
                                                                "45440", "45446", "16711680", "16711682"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0xB179)),
            (std::vector<std::string>{"Connected mode LTE Intra-frequency Measurement", "Measured Neighbor Cells",
                                      "Detected Cells"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0xB180)),
            (std::vector<std::string>{"Neighbor Measurements", "Neighbor Cells List"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0xB186)),
            (std::vector<std::string>{"Reselection Candidates", "Reselection Candidates List"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0xFF0001)), (std::vector<std::string>{"Serving Cell Info"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0xFF0000)), (std::vector<std::string>{"SIM Info"}));
  EXPECT_EQ(sectionNames(index.getSubscribers(0xFF0002)), (std::vector<std::string>{"PDP Context Info"}));
  EXPECT_EQ(index.sectionNames().size(), 11u);
}

TEST(LteClassIndex, TheStartCommandAsksForTheSixLogCodesAndTheThreeExtraCodes) {
  log::ScopedCapture quiet;
  LTELogGenerator generator;
  const Dictionary command = generator.getStartCommand();
  EXPECT_EQ(*command.find("SetQuendraLogCodes"),
            test::A({test::I(0xB0C2), test::I(0xB0C1), test::I(0xB179), test::I(0xB17F), test::I(0xB180),
                     test::I(0xB186)}));
  EXPECT_EQ(*command.find("SetTsExtraCodes"), test::A({test::I(1), test::I(0), test::I(2)}));
}

TEST_F(LteDispatch, A0xB179PacketUpdatesAllThreeSectionsInIndexOrder) {
  Bytes p = logPacket(0xB179, 29 + 6 + 2);
  put16(p, 17, 6300);
  p[27] = 1;
  p[28] = 1;
  put16(p, 29, 12);
  put16(p, 35, 77);
  log::ScopedCapture capture;
  generator->updateWithData(p);
  EXPECT_EQ(warningTexts(capture), (std::vector<std::string>{"Connected mode LTE Intra-frequency Measurement",
                                                             "Measured Neighbor Cells", "Detected Cells"}));
  EXPECT_EQ(rowText("Connected mode LTE Intra-frequency Measurement", "E-ARFCN"), "6300");
  EXPECT_EQ(listSize("Measured Neighbor Cells"), 1u);
  EXPECT_EQ(listSize("Detected Cells"), 1u);
}

TEST_F(LteDispatch, A0xB180PacketUpdatesBothNeighbourSectionsInIndexOrder) {
  Bytes p = logPacket(0xB180, 21 + 20);
  put16(p, 17, 1850);
  log::ScopedCapture capture;
  generator->updateState(state, p);
  const auto texts = warningTexts(capture);
  ASSERT_GE(texts.size(), 2u);
  EXPECT_EQ(texts[0], "Neighbor Measurements");
  EXPECT_EQ(texts[1], "Neighbor Cells List");
  EXPECT_EQ(rowText("Neighbor Measurements", "E-ARFCN"), "1850");
  EXPECT_EQ(listSize("Neighbor Cells List"), 1u);
}

TEST_F(LteDispatch, A0xB186PacketUpdatesBothReselectionSectionsInIndexOrder) {
  Bytes p = logPacket(0xB186, 21 + 8);
  put16(p, 15, 5230);
  put16(p, 19, 1);
  log::ScopedCapture capture;
  generator->updateWithData(p);
  EXPECT_EQ(warningTexts(capture), (std::vector<std::string>{"Reselection Candidates", "Reselection Candidates List"}));
  EXPECT_EQ(rowText("Reselection Candidates", "Serving EARFCN"), "5230");
  EXPECT_EQ(listSize("Reselection Candidates List"), 1u);
}

TEST_F(LteDispatch, ServingCellRecordsReachTheirSections) {
  Bytes carrier = logPacket(0xB0C2, 38);
  carrier[20] = 100;
  Bytes antennas = logPacket(0xB0C1, 22);
  antennas[20] = 4;
  Bytes measurement = logPacket(0xB17F, 33);
  measurement[13] = 9;
  log::ScopedCapture capture;
  generator->updateWithData(carrier);
  generator->updateWithData(antennas);
  generator->updateWithData(measurement);
  EXPECT_EQ(rowText("Serving Cell Info", "Download Bandwidth"), "20 MHz");
  EXPECT_EQ(rowText("Serving Cell Info", "Num Tx Antennas"), "4");
  EXPECT_EQ(rowText("Serving Cell Measurements", "Version"), "9");
  EXPECT_EQ(capture.sink().count("Received an unknown log message: 45249"), 1u);
}

// The template holds a row for every key a section writes, and a UARFCN row
// until the first carrier record removes it.
TEST_F(LteDispatch, TheTemplateShowsEveryRowBeforeAnyPacket) {
  EXPECT_EQ(rowText("Serving Cell Info", "UARFCN"), "-");
  EXPECT_EQ(rowText("Serving Cell Measurements", "Num of Consecutive DRX Cycles of S < 0"), "-");
  EXPECT_EQ(listSize("Neighbor Cells List"), 0u);
  generator->updateWithData(logPacket(0xB0C2, 38));
  EXPECT_EQ(rowText("Serving Cell Info", "UARFCN"), "<none>");
}

}  // namespace
}  // namespace corvane
