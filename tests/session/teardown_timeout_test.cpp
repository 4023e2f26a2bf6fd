// The wait for guards at teardown ends after 1000 polls of 100 ms. This program's nanosleep
// returns at once and counts, so the limit is reached without waiting 100 seconds.
#include <gtest/gtest.h>

#include <atomic>
#include <ctime>
#include <functional>
#include <mutex>

#include "session/teardown_slot.h"
#include "support/fake_error_log.h"
#include "support/slot_fixture.h"

namespace {

std::atomic<int> gSleeps{0};
std::atomic<long> gLastRequestNs{0};
std::function<void(int)> gOnSleep;

}  // namespace

extern "C" int nanosleep(const timespec *requested, timespec *) {
  const int n = ++gSleeps;
  gLastRequestNs = requested->tv_sec * 1000000000L + requested->tv_nsec;
  if (gOnSleep) gOnSleep(n);
  return 0;
}

namespace {

using namespace nKVSVAPI100;

class TeardownTimeout : public SlotFixture {
 protected:
  void SetUp() override {
    SlotFixture::SetUp();
    gSleeps = 0;
    gOnSleep = nullptr;
  }
  void TearDown() override {
    gOnSleep = nullptr;
    SlotFixture::TearDown();
  }
  Status Teardown(uint32_t handle) {
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    return TeardownSlot(gSessionManager, handle);
  }
};

TEST_F(TeardownTimeout, GuardNeverFreedEndsInAReportAndTheSlotIsFreedAnyway) {
  kvsvtest::cFakeErrorLog log;
  const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
  Slot(session)->guard = 1;
  EXPECT_EQ(Teardown(session), kvErrInternal);
  EXPECT_EQ(gSleeps.load(), 1000);
  EXPECT_EQ(gLastRequestNs.load(), 100000000L);
  EXPECT_EQ(Slot(session), nullptr);
  const auto records = log.Records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].value.File(), 11u);
  EXPECT_EQ(records[0].value.Line(), 1485u);
  EXPECT_EQ(records[0].value.info, 0u);
}

TEST_F(TeardownTimeout, ListGuardIsAwaitedToo) {
  kvsvtest::cFakeErrorLog log;
  const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
  Slot(session)->listGuard = 1;
  EXPECT_EQ(Teardown(session), kvErrInternal);
  EXPECT_EQ(gSleeps.load(), 1000);
}

TEST_F(TeardownTimeout, GuardFreedDuringTheWaitLetsTheTeardownFinish) {
  kvsvtest::cFakeErrorLog log;
  const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
  tSessionSlot *slot = Slot(session);
  slot->guard = 1;
  gOnSleep = [slot](int n) {
    if (n == 3) slot->guard = 0;
  };
  EXPECT_EQ(Teardown(session), 0);
  EXPECT_EQ(gSleeps.load(), 3);
  EXPECT_TRUE(log.Records().empty());
}

TEST_F(TeardownTimeout, GuardFreedOnlyAtTheLastLookStillCountsAsTooLate) {
  kvsvtest::cFakeErrorLog log;
  const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
  tSessionSlot *slot = Slot(session);
  slot->guard = 1;
  gOnSleep = [slot](int n) {
    if (n == 1000) slot->guard = 0;
  };
  EXPECT_EQ(Teardown(session), kvErrInternal);
  EXPECT_EQ(log.Records().size(), 1u);
}

}  // namespace
