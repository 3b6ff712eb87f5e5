// "Serving Cell Info" of UTRAN: record 0xD0E2 (restrictions at 14, URA at 15,
// uplink UARFCN at 17, downlink at 19, cell identity at 21, access bit 0 of
// 25) and the serving UTRAN2 cells of the cell-monitor list.

#include "LogGenerator/utran/UTRANServingCellInfo.h"

#include "utran/UtranSectionFixture.h"

namespace corvane {
namespace {

using test::cellListPacket;
using test::I;
using test::kGsm;
using test::kNeighbor;
using test::kServing;
using test::kUtran2;
using test::logPacket;
using test::monitorCell;
using test::put16;
using test::put32;
using test::rowText;

using UtranServingCellInfo = test::UtranSectionTest<UTRANServingCellInfo>;

Bytes servingCellPacket(std::uint8_t access) {
  Bytes p = logPacket(0xD0E2, 26);
  p[14] = 4;
  p[15] = 17;
  put16(p, 17, 9613);
  put16(p, 19, 10563);
  put32(p, 21, 0x0012D687);
  p[25] = access;
  return p;
}

TEST_F(UtranServingCellInfo, RegistersForTheRecordAndTheCellList) {
  EXPECT_EQ(classDict.at("Serving Cell Info"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0xD0E2, 0xFF0001}));
}

TEST_F(UtranServingCellInfo, TheRecordWritesItsSixRowsInOrder) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(servingCellPacket(0), 0xD0E2);
  EXPECT_EQ(capture.lines(), test::warnings({"Serving Cell Info"}));
  EXPECT_EQ(test::keysOf(rows), (std::vector<std::string>{"Cell Access Restrictions", "Cell ID", "Downlink UARFCN",
                                                          "Uplink UARFCN", "URA ID", "Allowed Access"}));
  EXPECT_EQ(rowText(rows, "Cell Access Restrictions"), "4");
  EXPECT_EQ(rowText(rows, "Cell ID"), "1234567");
  EXPECT_EQ(rowText(rows, "Downlink UARFCN"), "10563");
  EXPECT_EQ(rowText(rows, "Uplink UARFCN"), "9613");
  EXPECT_EQ(rowText(rows, "URA ID"), "17");
  EXPECT_EQ(rowText(rows, "Allowed Access"), "All Calls");
}

TEST_F(UtranServingCellInfo, AccessBitZeroSetIsEmergencyCallsOnlyAndOtherBitsDoNotCount) {
  const Dictionary rows = attachRows();
  log::ScopedCapture quiet;
  feed(servingCellPacket(0x03), 0xD0E2);
  EXPECT_EQ(rowText(rows, "Allowed Access"), "Emergency Calls Only");
  feed(servingCellPacket(0x02), 0xD0E2);
  EXPECT_EQ(rowText(rows, "Allowed Access"), "All Calls");
}

TEST_F(UtranServingCellInfo, ACellIdentityOfAllOnesShowsMinusOne) {
  const Dictionary rows = attachRows();
  Bytes p = servingCellPacket(0);
  p[21] = 0xFF;
  p[22] = 0xFF;
  p[23] = 0xFF;
  p[24] = 0xFF;
  log::ScopedCapture quiet;
  feed(p, 0xD0E2);
  EXPECT_EQ(rowText(rows, "Cell ID"), "-1");
}

TEST_F(UtranServingCellInfo, AShortRecordIsDroppedWithoutAMessage) {
  const Dictionary rows = attachRows();
  Bytes p = servingCellPacket(1);
  p.pop_back();
  log::ScopedCapture capture;
  feed(p, 0xD0E2);
  EXPECT_EQ(capture.lines(), test::warnings({"Serving Cell Info"}));
  EXPECT_EQ(rows.size(), 0u);
}

TEST_F(UtranServingCellInfo, AServingCellWithoutAScramblingCodeLogsOneFailureAndWritesTheOtherFourValues) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(cellListPacket({monitorCell(kUtran2, kServing,
                                   {{CellMonitorLAC, I(4660)},
                                    {CellMonitorCellId, I(1234567)},
                                    {CellMonitorBandInfo, I(1)},
                                    {CellMonitorUARFCN, I(10563)}})}),
       0xFF0001);
  const std::vector<log::Line> expected = {{log::kWarning, "Serving Cell Info"},
                                           {log::kError, "Serving Cell Info: Failed to retrieve Cell Scrambling Code\n"}};
  EXPECT_EQ(capture.lines(), expected);
  EXPECT_EQ(rowText(rows, "Local Area Code"), "4660");
  EXPECT_EQ(rowText(rows, "Cell ID"), "1234567");
  EXPECT_EQ(rowText(rows, "Freq Band Indicator"), "1");
  EXPECT_EQ(rowText(rows, "Uplink UARFCN"), "10563");
  EXPECT_EQ(rowText(rows, "Downlink UARFCN"), "10563");
  EXPECT_FALSE(rows.contains("Cell Scrambling Code"));
}

TEST_F(UtranServingCellInfo, TheCellListUarfcnOverwritesBothFrequenciesOfTheRecord) {
  const Dictionary rows = attachRows();
  log::ScopedCapture quiet;
  feed(servingCellPacket(0), 0xD0E2);
  ASSERT_EQ(rowText(rows, "Uplink UARFCN"), "9613");
  feed(cellListPacket({monitorCell(kUtran2, kServing,
                                   {{CellMonitorLAC, I(1)},
                                    {CellMonitorCellId, I(2)},
                                    {CellMonitorBandInfo, I(1)},
                                    {CellMonitorSCN, I(300)},
                                    {CellMonitorUARFCN, I(10700)}})}),
       0xFF0001);
  EXPECT_EQ(rowText(rows, "Uplink UARFCN"), "10700");
  EXPECT_EQ(rowText(rows, "Downlink UARFCN"), "10700");
  EXPECT_EQ(rowText(rows, "Cell Scrambling Code"), "300");
  // Rows that the list does not hold keep the record's values.
  EXPECT_EQ(rowText(rows, "URA ID"), "17");
}

TEST_F(UtranServingCellInfo, OnlyServingUtran2CellsCountAndTheLastOneShows) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(cellListPacket({monitorCell(kUtran2, kServing, {{CellMonitorLAC, I(1)}}),
                       monitorCell(kUtran2, kNeighbor, {{CellMonitorLAC, I(2)}}),
                       monitorCell(kGsm, kServing, {{CellMonitorLAC, I(3)}}),
                       monitorCell(kUtran2, kServing, {{CellMonitorLAC, I(4)}})}),
       0xFF0001);
  EXPECT_EQ(rowText(rows, "Local Area Code"), "4");
  // Two serving UTRAN2 cells, each without four values.
  EXPECT_EQ(capture.lines().size(), 1u + 2u * 4u);
}

TEST_F(UtranServingCellInfo, AListThatDoesNotParseChangesNothing) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(test::brokenCellListPacket(), 0xFF0001);
  const std::vector<log::Line> expected = {{log::kWarning, "Serving Cell Info"},
                                           {log::kError, "Cell Info Array data could not be constructed"}};
  EXPECT_EQ(capture.lines(), expected);
  EXPECT_EQ(rows.size(), 0u);
}

}  // namespace
}  // namespace corvane
