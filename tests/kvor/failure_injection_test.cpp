// Injected statuses: for the next N calls, until cleared, or for one property only. A failure
// replaces the call; a warning rides on a call that succeeds.
#include "control_calls.h"
#include "kvor_test_support.h"

namespace {

using KvorFailureInjection = KvorTest;

constexpr int32_t kHardwareFault = static_cast<int32_t>(0xBFF62DEA);
constexpr int32_t kWarning = 0x3FF62077;

TEST_F(KvorFailureInjection, TheNextCallsFailOrEveryCallUntilCleared) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A,B,C");
  ASSERT_EQ(kvsimFailCall("kvGetProperty", kHardwareFault, 2), 0);
  for (int call = 0; call < 2; ++call) {
    uint32_t count = 0xEEEEEEEE;
    EXPECT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &count), kHardwareFault) << call;
    EXPECT_EQ(count, 0xEEEEEEEEu) << "a failed call delivers nothing";
  }
  EXPECT_EQ(ReadU32(session, kvPropSession_NumInList), 3u);

  ASSERT_EQ(kvsimFailCall("kvReadSignalSinglePoint", kHardwareFault, -1), 0);
  double values[3] = {};
  for (int call = 0; call < 25; ++call) {
    EXPECT_EQ(kvReadSignalSinglePoint(session, values, sizeof values, nullptr, 0), kHardwareFault)
        << call;
  }
  kvsimClearFailures();
  EXPECT_EQ(kvReadSignalSinglePoint(session, values, sizeof values, nullptr, 0), 0);
}

TEST_F(KvorFailureInjection, APropertyRuleHitsThatPropertyOnlyAndGoesFirst) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A,B");
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_NumInList, kHardwareFault, -1), 0);
  uint32_t value = 0;
  EXPECT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &value), kHardwareFault);
  EXPECT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &value), kHardwareFault);
  EXPECT_EQ(ReadU32(session, kvPropSession_Mode), 0u) << "another property";
  EXPECT_EQ(kvGetPropertySize(session, kvPropSession_NumInList, &value), 0) << "another function";
  EXPECT_EQ(value, 4u);

  kvsimClearFailures();
  ASSERT_EQ(kvsimFailCall("kvGetProperty", kvsimErrInternal, -1), 0);
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_Mode, kHardwareFault, 1), 0);
  EXPECT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &value), kvsimErrInternal);
  EXPECT_EQ(kvGetProperty(session, kvPropSession_Mode, 4, &value), kHardwareFault);
  EXPECT_EQ(kvGetProperty(session, kvPropSession_Mode, 4, &value), kvsimErrInternal)
      << "the property rule is used up";
}

TEST_F(KvorFailureInjection, AFailedCallHasNoEffect) {
  ASSERT_EQ(kvsimFailCall("kvCreateSession", kHardwareFault, 1), 0);
  uint32_t handle = 0x5555;
  EXPECT_EQ(kvCreateSession("DB", "C", "A", "CAN1", 0, &handle), kHardwareFault);
  EXPECT_EQ(handle, 0x5555u);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);

  const uint32_t session = Create("CAN1", kvMode_SignalOutSinglePoint, "A");
  ASSERT_EQ(kvsimFailCall("kvClear", kHardwareFault, 1), 0);
  EXPECT_EQ(kvClear(session), kHardwareFault);
  EXPECT_EQ(kvsimOpenSessionCount(), 1) << "the session is still open";
}

TEST_F(KvorFailureInjection, EveryControlCallCanBeMadeToFailOrToWarn) {
  for (const ControlCall &call : ControlCalls()) {
    SCOPED_TRACE(call.function);
    for (int32_t injected : {kHardwareFault, kWarning}) {
      kvsimReset();
      ControlScene scene = MakeControlScene();
      call.prepare(scene);
      ASSERT_EQ(kvsimFailCall(call.function, injected, 1), 0);
      if (injected < 0) {
        EXPECT_EQ(call.run(scene), kHardwareFault);
        if (call.effect) {
          EXPECT_FALSE(call.effect(scene)) << "a failed call does nothing";
        }
        EXPECT_EQ(call.run(scene), call.status) << "the failure is used up";
      } else {
        EXPECT_EQ(call.run(scene), call.status < 0 ? call.status : kWarning);
      }
      if (call.effect) {
        EXPECT_TRUE(call.effect(scene));
      }
    }
  }
}

TEST_F(KvorFailureInjection, OnlyDriverFunctionsWithAStatusCanBeMadeToFail) {
  EXPECT_EQ(kvsimFailCall("kvGetPropety", kHardwareFault, 1), -1) << "misspelt";
  EXPECT_EQ(kvsimFailCall("kvStatusToString", kHardwareFault, 1), -1) << "returns no status";
  EXPECT_EQ(kvsimFailCall("kvsimReset", kHardwareFault, 1), -1) << "a control";
  EXPECT_EQ(kvsimFailCall(nullptr, kHardwareFault, 1), -1);
  EXPECT_EQ(kvsimFailCall("kvGetProperty", kHardwareFault, 0), -1) << "no calls at all";
  EXPECT_EQ(kvsimFailProperty("kvClear", kvPropSession_Mode, kHardwareFault, 1), -1)
      << "takes no property";
  EXPECT_EQ(kvsimFailProperty("kvSetSubProperty", kvPropSessionSub_CANTxTime, kHardwareFault, 1),
            0);
}

}  // namespace
