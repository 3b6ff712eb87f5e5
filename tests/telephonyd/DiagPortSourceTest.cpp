#include "telephonyd/DiagPortSource.h"

#include <fcntl.h>
#include <termios.h>
#include <unistd.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <thread>

#include "platform/Log.h"
#include "platform/VirtualRunLoop.h"
#include "support/Process.h"

namespace corvane::telephonyd {
namespace {

using namespace std::chrono_literals;
using Frame = std::vector<std::uint8_t>;

// The baseband's side of a pseudo-terminal, reached through a link, played by the test.
class Baseband {
 public:
  explicit Baseband(std::string link) : link_(std::move(link)) {
    master_ = ::posix_openpt(O_RDWR | O_NOCTTY);
    ::grantpt(master_);
    ::unlockpt(master_);
    slave_ = ::open(::ptsname(master_), O_RDWR | O_NOCTTY);
    termios settings{};
    ::tcgetattr(slave_, &settings);
    ::cfmakeraw(&settings);
    ::tcsetattr(slave_, TCSANOW, &settings);
    ::fcntl(master_, F_SETFL, ::fcntl(master_, F_GETFL) | O_NONBLOCK);
    std::filesystem::remove(link_);
    std::filesystem::create_symlink(::ptsname(master_), link_);
  }
  ~Baseband() { vanish(); }

  // The frames the service has written since the last call, without their CRCs.
  std::vector<Frame> frames() {
    std::vector<Frame> frames;
    std::uint8_t buffer[4096];
    for (;;) {
      const ssize_t n = ::read(master_, buffer, sizeof buffer);
      if (n <= 0) break;
      deframer_.feed(std::span<const std::uint8_t>(buffer, static_cast<std::size_t>(n)),
                     [&](const diag::Deframer::Frame& f) { frames.emplace_back(f.bytes.begin(), f.bytes.end()); });
    }
    return frames;
  }
  void write(std::span<const std::uint8_t> bytes) {
    ASSERT_EQ(::write(master_, bytes.data(), bytes.size()), static_cast<ssize_t>(bytes.size()));
  }
  void send(std::span<const std::uint8_t> payload) {
    std::vector<std::uint8_t> bytes;
    diag::appendFrame(bytes, payload);
    write(bytes);
  }
  void vanish() {
    if (master_ < 0) return;
    std::filesystem::remove(link_);
    ::close(master_);
    ::close(slave_);
    master_ = slave_ = -1;
  }

 private:
  std::string link_;
  int master_ = -1;
  int slave_ = -1;
  diag::Deframer deframer_;
};

diag::IdRanges lteRanges() {
  diag::IdRanges ranges{};
  ranges[4] = 0x1000;
  ranges[11] = 0x200;
  return ranges;
}

// A log record of `code`, its payload one byte.
Frame record(std::uint16_t code, std::uint8_t value) {
  return {0x0D, 0x00, static_cast<std::uint8_t>(code), static_cast<std::uint8_t>(code >> 8), 0, 0, 0, 0, 0, 0, 0, 0,
          value};
}

class DiagPortSourceTest : public ::testing::Test {
 protected:
  void SetUp() override {
    log::setSink(capture_);
    baseband_ = std::make_unique<Baseband>(link_);
  }
  void TearDown() override { log::setSink(nullptr); }

  std::unique_ptr<DiagPortSource> open() {
    std::string error;
    auto source = DiagPortSource::open(loop_, link_, "Quendra_LTE", error);
    EXPECT_TRUE(source) << error;
    if (source) source->setArrivalHandler([this] { ++arrivals_; });
    return source;
  }

  // Frames the service writes, waiting a little for the first.
  std::vector<Frame> written(std::size_t atLeast = 1) {
    std::vector<Frame> all;
    const auto giveUp = std::chrono::steady_clock::now() + 2s;
    while (all.size() < atLeast && std::chrono::steady_clock::now() < giveUp) {
      for (Frame& f : baseband_->frames()) all.push_back(std::move(f));
      if (all.size() < atLeast) std::this_thread::sleep_for(1ms);
    }
    return all;
  }

  // Lets the source read until the condition holds.
  template <typename Condition>
  bool until(Condition condition) {
    const auto giveUp = std::chrono::steady_clock::now() + 2s;
    for (;;) {
      loop_.pollWatches();
      loop_.runPending();
      if (condition()) return true;
      if (std::chrono::steady_clock::now() > giveUp) return false;
      std::this_thread::sleep_for(1ms);
    }
  }

  // Opens, answers the id ranges, and asks for the codes.
  std::unique_ptr<DiagPortSource> openAndMask(const std::set<std::uint32_t>& codes) {
    auto source = open();
    EXPECT_EQ(written(), std::vector<Frame>{diag::retrieveIdRangesRequest()});
    const diag::IdRanges ranges = lteRanges();
    baseband_->send(diag::logConfigReply(diag::LogConfigOperation::RetrieveIdRanges, 0, &ranges));
    EXPECT_TRUE(until([&] { return source->rangesKnown(); }));
    source->setWantedCodes(codes);
    return source;
  }

  // How many log lines hold the text.
  std::size_t containing(std::string_view text) const {
    std::size_t n = 0;
    for (const std::string& line : capture_->texts()) n += line.find(text) != std::string::npos ? 1 : 0;
    return n;
  }
  std::string allLines() const {
    std::string all;
    for (const std::string& line : capture_->texts()) all += line + "\n";
    return all;
  }

  std::shared_ptr<log::CapturingSink> capture_ = std::make_shared<log::CapturingSink>();
  test::TemporaryDirectory directory_;
  std::string link_ = directory_.path() + "/diag";
  std::unique_ptr<Baseband> baseband_;
  VirtualRunLoop loop_;
  int arrivals_ = 0;
};

TEST_F(DiagPortSourceTest, TheIdRangesAreAskedFirstAndTheMaskIsSetOnceTheyAreKnown) {
  auto source = open();
  EXPECT_EQ(source->technology(), "Quendra_LTE");
  EXPECT_EQ(written(), std::vector<Frame>{diag::retrieveIdRangesRequest()});
  // Wanted before the ranges are known: nothing is set yet.
  source->setWantedCodes({0xB17F, 0xB0C1, 0x4125});
  std::this_thread::sleep_for(20ms);
  EXPECT_TRUE(baseband_->frames().empty());

  const diag::IdRanges ranges = lteRanges();
  baseband_->send(diag::logConfigReply(diag::LogConfigOperation::RetrieveIdRanges, 0, &ranges));
  ASSERT_TRUE(until([&] { return source->masks().size() == 2; }));
  // One request at a time: the next goes when the last is answered.
  std::vector<Frame> requests = written();
  ASSERT_EQ(requests.size(), 1u);
  Frame id4(0x1000 / 8, 0);
  id4[0x125 / 8] = 1 << (0x125 % 8);
  EXPECT_EQ(requests[0], diag::setMaskRequest(4, 0x1000, id4));
  baseband_->send(diag::logConfigReply(diag::LogConfigOperation::SetMask, 0));
  ASSERT_TRUE(until([] { return true; }));
  requests = written();
  ASSERT_EQ(requests.size(), 1u);
  Frame id11(0x200 / 8, 0);
  id11[0x17F / 8] |= 1 << (0x17F % 8);
  id11[0x0C1 / 8] |= 1 << (0x0C1 % 8);
  EXPECT_EQ(requests[0], diag::setMaskRequest(11, 0x200, id11));
}

TEST_F(DiagPortSourceTest, ACodeBeyondItsIdsRangeIsNotAskedForAndSaidOnce) {
  auto source = openAndMask({0xB17F, 0xB3FF});
  ASSERT_TRUE(until([&] { return source->masks().size() == 1; }));
  Frame id11(0x200 / 8, 0);
  id11[0x17F / 8] |= 1 << (0x17F % 8);
  EXPECT_EQ(written(), std::vector<Frame>{diag::setMaskRequest(11, 0x200, id11)});
  EXPECT_EQ(containing("log code 0xB3FF is beyond what the baseband logs"), 1u);
}

TEST_F(DiagPortSourceTest, LogRecordsBecomePacketsOfTypeOneAlsoFromTheSecondSubscription) {
  auto source = openAndMask({0xB17F});
  written();
  baseband_->send(diag::logFrame(record(0xB17F, 1)));
  Frame wrapped{0x98, 0x01, 0x00, 0x00};
  const Frame inner = diag::logFrame(record(0xB17F, 2));
  wrapped.insert(wrapped.end(), inner.begin(), inner.end());
  baseband_->send(wrapped);
  ASSERT_TRUE(until([&] { return source->counts().records == 2; }));
  EXPECT_GE(arrivals_, 1);
  ASSERT_EQ(source->availability(), PacketSource::Availability::Ready);
  const SourcePacket first = source->nextPacket();
  Frame expected{0x01};
  const Frame r1 = record(0xB17F, 1);
  expected.insert(expected.end(), r1.begin(), r1.end());
  EXPECT_EQ(*first.data, expected);
  EXPECT_EQ(first.code, 0xB17Fu);
  EXPECT_EQ(source->nextPacket().data->back(), 2);
  EXPECT_EQ(source->availability(), PacketSource::Availability::Later);
}

TEST_F(DiagPortSourceTest, BadFramesGarbageAndCommandsNotUnderstoodAreCountedAndSkipped) {
  auto source = openAndMask({0xB17F});
  written();
  std::vector<std::uint8_t> bytes{0x13, 0x37, 0x00, diag::kFlag};  // garbage between frames
  diag::appendFrame(bytes, diag::logFrame(record(0xB17F, 1)));
  bytes[bytes.size() - 2] ^= 0x01;  // its CRC spoilt
  diag::appendFrame(bytes, Frame{0x4B, 0x01, 0x02});  // a command the service does not use
  Frame disagreeing = diag::logFrame(record(0xB17F, 2));
  disagreeing[2] = 0x99;
  diag::appendFrame(bytes, disagreeing);
  diag::appendFrame(bytes, diag::logFrame(record(0xB17F, 3)));  // the one good frame
  baseband_->write(bytes);
  ASSERT_TRUE(until([&] { return source->counts().records == 1; }));
  EXPECT_EQ(source->nextPacket().data->back(), 3);
  EXPECT_EQ(source->counts().notUnderstood, 2u);
  // The minute's report says what went wrong: the garbage, up to its flag, is
  // a frame whose CRC is wrong too.
  loop_.advanceBy(DiagPortSource::kReportEvery);
  EXPECT_EQ(containing("2 frames with a bad CRC"), 1u) << allLines();
  EXPECT_EQ(containing("2 frames not understood"), 1u) << allLines();
  // A quiet minute says nothing.
  loop_.advanceBy(DiagPortSource::kReportEvery);
  EXPECT_EQ(containing("in the last minute"), 1u);
}

TEST_F(DiagPortSourceTest, ARequestUnansweredForASecondIsCountedAndTheRangesAreAskedAgain) {
  auto source = open();
  EXPECT_EQ(written(), std::vector<Frame>{diag::retrieveIdRangesRequest()});
  loop_.advanceBy(DiagPortSource::kReplyTimeout);
  EXPECT_EQ(source->counts().unansweredRequests, 1u);
  EXPECT_EQ(written(), std::vector<Frame>{diag::retrieveIdRangesRequest()});
}

TEST_F(DiagPortSourceTest, LoggingIsSwitchedOffWhenNothingIsWantedAndWhenTheSourceGoes) {
  auto source = openAndMask({0xB17F});
  ASSERT_EQ(written().size(), 1u);
  baseband_->send(diag::logConfigReply(diag::LogConfigOperation::SetMask, 0));
  until([] { return true; });
  source->setWantedCodes({});
  EXPECT_EQ(written(), std::vector<Frame>{diag::disableLoggingRequest()});
  baseband_->send(diag::logConfigReply(diag::LogConfigOperation::Disable, 0));
  until([] { return true; });

  source->setWantedCodes({0xB0C1});
  ASSERT_EQ(written().size(), 1u);
  baseband_->send(diag::logConfigReply(diag::LogConfigOperation::SetMask, 0));
  until([] { return true; });
  source.reset();
  EXPECT_EQ(written(), std::vector<Frame>{diag::disableLoggingRequest()});
}

TEST_F(DiagPortSourceTest, ASecondOpeningOfTheSamePortIsRefusedWhileTheFirstHoldsIt) {
  auto source = open();
  std::string error;
  EXPECT_FALSE(DiagPortSource::open(loop_, link_, "Quendra_LTE", error));
  EXPECT_EQ(error, link_ + ": in use: another program holds its lock (is another corvane-telephonyd bridging it?)");
  source.reset();
  EXPECT_TRUE(DiagPortSource::open(loop_, link_, "Quendra_LTE", error)) << error;
}

TEST_F(DiagPortSourceTest, APortThatVanishesIsSaidOnceAndWhenItComesBackTheMaskIsSetAgain) {
  auto source = openAndMask({0xB17F});
  ASSERT_EQ(written().size(), 1u);
  baseband_->send(diag::logConfigReply(diag::LogConfigOperation::SetMask, 0));
  baseband_->vanish();
  ASSERT_TRUE(until([&] { return !source->deviceOpen(); }));
  EXPECT_EQ(containing("has gone"), 1u);
  // Still away: tried every second, said no more.
  loop_.advanceBy(3 * DiagPortSource::kReopenEvery);
  EXPECT_FALSE(source->deviceOpen());
  EXPECT_EQ(containing("has gone"), 1u);

  baseband_ = std::make_unique<Baseband>(link_);
  loop_.advanceBy(DiagPortSource::kReopenEvery);
  ASSERT_TRUE(source->deviceOpen());
  EXPECT_EQ(containing("is back"), 1u);
  EXPECT_EQ(written(), std::vector<Frame>{diag::retrieveIdRangesRequest()});
  const diag::IdRanges ranges = lteRanges();
  baseband_->send(diag::logConfigReply(diag::LogConfigOperation::RetrieveIdRanges, 0, &ranges));
  ASSERT_TRUE(until([&] { return source->masks().size() == 1; }));
  Frame id11(0x200 / 8, 0);
  id11[0x17F / 8] |= 1 << (0x17F % 8);
  EXPECT_EQ(written(), std::vector<Frame>{diag::setMaskRequest(11, 0x200, id11)});
}

TEST_F(DiagPortSourceTest, AMissingDeviceIsAnErrorNamingIt) {
  std::string error;
  EXPECT_FALSE(DiagPortSource::open(loop_, directory_.path() + "/nothing", "Quendra_LTE", error));
  EXPECT_EQ(error, directory_.path() + "/nothing: cannot open: No such file or directory");
}

}  // namespace
}  // namespace corvane::telephonyd
