// Relocatable handles: zero-filled creation, resizing in place and by moving, copies, counters,
// injected failures, and the stop on a handle that is not live.
#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "host_fixture.h"

namespace {

using Handles = HostTest;

bool AllBytesAre(const void *block, size_t size, unsigned char value) {
  const auto *bytes = static_cast<const unsigned char *>(block);
  for (size_t i = 0; i < size; ++i)
    if (bytes[i] != value) return false;
  return true;
}

TEST_F(Handles, NewHandlesHaveTheirSizeAndOnlyZeros) {
  for (size_t size : {size_t{0}, size_t{1}, size_t{7}, size_t{64}, size_t{5000}}) {
    // A freed block of the same size, full of non-zero bytes, is what the next one likely reuses.
    SvHandle previous = svNewHandleClr(size);
    ASSERT_NE(previous, nullptr);
    if (size != 0) std::memset(*previous, 0xA5, size);
    svDisposeHandle(previous);

    SvHandle h = svNewHandleClr(size);
    ASSERT_NE(h, nullptr) << size;
    ASSERT_NE(*h, nullptr) << size;
    EXPECT_EQ(svGetHandleSize(h), size);
    EXPECT_TRUE(AllBytesAre(*h, size, 0)) << size;
    EXPECT_EQ(svDisposeHandle(h), 0);
  }
}

struct ResizeCase {
  const char *name;
  int32_t move;
  size_t from;
  size_t to;
};

class HandleResize : public HostTest, public ::testing::WithParamInterface<ResizeCase> {};

TEST_P(HandleResize, KeepsTheCommonBytesAndZeroesGrowth) {
  const ResizeCase &c = GetParam();
  svsimSetMoveOnResize(c.move);
  SvHandle h = svNewHandleClr(c.from);
  ASSERT_NE(h, nullptr);
  std::memset(*h, 0x5A, c.from);
  ASSERT_EQ(svSetHandleSizeClr(h, c.to), 0);
  EXPECT_EQ(svGetHandleSize(h), c.to);
  const size_t kept = c.from < c.to ? c.from : c.to;
  EXPECT_TRUE(AllBytesAre(*h, kept, 0x5A));
  EXPECT_TRUE(AllBytesAre(static_cast<char *>(*h) + kept, c.to - kept, 0));
  svDisposeHandle(h);
}

INSTANTIATE_TEST_SUITE_P(
    InPlaceAndMoving, HandleResize,
    ::testing::Values(ResizeCase{"GrowInPlace", 0, 16, 4096}, ResizeCase{"ShrinkInPlace", 0, 64, 8},
                      ResizeCase{"GrowMoving", 1, 16, 4096}, ResizeCase{"ShrinkMoving", 1, 64, 8},
                      ResizeCase{"SameMoving", 1, 32, 32}, ResizeCase{"FromEmptyMoving", 1, 0, 24}),
    [](const ::testing::TestParamInfo<ResizeCase> &info) { return info.param.name; });

TEST_F(Handles, MoveModeGivesEveryResizeANewBlock) {
  svsimSetMoveOnResize(1);
  SvHandle h = svNewHandleClr(32);
  ASSERT_NE(h, nullptr);
  for (size_t size : {size_t{32}, size_t{64}, size_t{8}}) {
    void *before = *h;
    ASSERT_EQ(svSetHandleSizeClr(h, size), 0);
    EXPECT_NE(*h, before) << "resize to " << size;
  }
  svDisposeHandle(h);
}

#if defined(__SANITIZE_ADDRESS__)
TEST_F(Handles, MoveModeCatchesAStaleBlockPointer) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  svsimSetMoveOnResize(1);
  SvHandle h = svNewHandleClr(16);
  ASSERT_NE(h, nullptr);
  volatile char *stale = static_cast<char *>(*h);
  ASSERT_EQ(svSetHandleSizeClr(h, 16), 0);
  EXPECT_DEATH((void)stale[0], "heap-use-after-free");
  svDisposeHandle(h);
}
#endif

TEST_F(Handles, CountersCountEachKindOfOperationExactly) {
  svsimResetCounters();
  SvHandle a = svNewHandleClr(8);
  SvHandle b = svNewHandleClr(8);
  ASSERT_EQ(svSetHandleSizeClr(a, 100), 0);
  ASSERT_EQ(svSetHandleSizeClr(a, 10), 0);
  ASSERT_EQ(svSetHandleSizeClr(b, 10), 0);
  SvHandle copy = nullptr;
  ASSERT_EQ(svCopyHandle(&copy, a), 0);  // Makes a third handle.
  ASSERT_EQ(svCopyHandle(&copy, b), 0);  // Resizes it.
  EXPECT_EQ(svsimAllocCount(), 3u);
  EXPECT_EQ(svsimResizeCount(), 4u);
  EXPECT_EQ(svsimFreeCount(), 0u);
  const uint64_t live = svsimLiveHandles();
  svDisposeHandle(a);
  svDisposeHandle(b);
  EXPECT_EQ(svsimFreeCount(), 2u);
  EXPECT_EQ(svsimLiveHandles(), live - 2);
  svsimResetCounters();
  EXPECT_EQ(svsimAllocCount(), 0u);
  EXPECT_EQ(svsimResizeCount(), 0u);
  EXPECT_EQ(svsimFreeCount(), 0u);
  EXPECT_EQ(svsimLiveHandles(), live - 2) << "live handles are a fact, not a counter";
  svDisposeHandle(copy);
}

TEST_F(Handles, FailedOperationsAreNotCounted) {
  svsimResetCounters();
  svsimFailAll(1);
  EXPECT_EQ(svNewHandleClr(8), nullptr);
  svsimFailAll(0);
  SvHandle h = svNewHandleClr(8);
  svsimFailResizeAt(1);
  EXPECT_NE(svSetHandleSizeClr(h, 16), 0);
  EXPECT_EQ(svsimAllocCount(), 1u);
  EXPECT_EQ(svsimResizeCount(), 0u);
  EXPECT_EQ(svsimInjectedFaults(), 2u);
  svDisposeHandle(h);
}

TEST_F(Handles, OnlyTheNthAllocationFails) {
  for (uint32_t n : {1u, 2u, 5u}) {
    svsimReset();
    svsimFailAllocAt(n);
    std::vector<SvHandle> made;
    for (uint32_t i = 1; i <= n + 2; ++i) {
      SvHandle h = svNewHandleClr(16);
      EXPECT_EQ(h == nullptr, i == n) << "allocation " << i << " of fault at " << n;
      if (h != nullptr) made.push_back(h);
    }
    EXPECT_EQ(svsimInjectedFaults(), 1u);
    for (SvHandle h : made) svDisposeHandle(h);
  }
}

TEST_F(Handles, TheNthResizeFailsAndLeavesTheBlockAsItWas) {
  svsimSetMoveOnResize(1);
  SvHandle h = svNewHandleClr(16);
  ASSERT_NE(h, nullptr);
  std::memset(*h, 0x33, 16);
  svsimFailResizeAt(2);
  ASSERT_EQ(svSetHandleSizeClr(h, 24), 0);
  void *block = *h;
  EXPECT_EQ(svSetHandleSizeClr(h, 4096), SVSIM_ERR_MEMORY);
  EXPECT_EQ(*h, block);
  EXPECT_EQ(svGetHandleSize(h), 24u);
  EXPECT_TRUE(AllBytesAre(*h, 16, 0x33));
  EXPECT_EQ(svSetHandleSizeClr(h, 4096), 0) << "the fault is spent";
  svDisposeHandle(h);
}

TEST_F(Handles, FailAllRefusesEverythingUntilCleared) {
  SvHandle h = svNewHandleClr(8);
  ASSERT_NE(h, nullptr);
  svsimFailAll(1);
  for (int i = 0; i < 3; ++i) {
    EXPECT_EQ(svNewHandleClr(8), nullptr);
    EXPECT_EQ(svSetHandleSizeClr(h, 64), SVSIM_ERR_MEMORY);
  }
  EXPECT_EQ(svGetHandleSize(h), 8u);
  svsimFailAll(0);
  EXPECT_EQ(svSetHandleSizeClr(h, 64), 0);
  SvHandle other = svNewHandleClr(8);
  EXPECT_NE(other, nullptr);
  svDisposeHandle(other);
  svDisposeHandle(h);
}

TEST_F(Handles, TheResizeErrorCodeCanBeNegative) {
  SvHandle h = svNewHandleClr(8);
  svsimSetResizeError(-108);
  svsimFailResizeAt(1);
  EXPECT_EQ(svSetHandleSizeClr(h, 64), -108);
  svsimReset();
  svsimFailResizeAt(1);
  EXPECT_EQ(svSetHandleSizeClr(h, 64), SVSIM_ERR_MEMORY) << "reset restores the default code";
  svDisposeHandle(h);
}

TEST_F(Handles, CopyHandleMakesOrResizesTheTarget) {
  SvHandle source = svNewHandleClr(40);
  for (int i = 0; i < 40; ++i)
    static_cast<unsigned char *>(*source)[i] = static_cast<unsigned char>(i);
  for (size_t targetSize : {size_t{0}, size_t{8}, size_t{400}}) {
    SvHandle target = targetSize == 0 ? nullptr : svNewHandleClr(targetSize);
    SvHandle kept = target;
    ASSERT_EQ(svCopyHandle(&target, source), 0);
    ASSERT_NE(target, nullptr);
    if (kept != nullptr) {
      EXPECT_EQ(target, kept) << "an existing target keeps its handle";
    }
    EXPECT_EQ(svGetHandleSize(target), 40u);
    EXPECT_EQ(std::memcmp(*target, *source, 40), 0);
    svDisposeHandle(target);
  }
  svDisposeHandle(source);
}

TEST_F(Handles, CopyHandleReportsAFailedTargetAndLeavesItAlone) {
  SvHandle source = svNewHandleClr(40);
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
}

TEST_F(Handles, CopyBytesTakesTheSourceFirst) {
  const char source[] = "payload";
  char destination[8] = {0};
  svCopyBytes(source, destination, sizeof source);
  EXPECT_STREQ(destination, "payload");
  char overlapping[] = "abcdef";
  svCopyBytes(overlapping, overlapping + 2, 4);
  EXPECT_STREQ(overlapping, "ababcd");
}

TEST_F(Handles, NullHandlesAreArgumentErrors) {
  EXPECT_EQ(svSetHandleSizeClr(nullptr, 8), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svGetHandleSize(nullptr), 0u);
  EXPECT_EQ(svDisposeHandle(nullptr), SVSIM_ERR_ARGUMENT);
  SvHandle target = nullptr;
  EXPECT_EQ(svCopyHandle(&target, nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svCopyHandle(nullptr, nullptr), SVSIM_ERR_ARGUMENT);
}

using HandlesDeathTest = HostTest;

TEST_F(HandlesDeathTest, HandlesThatAreNotLiveStopTheProcess) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  SvHandle h = svNewHandleClr(8);
  svDisposeHandle(h);
  EXPECT_DEATH(svDisposeHandle(h), "svDisposeHandle.*not a live handle");
  EXPECT_DEATH(svSetHandleSizeClr(h, 16), "svSetHandleSizeClr.*not a live handle");
  void *foreign[1] = {nullptr};
  EXPECT_DEATH(svGetHandleSize(foreign), "svGetHandleSize.*not a live handle");
  SvHandle source = svNewHandleClr(8);
  SvHandle target = h;
  EXPECT_DEATH(svCopyHandle(&target, source), "svCopyHandle.*not a live handle");
  svDisposeHandle(source);
}

TEST_F(HandlesDeathTest, AnOverwrittenMasterPointerStopsTheProcess) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  SvHandle h = svNewHandleClr(8);
  void *block = *h;
  char elsewhere[8] = {0};
  for (void *wrong : {static_cast<void *>(nullptr), static_cast<void *>(elsewhere)}) {
    *h = wrong;
    EXPECT_DEATH(svGetHandleSize(h), "master pointer overwritten");
  }
  *h = block;
  svDisposeHandle(h);
}

}  // namespace
