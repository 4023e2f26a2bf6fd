// Relocatable handles: zero-filled creation, resizing in place and by moving, copies, counters and
// injected failures.
#include <gtest/gtest.h>

#include <cstring>

#include "host_fixture.h"

namespace {

using Handles = HostTest;

TEST_F(Handles, NewHandlesAreZeroedAndResizesKeepTheCommonBytesAndMoveWhenAsked) {
  const struct {
    int32_t move;
    size_t from, to;
  } cases[] = {{0, 16, 4096}, {0, 64, 8},  {0, 5000, 1}, {1, 16, 4096},
               {1, 64, 8},    {1, 32, 32}, {1, 0, 24}};
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << "move " << c.move << ": " << c.from << " -> " << c.to);
    svsimSetMoveOnResize(c.move);
    // A freed block of the same size, full of non-zero bytes, is what the next one likely reuses.
    SvHandle dirty = svNewHandleClr(c.from);
    std::memset(*dirty, 0xA5, c.from);
    svDisposeHandle(dirty);
    SvHandle h = svNewHandleClr(c.from);
    ASSERT_NE(*h, nullptr);
    EXPECT_EQ(svGetHandleSize(h), c.from);
    EXPECT_TRUE(AllBytesAre(*h, c.from, 0));
    std::memset(*h, 0x5A, c.from);
    void *before = *h;
    ASSERT_EQ(svSetHandleSizeClr(h, c.to), 0);
    EXPECT_EQ(svGetHandleSize(h), c.to);
    const size_t kept = c.from < c.to ? c.from : c.to;
    EXPECT_TRUE(AllBytesAre(*h, kept, 0x5A));
    EXPECT_TRUE(AllBytesAre(static_cast<char *>(*h) + kept, c.to - kept, 0));
    if (c.move) {
      EXPECT_NE(*h, before) << "every resize gives a new block";
    }
    svDisposeHandle(h);
  }
}

#if defined(__SANITIZE_ADDRESS__)
TEST_F(Handles, MoveModeCatchesAStaleBlockPointer) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  svsimSetMoveOnResize(1);
  SvHandle h = svNewHandleClr(16);
  volatile char *stale = static_cast<char *>(*h);
  ASSERT_EQ(svSetHandleSizeClr(h, 16), 0);
  EXPECT_DEATH((void)stale[0], "heap-use-after-free");
  svDisposeHandle(h);
}
#endif

TEST_F(Handles, CountersCountSucceededOperationsExactly) {
  svsimResetCounters();
  SvHandle a = svNewHandleClr(8);
  SvHandle b = svNewHandleClr(8);
  ASSERT_EQ(svSetHandleSizeClr(a, 100), 0);
  ASSERT_EQ(svSetHandleSizeClr(b, 10), 0);
  SvHandle copy = nullptr;
  ASSERT_EQ(svCopyHandle(&copy, a), 0);  // Makes a third handle.
  ASSERT_EQ(svCopyHandle(&copy, b), 0);  // Resizes it.
  svsimFailAll(1);
  EXPECT_EQ(svNewHandleClr(8), nullptr);
  EXPECT_NE(svSetHandleSizeClr(a, 16), 0);
  svsimFailAll(0);
  EXPECT_EQ(svsimAllocCount(), 3u);
  EXPECT_EQ(svsimResizeCount(), 3u);
  EXPECT_EQ(svsimInjectedFaults(), 2u);
  const uint64_t live = svsimLiveHandles();
  svDisposeHandle(a);
  svDisposeHandle(b);
  EXPECT_EQ(svsimFreeCount(), 2u);
  EXPECT_EQ(svsimLiveHandles(), live - 2);
  svsimResetCounters();
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount() + svsimInjectedFaults(), 0u);
  EXPECT_EQ(svsimLiveHandles(), live - 2) << "live handles are a fact, not a counter";
  svDisposeHandle(copy);
}

TEST_F(Handles, OnlyTheNthAllocationOrResizeFailsOnceAndAFailedResizeKeepsTheBlock) {
  for (bool resize : {false, true}) {
    for (uint32_t n : {1u, 2u, 5u}) {
      SCOPED_TRACE(testing::Message() << (resize ? "resize " : "allocation ") << n);
      svsimReset();
      svsimSetMoveOnResize(1);
      svsimSetResizeError(-108);
      SvHandle h = svNewHandleClr(16);
      std::memset(*h, 0x33, 16);
      (resize ? svsimFailResizeAt : svsimFailAllocAt)(n);
      for (uint32_t i = 1; i <= n + 2; ++i) {
        void *block = *h;
        SvHandle made = resize ? nullptr : svNewHandleClr(16);
        const int32_t resized = resize ? svSetHandleSizeClr(h, 16 + i) : 0;
        const bool failed = resize ? resized != 0 : made == nullptr;
        EXPECT_EQ(failed, i == n) << "operation " << i;
        if (made != nullptr) svDisposeHandle(made);
        if (resize && failed) {
          EXPECT_EQ(resized, -108) << "the resize error that was set";
          EXPECT_EQ(*h, block) << "a failed resize leaves the block where it was";
          EXPECT_EQ(svGetHandleSize(h), 16 + i - 1);
          EXPECT_TRUE(AllBytesAre(*h, 16, 0x33));
        }
      }
      EXPECT_EQ(svsimInjectedFaults(), 1u);
      svDisposeHandle(h);
    }
  }
  SvHandle h = svNewHandleClr(8);
  svsimReset();
  svsimFailResizeAt(1);
  EXPECT_EQ(svSetHandleSizeClr(h, 16), SVSIM_ERR_MEMORY) << "reset restores the default code";
  svDisposeHandle(h);
}

TEST_F(Handles, CopiesMakeOrResizeTheTargetOrLeaveItAloneAndNullsAreArgumentErrors) {
  SvHandle source = svNewHandleClr(40);
  for (int i = 0; i < 40; ++i) static_cast<unsigned char *>(*source)[i] = static_cast<uint8_t>(i);
  for (size_t targetSize : {size_t{0}, size_t{8}, size_t{400}}) {
    SvHandle target = targetSize == 0 ? nullptr : svNewHandleClr(targetSize);
    SvHandle kept = target;
    ASSERT_EQ(svCopyHandle(&target, source), 0);
    if (kept != nullptr) {
      EXPECT_EQ(target, kept) << "an existing target keeps its handle";
    }
    EXPECT_EQ(svGetHandleSize(target), 40u);
    EXPECT_EQ(std::memcmp(*target, *source, 40), 0);
    svDisposeHandle(target);
  }
  SvHandle target = nullptr;
  svsimFailAllocAt(1);
  EXPECT_EQ(svCopyHandle(&target, source), SVSIM_ERR_MEMORY);
  EXPECT_EQ(target, nullptr);
  target = svNewHandleClr(8);
  std::memset(*target, 0x11, 8);
  svsimFailResizeAt(1);
  EXPECT_EQ(svCopyHandle(&target, source), SVSIM_ERR_MEMORY);
  EXPECT_EQ(svGetHandleSize(target), 8u);
  EXPECT_TRUE(AllBytesAre(*target, 8, 0x11));
  svDisposeHandle(target);
  svDisposeHandle(source);

  char overlapping[] = "abcdef";
  svCopyBytes(overlapping, overlapping + 2, 4);
  EXPECT_STREQ(overlapping, "ababcd") << "the source comes first";
  EXPECT_EQ(svSetHandleSizeClr(nullptr, 8), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svGetHandleSize(nullptr), 0u);
  EXPECT_EQ(svDisposeHandle(nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svCopyHandle(&target, nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svCopyHandle(nullptr, nullptr), SVSIM_ERR_ARGUMENT);
}

}  // namespace
