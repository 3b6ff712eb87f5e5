// "UMTS RR Info": RRC state, transmit power, serving cell and frequencies,
// ciphering, and the UMTS serving cell of the cell-monitor list; and the
// "UMTS RR Measurement" placeholder.

#include "LogGenerator/gsm_umts/UMTSRRInfo.h"
#include "LogGenerator/gsm_umts/UMTSRRMeasurement.h"

#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::I;
using test::logPacket;
using test::monitorCell;
using test::put16;
using test::put32;
using test::rowText;
using test::S;

using RrInfo = test::GsmUmtsSectionTest<UMTSRRInfo>;

Bytes rrcStatePacket(std::uint8_t state) {
  Bytes p = logPacket(0x4125, 14);
  p[13] = state;
  return p;
}

// 0x4031: the number of samples at 14, then 14 bytes a sample from 16, its
// raw power (16 bits, signed) at +4; the other bytes are not read.
Bytes transmitPowerPacket(std::initializer_list<std::int16_t> powers) {
  Bytes p = logPacket(0x4031, 16 + 14 * powers.size());
  p[13] = 0xEE;
  p[14] = static_cast<std::uint8_t>(powers.size());
  p[15] = 0xEE;
  std::size_t at = 16;
  for (std::int16_t power : powers) {
    for (std::size_t b = 0; b < 14; ++b) p[at + b] = 0xEE;
    put16(p, at + 4, static_cast<std::uint16_t>(power));
    at += 14;
  }
  return p;
}

// 0x4127: uplink UARFCN at 13, downlink at 17, cell id at 21 (32 bits each),
// URA id at 25 (16 bits).
Bytes cellPacket(std::size_t size = 29) {
  Bytes p = logPacket(0x4127, size);
  put32(p, 13, 9750);
  put32(p, 17, 10700);
  put32(p, 21, 26543617);
  put16(p, 25, 65535);
  return p;
}

Bytes cipheringPacket(std::uint8_t value, std::size_t size = 19) {
  Bytes p = logPacket(0x4157, size);
  p[13] = value;
  return p;
}

TEST_F(RrInfo, RegistersUnderItsNameForItsFourRecordsAndTheCellList) {
  EXPECT_EQ(classDict.at("UMTS RR Info"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0x4125, 0x4031, 0x4127, 0x4157, 0xFF0001}));
  EXPECT_EQ(codeDict.keys(), (std::vector<std::string>{"16677", "16433", "16679", "16727", "16711681"}));
}

TEST_F(RrInfo, EveryRrcStateHasItsTextAndHigherOnesAreUnknown) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  const std::vector<std::pair<std::uint8_t, std::string>> table = {
      {0, "Disconnected"}, {1, "Connecting"}, {2, "CELL_FACH"}, {3, "CELL_DCH"}, {4, "CELL_PCH"},
      {5, "URA_PCH"},      {6, "Unknown"},    {9, "Unknown"},   {255, "Unknown"}};
  for (const auto& [value, text] : table) {
    feed(rrcStatePacket(value), 0x4125);
    EXPECT_EQ(rowText(rows, "RRC State"), text) << int(value);
  }
  EXPECT_EQ(test::keysOf(rows), std::vector<std::string>{"RRC State"});
  EXPECT_EQ(capture.sink().count("UMTSRRInfo"), table.size());
}

TEST_F(RrInfo, RrcStateByte3IsCellDchAnd9Unknown) {
  const Dictionary rows = attachRows();
  feed(rrcStatePacket(3), 0x4125);
  EXPECT_EQ(rowText(rows, "RRC State"), "CELL_DCH");
  feed(rrcStatePacket(9), 0x4125);
  EXPECT_EQ(rowText(rows, "RRC State"), "Unknown");
}

// (-100 + 512) / 10 = 41, 41 - 70 = -29; the sample of 0 holds no measurement.
TEST_F(RrInfo, OnlySamplesThatAreNotZeroCountTowardTheTransmitPower) {
  const Dictionary rows = attachRows();
  feed(transmitPowerPacket({-100, 0}), 0x4031);
  EXPECT_EQ(Value(rows), D({{"Transmit Power", S("-29.00 dBm")}}));
}

// 517 / 10 = 51 and 527 / 10 = 52, each less 70: the average of -19 and -18.
TEST_F(RrInfo, TheTransmitPowerIsTheAverageOfTheSamplesDividedInWholeNumbers) {
  const Dictionary rows = attachRows();
  feed(transmitPowerPacket({5, 15}), 0x4031);
  EXPECT_EQ(rowText(rows, "Transmit Power"), "-18.50 dBm");
  feed(transmitPowerPacket({-100, 5, 5}), 0x4031);
  EXPECT_EQ(rowText(rows, "Transmit Power"), "-22.33 dBm");  // -67 / 3
}

// Without a measured sample the average is not a number: printf's text for it
// at width 4, then the unit.
TEST_F(RrInfo, NoSampleOrOnlyEmptyOnesShowNotANumber) {
  const Dictionary rows = attachRows();
  feed(transmitPowerPacket({}), 0x4031);
  EXPECT_EQ(rowText(rows, "Transmit Power"), " nan dBm");
  feed(transmitPowerPacket({-100}), 0x4031);
  feed(transmitPowerPacket({0, 0}), 0x4031);
  EXPECT_EQ(rowText(rows, "Transmit Power"), " nan dBm");
}

TEST_F(RrInfo, SamplesACountPlacesPastTheEndDoNotCount) {
  const Dictionary rows = attachRows();
  Bytes p = transmitPowerPacket({-100, 5});
  p[14] = 4;
  p.resize(p.size() + 13);  // a third sample one byte short
  put16(p, 16 + 28 + 4, 15);
  feed(p, 0x4031);
  EXPECT_EQ(rowText(rows, "Transmit Power"), "-24.00 dBm");  // (-29 - 19) / 2
}

TEST_F(RrInfo, TheSampleAccessorThrowsAtTheCount) {
  const Bytes p = transmitPowerPacket({1, 2});
  const BoundedList samples = UMTSRRInfo::samples(PacketView(p));
  EXPECT_EQ(samples.entryOffset(1), 30u);
  EXPECT_THROW(samples.entryOffset(2), ArrayOutOfBoundsException);
}

TEST_F(RrInfo, ACellRecordSetsItsFourRowsAndDropsTheCellListsUarfcn) {
  const Dictionary rows = test::Dict({{"RRC State", S("-")}, {"Cell ID", S("-")}, {"Scrambling Code", S("-")},
                                      {"Downlink Frequency", S("-")}, {"Uplink Frequency", S("-")},
                                      {"UARFCN", S("10713")}, {"URA ID", S("-")}});
  section->updateSectionRef(Value(rows));
  feed(cellPacket(), 0x4127);
  EXPECT_EQ(Value(rows), D({{"RRC State", S("-")},
                            {"Cell ID", S("26543617")},
                            {"Scrambling Code", S("-")},
                            {"Downlink Frequency", S("10700")},
                            {"Uplink Frequency", S("9750")},
                            {"URA ID", S("65535")}}));
}

TEST_F(RrInfo, TheCellRecordsThirtyTwoBitValuesShowSigned) {
  const Dictionary rows = attachRows();
  Bytes p = cellPacket();
  put32(p, 21, 0xFFFFFFFF);
  feed(p, 0x4127);
  EXPECT_EQ(test::keysOf(rows),
            (std::vector<std::string>{"Cell ID", "Downlink Frequency", "Uplink Frequency", "URA ID"}));
  EXPECT_EQ(rowText(rows, "Cell ID"), "-1");
}

TEST_F(RrInfo, CipheringIsEnabledForAnyByteButZero) {
  const Dictionary rows = attachRows();
  feed(cipheringPacket(0), 0x4157);
  EXPECT_EQ(Value(rows), D({{"Ciphering", S("Disabled")}}));
  for (std::uint8_t value : {1, 2, 255}) {
    feed(cipheringPacket(0), 0x4157);
    feed(cipheringPacket(value), 0x4157);
    EXPECT_EQ(rowText(rows, "Ciphering"), "Enabled") << int(value);
  }
}

TEST_F(RrInfo, RecordsShorterThanTheirLayoutAreDroppedSilently) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(logPacket(0x4125, 13), 0x4125);
  feed(logPacket(0x4031, 15), 0x4031);
  feed(cellPacket(28), 0x4127);
  feed(cipheringPacket(1, 18), 0x4157);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"UMTSRRInfo", "UMTSRRInfo", "UMTSRRInfo", "UMTSRRInfo"}));
}

TEST_F(RrInfo, AnyOtherCodeIsLoggedAsUnknown) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(rrcStatePacket(3), 0x4116);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::errorsAfter("UMTSRRInfo", {"Received an unknown log message: 16662"}));
}

TEST_F(RrInfo, TheUmtsServingCellOfTheCellListSetsCellIdUarfcnAndScramblingCode) {
  const Dictionary rows = attachRows();
  feed(cellPacket(), 0x4127);
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kGsm, test::kServing, {{CellMonitorCellId, I(1)}}),
                             monitorCell(test::kUmts, test::kServing, {{CellMonitorCellId, I(777)},
                                                                       {CellMonitorUARFCN, I(10713)},
                                                                       {CellMonitorSCN, I(300)}})}),
       0xFF0001);
  EXPECT_EQ(Value(rows), D({{"Cell ID", S("777")},
                            {"Downlink Frequency", S("10700")},
                            {"Uplink Frequency", S("9750")},
                            {"URA ID", S("65535")},
                            {"UARFCN", S("10713")},
                            {"Scrambling Code", S("300")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"UMTSRRInfo"}));
  // The next cell record drops the UARFCN again.
  feed(cellPacket(), 0x4127);
  EXPECT_EQ(rowText(rows, "UARFCN"), "<none>");
  EXPECT_EQ(rowText(rows, "Cell ID"), "26543617");
}

TEST_F(RrInfo, AMissingCellListValueIsLoggedAndTheOthersAreStillSet) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kServing, {{CellMonitorSCN, I(300)}})}), 0xFF0001);
  EXPECT_EQ(Value(rows), D({{"Scrambling Code", S("300")}}));
  EXPECT_EQ(capture.lines(), test::errorsAfter("UMTSRRInfo", {"UMTSRRInfo: Failed to retrieve Cell ID\n",
                                                              "UMTSRRInfo: Failed to retrieve UARFCN\n"}));
  capture.sink().clear();
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kServing, {{CellMonitorCellId, I(1)},
                                                                       {CellMonitorUARFCN, I(2)}})}),
       0xFF0001);
  EXPECT_EQ(capture.lines(), test::errorsAfter("UMTSRRInfo", {"UMTSRRInfo: Failed to retrieve Scrambling Code\n"}));
}

TEST_F(RrInfo, ACellListThatDoesNotParseOrHasNoUmtsServingCellChangesNothing) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(test::brokenCellListPacket(), 0xFF0001);
  feed(test::cellListPacket({monitorCell(test::kUmts, test::kNeighbor, {{CellMonitorCellId, I(1)}})}), 0xFF0001);
  feed(test::cellListPacket({}), 0xFF0001);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "UMTSRRInfo"},
                                                     {log::kError, "Cell Info Array data could not be constructed"},
                                                     {log::kError, "Failed to get Cell Array\n"},
                                                     {log::kWarning, "UMTSRRInfo"},
                                                     {log::kWarning, "UMTSRRInfo"}}));
}

// --- UMTS RR Measurement ---

TEST(UmtsRrMeasurement, SubscribesToNothingAndOnlyTracesWhatItIsHanded) {
  ClassDictionary classDict;
  CodeDictionary codeDict;
  auto section = test::makeGsmUmtsSection<UMTSRRMeasurement>(classDict, codeDict);
  EXPECT_EQ(classDict.at("UMTS RR Measurement"), section);
  EXPECT_TRUE(section->getLogCodeArray().empty());
  EXPECT_EQ(codeDict.size(), 0u);
  const Dictionary rows;
  section->updateSectionRef(Value(rows));
  log::ScopedCapture capture;
  section->updateWithData(rrcStatePacket(3), 0x4125);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"UMTSRRMeasurement"}));
}

}  // namespace
}  // namespace corvane
