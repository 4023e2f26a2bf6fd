// The core's locks across threads: reports made before the log exists, where one thread builds
// the log while the others wait in short sleeps, and the managers' recursive mutex.
#include <gtest/gtest.h>

#include <thread>
#include <vector>

#include "core/internal_error.h"
#include "core/recursive_mutex.h"
#include "support/fake_error_log.h"
#include "support/sleep_recorder.h"

namespace {

using namespace nKVSVAPI100;

TEST(ReportBeforeTheLogExists, OneThreadBuildsWhileTheOthersSleepInMillisecondSteps) {
  constexpr uint32_t kThreads = 4;
  constexpr long kRemainderNs = 400000;
  kvsvtest::cFakeErrorLog log;
  // The build lasts until another thread has slept twice: once cut short, once for the rest.
  kvsvtest::InterruptNextSleep(kRemainderNs);
  log.SetBuildHook([] { kvsvtest::WaitForSleeps(2); });
  std::vector<std::thread> threads;
  for (uint32_t i = 0; i < kThreads; ++i)
    threads.emplace_back([i] { EXPECT_EQ(ReportInternalError(13, 9, i, 0), kvErrInternal); });
  for (auto &thread : threads) thread.join();

  EXPECT_EQ(log.Builds(), 1);
  uint32_t lines = 0;
  for (const auto &record : log.Records()) lines |= 1u << record.value.Line();
  EXPECT_EQ(lines, (1u << kThreads) - 1) << "every report is written once the log is there";
  // The interrupted sleep resumes once with what was left of it; every other sleep is 1 ms.
  size_t resumed = 0, whole = 0;
  for (const timespec &sleep : kvsvtest::Sleeps()) {
    resumed += sleep.tv_sec == 0 && sleep.tv_nsec == kRemainderNs;
    whole += sleep.tv_sec == 0 && sleep.tv_nsec == 1000000;
  }
  EXPECT_EQ(resumed, 1u);
  EXPECT_EQ(whole, kvsvtest::Sleeps().size() - 1);
}

TEST(RecursiveMutex, LocksAgainInItsOwnerAndKeepsOtherThreadsOut) {
  tStatusBlock owner;
  cRecursiveMutex mutex(owner);
  ASSERT_TRUE(mutex.Valid());
  EXPECT_EQ(owner.code, 0);
  long total = 0;  // a plain counter: only the mutex keeps the increments whole
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&] {
      for (int i = 0; i < 20000; ++i) {
        std::lock_guard<cRecursiveMutex> outer(mutex);
        std::lock_guard<cRecursiveMutex> inner(mutex);
        ++total;
      }
    });
  }
  for (auto &thread : threads) thread.join();
  EXPECT_EQ(total, 4 * 20000);
}

}  // namespace
