#include "platform/Log.h"

#include <sys/socket.h>
#include <sys/un.h>
#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <cinttypes>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <utility>

namespace corvane::log {

namespace {
// The sink all logging goes to, and its generation: a number that setSink
// raises with every new sink. Each thread keeps the sink it last used, with
// its generation, and goes back to the mutex only when the generation moved,
// so a line nobody wants costs an atomic load and the sink's wants(), with
// no lock taken and no reference counted.
struct CurrentSink {
  std::mutex mutex;
  std::shared_ptr<Sink> sink = makeSystemLogSink();  // guarded by mutex
};
CurrentSink& current() {
  static CurrentSink s;
  return s;
}
// Raised under CurrentSink::mutex; never 0.
constinit std::atomic<std::uint64_t> sinkGeneration{1};

// The calling thread's copy of the current sink. Trivially destructible, so
// that it can still be read while the thread (or the process) ends: the
// reference that keeps the sink alive is held by ThreadSinkHold below, which
// marks the cache as gone when it is destroyed; from then on the thread takes
// the sink under the mutex for each line.
struct ThreadSinkCache {
  std::uint64_t generation;  // 0: nothing cached
  Sink* sink;
  bool gone;
};
constinit thread_local ThreadSinkCache threadCache{0, nullptr, false};

struct ThreadSinkHold {
  std::shared_ptr<Sink> sink;
  ~ThreadSinkHold() { threadCache = {0, nullptr, true}; }
};
thread_local ThreadSinkHold threadHold;

// The current sink as the calling thread sees it; `keep` holds it when the
// thread can no longer cache it.
Sink* refreshSink(std::shared_ptr<Sink>& keep) {
  auto& c = current();
  std::shared_ptr<Sink> replaced;  // released after the mutex: a sink's destructor may log
  std::lock_guard lock(c.mutex);
  if (threadCache.gone) {
    keep = c.sink;
    return keep.get();
  }
  replaced = std::exchange(threadHold.sink, c.sink);
  threadCache = {sinkGeneration.load(std::memory_order_relaxed), threadHold.sink.get(), false};
  return threadCache.sink;
}

// Hands `use` the current sink (null if none). The common path: the copy
// this thread keeps, while no new sink was set since.
template <class Use>
inline auto withSink(Use&& use) {
  if (threadCache.generation == sinkGeneration.load(std::memory_order_acquire)) [[likely]]
    return use(threadCache.sink);
  std::shared_ptr<Sink> keep;
  return use(refreshSink(keep));
}

constexpr const char* kIdent = "corvane";
constexpr int kOptions = LOG_PID | LOG_NDELAY;

int connectedSocket(int type, const sockaddr_un& address) {
  const int fd = ::socket(AF_UNIX, type | SOCK_CLOEXEC, 0);
  if (fd < 0) return -1;
  if (::connect(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0) return fd;
  const int saved = errno;
  ::close(fd);
  errno = saved;
  return -1;
}

// One formatting pass for the usual short line; a longer one is measured by
// that pass and formatted again at its size.
__attribute__((format(printf, 1, 0))) std::string vformat(const char* fmt, va_list args) {
  char line[256];
  va_list copy;
  va_copy(copy, args);
  const int n = std::vsnprintf(line, sizeof line, fmt, copy);
  va_end(copy);
  if (n <= 0) return {};
  if (static_cast<std::size_t>(n) < sizeof line) return std::string(line, static_cast<std::size_t>(n));
  std::string out(static_cast<std::size_t>(n) + 1, '\0');
  std::vsnprintf(out.data(), out.size(), fmt, args);
  out.resize(static_cast<std::size_t>(n));
  return out;
}

}  // namespace

const char* systemLogSocket() { return _PATH_LOG; }

bool logDaemonListens(const char* path) {
  sockaddr_un address{};
  if (std::strlen(path) >= sizeof address.sun_path) return false;
  address.sun_family = AF_UNIX;
  std::strcpy(address.sun_path, path);
  int fd = connectedSocket(SOCK_DGRAM, address);
  if (fd < 0 && errno == EPROTOTYPE) fd = connectedSocket(SOCK_STREAM, address);
  if (fd < 0) return false;
  ::close(fd);
  return true;
}

SyslogSink::SyslogSink()
    : SyslogSink([] { return logDaemonListens(systemLogSocket()); }, std::chrono::steady_clock::now) {}

SyslogSink::SyslogSink(std::function<bool()> daemonListens, SteadyClock clock)
    : daemonListens_(std::move(daemonListens)), clock_(std::move(clock)) {
  present_.store(daemonListens_());
  nextCheck_.store((clock_() + kDaemonCheckInterval).time_since_epoch().count());
  // Connects now, and keeps the connection, when a daemon listens.
  if (present_.load()) openlog(kIdent, kOptions, LOG_USER);
}

bool SyslogSink::daemonPresent() const {
  const auto now = clock_().time_since_epoch().count();
  auto due = nextCheck_.load(std::memory_order_relaxed);
  if (now < due) return present_.load(std::memory_order_acquire);
  // The check is due: the thread that moves the next one a second on makes
  // it; the others answer from the last one meanwhile.
  using Duration = std::chrono::steady_clock::duration;
  const auto next = now + std::chrono::duration_cast<Duration>(kDaemonCheckInterval).count();
  if (!nextCheck_.compare_exchange_strong(due, next, std::memory_order_relaxed)) {
    return present_.load(std::memory_order_acquire);
  }
  // Keeps a check that takes long apart from the next one.
  std::lock_guard lock(checkMutex_);
  const bool listens = daemonListens_();
  // A daemon back (or new): connect at once rather than on the first line.
  // One that went is left to syslog(3), which connects anew when it returns.
  if (listens && !present_.load(std::memory_order_relaxed)) openlog(kIdent, kOptions, LOG_USER);
  present_.store(listens, std::memory_order_release);
  return listens;
}

void SyslogSink::write(int priority, std::string_view text) {
  if (!daemonPresent()) return;
  syslog(priority, "%.*s", static_cast<int>(text.size()), text.data());
}

bool SyslogSink::wants(int priority) const {
  if (priority == kMessage) return false;
  // Whether a daemon listens is known from atomics; setlogmask(0), which reads
  // the mask without changing it but under the C library's lock, is asked
  // only then.
  return daemonPresent() && (setlogmask(0) & LOG_MASK(LOG_PRI(priority))) != 0;
}

RepeatCollapsingSink::RepeatCollapsingSink(std::shared_ptr<Sink> next, SteadyClock clock)
    : next_(std::move(next)), clock_(std::move(clock)) {}

RepeatCollapsingSink::~RepeatCollapsingSink() { flush(); }

std::string RepeatCollapsingSink::repeatsLine(std::string_view text, std::uint64_t repeats) {
  return std::string(text) + " (repeated " + std::to_string(repeats) + (repeats == 1 ? " more time)" : " more times)");
}

void RepeatCollapsingSink::write(int priority, std::string_view text) {
  std::lock_guard lock(mutex_);
  const auto now = clock_();
  if (holding_ && priority == priority_ && text == text_ && now - writtenAt_ < kWindow) {
    ++repeats_;
    return;
  }
  flushLocked();
  next_->write(priority, text);
  holding_ = true;
  priority_ = priority;
  text_.assign(text);
  writtenAt_ = now;
}

void RepeatCollapsingSink::flush() {
  std::lock_guard lock(mutex_);
  flushLocked();
  next_->flush();
}

void RepeatCollapsingSink::flushLocked() {
  if (repeats_ == 0) return;
  const std::uint64_t repeats = repeats_;
  repeats_ = 0;
  if (next_->wants(priority_)) next_->write(priority_, repeatsLine(text_, repeats));
}

std::shared_ptr<Sink> makeSystemLogSink() {
  return std::make_shared<TeeSink>(std::vector<std::shared_ptr<Sink>>{
      std::make_shared<RepeatCollapsingSink>(std::make_shared<SyslogSink>()), std::make_shared<MessageLogSink>()});
}

void MessageLogSink::write(int priority, std::string_view text) {
  if (priority != kMessage) return;
  std::fprintf(stderr, "%.*s\n", static_cast<int>(text.size()), text.data());
}

void StderrSink::write(int priority, std::string_view text) {
  if (priority == kMessage) {
    std::fprintf(stderr, "%.*s\n", static_cast<int>(text.size()), text.data());
    return;
  }
  std::fprintf(stderr, "<%d> %.*s\n", priority, static_cast<int>(text.size()), text.data());
}

void TeeSink::write(int priority, std::string_view text) {
  for (auto& s : sinks_) {
    if (s->wants(priority)) s->write(priority, text);
  }
}

bool TeeSink::wants(int priority) const {
  for (const auto& s : sinks_) {
    if (s->wants(priority)) return true;
  }
  return false;
}

void TeeSink::flush() {
  for (auto& s : sinks_) s->flush();
}

void CapturingSink::write(int priority, std::string_view text) {
  std::lock_guard lock(mutex_);
  lines_.push_back({priority, std::string(text)});
}

std::vector<Line> CapturingSink::lines() const {
  std::lock_guard lock(mutex_);
  return lines_;
}

std::vector<std::string> CapturingSink::texts() const {
  std::lock_guard lock(mutex_);
  std::vector<std::string> out;
  out.reserve(lines_.size());
  for (const auto& l : lines_) out.push_back(l.text);
  return out;
}

std::size_t CapturingSink::count(std::string_view text) const {
  std::lock_guard lock(mutex_);
  std::size_t n = 0;
  for (const auto& l : lines_) n += (l.text == text) ? 1 : 0;
  return n;
}

void CapturingSink::clear() {
  std::lock_guard lock(mutex_);
  lines_.clear();
}

void setSink(std::shared_ptr<Sink> s) {
  auto& c = current();
  std::shared_ptr<Sink> previous;
  std::shared_ptr<Sink> cached;
  {
    std::lock_guard lock(c.mutex);
    previous = std::exchange(c.sink, std::move(s));
    sinkGeneration.fetch_add(1, std::memory_order_release);
    // This thread lets go of the old sink at once: a program that replaces
    // its sink sees the old one go (and write what it held back) here.
    if (!threadCache.gone) {
      cached = std::move(threadHold.sink);
      threadCache = {0, nullptr, false};
    }
  }
  // Released outside the mutex, since a sink's destructor may log.
}

std::shared_ptr<Sink> sink() {
  auto& c = current();
  std::lock_guard lock(c.mutex);
  return c.sink;
}

void flush() {
  if (auto s = sink()) s->flush();
}

bool wants(int priority) {
  return withSink([priority](Sink* s) { return s && s->wants(priority); });
}

void write(int priority, std::string_view text) {
  withSink([priority, text](Sink* s) {
    if (s && s->wants(priority)) s->write(priority, text);
  });
}

void printf(int priority, const char* fmt, ...) {
  va_list args;
  va_start(args, fmt);
  withSink([priority, fmt, &args](Sink* s) {
    if (!s || !s->wants(priority)) return;
    const std::string text = vformat(fmt, args);
    s->write(priority, text);
  });
  va_end(args);
}

std::string format(const char* fmt, ...) {
  va_list args;
  va_start(args, fmt);
  std::string text = vformat(fmt, args);
  va_end(args);
  return text;
}

std::string pointerText(const void* pointer) {
  char buf[2 + 16 + 1];
  std::snprintf(buf, sizeof buf, "0x%" PRIxPTR, reinterpret_cast<std::uintptr_t>(pointer));
  return buf;
}

ScopedCapture::ScopedCapture() : capture_(std::make_shared<CapturingSink>()), previous_(log::sink()) {
  setSink(capture_);
}

ScopedCapture::~ScopedCapture() { setSink(previous_); }

}  // namespace corvane::log
