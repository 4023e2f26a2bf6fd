// Slots and their guard, name lists, host references, manual sessions from creation to the end of
// the program, the close of every kind of reference, and the close of project sessions.
#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <ctime>
#include <map>
#include <tuple>

#include "session/kvorutility.h"
#include "session/name_list.h"
#include "session/slot_guard.h"
#include "session/teardown_slot.h"
#include "support/session_fixture.h"

// The wait for guards at teardown polls every 100 ms, 1000 times. This program's nanosleep
// returns at once and counts, so that the limit is reached without waiting 100 seconds.
namespace {
std::atomic<int> gSleeps{0};
std::atomic<long> gLastRequestNs{0};
std::function<void(int)> gOnSleep;
}  // namespace

extern "C" int nanosleep(const timespec *requested, timespec *) {
  const int n = ++gSleeps;
  gLastRequestNs = requested->tv_sec * 1000000000L + requested->tv_nsec;
  if (gOnSleep) gOnSleep(n);
  return 0;
}

namespace {

using namespace nKVSVAPI100;
using kvsvtest::CreateManual;
using kvsvtest::HasSlot;
using S = cSnLifeSession;

Status Teardown(uint32_t handle) {
  std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
  return TeardownSlot(gSessionManager, handle);
}

using SessionTable = SessionFixture;

TEST_F(SessionTable, SlotsOfIndices1To8192AdmitOneCallPerGuardWord) {
  // An open error comes back where no slot can be; a warning is no open error.
  const Status kOpenError = static_cast<Status>(0xBFF62020);
  const Status cases[][3] = {{0x0, 0, kvErrInvalidSession},
                             {0x2001, 0, kvErrInvalidSession},
                             {0xFFFF, 0x3FF62001, kvErrInvalidSession},
                             {0x2001, kOpenError, kOpenError},
                             {0x2000, 0, 0}};
  for (const auto &c : cases) EXPECT_EQ(PlaceSlot(c[0], c[1]), c[2]) << std::hex << c[0];
  for (uint32_t handle : {0x0u, 0x2001u, 0x1FFFu})
    EXPECT_EQ(cSlotGuard(handle).status(), kvErrInvalidSession) << handle;
  tSessionSlot *slot = Slot(0x2000u);
  {
    cSlotGuard guard(0xFFFF2000u);  // the high bits are not the table's
    ASSERT_TRUE(guard);
    EXPECT_EQ(&guard.slot(), slot);
    EXPECT_EQ(cSlotGuard(0x2000u).status(), kvErrSessionBusy);
    // The list guard is its own word: a name lookup runs beside a read.
    cSlotGuard list(0x2000u, &tSessionSlot::listGuard);
    EXPECT_TRUE(list && slot->listGuard.load() == 1u);
  }
  EXPECT_EQ(slot->guard.load() + slot->listGuard.load(), 0u);
  slot->slotValid = 0;  // as a teardown leaves it before it waits for the guards
  EXPECT_EQ(cSlotGuard(0x2000u).status(), kvErrSessionBusy);
  EXPECT_EQ(slot->guard.load(), 0u) << "the guard won is given back";
}

TEST_F(SessionTable, AnEndedSlotFreesWhatItOwnsAndItsRecordComesBackClean) {
  // Under the leak checker, every block the slot points to must be gone with it.
  ASSERT_EQ(PlaceSlot(0x11u), 0);
  tSessionSlot *slot = Slot(0x11u);
  slot->frameBuffer = std::malloc(64);
  slot->waveformScratch = static_cast<tWaveformScratch *>(std::malloc(sizeof(tWaveformScratch)));
  slot->waveformScratch->sampleBuffers = static_cast<double **>(std::malloc(16));
  slot->waveformScratch->descriptors = static_cast<SvWaveformDescriptor *>(std::malloc(160));
  slot->flexRayTimeCache = std::malloc(32);
  slot->sessionNameList = new cNameList("A,B");
  slot->nameList = new cNameList("S1");
  slot->cachedCount = 5;
  slot->guard = 1;
  DestroySlot(gSessionManager.slots[0x11].exchange(nullptr));
  DestroySlot(nullptr);
  // A caller that loaded the pointer late may still touch the record: it is kept for the next.
  ASSERT_EQ(PlaceSlot(0x12u), 0);
  ASSERT_EQ(Slot(0x12u), slot);
  EXPECT_EQ(slot->nameList, nullptr);
  EXPECT_EQ(slot->cachedCount, kUnknown);
  EXPECT_EQ(slot->guard.load(), 0u);
  EXPECT_EQ(slot->slotValid.load(), 1u);
}

TEST(NameList, FindsWholeNamesFirstThenThePartBeforeTheFirstDot) {
  // A blank or newline ends a name; empty entries are dropped.
  const cNameList list(" Brake.Front ,,Brake\nx,\tSpeed.Wheel.FL,Gear One,Speedo,");
  EXPECT_EQ(list.Names(),
            (std::vector<std::string>{"Brake.Front", "Brake", "Speed.Wheel.FL", "Gear", "Speedo"}));
  // The whole entry wins over an earlier prefix match; else only the part before the first dot
  // counts. The looked-up text is normalised too, only `length` bytes of it count, case matters.
  const std::tuple<const char *, std::ptrdiff_t, int> cases[] = {
      {"Brake", 5, 1}, {"Brake.Front", 11, 0}, {"Speed", 5, 2},   {"Speed.Wheel", 11, -1},
      {"Spee", 4, -1}, {" Gear \n", 7, 3},     {"Gearbox", 4, 3}, {"gear", 4, -1},
      {"Gear", 0, -1}, {nullptr, 4, -1}};
  for (const auto &[text, length, expected] : cases)
    EXPECT_EQ(list.Find(text, length), expected) << (text ? text : "(null)");
  EXPECT_EQ(cNameList(nullptr).Find("Gear", 4), -1);
  EXPECT_FALSE(cNameList(nullptr).Valid());
}

using SessionLife = SessionFixture;

TEST_F(SessionLife, ReferenceFailuresAreReportedAndLeaveNothingBehind) {
  kvsvtest::cFakeErrorLog log;
  SvHandle name = Keep(svsimMakeString("RefName"));
  const uint64_t liveBefore = svsimLiveHandles();
  SvRefnum cookie = 0, device = 0;
  EXPECT_EQ(RegisterReference(0xF0000, name, 5, &cookie), kvErrInternal);  // no such class
  for (uint32_t n = 1; n <= 5; ++n) {  // each text of the registration
    svsimFailAllocAt(n);
    EXPECT_EQ(RegisterReference(kClassSession, name, 5, &cookie), kvErrOutOfMemory) << n;
  }
  svsimSetRefStatus(-7);
  EXPECT_EQ(RegisterReference(kClassSession, name, 5, &cookie), kvErrInternal);
  svsimSetRefStatus(0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(svsimLiveHandles(), liveBefore);
  ASSERT_EQ(RegisterReference(kClassSession, name, 9, &cookie), 0);
  ASSERT_EQ(RegisterReference(kClassDevice, name, 0x01010100u, &device), 0);
  svsimSetRefStatus(3);  // a host warning is dropped
  EXPECT_EQ(UnregisterReference(cookie), 0);
  svsimSetRefStatus(0);
  EXPECT_EQ(UnregisterReference(cookie), kvErrInternal);  // gone already
  EXPECT_EQ(UnregisterReference(0), 0);
  const std::string other = "Other", text = "RefName";
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &other), kvErrInternal);
  EXPECT_EQ(UnregisterReferenceByName(kClassInterface, &text), kvErrInternal);
  EXPECT_EQ(UnregisterReferenceByName(kClassBareDatabase, &text), kvErrInternal);
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(ReportLines(log), (std::vector<uint32_t>{2451, 2536, 2596, 2743, 2743, 2719}));
  EXPECT_EQ(log.Records().at(1).value.info, static_cast<uint32_t>(-7));
}

TEST_F(SessionLife, ManualSessionsAreKeptByTheHostAndEndWithTheProgram) {
  ASSERT_EQ(kvsimFailCall("kvCreateSession", 0x3FF62005, 1), 0);  // a warning is lost
  const auto a = CreateManual("Speed,Gear", kvMode_SignalInSinglePoint, "CAN1");
  const auto b = CreateManual("B", kvMode_SignalOutSinglePoint, "CAN2");
  ASSERT_EQ(a.status, 0);
  SvsimRefInfo info{};
  ASSERT_EQ(svsimFindRef(kvsvtest::ManualSessionName(a.handle).c_str(), &info), 1);
  EXPECT_STREQ(info.className, "KVOR Session");
  EXPECT_EQ(info.keep, 1);
  EXPECT_TRUE(HasSlot(a.handle) && HasSlot(b.handle));
  // The host ends the program through the close named at registration.
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.closesCalled, 2);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_FALSE(HasSlot(a.handle) || HasSlot(b.handle));
}

TEST_F(SessionLife, ACreateThatFailsLeavesNoDriverSession) {
  // Refused by the driver, a session is registered as handle 0, to fail at its first use.
  const std::tuple<const char *, std::function<void()>, kvsvStatus, int, int, int> cases[] = {
      {"CAN9", [] {}, kvsimErrUnknownInterface, 1, 0, 1},
      {"CAN1", [] { svsimSetRefStatus(-9); }, kvErrInternal, 1, 1, 0},
      {"CAN1", [] { svsimFailAllocAt(1); }, kvErrOutOfMemory, 0, 0, 0},   // the name handle
      {"CAN1", [] { svsimFailResizeAt(1); }, kvErrOutOfMemory, 1, 1, 0},  // the name's text
  };
  for (const auto &[intf, fail, expected, creates, clears, refs] : cases) {
    SCOPED_TRACE(expected);
    svsimReset();
    kvsimLogClear();
    fail();
    const auto made = CreateManual("A", kvMode_SignalInSinglePoint, intf);
    svsimSetRefStatus(0);
    EXPECT_EQ(made.status, expected);
    EXPECT_EQ(made.handle, 0u);
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), creates);
    EXPECT_EQ(kvsimCountCalls("kvClear"), clears);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_EQ(svsimRefCount(), refs);
  }
}

TEST_F(SessionLife, CloseEndsASessionOnceAndSendsEveryOtherReferenceToItsOwnClose) {
  kvsvtest::cFakeErrorLog log;
  const auto made = CreateManual("A", kvMode_SignalInSinglePoint, "CAN1");
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionClose(made.handle), 0);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
  EXPECT_FALSE(HasSlot(made.handle));
  kvsimLogClear();
  for (uint32_t handle : {0x8F000001u, 0u, 0x82000001u, 0x0F000001u})
    EXPECT_EQ(kvsvSessionClose(handle), 0);
  // A bare database goes to the driver's close, a frame to the database close, which closes a
  // handle it never opened at the driver; none has no close.
  EXPECT_EQ(DriverCalls(), (std::vector<std::string>{"kvdbCloseDatabase 2399141889 0 ",
                                                     "kvdbCloseDatabase 2181038081 0 "}));
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  gReportImplicitClose = 1;  // an implicit close of a system object is reported when asked for
  EXPECT_EQ(kvsvSessionClose(system), 0);
  gReportImplicitClose = 0;
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
  EXPECT_EQ(ReportLines(log), std::vector<uint32_t>{2242});
}

TEST_F(SessionLife, ClearRemovesTheReferenceThenEndsTheSession) {
  const int32_t cases[][2] = {{0, 0}, {5, 0}, {-4, kvErrInternal}};  // a host warning is dropped
  for (const auto &c : cases) {
    const auto made = CreateManual("A", kvMode_SignalInSinglePoint, "CAN2");
    svsimSetRefStatus(c[0]);
    EXPECT_EQ(kvsvSessionClear(made.handle, made.reference), c[1]) << c[0];
    svsimSetRefStatus(0);
    EXPECT_EQ(svsimRefCount(), c[0] < 0 ? 1 : 0);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_FALSE(HasSlot(made.handle));
    svsimReset();
  }
}

class ProjectClose : public SessionFixture {
 protected:
  // An interface record as a project open leaves it: sessions by name, with their state.
  void MakeRecord(const std::map<std::string, uint32_t> &states) {
    auto *record = new cSnLifeInterface();
    for (const auto &[name, state] : states) {
      handles_[name] = state != S::kGone ? MakeSession(name, kvMode_SignalInSinglePoint) : 0;
      record->sessions[name] = new S{state, handles_[name], 0};
    }
    gSessionManager.InsertInterface("CAN1", record);
  }
  static uint32_t StateOf(const std::string &name) {
    return gSessionManager.interfaces.at("CAN1")->sessions.at(name)->state;
  }
  std::map<std::string, uint32_t> handles_;
};

TEST_F(ProjectClose, TheLastClaimedSessionTakesTheRecordAndItsUnclaimedSiblings) {
  MakeRecord({{"A", S::kClaimed}, {"B", S::kClaimed}, {"C", S::kCreated}, {"D", S::kGone}});
  EXPECT_EQ(Teardown(handles_["A"]), 0);
  EXPECT_EQ(StateOf("A"), S::kGone);
  EXPECT_EQ(Slot(handles_["A"]), nullptr);
  EXPECT_EQ(kvsimOpenSessionCount(), 2);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 1);
  kvsimLogClear();
  EXPECT_EQ(Teardown(handles_["B"]), 0);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 2);
  EXPECT_EQ(DriverCalls().at(2), "kvClear " + std::to_string(handles_["B"]) + " 0 ")
      << "the interface name's size and text are read, then the closed session goes first";
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

TEST_F(ProjectClose, TheFirstFailureAmongTheSiblingsIsTheResult) {
  MakeRecord({{"A", S::kClaimed}, {"B", S::kCreated}, {"C", S::kCreated}});
  // The closed session warns, then each sibling fails.
  for (uint32_t status : {0x3FF62001u, 0xBFF62091u, 0xBFF62092u})
    ASSERT_EQ(kvsimFailCall("kvClear", static_cast<int32_t>(status), 1), 0);
  EXPECT_EQ(Teardown(handles_["A"]), static_cast<int32_t>(0xBFF62091u));
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

TEST_F(ProjectClose, SessionsOutsideTheRecordAreOnlyCleared) {
  MakeRecord({{"A", S::kClaimed}});
  // A manual session on the record's interface, a suffix that the key lacks, no record at all;
  // "": the record's own session, whose interface name cannot be read.
  for (const char *intf : {"CAN1", "CAN1/monitor", "CAN3", ""}) {
    SCOPED_TRACE(intf);
    const bool own = *intf == '\0';
    const uint32_t handle =
        own ? handles_["A"] : MakeSession("M", kvMode_SignalInSinglePoint, intf);
    if (own) kvsimFailProperty("kvGetProperty", kvPropSession_IntfName, kvsimErrInternal, 1);
    kvsimLogClear();
    EXPECT_EQ(Teardown(handle), 0);
    EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
    EXPECT_EQ(StateOf("A"), S::kClaimed);
    EXPECT_EQ(Slot(handle), nullptr);
  }
}

TEST_F(SessionTable, GuardsAreAwaitedAtTeardownUpToTheLastPoll) {
  // The guard held, the poll after which it is let go (0: never), the result and the polls made.
  // Let go during the last sleep is too late, for no look follows it.
  const std::tuple<std::atomic<uint32_t> tSessionSlot::*, int, Status, int> cases[] = {
      {&tSessionSlot::guard, 0, kvErrInternal, 1000},
      {&tSessionSlot::listGuard, 0, kvErrInternal, 1000},
      {&tSessionSlot::guard, 3, 0, 3},
      {&tSessionSlot::guard, 1000, kvErrInternal, 1000},
  };
  tSessionSlot *previous = nullptr;
  for (const auto &[held, freedAt, status, polls] : cases) {
    SCOPED_TRACE(freedAt);
    kvsvtest::cFakeErrorLog log;
    const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
    tSessionSlot *slot = Slot(session);
    // The record of the slot that the case before ended, however it ended, is this one's.
    EXPECT_TRUE(previous == nullptr || slot == previous);
    previous = slot;
    (slot->*held) = 1;
    gSleeps = 0;
    gOnSleep = [slot, held = held, freedAt = freedAt](int n) {
      if (n == freedAt) (slot->*held) = 0;
    };
    EXPECT_EQ(Teardown(session), status);
    gOnSleep = nullptr;
    EXPECT_EQ(gSleeps.load(), polls);
    EXPECT_EQ(gLastRequestNs.load(), 100000000L);
    EXPECT_EQ(Slot(session), nullptr) << "the slot goes whether or not its guards were let go";
    EXPECT_EQ(ReportLines(log), std::vector<uint32_t>(status != 0 ? 1 : 0, 1485));
  }
}

}  // namespace
