// kvsvSessionWait: a wait that may block first registers the session's abort with the host, then
// waits in the driver and returns what the driver says.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <future>
#include <limits>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace {

constexpr uint32_t kParameter = 0x00C0FFEEu;

class SessionWait : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
    ASSERT_EQ(kvCreateSession("DB", "Cluster", "", "CAN3", kvMode_FrameInStream, &session_), 0);
  }

  void TearDown() override {
    kvsimReset();
    svsimReset();
  }

  std::future<int32_t> WaitAsync(double timeLimit) {
    const uint32_t session = session_;
    return std::async(std::launch::async, [session, timeLimit] {
      uint32_t value = 0;
      return kvsvSessionWait(session, kvsimConditionIntfCommunicating, kParameter, &value,
                             timeLimit);
    });
  }

  void ExpectAbortRegistered() const {
    SvCleanupProc procedure = nullptr;
    uint64_t argument = 0;
    int32_t mode = 0;
    ASSERT_EQ(svsimLastCleanup(&procedure, &argument, &mode), 1);
    EXPECT_EQ(procedure, &kvsvSessionAbort);
    EXPECT_EQ(argument, session_);
    EXPECT_EQ(mode, 6);
  }

  uint32_t session_ = 0;
};

TEST_F(SessionWait, EveryTimeLimitButZeroRegistersTheAbortForGood) {
  ASSERT_EQ(kvsimRaiseCondition(session_, kvsimConditionTransmitComplete, 1), 0);
  const double inf = std::numeric_limits<double>::infinity();
  const struct {
    double timeLimit;
    bool registers;
    int32_t status;  // the driver refuses a NaN limit, after the registration
  } cases[] = {
      {1.0, true, 0},  {-1.0, true, 0},  {std::nan(""), true, kvsimErrInvalidArgument},
      {inf, true, 0},  {-inf, true, 0},  {1e-300, true, 0},
      {0.0, false, 0}, {-0.0, false, 0},
  };
  int32_t registrations = 0;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.timeLimit);
    uint32_t value = 0;
    EXPECT_EQ(kvsvSessionWait(session_, kvsimConditionTransmitComplete, 0, &value, c.timeLimit),
              c.status);
    if (c.registers) ++registrations;
    EXPECT_EQ(svsimCleanupRegistrations(), registrations);
    EXPECT_EQ(svsimPendingCleanups(), registrations) << "no registration is taken back";
    if (c.registers) ExpectAbortRegistered();
  }
}

TEST_F(SessionWait, ARaisedConditionEndsTheWaitWithItsValue) {
  ASSERT_EQ(kvsimRaiseCondition(session_, kvsimConditionIntfRemoteWakeup, 4242), 0);
  kvsimLogClear();
  uint32_t value = 0;
  EXPECT_EQ(kvsvSessionWait(session_, kvsimConditionIntfRemoteWakeup, kParameter, &value, 5.0), 0);
  EXPECT_EQ(value, 4242u);
  ASSERT_EQ(kvsimLogCount(), 1);
  kvsimCallRecord record;
  ASSERT_EQ(kvsimLogEntry(0, &record), 1);
  EXPECT_STREQ(record.function, "kvWait");
  EXPECT_EQ(record.object, session_);
  EXPECT_EQ(record.propertyId, static_cast<uint32_t>(kvsimConditionIntfRemoteWakeup));
  EXPECT_EQ(record.size1, kParameter);
}

TEST_F(SessionWait, TheDriversFailureComesBackAndLeavesTheValue) {
  uint32_t failed = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(kvsimErrUnknownInterface, &failed), 0);
  const struct {
    uint32_t session;
    double timeLimit;
    int32_t status;
  } cases[] = {
      {session_, 0.0, kvsimErrTimeout},
      {session_, 0.05, kvsimErrTimeout},
      {failed, 1.0, kvsimErrUnknownInterface},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.session << " " << c.timeLimit);
    uint32_t value = 0xEEEEEEEE;
    EXPECT_EQ(kvsvSessionWait(c.session, kvsimConditionIntfCommunicating, 0, &value, c.timeLimit),
              c.status);
    EXPECT_EQ(value, 0xEEEEEEEEu);
  }
}

TEST_F(SessionWait, TheAbortIsRegisteredBeforeTheDriverIsCalled) {
  ASSERT_EQ(kvsimHold("kvWait"), 0);
  auto waiting = WaitAsync(2.5);
  ASSERT_EQ(kvsimWaitParked("kvWait", 1), 1);
  EXPECT_EQ(svsimCleanupRegistrations(), 1);
  ExpectAbortRegistered();
  ASSERT_EQ(kvsimRaiseCondition(session_, kvsimConditionIntfCommunicating, 0), 0);
  ASSERT_EQ(kvsimRelease("kvWait"), 0);
  EXPECT_EQ(waiting.get(), 0);
}

TEST_F(SessionWait, AClearFromAnotherThreadEndsTheWaitWithTheDriversStatus) {
  auto waiting = WaitAsync(-1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 1), 1);
  ASSERT_EQ(kvClear(session_), 0);
  EXPECT_EQ(waiting.get(), kvsimErrSessionCleared);
}

TEST_F(SessionWait, StoppingTheProgramAbortsTheSessionOfABlockedWait) {
  auto waiting = WaitAsync(-1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 1), 1);
  ASSERT_EQ(svsimEndProgramAsync(), 0);
  SvsimEndReport report{};
  ASSERT_EQ(svsimJoinEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 1);
  EXPECT_EQ(waiting.get(), kvsimErrSessionCleared);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

}  // namespace
