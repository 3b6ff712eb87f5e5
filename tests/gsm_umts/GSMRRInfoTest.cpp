// "GSM RR Info": the RR state of 0x512C, the serving cell's level and
// qualities of 0x5137, DTX of 0x5072 and DRX of 0x51F6.

#include "LogGenerator/gsm_umts/GSMRRInfo.h"

#include "gsm_umts/GsmCellPackets.h"
#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::logPacket;
using test::S;

using GsmRrInfo = test::GsmUmtsSectionTest<GSMRRInfo>;

// 0x512C: the state at 13, substate 14, status 15, mode 16; 17 bytes.
Bytes rrStateRecord(std::uint8_t state, std::uint8_t substate = 0, std::uint8_t status = 0, std::uint8_t mode = 0) {
  Bytes p = logPacket(0x512C, 17);
  p[13] = state;
  p[14] = substate;
  p[15] = status;
  p[16] = mode;
  return p;
}

// 0x5072: DTX at 19; 20 bytes.
Bytes dtxRecord(std::uint8_t dtx) {
  Bytes p = logPacket(0x5072, 20);
  p[19] = dtx;
  return p;
}

TEST_F(GsmRrInfo, RegistersForItsFourCodesInOrder) {
  EXPECT_EQ(classDict.at("GSM RR Info"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0x512C, 0x5137, 0x5072, 0x51F6}));
}

TEST_F(GsmRrInfo, ShowsTheRrStateItsNumbersAndTheMode) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(rrStateRecord(5, 2, 7, 0), 0x512C);
  EXPECT_EQ(Value(rows), D({{"RR State", S("RR_IDLE")},
                            {"RR Sub State", S("2")},
                            {"RR Status", S("7")},
                            {"RR Mode", S("Voice")}}));
  feed(rrStateRecord(9, 255, 0, 3), 0x512C);
  EXPECT_EQ(test::rowText(rows, "RR State"), "RR_DATA_TRANSFER");
  EXPECT_EQ(test::rowText(rows, "RR Sub State"), "255");
  EXPECT_EQ(test::rowText(rows, "RR Mode"), "Data");
  EXPECT_EQ(capture.lines(), test::warnings({"GSMRRInfo", "GSMRRInfo"}));
}

// Edge case: 16 is "GRR51"; 22 is past the table.
TEST_F(GsmRrInfo, AnRrStateOf16ShowsGrr51And22ShowsUnknown) {
  const Dictionary rows = attachRows();
  feed(rrStateRecord(16), 0x512C);
  EXPECT_EQ(test::rowText(rows, "RR State"), "GRR51");
  feed(rrStateRecord(22), 0x512C);
  EXPECT_EQ(test::rowText(rows, "RR State"), "Unknown");
}

TEST_F(GsmRrInfo, TheInterRatStatesKeepTheBlankBeforeProgress) {
  const Dictionary rows = attachRows();
  feed(rrStateRecord(13), 0x512C);
  EXPECT_EQ(test::rowText(rows, "RR State"), "RR_W2G_INTERRAT_HANDOVER_ PROGRESS");
  feed(rrStateRecord(14), 0x512C);
  EXPECT_EQ(test::rowText(rows, "RR State"), "RR_W2G_INTERRAT_RESELECTION_PROGRESS");
  feed(rrStateRecord(19), 0x512C);
  EXPECT_EQ(test::rowText(rows, "RR State"), "RR_G2W_INTERRAT_HANDOVER_ PROGRESS");
  feed(rrStateRecord(21), 0x512C);
  EXPECT_EQ(test::rowText(rows, "RR State"), "RR_W2G_INTERRAT_CC_ORDER_ PROGRESS");
}

// Edge case (this section's half): C1 of -5 in bytes 16 to 19 shows whole and signed.
TEST_F(GsmRrInfo, TheServingCellsQualitiesShowTheirWhole32BitsSigned) {
  const Dictionary rows = attachRows();
  feed(test::gsmMeasurementPacket(71, -5, 70000), 0x5137);
  EXPECT_EQ(Value(rows), D({{"Serving Rx Level", S("71")},
                            {"Rx Quality Full", S("-5")},
                            {"Rx Quality Sub", S("70000")}}));
}

TEST_F(GsmRrInfo, DtxIsOnForAnyByteButZero) {
  const Dictionary rows = attachRows();
  feed(dtxRecord(0), 0x5072);
  EXPECT_EQ(Value(rows), D({{"DTX Used", S("OFF")}}));
  feed(dtxRecord(2), 0x5072);
  EXPECT_EQ(Value(rows), D({{"DTX Used", S("ON")}}));
}

// Edge case (this section's half): byte 16 of 0x51F6 = 4 shows "4 sec".
TEST_F(GsmRrInfo, TheDrxTimerShowsInSeconds) {
  const Dictionary rows = attachRows();
  feed(test::gprsCellOptionsPacket(3, 4, 1), 0x51F6);
  EXPECT_EQ(Value(rows), D({{"DRX Used", S("4 sec")}}));
}

TEST_F(GsmRrInfo, ShortRecordsAreDroppedAndAnotherCodeLogged) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(logPacket(0x512C, 16), 0x512C);
  feed(logPacket(0x5137, 28), 0x5137);
  feed(logPacket(0x5072, 19), 0x5072);
  feed(logPacket(0x51F6, 23), 0x51F6);
  feed(rrStateRecord(5), 0x5134);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "GSMRRInfo"},
                                                     {log::kWarning, "GSMRRInfo"},
                                                     {log::kWarning, "GSMRRInfo"},
                                                     {log::kWarning, "GSMRRInfo"},
                                                     {log::kWarning, "GSMRRInfo"},
                                                     {log::kError, "Received an unknown log message: 20788"}}));
}

}  // namespace
}  // namespace corvane
