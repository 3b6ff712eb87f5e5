// Signed fields of record layouts: the bits sign-extended before the
// conversion, their display texts, and the inverse that encoders write
// through; and the walk over the whole entries of a packet.

#include "LogGenerator/records/SignedField.h"

#include <gtest/gtest.h>

#include <vector>

#include "LogGenerator/logcode/Entries.h"
#include "LogGenerator/logcode/SignedRows.h"
#include "support/Packets.h"

namespace corvane {
namespace {

using records::signedField;

TEST(SignedField, TheFieldsBitsAreSignExtendedWhateverTheirWidth) {
  const Bytes p = {0x9C, 0x18, 0xFC, 0xFB, 0xFF, 0xFF, 0xFF, 0x7F};
  const PacketView packet(p);
  EXPECT_EQ(signedField(records::u8(0)).number(packet), -100);
  EXPECT_EQ(signedField(records::le16(1)).number(packet), -1000);
  EXPECT_EQ(signedField(records::le32(3)).number(packet), -5);
  EXPECT_EQ(signedField(records::u8(7)).number(packet), 127);
  EXPECT_EQ(signedField(records::u8(0).bits(4, 7)).number(packet), -7);  // 0x9
  EXPECT_EQ(signedField(records::u8(0).bits(0, 3)).number(packet), -4);  // 0xC
  // Beyond the end the bytes read as zero.
  EXPECT_EQ(signedField(records::le16(7)).number(packet), 127);
}

TEST(SignedField, InAListEntryTheFieldIsReadFromTheEntry) {
  const Bytes p = {0, 0, 0, 0xFF, 0x80};
  const records::SignedField field = signedField(records::le16(1));
  EXPECT_EQ(field.number(PacketView(p), 2), -32513);  // 0x80FF
  EXPECT_EQ(field.at(2).number(PacketView(p)), -32513);
  EXPECT_EQ(field.at(2).end(), 5u);
}

TEST(SignedField, TextsShowTheSignedNumberThroughTheConversion) {
  const Bytes p = {0x9C, 0xF1, 0xFF, 0xFF, 0x40};
  const PacketView packet(p);
  EXPECT_EQ(signedFieldText(signedField(records::u8(0)), packet).view(), "-100");
  EXPECT_EQ(signedFieldText(signedField(records::u8(0).as(records::whole(1, -21, " dB"))), packet).view(), "-121 dB");
  EXPECT_EQ(signedFieldText(signedField(records::u8(1).as(records::fixed(0.5, 0, " dB"))), packet).view(), "-7.50 dB");
  EXPECT_EQ(signedFieldText(signedField(records::le16(2).as(records::whole(1, 0, " dBm"))), packet).view(), "-1 dBm");
  EXPECT_EQ(signedFieldText(signedField(records::u8(4).as(records::orNotPresent(records::decimal(), 0x40))), packet)
                .view(),
            "Not Present");
}

TEST(SignedField, RawForGivesTheTwosComplementBitsOfAValue) {
  EXPECT_EQ(signedField(records::u8(0)).rawFor(-100), 0x9Cu);
  EXPECT_EQ(signedField(records::u8(0)).rawFor(127), 0x7Fu);
  EXPECT_EQ(signedField(records::u8(0).as(records::whole(1, -21, " dB"))).rawFor(-121), 0x9Cu);
  EXPECT_EQ(signedField(records::u8(0).as(records::fixed(0.5, 0, " dB"))).rawFor(-7.5), 0xF1u);
  EXPECT_EQ(signedField(records::le16(0)).rawFor(-1000), 0xFC18u);
  EXPECT_EQ(signedField(records::le32(0)).rawFor(-5), 0xFFFFFFFBu);
  EXPECT_EQ(signedField(records::u8(0).bits(4, 7)).rawFor(-8), 0x8u);
}

TEST(SignedField, RawForRefusesWhatTheBitsCannotHoldOrTheStepsCannotReach) {
  EXPECT_THROW(signedField(records::u8(0)).rawFor(128), std::logic_error);
  EXPECT_THROW(signedField(records::u8(0)).rawFor(-129), std::logic_error);
  EXPECT_THROW(signedField(records::u8(0)).rawFor(0.5), std::logic_error);
  EXPECT_THROW(signedField(records::u8(0).as(records::fixed(0.5, 0, " dB"))).rawFor(-7.25), std::logic_error);
  EXPECT_THROW(signedField(records::u8(0).bits(4, 7)).rawFor(8), std::logic_error);
}

// A row per entry is not what every list makes; the walk keeps the same rule.
TEST(EntryWalk, StopsAtTheLastEntryThatLiesWhollyInsideThePacket) {
  const Bytes p = test::logPacket(0x4031, 16 + 14 + 13);
  std::vector<std::size_t> visited;
  forEachEntry(PacketView(p), BoundedList(3, 16, 14), 14, [&](std::size_t entry) { visited.push_back(entry); });
  EXPECT_EQ(visited, std::vector<std::size_t>{16});
  visited.clear();
  forEachEntry(PacketView(p), BoundedList(0, 16, 14), 14, [&](std::size_t entry) { visited.push_back(entry); });
  EXPECT_TRUE(visited.empty());
}

}  // namespace
}  // namespace corvane
