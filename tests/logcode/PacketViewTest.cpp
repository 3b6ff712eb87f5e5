#include "LogGenerator/logcode/PacketView.h"

#include <gtest/gtest.h>

#include <array>

namespace corvane {
namespace {

TEST(PacketView, ReadsLittleEndianFieldsAtAbsoluteOffsets) {
  const std::array<std::uint8_t, 8> bytes = {0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77, 0x88};
  PacketView view(bytes);
  EXPECT_EQ(view.u8(0), 0x11);
  EXPECT_EQ(view.le16(1), 0x3322);
  EXPECT_EQ(view.le32(2), 0x66554433u);
  EXPECT_EQ(view.le64(0), 0x8877665544332211ull);
}

TEST(PacketView, BytesBeyondTheEndReadAsZero) {
  const std::array<std::uint8_t, 3> bytes = {0xAB, 0xCD, 0xEF};
  PacketView view(bytes);
  EXPECT_EQ(view.u8(3), 0);
  EXPECT_EQ(view.u8(1000000), 0);
  // A field that starts inside and ends outside keeps its inside bytes.
  EXPECT_EQ(view.le16(2), 0x00EF);
  EXPECT_EQ(view.le32(1), 0x0000EFCDu);
  EXPECT_EQ(view.le32(SIZE_MAX - 1), 0u);
}

TEST(PacketView, CoversTellsWhetherAFieldLiesWhollyInside) {
  const std::array<std::uint8_t, 4> bytes = {};
  PacketView view(bytes);
  EXPECT_TRUE(view.covers(0, 4));
  EXPECT_TRUE(view.covers(4, 0));
  EXPECT_FALSE(view.covers(1, 4));
  EXPECT_FALSE(view.covers(5, 0));
  EXPECT_FALSE(view.covers(2, SIZE_MAX));
}

TEST(PacketView, BitRangesCountBitZeroAsTheLowestBitOfTheFirstByte) {
  // 32-bit value 0xF0E1D2C3 at offset 0.
  const std::array<std::uint8_t, 4> bytes = {0xC3, 0xD2, 0xE1, 0xF0};
  PacketView view(bytes);
  EXPECT_EQ(view.bits32(0, 0, 8), 0x0C3u);            // bits 0-8: low byte plus bit 0 of 0xD2
  EXPECT_EQ(view.bits32(0, 25, 31), 0xF0u >> 1);      // top seven bits
  EXPECT_EQ(view.bits16(1, 9, 15), 0xE1u >> 1);       // the 16-bit value at 1 is 0xE1D2
  EXPECT_EQ(view.bits8(3, 1, 4), (0xF0u >> 1) & 0xF); // bits 1-4 of 0xF0
  EXPECT_EQ(PacketView::bits(0xFFFFFFFFu, 0, 31), 0xFFFFFFFFu);
}

}  // namespace
}  // namespace corvane
