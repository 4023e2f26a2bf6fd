// State reads and writes against the driver stand-in: communication words unpacked into clusters,
// states and times handed on, the blocking time trigger, the FlexRay cycle and macrotick worked
// out from the driver's states and hidden timing, the LIN schedule by number or by name, and the
// future time trigger in its protocol's units.
#include <gtest/gtest.h>

#include <chrono>
#include <future>

#include "core/timestamps.h"
#include "state/flexray_time_cache.h"
#include "support/call_log.h"
#include "support/slot_fixture.h"

namespace {

using kvsvtest::LastCall;
using nKVSVAPI100::tSessionSlot;

constexpr uint8_t _ = 0xEE;  // a cluster byte that the read leaves alone
constexpr kvsvStatus kRefused = static_cast<kvsvStatus>(0xBFF62999);
// A bus start well after 1904, so that times are absolute raw times.
constexpr uint64_t kStart = 133000000000000000ull;

// A host time as its seconds and fraction; a driver time as the host sees it, from 100 ns units
// since 1601 or, on Ethernet, 1 ns units since 1970.
std::pair<int64_t, uint64_t> Host(const SvTime &time) { return {time.seconds, time.fraction}; }
std::pair<int64_t, uint64_t> Host(uint64_t value, bool ns = false) {
  SvTime time{};
  ns ? nKVSVAPI100::NsTimeToSvTime(&time, &value) : nKVSVAPI100::RawTimeToSvTime(&time, &value);
  return Host(time);
}

// What a schedule change meets: driver failures and the slot's guards.
void FailNames(tSessionSlot &) {
  kvsimFailProperty("kvGetProperty", kvPropSession_IntfLINSchedNames, kRefused, 1);
}
void FailWrite(tSessionSlot &) { kvsimFailCall("kvWriteState", kRefused, 1); }
void CallInProgress(tSessionSlot &slot) { slot.guard = 1; }
void ListGuardHeld(tSessionSlot &slot) { slot.listGuard = 1; }

class StateTest : public SlotFixture {
 protected:
  uint32_t Session(const char *interfaceName, uint32_t mode = kvMode_FrameInStream) {
    return MakeSession("", mode, interfaceName);
  }
  template <class T>
  static void SetState(uint32_t session, uint32_t stateId, const T &value) {
    ASSERT_EQ(kvsimSetState(session, stateId, sizeof value, &value, 0), 0);
  }
  // A LIN output session with a slot and schedule names.
  uint32_t LinSession() {
    const uint32_t session = Session("LIN1", kvMode_FrameOutStream);
    const char names[] = "Normal, Diag.Master ,Diag,Fast.One,Fast.Two";
    EXPECT_EQ(kvSetProperty(session, kvPropSession_IntfLINSchedNames, sizeof names, names), 0);
    return session;
  }
  kvsvStatus Change(uint32_t session, const char *text) {
    SvHandle schedule = Keep(svsimMakeString(text));
    return kvsvWriteStateLINScheduleChange(session, &schedule);
  }
  // The schedule the driver holds, or -1 for none written.
  static int64_t Selected(uint32_t session) {
    uint32_t index = 0;
    return kvsimLinSchedule(session, &index) == 1 ? int64_t{index} : -1;
  }
};

TEST_F(StateTest, CommunicationStatesAreUnpackedFieldByFieldWhateverTheStatus) {
  const uint32_t session = Session("CAN1");
  const auto can = kvsvReadStateCANComm, lin = kvsvReadStateLINComm;
  const auto flexRay = kvsvReadStateFlexRayComm, j1939 = kvsvReadStateJ1939Comm;
  const std::vector<uint32_t> record = {0x44332211, 0x88776655, 0xCCBBAA99, 0xF1F0EEDD};
  const struct {
    kvsvStatus (*read)(uint32_t, void *);
    uint32_t stateId;
    std::vector<uint32_t> words;
    uint32_t fault;
    std::vector<uint8_t> fields;  // from byte 5, behind the fault word and its flag
  } cases[] = {
      {can, kvState_CANComm, {0x12340531}, 0, {1, 5, 0x12, 0x34, 1, 1}},
      {can, kvState_CANComm, {0xFEDCBA98}, 0xCAFE0001, {8, 10, 0xFE, 0xDC, 1, 0}},
      {lin, kvState_LINComm, {0x4E6B3C4B, 0x335A}, 7, {2, 4, 60, 0x6B, 14, 1, 0, 0x5A}},
      {lin, kvState_LINComm, {0xC7A5B3DE, 0x01}, 0, {3, 13, 0xB3, 0xA5, 7, 1, 1, 1}},
      {flexRay, kvState_FlexRayComm, {0xFFFFBEEF}, 0, {15, 14, 0x1E, 1, 0}},
      {flexRay, kvState_FlexRayComm, {0x5A3C}, 0xCAFE0001, {12, 3, 0x1A, 0, 1}},
      {j1939,
       kvState_J1939Comm,
       record,
       2,
       {_, _, _, 0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77, 0x88}},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.stateId << " " << c.words[0]);
    const auto size = static_cast<uint32_t>(c.words.size() * 4);
    ASSERT_EQ(kvsimSetState(session, c.stateId, size, c.words.data(), c.fault), 0);
    std::vector<uint8_t> expected(20, _), cluster(20, _);
    std::memcpy(expected.data(), &c.fault, 4);
    expected[4] = c.fault != 0;
    std::copy(c.fields.begin(), c.fields.end(), expected.begin() + 5);
    EXPECT_EQ(c.read(session, cluster.data()), 0);
    EXPECT_EQ(cluster, expected);
    // A failed read leaves the work words as they were made: zeros reach the cluster.
    ASSERT_EQ(kvsimFailCall("kvReadState", kvsimErrInternal, 1), 0);
    EXPECT_EQ(c.read(session, cluster.data()), kvsimErrInternal);
    for (uint8_t &byte : expected) byte = byte == _ ? _ : 0;
    EXPECT_EQ(cluster, expected);
  }
  EXPECT_EQ(kvsvReadStateLINComm(session, nullptr), kvErrNullArgument);
  uint32_t word = 0;  // other states reach the host as the driver gives them
  EXPECT_EQ(kvsvReadStateU32(session, kvState_CANComm, &word), 0);
  EXPECT_EQ(word, 0xFEDCBA98u);
}

// kvsvReadStateTime, kvsvReadStateTime2 and kvsvReadStateTimeTrigger.
TEST_F(StateTest, TimesTakeTheFormOfTheSessionsProtocolAndClearOnFailure) {
  const uint32_t can = Session("CAN1"), ethernet = Session("ENET1");
  SetState(can, kvState_TimeStart, kStart + 1);
  const uint64_t flagged[3] = {1600000000123456789ull, 1600000000987654321ull, 0xFFFFFFF3};
  SetState(ethernet, kvState_TimeStartLong, flagged);
  ASSERT_EQ(kvsimSetTimeTrigger(ethernet, 0, flagged), 0);
  SvTime first{}, second{};
  uint8_t flag = 0;
  EXPECT_EQ(kvsvReadStateTime(can, kvState_TimeStart, &first), 0);  // raw on every protocol
  EXPECT_EQ(Host(first), Host(kStart + 1));
  const struct {
    uint32_t session, stateId, readId, size;  // the last driver read and its size; 0: a trigger
    int32_t status;                           // that the driver gives
    uint64_t first, second;
    uint8_t flag;
    double timeout = 0.0;  // of a trigger read
  } cases[] = {
      {can, kvState_TimeStartLong, kvState_TimeStart, 8, 0, kStart + 1, 0, 0},
      {ethernet, kvState_TimeStartLong, kvState_TimeStartLong, 24, 0x3FF62001, flagged[0],
       flagged[1], 1},
      {can, kvState_TimeStart, kvState_TimeStart, 8, kvsimErrOutOfMemory, 0, 0, 0},
      {can, kvState_TimeStart, kvPropSession_Protocol, 4, kvsimErrInternal, 0, 0, 0},
      {ethernet, 0, 0, 24, 0, flagged[0], flagged[1], 1, 0.0},
      {can, 0, 0, 24, kvsimErrTimeout, 0, 0, 0, 0.01},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.stateId << " " << c.status);
    if (c.readId == kvPropSession_Protocol) {
      kvsimFailProperty("kvGetProperty", c.readId, c.status, 1);
    } else if (c.status != 0 && c.stateId != 0) {
      kvsimFailCall("kvReadState", c.status, 1);
    }
    first = second = SvTime{7, 7};
    flag = 7;
    svsimReset();
    EXPECT_EQ(c.stateId != 0
                  ? kvsvReadStateTime2(c.session, c.stateId, &first, &second, &flag)
                  : kvsvReadStateTimeTrigger(c.session, &first, &second, &flag, c.timeout),
              c.status);
    EXPECT_EQ(Host(first), Host(c.first, c.session == ethernet));
    EXPECT_EQ(Host(second), Host(c.second, c.session == ethernet));
    EXPECT_EQ(flag, c.flag);
    EXPECT_EQ(LastCall().propertyId, c.readId);
    EXPECT_EQ(LastCall().size1, c.size);
    EXPECT_EQ(svsimCleanupRegistrations(), c.timeout > 0 ? 1 : 0);  // only for a time limit
  }
  // A failed protocol read leaves the trigger's outputs as they were.
  first = SvTime{7, 7};
  kvsimFailProperty("kvGetProperty", kvPropSession_Protocol, kvsimErrInternal, 1);
  EXPECT_EQ(kvsvReadStateTimeTrigger(can, &first, &second, &flag, 5.0), kvsimErrInternal);
  EXPECT_EQ(Host(first), Host(SvTime{7, 7}));
  EXPECT_EQ(kvsvReadStateTime(can, kvState_TimeStart, nullptr), kvErrInternal);
  EXPECT_EQ(kvsvReadStateTime2(can, kvState_TimeStart, &first, nullptr, &flag), kvErrInternal);
  // Without a time limit the trigger read waits for the clock.
  kvsimSetClock(kStart);
  const uint64_t record[3] = {kStart + 500, kStart + 900, 1};
  ASSERT_EQ(kvsimSetTimeTrigger(ethernet, kvsimClock() + 1000, record), 0);
  auto read = std::async(std::launch::async, [&] {
    return kvsvReadStateTimeTrigger(ethernet, &first, &second, &flag, -1.0);
  });
  ASSERT_EQ(kvsimWaitBlocked("kvReadStateTimeTrigger", 1), 1);
  kvsimAdvanceClock(999);
  EXPECT_EQ(read.wait_for(std::chrono::seconds(0)), std::future_status::timeout);
  kvsimAdvanceClock(1);
  EXPECT_EQ(read.get(), 0);
  EXPECT_EQ(Host(first), Host(record[0], true));
  EXPECT_EQ(Host(second), Host(record[1], true));
  EXPECT_EQ(flag, 1);
  uint64_t argument = 0;
  ASSERT_EQ(svsimLastCleanup(nullptr, &argument, nullptr), 1);
  EXPECT_EQ(argument, ethernet);
}

TEST_F(StateTest, FlexRayCycleAndMacrotickFromTheStartTime) {
  const uint32_t session = Session("FlexRay1");
  uint8_t cycle = 0;
  uint16_t macrotick = 0;
  const auto read = [&](uint64_t now) {
    SetState(session, kvState_TimeCurrent, now);
    cycle = 0xEE, macrotick = 0xEEEE;
    return kvsvReadStateFlexRayTime(session, &cycle, &macrotick);
  };
  // A cycle of 5000 us of 5000 macroticks of 10 raw units, the bus started at `start` when the
  // driver's last cycle was `lastCycle`. Offset 3 puts cycle 0 at start + 50000 - 40 - 30, offset
  // 5000 at start + 2^32 - 40 (the 32-bit difference wraps).
  const uint64_t zero = 49930, wrapped = 0xFFFFFFD8ull;
  const struct {
    uint32_t offset, lastCycle;
    uint64_t sinceStart;
    uint8_t cycle;
    uint16_t macrotick;
    int32_t status = 0;
    uint32_t property = 0, value = 0;  // a timing property set after the good ones
  } cases[] = {
      {3, 62, zero, 63, 0},
      {3, 62, zero + 2 * 50000 + 1234, 1, 123},
      {3, 62, zero + 2 * 50000 + 1235, 1, 124},  // half a macrotick rounds up
      {3, 0x3F + 0x40, zero + 49999, 0, 5000},
      {3, 255, zero + 64 * 50000 + 4, 0, 0},
      {5000, 1, wrapped + 3 * 50000 + 7, 5, 1},
      {3, 1, zero, 0, 0, kvErrFlexRayTimeUnknown, 0x0210FFFA, 0},
      {3, 1, zero, 0, 0, kvErrFlexRayTimeInvalid, 0x0010FFFE, 0},
      {3, 1, zero, 0, 0, kvErrFlexRayTimeInvalid, 0x0010FFFD, 0},
      // 50000 raw units cannot hold 50001 macroticks: a macrotick of 0 is refused, not divided by.
      {3, 1, zero, 0, 0, kvErrFlexRayTimeInvalid, 0x0010FFFD, 50001},
      {3, 1, zero, 0, 0, kvErrFlexRayTimeInvalid, 0x0010FFFE, 0x80000000u},
      {3, 1, zero, 0, 0, kvsimErrInternal},  // a timing property read fails
  };
  uint64_t start = kStart;
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.offset << " " << c.sinceStart << " " << c.status);
    start += 1000000000;  // a new start of the bus: its timing is read again, once
    const uint32_t timing[] = {0x0210FFFA, 1,          0x0010FFFE, 5000,       0x0010FFFD,
                               5000,       0x0010FFFA, c.offset,   c.property, c.value};
    for (int i = 0; i < 10; i += 2) {
      kvSetProperty(session, timing[i], timing[i] >> 24 == 2 ? 1 : 4, &timing[i + 1]);
    }
    SetState(session, kvState_FlexRayComm, c.lastCycle << 24 | 0x00ABCDEF);
    SetState(session, kvState_TimeStart, start);
    if (c.status == kvsimErrInternal) kvsimFailCall("kvGetProperty", c.status, 1);
    EXPECT_EQ(read(start + c.sinceStart), c.status);
    EXPECT_EQ(cycle, c.cycle);
    EXPECT_EQ(macrotick, c.macrotick);
    // A failure leaves no timing kept, so that the next call works it out again; a success
    // keeps it: a cycle later, the driver is asked for the times and nothing else.
    const auto *kept =
        static_cast<const nKVSVAPI100::tFlexRayTimeCache *>(Slot(session)->flexRayTimeCache);
    EXPECT_EQ(kept->startTime, c.status == 0 ? start : 0);
    if (c.status != 0) continue;
    kvsimLogClear();
    EXPECT_EQ(read(start + c.sinceStart + 50000), 0);
    EXPECT_EQ(cycle, (c.cycle + 1) % 64);
    EXPECT_EQ(macrotick, c.macrotick);
    EXPECT_EQ(kvsimLogCount(), 2);
  }
  // Without a start or a time now there is no cycle; the outputs are 0 whatever the failure.
  for (const uint64_t now : {uint64_t{0}, kStart}) {
    SetState(session, kvState_TimeStart, kStart - now);
    EXPECT_EQ(read(now), kvErrFlexRayTimeInvalid);
    EXPECT_EQ(cycle + macrotick, 0);
  }
  EXPECT_EQ(kvsvReadStateFlexRayTime(session, nullptr, &macrotick), kvErrNullArgument);
}

TEST_F(StateTest, SchedulesByNumberAndByName) {
  const struct {
    const char *text;
    kvsvStatus status;
    int64_t selected;  // -1: nothing written
    void (*arm)(tSessionSlot &) = nullptr;
  } cases[] = {
      {"3", 0, 3},
      {"", 0, 0},
      {"Normal", 0, 0},
      {"  Diag.Master  ", 0, 1},
      {"Diag", 0, 2},  // the whole entry before a prefix of an earlier one
      {"Fast", 0, 3},  // the first entry of that prefix
      {"Fast.Two", 0, 4},
      {"3a", kvErrScheduleNumberInvalid, -1},
      {"Fas", kvErrScheduleNameUnknown, -1},
      {"Diag", kRefused, -1, FailNames},
      {"Diag", kRefused, -1, FailWrite},
      {"2", kRefused, -1, FailWrite},
      // The lookup takes the list guard, not the call guard. A losing caller leaves through the
      // common exit, which clears the holder's list guard.
      {"Diag", 0, 2, CallInProgress},
      {"Diag", kvErrSessionBusy, -1, ListGuardHeld},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.text << " " << c.status);
    const uint32_t session = LinSession();
    tSessionSlot &slot = *Slot(session);
    if (c.arm != nullptr) c.arm(slot);
    EXPECT_EQ(Change(session, c.text), c.status);
    EXPECT_EQ(Selected(session), c.selected);
    EXPECT_EQ(slot.listGuard.load(), 0u);
    slot.guard = 0;
    if (c.status == kRefused) {  // nothing of the failure stays
      EXPECT_EQ(Change(session, c.text), 0);
      EXPECT_EQ(Selected(session), 2);
    }
  }
  // The names are read once per slot.
  const uint32_t session = LinSession();
  ASSERT_EQ(Change(session, "Fast.One"), 0);
  kvsimLogClear();
  ASSERT_EQ(Change(session, "Diag"), 0);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_IntfLINSchedNames), 0);
  EXPECT_EQ(Slot(session)->sessionNameList, nullptr);  // the list of items is another list
  // No text at all selects schedule 0 too; a number needs no slot, nor does the plain write.
  uint32_t noSlot = 0;
  ASSERT_EQ(kvCreateSession(":memory:", "", "", "LIN1", kvMode_FrameOutStream, &noSlot), 0);
  void *noBlock = nullptr;
  SvHandle blockless = &noBlock, none = nullptr;
  for (SvHandle *schedule : {static_cast<SvHandle *>(nullptr), &none, &blockless}) {
    ASSERT_EQ(Change(noSlot, "3"), 0);
    ASSERT_EQ(Selected(noSlot), 3);
    EXPECT_EQ(kvsvWriteStateLINScheduleChange(noSlot, schedule), 0);
    EXPECT_EQ(Selected(noSlot), 0);
  }
  EXPECT_EQ(kvsvWriteStateU32(noSlot, kvState_LINScheduleChange, 6), 0);
  EXPECT_EQ(Selected(noSlot), 6);
}

TEST_F(StateTest, FutureTriggersGoInTheProtocolsUnits) {
  // 2024-01-01 00:00:00.5 UTC, 3786912000 s after 1904, goes in 100 ns units since 1601, or on
  // Ethernet in 1 ns units since 1970.
  const SvTime newYear{0x8000000000000000ull, 3786912000};
  const uint32_t can = Session("CAN1", kvMode_FrameOutStream);
  const uint32_t enet = Session("ENET1", kvMode_FrameOutStream);
  for (const auto &[session, expected] : {std::pair<uint32_t, uint64_t>{can, 133485408005000000ull},
                                          {enet, 1704067200500000000ull}}) {
    EXPECT_EQ(kvsvFutureTimeTrigger(session, &newYear, session & 0xFF), 0);
    uint64_t when = 0;
    uint32_t option = 0;
    ASSERT_EQ(kvsimFutureTrigger(session, &when, &option), 1);
    EXPECT_EQ(when, expected);
    EXPECT_EQ(option, session & 0xFF);
  }
  kvsimFailProperty("kvGetProperty", kvPropSession_Protocol, kRefused, 1);
  EXPECT_EQ(kvsvFutureTimeTrigger(can, &newYear, 1), kRefused);
  EXPECT_EQ(kvsvFutureTimeTrigger(can, nullptr, 1), kvErrNullArgument);
  EXPECT_EQ(kvsimCountCalls("kvFutureTimeTrigger"), 2);  // the two above
}

}  // namespace
