// Many threads at once on the handles of the host: the counts come out exact, an armed fault hits
// one operation only, and nothing races.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>
#include <vector>

#include "kvsvplatform.h"
#include "svsim.h"

namespace {

TEST(HostConcurrency, HandleTrafficCountsExactlyAndAnArmedFaultHitsOneOperation) {
  constexpr int kThreads = 8, kRounds = 200;
  const uint64_t live = svsimReset();
  svsimSetMoveOnResize(1);
  svsimFailAllocAt(kThreads * kRounds);
  std::atomic<int> wrong{0}, failed{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      for (int i = 0; i < kRounds; ++i) {
        SvHandle h = svNewHandleClr(8), copy = nullptr;
        for (; h == nullptr; h = svNewHandleClr(8)) ++failed;
        wrong += svStrPrintf(h, "thread %d round %d", t, i) < 0;
        wrong += svSetHandleSizeClr(h, 256) != 0;
        while (svCopyHandle(&copy, h) != 0) ++failed;  // the fault may hit the copy
        wrong += svDisposeHandle(copy) + svDisposeHandle(h) != 0;
      }
    });
  }
  for (std::thread &thread : threads) thread.join();
  EXPECT_EQ(wrong.load(), 0);
  EXPECT_EQ(failed.load(), 1);
  EXPECT_EQ(svsimInjectedFaults(), 1u);
  EXPECT_EQ(svsimAllocCount(), 2u * kThreads * kRounds);
  EXPECT_EQ(svsimResizeCount(), 2u * kThreads * kRounds) << "one by svStrPrintf, one direct";
  EXPECT_EQ(svsimFreeCount(), 2u * kThreads * kRounds);
  EXPECT_EQ(svsimLiveHandles(), live);
  svsimReset();
}

}  // namespace
