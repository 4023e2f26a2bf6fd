// A reset gives back a freshly loaded driver, and the handles of before stay invalid after it.
#include "kvor_test_support.h"

namespace {

using KvorReset = KvorTest;

TEST_F(KvorReset, EveryStateOfTheDriverGoesBackToItsStart) {
  kvsimSetClock(5000);
  const uint32_t session = Create("CAN4", kvMode_SignalInSinglePoint, "A");
  const double value = 3.0;
  ASSERT_EQ(kvsimSetSignalValues(session, &value, 1), 1);
  ASSERT_EQ(kvStart(session, kvsimScopeNormal), 0);
  ASSERT_EQ(kvsimRaiseCondition(session, kvsimConditionTransmitComplete, 1), 0);
  const uint32_t system = OpenSystem();
  ASSERT_EQ(kvBlink(ReadHandles(system, kvPropSys_IntfRefsAll).front(), kvsimBlinkOn), 0);
  ASSERT_EQ(kvsimFailCall("kvSystemOpen", kvsimErrInternal, -1), 0);
  ASSERT_EQ(kvsimHold("kvGetPropertySize"), 0);

  kvsimReset();

  EXPECT_EQ(kvsimClock(), 0u);
  EXPECT_EQ(kvsimLogCount(), 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
  EXPECT_EQ(kvsimInterfaceStarted("CAN4"), 0);
  EXPECT_EQ(kvsimBlinkMode("CAN1"), kvsimBlinkOff);
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(session, kvPropSession_Mode, &size), kvsimErrInvalidSession)
      << "not held, and the old handle names nothing";
  EXPECT_EQ(kvGetPropertySize(system, kvPropSys_VerMajor, &size), kvsimErrInvalidObject);
  EXPECT_NE(OpenSystem(), 0u) << "the injected failure is gone";

  const uint32_t after = Create("CAN4", kvMode_SignalInSinglePoint, "A");
  EXPECT_NE(after, session);
  EXPECT_EQ(kvsimSessionStarted(after), 0);
  double read = -1;
  ASSERT_EQ(kvReadSignalSinglePoint(after, &read, 8, nullptr, 0), 0);
  EXPECT_EQ(read, 0.0) << "the networks forgot their values";
  uint32_t raised = 0;
  EXPECT_EQ(kvWait(after, kvsimConditionTransmitComplete, 0, &raised, 0.0), kvsimErrTimeout);
}

}  // namespace
