#pragma once

// The simulator's only source of chance. The standard distributions differ
// between libraries; this mapping is the same everywhere, so a seed means the
// same scenario on every build.

#include <cstdint>
#include <random>

namespace corvane::telephonyd {

class SeededRandom {
 public:
  explicit SeededRandom(std::uint64_t seed) : engine_(seed) {}

  // Inclusive at both ends.
  int uniform(int low, int high) {
    const auto span = static_cast<std::uint64_t>(static_cast<std::int64_t>(high) - low + 1);
    return low + static_cast<int>(engine_() % span);
  }
  bool oneIn(int n) { return uniform(0, n - 1) == 0; }

 private:
  std::mt19937_64 engine_;
};

}  // namespace corvane::telephonyd
