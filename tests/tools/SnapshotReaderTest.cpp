#include <gtest/gtest.h>

#include "PacketInput.h"
#include "support/LogRecords.h"
#include "support/Values.h"

namespace corvane::tools {
namespace {

using test::A;
using test::concatenated;
using test::D;
using test::logRecord;
using test::S;
using test::withType;

Value snapshotOf(std::initializer_list<Value> entries) {
  return D({{"Timestamp", S("2026-11-16 08:00:00 +0000")}, {"Data", A(entries)}, {"Description", S("drive test")}});
}

Value historyEntry(const Value& displayState) {
  return D({{"DisplayState", displayState},
            {"Display", D({})},
            {"ExtraInfo", D({})},
            {"Date", S("2026-11-16 08:00:00 +0000")},
            {"Description", S("Snapshot (2026-11-16 08:00:00 +0000)")}});
}

Value dlfEntry(const Bytes& dlf) {
  return D({{"Description", S("DLF binary (" + std::to_string(dlf.size()) + " bytes)")}, {"DLF", Value(dlf)}});
}

PacketList read(const Value& snapshot) {
  InputError error;
  // Through the file's bytes, as the tool reads it.
  auto list = packetsFromSnapshotContents(test::xmlBytes(snapshot), "s.corvane", error);
  if (!list) throw std::runtime_error(error.message);
  return *list;
}

std::string errorOf(const Value& snapshot) {
  InputError error;
  return packetsFromSnapshot(snapshot, "s.corvane", error) ? std::string("<read>") : error.message;
}

const Bytes kCellList = test::binaryBytes(A({D({{"CellMonitorCellId", test::I(4711)}})}));

TEST(SnapshotReader, HistoryIntervalsSplitIntoTheirPacketsAndTheDlfIsNotReplayed) {
  const Bytes a = withType(0x01, logRecord(0xB0C2, 1, {1, 2, 3}));
  const Bytes b = withType(0xFF, logRecord(0x0001, 2, kCellList));
  const Bytes c = withType(0x01, logRecord(0xB17F, 3, {}));
  const Value snapshot = snapshotOf({historyEntry(Value(concatenated({a, b}))), historyEntry(Value(c)),
                                     dlfEntry(test::dlfOfIntervals({{a, b}, {c}}))});
  const PacketList list = read(snapshot);
  EXPECT_EQ(list.packets, (std::vector<Bytes>{a, b, c}));
  EXPECT_TRUE(list.warnings.empty());
}

TEST(SnapshotReader, APacketWithThePrefixIsKeptWholeAsItWasReceived) {
  const Bytes plain = withType(0x01, logRecord(0x4005, 1, {7}));
  const Bytes prefixed = concatenated({{0x81, 0x00}, withType(0xFF, logRecord(0x0000, 2, kCellList))});
  EXPECT_EQ(read(snapshotOf({historyEntry(Value(concatenated({prefixed, plain, prefixed})))})).packets,
            (std::vector<Bytes>{prefixed, plain, prefixed}));
}

TEST(SnapshotReader, AnIfxReportIsOnePacket) {
  const Value report = D({{"Serving Cell", D({{"ARFCN", S("62")}})}});
  const Bytes binary = test::binaryBytes(report);
  const PacketList list = read(snapshotOf({historyEntry(report), historyEntry(Value(binary))}));
  ASSERT_EQ(list.packets.size(), 2u);
  EXPECT_EQ(plist::parseOrThrow(list.packets[0]), report);
  EXPECT_EQ(list.packets[1], binary);
}

TEST(SnapshotReader, WithoutPacketsInTheHistoryTheDlfIsReplayed) {
  const Bytes a = withType(0x01, logRecord(0xB0C2, 1, {1, 2, 3}));
  const Bytes b = withType(0xFF, logRecord(0x0001, 2, kCellList));
  const Value snapshot = snapshotOf(
      {D({{"Description", S("empty")}}), historyEntry(Value(Bytes{})), dlfEntry(test::dlfOfIntervals({{a, b}}))});
  const PacketList list = read(snapshot);
  EXPECT_EQ(list.packets, (std::vector<Bytes>{a, b}));
  EXPECT_TRUE(list.warnings.empty());
}

TEST(SnapshotReader, ATruncatedIntervalKeepsItsWholePacketsAndTheOtherEntries) {
  const Bytes a = withType(0x01, logRecord(0xB0C2, 1, {1, 2, 3}));
  const Bytes b = withType(0x01, logRecord(0xB0C3, 2, {4, 5, 6}));
  const Bytes cut(b.begin(), b.end() - 2);
  const PacketList list = read(snapshotOf({historyEntry(Value(concatenated({a, cut}))), historyEntry(Value(b))}));
  EXPECT_EQ(list.packets, (std::vector<Bytes>{a, b}));
  EXPECT_EQ(list.warnings, std::vector<std::string>{"s.corvane: Data[0].DisplayState: truncated packet at offset 16; "
                                                    "its 14 bytes are left out"});
}

TEST(SnapshotReader, BadPacketsAndBadStructureAreErrorsSayingWhere) {
  const Bytes a = withType(0x01, logRecord(0xB0C2, 1, {1, 2, 3}));
  EXPECT_EQ(errorOf(snapshotOf({historyEntry(Value(concatenated({a, {0x05, 0x0C, 0x00}})))})),
            "s.corvane: Data[0].DisplayState: no log packet at offset 16: type byte 0x05");
  EXPECT_EQ(errorOf(snapshotOf({historyEntry(Value(Bytes{0x01, 0x04, 0x00, 0, 0}))})),
            "s.corvane: Data[0].DisplayState: no log packet at offset 0: record length 4 is shorter than its header");
  EXPECT_EQ(errorOf(snapshotOf({S("x")})), "s.corvane: Data[0] is a String, not a dictionary");
  EXPECT_EQ(errorOf(D({{"Timestamp", S("t")}, {"Data", S("x")}})),
            "s.corvane: the snapshot's \"Data\" is a String, not an array");
  EXPECT_EQ(errorOf(snapshotOf({D({{"DLF", S("x")}})})), "s.corvane: Data[0].DLF is a String, not data");
  EXPECT_EQ(errorOf(snapshotOf({dlfEntry(Bytes(30, 0))})),
            "s.corvane: Data[0].DLF: not a DLF file: no whole log record at offset 0");
  EXPECT_EQ(errorOf(D({{"Data", A({})}})), "s.corvane: not a snapshot: no \"Timestamp\" and \"Data\"");
}

TEST(SnapshotReader, ASnapshotWithoutPacketsSaysSo) {
  const PacketList list = read(snapshotOf({}));
  EXPECT_TRUE(list.packets.empty());
  EXPECT_EQ(list.warnings, std::vector<std::string>{"s.corvane: the snapshot holds no packets"});
}

}  // namespace
}  // namespace corvane::tools
