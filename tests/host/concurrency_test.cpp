// Many threads at once on every part of the host: the counts come out exact and nothing races.
#include <gtest/gtest.h>

#include <atomic>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "host_fixture.h"
#include "reference_args.h"

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

TEST_F(Concurrency, HandleTrafficFromManyThreadsCountsExactly) {
  svsimSetMoveOnResize(1);
  svsimResetCounters();
  const uint64_t live = svsimLiveHandles();
  std::atomic<int> wrong{0};
  RunThreads([&](int t) {
    for (int i = 0; i < kRounds; ++i) {
      SvHandle h = svNewHandleClr(8);
      if (h == nullptr) {
        ++wrong;
        continue;
      }
      if (svStrPrintf(h, "thread %d round %d", t, i) < 0) ++wrong;
      if (svSetHandleSizeClr(h, 256) != 0) ++wrong;
      if (Text(h) != "thread " + std::to_string(t) + " round " + std::to_string(i)) ++wrong;
      SvHandle copy = nullptr;
      if (svCopyHandle(&copy, h) != 0) ++wrong;
      svDisposeHandle(copy);
      svDisposeHandle(h);
    }
  });
  EXPECT_EQ(wrong.load(), 0);
  const uint64_t n = kThreads * kRounds;
  EXPECT_EQ(svsimAllocCount(), 2 * n);
  EXPECT_EQ(svsimResizeCount(), 2 * n) << "one by svStrPrintf, one direct, per round";
  EXPECT_EQ(svsimFreeCount(), 2 * n);
  EXPECT_EQ(svsimLiveHandles(), live);
}

TEST_F(Concurrency, AnArmedFaultHitsExactlyOneAllocation) {
  svsimFailAllocAt(kThreads * kRounds / 2);
  std::atomic<int> failed{0};
  RunThreads([&](int) {
    for (int i = 0; i < kRounds; ++i) {
      SvHandle h = svNewHandleClr(16);
      if (h == nullptr)
        ++failed;
      else
        svDisposeHandle(h);
    }
  });
  EXPECT_EQ(failed.load(), 1);
  EXPECT_EQ(svsimInjectedFaults(), 1u);
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
