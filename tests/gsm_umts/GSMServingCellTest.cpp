// "GSM Serving Cell": the cell identity, the serving cell's measurement, the
// dedicated mobile allocation and the GSM serving cell of the cell-monitor
// list.

#include "LogGenerator/gsm_umts/GSMServingCell.h"

#include "gsm_umts/GsmCellPackets.h"
#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::gsmMeasurementPacket;
using test::I;
using test::logPacket;
using test::monitorCell;
using test::put16;
using test::rowText;
using test::S;

using GsmServingCell = test::GsmUmtsSectionTest<GSMServingCell>;

// 0x5134: ARFCN at 13, BSIC at 15, cell id at 17, 16 bits each.
Bytes identityPacket(std::size_t size = 26) {
  Bytes p = logPacket(0x5134, size);
  put16(p, 13, 62);
  put16(p, 15, 41);
  put16(p, 17, 12345);
  return p;
}

Bytes dedicatedAllocationPacket(std::uint16_t arfcn, std::size_t size = 17) {
  Bytes p = logPacket(0x5076, size);
  put16(p, 13, arfcn);
  return p;
}

TEST_F(GsmServingCell, RegistersUnderItsNameForItsThreeRecordsAndTheCellList) {
  EXPECT_EQ(classDict.at("GSM Serving Cell"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0x5134, 0x5137, 0x5076, 0xFF0001}));
  EXPECT_EQ(codeDict.keys(), (std::vector<std::string>{"20788", "20791", "20598", "16711681"}));
}

TEST_F(GsmServingCell, AnIdentityRecordSetsCellIdArfcnAndBsicInOrder) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(identityPacket(), 0x5134);
  EXPECT_EQ(Value(rows), D({{"Cell ID", S("12345")}, {"ARFCN", S("62")}, {"BSIC", S("41")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"GSMServingCell"}));
}

TEST_F(GsmServingCell, AMeasurementSetsRssiC1AndC2) {
  const Dictionary rows = attachRows();
  feed(gsmMeasurementPacket(60, 25, 31), 0x5137);
  EXPECT_EQ(Value(rows), D({{"RSSI", S("60 dBm")}, {"C1 Value", S("25")}, {"C2 Value", S("31")}}));
}

// The level byte shows unsigned, with no offset.
TEST_F(GsmServingCell, TheRssiIsTheUnsignedByteInDbm) {
  const Dictionary rows = attachRows();
  feed(gsmMeasurementPacket(200, 0, 0), 0x5137);
  EXPECT_EQ(rowText(rows, "RSSI"), "200 dBm");
}

TEST_F(GsmServingCell, C1AndC2ShowTheirLow16BitsUnsigned) {
  const Dictionary rows = attachRows();
  feed(gsmMeasurementPacket(60, -5, 70000), 0x5137);
  EXPECT_EQ(rowText(rows, "C1 Value"), "65531");
  EXPECT_EQ(rowText(rows, "C2 Value"), "4464");  // 70000 = 0x11170
}

TEST_F(GsmServingCell, TheDedicatedArfcnShowsItsLowByteOnly) {
  const Dictionary rows = attachRows();
  feed(dedicatedAllocationPacket(0x0123), 0x5076);
  EXPECT_EQ(Value(rows), D({{"MA Dedicated ARFCN", S("35")}}));
  feed(dedicatedAllocationPacket(0x01FF), 0x5076);
  EXPECT_EQ(rowText(rows, "MA Dedicated ARFCN"), "255");
}

TEST_F(GsmServingCell, RecordsShorterThanTheirLayoutAreDroppedSilently) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(identityPacket(25), 0x5134);
  Bytes measurement = gsmMeasurementPacket(60, 1, 2);
  measurement.resize(28);
  feed(measurement, 0x5137);
  feed(dedicatedAllocationPacket(7, 16), 0x5076);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"GSMServingCell", "GSMServingCell", "GSMServingCell"}));
}

TEST_F(GsmServingCell, AnyOtherCodeIsLoggedAsUnknown) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(identityPacket(), 0x51FF);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::errorsAfter("GSMServingCell", {"Received an unknown log message: 20991"}));
}

TEST_F(GsmServingCell, TheGsmServingCellOfTheCellListSetsCellIdAndArfcn) {
  const Dictionary rows = attachRows();
  feed(identityPacket(), 0x5134);
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kGsm, test::kNeighbor, {{CellMonitorCellId, I(1)}}),
                             monitorCell(test::kGsm, test::kServing, {{CellMonitorCellId, I(4242)},
                                                                      {CellMonitorARFCN, I(975)}}),
                             monitorCell(test::kGsm, test::kServing, {{CellMonitorCellId, I(3)}})}),
       0xFF0001);
  EXPECT_EQ(Value(rows), D({{"Cell ID", S("4242")}, {"ARFCN", S("975")}, {"BSIC", S("41")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"GSMServingCell"}));
}

TEST_F(GsmServingCell, AUmtsServingCellIsNoGsmServingCell) {
  const Dictionary rows = attachRows();
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kServing, {{CellMonitorCellId, I(7)}})}), 0xFF0001);
  EXPECT_TRUE(rows.empty());
}

TEST_F(GsmServingCell, AMissingCellIdIsLoggedAndTheArfcnStillSet) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kGsm, test::kServing, {{CellMonitorARFCN, I(10)}})}), 0xFF0001);
  EXPECT_EQ(Value(rows), D({{"ARFCN", S("10")}}));
  EXPECT_EQ(capture.lines(), test::errorsAfter("GSMServingCell", {"GSMServingCell: Failed to retrieve Cell ID\n"}));
  capture.sink().clear();
  feed(test::cellListPacket({monitorCell(test::kGsm, test::kServing, {{CellMonitorCellId, I(10)}})}), 0xFF0001);
  EXPECT_EQ(capture.lines(), test::errorsAfter("GSMServingCell", {"GSMServingCell: Failed to retrieve ARFCN\n"}));
}

TEST_F(GsmServingCell, ACellListThatDoesNotParseIsLoggedTwice) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(test::brokenCellListPacket(), 0xFF0001);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::errorsAfter("GSMServingCell", {"Cell Info Array data could not be constructed",
                                                                  "Failed to get Cell Array\n"}));
}

}  // namespace
}  // namespace corvane
