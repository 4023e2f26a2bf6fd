// What the library's tests lean on the host stand-in for: the mode in which every resize moves a
// block, so that a stale block pointer shows; exact counts of handle operations and live paths;
// faults that hit exactly the operation asked for; and a stop of the process on dead host data or
// a handle the host never made.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "kvsvplatform.h"
#include "svsim.h"

namespace {

// Each test starts from a reset stand-in and gives back every handle and path it made.
class Host : public ::testing::Test {
 protected:
  void SetUp() override {
    handles_ = svsimReset();
    paths_ = svsimLivePaths();
  }
  void TearDown() override {
    svsimReset();
    EXPECT_EQ(svsimLiveHandles(), handles_) << "handles left alive";
    EXPECT_EQ(svsimLivePaths(), paths_) << "paths left alive";
  }
  uint64_t handles_ = 0, paths_ = 0;
};
using HostDeathTest = Host;

TEST_F(Host, ResizesKeepTheCommonBytesZeroTheGrowthAndMoveEveryBlockWhenAsked) {
  const struct {
    int32_t move;
    size_t from, to;
  } cases[] = {{0, 16, 4096}, {0, 64, 8}, {1, 16, 4096}, {1, 64, 8}, {1, 32, 32}, {1, 0, 24}};
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << "move " << c.move << ": " << c.from << " -> " << c.to);
    svsimSetMoveOnResize(c.move);
    SvHandle h = svNewHandleClr(c.from);
    std::memset(*h, 'Z', c.from);
    void *before = *h;
    ASSERT_EQ(svSetHandleSizeClr(h, c.to), 0);
    EXPECT_EQ(svGetHandleSize(h), c.to);
    const size_t kept = std::min(c.from, c.to);
    EXPECT_EQ(std::string(static_cast<char *>(*h), c.to),
              std::string(kept, 'Z') + std::string(c.to - kept, '\0'));
    EXPECT_TRUE(!c.move || *h != before) << "every resize gives a new block";
    svDisposeHandle(h);
  }
}

TEST_F(Host, CountersCountWhatSucceededAndOnlyTheNthOperationFails) {
  svsimResetCounters();
  SvHandle a = svNewHandleClr(8), copy = nullptr;
  ASSERT_EQ(svCopyHandle(&copy, a), 0);  // makes a handle
  ASSERT_EQ(svSetHandleSizeClr(a, 100), 0);
  ASSERT_EQ(svCopyHandle(&copy, a), 0);  // resizes it
  svsimFailAllocAt(2);
  SvHandle made[] = {svNewHandleClr(8), svNewHandleClr(8), svNewHandleClr(8)};
  EXPECT_TRUE(made[0] != nullptr && made[1] == nullptr && made[2] != nullptr);
  svsimSetResizeError(-108);
  svsimFailResizeAt(2);
  EXPECT_EQ(svSetHandleSizeClr(a, 16), 0);
  void *block = *a;  // a resize that succeeds may move the block
  EXPECT_EQ(svSetHandleSizeClr(a, 24), -108);
  EXPECT_EQ(*a, block) << "a failed resize leaves the block";
  EXPECT_EQ(svGetHandleSize(a), 16u);
  EXPECT_EQ(svGetHandleSize(nullptr), 0u);
  EXPECT_EQ(svSetHandleSizeClr(a, 32), 0);
  EXPECT_EQ(svsimInjectedFaults(), 2u);
  EXPECT_EQ(svsimHandleSizeQueries(), 1u) << "only a program's queries of a handle count";
  EXPECT_EQ(svsimAllocCount(), 4u);
  EXPECT_EQ(svsimResizeCount(), 4u);
  const uint64_t live = svsimLiveHandles();
  for (SvHandle h : {a, copy, made[0], made[2]}) svDisposeHandle(h);
  EXPECT_EQ(svsimFreeCount(), 4u);
  EXPECT_EQ(svsimLiveHandles(), live - 4);
  SvPath path = svEmptyPath(0);
  EXPECT_EQ(svsimLivePaths(), paths_ + 1);
  svDestroyPath(path);
}

// A handle that was disposed of, or with `overwrite` a live one whose block pointer was written
// over.
SvHandle Broken(bool overwrite) {
  SvHandle h = svNewHandleClr(8);
  if (overwrite) {
    *h = nullptr;
  } else {
    svDisposeHandle(h);
  }
  return h;
}

TEST_F(HostDeathTest, DeadHostDataStopsTheProcessWithTheOperationNamed) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_DEATH(svDisposeHandle(Broken(false)), "svDisposeHandle.*not a live handle");
  EXPECT_DEATH(svGetHandleSize(Broken(true)), "master pointer overwritten");
  void *local = nullptr;
  EXPECT_DEATH(svGetHandleSize(&local), "svGetHandleSize.*not a live handle");
  // Inside a live handle's master record, but not its start.
  EXPECT_DEATH(svGetHandleSize(reinterpret_cast<SvHandle>(reinterpret_cast<char *>(
                   svNewHandleClr(8)) + sizeof(void *))),
               "svGetHandleSize.*not a live handle");
}

}  // namespace
