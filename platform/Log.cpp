#include "platform/Log.h"

#include <syslog.h>

#include <cinttypes>
#include <cstdarg>
#include <cstdio>
#include <iostream>

namespace corvane::log {

namespace {
std::mutex& sinkMutex() {
  static std::mutex m;
  return m;
}
std::shared_ptr<Sink>& currentSink() {
  static std::shared_ptr<Sink> s = std::make_shared<SyslogSink>();
  return s;
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

SyslogSink::SyslogSink() { openlog("corvane", LOG_PID, LOG_USER); }

void SyslogSink::write(int priority, std::string_view text) {
  syslog(priority, "%.*s", static_cast<int>(text.size()), text.data());
}

bool SyslogSink::wants(int priority) const {
  // setlogmask(0) reads the mask without changing it.
  return (setlogmask(0) & LOG_MASK(LOG_PRI(priority))) != 0;
}

void StderrSink::write(int priority, std::string_view text) {
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
  std::lock_guard lock(sinkMutex());
  currentSink() = std::move(s);
}

std::shared_ptr<Sink> sink() {
  std::lock_guard lock(sinkMutex());
  return currentSink();
}

bool wants(int priority) {
  const auto s = sink();
  return s && s->wants(priority);
}

void write(int priority, std::string_view text) {
  if (auto s = sink(); s && s->wants(priority)) s->write(priority, text);
}

void printf(int priority, const char* fmt, ...) {
  const auto s = sink();
  if (!s || !s->wants(priority)) return;
  va_list args;
  va_start(args, fmt);
  std::string text = vformat(fmt, args);
  va_end(args);
  s->write(priority, text);
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
