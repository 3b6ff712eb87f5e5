// "RRC Info": the RRC state of record 0xD0E0, its version byte at 13 and its
// state number at 14.

#include "LogGenerator/utran/RRC_State.h"

#include "utran/UtranSectionFixture.h"

namespace corvane {
namespace {

using test::logPacket;
using test::rowText;

using RrcState = test::UtranSectionTest<RRC_State>;

Bytes rrcPacket(std::uint8_t version, std::uint8_t state) {
  Bytes p = logPacket(0xD0E0, 15);
  p[13] = version;
  p[14] = state;
  return p;
}

TEST_F(RrcState, RegistersUnderItsNameForItsOneCode) {
  EXPECT_EQ(classDict.at("RRC Info"), section);
  EXPECT_EQ(section->getLogCodeArray(), std::vector<std::uint32_t>{0xD0E0});
}

TEST_F(RrcState, VersionOneWithStateThreeIsCellDch) {
  const Dictionary rows = attachRows();
  log::ScopedCapture quiet;
  feed(rrcPacket(1, 3), 0xD0E0);
  EXPECT_EQ(rowText(rows, "State"), "Cell DCH");
}

TEST_F(RrcState, EveryStateOfTheTable) {
  const Dictionary rows = attachRows();
  log::ScopedCapture quiet;
  const char* expected[] = {"Disconnected", "Connecting", "Cell Fach", "Cell DCH", "Cell PCH", "Cell URA PCH"};
  for (std::uint8_t state = 0; state < 6; ++state) {
    feed(rrcPacket(1, state), 0xD0E0);
    EXPECT_EQ(rowText(rows, "State"), expected[state]) << int(state);
  }
}

TEST_F(RrcState, AnotherVersionIsUnknownWhateverTheStateByte) {
  const Dictionary rows = attachRows();
  log::ScopedCapture quiet;
  for (std::uint8_t state : {0, 3, 5}) {
    feed(rrcPacket(1, 2), 0xD0E0);
    feed(rrcPacket(2, state), 0xD0E0);
    EXPECT_EQ(rowText(rows, "State"), "Unknown RRC Mode");
  }
}

TEST_F(RrcState, StateSixIsUnknown) {
  const Dictionary rows = attachRows();
  log::ScopedCapture quiet;
  feed(rrcPacket(1, 6), 0xD0E0);
  EXPECT_EQ(rowText(rows, "State"), "Unknown RRC Mode");
}

TEST_F(RrcState, AFourteenBytePacketIsTracedWithItsLengthAndReadAllTheSame) {
  const Dictionary rows = attachRows();
  Bytes p = logPacket(0xD0E0, 14);
  p[13] = 1;
  log::ScopedCapture capture;
  feed(p, 0xD0E0);
  const std::vector<log::Line> expected = {{log::kWarning, "RRC Info"},
                                           {log::kWarning, "LogCode_0xD0E0 is length is 14 expected size 15"},
                                           {log::kMessage, "Display Dict = { State = \"Disconnected\"; }, rrc mode = 0 Disconnected"}};
  EXPECT_EQ(capture.lines(), expected);
  // The state byte lies past the end and reads as zero.
  EXPECT_EQ(rowText(rows, "State"), "Disconnected");
}

TEST_F(RrcState, EveryRecordGoesToTheMessageLogWithTheDisplayAndTheState) {
  const Dictionary rows = attachRows();
  rows.set("Other", Value("x"));
  log::ScopedCapture capture;
  feed(rrcPacket(3, 1), 0xD0E0);
  const std::vector<log::Line> expected = {
      {log::kWarning, "RRC Info"},
      {log::kMessage, "Display Dict = { Other = \"x\"; State = \"Unknown RRC Mode\"; }, rrc mode = 255 Unknown RRC Mode"}};
  EXPECT_EQ(capture.lines(), expected);
}

TEST_F(RrcState, AnotherCodeIsOnlyTraced) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(rrcPacket(1, 3), 0xD0E2);
  EXPECT_EQ(capture.lines(), test::warnings({"RRC Info"}));
  EXPECT_FALSE(rows.contains("State"));
}

}  // namespace
}  // namespace corvane
