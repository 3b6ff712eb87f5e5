#pragma once

// The main run loop: the one thread on which ports deliver, timers tick and
// dispatched work runs. The application runs it on the Qt event loop; tests run
// it on a virtual clock that only moves when the test advances it.

#include <chrono>
#include <cstdint>
#include <functional>

namespace corvane {

class RunLoop {
 public:
  using Task = std::function<void()>;
  using Duration = std::chrono::nanoseconds;
  // Identifies a delayed task, a repeating timer or a descriptor watch; 0 is never used.
  using Handle = std::uint64_t;

  virtual ~RunLoop() = default;

  // Runs the task on the loop soon, after the current work.
  virtual void dispatchAsync(Task task) = 0;
  // Runs the task once, `delay` from now.
  virtual Handle dispatchAfter(Duration delay, Task task) = 0;
  // Runs `tick` every `interval`, the first time one interval from now.
  virtual Handle scheduleRepeatingTimer(Duration interval, Task tick) = 0;
  // Calls `onReadable` on the loop whenever the descriptor has data or has hung up.
  virtual Handle watchReadable(int fd, Task onReadable) = 0;
  // Stops a delayed task, a timer or a watch; unknown or finished handles are ignored.
  virtual void cancel(Handle handle) = 0;
  // Monotonic time of this loop.
  virtual Duration now() const = 0;
};

}  // namespace corvane
