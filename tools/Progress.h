#pragma once

// A progress line on standard error while a long input is read, for people
// watching a terminal: bytes read, packets per second and the time left. It
// is drawn over itself at most ten times a second, and only when standard
// error is a terminal; nothing is written otherwise.

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>

namespace corvane::tools {

// The line itself: "  312.0 MiB of 1.00 GiB  31%  1.52 M packets/s  0:02 left"
// (without a total: bytes and rate only).
std::string progressLine(std::uint64_t bytes, std::optional<std::uint64_t> total, std::uint64_t packets,
                         double seconds);

class Progress {
 public:
  // Draws only when `enabled` (a terminal) and the input is at least `smallest` bytes, or of unknown size.
  Progress(bool enabled, std::optional<std::uint64_t> total, std::uint64_t smallest = std::uint64_t{16} << 20);
  ~Progress();
  void update(std::uint64_t bytes, std::uint64_t packets);
  // Clears the line.
  void finish();

 private:
  using Clock = std::chrono::steady_clock;
  bool enabled_;
  bool drawn_ = false;
  std::optional<std::uint64_t> total_;
  Clock::time_point started_ = Clock::now();
  Clock::time_point nextDraw_ = started_ + std::chrono::milliseconds(300);
};

}  // namespace corvane::tools
