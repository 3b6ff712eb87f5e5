#pragma once

// The one process-wide lock over the arrays of the display: section objects hold
// it while they clear or replace a list, the display-tree builder while it walks
// one. It is a recursive lock with an 8-bit depth counter, and it behaves
// exactly so: every lockArray takes the lock, but unlockArray releases it only
// when the counter has come back to 0. Nested use therefore leaves the lock
// held once more by the same thread than it was released; the counter wraps at 256.

#include <cstdint>
#include <mutex>

namespace corvane {

class ArrayLock {
 public:
  ArrayLock() = delete;

  // Creates the lock and zeroes the counter; runs once, on first use.
  static void initialize();
  static void lockArray();
  static void unlockArray();

  // For tests and diagnostics.
  static std::uint8_t depth();
  static std::recursive_mutex& mutex();
};

}  // namespace corvane
