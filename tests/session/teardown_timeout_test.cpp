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

TEST_F(TeardownTimeout, GuardsAreAwaitedUpToTheLastPoll) {
  const struct {
    const char *what;
    std::atomic<uint32_t> tSessionSlot::*held;
    int freedAt;  // the poll after which the guard is let go; 0: never
    Status status;
    int polls;
  } cases[] = {
      {"guard never freed", &tSessionSlot::guard, 0, kvErrInternal, 1000},
      {"list guard never freed", &tSessionSlot::listGuard, 0, kvErrInternal, 1000},
      {"guard freed during the wait", &tSessionSlot::guard, 3, 0, 3},
      // Let go during the last sleep: too late, for no look follows it.
      {"guard freed at the last poll", &tSessionSlot::guard, 1000, kvErrInternal, 1000},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    kvsvtest::cFakeErrorLog log;
    const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
    tSessionSlot *slot = Slot(session);
    (slot->*c.held) = 1;
    gSleeps = 0;
    gLastRequestNs = 0;
    gOnSleep = [slot, &c](int n) {
      if (n == c.freedAt) (slot->*c.held) = 0;
    };
    EXPECT_EQ(Teardown(session), c.status);
    EXPECT_EQ(gSleeps.load(), c.polls);
    EXPECT_EQ(gLastRequestNs.load(), 100000000L);
    // The slot goes whether or not its guards were let go.
    EXPECT_EQ(Slot(session), nullptr);
    const auto records = log.Records();
    ASSERT_EQ(records.size(), c.status != 0 ? 1u : 0u);
    if (c.status == 0) continue;
    EXPECT_EQ(records[0].value.File(), 11u);
    EXPECT_EQ(records[0].value.Line(), 1485u);
    EXPECT_EQ(records[0].value.info, 0u);
  }
}

}  // namespace
