// The three sections of the connected-mode intra-frequency record 0xB179: the
// serving cell's filtered measurement, the measured neighbours and the
// detected cells behind them.

#include "LogGenerator/lte/ConnectedModeMeasurementMisc.h"
#include "LogGenerator/lte/DetectedCells.h"
#include "LogGenerator/lte/MeasuredNeighborCells.h"
#include "lte/LteSectionFixture.h"
#include "support/Values.h"

namespace corvane {
namespace {

using test::logPacket;
using test::put16;
using test::rowAt;
using test::rowText;

struct Neighbor {
  std::uint16_t physicalCellId;
  std::uint16_t rsrp;
  std::uint16_t rsrq;
};

// A record with its serving-cell fields, the measured neighbours and the
// detected cells, laid out one behind the other.
Bytes intraFrequencyPacket(const std::vector<Neighbor>& measured, const std::vector<std::uint16_t>& detected) {
  Bytes p = logPacket(0xB179, 29 + 6 * measured.size() + 2 * detected.size());
  put16(p, 17, 6300);
  put16(p, 19, 301);
  put16(p, 21, 7);
  put16(p, 23, 180);
  put16(p, 25, 100);
  p[27] = static_cast<std::uint8_t>(measured.size());
  p[28] = static_cast<std::uint8_t>(detected.size());
  std::size_t at = 29;
  for (const auto& n : measured) {
    put16(p, at, n.physicalCellId);
    put16(p, at + 2, n.rsrp);
    put16(p, at + 4, n.rsrq);
    at += 6;
  }
  for (std::uint16_t id : detected) {
    put16(p, at, id);
    at += 2;
  }
  return p;
}

// --- Connected mode LTE Intra-frequency Measurement ---

using ConnectedMode = test::LteSectionTest<ConnectedModeMeasurementMisc>;

TEST_F(ConnectedMode, WritesTheServingCellsFiveRowsInOrder) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(intraFrequencyPacket({}, {}), 0xB179);
  EXPECT_EQ(Value(rows), test::D({{"E-ARFCN", test::S("6300")},
                                  {"Serving Physical Cell ID", test::S("301")},
                                  {"Subframe Number", test::S("7")},
                                  {"Serving Filtered RSRP", test::S("-95.00 dBm")},
                                  {"Serving Filtered RSRQ", test::S("-7.50 dB")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Connected mode LTE Intra-frequency Measurement"}));
}

// Eighth-dB steps: 1 is -19.875, which rounds as "%4.2f" does.
TEST_F(ConnectedMode, FilteredRsrqUsesEighthDbSteps) {
  const Dictionary rows = attachRows();
  Bytes p = intraFrequencyPacket({}, {});
  put16(p, 25, 1);
  feed(p, 0xB179);
  EXPECT_EQ(rowText(rows, "Serving Filtered RSRQ"), "-19.88 dB");
}

TEST_F(ConnectedMode, A28BytePacketIsDroppedSilently) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  Bytes p = intraFrequencyPacket({}, {});
  p.resize(28);
  feed(p, 0xB179);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"Connected mode LTE Intra-frequency Measurement"}));
}

TEST_F(ConnectedMode, AnotherCodeIsLogged) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(intraFrequencyPacket({}, {}), 0xB17F);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Connected mode LTE Intra-frequency Measurement"},
                                                     {log::kError, "Received an unknown log message: 45439"}}));
}

// --- Measured Neighbor Cells ---

using Measured = test::LteSectionTest<MeasuredNeighborCells>;

TEST_F(Measured, OneRowPerMeasuredCell) {
  const Array list = attachList();
  log::ScopedCapture capture;
  feed(intraFrequencyPacket({{12, 160, 96}, {13, 0, 0}}, {44}), 0xB179);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(Value(rowAt(list, 0)), test::D({{"Physical Cell ID", test::S("12")},
                                            {"Filtered RSRP", test::S("-100.00 dBm")},
                                            {"Filtered RSRQ", test::S("-8.00 dB")}}));
  EXPECT_EQ(Value(rowAt(list, 1)), test::D({{"Physical Cell ID", test::S("13")},
                                            {"Filtered RSRP", test::S("-140.00 dBm")},
                                            {"Filtered RSRQ", test::S("-20.00 dB")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"Measured Neighbor Cells"}));
}

TEST_F(Measured, ACountOfZeroEmptiesTheList) {
  const Array list = attachList();
  feed(intraFrequencyPacket({{12, 160, 96}}, {}), 0xB179);
  ASSERT_EQ(list.size(), 1u);
  feed(intraFrequencyPacket({}, {44, 45}), 0xB179);
  EXPECT_TRUE(list.empty());
}

TEST_F(Measured, TheBoundedAccessorThrowsAtTheCount) {
  const Bytes p = intraFrequencyPacket({{12, 160, 96}, {13, 0, 0}}, {});
  const BoundedList cells = MeasuredNeighborCells::cells(PacketView(p));
  EXPECT_EQ(cells.count(), 2u);
  EXPECT_EQ(cells.entryOffset(1), 35u);
  EXPECT_THROW(cells.entryOffset(2), ArrayOutOfBoundsException);
}

// The list stops at the last cell that lies wholly inside the packet.
TEST_F(Measured, CellsACountPlacesPastTheEndAreNotShown) {
  const Array list = attachList();
  Bytes p = intraFrequencyPacket({{12, 160, 96}, {13, 0, 0}}, {});
  p[27] = 200;
  p.push_back(0x05);  // a third cell of which one byte arrived
  log::ScopedCapture capture;
  feed(p, 0xB179);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(rowText(rowAt(list, 1), "Physical Cell ID"), "13");
  EXPECT_EQ(capture.lines(), test::warnings({"Measured Neighbor Cells"}));
}

TEST_F(Measured, A28BytePacketLeavesTheListAsItWas) {
  const Array list = attachList();
  feed(intraFrequencyPacket({{12, 160, 96}}, {}), 0xB179);
  Bytes shortPacket = intraFrequencyPacket({}, {});
  shortPacket.resize(28);
  feed(shortPacket, 0xB179);
  EXPECT_EQ(list.size(), 1u);
}

// --- Detected Cells ---

using Detected = test::LteSectionTest<DetectedCells>;

TEST_F(Detected, NoMeasuredCellsAndTwoDetectedReadFromOffsets29And31) {
  const Array detectedList = attachList();
  const auto measured = test::makeLteSection<MeasuredNeighborCells>(classDict, codeDict);
  Array measuredList;
  measured->updateSectionRef(Value(measuredList));
  Bytes p = logPacket(0xB179, 33);
  p[27] = 0;
  p[28] = 2;
  put16(p, 29, 0x0123);
  put16(p, 31, 0x01F4);
  measured->updateWithData(p, 0xB179);
  feed(p, 0xB179);
  EXPECT_TRUE(measuredList.empty());
  ASSERT_EQ(detectedList.size(), 2u);
  EXPECT_EQ(Value(rowAt(detectedList, 0)), test::D({{"Physical Cell ID", test::S("291")}}));
  EXPECT_EQ(Value(rowAt(detectedList, 1)), test::D({{"Physical Cell ID", test::S("500")}}));
}

TEST_F(Detected, DetectedCellsLieRightBehindTheMeasuredOnes) {
  const Array list = attachList();
  feed(intraFrequencyPacket({{12, 160, 96}, {13, 0, 0}, {14, 0, 0}}, {77, 78, 79}), 0xB179);
  ASSERT_EQ(list.size(), 3u);
  EXPECT_EQ(rowText(rowAt(list, 0), "Physical Cell ID"), "77");
  EXPECT_EQ(rowText(rowAt(list, 2), "Physical Cell ID"), "79");
  const BoundedList cells =
      DetectedCells::cells(PacketView(intraFrequencyPacket({{12, 160, 96}, {13, 0, 0}, {14, 0, 0}}, {77, 78, 79})));
  EXPECT_EQ(cells.entryOffset(0), 29u + 18u);
  EXPECT_THROW(cells.entryOffset(3), ArrayOutOfBoundsException);
}

TEST_F(Detected, CellsACountPlacesPastTheEndAreNotShown) {
  const Array list = attachList();
  Bytes p = intraFrequencyPacket({{12, 160, 96}}, {77, 78});
  p[28] = 255;
  feed(p, 0xB179);
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(rowText(rowAt(list, 1), "Physical Cell ID"), "78");
}

// The measured count places the detected cells: with it past the end there is
// nothing to show.
TEST_F(Detected, AMeasuredCountPastTheEndLeavesNoDetectedCell) {
  const Array list = attachList();
  feed(intraFrequencyPacket({}, {1}), 0xB179);
  ASSERT_EQ(list.size(), 1u);
  Bytes p = intraFrequencyPacket({}, {77, 78});
  p[27] = 255;
  feed(p, 0xB179);
  EXPECT_TRUE(list.empty());
}

TEST_F(Detected, AnotherCodeIsLoggedAndLeavesTheList) {
  const Array list = attachList();
  feed(intraFrequencyPacket({}, {1}), 0xB179);
  log::ScopedCapture capture;
  feed(intraFrequencyPacket({}, {}), 0xB180);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "Detected Cells"},
                                                     {log::kError, "Received an unknown log message: 45440"}}));
}

}  // namespace
}  // namespace corvane
