// The two sections of the idle-mode neighbour record 0xB180: the carrier and
// its Qrxlevmin, and the list of neighbour cells.

#include "LogGenerator/lte/NeighborCellsList.h"
#include "LogGenerator/lte/NeighborMeasurementMisc.h"
#include "lte/LteSectionFixture.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::logPacket;
using test::put16;
using test::put32;
using test::rowAt;
using test::rowText;

struct Cell {
  std::uint32_t physicalCellId = 301;  // 9 bits
  std::uint32_t rssi = 100;            // 8 bits
  std::uint32_t rsrp = 150;            // 9 bits
  std::uint32_t averageRsrp = 140;     // 9 bits
  std::uint32_t rsrq = 40;             // 7 bits
  std::uint32_t averageRsrq = 44;      // 7 bits
  std::uint32_t srxlev = 50;           // 7 bits
  std::uint16_t frequencyOffset = 65535;
  std::uint32_t frameOffset = 1500;     // 11 bits
  std::uint32_t sampleOffset = 300000;  // 19 bits
};

// A record of the given cells; countBits is what bits 6-10 at 19 hold (the
// number of cells less one, unless a test says otherwise).
Bytes neighborPacket(const std::vector<Cell>& cells, std::optional<std::uint32_t> countBits = std::nullopt) {
  Bytes p = logPacket(0xB180, 21 + 20 * cells.size());
  p[13] = 2;
  put16(p, 17, 1850);
  const std::uint32_t count = countBits.value_or(cells.empty() ? 0 : cells.size() - 1);
  put16(p, 19, static_cast<std::uint16_t>(23 | (count << 6)));  // Qrxlevmin 23 in bits 0-5
  std::size_t at = 21;
  for (const Cell& c : cells) {
    put32(p, at, c.physicalCellId | (c.rssi << 9) | (c.rsrp << 17));
    put32(p, at + 4, c.averageRsrp | (c.rsrq << 9) | (c.averageRsrq << 16) | (c.srxlev << 23));
    put16(p, at + 8, c.frequencyOffset);
    put32(p, at + 12, c.frameOffset | (c.sampleOffset << 11));
    at += 20;
  }
  return p;
}

// --- Neighbor Measurements ---

using NeighborMisc = test::LteSectionTest<NeighborMeasurementMisc>;

TEST_F(NeighborMisc, WritesVersionCarrierAndQrxlevmin) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(neighborPacket({Cell{}}), 0xB180);
  EXPECT_EQ(Value(rows),
            test::D({{"Version", test::S("2")}, {"E-ARFCN", test::S("1850")}, {"Qrxlevmin", test::S("-94 dBm")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Neighbor Measurements"}));
}

TEST_F(NeighborMisc, QrxlevminOf0IsMinus140Dbm) {
  const Dictionary rows = attachRows();
  Bytes p = neighborPacket({});
  put16(p, 19, 0xFFC0);  // count bits set, Qrxlevmin bits clear
  feed(p, 0xB180);
  EXPECT_EQ(rowText(rows, "Qrxlevmin"), "-140 dBm");
}

TEST_F(NeighborMisc, A20BytePacketIsDroppedAndAnotherCodeLogged) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  Bytes p = neighborPacket({});
  p.resize(20);
  feed(p, 0xB180);
  feed(neighborPacket({}), 0xB186);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Neighbor Measurements"},
                                                     {log::kWarning, "Neighbor Measurements"},
                                                     {log::kError, "Received an unknown log message: 45446"}}));
}

// --- Neighbor Cells List ---

using NeighborList = test::LteSectionTest<NeighborCellsList>;

TEST_F(NeighborList, OneCellGivesItsTwelveRowsInOrderAndItsTraces) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(neighborPacket({Cell{}}), 0xB180);
  ASSERT_EQ(list.size(), 1u);
  const Dictionary row = rowAt(list, 0);
  const std::vector<std::pair<std::string, std::string>> expected = {
      {"Physical Cell ID", "301"},
      {"Measured RSSI", "-90.00 dBm"},
      {"Measured RSRP", "-65.00 dBm"},
      {"Average RSRP", "-70.00 dBm"},
      {"Measured RSRQ", "-20.00 dB"},
      {"Average RSRQ", "-19.00 dB"},
      {"Srxlev", "20 dBm"},
      {"Frequency Offset", "65535"},
      {"Ant 0 Frame Offset", "1500"},
      {"Ant 0 Sample Offset", "300000"},
      {"Ant 1 Frame Offset", "1500"},
      {"Ant 1 Sample Offset", "300000"},
  };
  ASSERT_EQ(row.size(), expected.size());
  for (std::size_t i = 0; i < expected.size(); ++i) {
    EXPECT_EQ(row.entries()[i].first, expected[i].first);
    EXPECT_EQ(rowText(row, expected[i].first), expected[i].second) << expected[i].first;
  }
  EXPECT_EQ(capture.lines(), test::warnings({"Neighbor Cells List", "Number of neighboring cells being reported: 1\n",
                                             "Physical Cell ID: 301\n", "Measured RSSI: -90.000000\n",
                                             "Measured RSSI: -65.000000\n", "Measured RSSI: -70.000000\n",
                                             "Measured RSSI: -20.000000\n", "Measured RSSI: -19.000000\n",
                                             "Measured RSSI: 20.000000\n"}));
}

// The serving cell's RSRP steps by 0.25 dB; the neighbours' by 0.5 dB.
TEST_F(NeighborList, NeighbourRsrpStepsByHalfADecibel) {
  const Array list = attachList();
  Cell c;
  c.rsrp = 1;
  c.averageRsrp = 3;
  feed(neighborPacket({c}), 0xB180);
  EXPECT_EQ(rowText(rowAt(list, 0), "Measured RSRP"), "-139.50 dBm");
  EXPECT_EQ(rowText(rowAt(list, 0), "Average RSRP"), "-138.50 dBm");
}

// Both antennas' rows read the bits of antenna 0; the bytes behind them never show.
TEST_F(NeighborList, Antenna1RowsReadTheSameBitsAsAntenna0) {
  const Array list = attachList();
  Bytes p = neighborPacket({Cell{}});
  put32(p, 21 + 16, 0xFFFFFFFF);
  feed(p, 0xB180);
  const Dictionary row = rowAt(list, 0);
  EXPECT_EQ(rowText(row, "Ant 1 Frame Offset"), "1500");
  EXPECT_EQ(rowText(row, "Ant 1 Sample Offset"), "300000");
}

TEST_F(NeighborList, CountBitsOf0StillGiveOneRowReadFromOffset21) {
  const Array list = attachList();
  log::ScopedCapture capture;
  Cell c;
  c.physicalCellId = 77;
  feed(neighborPacket({c}, 0), 0xB180);
  ASSERT_EQ(list.size(), 1u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Physical Cell ID"), "77");
  EXPECT_EQ(capture.texts().at(1), "Number of neighboring cells being reported: 1\n");
}

TEST_F(NeighborList, CountBitsOf31GiveThirtyTwoRows) {
  const Array list = attachList();
  std::vector<Cell> cells(32);
  for (std::size_t i = 0; i < cells.size(); ++i) cells[i].physicalCellId = static_cast<std::uint32_t>(400 + i);
  feed(neighborPacket(cells), 0xB180);
  ASSERT_EQ(list.size(), 32u);
  EXPECT_EQ(rowText(rowAt(list, 31), "Physical Cell ID"), "431");
}

// The list stops at the last cell that lies wholly inside the packet; the
// trace still names the count the packet reports.
TEST_F(NeighborList, CellsACountPlacesPastTheEndAreNotShown) {
  const Array list = attachList();
  Bytes p = neighborPacket({Cell{}, Cell{}}, 5);
  p.resize(p.size() + 19);  // a third cell one byte short
  log::ScopedCapture capture;
  feed(p, 0xB180);
  EXPECT_EQ(list.size(), 2u);
  EXPECT_EQ(capture.texts().at(1), "Number of neighboring cells being reported: 6\n");
  EXPECT_EQ(capture.sink().count("Physical Cell ID: 301\n"), 2u);
}

// A 21-byte record reports one cell but holds none of its bytes.
TEST_F(NeighborList, AMinimalRecordShowsNoCell) {
  const Array list = attachList();
  feed(neighborPacket({Cell{}}), 0xB180);
  ASSERT_EQ(list.size(), 1u);
  feed(neighborPacket({}), 0xB180);
  EXPECT_TRUE(list.empty());
}

TEST_F(NeighborList, TheBoundedAccessorThrowsAtTheCount) {
  const Bytes p = neighborPacket({Cell{}, Cell{}});
  const BoundedList cells = NeighborCellsList::cells(PacketView(p));
  EXPECT_EQ(cells.count(), 2u);
  EXPECT_EQ(cells.entryOffset(1), 41u);
  EXPECT_THROW(cells.entryOffset(2), ArrayOutOfBoundsException);
}

TEST_F(NeighborList, A20BytePacketLeavesTheListAndAnotherCodeIsLogged) {
  const Array list = attachList();
  feed(neighborPacket({Cell{}}), 0xB180);
  log::ScopedCapture capture;
  Bytes p = neighborPacket({});
  p.resize(20);
  feed(p, 0xB180);
  feed(neighborPacket({Cell{}}), 0xB179);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Neighbor Cells List"},
                                                     {log::kWarning, "Neighbor Cells List"},
                                                     {log::kError, "Received an unknown log message: 45433"}}));
}

}  // namespace
}  // namespace corvane
