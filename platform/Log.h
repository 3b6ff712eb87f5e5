#pragma once

// The system log. Every line has a syslog priority: 3 for failures, 4 for
// traces, 5 in one place, and 16 passed on as it is. Production code writes to
// syslog(3) with ident "corvane" (makeSystemLogSink); tests install a capturing
// sink and assert the exact lines.

#include <atomic>
#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

namespace corvane::log {

inline constexpr int kError = 3;
inline constexpr int kWarning = 4;
inline constexpr int kNotice = 5;
// The general message log: lines without a syslog priority, which go to
// standard error and never to the system log. They travel through the same
// sinks as the system log's lines under this pseudo-priority, so tests capture
// them alike and a line nobody records is never formatted.
inline constexpr int kMessage = -1;

class Sink {
 public:
  virtual ~Sink() = default;
  virtual void write(int priority, std::string_view text) = 0;
  // Whether the sink records lines of this priority. A line no sink wants is
  // never formatted, which keeps per-packet traces cheap when nobody reads
  // them; a sink that records a priority must say so here.
  virtual bool wants(int /*priority*/) const { return true; }
  // Writes out what the sink holds back (a count of repeats); also done when
  // it is destroyed.
  virtual void flush() {}
};

using SteadyClock = std::function<std::chrono::steady_clock::time_point()>;

// The system log's socket, where syslog(3) sends.
const char* systemLogSocket();
// Whether a log daemon takes connections on the Unix-domain socket at `path`
// (datagram or stream, as syslog(3) tries them).
bool logDaemonListens(const char* path);

// syslog(3), ident "corvane". The connection to the log daemon is opened once
// (LOG_NDELAY) and kept; when the daemon restarts, syslog(3) connects anew on
// the first line that fails to go. Whether a daemon listens at all is checked
// at most once a second: without one, the sink wants no line (so none is even
// formatted) and nothing tries to connect per line, as syslog(3) alone would;
// once one listens again, the sink connects and takes lines again. A daemon
// that goes away is noticed at the next check, within a second.
class SyslogSink final : public Sink {
 public:
  SyslogSink();
  // For tests: how to tell whether a daemon listens, and the clock of the checks.
  SyslogSink(std::function<bool()> daemonListens, SteadyClock clock);
  void write(int priority, std::string_view text) override;
  // What the process's syslog mask lets through (all priorities unless
  // setlogmask(3) narrowed it), while a log daemon listens.
  bool wants(int priority) const override;

  static constexpr std::chrono::seconds kDaemonCheckInterval{1};

 private:
  bool daemonPresent() const;

  std::function<bool()> daemonListens_;
  SteadyClock clock_;
  mutable std::mutex checkMutex_;
  mutable std::atomic<std::chrono::steady_clock::rep> nextCheck_;
  mutable std::atomic<bool> present_{false};
};

// Passes lines on to another sink, but a line that repeats (same priority,
// same text) within a second of being written is written once: the repeats
// are counted, and one line "<text> (repeated N more times)" follows, at the
// same priority, when a different line arrives, on the first line after the
// second has passed, or on flush and destruction. A flood of one message
// (a phone streaming thousands of packets a second, each failing alike) so
// costs the system log two lines a second. Wants what the sink behind it wants.
class RepeatCollapsingSink final : public Sink {
 public:
  explicit RepeatCollapsingSink(std::shared_ptr<Sink> next, SteadyClock clock = std::chrono::steady_clock::now);
  ~RepeatCollapsingSink() override;
  RepeatCollapsingSink(const RepeatCollapsingSink&) = delete;
  RepeatCollapsingSink& operator=(const RepeatCollapsingSink&) = delete;

  void write(int priority, std::string_view text) override;
  bool wants(int priority) const override { return next_->wants(priority); }
  void flush() override;

  static constexpr std::chrono::seconds kWindow{1};
  // "<text> (repeated 1 more time)", "<text> (repeated 5 more times)".
  static std::string repeatsLine(std::string_view text, std::uint64_t repeats);

 private:
  void flushLocked();

  std::shared_ptr<Sink> next_;
  SteadyClock clock_;
  std::mutex mutex_;
  bool holding_ = false;
  int priority_ = 0;
  std::string text_;
  std::chrono::steady_clock::time_point writtenAt_{};
  std::uint64_t repeats_ = 0;
};

// The system log as production code uses it: repeats collapsed, then
// syslog(3); the general message log's lines to standard error.
std::shared_ptr<Sink> makeSystemLogSink();

// Writes "<priority> <text>" lines to standard error, and the general message
// log's lines as their text alone.
class StderrSink final : public Sink {
 public:
  void write(int priority, std::string_view text) override;
};

// The general message log alone: its lines, as their text, to standard error.
class MessageLogSink final : public Sink {
 public:
  void write(int priority, std::string_view text) override;
  bool wants(int priority) const override { return priority == kMessage; }
};

// Sends every line to each of its sinks that wants it.
class TeeSink final : public Sink {
 public:
  explicit TeeSink(std::vector<std::shared_ptr<Sink>> sinks) : sinks_(std::move(sinks)) {}
  void write(int priority, std::string_view text) override;
  bool wants(int priority) const override;
  void flush() override;

 private:
  std::vector<std::shared_ptr<Sink>> sinks_;
};

struct Line {
  int priority;
  std::string text;
  friend bool operator==(const Line&, const Line&) = default;
};

// Records every line, for tests.
class CapturingSink final : public Sink {
 public:
  void write(int priority, std::string_view text) override;
  std::vector<Line> lines() const;
  std::vector<std::string> texts() const;
  // How many recorded lines have exactly this text.
  std::size_t count(std::string_view text) const;
  void clear();

 private:
  mutable std::mutex mutex_;
  std::vector<Line> lines_;
};

// The sink all logging goes to, makeSystemLogSink() until replaced; other threads drop the old at their next line.
void setSink(std::shared_ptr<Sink> sink);
std::shared_ptr<Sink> sink();
// Flushes the current sink; programs call it as they end.
void flush();

// Whether the current sink wants lines of this priority; write and printf
// ask it themselves.
bool wants(int priority);
void write(int priority, std::string_view text);
void printf(int priority, const char* format, ...) __attribute__((format(printf, 2, 3)));
std::string format(const char* format, ...) __attribute__((format(printf, 1, 2)));

// A pointer as log lines show it: "0x" and lower-case hex digits, "0x0" for null.
std::string pointerText(const void* pointer);

// Installs a capturing sink for its lifetime and restores the previous sink after.
class ScopedCapture {
 public:
  ScopedCapture();
  ~ScopedCapture();
  ScopedCapture(const ScopedCapture&) = delete;
  ScopedCapture& operator=(const ScopedCapture&) = delete;
  CapturingSink& sink() { return *capture_; }
  std::vector<std::string> texts() const { return capture_->texts(); }
  std::vector<Line> lines() const { return capture_->lines(); }

 private:
  std::shared_ptr<CapturingSink> capture_;
  std::shared_ptr<Sink> previous_;
};

}  // namespace corvane::log
