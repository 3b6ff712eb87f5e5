#pragma once

// A run loop on a virtual clock, for tests: nothing runs until the test calls
// runPending() or advanceBy(), and time only moves when the test moves it.

#include <map>
#include <vector>

#include "platform/RunLoop.h"

namespace corvane {

class VirtualRunLoop final : public RunLoop {
 public:
  void dispatchAsync(Task task) override;
  Handle dispatchAfter(Duration delay, Task task) override;
  Handle scheduleRepeatingTimer(Duration interval, Task tick) override;
  Handle watchReadable(int fd, Task onReadable) override;
  void cancel(Handle handle) override;
  Duration now() const override { return now_; }

  // Runs the dispatched tasks (and those they dispatch) without moving the clock.
  void runPending();
  // Moves the clock forward, running every task that falls due, in time order.
  void advanceBy(Duration duration);
  // Lets every watched descriptor's callback run once (tests that use real descriptors).
  void pollWatches();

  std::size_t timerCount() const;     // repeating timers alive
  std::size_t delayedCount() const;   // one-shot delayed tasks waiting
  std::size_t watchCount() const { return watches_.size(); }

 private:
  struct Scheduled {
    Duration due;
    Duration interval;  // zero for a one-shot task
    Task task;
  };
  Handle next_ = 1;
  Duration now_{0};
  std::vector<Task> pending_;
  std::map<Handle, Scheduled> scheduled_;
  std::map<Handle, std::pair<int, Task>> watches_;
};

}  // namespace corvane
