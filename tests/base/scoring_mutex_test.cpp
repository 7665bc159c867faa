// The process lock: one shared instance, re-entrant, mutually exclusive, scope-guarded.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <thread>
#include <vector>

#include "ScoringMutex.h"
#include "ScoringMutexContainer.h"
#include "ScoringMutexLock.h"

namespace QZScoring_800 {
namespace {

// Every caller gets the same process-wide lock, and its holder may take it again.
TEST(ScoringMutexTest, ProcessLockIsSharedAndReentrant) {
  ScoringMutex* mutex = ScoringMutexContainer::GetMutex();
  ASSERT_NE(mutex, nullptr);
  EXPECT_EQ(mutex, ScoringMutexContainer::GetMutex());

  ScoringMutexLock outer(mutex);
  {
    ScoringMutexLock inner(ScoringMutexContainer::GetMutex());
    mutex->lock();
    mutex->unlock();
  }
  ScoringMutexLock nothing(nullptr);  // guards nothing, must not crash
}

// While one thread holds the lock another waits, and the guard's release lets it in.
TEST(ScoringMutexTest, GuardExcludesOtherThreadsUntilReleased) {
  ScoringMutex mutex;
  std::atomic<bool> entered{false};
  std::thread waiter;
  {
    ScoringMutexLock guard(&mutex);
    waiter = std::thread([&] {
      ScoringMutexLock inner(&mutex);
      entered = true;
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    EXPECT_FALSE(entered);
  }
  waiter.join();
  EXPECT_TRUE(entered);

  // Unguarded increments from several threads add up exactly under the lock.
  long counter = 0;
  std::vector<std::thread> workers;
  for (int t = 0; t < 4; ++t) {
    workers.emplace_back([&] {
      for (int i = 0; i < 20000; ++i) {
        ScoringMutexLock guard(ScoringMutexContainer::GetMutex());
        ++counter;
      }
    });
  }
  for (std::thread& worker : workers) worker.join();
  EXPECT_EQ(counter, 80000);
}

}  // namespace
}  // namespace QZScoring_800
