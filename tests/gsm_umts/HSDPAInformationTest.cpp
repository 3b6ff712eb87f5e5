// "HSDPA Info": the version, sub-frames and carrier of 0x4221, and per HARQ
// process of each carrier what it received, every number unsigned.

#include "LogGenerator/gsm_umts/HSDPAInformation.h"

#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::logPacket;
using test::put16;
using test::put32;
using test::S;

using HsdpaInformation = test::GsmUmtsSectionTest<HSDPAInformation>;

struct Process {
  std::uint8_t id;
  std::uint32_t bits;
  std::uint16_t newTx;
  std::uint16_t errors;
};

// A HARQ entry: id, bits received (32 bits), new transmissions and block errors (16 bits each).
void putProcess(Bytes& p, std::size_t at, const Process& process) {
  p.at(at) = process.id;
  put32(p, at + 1, process.bits);
  put16(p, at + 5, process.newTx);
  put16(p, at + 7, process.errors);
}

// 0x4221: version at 13, sub-frames in bits 0-9 of the 16 bits at 14, the
// carrier in bits 2-3 of 15, p at 16, s at 17, the primary entries 9 bytes
// apart from 18, the secondary ones 9 bytes apart from 18 + 162 p.
Bytes hsdpaRecord(std::uint8_t version, std::uint16_t subFrames, std::uint8_t carrierBits,
                  const std::vector<Process>& primary, const std::vector<Process>& secondary) {
  const std::size_t secondaryStart = 18 + 162 * primary.size();
  Bytes p = logPacket(0x4221, secondary.empty() ? 18 + 9 * primary.size() : secondaryStart + 9 * secondary.size());
  p[13] = version;
  put16(p, 14, subFrames);
  p[15] = static_cast<std::uint8_t>(p[15] | carrierBits);
  p[16] = static_cast<std::uint8_t>(primary.size());
  p[17] = static_cast<std::uint8_t>(secondary.size());
  for (std::size_t i = 0; i < primary.size(); ++i) putProcess(p, 18 + 9 * i, primary[i]);
  for (std::size_t i = 0; i < secondary.size(); ++i) putProcess(p, secondaryStart + 9 * i, secondary[i]);
  return p;
}

Value process(const char* id, const char* bits, const char* newTx, const char* errors) {
  return D({{"Process ID", S(id)}, {"No Rx Bits", S(bits)}, {"New Tx", S(newTx)}, {"Block Errors", S(errors)}});
}

TEST_F(HsdpaInformation, RegistersUnderHsdpaInfoForItsOneCode) {
  EXPECT_EQ(classDict.at("HSDPA Info"), section);
  EXPECT_EQ(section->getLogCodeArray(), std::vector<std::uint32_t>{0x4221});
}

TEST_F(HsdpaInformation, ShowsTheScalarsAndThePrimaryProcessesUnsigned) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(hsdpaRecord(7, 500, 0x00, {{0, 4000000000u, 65535, 12}, {5, 123, 2, 0}}, {}), 0x4221);
  EXPECT_EQ(Value(rows), D({{"Version", S("7")},
                            {"Sub Frames", S("500")},
                            {"Carrier Info", S("Single Carrier")},
                            {"Primary HARQ Process",
                             A({process("0", "4000000000", "65535", "12"), process("5", "123", "2", "0")})}}));
  EXPECT_EQ(capture.lines(), test::warnings({"HSDPA Info"}));
}

// Edge case: the carrier is bits 2-3 of byte 15.
TEST_F(HsdpaInformation, TheCarrierIsBits2And3OfByte15) {
  const Dictionary rows = attachRows();
  const std::pair<std::uint8_t, const char*> carriers[] = {
      {0x04, "MIMO"}, {0x08, "Dual Carrier"}, {0x0C, "Reserved"}, {0x00, "Single Carrier"}};
  for (const auto& [byte15, text] : carriers) {
    Bytes p = logPacket(0x4221, 18);
    p[15] = byte15;
    feed(p, 0x4221);
    EXPECT_EQ(test::rowText(rows, "Carrier Info"), text) << int(byte15);
    EXPECT_EQ(test::rowText(rows, "Sub Frames"), "0") << int(byte15);
  }
}

// Edge case: 0xFF 0x03 at 14-15 is 1023 sub-frames on a single carrier.
TEST_F(HsdpaInformation, TenBitsOfSubFramesLeaveTheCarrierBitsAlone) {
  const Dictionary rows = attachRows();
  Bytes p = logPacket(0x4221, 18);
  p[14] = 0xFF;
  p[15] = 0x03;
  feed(p, 0x4221);
  EXPECT_EQ(test::rowText(rows, "Sub Frames"), "1023");
  EXPECT_EQ(test::rowText(rows, "Carrier Info"), "Single Carrier");
  p[15] = 0xFF;
  feed(p, 0x4221);
  EXPECT_EQ(test::rowText(rows, "Sub Frames"), "1023");
  EXPECT_EQ(test::rowText(rows, "Carrier Info"), "Reserved");
}

// Edge case: counts of 0 leave both lists as the record before set them.
TEST_F(HsdpaInformation, CountsOf0LeaveBothListsAsTheyWere) {
  const Dictionary rows = attachRows();
  feed(hsdpaRecord(1, 10, 0x08, {{1, 100, 1, 0}}, {{2, 200, 2, 1}}), 0x4221);
  feed(hsdpaRecord(2, 20, 0x08, {}, {}), 0x4221);
  EXPECT_EQ(Value(rows), D({{"Version", S("2")},
                            {"Sub Frames", S("20")},
                            {"Carrier Info", S("Dual Carrier")},
                            {"Primary HARQ Process", A({process("1", "100", "1", "0")})},
                            {"Secondary HARQ Process", A({process("2", "200", "2", "1")})}}));
}

// Edge case: with p = 1 the secondary entry is at 18 + 162 = 180, not 27.
TEST_F(HsdpaInformation, WithOnePrimaryEntryTheSecondaryOneIsReadAtOffset180) {
  const Dictionary rows = attachRows();
  Bytes p = hsdpaRecord(1, 10, 0x08, {{1, 100, 1, 0}}, {{9, 900, 90, 9}});
  ASSERT_EQ(p.size(), 189u);
  EXPECT_EQ(p[180], 9);
  putProcess(p, 27, {3, 300, 3, 3});  // where a 9-byte stride would put it
  feed(p, 0x4221);
  EXPECT_EQ(*rows.find("Secondary HARQ Process"), A({process("9", "900", "90", "9")}));
  EXPECT_EQ(*rows.find("Primary HARQ Process"), A({process("1", "100", "1", "0")}));
}

// Each record sets new lists: a list the display still holds keeps its rows.
TEST_F(HsdpaInformation, EachRecordSetsANewList) {
  const Dictionary rows = attachRows();
  feed(hsdpaRecord(1, 10, 0, {{1, 100, 1, 0}}, {}), 0x4221);
  const Value before = *rows.find("Primary HARQ Process");
  feed(hsdpaRecord(1, 10, 0, {{1, 150, 2, 0}}, {}), 0x4221);
  EXPECT_EQ(before, A({process("1", "100", "1", "0")}));
  EXPECT_EQ(*rows.find("Primary HARQ Process"), A({process("1", "150", "2", "0")}));
}

TEST_F(HsdpaInformation, EntriesACountPlacesPastTheEndAreNotShown) {
  const Dictionary rows = attachRows();
  Bytes p = hsdpaRecord(1, 10, 0, {{1, 100, 1, 0}, {2, 200, 2, 0}}, {});
  p[16] = 3;
  p.resize(p.size() + 8);  // a third entry one byte short
  p[17] = 1;               // a secondary entry at 18 + 486, far past the end
  feed(p, 0x4221);
  EXPECT_EQ(*rows.find("Primary HARQ Process"), A({process("1", "100", "1", "0"), process("2", "200", "2", "0")}));
  EXPECT_EQ(*rows.find("Secondary HARQ Process"), A({}));
}

TEST_F(HsdpaInformation, TheBoundedAccessorsThrowAtTheirCounts) {
  const Bytes p = hsdpaRecord(1, 10, 0, {{1, 100, 1, 0}, {2, 200, 2, 0}}, {{3, 300, 3, 0}});
  const BoundedList primary = HSDPAInformation::primaryProcesses(PacketView(p));
  const BoundedList secondary = HSDPAInformation::secondaryProcesses(PacketView(p));
  EXPECT_EQ(primary.entryOffset(1), 27u);
  EXPECT_THROW(primary.entryOffset(2), ArrayOutOfBoundsException);
  EXPECT_EQ(secondary.entryOffset(0), 18u + 324u);
  EXPECT_THROW(secondary.entryOffset(1), ArrayOutOfBoundsException);
}

TEST_F(HsdpaInformation, AShortRecordOrAnotherCodeIsDroppedWithoutAMessage) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  Bytes p = logPacket(0x4221, 17);
  p[13] = 1;
  feed(p, 0x4221);
  feed(hsdpaRecord(1, 10, 0, {{1, 100, 1, 0}}, {}), 0x4222);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), test::warnings({"HSDPA Info", "HSDPA Info"}));
}

}  // namespace
}  // namespace corvane
