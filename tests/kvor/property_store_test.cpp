// Session properties: any identifier stores the bytes set and gives them back, with the size
// rules of a driver; the definition's own properties cannot be set.
#include <algorithm>
#include <utility>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorSessionProperties = KvorTest;

using Bytes = std::vector<uint8_t>;

TEST_F(KvorSessionProperties, ValuesOfEveryTypeComeBackAsSetForTheirSessionOnly) {
  const uint32_t session = Create("CAN1", kvMode_SignalOutSinglePoint, "F1,F2");
  const uint32_t other = Create("CAN1", kvMode_SignalOutSinglePoint, "F1,F2");
  const struct {
    uint32_t id;
    Bytes value;
    size_t size;  // what the driver keeps: a text gets its NUL
  } cases[] = {
      {kvPropSession_IntfBaudRate, Bytes{0x20, 0xA1, 0x07, 0x00}, 4},
      {kvPropSession_ResampRate, Bytes{1, 2, 3, 4, 5, 6, 7, 8}, 8},
      {kvPropSession_AutoStart, Bytes{1}, 1},
      {kvPropSession_IntfEnetMacAddress, Bytes{'0', '2', ':', 'A', 'F', 0}, 6},
      {kvPropSession_EnetLogFile, Bytes{'c', 'a', 'p', '.', 'l', 'o', 'g'}, 8},
      {kvPropSession_IntfLINSchedNames, Bytes{'S', '1', ',', 'S', '2', 0}, 6},
      {kvPropSession_J1939ECU, Bytes{0x11, 0x22, 0x33, 0x44}, 4},
      {kvPropSession_IntfBaudRate64, Bytes{8, 7, 6, 5, 4, 3, 2, 1}, 8},
      {kvPropSession_IntfCANOutStrmListById, Bytes{1, 0, 0, 0, 2, 0, 0, 0, 3, 0}, 10},
      {kvPropSession_IntfEnetEptReceiveFilter, Bytes{9, 8, 7}, 3},
      {0x7F10ABCDu, Bytes{0xCA, 0xFE, 0xBA, 0xBE, 0x99}, 5},
      {kvPropSession_IntfOutStrmList, Bytes{}, 0},
  };
  const Bytes longer(32, 'L');
  for (const auto &c : cases) {
    // A longer value first: the later set must replace it whatever its size.
    const uint32_t type = c.id >> 24;
    if (type != 0x00 && type != 0x01 && type != 0x02 && type != 0x05 && type != 0x09) {
      ASSERT_EQ(kvSetProperty(session, c.id, 32, longer.data()), 0) << std::hex << c.id;
    }
    ASSERT_EQ(kvSetProperty(session, c.id, static_cast<uint32_t>(c.value.size()), c.value.data()),
              0)
        << std::hex << c.id;
  }
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.id);
    uint32_t size = 0xFFFF;
    ASSERT_EQ(kvGetPropertySize(session, c.id, &size), 0);
    EXPECT_EQ(size, c.size);
    Bytes read(c.size + 4, 0xEE);
    ASSERT_EQ(kvGetProperty(session, c.id, static_cast<uint32_t>(read.size()), read.data()), 0);
    EXPECT_TRUE(std::equal(c.value.begin(), c.value.end(), read.begin()));
    if (c.size > c.value.size()) {
      EXPECT_EQ(read[c.value.size()], 0) << "the NUL that was added";
    }
    EXPECT_EQ(read[c.size], 0xEE) << "nothing written past the value";
    EXPECT_EQ(kvGetPropertySize(other, c.id, &size), kvsimErrPropertyUnknown) << "never set";
    EXPECT_EQ(kvGetProperty(other, c.id, 64, read.data()), kvsimErrPropertyUnknown);
  }
}

TEST_F(KvorSessionProperties, RefusedReadsAndSetsChangeNothing) {
  const uint32_t session = Create("CAN2", kvMode_SignalInSinglePoint, "Alpha,Beta");
  const uint32_t baud = 500000;
  ASSERT_EQ(kvSetProperty(session, kvPropSession_IntfBaudRate, 4, &baud), 0);
  // A buffer one byte short of the value.
  for (const auto &[id, needed] : {std::pair<uint32_t, uint32_t>{kvPropSession_IntfBaudRate, 4},
                                   {kvPropSession_Mode, 4},
                                   {kvPropSession_List, sizeof "Alpha,Beta"},
                                   {kvPropSession_IntfName, sizeof "CAN2"}}) {
    SCOPED_TRACE(testing::Message() << std::hex << id);
    Bytes buffer(needed, 0xEE);
    EXPECT_EQ(kvGetProperty(session, id, needed - 1, buffer.data()), kvsimErrBufferTooSmall);
    EXPECT_EQ(buffer, Bytes(needed, 0xEE));
    EXPECT_EQ(kvGetProperty(session, id, 0, nullptr), kvsimErrBufferTooSmall);
    EXPECT_EQ(kvGetProperty(session, id, needed, buffer.data()), 0);
  }
  // A fixed-size type takes exactly its size; a refused value is not stored.
  const uint8_t bytes[16] = {};
  for (const auto &[id, size] : {std::pair<uint32_t, uint32_t>{kvPropSession_ResampRate, 4},
                                 {kvPropSession_IntfBaudRate, 2},
                                 {kvPropSession_IntfBaudRate, 8},
                                 {kvPropSession_AutoStart, 4},
                                 {kvPropSession_IntfBaudRate64, 4},
                                 {kvPropSession_J1939ECU, 0}}) {
    SCOPED_TRACE(testing::Message() << std::hex << id << " size " << std::dec << size);
    EXPECT_EQ(kvSetProperty(session, id, size, bytes), kvsimErrPropertySize);
    if (id != kvPropSession_IntfBaudRate) {
      uint32_t stored = 0;
      EXPECT_EQ(kvGetPropertySize(session, id, &stored), kvsimErrPropertyUnknown);
    }
  }
  EXPECT_EQ(ReadU32(session, kvPropSession_IntfBaudRate), baud);
  // The session's definition cannot be set.
  for (uint32_t id :
       {kvPropSession_Mode, kvPropSession_NumInList, kvPropSession_Protocol, kvPropSession_List,
        kvPropSession_IntfName, kvPropSession_DatabaseName, kvPropSession_ClusterName}) {
    EXPECT_EQ(kvSetProperty(session, id, 4, bytes), kvsimErrPropertyReadOnly) << std::hex << id;
  }
  EXPECT_EQ(ReadU32(session, kvPropSession_Mode), 0u);
  EXPECT_EQ(ReadU32(session, kvPropSession_NumInList), 2u);
  EXPECT_EQ(ReadText(session, kvPropSession_List), "Alpha,Beta");
  EXPECT_EQ(ReadText(session, kvPropSession_IntfName), "CAN2");
  EXPECT_EQ(kvGetPropertySize(session, kvPropSession_Mode, nullptr), kvsimErrNullPointer);
  EXPECT_EQ(kvGetProperty(session, kvPropSession_Mode, 4, nullptr), kvsimErrNullPointer);
  EXPECT_EQ(kvSetProperty(session, kvPropSession_IntfBaudRate, 4, nullptr), kvsimErrNullPointer);
  EXPECT_EQ(kvSetSubProperty(session, 0, kvPropSessionSub_CANTxTime, 8, nullptr),
            kvsimErrNullPointer);
}

TEST_F(KvorSessionProperties, SubPropertiesBelongToOneItemOfTheList) {
  const uint32_t session = Create("CAN1", kvMode_SignalOutSinglePoint, "F1,F2,F3");
  const double times[] = {0.010, 0.020, 0.030};
  for (uint32_t index = 0; index < 3; ++index) {
    ASSERT_EQ(kvSetSubProperty(session, index, kvPropSessionSub_CANTxTime, 8, &times[index]), 0);
  }
  double read = -1;
  for (uint32_t index = 0; index < 3; ++index) {
    ASSERT_EQ(kvGetSubProperty(session, index, kvPropSessionSub_CANTxTime, 8, &read), 0);
    EXPECT_EQ(read, times[index]) << index;
    EXPECT_EQ(kvGetSubProperty(session, index, kvPropSessionSub_CANTxTime, 7, &read),
              kvsimErrBufferTooSmall);
  }
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(session, kvPropSessionSub_CANTxTime, &size), kvsimErrPropertyUnknown)
      << "a per-item value is not the session's plain value";
  EXPECT_EQ(kvGetSubProperty(session, 0, kvPropSessionSub_SkipNCyclicFrames, 4, &read),
            kvsimErrPropertyUnknown);
  EXPECT_EQ(kvGetSubProperty(session, 3, kvPropSessionSub_CANTxTime, 8, &read),
            kvsimErrInvalidSubIndex);
  EXPECT_EQ(kvSetSubProperty(session, 3, kvPropSessionSub_CANTxTime, 8, &times[0]),
            kvsimErrInvalidSubIndex);
  EXPECT_EQ(kvSetSubProperty(session, 1, kvPropSessionSub_CANTxTime, 4, &times[0]),
            kvsimErrPropertySize);
}

}  // namespace
