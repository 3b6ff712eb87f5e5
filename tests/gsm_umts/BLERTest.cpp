// "BLER": the window size and, under "Transport Channels", one dictionary of
// block error counts per transport channel.

#include "LogGenerator/gsm_umts/BLER.h"

#include "gsm_umts/GsmUmtsSectionFixture.h"

namespace corvane {
namespace {

using test::A;
using test::D;
using test::logPacket;
using test::put16;
using test::put32;
using test::S;

using Bler = test::GsmUmtsSectionTest<BLER>;

struct Channel {
  std::uint8_t id;
  std::uint32_t received;
  std::uint32_t errors;
};

// 0x4116: the number of channels at 13, the window size at 14 (16 bits), then
// 9 bytes a channel from 16: id, CRCs received, CRCs in error (32 bits each).
Bytes blerPacket(std::uint16_t window, const std::vector<Channel>& channels) {
  Bytes p = logPacket(0x4116, 16 + 9 * channels.size());
  p[13] = static_cast<std::uint8_t>(channels.size());
  put16(p, 14, window);
  std::size_t at = 16;
  for (const Channel& c : channels) {
    p[at] = c.id;
    put32(p, at + 1, c.received);
    put32(p, at + 5, c.errors);
    at += 9;
  }
  return p;
}

Value channel(const char* id, const char* received, const char* errors) {
  return D({{"Transport Channel ID", S(id)}, {"CRC Received", S(received)}, {"CRC Received in Error", S(errors)}});
}

TEST_F(Bler, RegistersUnderItsNameForItsOneCode) {
  EXPECT_EQ(classDict.at("BLER"), section);
  EXPECT_EQ(section->getLogCodeArray(), std::vector<std::uint32_t>{0x4116});
  EXPECT_EQ(codeDict.keys(), std::vector<std::string>{"16662"});
}

// Channel 1 begins at 16 + 9 = 25.
TEST_F(Bler, TwoChannelsGiveTwoDictionariesTheSecondReadFromOffset25) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  Bytes p = blerPacket(200, {{5, 100, 3}, {0, 0, 0}});
  EXPECT_EQ(p[25], 0);
  p[25] = 31;
  put32(p, 26, 4000);
  put32(p, 30, 0xFFFFFFFF);
  feed(p, 0x4116);
  EXPECT_EQ(Value(rows), D({{"Window Size", S("200")},
                            {"Transport Channels", A({channel("5", "100", "3"), channel("31", "4000", "-1")})}}));
  EXPECT_EQ(capture.lines(), test::warnings({"BLER"}));
}

TEST_F(Bler, ACountOf0GivesAnEmptyList) {
  const Dictionary rows = attachRows();
  feed(blerPacket(200, {{5, 100, 3}}), 0x4116);
  feed(blerPacket(65535, {}), 0x4116);
  EXPECT_EQ(Value(rows), D({{"Window Size", S("65535")}, {"Transport Channels", A({})}}));
}

// The channels are the row's value, replaced by a new list: a list the
// display still holds keeps its contents.
TEST_F(Bler, EachRecordSetsANewListOfChannels) {
  const Dictionary rows = attachRows();
  feed(blerPacket(200, {{5, 100, 3}}), 0x4116);
  const Value before = *rows.find("Transport Channels");
  feed(blerPacket(200, {{6, 1, 1}}), 0x4116);
  EXPECT_EQ(before, A({channel("5", "100", "3")}));
  EXPECT_EQ(*rows.find("Transport Channels"), A({channel("6", "1", "1")}));
}

TEST_F(Bler, ChannelsACountPlacesPastTheEndAreNotShown) {
  const Dictionary rows = attachRows();
  Bytes p = blerPacket(200, {{5, 100, 3}, {6, 1, 1}});
  p[13] = 3;
  p.resize(p.size() + 8);  // a third channel one byte short
  feed(p, 0x4116);
  EXPECT_EQ(*rows.find("Transport Channels"), A({channel("5", "100", "3"), channel("6", "1", "1")}));
}

TEST_F(Bler, TheBoundedAccessorThrowsAtTheCount) {
  const Bytes p = blerPacket(200, {{5, 100, 3}, {6, 1, 1}});
  const BoundedList channels = BLER::channels(PacketView(p));
  EXPECT_EQ(channels.entryOffset(1), 25u);
  EXPECT_THROW(channels.entryOffset(2), ArrayOutOfBoundsException);
}

TEST_F(Bler, A15BytePacketIsDroppedAndAnotherCodeLogged) {
  const Dictionary rows = attachRows();
  log::ScopedCapture capture;
  feed(logPacket(0x4116, 15), 0x4116);
  feed(blerPacket(200, {}), 0x4127);
  EXPECT_TRUE(rows.empty());
  EXPECT_EQ(capture.lines(), (std::vector<log::Line>{{log::kWarning, "BLER"},
                                                     {log::kWarning, "BLER"},
                                                     {log::kError, "Received an unknown log message: 16679"}}));
}

}  // namespace
}  // namespace corvane
