#include "platform/QtRunLoop.h"

#include <QCoreApplication>
#include <gtest/gtest.h>
#include <unistd.h>

#include <chrono>
#include <string>
#include <vector>

namespace corvane {
namespace {

using namespace std::chrono_literals;

// Processes Qt events until the condition holds or the limit has passed.
template <typename Condition>
bool processEventsUntil(Condition condition, std::chrono::milliseconds limit = 2000ms) {
  const auto giveUp = std::chrono::steady_clock::now() + limit;
  while (!condition()) {
    if (std::chrono::steady_clock::now() > giveUp) return false;
    QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
  }
  return true;
}

void processEventsFor(std::chrono::milliseconds duration) {
  const auto end = std::chrono::steady_clock::now() + duration;
  while (std::chrono::steady_clock::now() < end) QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
}

TEST(QtRunLoopTest, DispatchedTasksRunLaterInOrder) {
  QtRunLoop loop;
  std::vector<int> order;
  loop.dispatchAsync([&] { order.push_back(1); });
  loop.dispatchAsync([&] {
    order.push_back(2);
    loop.dispatchAsync([&] { order.push_back(3); });
  });
  EXPECT_TRUE(order.empty());
  EXPECT_TRUE(processEventsUntil([&] { return order.size() == 3; }));
  EXPECT_EQ(order, (std::vector<int>{1, 2, 3}));
}

TEST(QtRunLoopTest, DelayedTaskRunsOnceNotBeforeItsDelay) {
  QtRunLoop loop;
  const auto start = loop.now();
  RunLoop::Duration ranAt{};
  int runs = 0;
  loop.dispatchAfter(30ms, [&] {
    ++runs;
    ranAt = loop.now();
  });
  EXPECT_TRUE(processEventsUntil([&] { return runs == 1; }));
  processEventsFor(50ms);
  EXPECT_EQ(runs, 1);
  EXPECT_GE(ranAt - start, 30ms);
}

TEST(QtRunLoopTest, CancelledTaskAndTimerDoNotRun) {
  QtRunLoop loop;
  int runs = 0;
  const auto task = loop.dispatchAfter(10ms, [&] { ++runs; });
  const auto timer = loop.scheduleRepeatingTimer(10ms, [&] { ++runs; });
  EXPECT_NE(task, timer);
  loop.cancel(task);
  loop.cancel(timer);
  loop.cancel(task);    // twice: ignored
  loop.cancel(999999);  // unknown: ignored
  processEventsFor(60ms);
  EXPECT_EQ(runs, 0);
}

TEST(QtRunLoopTest, RepeatingTimerTicksUntilItCancelsItself) {
  QtRunLoop loop;
  int ticks = 0;
  RunLoop::Handle timer = 0;
  timer = loop.scheduleRepeatingTimer(5ms, [&] {
    if (++ticks == 3) loop.cancel(timer);
  });
  EXPECT_TRUE(processEventsUntil([&] { return ticks == 3; }));
  processEventsFor(40ms);
  EXPECT_EQ(ticks, 3);
}

TEST(QtRunLoopTest, WatchReportsDataAndHangUp) {
  QtRunLoop loop;
  int fds[2];
  ASSERT_EQ(::pipe(fds), 0);
  int wakeups = 0;
  std::string read;
  bool hungUp = false;
  RunLoop::Handle watch = 0;
  watch = loop.watchReadable(fds[0], [&] {
    ++wakeups;
    char buffer[16];
    const ssize_t n = ::read(fds[0], buffer, sizeof buffer);
    if (n > 0) {
      read.append(buffer, static_cast<std::size_t>(n));
    } else {
      hungUp = true;
      loop.cancel(watch);
    }
  });
  processEventsFor(20ms);
  EXPECT_EQ(wakeups, 0);
  ASSERT_EQ(::write(fds[1], "abc", 3), 3);
  EXPECT_TRUE(processEventsUntil([&] { return read == "abc"; }));
  ::close(fds[1]);
  EXPECT_TRUE(processEventsUntil([&] { return hungUp; }));
  const int after = wakeups;
  processEventsFor(20ms);
  EXPECT_EQ(wakeups, after);
  ::close(fds[0]);
}

TEST(QtRunLoopTest, PendingWorkIsDroppedWithTheLoop) {
  int runs = 0;
  {
    QtRunLoop loop;
    loop.dispatchAsync([&] { ++runs; });
    loop.dispatchAfter(1ms, [&] { ++runs; });
  }
  processEventsFor(20ms);
  EXPECT_EQ(runs, 0);
}

}  // namespace
}  // namespace corvane
