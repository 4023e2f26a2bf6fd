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
#include "session/session_slot.h"
#include "state/flexray_time_cache.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

using nKVSVAPI100::tFlexRayTimeCache;

constexpr uint8_t kUntouched = 0xEE;
constexpr int kNotWritten = -1;
// A bus start well after 1904, so that times are absolute raw times.
constexpr uint64_t kStart = 133000000000000000ull;

struct tTimeRecord {
  uint64_t first;
  uint64_t second;
  uint32_t flags;
  uint32_t unused;
};

SvTime Raw(uint64_t value) {
  SvTime time{};
  nKVSVAPI100::RawTimeToSvTime(&time, &value);
  return time;
}

SvTime Ns(uint64_t value) {
  SvTime time{};
  nKVSVAPI100::NsTimeToSvTime(&time, &value);
  return time;
}

void ExpectTime(const SvTime &actual, const SvTime &expected) {
  EXPECT_EQ(actual.seconds, expected.seconds);
  EXPECT_EQ(actual.fraction, expected.fraction);
}

kvsimCallRecord LastCall(const char *function) {
  kvsimCallRecord record{};
  for (int32_t i = kvsimLogCount() - 1; i >= 0; --i) {
    if (kvsimLogEntry(i, &record) == 1 && std::strcmp(record.function, function) == 0) break;
  }
  return record;
}

class StateRead : public SlotFixture {
 protected:
  uint32_t Session(const char *interfaceName) {
    return MakeSession("", kvMode_FrameInStream, interfaceName);
  }

  static void SetWord(uint32_t session, uint32_t stateId, uint32_t word, uint32_t fault = 0) {
    ASSERT_EQ(kvsimSetState(session, stateId, sizeof word, &word, fault), 0);
  }

  static void SetTime(uint32_t session, uint32_t stateId, uint64_t time) {
    ASSERT_EQ(kvsimSetState(session, stateId, sizeof time, &time, 0), 0);
  }

  static void SetProperty(uint32_t session, uint32_t id, uint32_t value) {
    const uint32_t size = (id >> 24) == 0x02 ? 1 : 4;
    ASSERT_EQ(kvSetProperty(session, id, size, &value), 0);
  }
};

using tCommRead = kvsvStatus (*)(uint32_t, void *);

struct tCommCase {
  const char *name;
  tCommRead read;
  uint32_t stateId;
  std::vector<uint8_t> state;
  uint32_t fault;
  std::vector<int> expected;  // bytes 0 to 15 of the cluster, kNotWritten for untouched
};

std::vector<int> Cluster(uint32_t fault, std::vector<int> fields) {
  std::vector<int> bytes = {int(fault & 0xFF), int(fault >> 8 & 0xFF), int(fault >> 16 & 0xFF),
                            int(fault >> 24), fault != 0 ? 1 : 0};
  bytes.insert(bytes.end(), fields.begin(), fields.end());
  bytes.resize(16, kNotWritten);
  return bytes;
}

std::vector<uint8_t> Words(std::vector<uint32_t> words) {
  std::vector<uint8_t> bytes(words.size() * 4);
  std::memcpy(bytes.data(), words.data(), bytes.size());
  return bytes;
}

const std::vector<tCommCase> &CommCases() {
  constexpr int _ = kNotWritten;
  static const std::vector<tCommCase> cases = {
      {"CAN", kvsvReadStateCANComm, kvState_CANComm, Words({0x12340531}), 0,
       Cluster(0, {1, 5, 0x12, 0x34, 1, 1})},
      {"CAN masked", kvsvReadStateCANComm, kvState_CANComm, Words({0xFEDCBA98}), 0xCAFE0001,
       Cluster(0xCAFE0001, {0x8, 0xA, 0xFE, 0xDC, 1, 0})},
      {"LIN", kvsvReadStateLINComm, kvState_LINComm, Words({0x4E6B3C49, 0x7788995A}), 7,
       Cluster(7, {2, 4, 0x3C, 0x6B, 0x0E, 0, 0, 0x5A})},
      {"LIN high bits", kvsvReadStateLINComm, kvState_LINComm, Words({0xC7A5B3DE, 0x01}), 0,
       Cluster(0, {3, 0xD, 0xB3, 0xA5, 0x07, 1, 1, 0x01})},
      {"FlexRay", kvsvReadStateFlexRayComm, kvState_FlexRayComm, Words({0xFFFFBEEF}), 0,
       Cluster(0, {0xF, 0xE, 0x1E, 1, 0})},
      {"FlexRay low bits", kvsvReadStateFlexRayComm, kvState_FlexRayComm, Words({0x00005A3C}),
       0x100, Cluster(0x100, {0xC, 0x3, 0x1A, 0, 1})},
      {"J1939",
       kvsvReadStateJ1939Comm,
       kvState_J1939Comm,
       {0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77, 0x88, 0x99, 0xAA, 0xBB, 0xCC, 0xDD, 0xEE, 0xF0,
        0xF1},
       2,
       Cluster(2, {_, _, _, 0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77, 0x88})},
  };
  return cases;
}

void ExpectCluster(const std::array<uint8_t, 20> &cluster, const std::vector<int> &expected) {
  for (size_t i = 0; i < cluster.size(); ++i) {
    const int want = i < expected.size() && expected[i] != kNotWritten ? expected[i] : kUntouched;
    EXPECT_EQ(cluster[i], want) << "byte " << i;
  }
}

TEST_F(StateRead, CommunicationWordsAreUnpackedFieldByField) {
  const uint32_t session = Session("CAN1");
  for (const tCommCase &c : CommCases()) {
    SCOPED_TRACE(c.name);
    ASSERT_EQ(kvsimSetState(session, c.stateId, static_cast<uint32_t>(c.state.size()),
                            c.state.data(), c.fault),
              0);
    std::array<uint8_t, 20> cluster;
    cluster.fill(kUntouched);
    EXPECT_EQ(c.read(session, cluster.data()), 0);
    ExpectCluster(cluster, c.expected);
  }
}

TEST_F(StateRead, AFailedCommunicationReadUnpacksWhatTheDriverLeft) {
  const uint32_t session = Session("CAN1");
  constexpr int32_t kWarning = 0x3FF62001;
  for (const tCommCase &c : CommCases()) {
    SCOPED_TRACE(c.name);
    ASSERT_EQ(kvsimSetState(session, c.stateId, static_cast<uint32_t>(c.state.size()),
                            c.state.data(), c.fault),
              0);
    std::array<uint8_t, 20> cluster;
    cluster.fill(kUntouched);
    ASSERT_EQ(kvsimFailCall("kvReadState", kvsimErrInternal, 1), 0);
    EXPECT_EQ(c.read(session, cluster.data()), kvsimErrInternal);
    std::vector<int> zeros = c.expected;
    for (int &byte : zeros) byte = byte == kNotWritten ? kNotWritten : 0;
    ExpectCluster(cluster, zeros);
    ASSERT_EQ(kvsimFailCall("kvReadState", kWarning, 1), 0);
    EXPECT_EQ(c.read(session, cluster.data()), kWarning);
    ExpectCluster(cluster, c.expected);
  }
  const int32_t calls = kvsimCountCalls("kvReadState");
  EXPECT_EQ(kvsvReadStateCANComm(session, nullptr), kvErrNullArgument);
  EXPECT_EQ(kvsimCountCalls("kvReadState"), calls);
}

TEST_F(StateRead, StatisticsAndWordsGoStraightIntoTheBuffer) {
  const uint32_t session = Session("FlexRay1");
  std::array<uint8_t, 24> stats;
  for (size_t i = 0; i < stats.size(); ++i) stats[i] = static_cast<uint8_t>(0xA0 + i);
  ASSERT_EQ(kvsimSetState(session, kvState_FlexRayStats, 24, stats.data(), 0), 0);
  SetWord(session, kvState_FlexRayComm, 0xDEADBEEF);
  std::array<uint8_t, 24> read{};
  EXPECT_EQ(kvsvReadStateFlexRayStats(session, read.data()), 0);
  EXPECT_EQ(read, stats);
  uint32_t word = 0;
  EXPECT_EQ(kvsvReadStateU32(session, kvState_FlexRayComm, &word), 0);
  EXPECT_EQ(word, 0xDEADBEEFu);
  EXPECT_EQ(LastCall("kvReadState").size1, 4u);
  EXPECT_EQ(kvsvReadStateU32(session, 0x130099, &word), kvsimErrUnknownState);
}

TEST_F(StateRead, TimeIsARawTimeWhateverTheStatus) {
  const uint32_t session = Session("ENET1");
  const uint64_t raw = kStart + 12345678;
  SetTime(session, kvState_TimeStart, raw);
  SvTime time{1, 1};
  EXPECT_EQ(kvsvReadStateTime(session, kvState_TimeStart, &time), 0);
  ExpectTime(time, Raw(raw));
  time = {1, 1};
  ASSERT_EQ(kvsimFailCall("kvReadState", kvsimErrInternal, 1), 0);
  EXPECT_EQ(kvsvReadStateTime(session, kvState_TimeStart, &time), kvsimErrInternal);
  ExpectTime(time, SvTime{});
  EXPECT_EQ(kvsvReadStateTime(session, kvState_TimeStart, nullptr), kvErrInternal);
}

TEST_F(StateRead, Time2ReadsTheFormOfTheSessionsProtocol) {
  const uint32_t can = Session("CAN1");
  const uint32_t ethernet = Session("ENET1");
  SetTime(can, kvState_TimeStart, kStart + 1);
  SetTime(can, kvState_TimeCurrent, kStart + 2);
  const tTimeRecord record = {1600000000123456789ull, 1600000000987654321ull, 0xFFFFFFF3, 0};
  ASSERT_EQ(kvsimSetState(ethernet, kvState_TimeStartLong, 24, &record, 0), 0);
  const tTimeRecord noFlag = {5, 6, 0xFFFFFFFE, 0};
  ASSERT_EQ(kvsimSetState(ethernet, kvState_TimeCommLong, 24, &noFlag, 0), 0);
  const struct {
    uint32_t session;
    uint32_t stateId;
    uint32_t readId;
    uint32_t size;
    SvTime first;
    SvTime second;
    uint8_t flag;
  } cases[] = {
      {can, kvState_TimeStartLong, kvState_TimeStart, 8, Raw(kStart + 1), {}, 0},
      {can, kvState_TimeCurrent, kvState_TimeCurrent, 8, Raw(kStart + 2), {}, 0},
      {ethernet, kvState_TimeStartLong, kvState_TimeStartLong, 24, Ns(record.first),
       Ns(record.second), 1},
      {ethernet, kvState_TimeCommLong, kvState_TimeCommLong, 24, Ns(5), Ns(6), 0},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.stateId);
    SvTime first{7, 7}, second{7, 7};
    uint8_t flag = 7;
    EXPECT_EQ(kvsvReadStateTime2(c.session, c.stateId, &first, &second, &flag), 0);
    ExpectTime(first, c.first);
    ExpectTime(second, c.second);
    EXPECT_EQ(flag, c.flag);
    const kvsimCallRecord call = LastCall("kvReadState");
    EXPECT_EQ(call.propertyId, c.readId);
    EXPECT_EQ(call.size1, c.size);
  }
}

TEST_F(StateRead, Time2FailuresClearTheOutputs) {
  const uint32_t session = Session("CAN1");
  SetTime(session, kvState_TimeStart, kStart);
  SvTime first{}, second{};
  uint8_t flag = 0;
  const struct {
    const char *name;
    const char *function;
    uint32_t propertyId;  // 0: every call of the function
    int32_t status;
    int32_t stateReads;
  } cases[] = {
      {"protocol", "kvGetProperty", kvPropSession_Protocol, kvsimErrInternal, 0},
      {"state", "kvReadState", 0, kvsimErrOutOfMemory, 1},
      {"warning", "kvReadState", 0, 0x3FF62002, 1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    first = second = {3, 3};
    flag = 3;
    ASSERT_EQ(c.propertyId != 0 ? kvsimFailProperty(c.function, c.propertyId, c.status, 1)
                                : kvsimFailCall(c.function, c.status, 1),
              0);
    kvsimLogClear();
    EXPECT_EQ(kvsvReadStateTime2(session, kvState_TimeStart, &first, &second, &flag), c.status);
    ExpectTime(first, c.status < 0 ? SvTime{} : Raw(kStart));
    ExpectTime(second, SvTime{});
    EXPECT_EQ(flag, 0);
    EXPECT_EQ(kvsimCountCalls("kvReadState"), c.stateReads);
  }
  kvsimLogClear();
  EXPECT_EQ(kvsvReadStateTime2(session, kvState_TimeStart, nullptr, &second, &flag), kvErrInternal);
  EXPECT_EQ(kvsvReadStateTime2(session, kvState_TimeStart, &first, nullptr, &flag), kvErrInternal);
  EXPECT_EQ(kvsvReadStateTime2(session, kvState_TimeStart, &first, &second, nullptr),
            kvErrInternal);
  EXPECT_EQ(kvsimLogCount(), 0);
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
    const bool ns = session == ethernet;
    ExpectTime(first, ns ? Ns(record.first) : Raw(record.first));
    ExpectTime(second, ns ? Ns(record.second) : Raw(record.second));
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
    const char *name;
    bool armed;
    bool protocolFails;
    double timeout;
    int32_t status;
    bool cleared;  // else the outputs are as they were
    int32_t registrations;
  } cases[] = {
      {"fired, no limit", true, false, 0.0, 0, false, 0},
      {"fired, limit", true, false, 2.0, 0, false, 1},
      {"never armed", false, false, 0.0, kvsimErrTimeout, true, 0},
      {"runs out", false, false, 0.01, kvsimErrTimeout, true, 1},
      {"protocol", true, true, 5.0, kvsimErrInternal, false, 0},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    svsimReset();
    uint32_t live = 0;
    ASSERT_EQ(kvCreateSession(":memory:", "", "", "CAN2", kvMode_FrameInStream, &live), 0);
    if (c.armed) {
      ASSERT_EQ(kvsimSetTimeTrigger(live, 0, &record), 0);
    }
    if (c.protocolFails) {
      ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_Protocol, kvsimErrInternal, 1), 0);
    }
    SvTime first{9, 9}, second{9, 9};
    uint8_t flag = 9;
    EXPECT_EQ(kvsvReadStateTimeTrigger(live, &first, &second, &flag, c.timeout), c.status);
    EXPECT_EQ(svsimCleanupRegistrations(), c.registrations);
    const SvTime untouched{9, 9};
    ExpectTime(first, c.cleared ? SvTime{} : c.status == 0 ? Raw(kStart) : untouched);
    ExpectTime(second, c.cleared || c.status == 0 ? SvTime{} : untouched);
    EXPECT_EQ(flag, c.cleared || c.status == 0 ? 0 : 9);
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
    SetProperty(session_, 0x0210FFFA, 1);
    SetProperty(session_, 0x0010FFFE, cycleLength);
    SetProperty(session_, 0x0010FFFD, macroticks);
    SetProperty(session_, 0x0010FFFA, offset);
    SetWord(session_, kvState_FlexRayComm, lastCycle << 24 | 0x00ABCDEF);
    SetTime(session_, kvState_TimeStart, start);
  }

  kvsvStatus Read(uint64_t now) {
    SetTime(session_, kvState_TimeCurrent, now);
    cycle_ = 0xEE;
    macrotick_ = 0xEEEE;
    return kvsvReadStateFlexRayTime(session_, &cycle_, &macrotick_);
  }

  const tFlexRayTimeCache *Cache() {
    return static_cast<const tFlexRayTimeCache *>(Slot(session_)->flexRayTimeCache);
  }

  uint32_t session_ = 0;
  uint8_t cycle_ = 0;
  uint16_t macrotick_ = 0;
};

TEST_F(FlexRayTime, CycleAndMacrotickFromTheStartTime) {
  // A 5000 us cycle is 50000 raw units of 5000 macroticks of 10; offset 3 puts cycle 0 at
  // start + 50000 - 40 - 30, offset 5000 at start + 2^32 - 40 (the 32-bit difference wraps).
  const uint64_t zero = 49930;
  const uint64_t wrapped = 0xFFFFFFD8ull;
  const struct {
    uint32_t offset;
    uint32_t lastCycle;
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
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.offset << " " << c.sinceStart);
    start += 1000000000;  // a new start for each case, so that each works its timing out
    Bus(5000, 5000, c.offset, c.lastCycle, start);
    EXPECT_EQ(Read(start + c.sinceStart), 0);
    EXPECT_EQ(cycle_, c.cycle);
    EXPECT_EQ(macrotick_, c.macrotick);
  }
}

TEST_F(FlexRayTime, TheTimingIsReadOncePerStartOfTheBus) {
  Bus(5000, 5000, 3, 62);
  ASSERT_EQ(Read(kStart + 49930), 0);
  EXPECT_EQ(kvsimCountPropertyReads(0x0010FFFE), 1);
  const int32_t stateReads = kvsimCountCalls("kvReadState");
  ASSERT_EQ(Read(kStart + 49930 + 50000 + 20), 0);
  EXPECT_EQ(cycle_, 0);
  EXPECT_EQ(macrotick_, 2);
  EXPECT_EQ(kvsimCountCalls("kvReadState"), stateReads + 2);
  for (uint32_t id : {0x0210FFFAu, 0x0010FFFEu, 0x0010FFFDu, 0x0010FFFAu}) {
    EXPECT_EQ(kvsimCountPropertyReads(id), 1) << std::hex << id;
  }
  // The bus restarts 7 units later with a 1000 us cycle of 100 macroticks.
  Bus(1000, 100, 0, 9, kStart + 7);
  ASSERT_EQ(Read(kStart + 7 + 9960 + 150), 0);
  EXPECT_EQ(kvsimCountPropertyReads(0x0010FFFE), 2);
  EXPECT_EQ(cycle_, 10);
  EXPECT_EQ(macrotick_, 2);
  EXPECT_EQ(Cache()->startTime, kStart + 7);
}

TEST_F(FlexRayTime, FailuresLeaveBothOutputsZeroAndTheCacheEmpty) {
  const struct {
    const char *name;
    uint32_t property;
    uint32_t value;
    int32_t status;
  } cases[] = {
      {"no timing", 0x0210FFFA, 0, kvErrFlexRayTimeUnknown},
      {"cycle of 0", 0x0010FFFE, 0, kvErrFlexRayTimeInvalid},
      {"no macroticks", 0x0010FFFD, 0, kvErrFlexRayTimeInvalid},
      // 50 raw units cannot hold 51 macroticks: a macrotick of 0 is refused, not divided by.
      {"macrotick of 0", 0x0010FFFD, 51, kvErrFlexRayTimeInvalid},
      {"cycle wraps to 0", 0x0010FFFE, 0x80000000u, kvErrFlexRayTimeInvalid},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    Bus(5, 5, 0, 0);
    SetProperty(session_, c.property, c.value);
    EXPECT_EQ(Read(kStart + 100), c.status);
    EXPECT_EQ(cycle_, 0);
    EXPECT_EQ(macrotick_, 0);
    ASSERT_NE(Cache(), nullptr);
    EXPECT_EQ(Cache()->startTime, 0u);
  }
  Bus(5, 5, 0, 0);
  EXPECT_EQ(Read(kStart + 100), 0) << "the next call fills the cache again";
  EXPECT_EQ(Cache()->startTime, kStart);
}

TEST_F(FlexRayTime, NoStartTimeNoSlotBusyOrDriverFailures) {
  uint32_t noSlot = 0;
  ASSERT_EQ(kvCreateSession(":memory:", "", "", "FlexRay2", kvMode_FrameInStream, &noSlot), 0);
  const struct {
    const char *name;
    uint64_t start;
    uint64_t now;
    bool busy;
    uint32_t session;
    const char *failing;
    int32_t status;
    bool cacheMade;  // empty; else none at all
  } cases[] = {
      {"bus not started", 0, kStart, false, 0, nullptr, kvErrFlexRayTimeInvalid, false},
      {"no time now", kStart, 0, false, 0, nullptr, kvErrFlexRayTimeInvalid, false},
      {"guard held", kStart, kStart, true, 0, nullptr, kvErrSessionBusy, false},
      {"no slot", kStart, kStart, false, noSlot, nullptr, kvErrInvalidSession, false},
      {"state read", kStart, kStart, false, 0, "kvReadState", kvsimErrInternal, false},
      {"property read", kStart, kStart, false, 0, "kvGetProperty", kvsimErrInternal, true},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    Bus(5000, 5000, 3, 62, c.start);
    SetTime(session_, kvState_TimeCurrent, c.now);
    if (c.busy) Slot(session_)->guard.store(1);
    if (c.failing != nullptr) {
      ASSERT_EQ(kvsimFailCall(c.failing, c.status, 1), 0);
    }
    cycle_ = 0xEE;
    macrotick_ = 0xEEEE;
    EXPECT_EQ(kvsvReadStateFlexRayTime(c.session != 0 ? c.session : session_, &cycle_, &macrotick_),
              c.status);
    EXPECT_EQ(cycle_, 0);
    EXPECT_EQ(macrotick_, 0);
    if (c.cacheMade) {
      ASSERT_NE(Cache(), nullptr);
      EXPECT_EQ(Cache()->startTime, 0u);
    } else {
      EXPECT_EQ(Cache(), nullptr);
    }
    Slot(session_)->guard.store(0);
  }
  EXPECT_EQ(kvsvReadStateFlexRayTime(session_, nullptr, &macrotick_), kvErrNullArgument);
}

}  // namespace
