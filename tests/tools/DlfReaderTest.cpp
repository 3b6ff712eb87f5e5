#include <gtest/gtest.h>

#include <algorithm>

#include "PacketInput.h"
#include "support/LogRecords.h"
#include "support/Values.h"

namespace corvane::tools {
namespace {

using test::concatenated;
using test::dlfOfIntervals;
using test::dlfVersionReport;
using test::logRecord;
using test::withType;

const Bytes kPropertyList = test::binaryBytes(test::A({test::D({{"CellMonitorCellId", test::I(17)}})}));

PacketList read(const Bytes& dlf) {
  InputError error;
  auto list = packetsFromDlf(dlf, "f.dlf", error);
  if (!list) throw std::runtime_error(error.message);
  return *list;
}

std::string errorOf(const Bytes& dlf) {
  InputError error;
  return packetsFromDlf(dlf, "f.dlf", error) ? std::string("<read>") : error.message;
}

TEST(DlfReader, RecordsOfOtherToolsBecomeOrdinaryPacketsByteForByte) {
  const Bytes first{0x0E, 0x00, 0xC2, 0xB0, 1, 2, 3, 4, 5, 6, 7, 8, 0xAA, 0xBB};
  const Bytes second{0x0C, 0x00, 0x05, 0x40, 0, 0, 0, 0, 0, 0, 0, 0};
  const PacketList list = read(concatenated({first, second}));
  ASSERT_EQ(list.packets.size(), 2u);
  EXPECT_EQ(list.packets[0], (Bytes{0x01, 0x0E, 0x00, 0xC2, 0xB0, 1, 2, 3, 4, 5, 6, 7, 8, 0xAA, 0xBB}));
  EXPECT_EQ(list.packets[1], (Bytes{0x01, 0x0C, 0x00, 0x05, 0x40, 0, 0, 0, 0, 0, 0, 0, 0}));
  EXPECT_TRUE(list.warnings.empty());
}

TEST(DlfReader, TheApplicationsDlfGivesBackEveryPacketWithItsType) {
  const Bytes a = withType(0x01, logRecord(0xB0C2, 10, {1, 2, 3}));
  const Bytes b = withType(0xFF, logRecord(0x0001, 11, kPropertyList));
  const Bytes c = withType(0x01, logRecord(0xB17F, 12, {}));
  const Bytes d = withType(0xFF, logRecord(0x0000, 20, kPropertyList));
  const Bytes e = withType(0x01, logRecord(0xB0C1, 21, Bytes(300, 0x01)));
  const Bytes dlf = dlfOfIntervals({{a, b, c}, {d, e}});
  // Byte by byte: version report, a without its type byte, b and c with theirs, d without, e with.
  ASSERT_EQ(dlf.size(), 161 + (a.size() - 1) + b.size() + c.size() + (d.size() - 1) + e.size());
  EXPECT_EQ(dlf[161], 15);
  EXPECT_EQ(dlf[161 + 15], 0xFF);

  const PacketList list = read(dlf);
  EXPECT_EQ(list.packets, (std::vector<Bytes>{a, b, c, d, e}));
  EXPECT_TRUE(list.warnings.empty());
}

TEST(DlfReader, AnExtraCodeThatLostItsTypeByteIsKnownByItsPropertyList) {
  const Bytes extra = withType(0xFF, logRecord(0x0002, 5, kPropertyList));
  const Bytes ordinary = withType(0x01, logRecord(0x0002, 5, {'b', 'p', 'l', 'i', 's', 't', '0'}));
  EXPECT_EQ(read(dlfOfIntervals({{extra}})).packets, std::vector<Bytes>{extra});
  EXPECT_EQ(read(dlfOfIntervals({{ordinary}})).packets, std::vector<Bytes>{ordinary});
}

TEST(DlfReader, TypeBytesAreFoundAlsoWhereTheyReadAsALongRecordThatFits) {
  // 0x01 0x20 reads as a record of 0x2001 bytes; with more than that left in
  // the file, only the count of whole records tells the two readings apart.
  std::vector<Bytes> packets;
  for (std::uint64_t i = 0; i < 400; ++i) packets.push_back(withType(0x01, logRecord(0x4005, i, Bytes(20, 0x20))));
  const Bytes dlf = dlfOfIntervals({packets});
  ASSERT_GT(dlf.size(), 0x2001u + 200);
  EXPECT_EQ(read(dlf).packets, packets);
}

TEST(DlfReader, ARecordOf257BytesBehindItsTypeByteIsNotReadOneByteEarly) {
  // 01 | 01 01 80 B1 ...: also a record of 257 bytes, one byte early. Its last
  // byte (0x00) and the next type byte (0x01) read as a record of 256 bytes,
  // which here ends where the fourth packet's record begins: both readings
  // count as many records, but that one has a record more without a type byte.
  const Bytes lead = withType(0x01, logRecord(0xB0C1, 0, {1, 2, 3}));
  const Bytes first = withType(0x01, logRecord(0xB180, 1, Bytes(245, 0x00)));
  const Bytes second = withType(0x01, logRecord(0xB17F, 2, Bytes(242, 0x00)));
  const Bytes third = withType(0x01, logRecord(0xB0C2, 3, Bytes(20, 0x00)));
  ASSERT_EQ(first.size(), 258u);
  ASSERT_EQ(257 + 256, first.size() + second.size());
  EXPECT_EQ(read(dlfOfIntervals({{lead, first, second, third}})).packets,
            (std::vector<Bytes>{lead, first, second, third}));
}

TEST(DlfReader, OnATieTheRecordWithoutATypeByteWins) {
  // A cell list of 257 bytes opens an interval: 01 01 01 00 ... also reads as
  // type 0x01 and a record of 257 bytes one byte late, which takes the next
  // packet's type byte, after which that packet reads without it: as many
  // records, as many without a type byte.
  Bytes payload(257 - 12, 0x11);
  const Bytes magic = test::bytesOf("bplist00");
  std::copy(magic.begin(), magic.end(), payload.begin());
  const Bytes cellList = withType(0xFF, logRecord(0x0001, 1, payload));
  const Bytes next = withType(0x01, logRecord(0xB0C2, 2, {1, 2, 3}));
  EXPECT_EQ(read(dlfOfIntervals({{cellList, next}})).packets, (std::vector<Bytes>{cellList, next}));
}

TEST(DlfReader, OtherToolsRecordsAreReadOneAfterTheOtherWhateverTheirFirstByte) {
  // Records of 257 and 255 bytes start with 0x01 and 0xFF; without the
  // application's version report in front, no byte is taken for a type byte.
  const Bytes a = logRecord(0x0101, 1, Bytes(257 - 12, 0x01));
  const Bytes b = logRecord(0x00FF, 2, Bytes(255 - 12, 0xFF));
  ASSERT_EQ(a[0], 0x01);
  ASSERT_EQ(b[0], 0xFF);
  Bytes otherVersionReport = logRecord(0x1FFD, 0, Bytes(149, 0x00));
  otherVersionReport[23] = 'x';
  EXPECT_EQ(read(concatenated({otherVersionReport, a, b, a})).packets,
            (std::vector<Bytes>{withType(0x01, a), withType(0x01, b), withType(0x01, a)}));
}

TEST(DlfReader, VersionReportsAreSkipped) {
  const Bytes a = logRecord(0x4005, 1, {9});
  EXPECT_EQ(read(concatenated({dlfVersionReport(), a, dlfVersionReport()})).packets,
            std::vector<Bytes>{withType(0x01, a)});
  EXPECT_TRUE(read(dlfVersionReport()).packets.empty());
  // An extra code numbered like a version report is a packet.
  const Bytes extra = withType(0xFF, logRecord(0x1FFD, 1, {}));
  EXPECT_EQ(read(concatenated({dlfVersionReport(), extra})).packets, std::vector<Bytes>{extra});
}

TEST(DlfReader, ATruncatedLastRecordIsLeftOutWithAWarningNamingItsOffset) {
  const Bytes a = withType(0x01, logRecord(0x4005, 1, {1, 2, 3, 4}));
  const Bytes b = withType(0x01, logRecord(0x4006, 2, {5, 6, 7, 8}));
  const Bytes whole = dlfOfIntervals({{a, b}});
  for (std::size_t cut = 1; cut < b.size(); ++cut) {
    const Bytes dlf(whole.begin(), whole.end() - static_cast<std::ptrdiff_t>(cut));
    const PacketList list = read(dlf);
    EXPECT_EQ(list.packets, std::vector<Bytes>{a}) << cut;
    const std::size_t offset = 161 + a.size() - 1;
    EXPECT_EQ(list.warnings, std::vector<std::string>{"f.dlf: truncated record at offset " + std::to_string(offset) +
                                                      "; its " + std::to_string(dlf.size() - offset) +
                                                      " bytes are left out"})
        << cut;
  }
}

TEST(DlfReader, BytesThatAreNoRecordAreAnErrorNamingTheOffset) {
  const Bytes a = logRecord(0x4005, 1, {1, 2, 3, 4});
  EXPECT_EQ(errorOf(concatenated({a, Bytes(20, 0x00), a})),
            "f.dlf: no log record at offset 16: the DLF is damaged there");
  EXPECT_EQ(errorOf(Bytes{0x81, 0x01, 0x00, 0x10}), "f.dlf: not a DLF file: no whole log record at offset 0");
  EXPECT_EQ(errorOf(Bytes(100, 0x00)), "f.dlf: not a DLF file: no whole log record at offset 0");
}

TEST(DlfReader, EmptyDataHoldsNoPackets) {
  const PacketList list = read({});
  EXPECT_TRUE(list.packets.empty());
  EXPECT_TRUE(list.warnings.empty());
}

}  // namespace
}  // namespace corvane::tools
