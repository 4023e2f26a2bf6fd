// A second caller never waits on a session in use: it fails at once, and the first call finishes.
#include <gtest/gtest.h>

#include <atomic>
#include <set>
#include <thread>
#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

class SignalReadConcurrency : public SlotFixture {};

TEST_F(SignalReadConcurrency, SecondCallerFailsWhileTheFirstIsBlockedInTheDriver) {
  const uint32_t session = MakeSession("A,B", kvMode_SignalInSinglePoint);
  const double v[] = {10.5, 20.5};
  ASSERT_EQ(kvsimSetSignalValues(session, v, 2), 2);
  ASSERT_EQ(kvsimHold("kvReadSignalSinglePoint"), 0);

  SvHandle first = nullptr;
  kvsvStatus firstStatus = 1;
  std::thread blocked([&] { firstStatus = kvsvReadSignalSinglePoint(session, &first); });
  ASSERT_EQ(kvsimWaitParked("kvReadSignalSinglePoint", 1), 1);

  SvHandle second = nullptr;
  EXPECT_EQ(kvsvReadSignalSinglePoint(session, &second), kvErrSessionBusy);
  EXPECT_EQ(second, nullptr);
  EXPECT_EQ(Slot(session)->guard.load(), 1u);

  ASSERT_EQ(kvsimRelease("kvReadSignalSinglePoint"), 0);
  blocked.join();
  EXPECT_EQ(firstStatus, 0);
  double seen[2] = {0, 0};
  EXPECT_EQ(svsimReadDoubleArray(first, seen, 2), 2);
  EXPECT_EQ(seen[1], 20.5);
  EXPECT_EQ(Slot(session)->guard.load(), 0u);
  svDisposeHandle(first);
}

TEST_F(SignalReadConcurrency, RacingReadersGetValuesOrBusyAndNothingElse) {
  const uint32_t session = MakeSession("A,B,C,D", kvMode_SignalInSinglePoint);
  const double v[] = {1, 2, 3, 4};
  ASSERT_EQ(kvsimSetSignalValues(session, v, 4), 4);
  constexpr int kThreads = 4;
  constexpr int kRounds = 300;
  std::atomic<int> successes{0};
  std::atomic<int> unexpected{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&] {
      SvHandle values = nullptr;
      for (int i = 0; i < kRounds; ++i) {
        const kvsvStatus s = kvsvReadSignalSinglePoint(session, &values);
        if (s == 0) {
          ++successes;
          double seen[4] = {0, 0, 0, 0};
          if (svsimReadDoubleArray(values, seen, 4) != 4 || seen[3] != 4) ++unexpected;
        } else if (s != kvErrSessionBusy) {
          ++unexpected;
        }
      }
      svDisposeHandle(values);
    });
  }
  for (std::thread &t : threads) t.join();
  EXPECT_EQ(unexpected.load(), 0);
  EXPECT_GT(successes.load(), 0);
  EXPECT_EQ(Slot(session)->guard.load(), 0u);
}

}  // namespace
