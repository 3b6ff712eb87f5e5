#pragma once

// The system log. Every line has a syslog priority: 3 for failures, 4 for
// traces, 5 in one place, and 16 passed on as it is. Production code writes to
// syslog(3) with ident "corvane"; tests install a capturing sink and assert the
// exact lines.

#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

namespace corvane::log {

inline constexpr int kError = 3;
inline constexpr int kWarning = 4;
inline constexpr int kNotice = 5;

class Sink {
 public:
  virtual ~Sink() = default;
  virtual void write(int priority, std::string_view text) = 0;
  // Whether the sink records lines of this priority. A line no sink wants is
  // never formatted, which keeps per-packet traces cheap when nobody reads
  // them; a sink that records a priority must say so here.
  virtual bool wants(int /*priority*/) const { return true; }
};

class SyslogSink final : public Sink {
 public:
  SyslogSink();
  void write(int priority, std::string_view text) override;
  // What the process's syslog mask lets through (all priorities unless
  // setlogmask(3) narrowed it); syslog(3) would drop the rest anyway.
  bool wants(int priority) const override;
};

// Writes "<priority> <text>" lines to standard error.
class StderrSink final : public Sink {
 public:
  void write(int priority, std::string_view text) override;
};

// Sends every line to each of its sinks that wants it.
class TeeSink final : public Sink {
 public:
  explicit TeeSink(std::vector<std::shared_ptr<Sink>> sinks) : sinks_(std::move(sinks)) {}
  void write(int priority, std::string_view text) override;
  bool wants(int priority) const override;

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

// The sink all logging goes to; syslog until replaced.
void setSink(std::shared_ptr<Sink> sink);
std::shared_ptr<Sink> sink();

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
