#include "LogGenerator/logcode/ArrayLock.h"

#include <gtest/gtest.h>

#include <future>

namespace corvane {
namespace {

// Whether another thread can take the lock right now.
bool freeForOtherThreads() {
  return std::async(std::launch::async, [] {
           auto& m = ArrayLock::mutex();
           if (!m.try_lock()) return false;
           m.unlock();
           return true;
         }).get();
}

TEST(ArrayLock, OneLockAndOneUnlockLeaveTheLockFreeAndTheCounterAtZero) {
  ArrayLock::lockArray();
  EXPECT_EQ(ArrayLock::depth(), 1);
  EXPECT_FALSE(freeForOtherThreads());
  ArrayLock::unlockArray();
  EXPECT_EQ(ArrayLock::depth(), 0);
  EXPECT_TRUE(freeForOtherThreads());
}

TEST(ArrayLock, TwoLocksAndTwoUnlocksLeaveTheRecursiveLockHeldOnce) {
  ArrayLock::lockArray();
  ArrayLock::lockArray();
  EXPECT_EQ(ArrayLock::depth(), 2);
  ArrayLock::unlockArray();
  EXPECT_EQ(ArrayLock::depth(), 1);
  EXPECT_FALSE(freeForOtherThreads());
  ArrayLock::unlockArray();
  EXPECT_EQ(ArrayLock::depth(), 0);
  EXPECT_FALSE(freeForOtherThreads()) << "nested use leaves the lock held once by this thread";
  ArrayLock::mutex().unlock();  // give back the extra hold, so later tests start clean
  EXPECT_TRUE(freeForOtherThreads());
}

TEST(ArrayLock, TheCounterIsEightBitsAndWraps) {
  for (int i = 0; i < 256; ++i) ArrayLock::lockArray();
  EXPECT_EQ(ArrayLock::depth(), 0);
  // The counter wrapped to 0; one unlock takes it to 255 and releases nothing.
  ArrayLock::unlockArray();
  EXPECT_EQ(ArrayLock::depth(), 255);
  for (int i = 0; i < 255; ++i) ArrayLock::unlockArray();
  EXPECT_EQ(ArrayLock::depth(), 0);
  // 256 takes and one real release: 255 holds remain.
  for (int i = 0; i < 255; ++i) ArrayLock::mutex().unlock();
  EXPECT_TRUE(freeForOtherThreads());
}

}  // namespace
}  // namespace corvane
