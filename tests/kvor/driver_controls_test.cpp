// The controls that the library's tests count and fail calls with: every driver call is counted;
// injected failures hit the calls they name as often as asked; a freed index of the session table
// comes back under a new handle.
#include "kvor_test_support.h"

namespace {

using KvorControls = KvorTest;

constexpr int32_t kFault = static_cast<int32_t>(0xBFF62DEA);

// Counts that the library's tests compare with 0 as often as with more.
TEST_F(KvorControls, EveryCallIsCountedFailedOrNotAndEveryPropertyReadWithIt) {
  uint32_t session = 0, count = 0;
  const double tx = 0.5;
  ASSERT_EQ(kvCreateSession("DB", "C", "", "CAN9", 0, &session), kvsimErrUnknownInterface);
  session = Create("CAN2", kvMode_SignalInSinglePoint, "A,B");
  ASSERT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &count), 0);
  ASSERT_EQ(kvGetPropertySize(session, kvPropSession_Protocol, &count), 0);
  ASSERT_EQ(kvGetProperty(session, kvPropSession_IntfBaudRate, 4, &count), kvsimErrPropertyUnknown);
  ASSERT_EQ(kvSetSubProperty(session, 1, kvPropSessionSub_CANTxTime, 8, &tx), 0);
  ASSERT_EQ(kvConnectTerminals(session, "FrontPanel0", "StartTrigger"), 0);
  EXPECT_EQ(kvsimLogCount(), 7);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 2);
  EXPECT_EQ(kvsimCountCalls("kvGetProperty"), 2);
  EXPECT_EQ(kvsimCountCalls("kvWait"), 0);
  for (uint32_t id : {kvPropSession_NumInList, kvPropSession_Protocol, kvPropSession_IntfBaudRate})
    EXPECT_EQ(kvsimCountPropertyReads(id), 1) << std::hex << id << ": a read, a size, a failure";
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSessionSub_CANTxTime), 0) << "a set is none";
  EXPECT_EQ(kvsimOpenSessionCount(), 1);
  EXPECT_EQ(kvsimTerminalsConnected(session, "FrontPanel0", "StartTrigger"), 1);
  EXPECT_EQ(kvsimTerminalsConnected(session, "StartTrigger", "FrontPanel0"), 0) << "one way";
  EXPECT_EQ(kvsimTerminalsConnected(session, nullptr, "StartTrigger"), -1);
  kvsimLogClear();
  EXPECT_EQ(kvsimLogCount() + kvsimCountCalls("kvCreateSession"), 0);
}

TEST_F(KvorControls, InjectedFailuresHitTheNamedCallsAsOftenAsAsked) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A,B,C");
  ASSERT_EQ(kvsimFailCall("kvGetProperty", kFault, 2), 0);
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_Mode, kvsimErrInternal, 1), 0);
  const struct {
    uint32_t id;
    int32_t status;
    uint32_t value;
  } reads[] = {{kvPropSession_NumInList, kFault, 0xEEEEEEEE},       // a failure delivers nothing
               {kvPropSession_Mode, kvsimErrInternal, 0xEEEEEEEE},  // the property rule first
               {kvPropSession_NumInList, kFault, 0xEEEEEEEE},
               {kvPropSession_NumInList, 0, 3},
               {kvPropSession_Mode, 0, kvMode_SignalInSinglePoint}};
  for (const auto &r : reads) {
    uint32_t value = 0xEEEEEEEE;
    EXPECT_EQ(kvGetProperty(session, r.id, 4, &value), r.status) << &r - reads;
    EXPECT_EQ(value, r.value) << &r - reads;
  }
  ASSERT_EQ(kvsimFailCall("kvCreateSession", kFault, -1), 0);
  uint32_t handle = 0x5555;
  for (int i = 0; i < 3; ++i) EXPECT_EQ(kvCreateSession("", "", "", "CAN1", 0, &handle), kFault);
  EXPECT_EQ(handle, 0x5555u);
  kvsimClearFailures();
  ASSERT_EQ(kvsimFailCall("kvClear", 0x3FF62077, 1), 0);
  EXPECT_EQ(kvClear(session), 0x3FF62077) << "a warning rides on a call that works";
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsimFailCall("kvStatusToString", kFault, 1), -1) << "returns no status";
}

TEST_F(KvorControls, AFullTableGivesTheFreedIndexBackUnderANewHandleAndAResetForgetsAll) {
  std::vector<uint32_t> open(8192);  // the library's table of sessions has as many slots
  for (uint32_t &handle : open) handle = Create("LIN1", kvMode_FrameInQueued);
  uint32_t refused = 0x1234, size = 0, system = 0;
  EXPECT_EQ(kvCreateSession("", "", "", "LIN1", 0, &refused), kvsimErrTooManySessions);
  EXPECT_EQ(refused, 0x1234u);
  ASSERT_EQ(kvClear(open[4321]), 0);
  const uint32_t reused = Create("CAN1", kvMode_FrameInStream);
  EXPECT_EQ(reused & 0xFFFFu, open[4321] & 0xFFFFu) << "the only free index";
  EXPECT_NE(reused, open[4321]);
  EXPECT_EQ(kvGetPropertySize(open[4321], kvPropSession_Mode, &size), kvsimErrInvalidSession);
  ASSERT_EQ(kvSystemOpen(&system), 0);
  kvsimSetClock(5000);
  kvsimReset();
  EXPECT_EQ(kvsimOpenSessionCount() + kvsimOpenSystemCount() + kvsimLogCount(), 0);
  EXPECT_EQ(kvsimClock(), 0u);
  EXPECT_EQ(kvGetPropertySize(reused, kvPropSession_Mode, &size), kvsimErrInvalidSession);
}

}  // namespace
