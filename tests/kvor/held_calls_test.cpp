// Held calls: while a driver function is held its calls park inside the driver, until the test
// releases them or their session is cleared.
#include <chrono>
#include <future>
#include <vector>

#include "control_calls.h"
#include "kvor_test_support.h"

namespace {

using KvorHeldCalls = KvorTest;

struct ReadResult {
  int32_t status;
  double value;
};

std::future<ReadResult> ReadAsync(uint32_t session) {
  return std::async(std::launch::async, [=] {
    double value = -1.0;
    const int32_t status = kvReadSignalSinglePoint(session, &value, 8, nullptr, 0);
    return ReadResult{status, value};
  });
}

bool StillRunning(const std::future<ReadResult> &call) {
  return call.wait_for(std::chrono::seconds(0)) == std::future_status::timeout;
}

TEST_F(KvorHeldCalls, HeldReadsParkUntilReleasedOrTheirOwnSessionIsCleared) {
  std::vector<uint32_t> sessions;
  for (const char *name : {"CAN1", "CAN2", "CAN1"}) {
    sessions.push_back(Create(name, kvMode_SignalInSinglePoint, "Speed"));
  }
  ASSERT_EQ(kvsimHold("kvReadSignalSinglePoint"), 0);
  std::vector<std::future<ReadResult>> reads;
  for (uint32_t session : sessions) reads.push_back(ReadAsync(session));
  ASSERT_EQ(kvsimWaitParked("kvReadSignalSinglePoint", 3), 1);

  ASSERT_EQ(kvClear(sessions[2]), 0);
  const ReadResult cleared = reads[2].get();
  EXPECT_EQ(cleared.status, kvsimErrSessionCleared);
  EXPECT_EQ(cleared.value, -1.0);
  EXPECT_TRUE(StillRunning(reads[0]) && StillRunning(reads[1])) << "the others stay parked";

  const double speed = 42.0;
  ASSERT_EQ(kvsimSetSignalValues(sessions[0], &speed, 1), 1);
  ASSERT_EQ(kvsimRelease("kvReadSignalSinglePoint"), 0);
  for (int i = 0; i < 2; ++i) {
    const ReadResult result = reads[i].get();
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.value, 42.0) << "the read ran after the release";
  }
  double value = 0;
  EXPECT_EQ(kvReadSignalSinglePoint(sessions[0], &value, 8, nullptr, 0), 0)
      << "a released function no longer parks";
}

TEST_F(KvorHeldCalls, AParkedCallIsPendingInTheLogAndMeetsItsInjectedFailureWhenReleased) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A");
  kvsimLogClear();
  ASSERT_EQ(kvsimHold("kvReadSignalSinglePoint"), 0);
  ASSERT_EQ(kvsimFailCall("kvReadSignalSinglePoint", kvsimErrTimeout, 1), 0);
  auto read = ReadAsync(session);
  ASSERT_EQ(kvsimWaitParked("kvReadSignalSinglePoint", 1), 1);
  kvsimCallRecord record;
  ASSERT_EQ(kvsimLogEntry(0, &record), 1);
  EXPECT_STREQ(record.function, "kvReadSignalSinglePoint");
  EXPECT_EQ(record.status, KVSIM_STATUS_PENDING);
  ASSERT_EQ(kvsimRelease("kvReadSignalSinglePoint"), 0);
  EXPECT_EQ(read.get().status, kvsimErrTimeout);
  ASSERT_EQ(kvsimLogEntry(0, &record), 1);
  EXPECT_EQ(record.status, kvsimErrTimeout);
}

TEST_F(KvorHeldCalls, ACallOnNoSessionParksUntilReleasedOrReset) {
  for (bool byReset : {false, true}) {
    ASSERT_EQ(kvsimHold("kvSystemOpen"), 0);
    auto open = std::async(std::launch::async, [] {
      uint32_t system = 0;
      return kvSystemOpen(&system);
    });
    ASSERT_EQ(kvsimWaitParked("kvSystemOpen", 1), 1);
    EXPECT_EQ(kvsimOpenSystemCount(), 0) << "parked before doing anything";
    if (byReset) {
      kvsimReset();
    } else {
      ASSERT_EQ(kvsimRelease("kvSystemOpen"), 0);
    }
    EXPECT_EQ(open.get(), 0);
    EXPECT_EQ(kvsimOpenSystemCount(), 1);
    kvsimReset();
  }
}

TEST_F(KvorHeldCalls, EveryControlCallParksUntilReleasedOrItsSessionIsCleared) {
  for (const ControlCall &call : ControlCalls()) {
    SCOPED_TRACE(call.function);
    for (bool clear : {false, true}) {
      if (clear && !call.onSession) continue;
      kvsimReset();
      ControlScene scene = MakeControlScene();
      call.prepare(scene);
      ASSERT_EQ(kvsimHold(call.function), 0);
      auto running = std::async(std::launch::async, [&] { return call.run(scene); });
      ASSERT_EQ(kvsimWaitParked(call.function, 1), 1);
      if (call.effect) {
        EXPECT_FALSE(call.effect(scene)) << "parked before doing anything";
      }
      if (clear) {
        ASSERT_EQ(kvClear(scene.session), 0);
        EXPECT_EQ(running.get(), kvsimErrSessionCleared);
        continue;
      }
      ASSERT_EQ(kvsimRelease(call.function), 0);
      EXPECT_EQ(running.get(), call.status);
      if (call.effect) {
        EXPECT_TRUE(call.effect(scene));
      }
    }
  }
}

TEST_F(KvorHeldCalls, OnlyDriverFunctionsCanBeHeld) {
  EXPECT_EQ(kvsimHold("kvNoSuchCall"), -1) << "not a function of this driver";
  EXPECT_EQ(kvsimHold(nullptr), -1);
  EXPECT_EQ(kvsimRelease("kvsimReset"), -1);
  EXPECT_EQ(kvsimHold("kvStatusToString"), 0);
  EXPECT_EQ(kvsimRelease("kvStatusToString"), 0);
  char text[32];
  kvStatusToString(0, sizeof text, text);
  EXPECT_EQ(kvsimCountCalls("kvStatusToString"), 1) << "a released hold lets calls through";
}

}  // namespace
