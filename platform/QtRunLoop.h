#pragma once

// The run loop on the Qt event loop of the thread that makes it. A
// QCoreApplication (or QApplication) must exist first; the work runs only while
// that thread's event loop runs or processes events.

#include <memory>

#include "platform/RunLoop.h"

namespace corvane {

class QtRunLoop final : public RunLoop {
 public:
  QtRunLoop();
  ~QtRunLoop() override;
  QtRunLoop(const QtRunLoop&) = delete;
  QtRunLoop& operator=(const QtRunLoop&) = delete;

  void dispatchAsync(Task task) override;
  Handle dispatchAfter(Duration delay, Task task) override;
  Handle scheduleRepeatingTimer(Duration interval, Task tick) override;
  Handle watchReadable(int fd, Task onReadable) override;
  void cancel(Handle handle) override;
  Duration now() const override;

 private:
  struct Impl;
  std::unique_ptr<Impl> impl_;
};

}  // namespace corvane
