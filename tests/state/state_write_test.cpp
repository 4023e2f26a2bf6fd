// State writes: the LIN schedule by number or by name, the plain 32-bit write, and the future
// time trigger with its protocol's time units.
#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <new>
#include <string>

#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/name_list.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

// An armed size makes the next allocation of exactly that many bytes fail, once.
std::atomic<size_t> gFailSize{0};

}  // namespace

void *operator new(std::size_t size) {
  size_t armed = gFailSize.load();
  if (armed != 0 && size == armed && gFailSize.compare_exchange_strong(armed, 0))
    throw std::bad_alloc();
  if (void *memory = std::malloc(size != 0 ? size : 1)) return memory;
  throw std::bad_alloc();
}

void *operator new(std::size_t size, const std::nothrow_t &) noexcept {
  try {
    return operator new(size);
  } catch (const std::bad_alloc &) {
    return nullptr;
  }
}

// This program's operator new takes its memory from malloc, so free is the matching release.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"
void operator delete(void *memory) noexcept { std::free(memory); }
void operator delete(void *memory, std::size_t) noexcept { std::free(memory); }
#pragma GCC diagnostic pop

namespace {

using namespace nKVSVAPI100;

constexpr char kSchedules[] = "Normal, Diag.Master ,Diag,Fast.One,Fast.Two";
constexpr kvsvStatus kRefused = static_cast<kvsvStatus>(0xBFF62999);

class StateWriteTest : public SlotFixture {
 protected:
  // A LIN output session with a slot and the schedule names of `names`.
  uint32_t LinSession(const char *names = kSchedules) {
    const uint32_t session = MakeSession("", kvMode_FrameOutStream, "LIN1");
    SetNames(session, names);
    return session;
  }

  static void SetNames(uint32_t session, const std::string &names) {
    ASSERT_EQ(kvSetProperty(session, kvPropSession_IntfLINSchedNames,
                            static_cast<uint32_t>(names.size() + 1), names.c_str()),
              0);
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

  static kvsimCallRecord LastCall() {
    kvsimCallRecord record{};
    EXPECT_EQ(kvsimLogEntry(kvsimLogCount() - 1, &record), 1);
    return record;
  }
};

TEST_F(StateWriteTest, SchedulesByNumberAndByName) {
  const struct {
    const char *text;
    kvsvStatus status;
    int64_t selected;  // -1: nothing written
  } cases[] = {
      {"3", 0, 3},
      {"007", 0, 7},
      {"", 0, 0},
      {"Normal", 0, 0},
      {"  Diag.Master  ", 0, 1},
      {"Diag", 0, 2},  // the whole entry before a prefix of an earlier one
      {"Fast", 0, 3},  // the first entry of that prefix
      {"Fast.Two", 0, 4},
      {"3a", kvErrScheduleNumberInvalid, -1},
      {"2147483648", kvErrScheduleNumberInvalid, -1},
      {"Fas", kvErrScheduleNameUnknown, -1},
      {"Slow", kvErrScheduleNameUnknown, -1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text);
    const uint32_t session = LinSession();
    kvsimLogClear();
    EXPECT_EQ(Change(session, c.text), c.status);
    // The stand-in selects a schedule only for its state with 4 bytes.
    EXPECT_EQ(Selected(session), c.selected);
    EXPECT_EQ(kvsimCountCalls("kvWriteState"), c.selected < 0 ? 0 : 1);
  }
}

TEST_F(StateWriteTest, MissingTextsSelectScheduleZeroWithoutTheSlot) {
  uint32_t session = 0;
  ASSERT_EQ(kvCreateSession(":memory:", "", "", "LIN1", kvMode_FrameOutStream, &session), 0);
  void *noBlock = nullptr;
  SvHandle blockless = &noBlock;
  SvHandle none = nullptr;
  for (SvHandle *schedule : {static_cast<SvHandle *>(nullptr), &none, &blockless}) {
    ASSERT_EQ(kvWriteState(session, kvState_LINScheduleChange, 4, "\x09\0\0\0"), 0);
    EXPECT_EQ(kvsvWriteStateLINScheduleChange(session, schedule), 0);
    EXPECT_EQ(Selected(session), 0);
  }
  // A number works on a session that has no slot; a name needs one.
  EXPECT_EQ(Change(session, "3"), 0);
  EXPECT_EQ(Selected(session), 3);
  EXPECT_EQ(Change(session, "Normal"), kvErrInvalidSession);
  EXPECT_EQ(Change(0x20002001u, "Normal"), kvErrInvalidSession);  // index 8193
  EXPECT_EQ(Selected(session), 3);
}

TEST_F(StateWriteTest, NamesAreReadOncePerSlot) {
  const uint32_t session = LinSession();
  kvsimLogClear();
  ASSERT_EQ(Change(session, "Fast.One"), 0);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_IntfLINSchedNames), 2);  // size, then text
  // Later names do not reach the kept list.
  SetNames(session, "Other");
  kvsimLogClear();
  ASSERT_EQ(Change(session, "Diag"), 0);
  EXPECT_EQ(Selected(session), 2);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_IntfLINSchedNames), 0);
  EXPECT_EQ(Change(session, "Other"), kvErrScheduleNameUnknown);
  // The session's list of items is another list.
  EXPECT_EQ(Slot(session)->sessionNameList, nullptr);
}

TEST_F(StateWriteTest, TheLookupTakesTheListGuardOnly) {
  const uint32_t session = LinSession();
  tSessionSlot &slot = *Slot(session);
  // A read or write call in progress does not stop a lookup.
  slot.guard = 1;
  EXPECT_EQ(Change(session, "Diag"), 0);
  EXPECT_EQ(Selected(session), 2);
  EXPECT_EQ(slot.guard.load(), 1u);
  slot.guard = 0;

  const struct {
    const char *name;
    uint32_t listGuard;
    uint32_t slotValid;
  } cases[] = {
      // The losing caller leaves through the common exit, which clears the holder's guard.
      {"list guard held", 1, 1},
      {"slot closing", 0, 0},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    slot.listGuard = c.listGuard;
    slot.slotValid = c.slotValid;
    kvsimLogClear();
    EXPECT_EQ(Change(session, "Normal"), kvErrSessionBusy);
    EXPECT_EQ(slot.listGuard.load(), 0u);
    EXPECT_EQ(kvsimLogCount(), 0);
    EXPECT_EQ(Selected(session), 2);
    slot.slotValid = 1;
  }
  EXPECT_EQ(Change(session, "Normal"), 0);
  EXPECT_EQ(slot.listGuard.load(), 0u);
}

TEST_F(StateWriteTest, DriverFailuresWriteNothingButTheirOwn) {
  const struct {
    const char *name;
    const char *function;
    bool propertyRead;
    const char *text;
    bool listKept;
  } cases[] = {
      {"names size", "kvGetPropertySize", true, "Diag", false},
      {"names text", "kvGetProperty", true, "Diag", false},
      {"write by name", "kvWriteState", false, "Diag", true},
      {"write by number", "kvWriteState", false, "2", false},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    const uint32_t session = LinSession();
    if (c.propertyRead)
      kvsimFailProperty(c.function, kvPropSession_IntfLINSchedNames, kRefused, 1);
    else
      kvsimFailCall(c.function, kRefused, 1);
    EXPECT_EQ(Change(session, c.text), kRefused);
    EXPECT_EQ(Selected(session), -1);
    EXPECT_EQ(Slot(session)->nameList != nullptr, c.listKept);
    EXPECT_EQ(Slot(session)->listGuard.load(), 0u);
    EXPECT_EQ(Change(session, c.text), 0);  // nothing of the failure stays
    EXPECT_EQ(Selected(session), 2);
  }
}

TEST_F(StateWriteTest, NoMemoryForTheNamesIsAStatus) {
  // malloc of the driver's text cannot be made to fail here; the list's own memory can. The
  // normalised 300-byte name is the only request of 301 bytes on the way.
  const std::string name(300, 'S');
  const uint32_t session = LinSession(("Normal,  " + name + "  ").c_str());
  SvHandle schedule = Keep(svsimMakeString(name.c_str()));
  gFailSize = name.size() + 1;
  EXPECT_EQ(kvsvWriteStateLINScheduleChange(session, &schedule), kvErrOutOfMemory);
  EXPECT_EQ(gFailSize.load(), 0u) << "the list asked for no such block";
  EXPECT_EQ(Slot(session)->nameList, nullptr);
  EXPECT_EQ(Slot(session)->listGuard.load(), 0u);
  EXPECT_EQ(Selected(session), -1);
  EXPECT_EQ(Change(session, name.c_str()), 0);
  EXPECT_EQ(Selected(session), 1);
}

TEST_F(StateWriteTest, U32WritesGoStraightToTheDriver) {
  constexpr uint32_t kState = 0x05130123;
  const uint32_t session = LinSession();
  ASSERT_EQ(kvsimAllowStateWrite(session, kState), 0);
  const struct {
    const char *name;
    uint32_t session;
    uint32_t state;
    kvsvStatus status;
  } cases[] = {
      {"declared state", session, kState, 0},
      {"unknown state", session, kState + 1, kvsimErrUnknownState},
      // No slot test: the driver judges the handle.
      {"no session", 0x20002001u, kState, kvsimErrInvalidSession},
  };
  uint32_t value = 0xA5000000u;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    ++value;
    kvsimLogClear();
    EXPECT_EQ(kvsvWriteStateU32(c.session, c.state, value), c.status);
    ASSERT_EQ(kvsimLogCount(), 1);
    const kvsimCallRecord write = LastCall();
    EXPECT_STREQ(write.function, "kvWriteState");
    EXPECT_EQ(write.object, c.session);
    EXPECT_EQ(write.propertyId, c.state);
    EXPECT_EQ(write.size1, 4u);
  }
  uint32_t kept = 0;
  EXPECT_EQ(kvsimLastState(session, kState, &kept), 1);
  EXPECT_EQ(kept, 0xA5000001u);
  // The LIN schedule takes the same way.
  EXPECT_EQ(kvsvWriteStateU32(session, kvState_LINScheduleChange, 6), 0);
  EXPECT_EQ(Selected(session), 6);
}

// 2024-01-01 00:00:00.5 UTC: 3786912000 s after 1904, half a second of fraction.
constexpr SvTime kNewYear{0x8000000000000000ull, 3786912000};
// 100 ns units since 1601, and 1 ns units since 1970, of the same instant.
constexpr uint64_t kNewYearRaw = 133485408005000000ull;
constexpr uint64_t kNewYearNs = 1704067200500000000ull;

TEST_F(StateWriteTest, TriggerTimesGoInTheProtocolsUnits) {
  const struct {
    const char *interfaceName;
    uint32_t option;
    uint64_t expected;
  } cases[] = {
      {"CAN1", 7, kNewYearRaw},
      {"LIN1", 0, kNewYearRaw},
      {"ENET1", 0xFFFFFFFFu, kNewYearNs},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.interfaceName);
    const uint32_t session = MakeSession("", kvMode_FrameOutStream, c.interfaceName);
    EXPECT_EQ(kvsvFutureTimeTrigger(session, &kNewYear, c.option), 0);
    uint64_t when = 0;
    uint32_t option = 0;
    ASSERT_EQ(kvsimFutureTrigger(session, &when, &option), 1);
    EXPECT_EQ(when, c.expected);
    EXPECT_EQ(option, c.option);
  }
}

TEST_F(StateWriteTest, TriggerFailures) {
  const uint32_t can = MakeSession("", kvMode_FrameOutStream, "CAN1");
  const uint32_t enet = MakeSession("", kvMode_FrameOutStream, "ENET1");
  const uint32_t input = MakeSession("", kvMode_FrameInStream, "CAN2");
  const SvTime *none = nullptr;
  const struct {
    const char *name;
    uint32_t session;
    uint64_t clock;
    const SvTime *when;
    const char *failProtocol;  // the protocol read that fails, if any
    kvsvStatus status;
    int driverCalls;
  } cases[] = {
      {"protocol read fails", can, 0, &kNewYear, "kvGetProperty", kRefused, 0},
      {"null time", can, 0, none, nullptr, kvErrNullArgument, 0},
      {"input session", input, 0, &kNewYear, nullptr, kvsimErrWrongMode, 1},
      {"raw time passed", can, kNewYearRaw + 1, &kNewYear, nullptr, kvsimErrTimeInPast, 1},
      {"raw time now", can, kNewYearRaw, &kNewYear, nullptr, 0, 1},
      // The clock is raw; an Ethernet session compares in 1 ns since 1970.
      {"ns time passed", enet, kNewYearRaw + 1, &kNewYear, nullptr, kvsimErrTimeInPast, 1},
      {"ns time now", enet, kNewYearRaw, &kNewYear, nullptr, 0, 1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    kvsimSetClock(c.clock);
    if (c.failProtocol != nullptr)
      kvsimFailProperty(c.failProtocol, kvPropSession_Protocol, kRefused, 1);
    kvsimLogClear();
    EXPECT_EQ(kvsvFutureTimeTrigger(c.session, c.when, 1), c.status);
    EXPECT_EQ(kvsimCountCalls("kvFutureTimeTrigger"), c.driverCalls);
    uint64_t when = 0;
    uint32_t option = 0;
    EXPECT_EQ(kvsimFutureTrigger(c.session, &when, &option), c.status == 0 ? 1 : 0);
  }
}

}  // namespace
