// The current sink as threads see it: each thread keeps the sink it last used
// and takes the new one after setSink, without a lock on the common path.

#include <gtest/gtest.h>

#include <atomic>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "platform/Log.h"

namespace corvane {
namespace {

// Counts the workers' lines and the swapping thread's ones it takes; wants
// no notice.
class CountingSink final : public log::Sink {
 public:
  void write(int priority, std::string_view text) override {
    if (priority == log::kWarning && text.rfind("worker ", 0) == 0) workerLines_.fetch_add(1);
    if (text == "swapped") swappedLines_.fetch_add(1);
  }
  bool wants(int priority) const override { return priority != log::kNotice; }
  std::uint64_t workerLines() const { return workerLines_.load(); }
  std::uint64_t swappedLines() const { return swappedLines_.load(); }

 private:
  std::atomic<std::uint64_t> workerLines_{0};
  std::atomic<std::uint64_t> swappedLines_{0};
};

TEST(LogThreads, EveryLineReachesOneSinkWhileAnotherThreadSwapsThem) {
  auto outer = std::make_shared<CountingSink>();
  const auto previous = log::sink();
  log::setSink(outer);

  constexpr int kWorkers = 3;
  std::atomic<bool> stopping{false};
  std::atomic<int> started{0};
  std::vector<std::uint64_t> written(kWorkers, 0);
  std::vector<std::thread> workers;
  for (int w = 0; w < kWorkers; ++w) {
    workers.emplace_back([&, w] {
      started.fetch_add(1);
      std::uint64_t n = 0;
      while (!stopping.load(std::memory_order_relaxed)) {
        // A line nobody wants in between, as the decoders' traces are.
        log::printf(log::kNotice, "unwanted %llu", static_cast<unsigned long long>(n));
        log::printf(log::kWarning, "worker %d line %llu", w, static_cast<unsigned long long>(n));
        ++n;
      }
      written[static_cast<std::size_t>(w)] = n;
    });
  }
  while (started.load() < kWorkers) std::this_thread::yield();

  // Every sink the swapping thread installs, kept to count what each took:
  // counting ones, and capturing ones in between.
  std::vector<std::shared_ptr<CountingSink>> counting;
  std::vector<std::shared_ptr<log::CapturingSink>> capturing;
  for (int i = 0; i < 300; ++i) {
    std::shared_ptr<log::Sink> next;
    if (i % 2 == 0) {
      next = counting.emplace_back(std::make_shared<CountingSink>());
    } else {
      next = capturing.emplace_back(std::make_shared<log::CapturingSink>());
    }
    log::setSink(next);
    // What this thread writes after the swap goes to the new sink, at once.
    log::write(log::kWarning, "swapped");
    if (i % 2 == 0) {
      EXPECT_EQ(counting.back()->swappedLines(), 1u) << "swap " << i;
    } else {
      EXPECT_EQ(capturing.back()->count("swapped"), 1u) << "swap " << i;
    }
  }
  stopping.store(true);
  for (auto& t : workers) t.join();
  log::setSink(previous);

  // Each line the workers wrote reached exactly one sink.
  std::uint64_t total = 0;
  for (const auto n : written) total += n;
  std::uint64_t seen = outer->workerLines();
  for (const auto& s : counting) seen += s->workerLines();
  for (const auto& s : capturing) {
    for (const auto& line : s->lines()) {
      seen += line.priority == log::kWarning && line.text.rfind("worker ", 0) == 0 ? 1 : 0;
    }
  }
  EXPECT_GT(total, 0u);
  EXPECT_EQ(seen, total);
}

TEST(LogThreads, AScopedCaptureTakesThisThreadsLinesWhileOthersLog) {
  auto outer = std::make_shared<log::CapturingSink>();
  const auto previous = log::sink();
  log::setSink(outer);
  std::atomic<bool> stopping{false};
  std::thread worker([&] {
    while (!stopping.load(std::memory_order_relaxed)) log::write(log::kWarning, "worker");
  });
  for (int i = 0; i < 200; ++i) {
    {
      log::ScopedCapture capture;
      log::write(log::kError, "inside");
      EXPECT_EQ(capture.sink().count("inside"), 1u) << "capture " << i;
    }
    log::write(log::kError, "outside");
    EXPECT_EQ(outer->count("outside"), static_cast<std::size_t>(i) + 1) << "capture " << i;
  }
  stopping.store(true);
  worker.join();
  log::setSink(previous);
  EXPECT_EQ(outer->count("inside"), 0u);
}

TEST(LogThreads, ThisThreadLetsGoOfTheSinkItReplaces) {
  auto first = std::make_shared<log::CapturingSink>();
  const std::weak_ptr<log::CapturingSink> watched = first;
  const auto previous = log::sink();
  log::setSink(std::move(first));
  log::write(log::kError, "through the first");
  EXPECT_FALSE(watched.expired());
  log::setSink(previous);
  EXPECT_TRUE(watched.expired());
}

TEST(LogThreads, AThreadThatEndsLetsGoOfItsSink) {
  auto capture = std::make_shared<log::CapturingSink>();
  const std::weak_ptr<log::CapturingSink> watched = capture;
  const auto previous = log::sink();
  log::setSink(capture);
  std::thread([] { log::write(log::kError, "from a thread"); }).join();
  log::setSink(previous);
  EXPECT_EQ(capture->texts(), std::vector<std::string>{"from a thread"});
  capture.reset();
  EXPECT_TRUE(watched.expired());
}

// Logs as its thread ends, after the thread's own copy of the sink is gone.
struct LogsWhenTheThreadEnds {
  bool armed = false;
  ~LogsWhenTheThreadEnds() {
    if (armed) log::write(log::kError, "at the end");
  }
};

TEST(LogThreads, LinesWrittenAsAThreadEndsStillReachTheSink) {
  log::ScopedCapture capture;
  std::thread([] {
    // Made before the thread's first line, so destroyed after what the
    // logging keeps for the thread.
    thread_local LogsWhenTheThreadEnds last;
    last.armed = true;
    log::write(log::kError, "first");
  }).join();
  EXPECT_EQ(capture.texts(), (std::vector<std::string>{"first", "at the end"}));
}

}  // namespace
}  // namespace corvane
