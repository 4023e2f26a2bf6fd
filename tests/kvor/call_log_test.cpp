// The call log: each driver call with its arguments and result, in order of entry; controls are
// not driver calls and stay out of it.
#include <cstring>
#include <string>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorCallLog = KvorTest;

kvsimCallRecord EntryAt(int32_t index) {
  kvsimCallRecord record;
  std::memset(&record, 0xCC, sizeof record);
  EXPECT_EQ(kvsimLogEntry(index, &record), 1) << index;
  return record;
}

TEST_F(KvorCallLog, EachCallIsRecordedWithItsArgumentsAndResult) {
  uint32_t session = 0;
  ASSERT_EQ(kvCreateSession("DB", "C", "A,B", "CAN2", kvMode_SignalInSinglePoint, &session), 0);
  uint32_t count = 0;
  ASSERT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &count), 0);
  double values[2];
  uint64_t stamps[2];
  ASSERT_EQ(kvReadSignalSinglePoint(session, values, 16, stamps, 24), 0);
  double tx = 0.5;
  ASSERT_EQ(kvSetSubProperty(session, 1, kvPropSessionSub_CANTxTime, 8, &tx), 0);
  char text[80];
  kvStatusToString(kvsimErrTimeout, sizeof text, text);
  uint32_t notSet = 0;
  ASSERT_EQ(kvGetPropertySize(session, kvPropSession_IntfBaudRate, &notSet),
            kvsimErrPropertyUnknown);
  ASSERT_EQ(kvClear(session), 0);

  const struct {
    const char *function;
    uint32_t object;
    uint32_t propertyId;
    uint32_t size1;
    uint32_t size2;
    int32_t status;
    const char *text;
  } expected[] = {
      {"kvCreateSession", session, 0, kvMode_SignalInSinglePoint, 0, 0, "CAN2"},
      {"kvGetProperty", session, kvPropSession_NumInList, 4, 0, 0, ""},
      {"kvReadSignalSinglePoint", session, 0, 16, 24, 0, ""},
      {"kvSetSubProperty", session, kvPropSessionSub_CANTxTime, 8, 1, 0, ""},
      {"kvStatusToString", static_cast<uint32_t>(kvsimErrTimeout), 0, sizeof text, 0, 0, ""},
      {"kvGetPropertySize", session, kvPropSession_IntfBaudRate, 0, 0, kvsimErrPropertyUnknown, ""},
      {"kvClear", session, 0, 0, 0, 0, ""},
  };
  ASSERT_EQ(kvsimLogCount(), static_cast<int32_t>(std::size(expected)));
  for (size_t i = 0; i < std::size(expected); ++i) {
    const kvsimCallRecord record = EntryAt(static_cast<int32_t>(i));
    EXPECT_STREQ(record.function, expected[i].function) << i;
    EXPECT_EQ(record.object, expected[i].object) << record.function;
    EXPECT_EQ(record.propertyId, expected[i].propertyId) << record.function;
    EXPECT_EQ(record.size1, expected[i].size1) << record.function;
    EXPECT_EQ(record.size2, expected[i].size2) << record.function;
    EXPECT_EQ(record.status, expected[i].status) << record.function;
    EXPECT_STREQ(record.text, expected[i].text) << record.function;
  }
}

TEST_F(KvorCallLog, ControlCallsAreRecordedWithTheirArguments) {
  uint32_t session = 0;
  ASSERT_EQ(kvCreateSession("DB", "C", "", "FlexRay2", kvMode_FrameInStream, &session), 0);
  uint32_t system = 0;
  ASSERT_EQ(kvSystemOpen(&system), 0);
  uint32_t interfaces[2] = {};
  ASSERT_EQ(kvGetProperty(system, kvPropSys_IntfRefsLIN, sizeof interfaces, interfaces), 0);
  kvsimLogClear();
  uint64_t token = 0;
  const struct {
    const char *function;
    int32_t status;
    int32_t (*run)(uint32_t session, uint32_t interfaceRef, uint64_t *token);
    uint32_t object;
    uint32_t size1;
    const char *text;
  } calls[] = {
      {"kvStart", 0, [](uint32_t s, uint32_t, uint64_t *) { return kvStart(s, 1); }, session, 1,
       ""},
      {"kvStop", kvsimErrInvalidScope,
       [](uint32_t s, uint32_t, uint64_t *) { return kvStop(s, 7); }, session, 7, ""},
      {"kvFlush", 0, [](uint32_t s, uint32_t, uint64_t *) { return kvFlush(s); }, session, 0, ""},
      {"kvConnectTerminals", 0,
       [](uint32_t s, uint32_t, uint64_t *) {
         return kvConnectTerminals(s, "PXI_Trig5", "Interface/StartTrigger");
       },
       session, 0, "PXI_Trig5 -> Interface/StartTrigger"},
      {"kvDisconnectTerminals", kvsimErrNullPointer,
       [](uint32_t s, uint32_t, uint64_t *) {
         return kvDisconnectTerminals(s, nullptr, "FrontPanel0");
       },
       session, 0, " -> FrontPanel0"},
      {"kvhdnCreateSvTiming_FlexRayMacrotick", 0,
       [](uint32_t s, uint32_t, uint64_t *t) { return kvhdnCreateSvTiming_FlexRayMacrotick(s, t); },
       session, 0, ""},
      {"kvBlink", 0, [](uint32_t, uint32_t i, uint64_t *) { return kvBlink(i, 1); }, interfaces[1],
       1, ""},
      {"kvdbCloseDatabase", kvsimErrInvalidDatabase,
       [](uint32_t, uint32_t, uint64_t *) { return kvdbCloseDatabase(0x03000042u, 1); },
       0x03000042u, 1, ""},
  };
  for (const auto &call : calls) {
    ASSERT_EQ(call.run(session, interfaces[1], &token), call.status) << call.function;
  }
  ASSERT_EQ(kvsimLogCount(), static_cast<int32_t>(std::size(calls)));
  for (size_t i = 0; i < std::size(calls); ++i) {
    const kvsimCallRecord record = EntryAt(static_cast<int32_t>(i));
    EXPECT_STREQ(record.function, calls[i].function) << i;
    EXPECT_EQ(record.object, calls[i].object) << record.function;
    EXPECT_EQ(record.propertyId, 0u) << record.function;
    EXPECT_EQ(record.size1, calls[i].size1) << record.function;
    EXPECT_EQ(record.size2, 0u) << record.function;
    EXPECT_EQ(record.status, calls[i].status) << record.function;
    EXPECT_STREQ(record.text, calls[i].text) << record.function;
  }
}

TEST_F(KvorCallLog, ARouteLongerThanTheTextIsCut) {
  uint32_t session = 0;
  ASSERT_EQ(kvCreateSession("DB", "C", "", "CAN1", kvMode_FrameInStream, &session), 0);
  kvsimLogClear();
  const std::string longName(100, 'T');
  EXPECT_EQ(kvConnectTerminals(session, longName.c_str(), "StartTrigger"), kvsimErrInvalidTerminal);
  const kvsimCallRecord record = EntryAt(0);
  EXPECT_EQ(std::string(record.text), longName.substr(0, 63));
}

TEST_F(KvorCallLog, FailedCallsAreRecordedWithTheirStatus) {
  uint32_t session = 0;
  ASSERT_EQ(kvCreateSession("DB", "C", "", "CAN9", 0, &session), kvsimErrUnknownInterface);
  ASSERT_EQ(kvhdnCreateErrorSession(kvsimErrUnknownInterface, &session), 0);
  ASSERT_EQ(kvsimLogCount(), 2);
  const kvsimCallRecord failed = EntryAt(0);
  EXPECT_EQ(failed.object, 0u) << "no handle was made";
  EXPECT_EQ(failed.status, kvsimErrUnknownInterface);
  EXPECT_STREQ(failed.text, "CAN9");
  const kvsimCallRecord error = EntryAt(1);
  EXPECT_STREQ(error.function, "kvhdnCreateErrorSession");
  EXPECT_EQ(error.object, session);
  EXPECT_EQ(error.size1, static_cast<uint32_t>(kvsimErrUnknownInterface));
  EXPECT_EQ(error.status, 0);
}

TEST_F(KvorCallLog, ALongInterfaceNameIsCutAndTerminated) {
  const std::string name(100, 'N');
  uint32_t session = 0;
  ASSERT_EQ(kvCreateSession("", "", "", name.c_str(), 0, &session), kvsimErrUnknownInterface);
  EXPECT_EQ(std::string(EntryAt(0).text), name.substr(0, 63));
}

TEST_F(KvorCallLog, ControlsAreNotRecorded) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A");
  kvsimLogClear();
  const double value = 1.0;
  double read = 0;
  kvsimSetSignalValues(session, &value, 1);
  kvsimGetSignalValues(session, &read, 1);
  kvsimRaiseCondition(session, kvsimConditionTransmitComplete, 0);
  kvsimAdvanceClock(10);
  kvsimFailCall("kvClear", kvsimErrInternal, 1);
  kvsimClearFailures();
  kvsimHold("kvClear");
  kvsimRelease("kvClear");
  kvsimOpenSessionCount();
  kvsimCountCalls("kvClear");
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(KvorCallLog, CountsOfCallsAndOfPropertyReads) {
  const uint32_t session = Create("CAN1", kvMode_FrameOutQueued, "F1,F2");
  uint32_t value = 0;
  double tx = 0.25;
  for (int i = 0; i < 3; ++i) kvGetProperty(session, kvPropSession_NumInList, 4, &value);
  kvGetPropertySize(session, kvPropSession_NumInList, &value);
  kvGetProperty(session, kvPropSession_Mode, 4, &value);
  kvSetProperty(session, kvPropSession_QueueSize, 4, &value);
  kvSetSubProperty(session, 0, kvPropSessionSub_CANTxTime, 8, &tx);
  kvGetSubProperty(session, 0, kvPropSessionSub_CANTxTime, 8, &tx);
  kvGetSubProperty(session, 1, kvPropSessionSub_CANTxTime, 8, &tx);

  EXPECT_EQ(kvsimCountCalls("kvGetProperty"), 4);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 1);
  EXPECT_EQ(kvsimCountCalls("kvWait"), 0);
  EXPECT_EQ(kvsimCountCalls(nullptr), 0);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 4) << "three reads and a size";
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_Mode), 1);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_QueueSize), 0) << "a set is not a read";
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSessionSub_CANTxTime), 2) << "failed reads count too";
}

TEST_F(KvorCallLog, ClearingStartsTheLogAfresh) {
  Create("CAN1", kvMode_FrameInStream);
  Create("CAN2", kvMode_FrameInStream);
  ASSERT_EQ(kvsimLogCount(), 2);
  kvsimLogClear();
  EXPECT_EQ(kvsimLogCount(), 0);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
  Create("LIN1", kvMode_FrameInStream);
  ASSERT_EQ(kvsimLogCount(), 1);
  EXPECT_STREQ(EntryAt(0).text, "LIN1");
}

TEST_F(KvorCallLog, EntriesOutsideTheLogAreNotGiven) {
  Create("CAN1", kvMode_FrameInStream);
  kvsimCallRecord record;
  EXPECT_EQ(kvsimLogEntry(1, &record), 0);
  EXPECT_EQ(kvsimLogEntry(-1, &record), 0);
  EXPECT_EQ(kvsimLogEntry(0, nullptr), 0);
}

}  // namespace
