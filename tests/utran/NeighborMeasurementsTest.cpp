// "Neighbor Cell List" (record 0xD00A: count in bits 1-7 of byte 16, 16
// bytes a cell from 168) and "GSM Neighbor Cell List" (record 0xD00E: count
// at 16, 8 bytes a cell from 17).

#include "LogGenerator/utran/GSMNeighbhorMeasurements.h"
#include "LogGenerator/utran/UTRANNeighbhorMeasurements.h"

#include "utran/UtranSectionFixture.h"

namespace corvane {
namespace {

using test::logPacket;
using test::put16;
using test::rowAt;
using test::rowText;

using UtranNeighbors = test::UtranSectionTest<UTRANNeighbhorMeasurements>;
using GsmNeighbors = test::UtranSectionTest<GSMNeighbhorMeasurements>;

// A 0xD00A record with room for `cells` cells and byte 16 as given.
Bytes utranNeighborPacket(std::uint8_t countByte, std::size_t cells) {
  Bytes p = logPacket(0xD00A, 168 + 16 * cells);
  p[16] = countByte;
  return p;
}

// Cell i at 168 + 16 i: UARFCN in bits 0-13 of the 16 bits at +0, cell
// identity in bits 6-12 of those at +1, RSCP in bits 5-12 of those at +2, the
// set in bits 5-6 and the JDCS flag in bit 7 of +3.
void putCell(Bytes& p, std::size_t i, std::uint16_t uarfcn, std::uint8_t cellId, std::uint8_t rscp, std::uint8_t set,
             bool jdcs) {
  const std::size_t at = 168 + 16 * i;
  put16(p, at, uarfcn);
  p[at + 1] = static_cast<std::uint8_t>(p[at + 1] | ((cellId & 0x03) << 6));
  p[at + 2] = static_cast<std::uint8_t>((cellId >> 2) | ((rscp & 0x07) << 5));
  p[at + 3] = static_cast<std::uint8_t>((rscp >> 3) | (set << 5) | (jdcs ? 0x80 : 0));
}

TEST_F(UtranNeighbors, CountByteSevenGivesThreeRowsAndCountByteOneAnEmptyList) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(utranNeighborPacket(0x07, 3), 0xD00A);
  EXPECT_EQ(capture.lines(), test::warnings({"NeighbhorMeasurements List"}));
  EXPECT_EQ(list.size(), 3u);
  feed(utranNeighborPacket(0x01, 3), 0xD00A);
  EXPECT_EQ(list.size(), 0u);
}

TEST_F(UtranNeighbors, ACellsRowsInTheirOrder) {
  const Array list = attachList();
  Bytes p = utranNeighborPacket(0x04, 2);
  putCell(p, 1, 10713, 77, 200, 2, false);
  log::ScopedCapture quiet;
  feed(p, 0xD00A);
  ASSERT_EQ(list.size(), 2u);
  const Dictionary cell = rowAt(list, 1);
  EXPECT_EQ(test::keysOf(cell), (std::vector<std::string>{"UARFCN", "Cell ID", "Filter RSCP", "Status", "inJDCS"}));
  EXPECT_EQ(rowText(cell, "UARFCN"), "10713");
  EXPECT_EQ(rowText(cell, "Cell ID"), "77");
  EXPECT_EQ(rowText(cell, "Filter RSCP"), "0.781250");
  EXPECT_EQ(rowText(cell, "Status"), "DSET");
  EXPECT_EQ(rowText(cell, "inJDCS"), "FALSE");
  EXPECT_EQ(rowText(rowAt(list, 0), "Status"), "ASET");
}

TEST_F(UtranNeighbors, SetThreeHasNoStatusAndBitSevenIsInJdcs) {
  const Array list = attachList();
  Bytes p = utranNeighborPacket(0x04, 2);
  p[168 + 3] = 0xE0;
  p[184 + 3] = 0x20;
  log::ScopedCapture quiet;
  feed(p, 0xD00A);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_FALSE(rowAt(list, 0).contains("Status"));
  EXPECT_EQ(rowText(rowAt(list, 0), "inJDCS"), "TRUE");
  EXPECT_EQ(rowText(rowAt(list, 1), "Status"), "MSET");
  EXPECT_EQ(rowText(rowAt(list, 1), "inJDCS"), "FALSE");
}

TEST_F(UtranNeighbors, AnRscpOf128ShowsAHalfWithSixDecimals) {
  const Array list = attachList();
  Bytes p = utranNeighborPacket(0x02, 1);
  // 128 in bits 5-12 of the 16 bits at 170: 0x1000.
  p[170] = 0x00;
  p[171] = 0x10;
  log::ScopedCapture quiet;
  feed(p, 0xD00A);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Filter RSCP"), "0.500000");
}

TEST_F(UtranNeighbors, TheListStopsAtTheLastCellWhollyInsideThePacket) {
  const Array list = attachList();
  // Three cells counted; the third's four bytes end one past the packet.
  Bytes p = utranNeighborPacket(0x06, 2);
  p.resize(168 + 32 + 3, 0);
  log::ScopedCapture quiet;
  feed(p, 0xD00A);
  EXPECT_EQ(list.size(), 2u);
  p.push_back(0);
  feed(p, 0xD00A);
  EXPECT_EQ(list.size(), 3u);
}

TEST_F(UtranNeighbors, AShortPacketOrAnotherCodeLeavesTheListAsItWas) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(utranNeighborPacket(0x02, 1), 0xD00A);
  ASSERT_EQ(list.size(), 1u);
  feed(logPacket(0xD00A, 20), 0xD00A);
  feed(utranNeighborPacket(0x00, 0), 0xD00E);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines(), test::warnings({"NeighbhorMeasurements List", "NeighbhorMeasurements List",
                                             "NeighbhorMeasurements List"}));
}

Bytes gsmNeighborPacket(std::uint8_t count) {
  Bytes p = logPacket(0xD00E, 17 + 8 * count);
  p[16] = count;
  for (std::size_t i = 0; i < count; ++i) {
    const std::size_t at = 17 + 8 * i;
    // Bit 15 (bit 7 of byte 1): BSIC valid; bit 14 (the band) clear.
    put16(p, at, static_cast<std::uint16_t>(0x8000 | (100 + i)));
    p[at + 2] = 3;
    p[at + 3] = 5;
    put16(p, at + 4, static_cast<std::uint16_t>(60 + i));
    put16(p, at + 6, static_cast<std::uint16_t>(-85));
  }
  return p;
}

TEST_F(GsmNeighbors, AnAcceptedRecordLeavesTheListEmpty) {
  const Array list = attachList();
  list.append(Value("stale"));
  log::ScopedCapture capture;
  feed(gsmNeighborPacket(2), 0xD00E);
  EXPECT_EQ(capture.lines(), test::warnings({"GSM Neighbor Cell List"}));
  EXPECT_EQ(list.size(), 0u);
  feed(gsmNeighborPacket(0), 0xD00E);
  EXPECT_EQ(list.size(), 0u);
}

TEST_F(GsmNeighbors, AShortRecordLeavesTheListAsItWas) {
  const Array list = attachList();
  list.append(Value("kept"));
  log::ScopedCapture quiet;
  feed(logPacket(0xD00E, 16), 0xD00E);
  EXPECT_EQ(list.size(), 1u);
}

TEST(GsmNeighborRows, ACellsSevenRowsInTheirOrder) {
  const Bytes p = gsmNeighborPacket(2);
  const Array rows = GSMNeighbhorMeasurements::cellRows(PacketView(p));
  ASSERT_EQ(rows.size(), 2u);
  const Dictionary cell = rowAt(rows, 1);
  EXPECT_EQ(test::keysOf(cell),
            (std::vector<std::string>{"Cell ID", "Band Indicator", "BSIC Valid", "NCC", "BCC", "ARFCN", "RSSI"}));
  // Bit 15 of the first 16 bits is not the cell's: it is the BSIC flag.
  EXPECT_EQ(rowText(cell, "Cell ID"), "101");
  EXPECT_EQ(rowText(cell, "Band Indicator"), "0");
  EXPECT_EQ(rowText(cell, "BSIC Valid"), "1");
  EXPECT_EQ(rowText(cell, "NCC"), "3");
  EXPECT_EQ(rowText(cell, "BCC"), "5");
  EXPECT_EQ(rowText(cell, "ARFCN"), "61");
  EXPECT_EQ(rowText(cell, "RSSI"), "-85");
}

TEST(GsmNeighborRows, ACountPastTheEndGivesTheCellsThePacketHolds) {
  Bytes p = gsmNeighborPacket(3);
  p.pop_back();
  EXPECT_EQ(GSMNeighbhorMeasurements::cellRows(PacketView(p)).size(), 2u);
  EXPECT_THROW(GSMNeighbhorMeasurements::cells(PacketView(p)).entryOffset(3), ArrayOutOfBoundsException);
}

}  // namespace
}  // namespace corvane
