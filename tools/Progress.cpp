#include "Progress.h"

#include <cstdio>

namespace corvane::tools {

namespace {

std::string bytesText(std::uint64_t bytes) {
  char text[32];
  const double b = static_cast<double>(bytes);
  if (bytes >= (std::uint64_t{1} << 30)) std::snprintf(text, sizeof text, "%.2f GiB", b / (1 << 30));
  else if (bytes >= (std::uint64_t{1} << 20)) std::snprintf(text, sizeof text, "%.1f MiB", b / (1 << 20));
  else std::snprintf(text, sizeof text, "%.0f KiB", b / 1024);
  return text;
}

std::string rateText(double perSecond) {
  char text[32];
  if (perSecond >= 1e6) std::snprintf(text, sizeof text, "%.2f M packets/s", perSecond / 1e6);
  else if (perSecond >= 1e3) std::snprintf(text, sizeof text, "%.1f k packets/s", perSecond / 1e3);
  else std::snprintf(text, sizeof text, "%.0f packets/s", perSecond);
  return text;
}

}  // namespace

std::string progressLine(std::uint64_t bytes, std::optional<std::uint64_t> total, std::uint64_t packets,
                         double seconds) {
  std::string line = "  " + bytesText(bytes);
  if (total && *total > 0) {
    char percent[16];
    std::snprintf(percent, sizeof percent, "  %3.0f%%", 100.0 * static_cast<double>(bytes) / static_cast<double>(*total));
    line += " of " + bytesText(*total) + percent;
  }
  if (seconds > 0) line += "  " + rateText(static_cast<double>(packets) / seconds);
  if (total && bytes > 0 && seconds > 0 && bytes <= *total) {
    const auto left = static_cast<long>(seconds * static_cast<double>(*total - bytes) / static_cast<double>(bytes) + 0.5);
    char text[32];
    std::snprintf(text, sizeof text, "  %ld:%02ld left", left / 60, left % 60);
    line += text;
  }
  return line;
}

Progress::Progress(bool enabled, std::optional<std::uint64_t> total, std::uint64_t smallest)
    : enabled_(enabled && (!total || *total >= smallest)), total_(total) {}

Progress::~Progress() { finish(); }

void Progress::update(std::uint64_t bytes, std::uint64_t packets) {
  if (!enabled_) return;
  const auto now = Clock::now();
  if (now < nextDraw_) return;
  nextDraw_ = now + std::chrono::milliseconds(100);
  const double seconds = std::chrono::duration<double>(now - started_).count();
  // "\r", the line, and "erase to the end of the line".
  std::fprintf(stderr, "\r%s\033[K", progressLine(bytes, total_, packets, seconds).c_str());
  std::fflush(stderr);
  drawn_ = true;
}

void Progress::finish() {
  if (!drawn_) return;
  std::fprintf(stderr, "\r\033[K");
  std::fflush(stderr);
  drawn_ = false;
}

}  // namespace corvane::tools
