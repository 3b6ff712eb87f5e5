#include "PacketInput.h"

#include <gtest/gtest.h>

#include "support/Values.h"

namespace corvane::tools {
namespace {

using test::bytesOf;

TEST(HexLine, BlanksAndColonsMayStandBetweenBytes) {
  std::string reason;
  EXPECT_EQ(parseHexLine("0101:0a 0B\tff", reason), (Bytes{0x01, 0x01, 0x0A, 0x0B, 0xFF}));
  EXPECT_EQ(parseHexLine("", reason), Bytes{});
}

TEST(HexLine, BadLinesSayWhatIsWrong) {
  std::string reason;
  EXPECT_FALSE(parseHexLine("0 1", reason));
  EXPECT_EQ(reason, "separator inside a byte at column 2");
  EXPECT_FALSE(parseHexLine("01 0g", reason));
  EXPECT_EQ(reason, "'g' is not a hex digit (column 5)");
  EXPECT_FALSE(parseHexLine("012", reason));
  EXPECT_EQ(reason, "odd number of hex digits");
}

TEST(PacketFile, HexTextGivesOnePacketPerLineSkippingCommentsAndBlankLines) {
  InputError error;
  auto packets = packetsFromContents(bytesOf("# capture\n01 02\r\n\n  # indented comment\nff:00\n"), "f", error);
  ASSERT_TRUE(packets) << error.message;
  EXPECT_EQ(*packets, (std::vector<Bytes>{{0x01, 0x02}, {0xFF, 0x00}}));
}

TEST(PacketFile, ABadHexLineNamesItsLineNumber) {
  InputError error;
  EXPECT_FALSE(packetsFromContents(bytesOf("01 02\n# note\n01 zz\n"), "capture.hex", error));
  EXPECT_EQ(error.message, "capture.hex:3: bad hex line: 'z' is not a hex digit (column 4)");
}

TEST(PacketFile, APropertyListIsOnePacket) {
  const Bytes xml = test::xmlBytes(test::D({{"Serving", test::S("62")}}));
  InputError error;
  auto packets = packetsFromContents(xml, "p.plist", error);
  ASSERT_TRUE(packets);
  EXPECT_EQ(*packets, std::vector<Bytes>{xml});
  const Bytes binary = test::binaryBytes(test::D({{"Serving", test::S("62")}}));
  EXPECT_EQ(*packetsFromContents(binary, "p.bplist", error), std::vector<Bytes>{binary});
}

TEST(PacketFile, AMalformedPropertyListIsAnError) {
  InputError error;
  EXPECT_FALSE(packetsFromContents(bytesOf("<?xml version=\"1.0\"?><plist><dict>"), "bad.plist", error));
  EXPECT_EQ(error.message, "bad.plist: malformed XML property list");
}

TEST(PacketFile, BinaryThatIsNeitherFormIsAnError) {
  InputError error;
  EXPECT_FALSE(packetsFromContents(Bytes{0x81, 0x01, 0x00, 0x10}, "raw.bin", error));
  EXPECT_EQ(error.message, "raw.bin: neither a property list nor text with one hex packet per line");
}

TEST(PacketFile, AMissingFileIsAnErrorNamingIt) {
  InputError error;
  EXPECT_FALSE(readInput("/nonexistent/capture.hex", error));
  EXPECT_EQ(error.message, "/nonexistent/capture.hex: cannot open: No such file or directory");
}

}  // namespace
}  // namespace corvane::tools
