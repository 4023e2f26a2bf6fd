// kvWait: a real wait that ends on its condition, on its time limit, or when another thread
// clears the session.
#include <chrono>
#include <future>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorWait = KvorTest;

struct WaitResult {
  int32_t status;
  uint32_t value;
};

std::future<WaitResult> WaitAsync(uint32_t session, uint32_t condition, double limit) {
  return std::async(std::launch::async, [=] {
    uint32_t value = 0xEEEEEEEE;
    const int32_t status = kvWait(session, condition, 0, &value, limit);
    return WaitResult{status, value};
  });
}

TEST_F(KvorWait, AWaitThatRunsOutHasReallyWaited) {
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
  uint32_t value = 0xEEEEEEEE;
  const auto start = std::chrono::steady_clock::now();
  EXPECT_EQ(kvWait(session, kvsimConditionIntfCommunicating, 0, &value, 0.05), kvsimErrTimeout);
  EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(50));
  EXPECT_EQ(value, 0xEEEEEEEEu) << "no value on a timeout";
}

TEST_F(KvorWait, ARaisedConditionEndsEveryWaitOnItsSessionAtOnceUntilLowered) {
  const uint32_t session = Create("LIN1", kvMode_FrameInStream);
  const uint32_t other = Create("LIN2", kvMode_FrameInStream);
  ASSERT_EQ(kvsimRaiseCondition(session, kvsimConditionIntfRemoteWakeup, 77), 0);
  uint32_t value = 0;
  EXPECT_EQ(kvWait(session, kvsimConditionIntfRemoteWakeup, 0, nullptr, -1.0), 0)
      << "the value is optional";
  EXPECT_EQ(kvWait(session, kvsimConditionIntfRemoteWakeup, 0, &value, -1.0), 0)
      << "a raised condition stays raised";
  EXPECT_EQ(value, 77u);
  EXPECT_EQ(kvWait(session, kvsimConditionTransmitComplete, 0, &value, 0.0), kvsimErrTimeout)
      << "another condition is not raised";
  EXPECT_EQ(kvWait(other, kvsimConditionIntfRemoteWakeup, 0, &value, 0.0), kvsimErrTimeout)
      << "conditions belong to one session";
  ASSERT_EQ(kvsimLowerCondition(session, kvsimConditionIntfRemoteWakeup), 0);
  EXPECT_EQ(kvWait(session, kvsimConditionIntfRemoteWakeup, 0, &value, 0.0), kvsimErrTimeout);

  auto waiting = WaitAsync(session, kvsimConditionTransmitComplete, -1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 1), 1);
  ASSERT_EQ(kvsimRaiseCondition(session, kvsimConditionTransmitComplete, 5), 0);
  const WaitResult result = waiting.get();
  EXPECT_EQ(result.status, 0) << "raising wakes a blocked wait";
  EXPECT_EQ(result.value, 5u);
}

TEST_F(KvorWait, AClearEndsEveryWaitOnItsSessionAndAResetEndsTheRest) {
  const uint32_t session = Create("ENET1", kvMode_FrameInStream);
  const uint32_t bystander = Create("ENET1", kvMode_FrameInStream);
  kvsimLogClear();
  std::vector<std::future<WaitResult>> waits;
  waits.push_back(WaitAsync(session, kvsimConditionIntfCommunicating, -1.0));
  waits.push_back(WaitAsync(session, kvsimConditionIntfCommunicating, 3600.0));
  waits.push_back(WaitAsync(session, kvsimConditionTransmitComplete, -1.0));
  auto other = WaitAsync(bystander, kvsimConditionIntfCommunicating, -1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 4), 1);
  ASSERT_EQ(kvsimLogCount(), 4);
  for (int32_t i = 0; i < 4; ++i) {
    kvsimCallRecord record;
    ASSERT_EQ(kvsimLogEntry(i, &record), 1);
    EXPECT_STREQ(record.function, "kvWait");
    EXPECT_EQ(record.status, KVSIM_STATUS_PENDING) << "a blocked call is pending in the log";
  }

  ASSERT_EQ(kvClear(session), 0);
  for (auto &wait : waits) {
    const WaitResult result = wait.get();
    EXPECT_EQ(result.status, kvsimErrSessionCleared);
    EXPECT_EQ(result.value, 0xEEEEEEEEu);
  }
  EXPECT_EQ(other.wait_for(std::chrono::seconds(0)), std::future_status::timeout)
      << "a wait on another session goes on";
  int32_t cleared = 0;
  for (int32_t i = 0; i < 4; ++i) {
    kvsimCallRecord record;
    ASSERT_EQ(kvsimLogEntry(i, &record), 1);
    cleared += record.status == kvsimErrSessionCleared;
    if (record.object == bystander) {
      EXPECT_EQ(record.status, KVSIM_STATUS_PENDING);
    }
  }
  EXPECT_EQ(cleared, 3) << "the log shows how each wait ended";
  kvsimReset();
  EXPECT_EQ(other.get().status, kvsimErrSessionCleared);
}

TEST_F(KvorWait, BadArgumentsEndTheWaitAtOnce) {
  const uint32_t session = Create("CAN4", kvMode_FrameInStream);
  uint32_t value = 0;
  EXPECT_EQ(kvWait(session, 0x1234, 0, &value, -1.0), kvsimErrInvalidCondition);
  EXPECT_EQ(kvsimRaiseCondition(session, 0x1234, 0), -1);
  EXPECT_EQ(kvsimRaiseCondition(session + 1, kvsimConditionIntfCommunicating, 0), -1);
}

}  // namespace
