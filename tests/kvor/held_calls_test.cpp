// A held call parks inside the driver, pending in the log, until it is released or its session
// is cleared.
#include <chrono>
#include <future>

#include "kvor_test_support.h"

namespace {

using KvorHeldCalls = KvorTest;

TEST_F(KvorHeldCalls, AHeldCallParksPendingUntilReleasedOrItsSessionIsCleared) {
  const uint32_t sessions[] = {Create("CAN1", kvMode_SignalInSinglePoint, "Speed"),
                               Create("CAN2", kvMode_SignalInSinglePoint, "Speed")};
  double values[] = {-1.0, -1.0};
  ASSERT_EQ(kvsimHold("kvReadSignalSinglePoint"), 0);
  kvsimLogClear();
  std::future<int32_t> reads[2];
  for (int i = 0; i < 2; ++i) {
    reads[i] = std::async(std::launch::async, [&, i] {
      return kvReadSignalSinglePoint(sessions[i], &values[i], 8, nullptr, 0);
    });
  }
  ASSERT_EQ(kvsimWaitParked("kvReadSignalSinglePoint", 2), 1);
  kvsimCallRecord record;
  for (int32_t i = 0; i < 2; ++i) {
    ASSERT_EQ(kvsimLogEntry(i, &record), 1);
    EXPECT_EQ(record.status, KVSIM_STATUS_PENDING);
  }
  ASSERT_EQ(kvClear(sessions[1]), 0);
  EXPECT_EQ(reads[1].get(), kvsimErrSessionCleared);
  EXPECT_EQ(reads[0].wait_for(std::chrono::seconds(0)), std::future_status::timeout)
      << "the other stays parked";
  const double speed = 42.0;
  ASSERT_EQ(kvsimSetSignalValues(sessions[0], &speed, 1), 1);
  ASSERT_EQ(kvsimRelease("kvReadSignalSinglePoint"), 0);
  EXPECT_EQ(reads[0].get(), 0);
  EXPECT_EQ(std::vector<double>(values, values + 2), std::vector<double>({42.0, -1.0}))
      << "the released read ran after its release, the cleared one not at all";
}

}  // namespace
