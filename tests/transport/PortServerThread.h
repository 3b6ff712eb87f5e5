#pragma once

// A thread that serves local ports on its own run loop, so that a test can send
// requests that wait for replies from the test's thread. Every operation on the
// server's ports runs on the server thread (through run()).

#include <atomic>
#include <chrono>
#include <functional>
#include <future>
#include <mutex>
#include <thread>
#include <vector>

#include "platform/VirtualRunLoop.h"

namespace corvane::test {

class PortServerThread {
 public:
  PortServerThread() : thread_([this] { serve(); }) {}
  ~PortServerThread() {
    run([this] { stopping_ = true; });
    thread_.join();
  }
  PortServerThread(const PortServerThread&) = delete;
  PortServerThread& operator=(const PortServerThread&) = delete;

  // Runs the work on the server thread and waits for it.
  void run(std::function<void(VirtualRunLoop& loop)> work) {
    std::packaged_task<void()> task([this, &work] { work(loop_); });
    auto done = task.get_future();
    {
      std::lock_guard lock(mutex_);
      queue_.push_back(std::move(task));
    }
    done.get();
  }
  void run(std::function<void()> work) {
    run([&work](VirtualRunLoop&) { work(); });
  }

 private:
  void serve() {
    while (!stopping_) {
      std::vector<std::packaged_task<void()>> work;
      {
        std::lock_guard lock(mutex_);
        work.swap(queue_);
      }
      for (auto& task : work) task();
      loop_.pollWatches();
      std::this_thread::sleep_for(std::chrono::microseconds(200));
    }
  }

  VirtualRunLoop loop_;
  std::mutex mutex_;
  std::vector<std::packaged_task<void()>> queue_;
  bool stopping_ = false;  // touched on the server thread only
  std::thread thread_;
};

}  // namespace corvane::test
