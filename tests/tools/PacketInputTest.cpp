#include "PacketInput.h"

#include <gtest/gtest.h>

#include "support/LogRecords.h"
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
  EXPECT_EQ(packets->packets, (std::vector<Bytes>{{0x01, 0x02}, {0xFF, 0x00}}));
  EXPECT_TRUE(packets->warnings.empty());
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
  EXPECT_EQ(packets->packets, std::vector<Bytes>{xml});
  const Bytes binary = test::binaryBytes(test::D({{"Serving", test::S("62")}}));
  EXPECT_EQ(packetsFromContents(binary, "p.bplist", error)->packets, std::vector<Bytes>{binary});
}

TEST(PacketFile, AMalformedPropertyListIsAnError) {
  InputError error;
  EXPECT_FALSE(packetsFromContents(bytesOf("<?xml version=\"1.0\"?><plist><dict>"), "bad.plist", error));
  EXPECT_EQ(error.message, "bad.plist: malformed XML property list");
}

TEST(PacketFile, BinaryThatIsNoPropertyListIsReadAsDlf) {
  const Bytes record = test::logRecord(0x4005, 1, {1, 2});
  InputError error;
  auto packets = packetsFromContents(record, "capture.bin", error);
  ASSERT_TRUE(packets) << error.message;
  EXPECT_EQ(packets->packets, std::vector<Bytes>{test::withType(0x01, record)});
  EXPECT_FALSE(packetsFromContents(Bytes{0x81, 0x01, 0x00, 0x10}, "raw.bin", error));
  EXPECT_EQ(error.message, "raw.bin: not a DLF file: no whole log record at offset 0");
}

TEST(PacketFile, ASnapshotReplaysItsHistory) {
  const Bytes packet = test::withType(0x01, test::logRecord(0x4005, 1, {1, 2}));
  const Bytes snapshot = test::xmlBytes(test::D({{"Timestamp", test::S("2026-11-16 08:00:00 +0000")},
                                                 {"Data", test::A({test::D({{"DisplayState", Value(packet)}})})}}));
  InputError error;
  auto packets = packetsFromContents(snapshot, "s.corvane", error);
  ASSERT_TRUE(packets) << error.message;
  EXPECT_EQ(packets->packets, std::vector<Bytes>{packet});
}

TEST(InputFormat, IsToldByTheContents) {
  const Value report = test::D({{"Serving", test::S("62")}});
  EXPECT_EQ(detectInputFormat(test::xmlBytes(report)), InputFormat::PropertyList);
  EXPECT_EQ(detectInputFormat(test::binaryBytes(report)), InputFormat::PropertyList);
  // Either key alone does not make a snapshot.
  EXPECT_EQ(detectInputFormat(test::xmlBytes(test::D({{"Data", test::A({})}}))), InputFormat::PropertyList);
  const Value snapshot = test::D({{"Timestamp", test::S("t")}, {"Data", test::A({})}});
  EXPECT_EQ(detectInputFormat(test::xmlBytes(snapshot)), InputFormat::Snapshot);
  EXPECT_EQ(detectInputFormat(test::binaryBytes(snapshot)), InputFormat::Snapshot);
  EXPECT_EQ(detectInputFormat(test::logRecord(0x4005, 0, {})), InputFormat::Dlf);
  EXPECT_EQ(detectInputFormat(test::dlfVersionReport()), InputFormat::Dlf);
  EXPECT_EQ(detectInputFormat(bytesOf("01 0c 00 05 40 00 00 00 00 00 00 00 00\n")), InputFormat::HexText);
  EXPECT_EQ(detectInputFormat(Bytes{}), InputFormat::HexText);
  // A malformed property list is still one: reading it says what is wrong.
  EXPECT_EQ(detectInputFormat(bytesOf("<?xml version=\"1.0\"?><plist><dict>")), InputFormat::PropertyList);
}

TEST(PacketFile, AMissingFileIsAnErrorNamingIt) {
  InputError error;
  EXPECT_FALSE(readInput("/nonexistent/capture.hex", error));
  EXPECT_EQ(error.message, "/nonexistent/capture.hex: cannot open: No such file or directory");
}

}  // namespace
}  // namespace corvane::tools
