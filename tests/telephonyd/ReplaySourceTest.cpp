#include "telephonyd/ReplaySource.h"

#include <gtest/gtest.h>

#include <thread>

#include "platform/LogChannelTechnology.h"
#include "platform/PropertyList.h"
#include "support/Process.h"

namespace corvane::telephonyd {
namespace {

using namespace std::chrono_literals;

constexpr std::uint16_t kLteCode = 0xB17F;  // read by an LTE section only
constexpr std::uint16_t kGsmCode = 0x5134;  // read by a GSM/UMTS section only

// A DLF record laid out by hand: length, code, timestamp (ticks of 1.25 ms
// above a 16-bit fraction), payload.
std::string record(std::uint16_t code, std::uint64_t ticks, std::uint16_t fraction = 0, std::string payload = "ab") {
  const std::size_t length = 12 + payload.size();
  std::string r;
  r += static_cast<char>(length & 0xFF);
  r += static_cast<char>(length >> 8);
  r += static_cast<char>(code & 0xFF);
  r += static_cast<char>(code >> 8);
  const std::uint64_t timestamp = ticks << 16 | fraction;
  for (int i = 0; i < 8; ++i) r += static_cast<char>(timestamp >> (8 * i));
  return r + payload;
}

struct Played {
  std::vector<SourcePacket> packets;
  bool ended = false;
};

// Takes up to `count` packets, waiting for the reader; stops early at the end.
Played take(ReplaySource& source, std::size_t count) {
  Played played;
  const auto giveUp = std::chrono::steady_clock::now() + 10s;
  while (played.packets.size() < count && std::chrono::steady_clock::now() < giveUp) {
    const auto availability = source.availability();
    if (availability == PacketSource::Availability::Ended) {
      played.ended = true;
      break;
    }
    if (availability == PacketSource::Availability::Later) {
      std::this_thread::sleep_for(1ms);
      continue;
    }
    played.packets.push_back(source.nextPacket());
  }
  return played;
}

std::vector<std::chrono::nanoseconds> duesOf(const Played& played) {
  std::vector<std::chrono::nanoseconds> dues;
  for (const SourcePacket& packet : played.packets) dues.push_back(packet.due);
  return dues;
}

class ReplaySourceTest : public ::testing::Test {
 protected:
  std::unique_ptr<ReplaySource> open(const std::string& contents, ReplaySource::Settings settings = {},
                                     const std::string& name = "capture.dlf") {
    settings.path = directory_.write(name, contents);
    return ReplaySource::open(settings, error_);
  }
  static ReplaySource::Settings lte() {
    ReplaySource::Settings settings;
    settings.technology = std::string(kLogChannelTechnologyQuendraLTE);
    return settings;
  }

  test::TemporaryDirectory directory_;
  std::string error_;
};

TEST_F(ReplaySourceTest, PacketsAreTheCapturesRecordsInOrderBehindTheirTypeByteWithTheirCodes) {
  const std::string dlf = record(kLteCode, 1000, 0, "xy") + record(0xB0C1, 1032, 0, "z");
  auto source = open(dlf, lte());
  ASSERT_TRUE(source) << error_;
  EXPECT_EQ(source->technology(), "Quendra_LTE");
  EXPECT_TRUE(source->keepsTime());
  const Played played = take(*source, 5);
  ASSERT_EQ(played.packets.size(), 2u);
  EXPECT_TRUE(played.ended);
  const std::string first = "\x01" + record(kLteCode, 1000, 0, "xy");
  EXPECT_EQ(*played.packets[0].data, Bytes(first.begin(), first.end()));
  EXPECT_EQ(played.packets[0].code, kLteCode);
  EXPECT_EQ(played.packets[1].code, 0xB0C1u);
  EXPECT_EQ(source->packetsPlayed(), 2u);
}

TEST_F(ReplaySourceTest, EachPacketIsDueAsLongAfterThePreviousAsItsTimestampIsLater) {
  // 32 ticks are 40 ms; a fraction of 0x8000 is half a tick, 625 us.
  auto source = open(record(kLteCode, 5000) + record(kLteCode, 5032) + record(kLteCode, 5032, 0x8000) +
                         record(kLteCode, 5832, 0x8000),
                     lte());
  ASSERT_TRUE(source) << error_;
  EXPECT_EQ(duesOf(take(*source, 4)), (std::vector<std::chrono::nanoseconds>{0ms, 40ms, 40625us, 1040625us}));
}

TEST_F(ReplaySourceTest, TheSpeedDividesThePace) {
  const std::string dlf = record(kLteCode, 0) + record(kLteCode, 800) + record(kLteCode, 1600);
  ReplaySource::Settings settings = lte();
  settings.speed = 4;
  auto fast = open(dlf, settings, "fast.dlf");
  ASSERT_TRUE(fast) << error_;
  EXPECT_EQ(duesOf(take(*fast, 3)), (std::vector<std::chrono::nanoseconds>{0ms, 250ms, 500ms}));
  settings.speed = 0.5;
  auto slow = open(dlf, settings, "slow.dlf");
  ASSERT_TRUE(slow) << error_;
  EXPECT_EQ(duesOf(take(*slow, 3)), (std::vector<std::chrono::nanoseconds>{0s, 2s, 4s}));
}

TEST_F(ReplaySourceTest, ATimestampThatGoesBackIsNotWaitedForAndThePaceGoesOnFromIt) {
  auto source = open(record(kLteCode, 1000) + record(kLteCode, 900) + record(kLteCode, 932), lte());
  ASSERT_TRUE(source) << error_;
  EXPECT_EQ(duesOf(take(*source, 3)), (std::vector<std::chrono::nanoseconds>{0ms, 0ms, 40ms}));
}

TEST_F(ReplaySourceTest, AJumpOfMoreThanTenSecondsIsNotWaitedForButTenSecondsAre) {
  // 8000 ticks are 10 s.
  auto source = open(record(kLteCode, 0) + record(kLteCode, 8000) + record(kLteCode, 16001) + record(kLteCode, 16033),
                     lte());
  ASSERT_TRUE(source) << error_;
  EXPECT_EQ(duesOf(take(*source, 4)), (std::vector<std::chrono::nanoseconds>{0s, 10s, 10s, 10040ms}));
}

TEST_F(ReplaySourceTest, PlayedOnceItEndsAfterItsLastPacketAndStaysEnded) {
  auto source = open(record(kLteCode, 0), lte());
  ASSERT_TRUE(source) << error_;
  EXPECT_TRUE(take(*source, 5).ended);
  EXPECT_EQ(source->availability(), PacketSource::Availability::Ended);
}

TEST_F(ReplaySourceTest, InALoopTheCaptureStartsAgainAtOnceAndKeepsItsPace) {
  ReplaySource::Settings settings = lte();
  settings.loop = true;
  auto source = open(record(kLteCode, 100, 0, "1") + record(kLteCode, 132, 0, "2"), settings);
  ASSERT_TRUE(source) << error_;
  const Played played = take(*source, 7);
  ASSERT_EQ(played.packets.size(), 7u);
  EXPECT_FALSE(played.ended);
  EXPECT_EQ(duesOf(played), (std::vector<std::chrono::nanoseconds>{0ms, 40ms, 40ms, 80ms, 80ms, 120ms, 120ms}));
  for (std::size_t i = 0; i < played.packets.size(); ++i) {
    EXPECT_EQ(played.packets[i].data->back(), i % 2 == 0 ? '1' : '2') << i;
  }
}

TEST_F(ReplaySourceTest, AsFastAsPossibleKeepsNoTime) {
  ReplaySource::Settings settings = lte();
  settings.speed = 0;
  auto source = open(record(kLteCode, 0) + record(kLteCode, 800), settings);
  ASSERT_TRUE(source) << error_;
  EXPECT_FALSE(source->keepsTime());
  EXPECT_EQ(take(*source, 2).packets.size(), 2u);
}

TEST_F(ReplaySourceTest, HexLinesAreReadToo) {
  const std::string line = "01 0e 00 7f b1 00 00 00 00 e8 03 00 00 61 62\n";
  auto source = open("# a capture as hex lines\n" + line + line, lte(), "capture.hex");
  ASSERT_TRUE(source) << error_;
  const Played played = take(*source, 3);
  ASSERT_EQ(played.packets.size(), 2u);
  EXPECT_EQ(played.packets[0].code, kLteCode);
}

// --- The technology, when not given ---

TEST_F(ReplaySourceTest, TheTechnologyIsTheOneWhoseDecodersReadTheCapturesLogCodes) {
  auto lteCapture = open(record(kLteCode, 0) + record(kGsmCode, 1) + record(kLteCode, 2), {}, "lte.dlf");
  ASSERT_TRUE(lteCapture) << error_;
  EXPECT_EQ(lteCapture->technology(), "Quendra_LTE");
  auto gsmCapture = open(record(kGsmCode, 0) + record(kGsmCode, 1) + record(kLteCode, 2), {}, "gsm.dlf");
  ASSERT_TRUE(gsmCapture) << error_;
  EXPECT_EQ(gsmCapture->technology(), "Quendra_GSM");
}

TEST_F(ReplaySourceTest, PropertyListReportsAreIfxAndFollowOneAnotherAtTheIntervalGiven) {
  Dictionary report;
  report.set("Technology", Value("GSM"));
  const Bytes plist = plist::serializeOrThrow(Value(report), plist::Format::XML);
  ReplaySource::Settings settings;
  settings.untimedInterval = 250ms;
  auto source = open(std::string(plist.begin(), plist.end()), settings, "report.plist");
  ASSERT_TRUE(source) << error_;
  EXPECT_EQ(source->technology(), "IFX");
  const Played played = take(*source, 2);
  ASSERT_EQ(played.packets.size(), 1u);
  EXPECT_FALSE(played.packets[0].code);
}

TEST_F(ReplaySourceTest, ACaptureThatDoesNotTellItsTechnologyIsAnErrorThatNamesTheOption) {
  // As many packets read by the LTE decoders as by the GSM/UMTS ones.
  EXPECT_FALSE(open(record(kLteCode, 0) + record(kGsmCode, 1), {}, "tie.dlf"));
  EXPECT_NE(error_.find("tie.dlf"), std::string::npos) << error_;
  EXPECT_NE(error_.find("Quendra_LTE"), std::string::npos) << error_;
  EXPECT_NE(error_.find("Quendra_GSM"), std::string::npos) << error_;
  EXPECT_NE(error_.find("--technology NAME"), std::string::npos) << error_;
  // Codes that no decoder reads.
  EXPECT_FALSE(open(record(0x1234, 0) + record(0x1234, 1), {}, "unknown.dlf"));
  EXPECT_NE(error_.find("no decoder of this version reads its log codes"), std::string::npos) << error_;
}

TEST(TechnologyOfCodesTest, ExtraCodesDoNotCountAndReportsAloneAreIfx) {
  std::string why;
  EXPECT_EQ(technologyOfCodes({{0xFF0001, 10}}, 0, why), "");
  EXPECT_EQ(why, "it holds no log records, only the service's own extra codes");
  EXPECT_EQ(technologyOfCodes({}, 3, why), "IFX");
  EXPECT_EQ(technologyOfCodes({{0xFF0001, 100}, {kLteCode, 1}}, 0, why), "Quendra_LTE");
  EXPECT_EQ(technologyOfCodes({{kLteCode, 2}, {kGsmCode, 3}}, 0, why), "Quendra_GSM");
  // The CDMA2000 decoders' codes (1x status, EV-DO status) are CDMA's.
  EXPECT_EQ(technologyOfCodes({{0x119C, 2}, {0x1183, 2}, {kLteCode, 3}}, 0, why), "Quendra_CDMA");
}

TEST_F(ReplaySourceTest, AMissingOrUnreadableFileIsAnErrorNamingIt) {
  ReplaySource::Settings settings = lte();
  settings.path = directory_.path() + "/nothing.dlf";
  EXPECT_FALSE(ReplaySource::open(settings, error_));
  EXPECT_NE(error_.find("nothing.dlf"), std::string::npos) << error_;
  settings.technology.clear();
  EXPECT_FALSE(ReplaySource::open(settings, error_));
  EXPECT_NE(error_.find("nothing.dlf"), std::string::npos) << error_;
}

TEST_F(ReplaySourceTest, ASourceDestroyedWhileItsReaderIsAheadStopsAtOnce) {
  std::string big;
  for (int i = 0; i < 20000; ++i) big += record(kLteCode, static_cast<std::uint64_t>(i));
  auto source = open(big, lte());
  ASSERT_TRUE(source) << error_;
  EXPECT_EQ(take(*source, 10).packets.size(), 10u);
  source.reset();  // joins a reader that waits for room in the queue
  SUCCEED();
}

}  // namespace
}  // namespace corvane::telephonyd
