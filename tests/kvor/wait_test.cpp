// kvWait: a real wait that ends on its condition, on its time limit, or when another thread
// clears the session.
#include <chrono>
#include <cmath>
#include <future>
#include <thread>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorWait = KvorTest;
using Clock = std::chrono::steady_clock;

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

TEST_F(KvorWait, AWaitEndsWithATimeoutWhenItsLimitRunsOut) {
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
  for (double limit : {0.0, 0.05, 0.2}) {
    uint32_t value = 0xEEEEEEEE;
    const auto start = Clock::now();
    EXPECT_EQ(kvWait(session, kvsimConditionIntfCommunicating, 0, &value, limit), kvsimErrTimeout);
    const std::chrono::duration<double> waited = Clock::now() - start;
    EXPECT_GE(waited.count(), limit) << "the wait is real";
    EXPECT_EQ(value, 0xEEEEEEEEu) << "no value on a timeout";
  }
}

TEST_F(KvorWait, ARaisedConditionEndsEveryWaitAtOnceUntilLowered) {
  const uint32_t session = Create("LIN1", kvMode_FrameInStream);
  ASSERT_EQ(kvsimRaiseCondition(session, kvsimConditionIntfRemoteWakeup, 77), 0);
  for (int i = 0; i < 3; ++i) {
    uint32_t value = 0;
    EXPECT_EQ(kvWait(session, kvsimConditionIntfRemoteWakeup, 0, &value, -1.0), 0);
    EXPECT_EQ(value, 77u);
  }
  EXPECT_EQ(kvWait(session, kvsimConditionIntfRemoteWakeup, 0, nullptr, -1.0), 0)
      << "the value is optional";
  uint32_t value = 0;
  EXPECT_EQ(kvWait(session, kvsimConditionTransmitComplete, 0, &value, 0.0), kvsimErrTimeout)
      << "another condition is not raised";
  ASSERT_EQ(kvsimLowerCondition(session, kvsimConditionIntfRemoteWakeup), 0);
  EXPECT_EQ(kvWait(session, kvsimConditionIntfRemoteWakeup, 0, &value, 0.0), kvsimErrTimeout);
  const uint32_t other = Create("LIN2", kvMode_FrameInStream);
  ASSERT_EQ(kvsimRaiseCondition(session, kvsimConditionIntfRemoteWakeup, 1), 0);
  EXPECT_EQ(kvWait(other, kvsimConditionIntfRemoteWakeup, 0, &value, 0.0), kvsimErrTimeout)
      << "conditions belong to one session";
}

TEST_F(KvorWait, RaisingTheConditionWakesABlockedWait) {
  const uint32_t session = Create("CAN1", kvMode_FrameOutQueued, "F1");
  auto waiting = WaitAsync(session, kvsimConditionTransmitComplete, -1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 1), 1);
  ASSERT_EQ(kvsimRaiseCondition(session, kvsimConditionTransmitComplete, 5), 0);
  const WaitResult result = waiting.get();
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.value, 5u);
}

TEST_F(KvorWait, ClearingTheSessionEndsEveryWaitOnIt) {
  const uint32_t session = Create("ENET1", kvMode_FrameInStream);
  const uint32_t bystander = Create("ENET1", kvMode_FrameInStream);
  std::vector<std::future<WaitResult>> waits;
  for (uint32_t condition : {kvsimConditionIntfCommunicating, kvsimConditionIntfCommunicating,
                             kvsimConditionTransmitComplete}) {
    waits.push_back(WaitAsync(session, condition, -1.0));
  }
  auto other = WaitAsync(bystander, kvsimConditionIntfCommunicating, -1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 4), 1);
  ASSERT_EQ(kvClear(session), 0);
  for (auto &wait : waits) {
    const WaitResult result = wait.get();
    EXPECT_EQ(result.status, kvsimErrSessionCleared);
    EXPECT_EQ(result.value, 0xEEEEEEEEu);
  }
  EXPECT_EQ(other.wait_for(std::chrono::seconds(0)), std::future_status::timeout)
      << "a wait on another session goes on";
  ASSERT_EQ(kvsimRaiseCondition(bystander, kvsimConditionIntfCommunicating, 2), 0);
  EXPECT_EQ(other.get().status, 0);
}

TEST_F(KvorWait, ClearingEndsAWaitThatHasALimit) {
  const uint32_t session = Create("CAN4", kvMode_FrameInStream);
  auto waiting = WaitAsync(session, kvsimConditionIntfCommunicating, 3600.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 1), 1);
  ASSERT_EQ(kvClear(session), 0);
  EXPECT_EQ(waiting.get().status, kvsimErrSessionCleared);
}

TEST_F(KvorWait, ResetEndsABlockedWait) {
  const uint32_t session = Create("CAN4", kvMode_FrameInStream);
  auto waiting = WaitAsync(session, kvsimConditionIntfCommunicating, -1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 1), 1);
  kvsimReset();
  EXPECT_EQ(waiting.get().status, kvsimErrSessionCleared);
}

TEST_F(KvorWait, TheLogShowsABlockedWaitAsPending) {
  const uint32_t session = Create("CAN4", kvMode_FrameInStream);
  kvsimLogClear();
  auto waiting = WaitAsync(session, kvsimConditionIntfCommunicating, -1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 1), 1);
  kvsimCallRecord record;
  ASSERT_EQ(kvsimLogEntry(0, &record), 1);
  EXPECT_STREQ(record.function, "kvWait");
  EXPECT_EQ(record.object, session);
  EXPECT_EQ(record.propertyId, static_cast<uint32_t>(kvsimConditionIntfCommunicating));
  EXPECT_EQ(record.status, KVSIM_STATUS_PENDING);
  ASSERT_EQ(kvsimRaiseCondition(session, kvsimConditionIntfCommunicating, 0), 0);
  ASSERT_EQ(waiting.get().status, 0);
  ASSERT_EQ(kvsimLogEntry(0, &record), 1);
  EXPECT_EQ(record.status, 0);
}

TEST_F(KvorWait, BadArgumentsEndTheWaitAtOnce) {
  const uint32_t session = Create("CAN4", kvMode_FrameInStream);
  uint32_t value = 0;
  EXPECT_EQ(kvWait(session, 0x1234, 0, &value, -1.0), kvsimErrInvalidCondition);
  EXPECT_EQ(kvWait(session, kvsimConditionIntfCommunicating, 0, &value, std::nan("")),
            kvsimErrInvalidArgument);
  EXPECT_EQ(kvWait(session + 1, kvsimConditionIntfCommunicating, 0, &value, -1.0),
            kvsimErrInvalidSession);
  EXPECT_EQ(kvsimRaiseCondition(session, 0x1234, 0), -1);
}

}  // namespace
