// Slots and their guard, name lists, host references and the close dispatch, manual sessions from
// creation to the end of the program, the close of project sessions, and the exports that only
// forward to the driver.
#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <ctime>
#include <functional>
#include <map>
#include <string>
#include <vector>

#include "session/kvorutility.h"
#include "session/name_list.h"
#include "session/object_class.h"
#include "session/session_fixture.h"
#include "session/slot_guard.h"
#include "session/teardown_slot.h"
#include "support/fake_error_log.h"
#include "support/session_helpers.h"

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

std::vector<uint32_t> ReportLines(const kvsvtest::cFakeErrorLog &log) {
  std::vector<uint32_t> lines;
  for (const auto &record : log.Records()) lines.push_back(record.value.Line());
  return lines;
}

Status Teardown(uint32_t handle) {
  std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
  return TeardownSlot(gSessionManager, handle);
}

using SessionTable = SessionFixture;

TEST_F(SessionTable, SlotsExistForIndices1To8192WhateverTheHighBits) {
  const struct {
    uint32_t handle;
    Status openStatus, expected;
  } cases[] = {
      {0x00000000u, 0, kvErrInvalidSession},
      {0x00002001u, 0, kvErrInvalidSession},
      {0x0000FFFFu, 0, kvErrInvalidSession},
      {0x00002001u, static_cast<Status>(0xBFF62020), static_cast<Status>(0xBFF62020)},
      {0x00002001u, 0x3FF62001, kvErrInvalidSession},  // a warning is no open error
      {0x00002000u, 0, 0},
  };
  for (const auto &c : cases) EXPECT_EQ(PlaceSlot(c.handle, c.openStatus), c.expected) << c.handle;
  EXPECT_EQ(gSessionManager.slots[0].load(), nullptr);
  for (uint32_t handle : {0x0u, 0x2001u, 0x1FFFu})
    EXPECT_EQ(cSlotGuard(handle).status(), kvErrInvalidSession) << handle;
  for (uint32_t handle : {0x00002000u, 0xFFFF2000u}) {
    cSlotGuard guard(handle);
    ASSERT_TRUE(guard) << handle;
    EXPECT_EQ(&guard.slot(), Slot(0x2000u));
  }
  EXPECT_EQ(Slot(0x2000u)->guard.load(), 0u);
}

TEST_F(SessionTable, EachGuardWordAdmitsOneCallAndNoneOnceTheSlotIsEnding) {
  ASSERT_EQ(PlaceSlot(0x123u), 0);
  tSessionSlot *slot = Slot(0x123u);
  {
    cSlotGuard guard(0x123u);
    ASSERT_TRUE(guard);
    EXPECT_EQ(cSlotGuard(0x123u).status(), kvErrSessionBusy);
    // The list guard is its own word: a name lookup runs beside a read.
    cSlotGuard list(0x123u, &tSessionSlot::listGuard);
    EXPECT_TRUE(list);
    EXPECT_EQ(slot->listGuard.load(), 1u);
  }
  EXPECT_EQ(slot->guard.load() + slot->listGuard.load(), 0u);
  slot->slotValid = 0;  // as a teardown leaves it before waiting for the guards
  EXPECT_EQ(cSlotGuard(0x123u).status(), kvErrSessionBusy);
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
  slot->sessionMode = 3;
  slot->guard = 1;
  DestroySlot(gSessionManager.slots[0x11].exchange(nullptr));
  DestroySlot(nullptr);
  // A caller that loaded the pointer late may still touch the record: it is kept for the next.
  ASSERT_EQ(PlaceSlot(0x12u), 0);
  ASSERT_EQ(Slot(0x12u), slot);
  EXPECT_EQ(slot->frameBuffer, nullptr);
  EXPECT_EQ(slot->waveformScratch, nullptr);
  EXPECT_EQ(slot->nameList, nullptr);
  EXPECT_EQ(slot->cachedCount, kUnknown);
  EXPECT_EQ(slot->sessionMode, 0xFFFFFFFFu);
  EXPECT_EQ(slot->guard.load(), 0u);
  EXPECT_EQ(slot->slotValid.load(), 1u);
}

TEST(NameList, CutsAtCommasDropsEmptyEntriesAndNormalises) {
  const struct {
    const char *text;
    bool valid;
    std::vector<std::string> names;
  } cases[] = {
      // A blank or newline ends a name.
      {" EngineSpeed ,,\tGear\nPowertrain.CAN , Msg One.Sig,", true, {"EngineSpeed", "Gear", "Msg"}},
      {"", true, {}},
      {nullptr, false, {}},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text ? c.text : "(null)");
    const cNameList list(c.text);
    EXPECT_EQ(list.Valid(), c.valid);
    EXPECT_EQ(list.Names(), c.names);
    EXPECT_EQ(list.Find("A", 1), -1);
  }
}

TEST(NameList, FindsWholeNamesFirstThenThePartBeforeTheFirstDot) {
  const cNameList list("Brake.Front,Brake,Speed.Wheel.FL,Gear,Speedo");
  const struct {
    const char *text;
    std::ptrdiff_t length;
    int expected;
  } cases[] = {
      {"Brake", 5, 1},  // the whole entry wins over an earlier prefix match
      {"Brake.Front", 11, 0},
      {"Speed", 5, 2},  // only the part before the first dot
      {"Speed.Wheel", 11, -1},
      {"Spee", 4, -1},     // a prefix of a part is no match
      {" Gear \n", 7, 3},  // the looked-up text is normalised too
      {"Gearbox", 4, 3},   // only `length` bytes count
      {"gear", 4, -1},     // case matters
      {"", 0, -1},
      {"Gear", -1, -1},
      {nullptr, 4, -1},
  };
  for (const auto &c : cases)
    EXPECT_EQ(list.Find(c.text, c.length), c.expected) << (c.text ? c.text : "(null)");
}

TEST(ClassFromHandle, EveryKindOfHandle) {
  const uint32_t cases[][2] = {
      {0x00000000u, kClassNone},    {0x01000000u, kClassSystem},
      {0x01000010u, kClassDevice},  {0x01000001u, kClassInterface},
      {0x01AB1200u, kClassDevice},  {0x01AB120Fu, kClassInterface},
      {0x0F123456u, kClassNone},    {0x02000000u, kClassSession},
      {0x20010001u, kClassSession}, {0x00000001u, kClassSession},
      {0x80000000u, kClassDatabase}, {0x83000000u, kClassSignal},
      {0x8F000000u, kClassBareDatabase}, {0xF8123456u, kClassPdu},
  };
  for (const auto &c : cases)
    EXPECT_EQ(ClassFromHandle(static_cast<int32_t>(c[0])), c[1]) << std::hex << c[0];
}

class References : public SessionFixture {
 protected:
  void TearDown() override {
    gReportImplicitClose = 0;
    SessionFixture::TearDown();
  }
  kvsvtest::cFakeErrorLog log_;
};

TEST_F(References, FailedRegistrationsAreReportedAndLeaveNothingBehind) {
  SvHandle name = Keep(svsimMakeString("RefName"));
  const uint64_t liveBefore = svsimLiveHandles();
  SvRefnum reference = 0;
  EXPECT_EQ(RegisterReference(0xF0000, name, 5, &reference), kvErrInternal);
  svsimSetRefStatus(-7);
  EXPECT_EQ(RegisterReference(kClassSession, name, 5, &reference), kvErrInternal);
  svsimSetRefStatus(0);
  for (uint32_t n = 1; n <= 5; ++n) {  // each text handle of the registration
    svsimFailAllocAt(n);
    EXPECT_EQ(RegisterReference(kClassSession, name, 5, &reference), kvErrOutOfMemory) << n;
  }
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(svsimLiveHandles(), liveBefore);
  EXPECT_EQ(ReportLines(log_), (std::vector<uint32_t>{2451, 2536}));
  const auto records = log_.Records();
  EXPECT_EQ(records[0].value.File(), nFile::kUtility);
  EXPECT_EQ(records[0].value.info, 0u);
  EXPECT_EQ(records[1].value.info, static_cast<uint32_t>(-7));
}

TEST_F(References, RemovalByCookieAndByNameOfItsClass) {
  SvHandle name = Keep(svsimMakeString("RefName"));
  SvRefnum cookie = 0, device = 0;
  EXPECT_EQ(UnregisterReference(0), 0);
  ASSERT_EQ(RegisterReference(kClassSession, name, 9, &cookie), 0);
  ASSERT_EQ(RegisterReference(kClassDevice, name, 0x01010100u, &device), 0);
  svsimSetRefStatus(3);  // a host warning
  EXPECT_EQ(UnregisterReference(cookie), 0);
  svsimSetRefStatus(0);
  EXPECT_EQ(UnregisterReference(cookie), kvErrInternal);  // gone already
  const std::string other = "Other", text = "RefName";
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &other), kvErrInternal);
  EXPECT_EQ(UnregisterReferenceByName(kClassInterface, &text), kvErrInternal);
  EXPECT_EQ(UnregisterReferenceByName(kClassBareDatabase, &text), kvErrInternal);  // no such class
  EXPECT_EQ(svsimRefCount(), 1);
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(ReportLines(log_), (std::vector<uint32_t>{2596, 2743, 2743, 2719}));
}

TEST_F(References, CloseDispatchSendsEachClassToItsClose) {
  const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
  kvsimLogClear();
  CloseDispatch(session, kClassSession);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
  EXPECT_EQ(Slot(session), nullptr);
  CloseDispatch(0x8F000001u, kClassBareDatabase);
  kvsimCallRecord record{};
  ASSERT_EQ(kvsimLogEntry(kvsimLogCount() - 1, &record), 1);
  EXPECT_STREQ(record.function, "kvdbCloseDatabase");
  EXPECT_EQ(record.object, 0x8F000001u);
  // Classes without a close here are left alone.
  kvsimLogClear();
  CloseDispatch(0x82000001u, kClassFrame);
  CloseDispatch(5, kClassNone);
  EXPECT_EQ(kvsimLogCount(), 0);
  EXPECT_TRUE(log_.Records().empty());
  // Implicit closes of system objects are reported when asked for.
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  gReportImplicitClose = 1;
  CloseDispatch(system, kClassSystem);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(ReportLines(log_), std::vector<uint32_t>{2242});
  EXPECT_EQ(log_.Records().at(0).value.info, kClassSystem);
}

using SessionLife = SessionFixture;

TEST_F(SessionLife, ManualSessionsAreKeptByTheHostAndEndWithTheProgram) {
  const auto a = CreateManual("Speed,Gear", kvMode_SignalInSinglePoint, "CAN1");
  const auto b = CreateManual("B", kvMode_SignalOutSinglePoint, "CAN2");
  ASSERT_EQ(a.status, 0);
  ASSERT_NE(a.handle, 0u);
  SvsimRefInfo info{};
  ASSERT_EQ(svsimFindRef(kvsvtest::ManualSessionName(a.handle).c_str(), &info), 1);
  EXPECT_STREQ(info.className, "KVOR Session");
  EXPECT_EQ(info.keep, 1);
  EXPECT_TRUE(HasSlot(a.handle));
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
  ASSERT_EQ(kvsimOpenSessionCount(), 2);
  // The host ends the program through the close named at registration.
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.closesCalled, 2);
  EXPECT_EQ(report.closesMissing, 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_FALSE(HasSlot(a.handle));
  EXPECT_FALSE(HasSlot(b.handle));
}

TEST_F(SessionLife, TheDriversAnswerToACreate) {
  // Refused: registered as handle 0, so that the failure surfaces at the first use.
  const auto refused = CreateManual("Speed", kvMode_SignalInSinglePoint, "CAN9");
  EXPECT_EQ(refused.status, kvsimErrUnknownInterface);
  SvsimRefInfo info{};
  ASSERT_EQ(svsimFindRef("___kvorSesn#00000000", &info), 1);
  EXPECT_EQ(info.cookie, refused.reference);
  EXPECT_EQ(info.handle, 0u);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  // A warning is lost.
  ASSERT_EQ(kvsimFailCall("kvCreateSession", 0x3FF62005, 1), 0);
  const auto warned = CreateManual("Speed", kvMode_SignalInSinglePoint, "CAN1");
  EXPECT_EQ(warned.status, 0);
  EXPECT_TRUE(HasSlot(warned.handle));
}

TEST_F(SessionLife, AFailedRegistrationOrHostMemoryLeavesNoSession) {
  const struct {
    const char *what;
    std::function<void()> fail;
    kvsvStatus expected;
    int creates;
  } cases[] = {
      {"registration", [] { svsimSetRefStatus(-9); }, kvErrInternal, 1},
      {"name handle", [] { svsimFailAllocAt(1); }, kvErrOutOfMemory, 0},
      {"name text", [] { svsimFailResizeAt(1); }, kvErrOutOfMemory, 1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    kvsimLogClear();
    c.fail();
    kvsvRefnum reference = 0;
    EXPECT_EQ(kvsvSessionManualCreate(":memory:", "", "A", "CAN1", kvMode_SignalInSinglePoint,
                                      &reference),
              c.expected);
    svsimSetRefStatus(0);
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), c.creates);
    EXPECT_EQ(kvsimCountCalls("kvClear"), c.creates);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_EQ(svsimRefCount(), 0);
  }
}

TEST_F(SessionLife, CloseEndsTheDriverSessionOnceAndSendsOtherReferencesToTheirClose) {
  const auto made = CreateManual("A", kvMode_SignalInSinglePoint, "CAN1");
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionClose(made.handle), 0);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_FALSE(HasSlot(made.handle));
  EXPECT_EQ(kvsvSessionClose(made.handle), 0);  // nothing left to free
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionClose(0), 0);
  EXPECT_EQ(kvsimLogCount(), 0);
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  EXPECT_EQ(kvsvSessionClose(system), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
}

TEST_F(SessionLife, ClearRemovesTheReferenceThenEndsTheSession) {
  const struct {
    int32_t hostStatus;
    kvsvStatus expected;
  } cases[] = {{0, 0}, {5, 0}, {-4, kvErrInternal}};  // a host warning is dropped
  for (const auto &c : cases) {
    SCOPED_TRACE(c.hostStatus);
    const auto made = CreateManual("A", kvMode_SignalInSinglePoint, "CAN2");
    svsimSetRefStatus(c.hostStatus);
    EXPECT_EQ(kvsvSessionClear(made.handle, made.reference), c.expected);
    svsimSetRefStatus(0);
    EXPECT_EQ(svsimRefCount(), c.hostStatus < 0 ? 1 : 0);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_FALSE(HasSlot(made.handle));
    svsimReset();
  }
  // Handle 0: only the reference goes.
  const auto made = CreateManual("A", kvMode_SignalInSinglePoint, "CAN1");
  EXPECT_EQ(kvsvSessionClear(0, made.reference), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_TRUE(HasSlot(made.handle));
  EXPECT_EQ(kvsimOpenSessionCount(), 1);
}

class ProjectClose : public SessionFixture {
 protected:
  // An interface record as a project open leaves it: sessions by name, with their state.
  void MakeRecord(const std::map<std::string, uint32_t> &states) {
    auto *record = new cSnLifeInterface();
    for (const auto &entry : states) {
      auto *session = new cSnLifeSession();
      session->state = entry.second;
      if (entry.second != cSnLifeSession::kGone)
        session->handle = MakeSession(entry.first, kvMode_SignalInSinglePoint, "CAN1");
      handles_[entry.first] = session->handle;
      record->sessions[entry.first] = session;
    }
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    gSessionManager.InsertInterface("CAN1", record);
  }
  static uint32_t StateOf(const std::string &name) {
    return gSessionManager.interfaces.at("CAN1")->sessions.at(name)->state;
  }
  std::map<std::string, uint32_t> handles_;
};

TEST_F(ProjectClose, TheLastClaimedSessionTakesTheRecordAndItsUnclaimedSiblings) {
  MakeRecord({{"A", cSnLifeSession::kClaimed}, {"B", cSnLifeSession::kClaimed},
              {"C", cSnLifeSession::kCreated}, {"D", cSnLifeSession::kGone}});
  ASSERT_EQ(kvsimOpenSessionCount(), 3);
  EXPECT_EQ(Teardown(handles_["A"]), 0);
  EXPECT_EQ(StateOf("A"), cSnLifeSession::kGone);
  EXPECT_EQ(Slot(handles_["A"]), nullptr);
  EXPECT_EQ(kvsimOpenSessionCount(), 2);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 1);
  kvsimLogClear();
  EXPECT_EQ(Teardown(handles_["B"]), 0);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 2);
  kvsimCallRecord first{};
  ASSERT_EQ(kvsimLogEntry(2, &first), 1);  // size read, name read, then the closed session
  EXPECT_EQ(first.object, handles_["B"]);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

TEST_F(ProjectClose, TheFirstFailureAmongTheSiblingsIsTheResult) {
  MakeRecord({{"A", cSnLifeSession::kClaimed}, {"B", cSnLifeSession::kCreated},
              {"C", cSnLifeSession::kCreated}});
  const int32_t first = static_cast<int32_t>(0xBFF62091), second = static_cast<int32_t>(0xBFF62092);
  ASSERT_EQ(kvsimFailCall("kvClear", 0x3FF62001, 1), 0);  // the closed session warns
  ASSERT_EQ(kvsimFailCall("kvClear", first, 1), 0);
  ASSERT_EQ(kvsimFailCall("kvClear", second, 1), 0);
  EXPECT_EQ(Teardown(handles_["A"]), first);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

TEST_F(ProjectClose, SessionsOutsideTheRecordAreOnlyCleared) {
  MakeRecord({{"A", cSnLifeSession::kClaimed}});
  // A manual session on the record's interface, a suffix that the key lacks, no record at all.
  for (const char *intf : {"CAN1", "CAN1/monitor", "CAN3", ""}) {
    SCOPED_TRACE(intf);
    // "": the record's own session, whose interface name cannot be read.
    const bool own = *intf == '\0';
    const uint32_t handle = own ? handles_["A"] : MakeSession("M", kvMode_SignalInSinglePoint, intf);
    if (own) kvsimFailProperty("kvGetProperty", kvPropSession_IntfName, kvsimErrInternal, 1);
    kvsimLogClear();
    EXPECT_EQ(Teardown(handle), 0);
    EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
    EXPECT_EQ(StateOf("A"), cSnLifeSession::kClaimed);
    EXPECT_EQ(Slot(handle), nullptr);
  }
  // Outside the table: the close's failure, else invalid session.
  EXPECT_EQ(Teardown(0), kvErrInvalidSession);
  uint32_t error = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(static_cast<int32_t>(0xBFF62010), &error), 0);
  ASSERT_EQ(kvsimFailCall("kvClear", kvsimErrInternal, 1), 0);
  EXPECT_EQ(Teardown((error & 0xFFFF0000u) | 0x2001u), kvsimErrInternal);
}

class TeardownTimeout : public SessionFixture {
 protected:
  void TearDown() override {
    gOnSleep = nullptr;
    SessionFixture::TearDown();
  }
};

TEST_F(TeardownTimeout, GuardsAreAwaitedUpToTheLastPoll) {
  const struct {
    const char *what;
    std::atomic<uint32_t> tSessionSlot::*held;
    int freedAt;  // the poll after which the guard is let go; 0: never
    Status status;
    int polls;
  } cases[] = {
      {"guard never freed", &tSessionSlot::guard, 0, kvErrInternal, 1000},
      {"list guard never freed", &tSessionSlot::listGuard, 0, kvErrInternal, 1000},
      {"guard freed during the wait", &tSessionSlot::guard, 3, 0, 3},
      // Let go during the last sleep: too late, for no look follows it.
      {"guard freed at the last poll", &tSessionSlot::guard, 1000, kvErrInternal, 1000},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    kvsvtest::cFakeErrorLog log;
    const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
    tSessionSlot *slot = Slot(session);
    (slot->*c.held) = 1;
    gSleeps = 0;
    gLastRequestNs = 0;
    gOnSleep = [slot, &c](int n) {
      if (n == c.freedAt) (slot->*c.held) = 0;
    };
    EXPECT_EQ(Teardown(session), c.status);
    EXPECT_EQ(gSleeps.load(), c.polls);
    EXPECT_EQ(gLastRequestNs.load(), 100000000L);
    EXPECT_EQ(Slot(session), nullptr) << "the slot goes whether or not its guards were let go";
    EXPECT_EQ(ReportLines(log), c.status != 0 ? std::vector<uint32_t>{1485} : std::vector<uint32_t>{});
  }
}

using DriverForwards = SessionFixture;

TEST_F(DriverForwards, ControlExportsHandTheDriverTheirArgumentsAndReturnItsStatus) {
  // A session of the driver alone: the library holds no slot for it.
  uint32_t s = 0, system = 0, interfaces[2] = {};
  ASSERT_EQ(kvCreateSession("DB", "Cluster", "Speed", "FlexRay2", kvMode_SignalInSinglePoint, &s), 0);
  ASSERT_EQ(kvSystemOpen(&system), 0);
  ASSERT_EQ(kvGetProperty(system, kvPropSys_IntfRefsFlexRay, sizeof interfaces, interfaces), 0);
  const uint32_t intf = interfaces[1];
  uint64_t token = 0;
  const struct {
    const char *function;
    std::function<int32_t()> call;
    uint32_t object, size1;
    std::string text;
  } cases[] = {
      {"kvStart", [=] { return kvsvSessionStart(s, kvsimScopeInterfaceOnly); }, s,
       kvsimScopeInterfaceOnly, ""},
      {"kvStop", [=] { return kvsvSessionStop(s, kvsimScopeSessionOnly); }, s,
       kvsimScopeSessionOnly, ""},
      {"kvFlush", [=] { return kvsvSessionFlush(s); }, s, 0, ""},
      {"kvConnectTerminals",
       [=] { return kvsvSessionConnectTerminals(s, "PXI_Trig4", "FrontPanel1"); }, s, 0,
       "PXI_Trig4 -> FrontPanel1"},
      {"kvDisconnectTerminals",
       [=] { return kvsvSessionDisconnectTerminals(s, "PXI_Trig4", "FrontPanel1"); }, s, 0,
       "PXI_Trig4 -> FrontPanel1"},
      {"kvhdnCreateSvTiming_FlexRayMacrotick",
       [&] { return kvsvSessionCreateSvTiming_FlexRayMacrotick(s, &token); }, s, 0, ""},
      {"kvBlink", [=] { return kvsvInterfaceBlink(intf, kvsimBlinkOn); }, intf, kvsimBlinkOn, ""},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.function);
    kvsimLogClear();
    EXPECT_EQ(c.call(), 0);
    ASSERT_EQ(kvsimLogCount(), 1) << "one driver call and nothing else";
    kvsimCallRecord record;
    ASSERT_EQ(kvsimLogEntry(0, &record), 1);
    EXPECT_STREQ(record.function, c.function);
    EXPECT_EQ(record.object, c.object);
    EXPECT_EQ(record.size1, c.size1);
    EXPECT_EQ(record.text, c.text);
    ASSERT_EQ(kvsimFailCall(c.function, static_cast<int32_t>(0xBFF62DEA), 1), 0);
    EXPECT_EQ(c.call(), static_cast<int32_t>(0xBFF62DEA));
  }
  EXPECT_EQ(token, KVSIM_MACROTICK_SOURCE(s)) << "the timing source reaches the caller";
  EXPECT_EQ(kvsvSessionFlush(0x2000FFFFu), kvsimErrInvalidSession) << "unknown handles too";
}

}  // namespace
