#include "telephonyd/LogRecord.h"

#include <gtest/gtest.h>

#include <stdexcept>

#include "platform/PropertyList.h"

namespace corvane::telephonyd {
namespace {

TEST(LogRecordTest, OrdinaryPacketIsTypeRecordLengthCodeTimestampPayload) {
  const Bytes payload{0xAA, 0xBB, 0xCC};
  const Bytes packet = encodeLogPacket(0xB0C2, 0x0102030405060708, payload);
  const Bytes expected{0x01,                                            // type
                       0x0F, 0x00,                                      // record length 12 + 3
                       0xC2, 0xB0,                                      // code
                       0x08, 0x07, 0x06, 0x05, 0x04, 0x03, 0x02, 0x01,  // timestamp
                       0xAA, 0xBB, 0xCC};
  EXPECT_EQ(packet, expected);
}

TEST(LogRecordTest, EmptyPayloadGivesTheThirteenHeaderBytesOnly) {
  EXPECT_EQ(encodeLogPacket(0x4005, 0, {}),
            (Bytes{0x01, 0x0C, 0x00, 0x05, 0x40, 0, 0, 0, 0, 0, 0, 0, 0}));
}

TEST(LogRecordTest, ExtraCodePacketCarriesItsNumberAndABinaryPropertyList) {
  Array cells;
  Dictionary cell;
  cell.set("CellMonitorCellId", Value::integer(4711));
  cells.append(Value(cell));
  const Bytes plistBytes = plist::serializeOrThrow(Value(cells), plist::Format::Binary);
  const Bytes packet = encodeExtraCodePacket(1, 1'700'000'000'000'000, Value(cells));

  ASSERT_EQ(packet.size(), 13 + plistBytes.size());
  EXPECT_EQ(packet[0], 0xFF);
  EXPECT_EQ(packet[1] | packet[2] << 8, static_cast<int>(12 + plistBytes.size()));
  EXPECT_EQ(packet[3], 0x01);
  EXPECT_EQ(packet[4], 0x00);
  // 1 700 000 000 000 000 = 0x00060A24181E4000
  EXPECT_EQ(Bytes(packet.begin() + 5, packet.begin() + 13),
            (Bytes{0x00, 0x40, 0x1E, 0x18, 0x24, 0x0A, 0x06, 0x00}));
  EXPECT_EQ(Bytes(packet.begin() + 13, packet.end()), plistBytes);
  EXPECT_TRUE(plist::isBinary(Bytes(packet.begin() + 13, packet.end())));
  EXPECT_EQ(plist::parseOrThrow(Bytes(packet.begin() + 13, packet.end())), Value(cells));
}

TEST(LogRecordTest, LargestPayloadFillsTheSixteenBitLengthAndOneMoreByteIsRefused) {
  const Bytes largest(kMaximumLogPayloadSize, 0x5A);
  const Bytes packet = encodeLogPacket(1, 0, largest);
  EXPECT_EQ(packet[1], 0xFF);
  EXPECT_EQ(packet[2], 0xFF);
  EXPECT_EQ(packet.size(), 1u + 0xFFFF);
  EXPECT_THROW(encodeLogPacket(1, 0, Bytes(kMaximumLogPayloadSize + 1)), std::length_error);
}

TEST(LogRecordTest, ExtraCodeOfAValueThatIsNoPropertyListIsRefused) {
  EXPECT_THROW(encodeExtraCodePacket(0, 0, Value()), plist::PropertyListError);
}

// --- Record timestamps: 1.25 ms ticks since 1980-01-06 00:00:00 UTC above a 16-bit fraction ---

// 1980-01-06 00:00:00 UTC is 315 964 800 s after 1970-01-01.
constexpr std::int64_t kEpochSeconds = 315'964'800;

BasebandMoment unixMicroseconds(std::int64_t us) { return BasebandMoment(std::chrono::microseconds(us)); }

TEST(LogRecordTimestampTest, TheEpochIsZeroAndOneTickLaterIsOneAboveTheFraction) {
  EXPECT_EQ(basebandTimestamp(unixMicroseconds(kEpochSeconds * 1'000'000)), 0u);
  EXPECT_EQ(basebandTimestamp(unixMicroseconds(kEpochSeconds * 1'000'000 + 1250)), 0x10000u);
  // A second is 800 ticks.
  EXPECT_EQ(basebandTimestamp(unixMicroseconds((kEpochSeconds + 1) * 1'000'000)), 800u << 16);
}

TEST(LogRecordTimestampTest, AMomentBetweenTicksKeepsItsFractionAndReadsBackToTheMicrosecond) {
  // Half a tick: 625 us, fraction 0x8000.
  const std::uint64_t half = basebandTimestamp(unixMicroseconds(kEpochSeconds * 1'000'000 + 625));
  EXPECT_EQ(half, 0x8000u);
  for (std::int64_t us : {0, 1, 624, 625, 626, 1249, 1250, 1251, 999'999}) {
    const BasebandMoment moment = unixMicroseconds(1'800'000'000'000'000 + us);
    EXPECT_EQ(basebandMoment(basebandTimestamp(moment)), moment) << us;
  }
}

TEST(LogRecordTimestampTest, AMomentBeforeTheEpochIsZero) {
  EXPECT_EQ(basebandTimestamp(unixMicroseconds(0)), 0u);
  EXPECT_EQ(basebandTimestamp(unixMicroseconds(kEpochSeconds * 1'000'000 - 1)), 0u);
}

TEST(LogRecordTimestampTest, AKnownDateHasItsTicksInTheUpper48Bits) {
  // 2027-01-15 08:00:00 UTC = 1 800 000 000 s since 1970 = 1 484 035 200 s since the epoch.
  const std::uint64_t timestamp = basebandTimestamp(unixMicroseconds(1'800'000'000'000'000));
  EXPECT_EQ(timestamp >> 16, 1'484'035'200ull * 800);
  EXPECT_EQ(timestamp & 0xFFFF, 0u);
}

TEST(LogRecordTimestampTest, IntervalsCountTicksAndFractionsAndMayBeNegative) {
  const std::uint64_t a = (1000ull << 16) | 0x4000;  // a quarter tick: 312.5 us, read as 312
  const std::uint64_t b = (1032ull << 16);           // 32 ticks = 40 ms after tick 1000
  EXPECT_EQ(basebandInterval(1000ull << 16, b), std::chrono::microseconds(40'000));
  EXPECT_EQ(basebandInterval(a, b), std::chrono::microseconds(40'000 - 312));
  EXPECT_EQ(basebandInterval(b, 1000ull << 16), std::chrono::microseconds(-40'000));
}

}  // namespace
}  // namespace corvane::telephonyd
