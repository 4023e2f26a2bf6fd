// A reset puts every control back to its default while it leaves live host data alone.
#include <gtest/gtest.h>

#include "host_fixture.h"

namespace {

using Reset = HostTest;

int gRuns = 0;
int32_t CountRun(uint64_t) { return ++gRuns; }

TEST_F(Reset, EveryControlGoesBackToItsDefault) {
  SvHandle survivor = svNewHandleClr(8);
  const uint64_t live = svsimLiveHandles();
  SvRefnum cookie = 0;
  ASSERT_EQ(Register(ReferenceArgs(), &cookie), 0);
  svsimSetRefStatus(-3);
  gRuns = 0;
  ASSERT_EQ(svSetCleanupProc(CountRun, 0, 6), 0);
  svsimFailAllocAt(1);
  EXPECT_EQ(svNewHandleClr(8), nullptr);
  svsimFailResizeAt(3);
  svsimFailAll(1);
  svsimSetResizeError(-1);
  svsimSetMoveOnResize(1);
  svsimSetRunMode(1, 1, 1);
  svsimSetAppPath("/elsewhere");

  EXPECT_EQ(svsimReset(), live);

  EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
  EXPECT_EQ(svsimInjectedFaults(), 0u);
  EXPECT_EQ(svsimLiveHandles(), live) << "live handles are not freed";
  EXPECT_EQ(svGetHandleSize(survivor), 8u);
  for (int i = 0; i < 4; ++i) ASSERT_EQ(svSetHandleSizeClr(survivor, 16 + i), 0) << i;
  SvHandle made = svNewHandleClr(8);
  EXPECT_NE(made, nullptr);
  svsimFailResizeAt(1);
  EXPECT_EQ(svSetHandleSizeClr(survivor, 64), SVSIM_ERR_MEMORY);
  EXPECT_EQ(svIsBoundApp(0) | svIsRunTime(0) | svIsFullFeatureRunTime(0), 0);
  SvPath path = svEmptyPath(0);
  ASSERT_EQ(svAppPath(path), 0);
  SvHandle text = nullptr;
  ASSERT_EQ(svPathToString(path, &text), 0);
  EXPECT_NE(Text(text), "/elsewhere");
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(Register(ReferenceArgs(), &cookie), 0) << "the forced status is gone";
  EXPECT_EQ(svsimPendingCleanups(), 0);
  EXPECT_EQ(svsimCleanupRegistrations(), 0);
  EXPECT_EQ(svsimLastCleanup(nullptr, nullptr, nullptr), 0);
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 0);
  EXPECT_EQ(gRuns, 0) << "forgotten, not run";

  svDestroyPath(path);
  for (SvHandle h : {survivor, made, text}) svDisposeHandle(h);
}

}  // namespace
