// State reads through the library: communication words unpacked into clusters, states handed on
// as they are, times by protocol, the blocking time trigger, and the FlexRay cycle and macrotick
// worked out from the driver stand-in's states and hidden timing properties.
#include <gtest/gtest.h>

#include <array>
#include <chrono>
#include <cstring>
#include <future>
#include <vector>

#include "core/timestamps.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "state/flexray_time_cache.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

constexpr int kNotWritten = -1;
constexpr uint8_t kUntouched = 0xEE;
constexpr int32_t kWarning = 0x3FF62001;
// A bus start well after 1904, so that times are absolute raw times.
constexpr uint64_t kStart = 133000000000000000ull;

struct tTimeRecord {
  uint64_t first, second;
  uint32_t flags, unused;
};

SvTime Converted(uint64_t value, bool ns) {
  SvTime time{};
  ns ? nKVSVAPI100::NsTimeToSvTime(&time, &value) : nKVSVAPI100::RawTimeToSvTime(&time, &value);
  return time;
}

void ExpectTime(const SvTime &actual, const SvTime &expected) {
  EXPECT_EQ(actual.seconds, expected.seconds);
  EXPECT_EQ(actual.fraction, expected.fraction);
}

// The latest logged call of `function`, or an empty record.
kvsimCallRecord LastCall(const char *function) {
  kvsimCallRecord record{};
  for (int32_t i = kvsimLogCount() - 1; i >= 0; --i) {
    if (kvsimLogEntry(i, &record) == 1 && std::strcmp(record.function, function) == 0)
      return record;
  }
  return kvsimCallRecord{};
}

class StateRead : public SlotFixture {
 protected:
  uint32_t Session(const char *interfaceName) {
    return MakeSession("", kvMode_FrameInStream, interfaceName);
  }

  template <class T>
  static void SetState(uint32_t session, uint32_t stateId, const T &value, uint32_t fault = 0) {
    ASSERT_EQ(kvsimSetState(session, stateId, sizeof value, &value, fault), 0);
  }
};

// Bytes 0 to 15 of a cluster: the fault word and its flag, then the fields from byte 5.
std::vector<int> Cluster(uint32_t fault, std::vector<int> fields) {
  std::vector<int> bytes = {int(fault & 0xFF), int(fault >> 8 & 0xFF), int(fault >> 16 & 0xFF),
                            int(fault >> 24), fault != 0 ? 1 : 0};
  bytes.insert(bytes.end(), fields.begin(), fields.end());
  bytes.resize(16, kNotWritten);
  return bytes;
}

void ExpectCluster(const std::array<uint8_t, 20> &cluster, const std::vector<int> &expected) {
  for (size_t i = 0; i < cluster.size(); ++i) {
    const int want = i < expected.size() && expected[i] != kNotWritten ? expected[i] : kUntouched;
    EXPECT_EQ(cluster[i], want) << "byte " << i;
  }
}

TEST_F(StateRead, CommunicationStatesAreUnpackedFieldByFieldWhateverTheStatus) {
  const uint32_t session = Session("CAN1");
  constexpr int _ = kNotWritten;
  constexpr uint32_t kFault = 0xCAFE0001;
  const auto can = kvsvReadStateCANComm, lin = kvsvReadStateLINComm;
  const auto flexRay = kvsvReadStateFlexRayComm, j1939 = kvsvReadStateJ1939Comm;
  const struct {
    kvsvStatus (*read)(uint32_t, void *);
    uint32_t stateId;
    std::vector<uint32_t> words;
    uint32_t fault;
    std::vector<int> cluster;
  } cases[] = {
      {can, kvState_CANComm, {0x12340531}, 0, Cluster(0, {1, 5, 0x12, 0x34, 1, 1})},
      {can, kvState_CANComm, {0xFEDCBA98}, kFault, Cluster(kFault, {8, 10, 0xFE, 0xDC, 1, 0})},
      {lin, kvState_LINComm, {0x4E6B3C49, 0x335A}, 7, Cluster(7, {2, 4, 60, 0x6B, 14, 0, 0, 0x5A})},
      {lin, kvState_LINComm, {0xC7A5B3DE, 0x01}, 0, Cluster(0, {3, 13, 0xB3, 0xA5, 7, 1, 1, 1})},
      {flexRay, kvState_FlexRayComm, {0xFFFFBEEF}, 0, Cluster(0, {15, 14, 0x1E, 1, 0})},
      {flexRay, kvState_FlexRayComm, {0x5A3C}, kFault, Cluster(kFault, {12, 3, 0x1A, 0, 1})},
      {j1939,
       kvState_J1939Comm,
       {0x44332211, 0x88776655, 0xCCBBAA99, 0xF1F0EEDD},
       2,
       Cluster(2, {_, _, _, 0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77, 0x88})},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.stateId << " " << c.words[0]);
    const auto size = static_cast<uint32_t>(c.words.size() * 4);
    ASSERT_EQ(kvsimSetState(session, c.stateId, size, c.words.data(), c.fault), 0);
    std::array<uint8_t, 20> cluster;
    cluster.fill(kUntouched);
    EXPECT_EQ(c.read(session, cluster.data()), 0);
    ExpectCluster(cluster, c.cluster);
    // A failed read leaves the work words as they were made: zeros reach the cluster.
    ASSERT_EQ(kvsimFailCall("kvReadState", kvsimErrInternal, 1), 0);
    EXPECT_EQ(c.read(session, cluster.data()), kvsimErrInternal);
    std::vector<int> zeros = c.cluster;
    for (int &byte : zeros) byte = byte == kNotWritten ? kNotWritten : 0;
    ExpectCluster(cluster, zeros);
    ASSERT_EQ(kvsimFailCall("kvReadState", kWarning, 1), 0);
    EXPECT_EQ(c.read(session, cluster.data()), kWarning);
    ExpectCluster(cluster, c.cluster);
  }
  const int32_t calls = kvsimCountCalls("kvReadState");
  EXPECT_EQ(kvsvReadStateLINComm(session, nullptr), kvErrNullArgument);
  EXPECT_EQ(kvsimCountCalls("kvReadState"), calls);
}

TEST_F(StateRead, StatisticsAndWordsGoStraightIntoTheBuffer) {
  const uint32_t session = Session("FlexRay1");
  std::array<uint8_t, 24> stats;
  for (size_t i = 0; i < stats.size(); ++i) stats[i] = static_cast<uint8_t>(0xA0 + i);
  SetState(session, kvState_FlexRayStats, stats);
  SetState(session, kvState_FlexRayComm, 0xDEADBEEFu);
  std::array<uint8_t, 24> read{};
  EXPECT_EQ(kvsvReadStateFlexRayStats(session, read.data()), 0);
  EXPECT_EQ(read, stats);
  uint32_t word = 0;
  EXPECT_EQ(kvsvReadStateU32(session, kvState_FlexRayComm, &word), 0);
  EXPECT_EQ(word, 0xDEADBEEFu);
  EXPECT_EQ(kvsvReadStateU32(session, 0x130099, &word), kvsimErrUnknownState);
}

TEST_F(StateRead, TimeIsARawTimeOnEveryProtocolWhateverTheStatus) {
  const uint32_t session = Session("ENET1");
  SetState(session, kvState_TimeStart, kStart + 12345678);
  SvTime time{1, 1};
  EXPECT_EQ(kvsvReadStateTime(session, kvState_TimeStart, &time), 0);
  ExpectTime(time, Converted(kStart + 12345678, false));
  ASSERT_EQ(kvsimFailCall("kvReadState", kvsimErrInternal, 1), 0);
  EXPECT_EQ(kvsvReadStateTime(session, kvState_TimeStart, &time), kvsimErrInternal);
  ExpectTime(time, SvTime{});
  EXPECT_EQ(kvsvReadStateTime(session, kvState_TimeStart, nullptr), kvErrInternal);
}

TEST_F(StateRead, Time2ReadsTheFormOfTheSessionsProtocolAndClearsOnFailure) {
  const uint32_t can = Session("CAN1");
  const uint32_t ethernet = Session("ENET1");
  SetState(can, kvState_TimeStart, kStart + 1);
  SetState(can, kvState_TimeCurrent, kStart + 2);
  const tTimeRecord flagged = {1600000000123456789ull, 1600000000987654321ull, 0xFFFFFFF3, 0};
  SetState(ethernet, kvState_TimeStartLong, flagged);
  SetState(ethernet, kvState_TimeCommLong, tTimeRecord{5, 6, 0xFFFFFFFE, 0});
  const struct {
    uint32_t session, stateId, readId, size;
    uint64_t first, second;
    uint8_t flag;
    const char *failing;  // the driver function made to fail; with no state read, the protocol
    int32_t status;
  } cases[] = {
      {can, kvState_TimeStartLong, kvState_TimeStart, 8, kStart + 1, 0, 0, nullptr, 0},
      {can, kvState_TimeCurrent, kvState_TimeCurrent, 8, kStart + 2, 0, 0, nullptr, 0},
      {ethernet, kvState_TimeStartLong, kvState_TimeStartLong, 24, flagged.first, flagged.second, 1,
       nullptr, 0},
      {ethernet, kvState_TimeCommLong, kvState_TimeCommLong, 24, 5, 6, 0, nullptr, 0},
      {ethernet, kvState_TimeCommLong, kvState_TimeCommLong, 24, 5, 6, 0, "kvReadState", kWarning},
      {can, kvState_TimeStart, kvState_TimeStart, 8, 0, 0, 0, "kvReadState", kvsimErrOutOfMemory},
      {can, kvState_TimeStart, 0, 0, 0, 0, 0, "kvGetProperty", kvsimErrInternal},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.stateId << " " << c.status);
    if (c.failing != nullptr) {
      ASSERT_EQ(c.readId == 0 ? kvsimFailProperty(c.failing, kvPropSession_Protocol, c.status, 1)
                              : kvsimFailCall(c.failing, c.status, 1),
                0);
    }
    kvsimLogClear();
    SvTime first{7, 7}, second{7, 7};
    uint8_t flag = 7;
    EXPECT_EQ(kvsvReadStateTime2(c.session, c.stateId, &first, &second, &flag), c.status);
    ExpectTime(first, Converted(c.first, c.session == ethernet));
    ExpectTime(second, Converted(c.second, c.session == ethernet));
    EXPECT_EQ(flag, c.flag);
    const kvsimCallRecord call = LastCall("kvReadState");
    EXPECT_EQ(call.propertyId, c.readId);
    EXPECT_EQ(call.size1, c.size);
  }
  SvTime time{};
  uint8_t flag = 0;
  kvsimLogClear();
  EXPECT_EQ(kvsvReadStateTime2(can, kvState_TimeStart, nullptr, &time, &flag), kvErrInternal);
  EXPECT_EQ(kvsvReadStateTime2(can, kvState_TimeStart, &time, nullptr, &flag), kvErrInternal);
  EXPECT_EQ(kvsvReadStateTime2(can, kvState_TimeStart, &time, &time, nullptr), kvErrInternal);
  EXPECT_EQ(kvsimCountCalls("kvReadState"), 0);
}

TEST_F(StateRead, TimeTriggerBlocksUntilTheClockReachesTheTrigger) {
  const uint32_t can = Session("CAN1");
  const uint32_t ethernet = Session("ENET1");
  kvsimSetClock(kStart);
  const tTimeRecord record = {kStart + 500, kStart + 900, 1, 0};
  for (uint32_t session : {can, ethernet}) {
    SCOPED_TRACE(session);
    svsimReset();
    ASSERT_EQ(kvsimSetTimeTrigger(session, kvsimClock() + 1000, &record), 0);
    SvTime first{}, second{};
    uint8_t flag = 0;
    auto read = std::async(std::launch::async, [&] {
      return kvsvReadStateTimeTrigger(session, &first, &second, &flag, -1.0);
    });
    ASSERT_EQ(kvsimWaitBlocked("kvReadStateTimeTrigger", 1), 1);
    kvsimAdvanceClock(999);
    EXPECT_EQ(read.wait_for(std::chrono::seconds(0)), std::future_status::timeout);
    kvsimAdvanceClock(1);
    EXPECT_EQ(read.get(), 0);
    ExpectTime(first, Converted(record.first, session == ethernet));
    ExpectTime(second, Converted(record.second, session == ethernet));
    EXPECT_EQ(flag, 1);
    EXPECT_EQ(LastCall("kvReadStateTimeTrigger").size1, 24u);
    uint64_t argument = 0;
    int32_t mode = 0;
    ASSERT_EQ(svsimLastCleanup(nullptr, &argument, &mode), 1);
    EXPECT_EQ(argument, session);
    EXPECT_EQ(mode, 6);
  }
}

TEST_F(StateRead, TimeTriggerRegistersTheAbortOnlyForATimeLimitAndClearsOnFailure) {
  const tTimeRecord record = {kStart, 0, 0, 0};
  const struct {
    bool armed, protocolFails;
    double timeout;
    int32_t status;
    int32_t registrations;
  } cases[] = {
      {true, false, 0.0, 0, 0},
      {true, false, 2.0, 0, 1},
      {false, false, 0.0, kvsimErrTimeout, 0},
      {false, false, 0.01, kvsimErrTimeout, 1},
      {true, true, 5.0, kvsimErrInternal, 0},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.timeout << " " << c.status);
    svsimReset();
    uint32_t session = 0;
    ASSERT_EQ(kvCreateSession(":memory:", "", "", "CAN2", kvMode_FrameInStream, &session), 0);
    if (c.armed) {
      ASSERT_EQ(kvsimSetTimeTrigger(session, 0, &record), 0);
    }
    if (c.protocolFails) {
      ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_Protocol, c.status, 1), 0);
    }
    SvTime first{9, 9}, second{9, 9};
    uint8_t flag = 9;
    EXPECT_EQ(kvsvReadStateTimeTrigger(session, &first, &second, &flag, c.timeout), c.status);
    EXPECT_EQ(svsimCleanupRegistrations(), c.registrations);
    // A failed protocol read leaves the outputs; a failed trigger read clears them.
    const bool kept = c.protocolFails;
    ExpectTime(first, kept ? SvTime{9, 9} : Converted(c.status == 0 ? kStart : 0, false));
    ExpectTime(second, kept ? SvTime{9, 9} : SvTime{});
    EXPECT_EQ(flag, kept ? 9 : 0);
  }
}

class FlexRayTime : public StateRead {
 protected:
  void SetUp() override {
    StateRead::SetUp();
    session_ = Session("FlexRay1");
  }

  // A cycle of `cycleLength` microseconds of `macroticks` macroticks, cycle 0 shifted by `offset`
  // macroticks, the bus started at `start` when the driver's last cycle was `lastCycle`.
  void Bus(uint32_t cycleLength, uint32_t macroticks, uint32_t offset, uint32_t lastCycle,
           uint64_t start = kStart) {
    const uint8_t known = 1;
    ASSERT_EQ(kvSetProperty(session_, 0x0210FFFA, 1, &known), 0);
    ASSERT_EQ(kvSetProperty(session_, 0x0010FFFE, 4, &cycleLength), 0);
    ASSERT_EQ(kvSetProperty(session_, 0x0010FFFD, 4, &macroticks), 0);
    ASSERT_EQ(kvSetProperty(session_, 0x0010FFFA, 4, &offset), 0);
    SetState(session_, kvState_FlexRayComm, lastCycle << 24 | 0x00ABCDEF);
    SetState(session_, kvState_TimeStart, start);
  }

  kvsvStatus Read(uint64_t now, uint32_t session = 0) {
    SetState(session_, kvState_TimeCurrent, now);
    cycle_ = 0xEE;
    macrotick_ = 0xEEEE;
    return kvsvReadStateFlexRayTime(session != 0 ? session : session_, &cycle_, &macrotick_);
  }

  const nKVSVAPI100::tFlexRayTimeCache *Cache() {
    return static_cast<const nKVSVAPI100::tFlexRayTimeCache *>(Slot(session_)->flexRayTimeCache);
  }

  uint32_t session_ = 0;
  uint8_t cycle_ = 0;
  uint16_t macrotick_ = 0;
};

TEST_F(FlexRayTime, CycleAndMacrotickFromTheStartTime) {
  // A 5000 us cycle is 50000 raw units of 5000 macroticks of 10; offset 3 puts cycle 0 at
  // start + 50000 - 40 - 30, offset 5000 at start + 2^32 - 40 (the 32-bit difference wraps).
  const uint64_t zero = 49930, wrapped = 0xFFFFFFD8ull;
  const struct {
    uint32_t offset, lastCycle;
    uint64_t sinceStart;
    uint8_t cycle;
    uint16_t macrotick;
  } cases[] = {
      {3, 62, zero, 63, 0},
      {3, 62, zero + 2 * 50000 + 1234, 1, 123},
      {3, 62, zero + 2 * 50000 + 1235, 1, 124},  // half a macrotick rounds up
      {3, 0x3F + 0x40, zero + 49999, 0, 5000},
      {3, 255, zero + 64 * 50000 + 4, 0, 0},
      {5000, 1, wrapped + 3 * 50000 + 7, 5, 1},
  };
  uint64_t start = kStart;
  int32_t starts = 0;
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.offset << " " << c.sinceStart);
    start += 1000000000;  // a new start of the bus: its timing is read again, once
    Bus(5000, 5000, c.offset, c.lastCycle, start);
    EXPECT_EQ(Read(start + c.sinceStart + 50000), 0);
    const int32_t stateReads = kvsimCountCalls("kvReadState");
    EXPECT_EQ(Read(start + c.sinceStart), 0);
    EXPECT_EQ(cycle_, c.cycle);
    EXPECT_EQ(macrotick_, c.macrotick);
    EXPECT_EQ(kvsimCountCalls("kvReadState"), stateReads + 2);
    ++starts;
    for (uint32_t id : {0x0210FFFAu, 0x0010FFFEu, 0x0010FFFDu, 0x0010FFFAu}) {
      EXPECT_EQ(kvsimCountPropertyReads(id), starts) << std::hex << id;
    }
  }
}

TEST_F(FlexRayTime, FailuresLeaveBothOutputsZeroAndNoTimingKept) {
  uint32_t noSlot = 0;
  ASSERT_EQ(kvCreateSession(":memory:", "", "", "FlexRay2", kvMode_FrameInStream, &noSlot), 0);
  const struct {
    uint64_t start, now;
    uint32_t property, value;  // a timing property set after the good ones
    bool busy;
    uint32_t session;
    const char *failing;
    int32_t status;
    bool cacheMade;  // empty; else none at all
  } cases[] = {
      {0, kStart, 0, 0, false, 0, nullptr, kvErrFlexRayTimeInvalid, false},
      {kStart, 0, 0, 0, false, 0, nullptr, kvErrFlexRayTimeInvalid, false},
      {kStart, kStart, 0, 0, true, 0, nullptr, kvErrSessionBusy, false},
      {kStart, kStart, 0, 0, false, noSlot, nullptr, kvErrInvalidSession, false},
      {kStart, kStart, 0, 0, false, 0, "kvReadState", kvsimErrInternal, false},
      {kStart, kStart, 0, 0, false, 0, "kvGetProperty", kvsimErrInternal, true},
      {kStart, kStart, 0x0210FFFA, 0, false, 0, nullptr, kvErrFlexRayTimeUnknown, true},
      {kStart, kStart, 0x0010FFFE, 0, false, 0, nullptr, kvErrFlexRayTimeInvalid, true},
      {kStart, kStart, 0x0010FFFD, 0, false, 0, nullptr, kvErrFlexRayTimeInvalid, true},
      // 50 raw units cannot hold 51 macroticks: a macrotick of 0 is refused, not divided by.
      {kStart, kStart, 0x0010FFFD, 51, false, 0, nullptr, kvErrFlexRayTimeInvalid, true},
      {kStart, kStart, 0x0010FFFE, 0x80000000u, false, 0, nullptr, kvErrFlexRayTimeInvalid, true},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.status << " " << std::hex << c.property);
    Bus(5, 5, 0, 0, c.start);
    if (c.property != 0) {
      ASSERT_EQ(kvSetProperty(session_, c.property, c.property >> 24 == 2 ? 1 : 4, &c.value), 0);
    }
    Slot(session_)->guard.store(c.busy ? 1 : 0);
    if (c.failing != nullptr) {
      ASSERT_EQ(kvsimFailCall(c.failing, c.status, 1), 0);
    }
    EXPECT_EQ(Read(c.now, c.session), c.status);
    EXPECT_EQ(cycle_, 0);
    EXPECT_EQ(macrotick_, 0);
    ASSERT_EQ(Cache() != nullptr, c.cacheMade);
    if (c.cacheMade) {
      EXPECT_EQ(Cache()->startTime, 0u);
    }
  }
  Slot(session_)->guard.store(0);
  Bus(5, 5, 0, 0);
  EXPECT_EQ(Read(kStart + 100), 0) << "the next call works the timing out again";
  EXPECT_EQ(Cache()->startTime, kStart);
  EXPECT_EQ(kvsvReadStateFlexRayTime(session_, nullptr, &macrotick_), kvErrNullArgument);
}

}  // namespace
