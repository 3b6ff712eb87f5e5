#include "telephonyd/RecordWriter.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace corvane::telephonyd {
namespace {

constexpr std::uint64_t kTimestamp = 0x0102030405060708;

Bytes payloadOf(const RecordWriter& record) {
  const Bytes packet = record.packet(0xB17F, kTimestamp);
  return Bytes(packet.begin() + 13, packet.end());
}

TEST(RecordWriterTest, FieldsGoLittleEndianToAbsoluteOffsetsBehindTheHeader) {
  RecordWriter record(22);
  record.put({13, 1}, 0xAB);
  record.put({14, 2}, 0x1234);
  record.put({16, 4}, 0xDEADBEEF);
  const Bytes packet = record.packet(0xB0C1, kTimestamp);
  EXPECT_EQ(packet, (Bytes{0x01, 21, 0, 0xC1, 0xB0, 8, 7, 6, 5, 4, 3, 2, 1,  // header
                           0xAB, 0x34, 0x12, 0xEF, 0xBE, 0xAD, 0xDE, 0, 0}));
}

TEST(RecordWriterTest, BitRangesCountFromTheLowestBitOfTheValuesFirstByte) {
  RecordWriter record(33);
  record.put({21, 4, 0, 8}, 0x1FF);   // bits 0-8: byte 21 and bit 0 of byte 22
  record.put({21, 4, 9, 17}, 0x155);  // bits 9-17: bits 1-7 of 22, bits 0-1 of 23
  record.put({20, 1, 1, 4}, 0xF);     // bits 1-4 of byte 20
  record.put({29, 1, 0, 6}, 0x55);
  record.put({29, 2, 7, 12}, 0x3F);   // bit 7 of byte 29, bits 0-4 of byte 30
  const Bytes payload = payloadOf(record);
  EXPECT_EQ(payload[20 - 13], 0x1E);
  EXPECT_EQ(payload[21 - 13], 0xFF);
  EXPECT_EQ(payload[22 - 13], 0x01 | (0x155 & 0x7F) << 1);
  EXPECT_EQ(payload[23 - 13], 0x155 >> 7);
  EXPECT_EQ(payload[29 - 13], 0x55 | 0x80);
  EXPECT_EQ(payload[30 - 13], 0x1F);
}

TEST(RecordWriterTest, FieldsOfAnEntryAreShiftedByTheEntrysOffset) {
  constexpr RecordField kPhysicalCellId{0, 2, 0, 8};
  RecordWriter record(21 + 2 * 20);
  record.put(kPhysicalCellId.at(21), 300);
  record.put(kPhysicalCellId.at(41), 7);
  const Bytes payload = payloadOf(record);
  EXPECT_EQ(payload[21 - 13], 300 & 0xFF);
  EXPECT_EQ(payload[22 - 13], 300 >> 8);
  EXPECT_EQ(payload[41 - 13], 7);
}

TEST(RecordWriterTest, AValueWiderThanItsFieldIsRefused) {
  RecordWriter record(33);
  EXPECT_THROW(record.put({21, 4, 0, 8}, 512), std::out_of_range);
  EXPECT_THROW(record.put({13, 1}, 256), std::out_of_range);
  EXPECT_NO_THROW(record.put({21, 4, 0, 8}, 511));
  EXPECT_NO_THROW(record.put({25, 4}, 0xFFFFFFFF));
}

TEST(RecordWriterTest, FieldsOutsideThePayloadAreRefused) {
  RecordWriter record(21);
  EXPECT_THROW(record.put({12, 1}, 0), std::out_of_range) << "the header is the framing's";
  EXPECT_THROW(record.put({20, 2}, 0), std::out_of_range);
  EXPECT_THROW(record.put({21, 1}, 0), std::out_of_range);
  EXPECT_THROW(record.put({19, 2, 6, 16}, 0), std::out_of_range) << "bits beyond the value's bytes";
  EXPECT_THROW(record.put({13, 3}, 0), std::out_of_range);
  EXPECT_NO_THROW(record.put({19, 2}, 0xFFFF));
}

TEST(RecordWriterTest, ABitWrittenTwiceIsAnOverlapInTheLayout) {
  RecordWriter record(33);
  record.put({19, 2, 0, 8}, 0);
  EXPECT_THROW(record.put({20, 1, 0, 3}, 0), std::logic_error);
  EXPECT_NO_THROW(record.put({20, 1, 1, 4}, 3));
  EXPECT_THROW(record.put({17, 4}, 0), std::logic_error);
}

TEST(RecordWriterTest, ARecordWithoutPayloadIsRefused) {
  EXPECT_THROW(RecordWriter(13), std::length_error);
  EXPECT_THROW(RecordWriter(13 + 0xFFFF), std::length_error);
  EXPECT_EQ(RecordWriter(14).packet(0xB0C2, 0).size(), 14u);
}

}  // namespace
}  // namespace corvane::telephonyd
