// "Neighboring Cells": the neighbours of the GSM cell measurement, with the
// BSIC of their frequency from the last ARFCN-to-BSIC record, or the GSM
// neighbours of the cell-monitor list.

#include "LogGenerator/gsm_umts/NeighboringCells.h"

#include "gsm_umts/GsmCellPackets.h"
#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::gsmMeasurementPacket;
using test::GsmNeighbor;
using test::I;
using test::logPacket;
using test::monitorCell;
using test::put16;
using test::rowAt;
using test::rowText;
using test::S;

using Neighbors = test::GsmUmtsSectionTest<NeighboringCells>;

// 0x51FF: the number of pairs at 14, then 4 bytes a pair from 15: ARFCN
// (16 bits), BSIC, one byte not read.
Bytes arfcnBsicPacket(std::uint8_t count, const std::vector<std::pair<std::uint16_t, std::uint8_t>>& pairs) {
  Bytes p = logPacket(0x51FF, 15 + 4 * pairs.size());
  p[14] = count;
  std::size_t at = 15;
  for (const auto& [arfcn, bsic] : pairs) {
    put16(p, at, arfcn);
    p[at + 2] = bsic;
    p[at + 3] = 0xEE;
    at += 4;
  }
  return p;
}

const std::vector<GsmNeighbor> kTwoNeighbors = {{62, 200, -5}, {99, 30, 12}};

TEST_F(Neighbors, RegistersUnderItsNameForTheMeasurementTheBsicsAndTheCellList) {
  EXPECT_EQ(classDict.at("Neighboring Cells"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0x5137, 0x51FF, 0xFF0001}));
  EXPECT_EQ(codeDict.keys(), (std::vector<std::string>{"20791", "20991", "16711681"}));
}

TEST_F(Neighbors, EachNeighbourShowsArfcnRssiWithoutUnitAndSignedC1) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(list.at(0), D({{"ARFCN", S("62")}, {"RSSI", S("200")}, {"C1 Value", S("-5")}}));
  EXPECT_EQ(list.at(1), D({{"ARFCN", S("99")}, {"RSSI", S("30")}, {"C1 Value", S("12")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"NeighboringCells"}));
}

TEST_F(Neighbors, ANeighbourWhoseFrequencyHasABsicShowsIt) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(arfcnBsicPacket(2, {{62, 41}, {70, 7}}), 0x51FF);
  EXPECT_TRUE(list.empty());  // the pairs alone show nothing
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  EXPECT_EQ(list.at(0), D({{"ARFCN", S("62")}, {"RSSI", S("200")}, {"C1 Value", S("-5")}, {"BSIC", S("41")}}));
  EXPECT_EQ(list.at(1), D({{"ARFCN", S("99")}, {"RSSI", S("30")}, {"C1 Value", S("12")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"NeighboringCells", "NeighboringCells"}));
}

TEST_F(Neighbors, EachBsicRecordReplacesThePairsOfTheLast) {
  const Array list = attachList();
  feed(arfcnBsicPacket(1, {{62, 41}}), 0x51FF);
  feed(arfcnBsicPacket(1, {{99, 3}}), 0x51FF);
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  EXPECT_EQ(rowText(rowAt(list, 0), "BSIC"), "<none>");
  EXPECT_EQ(rowText(rowAt(list, 1), "BSIC"), "3");
  feed(arfcnBsicPacket(0, {}), 0x51FF);
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  EXPECT_EQ(rowText(rowAt(list, 1), "BSIC"), "<none>");
}

TEST_F(Neighbors, ALaterPairForTheSameArfcnWins) {
  const Array list = attachList();
  feed(arfcnBsicPacket(2, {{62, 41}, {62, 42}}), 0x51FF);
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  EXPECT_EQ(rowText(rowAt(list, 0), "BSIC"), "42");
}

TEST_F(Neighbors, BeforeAnyBsicRecordNoNeighbourHasABsic) {
  const Array list = attachList();
  feed(gsmMeasurementPacket(60, 1, 2, {{0, 1, 1}}), 0x5137);
  EXPECT_EQ(test::keysOf(rowAt(list, 0)), (std::vector<std::string>{"ARFCN", "RSSI", "C1 Value"}));
}

// Pairs that the count places past the end are not taken: the third pair here
// would read ARFCN 0 and BSIC 0.
TEST_F(Neighbors, PairsACountPlacesPastTheEndAreNotTaken) {
  const Array list = attachList();
  feed(arfcnBsicPacket(3, {{62, 41}, {70, 7}}), 0x51FF);
  feed(gsmMeasurementPacket(60, 1, 2, {{0, 1, 1}, {70, 1, 1}}), 0x5137);
  EXPECT_EQ(rowText(rowAt(list, 0), "BSIC"), "<none>");
  EXPECT_EQ(rowText(rowAt(list, 1), "BSIC"), "7");
}

TEST_F(Neighbors, ACountOf0EmptiesTheList) {
  const Array list = attachList();
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  feed(gsmMeasurementPacket(60, 1, 2), 0x5137);
  EXPECT_TRUE(list.empty());
}

TEST_F(Neighbors, NeighboursACountPlacesPastTheEndAreNotShown) {
  const Array list = attachList();
  Bytes p = gsmMeasurementPacket(60, 1, 2, kTwoNeighbors);
  p[28] = 5;
  p.resize(p.size() + 13);  // a third neighbour one byte short
  feed(p, 0x5137);
  EXPECT_EQ(list.size(), 2u);
}

TEST_F(Neighbors, TheBoundedAccessorsThrowAtTheCount) {
  const Bytes measurement = gsmMeasurementPacket(60, 1, 2, kTwoNeighbors);
  const BoundedList neighbors = NeighboringCells::neighbors(PacketView(measurement));
  EXPECT_EQ(neighbors.count(), 2u);
  EXPECT_EQ(neighbors.entryOffset(1), 43u);
  EXPECT_THROW(neighbors.entryOffset(2), ArrayOutOfBoundsException);
  const Bytes bsics = arfcnBsicPacket(2, {{62, 41}, {70, 7}});
  const BoundedList pairs = NeighboringCells::pairs(PacketView(bsics));
  EXPECT_EQ(pairs.entryOffset(1), 19u);
  EXPECT_THROW(pairs.entryOffset(2), ArrayOutOfBoundsException);
}

TEST_F(Neighbors, ShortRecordsAreDroppedSilentlyAndAnotherCodeIsLogged) {
  const Array list = attachList();
  feed(arfcnBsicPacket(1, {{62, 41}}), 0x51FF);
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  log::ScopedCapture capture;
  Bytes measurement = gsmMeasurementPacket(60, 1, 2);
  measurement.resize(28);
  feed(measurement, 0x5137);
  feed(logPacket(0x51FF, 14), 0x51FF);  // the pairs stay
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5134);
  EXPECT_EQ(list.size(), 2u);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "NeighboringCells"},
                                                     {log::kWarning, "NeighboringCells"},
                                                     {log::kWarning, "NeighboringCells"},
                                                     {log::kError, "Received an unknown log message: 20788"}}));
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  EXPECT_EQ(rowText(rowAt(list, 0), "BSIC"), "41");
}

TEST_F(Neighbors, TheCellListShowsItsGsmNeighboursWithTheirLevelInDbm) {
  const Array list = attachList();
  feed(arfcnBsicPacket(1, {{62, 41}}), 0x51FF);
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kGsm, test::kServing, {{CellMonitorARFCN, I(1)}}),
                             monitorCell(test::kGsm, test::kNeighbor, {{CellMonitorARFCN, I(62)}, {CellMonitorRSSI, I(-50)}}),
                             monitorCell(test::kUmts, test::kNeighbor, {{CellMonitorARFCN, I(2)}}),
                             monitorCell(test::kGsm, test::kNeighbor, {{CellMonitorARFCN, I(70)}, {CellMonitorRSSI, I(32767)}})}),
       0xFF0001);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(list.at(0), D({{"ARFCN", S("62")}, {"RSSI", S("-100 dBm")}}));
  EXPECT_EQ(list.at(1), D({{"ARFCN", S("70")}, {"RSSI", S("")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"NeighboringCells"}));
}

// The level is the low 16 bits of the number, signed.
TEST_F(Neighbors, TheCellListLevelIsItsLow16BitsSigned) {
  const Array list = attachList();
  feed(test::cellListPacket({monitorCell(test::kGsm, test::kNeighbor, {{CellMonitorARFCN, I(1)}, {CellMonitorRSSI, I(98303)}}),
                             monitorCell(test::kGsm, test::kNeighbor, {{CellMonitorARFCN, I(2)}, {CellMonitorRSSI, I(65535)}})}),
       0xFF0001);
  EXPECT_EQ(rowText(rowAt(list, 0), "RSSI"), "");
  EXPECT_EQ(rowText(rowAt(list, 1), "RSSI"), "-2 dBm");
}

TEST_F(Neighbors, ACellListValueThatFailsIsLoggedAndItsRowLeftOut) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kGsm, test::kNeighbor, {{CellMonitorRSSI, I(-40)}}),
                             monitorCell(test::kGsm, test::kNeighbor, {{CellMonitorARFCN, I(5)}})}),
       0xFF0001);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(list.at(0), D({{"RSSI", S("-80 dBm")}}));
  EXPECT_EQ(list.at(1), D({{"ARFCN", S("5")}}));
  EXPECT_EQ(capture.lines(), test::errorsAfter("NeighboringCells", {"NeighboringCells: Failed to retrieve ARFCN\n",
                                                                    "NeighboringCells: Failed to retrieve RSSI\n"}));
}

TEST_F(Neighbors, ACellListThatDoesNotParseEmptiesTheList) {
  const Array list = attachList();
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  log::ScopedCapture capture;
  feed(test::brokenCellListPacket(), 0xFF0001);
  EXPECT_TRUE(list.empty());
  EXPECT_EQ(capture.lines(), test::errorsAfter("NeighboringCells", {"Cell Info Array data could not be constructed",
                                                                    "Failed to get Cell Array\n"}));
}

TEST_F(Neighbors, ACellListWithoutGsmNeighboursEmptiesTheList) {
  const Array list = attachList();
  feed(gsmMeasurementPacket(60, 1, 2, kTwoNeighbors), 0x5137);
  feed(test::cellListPacket({monitorCell(test::kGsm, test::kServing, {})}), 0xFF0001);
  EXPECT_TRUE(list.empty());
}

}  // namespace
}  // namespace corvane
