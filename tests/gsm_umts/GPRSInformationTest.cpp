// "GPRS Information": the GSM serving cell's packet service parameters, from
// seven records, each of which writes its own rows.

#include "LogGenerator/gsm_umts/GPRSInformation.h"

#include "gsm_umts/GsmCellPackets.h"
#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::logPacket;
using test::S;

using GprsInformation = test::GsmUmtsSectionTest<GPRSInformation>;

// 0x51F5: PFC at 13, the priority access threshold at 14, the network control order at 15; 18 bytes.
Bytes accessRecord(std::uint8_t pfc, std::uint8_t threshold, std::uint8_t order) {
  Bytes p = logPacket(0x51F5, 18);
  p[13] = pfc;
  p[14] = threshold;
  p[15] = order;
  return p;
}

// 0x51FD: PSI status 13, count LR 14, count HR 15, extended measurement order 16, SI status 33; 35 bytes.
Bytes systemInfoRecord(std::size_t size = 35) {
  Bytes p = logPacket(0x51FD, size);
  p[13] = 2;
  p[14] = 3;
  p[15] = 4;
  p[16] = 1;
  if (size > 33) p[33] = 9;
  return p;
}

TEST_F(GprsInformation, RegistersForItsSevenCodesInOrder) {
  EXPECT_EQ(classDict.at("GPRS Information"), section);
  EXPECT_EQ(section->getLogCodeArray(),
            (std::vector<std::uint32_t>{0x51F5, 0x7135, 0x51F6, 0x51FB, 0x51FD, 0x51F4, 0x5137}));
}

TEST_F(GprsInformation, TheAccessRecordWritesOrderPfcAndThresholdInThatOrder) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(accessRecord(1, 6, 2), 0x51F5);
  EXPECT_EQ(test::keysOf(rows), (std::vector<std::string>{"Network Control Order", "PFC Supported",
                                                    "Priority Access Threshold"}));
  EXPECT_EQ(Value(rows), D({{"Network Control Order", S("NC2")},
                            {"PFC Supported", S("Supported")},
                            {"Priority Access Threshold", S("1 to 4")}}));
  feed(accessRecord(0, 0, 255), 0x51F5);
  EXPECT_EQ(Value(rows), D({{"Network Control Order", S("Not Available")},
                            {"PFC Supported", S("Not Supported")},
                            {"Priority Access Threshold", S("Barred (PKT access not allowed in the Cell)")}}));
  feed(accessRecord(2, 7, 3), 0x51F5);
  EXPECT_EQ(test::rowText(rows, "Network Control Order"), "Unknown");
  EXPECT_EQ(test::rowText(rows, "PFC Supported"), "Unknown");
  EXPECT_EQ(test::rowText(rows, "Priority Access Threshold"), "Allowed");
  EXPECT_EQ(capture.lines(), test::warnings({"GPRSInformation", "GPRSInformation", "GPRSInformation"}));
}

// Edge case: a PFC byte of 255 reads "Available".
TEST_F(GprsInformation, APfcByteOf255ShowsAvailable) {
  const Dictionary rows = attachRows();
  feed(accessRecord(255, 7, 0), 0x51F5);
  EXPECT_EQ(test::rowText(rows, "PFC Supported"), "Available");
}

// Edge case: thresholds 2, 255 and 100.
TEST_F(GprsInformation, PriorityThresholdsOf2And255And100) {
  const Dictionary rows = attachRows();
  feed(accessRecord(0, 2, 0), 0x51F5);
  EXPECT_EQ(test::rowText(rows, "Priority Access Threshold"), "Barred");
  feed(accessRecord(0, 255, 0), 0x51F5);
  EXPECT_EQ(test::rowText(rows, "Priority Access Threshold"), "Not Available");
  feed(accessRecord(0, 100, 0), 0x51F5);
  EXPECT_EQ(test::rowText(rows, "Priority Access Threshold"), "Unknown");
}

TEST_F(GprsInformation, TheNetworkOperatingModeIsByte13OfTheRegistration) {
  const Dictionary rows = attachRows();
  Bytes p = logPacket(0x7135, 32);
  p[13] = 1;
  p[14] = 3;
  feed(p, 0x7135);
  EXPECT_EQ(Value(rows), D({{"Network Operating Mode", S("Class 2")}}));
  p[13] = 3;
  feed(p, 0x7135);
  EXPECT_EQ(Value(rows), D({{"Network Operating Mode", S("Unknown")}}));
  p.pop_back();
  p[13] = 0;
  feed(p, 0x7135);
  EXPECT_EQ(Value(rows), D({{"Network Operating Mode", S("Unknown")}}));
}

// Edge case: T3192 of 3 is "0 ms"; 9 is past the table.
TEST_F(GprsInformation, AT3192Of3ShowsZeroMsAnd9ShowsQuestionMarks) {
  const Dictionary rows = attachRows();
  feed(test::gprsCellOptionsPacket(3), 0x51F6);
  EXPECT_EQ(test::rowText(rows, "T3192"), "0 ms");
  feed(test::gprsCellOptionsPacket(9), 0x51F6);
  EXPECT_EQ(test::rowText(rows, "T3192"), "?? ms");
}

// Edge case (this section's half): byte 16 = 4 shows "4".
TEST_F(GprsInformation, TheCellOptionsShowT3192BurstTypeAndDrxTimer) {
  const Dictionary rows = attachRows();
  feed(test::gprsCellOptionsPacket(0, 4, 1), 0x51F6);
  EXPECT_EQ(Value(rows),
            D({{"T3192", S("500 ms")}, {"Access Burst Type", S("11-bit format")}, {"DRX Timer Max", S("4")}}));
  feed(test::gprsCellOptionsPacket(7, 0, 0), 0x51F6);
  EXPECT_EQ(Value(rows),
            D({{"T3192", S("200 ms")}, {"Access Burst Type", S("8-bit format")}, {"DRX Timer Max", S("0")}}));
}

TEST_F(GprsInformation, PbcchPresenceIsAPlainNumber) {
  const Dictionary rows = attachRows();
  Bytes p = logPacket(0x51FB, 34);
  p[13] = 1;
  feed(p, 0x51FB);
  EXPECT_EQ(Value(rows), D({{"PBCCH Present", S("1")}}));
  feed(logPacket(0x51FB, 33), 0x51FB);
  EXPECT_EQ(Value(rows), D({{"PBCCH Present", S("1")}}));
}

TEST_F(GprsInformation, ThePacketSystemInformationStatus) {
  const Dictionary rows = attachRows();
  feed(systemInfoRecord(), 0x51FD);
  EXPECT_EQ(Value(rows), D({{"Ext Measurement Order", S("1")},
                            {"Packet PSI Status", S("2")},
                            {"Packet SI Status", S("Supported")},
                            {"Count LR", S("3")},
                            {"Count HR", S("4")}}));
}

// Edge case: a 0x51FD record of 34 bytes changes nothing.
TEST_F(GprsInformation, A34BytePacketSystemInformationRecordChangesNothing) {
  const Dictionary rows = attachRows();
  feed(accessRecord(1, 3, 0), 0x51F5);
  const Value before = Value(rows).deepCopy();
  feed(systemInfoRecord(34), 0x51FD);
  EXPECT_EQ(Value(rows), before);
}

TEST_F(GprsInformation, TheSi13Position) {
  const Dictionary rows = attachRows();
  Bytes p = logPacket(0x51F4, 15);
  p[13] = 1;
  p[14] = 1;
  feed(p, 0x51F4);
  EXPECT_EQ(Value(rows), D({{"SI13 Position", S("Located on Extended BCCH")}}));
  p[14] = 255;
  feed(p, 0x51F4);
  EXPECT_EQ(Value(rows), D({{"SI13 Position", S("Not Available")}}));
  p[14] = 2;
  feed(p, 0x51F4);
  EXPECT_EQ(Value(rows), D({{"SI13 Position", S("Unknown")}}));
  p[14] = 0;
  p.pop_back();
  feed(p, 0x51F4);
  EXPECT_EQ(Value(rows), D({{"SI13 Position", S("Unknown")}}));
}

TEST_F(GprsInformation, TheReselectionHysteresisIsByte26OfTheCellMeasurement) {
  const Dictionary rows = attachRows();
  Bytes p = test::gsmMeasurementPacket(70, 30, 34);
  feed(p, 0x5137);
  EXPECT_EQ(Value(rows), D({{"Cell Reselect Hysteresis", S("Not Applied")}}));
  p[26] = 6;
  feed(p, 0x5137);
  EXPECT_EQ(Value(rows), D({{"Cell Reselect Hysteresis", S("Applied")}}));
}

// The codes between its own that it does not subscribe to.
TEST_F(GprsInformation, CodesInsideItsRangeThatItDoesNotHandleAreUnknown) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  for (std::uint16_t code : {0x51F7, 0x51F8, 0x51F9, 0x51FA, 0x51FC}) feed(logPacket(code, 40), code);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "GPRSInformation"},
                                                     {log::kError, "Received an unknown log message: 20983"},
                                                     {log::kWarning, "GPRSInformation"},
                                                     {log::kError, "Received an unknown log message: 20984"},
                                                     {log::kWarning, "GPRSInformation"},
                                                     {log::kError, "Received an unknown log message: 20985"},
                                                     {log::kWarning, "GPRSInformation"},
                                                     {log::kError, "Received an unknown log message: 20986"},
                                                     {log::kWarning, "GPRSInformation"},
                                                     {log::kError, "Received an unknown log message: 20988"}}));
}

TEST_F(GprsInformation, ShortRecordsOfEveryCodeAreDroppedSilently) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  const std::pair<std::uint16_t, std::size_t> shortest[] = {{0x51F5, 17}, {0x7135, 31}, {0x51F6, 23}, {0x51FB, 33},
                                                            {0x51FD, 34}, {0x51F4, 14}, {0x5137, 28}};
  for (const auto& [code, size] : shortest) {
    Bytes p = logPacket(code, size);
    std::fill(p.begin() + 13, p.end(), 1);
    feed(p, code);
  }
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines().size(), 7u);
}

}  // namespace
}  // namespace corvane
