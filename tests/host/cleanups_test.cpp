// Registration of clean-up procedures: every call counts, the last one can be read back.
#include <gtest/gtest.h>

#include "host_fixture.h"

namespace {

using Cleanups = HostTest;

int32_t Abort(uint64_t) { return 0; }
int32_t Other(uint64_t) { return 0; }

TEST_F(Cleanups, EveryRegistrationCountsAndTheLastIsKept) {
  EXPECT_EQ(svsimLastCleanup(nullptr, nullptr, nullptr), 0);
  ASSERT_EQ(svSetCleanupProc(Abort, 0x00010002, 6), 0);
  ASSERT_EQ(svSetCleanupProc(Abort, 0x00010002, 6), 0);  // A duplicate is a registration too.
  ASSERT_EQ(svSetCleanupProc(Other, 0xFFFFFFFF00000001ull, 3), 0);
  EXPECT_EQ(svsimCleanupRegistrations(), 3);
  EXPECT_EQ(svsimPendingCleanups(), 3);
  SvCleanupProc procedure = nullptr;
  uint64_t argument = 0;
  int32_t mode = 0;
  ASSERT_EQ(svsimLastCleanup(&procedure, &argument, &mode), 1);
  EXPECT_EQ(procedure, &Other);
  EXPECT_EQ(argument, 0xFFFFFFFF00000001ull) << "all 64 bits of the argument are kept";
  EXPECT_EQ(mode, 3);
}

TEST_F(Cleanups, ANullProcedureIsRefused) {
  EXPECT_EQ(svSetCleanupProc(nullptr, 1, 6), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svsimCleanupRegistrations(), 0);
  EXPECT_EQ(svsimPendingCleanups(), 0);
}

TEST_F(Cleanups, ResetForgetsThemWithoutRunningThem) {
  static int runs = 0;
  runs = 0;
  ASSERT_EQ(svSetCleanupProc([](uint64_t) -> int32_t { return ++runs; }, 0, 6), 0);
  svsimReset();
  EXPECT_EQ(svsimCleanupRegistrations(), 0);
  EXPECT_EQ(svsimPendingCleanups(), 0);
  EXPECT_EQ(svsimLastCleanup(nullptr, nullptr, nullptr), 0);
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 0);
  EXPECT_EQ(runs, 0);
}

}  // namespace
