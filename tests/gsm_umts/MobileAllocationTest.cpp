// "Mobile Allocation": the hopping sequence number and the ARFCNs hopped over.

#include "LogGenerator/gsm_umts/MobileAllocation.h"

#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::logPacket;
using test::put16;
using test::S;

using Allocation = test::GsmUmtsSectionTest<MobileAllocation>;

// 0x51F8: HSN at 13, the number of ARFCNs at 14, then 16 bits an ARFCN from 15.
Bytes allocationPacket(std::uint8_t hsn, std::uint8_t count, std::initializer_list<std::uint16_t> arfcns) {
  Bytes p = logPacket(0x51F8, 15 + 2 * arfcns.size());
  p[13] = hsn;
  p[14] = count;
  std::size_t at = 15;
  for (std::uint16_t arfcn : arfcns) {
    put16(p, at, arfcn);
    at += 2;
  }
  return p;
}

TEST_F(Allocation, RegistersUnderItsNameForItsOneCode) {
  EXPECT_EQ(classDict.at("Mobile Allocation"), section);
  EXPECT_EQ(section->getLogCodeArray(), std::vector<std::uint32_t>{0x51F8});
  EXPECT_EQ(codeDict.keys(), std::vector<std::string>{"20984"});
}

TEST_F(Allocation, SetsTheHsnAndTheListOfArfcns) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(allocationPacket(5, 3, {1, 124, 975}), 0x51F8);
  EXPECT_EQ(Value(rows), D({{"HSN", S("5")}, {"ARFCNs", A({S("1"), S("124"), S("975")})}}));
  EXPECT_EQ(capture.lines(), test::warnings({"MobileAllocation"}));
}

TEST_F(Allocation, ACountOf0GivesAnEmptyList) {
  const Dictionary rows = attachRows();
  feed(allocationPacket(5, 3, {1, 124, 975}), 0x51F8);
  feed(allocationPacket(63, 0, {}), 0x51F8);
  EXPECT_EQ(Value(rows), D({{"HSN", S("63")}, {"ARFCNs", A({})}}));
}

// The list is a new one each time: one the display still holds keeps its contents.
TEST_F(Allocation, EachRecordReplacesTheListWhole) {
  const Dictionary rows = attachRows();
  feed(allocationPacket(5, 2, {1, 2}), 0x51F8);
  const Value before = *rows.find("ARFCNs");
  feed(allocationPacket(5, 1, {3}), 0x51F8);
  EXPECT_EQ(before, A({S("1"), S("2")}));
  EXPECT_EQ(*rows.find("ARFCNs"), A({S("3")}));
}

TEST_F(Allocation, ArfcnsACountPlacesPastTheEndAreNotShown) {
  const Dictionary rows = attachRows();
  Bytes p = allocationPacket(5, 3, {1, 124});
  p.push_back(0x07);  // one byte of a third ARFCN
  feed(p, 0x51F8);
  EXPECT_EQ(*rows.find("ARFCNs"), A({S("1"), S("124")}));
}

TEST_F(Allocation, TheBoundedAccessorThrowsAtTheCount) {
  const Bytes p = allocationPacket(5, 2, {1, 2});
  const BoundedList arfcns = MobileAllocation::arfcns(PacketView(p));
  EXPECT_EQ(arfcns.entryOffset(1), 17u);
  EXPECT_THROW(arfcns.entryOffset(2), ArrayOutOfBoundsException);
}

TEST_F(Allocation, A14BytePacketIsDroppedAndAnotherCodeLogged) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(logPacket(0x51F8, 14), 0x51F8);
  feed(allocationPacket(5, 0, {}), 0x51FF);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "MobileAllocation"},
                                                     {log::kWarning, "MobileAllocation"},
                                                     {log::kError, "Received an unknown log message: 20991"}}));
}

}  // namespace
}  // namespace corvane
