// Many threads at once on every part of the host: the counts come out exact and nothing races.
#include <gtest/gtest.h>

#include <atomic>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "host_fixture.h"

namespace {

using Concurrency = HostTest;

constexpr int kThreads = 8;
constexpr int kRounds = 200;

template <typename Body>
void RunThreads(Body body) {
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) threads.emplace_back(body, t);
  for (std::thread &thread : threads) thread.join();
}

TEST_F(Concurrency, HandleTrafficCountsExactlyAndAnArmedFaultHitsOneAllocation) {
  svsimSetMoveOnResize(1);
  svsimResetCounters();
  const uint64_t live = svsimLiveHandles();
  const uint64_t n = kThreads * kRounds;
  svsimFailAllocAt(static_cast<uint32_t>(n));
  std::atomic<int> wrong{0}, failed{0};
  RunThreads([&](int t) {
    for (int i = 0; i < kRounds; ++i) {
      SvHandle h = svNewHandleClr(8);
      if (h == nullptr) {
        ++failed;
        h = svNewHandleClr(8);
      }
      const std::string expected = "thread " + std::to_string(t) + " round " + std::to_string(i);
      if (svStrPrintf(h, "thread %d round %d", t, i) < 0) ++wrong;
      if (svSetHandleSizeClr(h, 256) != 0) ++wrong;
      if (Text(h) != expected) ++wrong;
      // The armed fault may hit the copy's allocation instead.
      SvHandle copy = nullptr;
      int32_t copied = svCopyHandle(&copy, h);
      if (copied == SVSIM_ERR_MEMORY) {
        ++failed;
        copied = svCopyHandle(&copy, h);
      }
      if (copied != 0) ++wrong;
      svDisposeHandle(copy);
      svDisposeHandle(h);
    }
  });
  EXPECT_EQ(wrong.load(), 0);
  EXPECT_EQ(failed.load(), 1);
  EXPECT_EQ(svsimInjectedFaults(), 1u);
  EXPECT_EQ(svsimAllocCount(), 2 * n);
  EXPECT_EQ(svsimResizeCount(), 2 * n) << "one by svStrPrintf, one direct, per round";
  EXPECT_EQ(svsimFreeCount(), 2 * n);
  EXPECT_EQ(svsimLiveHandles(), live);
}

TEST_F(Concurrency, ReferencesVariantsPathsAndCleanupsFromManyThreads) {
  std::vector<std::vector<SvRefnum>> cookies(kThreads);
  std::atomic<int> wrong{0};
  RunThreads([&](int t) {
    SvHandle array = svNewHandleClr(8 + kRounds * 8);
    const unsigned char name[] = {0x01, 'n'};
    for (int i = 0; i < kRounds; ++i) {
      SvRefnum cookie = 0;
      if (Register(ReferenceArgs(), &cookie) != 0) ++wrong;
      cookies[t].push_back(cookie);
      SvHandle text = svsimMakeString("element");
      if (svVariantSetStringAttr(static_cast<char *>(*array) + 8 + i * 8, name, text) != 0) ++wrong;
      SvPath path = nullptr;
      if (svStringToPath(text, &path) != 0) ++wrong;
      svDestroyPath(path);
      svDisposeHandle(text);
      if (svSetCleanupProc([](uint64_t) -> int32_t { return 0; }, i, 6) != 0) ++wrong;
    }
    *static_cast<int32_t *>(*array) = kRounds;
    svsimDisposeVariantArray(array);
  });
  EXPECT_EQ(wrong.load(), 0);
  std::set<SvRefnum> unique;
  for (const auto &list : cookies) unique.insert(list.begin(), list.end());
  EXPECT_EQ(unique.size(), static_cast<size_t>(kThreads * kRounds));
  EXPECT_EQ(svsimRefCount(), kThreads * kRounds);
  EXPECT_EQ(svsimCleanupRegistrations(), kThreads * kRounds);
}

}  // namespace
