#include "platform/SignalEvents.h"

#include <QCoreApplication>
#include <gtest/gtest.h>
#include <poll.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <string>
#include <vector>

#include "platform/QtRunLoop.h"
#include "platform/VirtualRunLoop.h"

namespace corvane {
namespace {

using namespace std::chrono_literals;

template <typename Condition>
bool processEventsUntil(Condition condition, std::chrono::milliseconds limit = 2000ms) {
  const auto giveUp = std::chrono::steady_clock::now() + limit;
  while (!condition()) {
    if (std::chrono::steady_clock::now() > giveUp) return false;
    QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
  }
  return true;
}

void (*handlerOf(int signal))(int) {
  struct sigaction current {};
  ::sigaction(signal, nullptr, &current);
  return current.sa_handler;
}

TEST(SignalEventsTest, RaisedSignalReachesTheCallbackOnTheQtLoopNotInTheHandler) {
  QtRunLoop loop;
  std::vector<int> received;
  std::string error;
  const auto events = SignalEvents::watch(
      loop, SignalEvents::terminationSignals(), [&](int signal) { received.push_back(signal); }, error);
  ASSERT_TRUE(events) << error;

  ASSERT_EQ(::raise(SIGTERM), 0);
  EXPECT_TRUE(received.empty());  // the handler only wrote to the pipe
  ASSERT_TRUE(processEventsUntil([&] { return !received.empty(); }));
  EXPECT_EQ(received, std::vector<int>{SIGTERM});
}

TEST(SignalEventsTest, SignalsSentWithKillArriveOnceEachInOrder) {
  VirtualRunLoop loop;
  std::vector<int> received;
  std::string error;
  const auto events = SignalEvents::watch(
      loop, SignalEvents::terminationSignals(), [&](int signal) { received.push_back(signal); }, error);
  ASSERT_TRUE(events) << error;
  EXPECT_EQ(loop.watchCount(), 1u);

  ASSERT_EQ(::kill(::getpid(), SIGINT), 0);
  ASSERT_EQ(::kill(::getpid(), SIGTERM), 0);
  EXPECT_TRUE(received.empty());  // nothing runs outside the loop
  // Another thread may take a signal sent to the process, a moment later.
  const auto giveUp = std::chrono::steady_clock::now() + 2s;
  while (received.size() < 2 && std::chrono::steady_clock::now() < giveUp) loop.pollWatches();
  EXPECT_EQ(received, (std::vector<int>{SIGINT, SIGTERM}));
  loop.pollWatches();
  EXPECT_EQ(received.size(), 2u);
}

TEST(SignalEventsTest, WhenItGoesTheSignalsGetTheirFormerActionsBackAndTheWatchEnds) {
  VirtualRunLoop loop;
  ::signal(SIGUSR1, SIG_IGN);
  {
    std::string error;
    const auto events = SignalEvents::watch(loop, {SIGUSR1}, [](int) {}, error);
    ASSERT_TRUE(events) << error;
    EXPECT_NE(handlerOf(SIGUSR1), SIG_IGN);
  }
  EXPECT_EQ(handlerOf(SIGUSR1), SIG_IGN);
  EXPECT_EQ(loop.watchCount(), 0u);
  ::signal(SIGUSR1, SIG_DFL);
}

TEST(SignalEventsTest, ASignalIsCaughtByOneWatcherAtATime) {
  VirtualRunLoop loop;
  std::string error;
  const auto first = SignalEvents::watch(loop, {SIGUSR2}, [](int) {}, error);
  ASSERT_TRUE(first) << error;
  EXPECT_FALSE(SignalEvents::watch(loop, {SIGUSR2}, [](int) {}, error));
  EXPECT_EQ(error, "cannot catch signal " + std::to_string(SIGUSR2) + ": it is caught already");
}

bool readable(int fd) {
  pollfd p{fd, POLLIN, 0};
  return ::poll(&p, 1, 0) == 1 && (p.revents & POLLIN) != 0;
}

TEST(SignalEventsTest, PendingDescriptorIsReadableFromTheSignalUntilTheLoopHasHandledIt) {
  VirtualRunLoop loop;
  std::vector<int> received;
  std::string error;
  const auto events = SignalEvents::watch(loop, {SIGUSR1}, [&](int signal) { received.push_back(signal); }, error);
  ASSERT_TRUE(events) << error;
  EXPECT_FALSE(readable(events->pendingDescriptor()));
  ASSERT_EQ(::raise(SIGUSR1), 0);
  EXPECT_TRUE(readable(events->pendingDescriptor()));
  // Looking does not take the signal away from the loop.
  EXPECT_TRUE(readable(events->pendingDescriptor()));
  EXPECT_TRUE(received.empty());
  loop.pollWatches();
  EXPECT_EQ(received, std::vector<int>{SIGUSR1});
  EXPECT_FALSE(readable(events->pendingDescriptor()));
}

}  // namespace
}  // namespace corvane
