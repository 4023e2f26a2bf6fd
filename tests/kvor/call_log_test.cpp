// The call log: each driver call with its arguments and result, in order of entry; controls are
// not driver calls and stay out of it.
#include <cstring>
#include <string>

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
  ASSERT_EQ(kvCreateSession("DB", "C", "", "CAN9", 0, &session), kvsimErrUnknownInterface);
  ASSERT_EQ(kvCreateSession("DB", "C", "A,B", "CAN2", kvMode_SignalInSinglePoint, &session), 0);
  uint32_t count = 0;
  ASSERT_EQ(kvGetProperty(session, kvPropSession_NumInList, 4, &count), 0);
  double tx = 0.5;
  ASSERT_EQ(kvSetSubProperty(session, 1, kvPropSessionSub_CANTxTime, 8, &tx), 0);
  ASSERT_EQ(kvGetPropertySize(session, kvPropSession_IntfBaudRate, &count),
            kvsimErrPropertyUnknown);
  ASSERT_EQ(kvStop(session, 7), kvsimErrInvalidScope);
  uint32_t error = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(kvsimErrUnknownInterface, &error), 0);
  ASSERT_EQ(kvdbCloseDatabase(session, 1), kvsimErrInvalidDatabase);
  EXPECT_EQ(kvsimOpenSessionCount(), 2) << "a session handle is not closed as a database";

  const struct {
    const char *function;
    uint32_t object, propertyId, size1, size2;
    int32_t status;
    const char *text;
  } expected[] = {
      {"kvCreateSession", 0, 0, 0, 0, kvsimErrUnknownInterface, "CAN9"},
      {"kvCreateSession", session, 0, kvMode_SignalInSinglePoint, 0, 0, "CAN2"},
      {"kvGetProperty", session, kvPropSession_NumInList, 4, 0, 0, ""},
      {"kvSetSubProperty", session, kvPropSessionSub_CANTxTime, 8, 1, 0, ""},
      {"kvGetPropertySize", session, kvPropSession_IntfBaudRate, 0, 0, kvsimErrPropertyUnknown, ""},
      {"kvStop", session, 0, 7, 0, kvsimErrInvalidScope, ""},
      {"kvhdnCreateErrorSession", error, 0, static_cast<uint32_t>(kvsimErrUnknownInterface), 0, 0,
       ""},
      {"kvdbCloseDatabase", session, 0, 1, 0, kvsimErrInvalidDatabase, ""},
  };
  ASSERT_EQ(kvsimLogCount(), static_cast<int32_t>(std::size(expected)));
  for (size_t i = 0; i < std::size(expected); ++i) {
    const kvsimCallRecord record = EntryAt(static_cast<int32_t>(i));
    SCOPED_TRACE(testing::Message() << i << ' ' << record.function);
    EXPECT_STREQ(record.function, expected[i].function);
    EXPECT_EQ(record.object, expected[i].object);
    EXPECT_EQ(record.propertyId, expected[i].propertyId);
    EXPECT_EQ(record.size1, expected[i].size1);
    EXPECT_EQ(record.size2, expected[i].size2);
    EXPECT_EQ(record.status, expected[i].status);
    EXPECT_STREQ(record.text, expected[i].text);
  }
}

TEST_F(KvorCallLog, TextsAreCutTo63BytesAndANullNameIsEmpty) {
  const std::string longName(100, 'N');
  uint32_t session = 0;
  ASSERT_EQ(kvCreateSession("", "", "", longName.c_str(), 0, &session), kvsimErrUnknownInterface);
  ASSERT_EQ(kvCreateSession("", "", "", "CAN1", kvMode_FrameInStream, &session), 0);
  EXPECT_EQ(kvConnectTerminals(session, longName.c_str(), "StartTrigger"), kvsimErrInvalidTerminal);
  EXPECT_EQ(kvDisconnectTerminals(session, nullptr, "FrontPanel0"), kvsimErrNullPointer);
  EXPECT_EQ(std::string(EntryAt(0).text), longName.substr(0, 63));
  EXPECT_EQ(std::string(EntryAt(2).text), longName.substr(0, 63));
  EXPECT_STREQ(EntryAt(3).text, " -> FrontPanel0");
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
  const uint32_t session = Create("CAN1", kvMode_SignalOutSinglePoint, "F1,F2");
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

  kvsimLogClear();
  EXPECT_EQ(kvsimLogCount(), 0);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
  Create("LIN1", kvMode_FrameInStream);
  ASSERT_EQ(kvsimLogCount(), 1);
  EXPECT_STREQ(EntryAt(0).text, "LIN1");
  kvsimCallRecord record;
  EXPECT_EQ(kvsimLogEntry(1, &record), 0);
  EXPECT_EQ(kvsimLogEntry(-1, &record), 0);
  EXPECT_EQ(kvsimLogEntry(0, nullptr), 0);
}

}  // namespace
