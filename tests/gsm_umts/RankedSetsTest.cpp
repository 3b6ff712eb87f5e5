// The ranked idle-mode neighbour lists of 0x4005: "UMTS Set" (also from the
// cell-monitor list) and "GSM Set", which read overlapping bytes of the same
// record; and the two non-ranked sets, which take no packets.

#include "LogGenerator/gsm_umts/GSMSet.h"
#include "LogGenerator/gsm_umts/NonRankedGSMSet.h"
#include "LogGenerator/gsm_umts/NonRankedUMTSSet.h"
#include "LogGenerator/gsm_umts/UMTSSet.h"
#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::I;
using test::logPacket;
using test::monitorCell;
using test::put16;
using test::rowAt;
using test::rowText;
using test::S;

struct UmtsCell {
  std::int16_t uarfcn = 10700;
  std::uint16_t scramblingCode = 300;
  std::int8_t rscp = -80;
  std::int16_t rankRscp = -95;
  std::int8_t ecNo = -10;
  std::int16_t ranking = -3;
};

// 0x4005 with UMTS cells: their count at 13, then 10 bytes a cell from 15:
// UARFCN, scrambling code (16 bits each), RSCP (8), ranking RSCP (16), Ec/No
// (8), ranking value (16).
Bytes umtsCellsPacket(const std::vector<UmtsCell>& cells) {
  Bytes p = logPacket(0x4005, 15 + 10 * cells.size());
  p[13] = static_cast<std::uint8_t>(cells.size());
  std::size_t at = 15;
  for (const UmtsCell& c : cells) {
    put16(p, at, static_cast<std::uint16_t>(c.uarfcn));
    put16(p, at + 2, c.scramblingCode);
    p[at + 4] = static_cast<std::uint8_t>(c.rscp);
    put16(p, at + 5, static_cast<std::uint16_t>(c.rankRscp));
    p[at + 7] = static_cast<std::uint8_t>(c.ecNo);
    put16(p, at + 8, static_cast<std::uint16_t>(c.ranking));
    at += 10;
  }
  return p;
}

struct GsmCell {
  std::uint16_t arfcn = 62;
  std::uint16_t bsic = 41;
  std::int8_t rssi = -90;
  std::int16_t ranking = -12;
};

// 0x4005 with GSM cells: their count at 14, then 7 bytes a cell from 15:
// ARFCN, BSIC (16 bits each), RSSI (8), ranking value (16).
Bytes gsmCellsPacket(const std::vector<GsmCell>& cells) {
  Bytes p = logPacket(0x4005, 15 + 7 * cells.size());
  p[14] = static_cast<std::uint8_t>(cells.size());
  std::size_t at = 15;
  for (const GsmCell& c : cells) {
    put16(p, at, c.arfcn);
    put16(p, at + 2, c.bsic);
    p[at + 4] = static_cast<std::uint8_t>(c.rssi);
    put16(p, at + 5, static_cast<std::uint16_t>(c.ranking));
    at += 7;
  }
  return p;
}

// --- UMTS Set ---

using Umts = test::GsmUmtsSectionTest<UMTSSet>;

TEST_F(Umts, RegistersUnderItsNameForTheRankedListAndTheCellList) {
  EXPECT_EQ(classDict.at("UMTS Set"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0x4005, 0xFF0001}));
  EXPECT_EQ(codeDict.keys(), (std::vector<std::string>{"16389", "16711681"}));
}

TEST_F(Umts, EachCellShowsItsSixRowsInOrder) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(umtsCellsPacket({UmtsCell{}, {-1, 511, 127, 32767, 127, 32767}}), 0x4005);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(test::keysOf(rowAt(list, 0)), (std::vector<std::string>{"Scrambling Code", "RSCP", "Energy Per Chip",
                                                                     "Downlink Frequency", "Ranking Value",
                                                                     "Rank Cell RSCP"}));
  EXPECT_EQ(list.at(0), D({{"Scrambling Code", S("300")},
                           {"RSCP", S("-101 dB")},
                           {"Energy Per Chip", S("-5.000000 dB")},
                           {"Downlink Frequency", S("10700")},
                           {"Ranking Value", S("-3")},
                           {"Rank Cell RSCP", S("-95 dB")}}));
  EXPECT_EQ(list.at(1), D({{"Scrambling Code", S("511")},
                           {"RSCP", S("106 dB")},
                           {"Energy Per Chip", S("63.500000 dB")},
                           {"Downlink Frequency", S("-1")},
                           {"Ranking Value", S("32767")},
                           {"Rank Cell RSCP", S("32767 dB")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"UMTSSet"}));
}

// RSCP is the signed byte less 21; Ec/No the signed byte in half decibels, printed with six decimals.
TEST_F(Umts, AnRscpByte0x9CShowsMinus121DbAndAnEcNoByte0xF1Minus7Point5Db) {
  const Array list = attachList();
  Bytes p = umtsCellsPacket({UmtsCell{}});
  p[15 + 4] = 0x9C;
  p[15 + 7] = 0xF1;
  feed(p, 0x4005);
  EXPECT_EQ(rowText(rowAt(list, 0), "RSCP"), "-121 dB");
  EXPECT_EQ(rowText(rowAt(list, 0), "Energy Per Chip"), "-7.500000 dB");
}

TEST_F(Umts, ACountOf0EmptiesTheList) {
  const Array list = attachList();
  feed(umtsCellsPacket({UmtsCell{}}), 0x4005);
  feed(umtsCellsPacket({}), 0x4005);
  EXPECT_TRUE(list.empty());
}

TEST_F(Umts, CellsACountPlacesPastTheEndAreNotShown) {
  const Array list = attachList();
  Bytes p = umtsCellsPacket({UmtsCell{}, UmtsCell{}});
  p[13] = 3;
  p.resize(p.size() + 9);  // a third cell one byte short
  feed(p, 0x4005);
  EXPECT_EQ(list.size(), 2u);
}

TEST_F(Umts, TheBoundedAccessorThrowsAtTheCount) {
  const Bytes p = umtsCellsPacket({UmtsCell{}, UmtsCell{}});
  const BoundedList cells = UMTSSet::cells(PacketView(p));
  EXPECT_EQ(cells.entryOffset(1), 25u);
  EXPECT_THROW(cells.entryOffset(2), ArrayOutOfBoundsException);
}

TEST_F(Umts, A14BytePacketLeavesTheListAndAnotherCodeIsLogged) {
  const Array list = attachList();
  feed(umtsCellsPacket({UmtsCell{}}), 0x4005);
  log::ScopedCapture capture;
  feed(logPacket(0x4005, 14), 0x4005);
  feed(umtsCellsPacket({}), 0x417A);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "UMTSSet"},
                                                     {log::kWarning, "UMTSSet"},
                                                     {log::kError, "Received an unknown log message: 16762"}}));
}

TEST_F(Umts, TheCellListShowsItsUmtsNeighboursWithOtherKeys) {
  const Array list = attachList();
  feed(umtsCellsPacket({UmtsCell{}}), 0x4005);
  log::ScopedCapture capture;
  feed(test::cellListPacket(
           {monitorCell(test::kUmts, test::kServing, {{CellMonitorUARFCN, I(1)}}),
            monitorCell(test::kUmts, test::kNeighbor,
                        {{CellMonitorUARFCN, I(10713)}, {CellMonitorSCN, I(77)}, {CellMonitorRSCP, I(-98)},
                         {CellMonitorECN0, I(-12)}}),
            monitorCell(test::kGsm, test::kNeighbor, {{CellMonitorUARFCN, I(2)}})}),
       0xFF0001);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(list.at(0), D({{"UARFCN", S("10713")},
                           {"Scrambling Code", S("77")},
                           {"RSCP", S("-98 dBm")},
                           {"Energy Per Chip", S("-12 dB")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"UMTSSet"}));
}

TEST_F(Umts, ACellListRscpOrEcNoOf32767ShowsEmpty) {
  const Array list = attachList();
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kNeighbor,
                                         {{CellMonitorUARFCN, I(10713)}, {CellMonitorSCN, I(77)},
                                          {CellMonitorRSCP, I(32767)}, {CellMonitorECN0, I(32767)}})}),
       0xFF0001);
  EXPECT_EQ(rowText(rowAt(list, 0), "RSCP"), "");
  EXPECT_EQ(rowText(rowAt(list, 0), "Energy Per Chip"), "");
}

TEST_F(Umts, ACellListValueThatFailsIsLoggedAndItsRowLeftOut) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kNeighbor, {{CellMonitorSCN, I(77)}})}), 0xFF0001);
  EXPECT_EQ(list.at(0), D({{"Scrambling Code", S("77")}}));
  EXPECT_EQ(capture.lines(), test::errorsAfter("UMTSSet", {"UMTSSet: Failed to retrieve UARFCN\n",
                                                           "UMTSSet: Failed to retrieve RSCP\n",
                                                           "UMTSSet: Failed to retrieve Energy Per Chip\n"}));
  capture.sink().clear();
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kNeighbor, {{CellMonitorUARFCN, I(1)},
                                                                        {CellMonitorRSCP, I(1)},
                                                                        {CellMonitorECN0, I(1)}})}),
       0xFF0001);
  EXPECT_EQ(capture.lines(), test::errorsAfter("UMTSSet", {"UMTSSet: Failed to retrieve Scrambling Code\n"}));
}

TEST_F(Umts, ACellListThatDoesNotParseEmptiesTheList) {
  const Array list = attachList();
  feed(umtsCellsPacket({UmtsCell{}}), 0x4005);
  log::ScopedCapture capture;
  feed(test::brokenCellListPacket(), 0xFF0001);
  EXPECT_TRUE(list.empty());
  EXPECT_EQ(capture.lines(), test::errorsAfter("UMTSSet", {"Cell Info Array data could not be constructed",
                                                           "Failed to get Cell Array\n"}));
}

// --- GSM Set ---

using Gsm = test::GsmUmtsSectionTest<GSMSet>;

TEST_F(Gsm, RegistersUnderItsNameForTheRankedList) {
  EXPECT_EQ(classDict.at("GSM Set"), section);
  EXPECT_EQ(section->getLogCodeArray(), std::vector<std::uint32_t>{0x4005});
  EXPECT_EQ(codeDict.keys(), std::vector<std::string>{"16389"});
}

TEST_F(Gsm, EachCellShowsArfcnBsicRssiAndRanking) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(gsmCellsPacket({GsmCell{}, {1023, 65535, 20, 32767}}), 0x4005);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(list.at(0),
            D({{"ARFCN", S("62")}, {"BSIC", S("41")}, {"RSSI", S("-90 dBm")}, {"Ranking Value", S("-12")}}));
  EXPECT_EQ(list.at(1),
            D({{"ARFCN", S("1023")}, {"BSIC", S("65535")}, {"RSSI", S("20 dBm")}, {"Ranking Value", S("32767")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"GSMSet"}));
}

TEST_F(Gsm, ACountOf0EmptiesTheListAndCellsPastTheEndAreNotShown) {
  const Array list = attachList();
  Bytes p = gsmCellsPacket({GsmCell{}, GsmCell{}});
  p[14] = 3;
  p.resize(p.size() + 6);
  feed(p, 0x4005);
  EXPECT_EQ(list.size(), 2u);
  feed(gsmCellsPacket({}), 0x4005);
  EXPECT_TRUE(list.empty());
}

TEST_F(Gsm, TheBoundedAccessorThrowsAtTheCount) {
  const Bytes p = gsmCellsPacket({GsmCell{}, GsmCell{}});
  const BoundedList cells = GSMSet::cells(PacketView(p));
  EXPECT_EQ(cells.entryOffset(1), 22u);
  EXPECT_THROW(cells.entryOffset(2), ArrayOutOfBoundsException);
}

TEST_F(Gsm, A14BytePacketLeavesTheListAndAnotherCodeIsLogged) {
  const Array list = attachList();
  feed(gsmCellsPacket({GsmCell{}}), 0x4005);
  log::ScopedCapture capture;
  feed(logPacket(0x4005, 14), 0x4005);
  feed(gsmCellsPacket({}), 0xFF0001);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "GSMSet"},
                                                     {log::kWarning, "GSMSet"},
                                                     {log::kError, "Received an unknown log message: 16711681"}}));
}

// --- The non-ranked sets ---

TEST(NonRankedSets, SubscribeToNothingAndOnlyTraceWhatTheyAreHanded) {
  ClassDictionary classDict;
  CodeDictionary codeDict;
  log::ScopedCapture capture;
  auto umts = test::makeGsmUmtsSection<NonRankedUMTSSet>(classDict, codeDict);
  auto gsm = test::makeGsmUmtsSection<NonRankedGSMSet>(classDict, codeDict);
  EXPECT_TRUE(umts->getLogCodeArray().empty());
  EXPECT_TRUE(gsm->getLogCodeArray().empty());
  EXPECT_EQ(codeDict.size(), 0u);
  const Array list;
  list.append(D({{"ARFCN", S("1")}}));
  umts->updateSectionRef(Value(list));
  gsm->updateSectionRef(Value(list));
  capture.sink().clear();
  umts->updateWithData(gsmCellsPacket({GsmCell{}}), 0x4005);
  gsm->updateWithData(gsmCellsPacket({GsmCell{}}), 0x4005);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines(), test::warnings({"NonRankedUMTSSet", "NonRankedGSMSet"}));
}

}  // namespace
}  // namespace corvane
