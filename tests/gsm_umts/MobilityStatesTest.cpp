// "Process CO", "Process CS" and "Process PS": the mobility management state
// machines shown by name, one table per byte, "Unknown" outside a table and at
// its gaps.

#include "LogGenerator/gsm_umts/ProcessCO.h"
#include "LogGenerator/gsm_umts/ProcessCS.h"
#include "LogGenerator/gsm_umts/ProcessPS.h"

#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::D;
using test::logPacket;
using test::S;

using ProcessCo = test::GsmUmtsSectionTest<ProcessCO>;
using ProcessCs = test::GsmUmtsSectionTest<ProcessCS>;
using ProcessPs = test::GsmUmtsSectionTest<ProcessPS>;

// 0x7131 (MM) and 0x7130 (GMM): the state at 13, the substate at 14, the
// update status at 15, in a record of 16 bytes.
Bytes stateRecord(std::uint16_t code, std::uint8_t state, std::uint8_t substate, std::uint8_t status,
                  std::size_t size = 16) {
  Bytes p = logPacket(code, size);
  if (size > 13) p[13] = state;
  if (size > 14) p[14] = substate;
  if (size > 15) p[15] = status;
  return p;
}

// 0x7132: the registration service state at 13 (the selection mode at 14).
Bytes serviceStateRecord(std::uint8_t state) {
  Bytes p = logPacket(0x7132, 16);
  p[13] = state;
  p[14] = 1;
  return p;
}

TEST_F(ProcessCo, RegistersForTheMmStateAndTheServiceState) {
  EXPECT_EQ(classDict.at("Process CO"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0x7131, 0x7132}));
}

TEST_F(ProcessPs, RegistersForTheGmmStateAndTheServiceState) {
  EXPECT_EQ(classDict.at("Process PS"), section);
  EXPECT_EQ(section->getLogCodeArray(), (std::vector<std::uint32_t>{0x7130, 0x7132}));
}

TEST_F(ProcessCo, ShowsTheMmStateAloneAndTracesItselfAsTheCircuitSwitchedSection) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(stateRecord(0x7131, 19, 8, 0), 0x7131);
  EXPECT_EQ(Value(rows), D({{"MM State", S("MM_IDLE")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"ProcessCS"}));
}

// Edge case: an MM state of 4 is a gap of the table; 19 is MM_IDLE.
TEST_F(ProcessCs, AnMmStateOf4ShowsUnknownAnd19ShowsMmIdle) {
  const Dictionary rows = attachRows();
  feed(stateRecord(0x7131, 4, 8, 0), 0x7131);
  EXPECT_EQ(test::rowText(rows, "MM State"), "Unknown");
  feed(stateRecord(0x7131, 19, 8, 0), 0x7131);
  EXPECT_EQ(test::rowText(rows, "MM State"), "MM_IDLE");
}

TEST_F(ProcessCs, EveryGapAndTheEndOfTheMmStateTableShowUnknown) {
  const Dictionary rows = attachRows();
  for (std::uint8_t gap : {1, 2, 4, 11, 12, 16, 24, 26, 255}) {
    feed(stateRecord(0x7131, gap, 0, 0), 0x7131);
    EXPECT_EQ(test::rowText(rows, "MM State"), "Unknown") << int(gap);
  }
  feed(stateRecord(0x7131, 25, 0, 0), 0x7131);
  EXPECT_EQ(test::rowText(rows, "MM State"), "MM_RR_CONNECTION_RELEASE_NOT_ALLOWED");
}

// The blank after the last underscore but one is part of the texts.
TEST_F(ProcessCs, TheLongMmStatesKeepTheirBlanks) {
  const Dictionary rows = attachRows();
  feed(stateRecord(0x7131, 20, 0, 0), 0x7131);
  EXPECT_EQ(test::rowText(rows, "MM State"), "MM_WAIT_FOR_ADDITIONAL_OUTGOING_MM_ CONNECTION");
  feed(stateRecord(0x7131, 21, 0, 0), 0x7131);
  EXPECT_EQ(test::rowText(rows, "MM State"), "MM_WAIT_FOR_RR_CONNECTION_ REESTABLISHMENT");
}

TEST_F(ProcessCs, ShowsStateSubstateAndUpdateStatusInThatOrder) {
  const Dictionary rows = attachRows();
  feed(stateRecord(0x7131, 3, 5, 1), 0x7131);
  EXPECT_EQ(Value(rows), D({{"MM State", S("MM_LOCATION_UPDATE_INITIATED")},
                            {"MM Sub State", S("MM_LOCATION_UPDATE_NEEDED")},
                            {"LU Reject Cause", S("NOT_UPDATED")}}));
  feed(stateRecord(0x7131, 19, 9, 4), 0x7131);
  EXPECT_EQ(Value(rows), D({{"MM State", S("MM_IDLE")},
                            {"MM Sub State", S("Unknown")},
                            {"LU Reject Cause", S("Unknown")}}));
}

// Edge case: a 0x7131 record of 15 bytes changes nothing.
TEST_F(ProcessCs, A15ByteMmRecordChangesNothing) {
  const Dictionary rows = attachRows();
  feed(stateRecord(0x7131, 6, 8, 0), 0x7131);
  log::ScopedCapture capture;
  feed(stateRecord(0x7131, 19, 2, 3, 15), 0x7131);
  EXPECT_EQ(Value(rows), D({{"MM State", S("MM_CONNECTION_ACTIVE")},
                            {"MM Sub State", S("MM_NORMAL_SERVICE")},
                            {"LU Reject Cause", S("UPDATED")}}));
  EXPECT_EQ(capture.lines(), test::warnings({"ProcessCS"}));
}

TEST_F(ProcessCo, A15ByteMmRecordChangesNothingEither) {
  const Dictionary rows = attachRows();
  feed(stateRecord(0x7131, 19, 0, 0, 15), 0x7131);
  EXPECT_TRUE(rows.empty());
}

// Edge case: a GMM substate of 9 keeps its missing T.
TEST_F(ProcessPs, AGmmSubstateOf9ShowsTheSpellingWithoutItsT) {
  const Dictionary rows = attachRows();
  feed(stateRecord(0x7130, 5, 9, 1), 0x7130);
  EXPECT_EQ(Value(rows), D({{"MM State", S("GMM_ROUTING_AREA_UPDATE_INITIATED")},
                            {"MM Sub State", S("GMM_ATTEMPING_TO_UPDATE")},
                            {"Attach Reject Cause", S("GMM_GU2_NOT_UPDATED")}}));
}

TEST_F(ProcessPs, ValuesPastTheGmmTablesShowUnknown) {
  const Dictionary rows = attachRows();
  feed(stateRecord(0x7130, 6, 12, 3), 0x7130);
  EXPECT_EQ(Value(rows), D({{"MM State", S("GMM_SERVICE_REQUEST_INITIATED")},
                            {"MM Sub State", S("GMM_NULL_SUBSTATE")},
                            {"Attach Reject Cause", S("GMM_GU3_ROUTING_AREA_NOT_ALLOWED")}}));
  feed(stateRecord(0x7130, 7, 13, 4), 0x7130);
  EXPECT_EQ(Value(rows), D({{"MM State", S("Unknown")},
                            {"MM Sub State", S("Unknown")},
                            {"Attach Reject Cause", S("Unknown")}}));
}

TEST_F(ProcessPs, A15ByteGmmRecordChangesNothing) {
  const Dictionary rows = attachRows();
  feed(stateRecord(0x7130, 3, 0, 0, 15), 0x7130);
  EXPECT_TRUE(rows.empty());
}

// Edge case: a 0x7130 record handed to "Process CO" is a code it does not own.
TEST_F(ProcessCo, AGmmRecordLogsTheUnknownCodeMessage) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(stateRecord(0x7130, 3, 0, 0), 0x7130);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::errorsAfter("ProcessCS", {"Received an unknown log message: 28976"}));
}

TEST_F(ProcessPs, AnMmRecordLogsTheUnknownCodeMessage) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(stateRecord(0x7131, 19, 0, 0), 0x7131);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::errorsAfter("ProcessPS", {"Received an unknown log message: 28977"}));
}

// Edge case: a service state of 7 is past the table.
TEST_F(ProcessCs, AServiceStateOf7ShowsUnknown) {
  const Dictionary rows = attachRows();
  feed(serviceStateRecord(6), 0x7132);
  EXPECT_EQ(Value(rows), D({{"MM Service State", S("REG_STATE_OFFLINE")}}));
  feed(serviceStateRecord(7), 0x7132);
  EXPECT_EQ(Value(rows), D({{"MM Service State", S("Unknown")}}));
}

TEST_F(ProcessPs, TheServiceStateIsByte13NotTheSelectionModeAt14) {
  const Dictionary rows = attachRows();
  feed(serviceStateRecord(2), 0x7132);
  EXPECT_EQ(Value(rows), D({{"MM Service State", S("REG_STATE_REGISTERING")}}));
  Bytes shortRecord = serviceStateRecord(0);
  shortRecord.pop_back();
  feed(shortRecord, 0x7132);
  EXPECT_EQ(Value(rows), D({{"MM Service State", S("REG_STATE_REGISTERING")}}));
}

TEST_F(ProcessCo, ShowsTheServiceStateBesideTheMmState) {
  const Dictionary rows = attachRows();
  feed(serviceStateRecord(1), 0x7132);
  feed(stateRecord(0x7131, 0, 0, 0), 0x7131);
  EXPECT_EQ(Value(rows), D({{"MM Service State", S("REG_STATE_IDLE")}, {"MM State", S("MM_NULL")}}));
}

}  // namespace
}  // namespace corvane
