// Error sessions stand for a failed open: every use answers with the failure, and clearing them
// ends them quietly.
#include <functional>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorErrorSessions = KvorTest;

constexpr int32_t kOpenFailure = static_cast<int32_t>(0xBFF6308A);

struct Use {
  const char *call;
  std::function<int32_t(uint32_t)> run;
};

// Every call that takes a session, or an object that a failed open stands for, with buffers that
// a wrong answer would touch.
std::vector<Use> EveryUse(std::vector<uint8_t> &buffer, double &value, uint64_t &timestamp,
                          uint32_t &word) {
  return {
      {"kvGetPropertySize",
       [&](uint32_t h) { return kvGetPropertySize(h, kvPropSession_IntfName, &word); }},
      {"kvGetProperty",
       [&](uint32_t h) {
         return kvGetProperty(h, kvPropSession_Mode, static_cast<uint32_t>(buffer.size()),
                              buffer.data());
       }},
      {"kvSetProperty",
       [&](uint32_t h) { return kvSetProperty(h, kvPropSession_IntfBaudRate, 4, &word); }},
      {"kvGetSubProperty",
       [&](uint32_t h) {
         return kvGetSubProperty(h, 0, kvPropSessionSub_CANTxTime,
                                 static_cast<uint32_t>(buffer.size()), buffer.data());
       }},
      {"kvSetSubProperty",
       [&](uint32_t h) { return kvSetSubProperty(h, 0, kvPropSessionSub_CANTxTime, 8, &value); }},
      {"kvReadSignalSinglePoint",
       [&](uint32_t h) { return kvReadSignalSinglePoint(h, &value, 8, &timestamp, 8); }},
      {"kvWriteSignalSinglePoint",
       [&](uint32_t h) { return kvWriteSignalSinglePoint(h, &value, 8); }},
      // A limit, so that a wrong answer shows as a failure rather than a hang.
      {"kvWait",
       [&](uint32_t h) { return kvWait(h, kvsimConditionIntfCommunicating, 0, &word, 5.0); }},
      {"kvStart", [&](uint32_t h) { return kvStart(h, kvsimScopeNormal); }},
      {"kvStop", [&](uint32_t h) { return kvStop(h, kvsimScopeNormal); }},
      {"kvFlush", [&](uint32_t h) { return kvFlush(h); }},
      {"kvConnectTerminals",
       [&](uint32_t h) { return kvConnectTerminals(h, "PXI_Trig0", "StartTrigger"); }},
      {"kvDisconnectTerminals",
       [&](uint32_t h) { return kvDisconnectTerminals(h, "PXI_Trig0", "StartTrigger"); }},
      {"kvhdnCreateSvTiming_FlexRayMacrotick",
       [&](uint32_t h) { return kvhdnCreateSvTiming_FlexRayMacrotick(h, &timestamp); }},
      {"kvBlink", [&](uint32_t h) { return kvBlink(h, kvsimBlinkOn); }},
      {"kvdbCloseDatabase", [&](uint32_t h) { return kvdbCloseDatabase(h, 1); }},
  };
}

TEST_F(KvorErrorSessions, EveryUseAnswersWithItsStatusAndTouchesNothing) {
  for (int32_t failure : {kOpenFailure, static_cast<int32_t>(kvsimErrUnknownInterface), -1}) {
    uint32_t handle = 0;
    ASSERT_EQ(kvhdnCreateErrorSession(failure, &handle), 0);
    std::vector<uint8_t> buffer(64, 0xEE);
    double value = 42.0;
    uint64_t timestamp = 7;
    uint32_t word = 0x5A5A5A5A;
    for (const Use &use : EveryUse(buffer, value, timestamp, word)) {
      EXPECT_EQ(use.run(handle), failure) << use.call << " status " << std::hex << failure;
    }
    EXPECT_EQ(buffer, std::vector<uint8_t>(64, 0xEE));
    EXPECT_EQ(value, 42.0);
    EXPECT_EQ(timestamp, 7u);
    EXPECT_EQ(word, 0x5A5A5A5Au);
  }
}

TEST_F(KvorErrorSessions, TheControlsDoNotTreatItAsASession) {
  uint32_t handle = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(kOpenFailure, &handle), 0);
  const double values[] = {1.0};
  double read[1] = {};
  EXPECT_EQ(kvsimSetSignalValues(handle, values, 1), -1);
  EXPECT_EQ(kvsimGetSignalValues(handle, read, 1), -1);
  EXPECT_EQ(kvsimRaiseCondition(handle, kvsimConditionIntfCommunicating, 1), -1);
}

TEST_F(KvorErrorSessions, ClearOrSystemCloseEndsItWithSuccess) {
  const struct {
    const char *call;
    int32_t (*end)(uint32_t);
    int32_t again;  // what the same call answers once the handle is gone
  } ends[] = {{"kvClear", kvClear, kvsimErrInvalidSession},
              {"kvSystemClose", kvSystemClose, kvsimErrInvalidObject}};
  for (const auto &end : ends) {
    uint32_t handle = 0;
    ASSERT_EQ(kvhdnCreateErrorSession(kOpenFailure, &handle), 0);
    ASSERT_EQ(kvsimOpenSessionCount(), 1);
    EXPECT_EQ(end.end(handle), 0) << end.call;
    EXPECT_EQ(kvsimOpenSessionCount(), 0) << end.call;
    uint32_t size = 0;
    EXPECT_EQ(kvGetPropertySize(handle, kvPropSession_IntfName, &size), kvsimErrInvalidSession)
        << end.call;
    EXPECT_EQ(end.end(handle), end.again) << end.call << " a second time";
  }
}

TEST_F(KvorErrorSessions, OnlyAnErrorCanBeKept) {
  uint32_t handle = 0x77;
  EXPECT_EQ(kvhdnCreateErrorSession(0, &handle), kvsimErrInvalidArgument);
  EXPECT_EQ(kvhdnCreateErrorSession(0x3FF60001, &handle), kvsimErrInvalidArgument);
  EXPECT_EQ(kvhdnCreateErrorSession(kOpenFailure, nullptr), kvsimErrNullPointer);
  EXPECT_EQ(handle, 0x77u);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

TEST_F(KvorErrorSessions, ErrorSessionsAndSessionsLiveSideBySide) {
  uint32_t first = 0, second = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(kOpenFailure, &first), 0);
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A");
  ASSERT_EQ(kvhdnCreateErrorSession(kvsimErrInvalidMode, &second), 0);
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(first, kvPropSession_IntfName, &size), kOpenFailure);
  EXPECT_EQ(kvGetPropertySize(second, kvPropSession_IntfName, &size), kvsimErrInvalidMode);
  EXPECT_EQ(ReadText(session, kvPropSession_IntfName), "CAN1");
  EXPECT_EQ(kvSystemClose(session), kvsimErrInvalidObject) << "a real session is not a system";
  EXPECT_EQ(kvsimOpenSessionCount(), 3);
}

}  // namespace
