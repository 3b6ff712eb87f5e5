#include "platform/DiagCommands.h"

#include <gtest/gtest.h>

namespace corvane::diag {
namespace {

using Bytes = std::vector<std::uint8_t>;

TEST(DiagCommandsTest, RequestsAreTheCommandThreeZeroBytesAndTheOperation) {
  EXPECT_EQ(disableLoggingRequest(), (Bytes{0x73, 0, 0, 0, 0, 0, 0, 0}));
  EXPECT_EQ(retrieveIdRangesRequest(), (Bytes{0x73, 0, 0, 0, 1, 0, 0, 0}));
  const Bytes mask{0x82, 0x00, 0x01};
  EXPECT_EQ(setMaskRequest(11, 0x200, mask), (Bytes{0x73, 0, 0, 0, 3, 0, 0, 0,   // set mask
                                                    11, 0, 0, 0,                 // equipment id
                                                    0x00, 0x02, 0, 0,            // 512 bits
                                                    0x82, 0x00, 0x01}));
}

TEST(DiagCommandsTest, AMaskHasTheBitOfEachCodeLeastSignificantFirstAndAByteForEveryEightBitsOfTheRange) {
  IdRanges ranges{};
  ranges[11] = 0x187;  // 391 bits: 49 bytes
  ranges[4] = 9;       // 2 bytes
  std::set<std::uint32_t> outOfRange;
  const auto masks = logMasks({0xB000, 0xB009, 0xB186, 0x4008}, ranges, outOfRange);
  EXPECT_TRUE(outOfRange.empty());
  ASSERT_EQ(masks.size(), 2u);  // ids without bits are left out
  const Bytes& lte = masks.at(11);
  ASSERT_EQ(lte.size(), 49u);
  EXPECT_EQ(lte[0], 0x01);         // 0xB000: bit 0
  EXPECT_EQ(lte[1], 0x02);         // 0xB009: bit 9 = byte 1, bit 1
  EXPECT_EQ(lte[0x186 / 8], 0x40);  // 0xB186: bit 390 = byte 48, bit 6
  for (std::size_t i = 2; i < 48; ++i) EXPECT_EQ(lte[i], 0) << i;
  EXPECT_EQ(masks.at(4), (Bytes{0x00, 0x01}));
}

TEST(DiagCommandsTest, CodesBeyondTheirIdsRangeAreNeverSet) {
  IdRanges ranges{};
  ranges[11] = 0x187;
  std::set<std::uint32_t> outOfRange;
  const auto masks = logMasks({0xB187, 0xB186, 0x5134}, ranges, outOfRange);
  EXPECT_EQ(outOfRange, (std::set<std::uint32_t>{0xB187, 0x5134}));
  ASSERT_EQ(masks.size(), 1u);
  EXPECT_EQ(masks.at(11)[48], 0x40);
  // Codes of an equipment id beyond 15 (the extra codes' range) are out of range too.
  outOfRange.clear();
  logMasks({0xFF0001}, ranges, outOfRange);
  EXPECT_EQ(outOfRange, (std::set<std::uint32_t>{0xFF0001}));
}

TEST(DiagCommandsTest, RepliesAreReadWithTheirStatusAndTheIdRanges) {
  Bytes ranges{0x73, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0};
  for (std::uint32_t id = 0; id < 16; ++id) {
    const std::uint32_t bits = id * 0x100 + 7;
    ranges.insert(ranges.end(), {static_cast<std::uint8_t>(bits), static_cast<std::uint8_t>(bits >> 8), 0, 0});
  }
  const auto reply = parseLogConfigReply(ranges);
  ASSERT_TRUE(reply);
  EXPECT_EQ(reply->operation, LogConfigOperation::RetrieveIdRanges);
  EXPECT_EQ(reply->status, 0u);
  EXPECT_EQ(reply->ranges[0], 7u);
  EXPECT_EQ(reply->ranges[11], 0xB07u);
  EXPECT_EQ(reply->ranges[15], 0xF07u);
  // Cut short of its sixteenth range: not a reply.
  ranges.pop_back();
  EXPECT_FALSE(parseLogConfigReply(ranges));

  const auto refused = parseLogConfigReply(Bytes{0x73, 0, 0, 0, 3, 0, 0, 0, 2, 0, 0, 0});
  ASSERT_TRUE(refused);
  EXPECT_EQ(refused->operation, LogConfigOperation::SetMask);
  EXPECT_EQ(refused->status, 2u);
  EXPECT_FALSE(parseLogConfigReply(Bytes{0x73, 0, 0, 0, 2, 0, 0, 0, 0, 0, 0, 0}));  // no such operation
  EXPECT_FALSE(parseLogConfigReply(Bytes{0x10, 0, 0, 0, 3, 0, 0, 0, 0, 0, 0, 0}));  // another command
  EXPECT_FALSE(parseLogConfigReply(Bytes{0x73, 0, 0, 0, 3, 0, 0, 0, 0, 0, 0}));     // no status
}

TEST(DiagCommandsTest, RequestsReadBackAsABasebandReadsThem) {
  const auto request = parseLogConfigRequest(setMaskRequest(5, 12, Bytes{0x10, 0x08}));
  ASSERT_TRUE(request);
  EXPECT_EQ(request->operation, LogConfigOperation::SetMask);
  EXPECT_EQ(request->equipmentId, 5u);
  EXPECT_EQ(request->bits, 12u);
  EXPECT_EQ(request->mask, (Bytes{0x10, 0x08}));
  // A mask shorter than its bits say.
  EXPECT_FALSE(parseLogConfigRequest(setMaskRequest(5, 17, Bytes{0x10, 0x08})));
  EXPECT_EQ(parseLogConfigRequest(disableLoggingRequest())->operation, LogConfigOperation::Disable);
}

TEST(DiagCommandsTest, ALogFrameCarriesOneRecordWhoseLengthsAgree) {
  const Bytes record{0x0E, 0x00, 0x7F, 0xB1, 1, 2, 3, 4, 5, 6, 7, 8, 0xAA, 0xBB};
  const Bytes frame = logFrame(record);
  EXPECT_EQ(frame, (Bytes{0x10, 0x00, 0x0E, 0x00, 0x0E, 0x00, 0x7F, 0xB1, 1, 2, 3, 4, 5, 6, 7, 8, 0xAA, 0xBB}));
  const auto back = logRecordOfFrame(frame);
  ASSERT_TRUE(back);
  EXPECT_EQ(Bytes(back->begin(), back->end()), record);

  Bytes disagreeing = frame;
  disagreeing[4] = 0x0D;  // the record says 13 bytes
  EXPECT_FALSE(logRecordOfFrame(disagreeing));
  Bytes shortFrame = frame;
  shortFrame.resize(10);
  EXPECT_FALSE(logRecordOfFrame(shortFrame));
}

TEST(DiagCommandsTest, ASecondSubscriptionFrameWrapsACommandBehindFourBytes) {
  const Bytes record{0x0C, 0x00, 0x7F, 0xB1, 0, 0, 0, 0, 0, 0, 0, 0};
  Bytes wrapped{0x98, 0x01, 0x00, 0x00};
  const Bytes inner = logFrame(record);
  wrapped.insert(wrapped.end(), inner.begin(), inner.end());
  const auto unwrapped = unwrapSubscription(wrapped);
  ASSERT_TRUE(unwrapped);
  EXPECT_EQ(Bytes(unwrapped->begin(), unwrapped->end()), inner);
  EXPECT_FALSE(unwrapSubscription(Bytes{0x98, 0x01, 0x00, 0x00}));
  EXPECT_FALSE(unwrapSubscription(inner));
}

}  // namespace
}  // namespace corvane::diag
