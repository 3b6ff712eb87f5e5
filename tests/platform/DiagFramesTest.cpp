// The framing of a diagnostic port, built byte by byte: flags, escapes and the
// CRC-16/X.25, and how a stream that is not all good frames is read.

#include "platform/DiagFrames.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace corvane::diag {
namespace {

using Bytes = std::vector<std::uint8_t>;

struct Collected {
  std::vector<Bytes> frames;
  std::vector<bool> good;
};

Collected deframe(const Bytes& stream, bool keepBadCrc = false, std::size_t piece = 0, Deframer* outer = nullptr) {
  Deframer local(keepBadCrc);
  Deframer& deframer = outer ? *outer : local;
  Collected out;
  auto collect = [&](const Deframer::Frame& frame) {
    out.frames.emplace_back(frame.bytes.begin(), frame.bytes.end());
    out.good.push_back(frame.crcGood);
  };
  if (piece == 0) {
    deframer.feed(stream, collect);
  } else {
    for (std::size_t at = 0; at < stream.size(); at += piece) {
      deframer.feed(std::span<const std::uint8_t>(stream).subspan(at, std::min(piece, stream.size() - at)), collect);
    }
  }
  deframer.finish();
  return out;
}

TEST(DiagFrames, TheCrcIsX25) {
  const std::string check = "123456789";
  EXPECT_EQ(crc16(std::span(reinterpret_cast<const std::uint8_t*>(check.data()), check.size())), 0x906E);
  EXPECT_EQ(crc16({}), 0x0000);
}

TEST(DiagFrames, AFrameIsThePayloadItsCrcLittleEndianAndAFlag) {
  // CRC-16/X.25 of 0x10 0x00 is 0x1BD6 (worked out bit by bit).
  Bytes out;
  appendFrame(out, Bytes{0x10, 0x00});
  const std::uint16_t crc = crc16(Bytes{0x10, 0x00});
  EXPECT_EQ(out, (Bytes{0x10, 0x00, static_cast<std::uint8_t>(crc & 0xFF), static_cast<std::uint8_t>(crc >> 8), 0x7E}));
}

TEST(DiagFrames, FlagAndEscapeBytesAreEscapedInPayloadAndCrc) {
  Bytes out;
  appendFrame(out, Bytes{0x7E, 0x01, 0x7D});
  ASSERT_GE(out.size(), 6u);
  EXPECT_EQ((Bytes(out.begin(), out.begin() + 5)), (Bytes{0x7D, 0x5E, 0x01, 0x7D, 0x5D}));
  EXPECT_EQ(out.back(), 0x7E);
  const auto back = deframe(out);
  ASSERT_EQ(back.frames.size(), 1u);
  EXPECT_EQ(back.frames[0], (Bytes{0x7E, 0x01, 0x7D}));
}

TEST(DiagFrames, ACrcThatHoldsAFlagByteIsEscapedToo) {
  // Look for a payload whose CRC has 0x7E or 0x7D in it, and frame it.
  for (std::uint32_t n = 0; n < 65536; ++n) {
    const Bytes payload{static_cast<std::uint8_t>(n), static_cast<std::uint8_t>(n >> 8)};
    const std::uint16_t crc = crc16(payload);
    const std::uint8_t low = crc & 0xFF;
    const std::uint8_t high = crc >> 8;
    if (payload[0] == 0x7E || payload[0] == 0x7D || payload[1] == 0x7E || payload[1] == 0x7D) continue;
    auto special = [](std::uint8_t b) { return b == 0x7E || b == 0x7D; };
    if (!special(low) && !special(high)) continue;
    Bytes out;
    appendFrame(out, payload);
    // The payload, each CRC byte (two bytes when escaped), the flag.
    EXPECT_EQ(out.size(), 2u + (special(low) ? 2u : 1u) + (special(high) ? 2u : 1u) + 1u);
    EXPECT_EQ(out[2], special(low) ? 0x7D : low);
    const auto back = deframe(out);
    ASSERT_EQ(back.frames.size(), 1u);
    EXPECT_EQ(back.frames[0], payload);
    return;
  }
  FAIL() << "no two-byte payload has such a CRC";
}

TEST(DiagFrames, FramesSplitAnywhereReadTheSame) {
  Bytes stream;
  for (std::uint8_t i = 0; i < 20; ++i) appendFrame(stream, Bytes{0x10, i, 0x7E, 0x7D, i});
  const auto whole = deframe(stream);
  ASSERT_EQ(whole.frames.size(), 20u);
  for (std::size_t piece : {1u, 2u, 3u, 7u, 64u}) {
    EXPECT_EQ(deframe(stream, false, piece).frames, whole.frames) << piece;
  }
}

TEST(DiagFrames, ABadCrcIsCountedAndSkippedOrKept) {
  Bytes stream;
  appendFrame(stream, Bytes{0x10, 0x01});
  Bytes bad;
  appendFrame(bad, Bytes{0x10, 0x02});
  bad[1] ^= 0x01;  // the payload changed after the CRC was made
  stream.insert(stream.end(), bad.begin(), bad.end());
  appendFrame(stream, Bytes{0x10, 0x03});

  Deframer skipping;
  const auto skipped = deframe(stream, false, 0, &skipping);
  ASSERT_EQ(skipped.frames.size(), 2u);
  EXPECT_EQ(skipped.frames[1], (Bytes{0x10, 0x03}));
  EXPECT_EQ(skipping.counts().badCrc, 1u);
  EXPECT_EQ(skipping.counts().frames, 2u);

  Deframer keeping(true);
  const auto kept = deframe(stream, true, 0, &keeping);
  ASSERT_EQ(kept.frames.size(), 3u);
  EXPECT_EQ(kept.frames[1], (Bytes{0x10, 0x02 ^ 0x01}));
  EXPECT_EQ(kept.good, (std::vector<bool>{true, false, true}));
  EXPECT_EQ(keeping.counts().badCrc, 1u);
}

TEST(DiagFrames, LeadingGarbageEmptyFramesAndGarbageBetweenFramesResynchronise) {
  Bytes stream{0x33, 0x44, 0x55, 0x7E, 0x7E, 0x7E};  // a capture begun mid-frame, then empty frames
  appendFrame(stream, Bytes{0x10, 0xAA});
  stream.insert(stream.end(), {0x01, 0x7E});  // too short to hold a CRC
  stream.insert(stream.end(), {0x01, 0x02, 0x03, 0x04, 0x7E});  // garbage: bad CRC
  stream.insert(stream.end(), {0x05, 0x7D, 0x7E});  // an escape before the flag
  appendFrame(stream, Bytes{0x10, 0xBB});
  stream.insert(stream.end(), {0x10, 0x20});  // cut off by the end

  Deframer deframer;
  const auto out = deframe(stream, false, 0, &deframer);
  ASSERT_EQ(out.frames.size(), 2u);
  EXPECT_EQ(out.frames[0], (Bytes{0x10, 0xAA}));
  EXPECT_EQ(out.frames[1], (Bytes{0x10, 0xBB}));
  const FrameCounts& counts = deframer.counts();
  EXPECT_EQ(counts.leadingBytes, 3u);
  EXPECT_EQ(counts.empty, 2u);
  EXPECT_EQ(counts.tooShort, 1u);
  EXPECT_EQ(counts.badCrc, 1u);
  EXPECT_EQ(counts.badEscape, 1u);
  EXPECT_EQ(counts.trailingBytes, 2u);
  EXPECT_EQ(counts.skipped(), 3u);
}

TEST(DiagFrames, AGoodFrameBeforeTheFirstFlagIsAFrame) {
  Bytes stream;
  appendFrame(stream, Bytes{0x10, 0x01});
  Deframer deframer;
  EXPECT_EQ(deframe(stream, false, 0, &deframer).frames.size(), 1u);
  EXPECT_EQ(deframer.counts().leadingBytes, 0u);
}

TEST(DiagFrames, AFrameLongerThanTheLargestIsSkippedWhole) {
  Bytes stream;
  appendFrame(stream, Bytes(100, 0x11));
  appendFrame(stream, Bytes(10, 0x22));
  Deframer deframer(false, 50);
  Bytes flagFirst{0x7E};
  flagFirst.insert(flagFirst.end(), stream.begin(), stream.end());
  const auto out = deframe(flagFirst, false, 0, &deframer);
  ASSERT_EQ(out.frames.size(), 1u);
  EXPECT_EQ(out.frames[0], Bytes(10, 0x22));
  EXPECT_EQ(deframer.counts().oversized, 1u);
}

}  // namespace
}  // namespace corvane::diag
