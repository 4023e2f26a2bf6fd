// Injected statuses: for the next N calls, until cleared, or for one property only. A failure
// replaces the call; a warning rides on a call that succeeds.
#include "control_calls.h"
#include "kvor_test_support.h"

namespace {

using KvorFailureInjection = KvorTest;

constexpr int32_t kHardwareFault = static_cast<int32_t>(0xBFF62DEA);
constexpr int32_t kWarning = 0x3FF62077;

TEST_F(KvorFailureInjection, TheNextCallsFailThenCallsWorkAgain) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A,B,C");
  ASSERT_EQ(kvsimFailCall("kvGetProperty", kHardwareFault, 2), 0);
  for (int call = 0; call < 2; ++call) {
    uint32_t count = 0xEEEEEEEE;
    EXPECT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &count), kHardwareFault) << call;
    EXPECT_EQ(count, 0xEEEEEEEEu) << "a failed call delivers nothing";
  }
  EXPECT_EQ(ReadU32(session, kvPropSession_NumInList), 3u);
}

TEST_F(KvorFailureInjection, AnOpenEndedFailureLastsUntilCleared) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A");
  ASSERT_EQ(kvsimFailCall("kvReadSignalSinglePoint", kHardwareFault, -1), 0);
  double value = 0;
  for (int call = 0; call < 25; ++call) {
    EXPECT_EQ(kvReadSignalSinglePoint(session, &value, 8, nullptr, 0), kHardwareFault) << call;
  }
  kvsimClearFailures();
  EXPECT_EQ(kvReadSignalSinglePoint(session, &value, 8, nullptr, 0), 0);
}

TEST_F(KvorFailureInjection, APropertyFailureHitsThatPropertyOnly) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A,B");
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_NumInList, kHardwareFault, -1), 0);
  uint32_t value = 0;
  EXPECT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &value), kHardwareFault);
  EXPECT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &value), kHardwareFault);
  EXPECT_EQ(ReadU32(session, kvPropSession_Mode), 0u) << "another property";
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(session, kvPropSession_NumInList, &size), 0) << "another function";
  EXPECT_EQ(size, 4u);
}

TEST_F(KvorFailureInjection, APropertyRuleGoesBeforeARuleForTheWholeFunction) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A,B");
  ASSERT_EQ(kvsimFailCall("kvGetProperty", kvsimErrInternal, -1), 0);
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_Mode, kHardwareFault, 1), 0);
  uint32_t value = 0;
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
  ASSERT_EQ(kvsimFailCall("kvSetProperty", kHardwareFault, 1), 0);
  const uint32_t baud = 500000;
  EXPECT_EQ(kvSetProperty(session, kvPropSession_IntfBaudRate, 4, &baud), kHardwareFault);
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(session, kvPropSession_IntfBaudRate, &size), kvsimErrPropertyUnknown);

  ASSERT_EQ(kvsimFailCall("kvWriteSignalSinglePoint", kHardwareFault, 1), 0);
  const double value = 12.5;
  EXPECT_EQ(kvWriteSignalSinglePoint(session, &value, 8), kHardwareFault);
  double written = -1;
  EXPECT_EQ(kvsimGetSignalValues(session, &written, 1), 1);
  EXPECT_EQ(written, 0.0);

  ASSERT_EQ(kvsimFailCall("kvClear", kHardwareFault, 1), 0);
  EXPECT_EQ(kvClear(session), kHardwareFault);
  EXPECT_EQ(kvsimOpenSessionCount(), 1) << "the session is still open";
}

TEST_F(KvorFailureInjection, AWarningRidesOnASuccessfulCall) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A,B,C");
  ASSERT_EQ(kvsimFailCall("kvGetProperty", kWarning, 2), 0);
  uint32_t count = 0;
  EXPECT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &count), kWarning);
  EXPECT_EQ(count, 3u) << "a warning delivers the value";
  EXPECT_EQ(kvGetProperty(session, kvPropSession_IntfBaudRate, 4, &count), kvsimErrPropertyUnknown)
      << "a call that fails keeps its failure";
  EXPECT_EQ(kvGetProperty(session, kvPropSession_Mode, 4, &count), 0);
}

TEST_F(KvorFailureInjection, EveryControlCallCanBeMadeToFailOrToWarn) {
  for (const ControlCall &call : ControlCalls()) {
    SCOPED_TRACE(call.function);
    kvsimReset();
    ControlScene failing = MakeControlScene();
    call.prepare(failing);
    ASSERT_EQ(kvsimFailCall(call.function, kHardwareFault, 1), 0);
    EXPECT_EQ(call.run(failing), kHardwareFault);
    if (call.effect) {
      EXPECT_FALSE(call.effect(failing)) << "a failed call does nothing";
    }
    EXPECT_EQ(call.run(failing), call.status) << "the failure is used up";
    if (call.effect) {
      EXPECT_TRUE(call.effect(failing));
    }

    kvsimReset();
    ControlScene warned = MakeControlScene();
    call.prepare(warned);
    ASSERT_EQ(kvsimFailCall(call.function, kWarning, 1), 0);
    EXPECT_EQ(call.run(warned), call.status < 0 ? call.status : kWarning);
    if (call.effect) {
      EXPECT_TRUE(call.effect(warned)) << "a warned call does its work";
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

TEST_F(KvorFailureInjection, ResetDropsInjectedFailures) {
  ASSERT_EQ(kvsimFailCall("kvSystemOpen", kHardwareFault, -1), 0);
  uint32_t system = 0;
  EXPECT_EQ(kvSystemOpen(&system), kHardwareFault);
  kvsimReset();
  EXPECT_EQ(kvSystemOpen(&system), 0);
}

}  // namespace
