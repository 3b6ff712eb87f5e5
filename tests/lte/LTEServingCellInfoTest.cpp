// "Serving Cell Info" of LTE: the carrier record, the antenna record and the
// cell-monitor list, each refreshing part of the same rows.

#include "LogGenerator/lte/LTEServingCellInfo.h"

#include "lte/LteSectionFixture.h"
#include "platform/CellMonitor.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::A;
using test::binaryBytes;
using test::D;
using test::extraCodePacket;
using test::I;
using test::logPacket;
using test::put16;
using test::put32;
using test::rowText;
using test::S;

using ServingCellInfo = test::LteSectionTest<LTEServingCellInfo>;

Bytes carrierPacket(std::size_t size = 38) {
  Bytes p = logPacket(0xB0C2, size);
  put16(p, 14, 301);
  put16(p, 16, 6300);
  put16(p, 18, 24300);
  p[20] = 50;
  p[21] = 25;
  put32(p, 22, 26543617);
  put16(p, 26, 4660);
  put32(p, 28, 20);
  return p;
}

Value lteCell(const char* type, std::initializer_list<std::pair<std::string, Value>> numbers) {
  Dictionary cell;
  cell.set(CellMonitorCellRadioAccessTechnology, S(std::string(CellMonitorRadioAccessTechnologyLTE)));
  cell.set(CellMonitorCellType, S(type));
  for (const auto& [k, v] : numbers) cell.set(k, v);
  return Value(cell);
}

Bytes cellListPacket(const Value& cells) { return extraCodePacket(1, binaryBytes(cells)); }

const std::string kServing(CellMonitorCellTypeServing);
const std::string kNeighbor(CellMonitorCellTypeNeighbor);

TEST_F(ServingCellInfo, RegistersUnderItsNameForTheCarrierAntennaAndCellListCodes) {
  EXPECT_EQ(classDict.at("Serving Cell Info"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0xB0C2, 0xB0C1, 0xFF0001}));
  EXPECT_EQ(codeDict.keys(), (std::vector<std::string>{"45250", "45249", "16711681"}));
}

TEST_F(ServingCellInfo, ACarrierRecordSetsItsEightRowsInOrder) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(carrierPacket(), 0xB0C2);
  EXPECT_EQ(test::keysOf(rows), (std::vector<std::string>{"Physical Cell ID", "Download Frequency", "Upload Frequency",
                                                          "Download Bandwidth", "Upload Bandwidth", "Cell Identity",
                                                          "Tracking Area Code", "Freq Band Indicator"}));
  EXPECT_EQ(rowText(rows, "Physical Cell ID"), "301");
  EXPECT_EQ(rowText(rows, "Download Frequency"), "6300");
  EXPECT_EQ(rowText(rows, "Upload Frequency"), "24300");
  EXPECT_EQ(rowText(rows, "Download Bandwidth"), "10 MHz");
  EXPECT_EQ(rowText(rows, "Upload Bandwidth"), "5 MHz");
  EXPECT_EQ(rowText(rows, "Cell Identity"), "26543617");
  EXPECT_EQ(rowText(rows, "Tracking Area Code"), "4660");
  EXPECT_EQ(rowText(rows, "Freq Band Indicator"), "20");
  EXPECT_EQ(capture.lines(), test::warnings({"LTE Serving Cell Info"}));
}

TEST_F(ServingCellInfo, A37ByteCarrierRecordChangesNothingAndLogsOnlyTheTrace) {
  const Dictionary rows = test::Dict({{"Physical Cell ID", S("-")}, {"UARFCN", S("1300")}});
  section->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  feed(carrierPacket(37), 0xB0C2);
  EXPECT_EQ(Value(rows), D({{"Physical Cell ID", S("-")}, {"UARFCN", S("1300")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"LTE Serving Cell Info"}));
}

TEST_F(ServingCellInfo, BandwidthsOutsideTheTableShowUnknown) {
  const Dictionary rows = attachRows();
  Bytes p = carrierPacket();
  p[20] = 7;
  p[21] = 100;
  feed(p, 0xB0C2);
  EXPECT_EQ(rowText(rows, "Download Bandwidth"), "Unknown");
  EXPECT_EQ(rowText(rows, "Upload Bandwidth"), "20 MHz");
}

TEST_F(ServingCellInfo, EveryBandwidthOfTheTableHasItsText) {
  const Dictionary rows = attachRows();
  const std::vector<std::pair<std::uint8_t, std::string>> table = {
      {6, "1.4 MHz"}, {15, "3 MHz"}, {25, "5 MHz"}, {50, "10 MHz"}, {75, "15 MHz"}, {100, "20 MHz"}, {0, "Unknown"},
      {255, "Unknown"}};
  for (const auto& [blocks, text] : table) {
    Bytes p = carrierPacket();
    p[20] = blocks;
    feed(p, 0xB0C2);
    EXPECT_EQ(rowText(rows, "Download Bandwidth"), text) << int(blocks);
  }
}

// "%d" of a 32-bit field: the top bit makes it negative.
TEST_F(ServingCellInfo, ThirtyTwoBitFieldsShowAsSignedDecimals) {
  const Dictionary rows = attachRows();
  Bytes p = carrierPacket();
  put32(p, 22, 0xFFFFFFFF);
  put32(p, 28, 0x80000000);
  feed(p, 0xB0C2);
  EXPECT_EQ(rowText(rows, "Cell Identity"), "-1");
  EXPECT_EQ(rowText(rows, "Freq Band Indicator"), "-2147483648");
}

TEST_F(ServingCellInfo, AnAntennaRecordSetsTheAntennaCountAndIsThenTracedAsUnknown) {
  const Dictionary rows = attachRows();
  Bytes p = logPacket(0xB0C1, 22);
  p[20] = 2;
  log::ScopedCapture capture;
  feed(p, 0xB0C1);
  EXPECT_EQ(Value(rows), D({{"Num Tx Antennas", S("2")}}));
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "LTE Serving Cell Info"},
                                                     {log::kError, "Received an unknown log message: 45249"}}));
}

TEST_F(ServingCellInfo, A21ByteAntennaRecordIsDroppedSilently) {
  const Dictionary rows = attachRows();
  Bytes p = logPacket(0xB0C1, 21);
  p[20] = 2;
  log::ScopedCapture capture;
  feed(p, 0xB0C1);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"LTE Serving Cell Info"}));
}

TEST_F(ServingCellInfo, AnyOtherCodeIsLoggedAsUnknown) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(carrierPacket(), 0xB17F);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "LTE Serving Cell Info"},
                                                     {log::kError, "Received an unknown log message: 45439"}}));
}

TEST_F(ServingCellInfo, TheServingLteCellOfTheCellListSetsFiveRows) {
  const Dictionary rows = attachRows();
  const Value cells = A({
      D({{std::string(CellMonitorCellRadioAccessTechnology), S(std::string(CellMonitorRadioAccessTechnologyUMTS))},
         {std::string(CellMonitorCellType), S(kServing)},
         {std::string(CellMonitorTAC), I(1)}}),
      lteCell(kNeighbor.c_str(), {{std::string(CellMonitorTAC), I(2)}}),
      lteCell(kServing.c_str(), {{std::string(CellMonitorTAC), I(4660)},
                                 {std::string(CellMonitorCellId), I(26543617)},
                                 {std::string(CellMonitorPID), I(301)},
                                 {std::string(CellMonitorBandInfo), I(20)},
                                 {std::string(CellMonitorUARFCN), I(-5)}}),
      lteCell(kServing.c_str(), {{std::string(CellMonitorTAC), I(9)}}),
  });
  log::ScopedCapture capture;
  feed(cellListPacket(cells), 0xFF0001);
  EXPECT_EQ(Value(rows), D({{"Tracking Area Code", S("4660")},
                            {"Cell Identity", S("26543617")},
                            {"Physical Cell ID", S("301")},
                            {"Freq Band Indicator", S("20")},
                            {"UARFCN", S("-5")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"LTE Serving Cell Info"}));
}

TEST_F(ServingCellInfo, ACarrierRecordAfterACellListRemovesTheUarfcnRow) {
  const Dictionary rows = attachRows();
  feed(cellListPacket(A({lteCell(kServing.c_str(), {{std::string(CellMonitorTAC), I(1)},
                                                    {std::string(CellMonitorCellId), I(2)},
                                                    {std::string(CellMonitorPID), I(3)},
                                                    {std::string(CellMonitorBandInfo), I(4)},
                                                    {std::string(CellMonitorUARFCN), I(1300)}})})),
       0xFF0001);
  ASSERT_EQ(rowText(rows, "UARFCN"), "1300");
  feed(carrierPacket(), 0xB0C2);
  EXPECT_FALSE(rows.contains("UARFCN"));
  EXPECT_EQ(rowText(rows, "Tracking Area Code"), "4660");
}

TEST_F(ServingCellInfo, ACellListWhoseOnlyLteCellIsANeighbourChangesNothing) {
  const Dictionary rows = test::Dict({{"Tracking Area Code", S("7")}});
  section->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  feed(cellListPacket(A({lteCell(kNeighbor.c_str(), {{std::string(CellMonitorTAC), I(1)},
                                                     {std::string(CellMonitorCellId), I(2)}})})),
       0xFF0001);
  EXPECT_EQ(Value(rows), D({{"Tracking Area Code", S("7")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"LTE Serving Cell Info"}));
}

TEST_F(ServingCellInfo, AServingCellWithoutATacLogsItAndStillSetsTheOtherFourRows) {
  const Dictionary rows = test::Dict({{"Tracking Area Code", S("7")}});
  section->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  feed(cellListPacket(A({lteCell(kServing.c_str(), {{std::string(CellMonitorCellId), I(2)},
                                                    {std::string(CellMonitorPID), I(3)},
                                                    {std::string(CellMonitorBandInfo), I(4)},
                                                    {std::string(CellMonitorUARFCN), I(5)}})})),
       0xFF0001);
  EXPECT_EQ(Value(rows), D({{"Tracking Area Code", S("7")},
                            {"Cell Identity", S("2")},
                            {"Physical Cell ID", S("3")},
                            {"Freq Band Indicator", S("4")},
                            {"UARFCN", S("5")}}));
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "LTE Serving Cell Info"},
                                                     {log::kError, "Serving Cell Info: Failed to retrieve TAC\n"}}));
}

TEST_F(ServingCellInfo, EachUnreadableValueIsLoggedInTurn) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(cellListPacket(A({lteCell(kServing.c_str(), {{std::string(CellMonitorTAC), S("1")}})})), 0xFF0001);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(),
            (std::vector<log::Line>{{log::kWarning, "LTE Serving Cell Info"},
                                    {log::kError, "Serving Cell Info: Failed to retrieve TAC\n"},
                                    {log::kError, "Serving Cell Info: Failed to retrieve Cell ID\n"},
                                    {log::kError, "Serving Cell Info: Failed to retrieve Physical Cell ID\n"},
                                    {log::kError, "Serving Cell Info: Failed to retrieve Freq Band Indicator\n"},
                                    {log::kError, "Serving Cell Info: Failed to retrieve UARFCN\n"}}));
}

TEST_F(ServingCellInfo, CellsWithoutATechnologyOrATypeAreSkipped) {
  const Dictionary rows = attachRows();
  const Value cells = A({
      S("not a cell"),
      D({{std::string(CellMonitorCellType), S(kServing)}, {std::string(CellMonitorTAC), I(1)}}),
      D({{std::string(CellMonitorCellRadioAccessTechnology), S(std::string(CellMonitorRadioAccessTechnologyLTE))},
         {std::string(CellMonitorTAC), I(2)}}),
      lteCell(kServing.c_str(), {{std::string(CellMonitorTAC), I(3)}}),
  });
  feed(cellListPacket(cells), 0xFF0001);
  EXPECT_EQ(rowText(rows, "Tracking Area Code"), "3");
}

TEST_F(ServingCellInfo, ACellListThatIsNoArrayIsLogged) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(cellListPacket(D({{"a", S("b")}})), 0xFF0001);
  feed(extraCodePacket(1, Bytes{0xde, 0xad}), 0xFF0001);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "LTE Serving Cell Info"},
                                                     {log::kError, "Failed to get Cell Array\n"},
                                                     {log::kWarning, "LTE Serving Cell Info"},
                                                     {log::kError, "Cell Info Array data could not be constructed"},
                                                     {log::kError, "Failed to get Cell Array\n"}}));
}

TEST_F(ServingCellInfo, AnEmptyCellListChangesNothingSilently) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(cellListPacket(A({})), 0xFF0001);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"LTE Serving Cell Info"}));
}

TEST_F(ServingCellInfo, WithoutADisplayThePacketsGoNowhereButAreStillTraced) {
  log::ScopedCapture capture;
  Bytes p = logPacket(0xB0C1, 22);
  feed(p, 0xB0C1);
  feed(carrierPacket(), 0xB0C2);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "LTE Serving Cell Info"},
                                                     {log::kError, "Received an unknown log message: 45249"},
                                                     {log::kWarning, "LTE Serving Cell Info"}}));
}

}  // namespace
}  // namespace corvane
