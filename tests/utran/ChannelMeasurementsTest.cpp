// "TRCH BLER" and "CCTRCH SIR" from record 0xD00C: the transport-channel
// count in bits 6-11 of the 16 bits at 14, 2 bytes a channel from 17; the
// CCTrCH count in bits 4-7 of byte 15, 8 bytes a CCTrCH from 289 + 34 × the
// transport-channel count.

#include "LogGenerator/utran/CCTRCHSIRMeasurement.h"
#include "LogGenerator/utran/TRCHBLERMeasurement.h"

#include "utran/UtranSectionFixture.h"

namespace corvane {
namespace {

using test::logPacket;
using test::put16;
using test::rowAt;
using test::rowText;

using TrchBler = test::UtranSectionTest<TRCHBLERMeasurement>;
using CctrchSir = test::UtranSectionTest<CCTRCHSIRMeasurement>;

Bytes channelPacket(std::uint16_t countBits, std::size_t size) {
  Bytes p = logPacket(0xD00C, size);
  put16(p, 14, countBits);
  return p;
}

TEST_F(TrchBler, CountTwoAtFourteenGivesTwoRowsTracedAtLevelFive) {
  const Array list = attachList();
  Bytes p = channelPacket(0x0080, 21);
  p[17] = 6;
  p[18] = 12;
  p[19] = 7;
  p[20] = 0;
  log::ScopedCapture capture;
  feed(p, 0xD00C);
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kNotice, "TRCH BLER Measurement"}}));
  ASSERT_EQ(list.size(), 2u);
  EXPECT_EQ(test::keysOf(rowAt(list, 0)), (std::vector<std::string>{"TRCH ID", "TRCH BLER Measurement"}));
  EXPECT_EQ(rowText(rowAt(list, 0), "TRCH ID"), "6");
  EXPECT_EQ(rowText(rowAt(list, 0), "TRCH BLER Measurement"), "12");
  EXPECT_EQ(rowText(rowAt(list, 1), "TRCH ID"), "7");
}

TEST_F(CctrchSir, CountTwoTransportChannelsAndNoCctrchGivesAnEmptyList) {
  const Array list = attachList();
  list.append(Value("stale"));
  log::ScopedCapture capture;
  feed(channelPacket(0x0080, 21), 0xD00C);
  EXPECT_EQ(capture.lines(), test::warnings({"CCTRCH SIR Measurement"}));
  EXPECT_EQ(list.size(), 0u);
}

// Two transport channels put the CCTrCHs at 289 + 68 = 357.
TEST_F(CctrchSir, CctrchsFollowThirtyFourBytesPerTransportChannel) {
  const Array list = attachList();
  Bytes p = channelPacket(0x2080, 357 + 16);
  for (std::size_t i = 0; i < 16; ++i) p[357 + i] = static_cast<std::uint8_t>(10 + i);
  log::ScopedCapture quiet;
  feed(p, 0xD00C);
  ASSERT_EQ(list.size(), 2u);
  const Dictionary second = rowAt(list, 1);
  EXPECT_EQ(test::keysOf(second), (std::vector<std::string>{"CCTRCH ID", "TSNUM", "SIR"}));
  EXPECT_EQ(rowText(second, "CCTRCH ID"), "18");
  EXPECT_EQ(rowText(second, "TSNUM"), "19");
  EXPECT_EQ(*second.find("SIR"), test::A({test::S("20"), test::S("21"), test::S("22"), test::S("23"), test::S("24"),
                                          test::S("25")}));
}

TEST_F(CctrchSir, TheListStopsAtTheLastCctrchWhollyInsideThePacket) {
  const Array list = attachList();
  Bytes p = channelPacket(0x3000, 289 + 8 * 2 + 7);
  log::ScopedCapture quiet;
  feed(p, 0xD00C);
  EXPECT_EQ(list.size(), 2u);
}

TEST(CctrchSirValues, ASeventhSirValueIsOutOfBounds) {
  const BoundedList values = CCTRCHSIRMeasurement::sirValues(289);
  EXPECT_EQ(values.entryOffset(5), 289u + 7u);
  EXPECT_THROW(values.entryOffset(6), ArrayOutOfBoundsException);
}

TEST_F(TrchBler, AShortPacketOrAnotherCodeLeavesTheListAsItWas) {
  const Array list = attachList();
  list.append(Value("kept"));
  log::ScopedCapture capture;
  feed(logPacket(0xD00C, 16), 0xD00C);
  feed(channelPacket(0x0040, 19), 0xD00A);
  EXPECT_EQ(list.size(), 1u);
  EXPECT_EQ(capture.lines().size(), 2u);
}

}  // namespace
}  // namespace corvane
