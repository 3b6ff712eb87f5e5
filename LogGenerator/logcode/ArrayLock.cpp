#include "LogGenerator/logcode/ArrayLock.h"

namespace corvane {

namespace {
struct LockState {
  std::recursive_mutex lock;
  std::uint8_t depth = 0;
};

LockState& state() {
  static LockState* s = new LockState();  // lives for the whole process, also during static destruction
  return *s;
}
}  // namespace

void ArrayLock::initialize() { (void)state(); }

void ArrayLock::lockArray() {
  LockState& s = state();
  s.lock.lock();
  ++s.depth;
}

void ArrayLock::unlockArray() {
  LockState& s = state();
  --s.depth;
  if (s.depth == 0) s.lock.unlock();
}

std::uint8_t ArrayLock::depth() { return state().depth; }

std::recursive_mutex& ArrayLock::mutex() { return state().lock; }

}  // namespace corvane
