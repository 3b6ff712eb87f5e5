#include "platform/VirtualRunLoop.h"

#include <utility>

namespace corvane {

void VirtualRunLoop::dispatchAsync(Task task) { pending_.push_back(std::move(task)); }

RunLoop::Handle VirtualRunLoop::dispatchAfter(Duration delay, Task task) {
  const Handle h = next_++;
  scheduled_.emplace(h, Scheduled{now_ + delay, Duration::zero(), std::move(task)});
  return h;
}

RunLoop::Handle VirtualRunLoop::scheduleRepeatingTimer(Duration interval, Task tick) {
  const Handle h = next_++;
  scheduled_.emplace(h, Scheduled{now_ + interval, interval, std::move(tick)});
  return h;
}

RunLoop::Handle VirtualRunLoop::watchReadable(int fd, Task onReadable) {
  const Handle h = next_++;
  watches_.emplace(h, std::make_pair(fd, std::move(onReadable)));
  return h;
}

void VirtualRunLoop::cancel(Handle handle) {
  scheduled_.erase(handle);
  watches_.erase(handle);
}

void VirtualRunLoop::runPending() {
  while (!pending_.empty()) {
    std::vector<Task> batch;
    batch.swap(pending_);
    for (auto& t : batch) t();
  }
}

void VirtualRunLoop::advanceBy(Duration duration) {
  const Duration end = now_ + duration;
  runPending();
  for (;;) {
    // The earliest due task; ties go to the one scheduled first.
    auto earliest = scheduled_.end();
    for (auto it = scheduled_.begin(); it != scheduled_.end(); ++it) {
      if (it->second.due <= end && (earliest == scheduled_.end() || it->second.due < earliest->second.due)) {
        earliest = it;
      }
    }
    if (earliest == scheduled_.end()) break;
    now_ = earliest->second.due;
    const Handle h = earliest->first;
    Task task = earliest->second.task;
    if (earliest->second.interval == Duration::zero()) {
      scheduled_.erase(earliest);
    } else {
      earliest->second.due += earliest->second.interval;
    }
    task();
    (void)h;
    runPending();
  }
  now_ = end;
}

void VirtualRunLoop::pollWatches() {
  std::vector<Handle> handles;
  for (const auto& [h, w] : watches_) handles.push_back(h);
  for (Handle h : handles) {
    auto it = watches_.find(h);
    if (it == watches_.end()) continue;
    Task t = it->second.second;
    t();
  }
  runPending();
}

std::size_t VirtualRunLoop::timerCount() const {
  std::size_t n = 0;
  for (const auto& [h, s] : scheduled_) n += s.interval != Duration::zero() ? 1 : 0;
  return n;
}

std::size_t VirtualRunLoop::delayedCount() const { return scheduled_.size() - timerCount(); }

}  // namespace corvane
