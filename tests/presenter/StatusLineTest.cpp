#include "presenter/StatusLine.h"

#include <gtest/gtest.h>

namespace corvane {
namespace {

// 2026-11-16 08:00:00 UTC; the tests run in a zone three hours east of UTC.
constexpr std::int64_t kMorning = 1'794'816'000'000'000;

TEST(StatusLine, LaunchShowsConnectingWithoutDotsSpinning) {
  EXPECT_EQ(StatusLine::launching(), (StatusState{"Connecting", true}));
}

TEST(StatusLine, NotConnectedShowsConnectingWithDotsSpinning) {
  StatusLine line;
  EXPECT_EQ(line.current(false), (StatusState{"Connecting...", true}));
  line.displayUpdated(true, Date{kMorning});
  EXPECT_EQ(line.current(false), (StatusState{"Connecting...", true}));
}

TEST(StatusLine, ConnectedShowsTheLocalTimeOfTheLastUpdateStopped) {
  StatusLine line;
  line.displayUpdated(true, Date{kMorning});
  EXPECT_EQ(line.current(true), (StatusState{"Updated 2026-11-16 at 11:00:00", false}));
}

TEST(StatusLine, UpdateWhileDisconnectedKeepsTheLastMessage) {
  StatusLine line;
  line.displayUpdated(true, Date{kMorning});
  line.displayUpdated(false, Date{kMorning + 60'000'000});
  EXPECT_EQ(line.updateMessage(), "Updated 2026-11-16 at 11:00:00");
}

TEST(StatusLine, ConnectedBeforeAnyUpdateShowsConnectingWithDotsStopped) {
  const StatusLine line;
  EXPECT_EQ(line.current(true), (StatusState{"Connecting...", false}));
}

TEST(StatusLine, FractionOfASecondBefore1970RoundsDown) {
  EXPECT_EQ(StatusLine::updateMessageAt(Date{-1}), "Updated 1970-01-01 at 02:59:59");
  EXPECT_EQ(StatusLine::updateMessageAt(Date{999'999}), "Updated 1970-01-01 at 03:00:00");
}

}  // namespace
}  // namespace corvane
