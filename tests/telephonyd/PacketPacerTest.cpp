#include "telephonyd/PacketPacer.h"

#include <gtest/gtest.h>

#include <deque>

#include "platform/VirtualRunLoop.h"

namespace corvane::telephonyd {
namespace {

using namespace std::chrono_literals;

// A source whose packets are due at the times given; it can be told to have
// nothing for now, and ends after its last packet unless more are added.
class ScriptedSource final : public PacketSource {
 public:
  std::string_view technology() const override { return "Quendra_LTE"; }
  Availability availability() override {
    if (!ready) return Availability::Later;
    if (!dues.empty()) return Availability::Ready;
    return endsWhenEmpty ? Availability::Ended : Availability::Later;
  }
  SourcePacket nextPacket() override {
    SourcePacket packet{std::make_shared<const Bytes>(Bytes{static_cast<std::uint8_t>(taken++)}), std::nullopt,
                        dues.front()};
    dues.pop_front();
    return packet;
  }
  bool keepsTime() const override { return true; }

  std::deque<std::chrono::nanoseconds> dues;
  bool ready = true;
  bool endsWhenEmpty = true;
  int taken = 0;
};

class PacketPacerTest : public ::testing::Test {
 protected:
  PacketPacer& pacer() {
    if (!pacer_) {
      pacer_ = std::make_unique<PacketPacer>(
          loop_, source_,
          [this](const SourcePacket& packet) {
            arrivals_.push_back(loop_.now());
            values_.push_back((*packet.data)[0]);
          },
          [this] { ++turns_; });
    }
    return *pacer_;
  }

  VirtualRunLoop loop_;
  ScriptedSource source_;
  std::unique_ptr<PacketPacer> pacer_;
  std::vector<RunLoop::Duration> arrivals_;
  std::vector<int> values_;
  int turns_ = 0;
};

TEST_F(PacketPacerTest, EachPacketArrivesWhenItsDueTimeHasPassedSinceTheFirst) {
  source_.dues = {0ms, 0ms, 40ms, 1s, 1500ms};
  loop_.advanceBy(5s);  // the clock stands anywhere when the pacer starts
  pacer().resume();
  loop_.runPending();
  loop_.advanceBy(0ms);
  EXPECT_EQ(arrivals_, (std::vector<RunLoop::Duration>{5s, 5s}));
  loop_.advanceBy(39ms);
  EXPECT_EQ(arrivals_.size(), 2u);
  loop_.advanceBy(1ms);
  EXPECT_EQ(arrivals_.size(), 3u);
  loop_.advanceBy(2s);
  EXPECT_EQ(arrivals_, (std::vector<RunLoop::Duration>{5s, 5s, 5040ms, 6s, 6500ms}));
  EXPECT_EQ(values_, (std::vector<int>{0, 1, 2, 3, 4}));
  EXPECT_TRUE(pacer().ended());
  EXPECT_FALSE(pacer().running());
  EXPECT_EQ(pacer().delivered(), 5u);
}

TEST_F(PacketPacerTest, APauseTakesNothingMoreAndAResumeGoesOnAtThePaceWithoutMakingUp) {
  source_.dues = {0ms, 100ms, 200ms, 300ms};
  pacer().resume();
  loop_.advanceBy(150ms);
  ASSERT_EQ(arrivals_.size(), 2u);
  pacer().pause();
  loop_.advanceBy(10s);
  EXPECT_EQ(arrivals_.size(), 2u);
  EXPECT_EQ(source_.taken, 3);  // the next one was looked at, not handed over
  pacer().resume();
  loop_.advanceBy(0ms);
  // The packet that was next comes at once; the one after it 100 ms later.
  ASSERT_EQ(arrivals_.size(), 3u);
  EXPECT_EQ(arrivals_[2], 10150ms);
  loop_.advanceBy(100ms);
  ASSERT_EQ(arrivals_.size(), 4u);
  EXPECT_EQ(arrivals_[3], 10250ms);
}

TEST_F(PacketPacerTest, ASourceWithNothingYetIsAskedAgainSoon) {
  source_.dues = {0ms, 10ms};
  source_.ready = false;
  pacer().resume();
  loop_.advanceBy(20ms);
  EXPECT_TRUE(arrivals_.empty());
  EXPECT_TRUE(pacer().running());
  source_.ready = true;
  loop_.advanceBy(PacketPacer::kRetry);
  ASSERT_EQ(arrivals_.size(), 1u);
  loop_.advanceBy(10ms);
  EXPECT_EQ(arrivals_.size(), 2u);
  EXPECT_EQ(arrivals_[1] - arrivals_[0], 10ms);
}

TEST_F(PacketPacerTest, AfterAnEndNothingStartsItAgain) {
  source_.dues = {0ms};
  pacer().resume();
  loop_.advanceBy(1s);
  EXPECT_TRUE(pacer().ended());
  source_.dues = {2s};
  pacer().resume();
  loop_.advanceBy(5s);
  EXPECT_EQ(arrivals_.size(), 1u);
  EXPECT_EQ(loop_.delayedCount(), 0u);
}

TEST_F(PacketPacerTest, ASourceLongBehindResumesThePaceInsteadOfFlooding) {
  // Packets every 10 ms; after the first the source has nothing for 3 s (a
  // reader stuck on a slow disk), so the ones after it are long overdue.
  for (int i = 0; i < 1000; ++i) source_.dues.push_back(i * 10ms);
  pacer().resume();
  loop_.advanceBy(0ms);
  ASSERT_EQ(arrivals_.size(), 1u);
  source_.ready = false;
  loop_.advanceBy(3s);
  // The second packet had been taken already: it came on time.
  ASSERT_EQ(arrivals_.size(), 2u);
  EXPECT_EQ(arrivals_[1], 10ms);
  source_.ready = true;
  loop_.advanceBy(PacketPacer::kRetry);
  // Of the overdue ones only the next comes at once; the rest keep their pace from there.
  EXPECT_EQ(arrivals_.size(), 3u);
  loop_.advanceBy(100ms);
  EXPECT_EQ(arrivals_.size(), 13u);
}

TEST_F(PacketPacerTest, ASourceALittleBehindCatchesUp) {
  // Half a second behind is within kLongestLag: the overdue packets come at once.
  for (int i = 0; i < 100; ++i) source_.dues.push_back(i * 10ms);
  pacer().resume();
  loop_.advanceBy(0ms);
  source_.ready = false;
  loop_.advanceBy(500ms);
  source_.ready = true;
  loop_.advanceBy(PacketPacer::kRetry);
  EXPECT_GE(arrivals_.size(), 50u);
  EXPECT_LE(arrivals_.size(), 52u);
}

TEST_F(PacketPacerTest, ABurstOfDuePacketsIsHandedOverInTurnsThatLetTheLoopRun) {
  for (std::uint64_t i = 0; i < PacketPacer::kMostPerTurn + 5; ++i) source_.dues.push_back(0ms);
  pacer().resume();
  loop_.runPending();
  loop_.advanceBy(0ms);
  EXPECT_EQ(arrivals_.size(), PacketPacer::kMostPerTurn + 5);
  EXPECT_GE(turns_, 2);
}

}  // namespace
}  // namespace corvane::telephonyd
