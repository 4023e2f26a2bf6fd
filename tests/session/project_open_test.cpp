// Opening project sessions by name, from a session file in the driver's directory for temporary
// session files (relocated below a temporary root): siblings, claims, closes and error sessions.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "paths/relocation_root.h"
#include "session/open_project_session.h"
#include "session/project_session_support.h"
#include "session/session_manager.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::Entry;
using kvsvtest::Open;
using kvsvtest::UseStatus;

const kvsvtest::cRelocationRoot gRoot;

const int32_t kRefused = static_cast<int32_t>(0xBFF62099);

class ProjectOpen : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
    liveHandles_ = svsimLiveHandles();
  }

  void TearDown() override {
    for (uint32_t handle : opened_) kvsvSessionClose(handle);
    {
      // A failed sibling listing leaves its record behind on purpose.
      std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
      while (!gSessionManager.interfaces.empty())
        gSessionManager.EraseInterface(gSessionManager.interfaces.begin()->first);
    }
    kvsimReset();
    svsimReset();
  }

  static void WriteFile(const std::string &text) {
    kvsvtest::WriteText(gRoot.Path() + "/var/lib/kvor/kvorSession.txt", text);
  }

  // An open whose session is closed at the end of the test.
  kvsvtest::tOpened OpenKept(const char *name) {
    const kvsvtest::tOpened opened = Open(name);
    EXPECT_EQ(opened.status, 0) << name;
    if (opened.handle != 0) opened_.push_back(opened.handle);
    return opened;
  }

  void Close(uint32_t handle) {
    EXPECT_EQ(kvsvSessionClose(handle), 0);
    opened_.erase(std::remove(opened_.begin(), opened_.end(), handle), opened_.end());
  }

  static std::string TextProperty(uint32_t handle, uint32_t id) {
    char text[64] = {};
    EXPECT_EQ(kvGetProperty(handle, id, sizeof text, text), 0);
    return text;
  }

  uint64_t liveHandles_ = 0;
  std::vector<uint32_t> opened_;
};

TEST_F(ProjectOpen, FirstOpenCreatesTheSiblingsAndLaterOpensClaimThem) {
  WriteFile(Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") +
            Entry("B", "0 0 0 0 CAN1 Gear Body Vehicle") +
            Entry("M", "6 0 0 0 CAN1/monitor - Body Vehicle") +
            Entry("X", "0 0 0 0 CAN1 Speed Body Other"));
  const auto a = OpenKept("A");
  EXPECT_EQ(UseStatus(a.handle), 0);
  EXPECT_EQ(TextProperty(a.handle, kvPropSession_List), "Speed");
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 3);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 1);
  EXPECT_EQ(svsimRefCount(), 0);

  kvsimLogClear();
  const auto b = OpenKept("B");
  EXPECT_EQ(TextProperty(b.handle, kvPropSession_List), "Gear");
  const auto m = OpenKept("M");
  EXPECT_EQ(TextProperty(m.handle, kvPropSession_IntfName), "CAN1/monitor");
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);

  // Same interface, another database: not a sibling, and the record stays the first one's.
  const auto x = OpenKept("X");
  EXPECT_EQ(UseStatus(x.handle), kvErrSessionNotInInterface);
  const auto again = OpenKept("A");
  EXPECT_EQ(UseStatus(again.handle), kvErrSessionAlreadyOpen);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
  EXPECT_EQ(UseStatus(a.handle), 0);
  EXPECT_EQ(svsimLiveHandles(), liveHandles_);
}

TEST_F(ProjectOpen, SiblingThatFailedTellsItsFailureOnce) {
  struct Case {
    const char *what;
    const char *siblingFields;
    const char *failFunction;  // a driver failure injected after the first creation
    uint32_t failProperty;
    int32_t expected;
  } cases[] = {
      {"refused creation", "0 0 0 0 CAN1 a,,b Body Vehicle", nullptr, 0, kvsimErrInvalidList},
      {"refused resample rate", "1 10 0 0 CAN1 Gear Body Vehicle", "kvSetProperty",
       kvPropSession_ResampRate, kRefused},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    WriteFile(Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") + Entry("Bad", c.siblingFields));
    if (c.failFunction != nullptr) {
      ASSERT_EQ(kvsimFailProperty(c.failFunction, c.failProperty, kRefused, 1), 0);
    }
    const auto a = OpenKept("A");
    EXPECT_EQ(UseStatus(a.handle), 0);
    EXPECT_EQ(kvsimOpenSessionCount(), 1);
    const auto bad = OpenKept("Bad");
    EXPECT_EQ(UseStatus(bad.handle), c.expected);
    const auto badAgain = OpenKept("Bad");
    EXPECT_EQ(UseStatus(badAgain.handle), kvErrSessionNotInInterface);
    for (uint32_t handle : {badAgain.handle, bad.handle, a.handle}) Close(handle);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
  }
}

TEST_F(ProjectOpen, LastClaimedCloseEndsTheRecordAndTheNextOpenStartsAfresh) {
  WriteFile(Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") +
            Entry("B", "0 0 0 0 CAN1 Gear Body Vehicle") +
            Entry("C", "0 0 0 0 CAN1 Rpm Body Vehicle"));
  const auto a = OpenKept("A");
  const auto b = OpenKept("B");
  ASSERT_EQ(kvsimOpenSessionCount(), 3);

  Close(a.handle);
  EXPECT_EQ(kvsimOpenSessionCount(), 2);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 1);
  const auto closedName = Open("A");
  EXPECT_EQ(UseStatus(closedName.handle), kvErrSessionAlreadyOpen);
  Close(closedName.handle);

  // B was the last claimed session: C, never claimed, goes with it.
  Close(b.handle);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);

  kvsimLogClear();
  const auto reopened = OpenKept("A");
  EXPECT_EQ(UseStatus(reopened.handle), 0);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 3);
}

TEST_F(ProjectOpen, EntrySettingsReachTheDriver) {
  constexpr double kNoRate = -1.0;
  constexpr int64_t kNone = -1;
  struct Case {
    const char *fields;
    double rate;
    int64_t keySlot;
    int64_t schedule;
  } cases[] = {
      {"1 1000 500000 0 CAN1 - C D", 1000.5, kNone, kNone},
      {"4 2 0 0 CAN1 - C D", 2.0, kNone, kNone},
      {"2 1000 0 0 CAN1 - C D", kNoRate, kNone, kNone},
      {"0 0 0 0 FlexRay1 - C D", kNoRate, kNone, kNone},
      {"0 0 0 12 flexray1 - C D", kNoRate, 12, kNone},
      {"0 0 0 -1 LIN1 - C D", kNoRate, kNone, kNone},
      {"0 0 0 0 LIN1 - C D", kNoRate, kNone, 0},
      {"0 0 0 3 lin2/x - C D", kNoRate, kNone, 3},
      {"0 0 0 5 CAN2 - C D", kNoRate, kNone, kNone},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.fields);
    WriteFile(Entry("S", c.fields));
    const auto s = OpenKept("S");
    ASSERT_EQ(UseStatus(s.handle), 0);
    double rate = 0.0;
    const int32_t rateRead = kvGetProperty(s.handle, kvPropSession_ResampRate, 8, &rate);
    EXPECT_EQ(rateRead, c.rate == kNoRate ? kvsimErrPropertyUnknown : 0);
    if (c.rate != kNoRate) {
      EXPECT_EQ(rate, c.rate);
    }
    int32_t keySlot = 0;
    const int32_t keySlotRead =
        kvGetProperty(s.handle, kvPropSession_IntfFlexRayKeySlotID, 4, &keySlot);
    EXPECT_EQ(keySlotRead, c.keySlot == kNone ? kvsimErrPropertyUnknown : 0);
    if (c.keySlot != kNone) {
      EXPECT_EQ(keySlot, c.keySlot);
    }
    uint32_t schedule = 0;
    EXPECT_EQ(kvsimLinSchedule(s.handle, &schedule), c.schedule == kNone ? 0 : 1);
    if (c.schedule != kNone) {
      EXPECT_EQ(schedule, c.schedule);
    }
    Close(s.handle);
  }
}

TEST_F(ProjectOpen, RefusedSettingsClearTheNewSession) {
  struct Case {
    const char *fields;
    const char *function;
    uint32_t property;  // 0: any call of the function
  } cases[] = {
      {"1 10 0 0 CAN1 - C D", "kvSetProperty", kvPropSession_ResampRate},
      {"0 0 0 3 FlexRay1 - C D", "kvSetProperty", kvPropSession_IntfFlexRayKeySlotID},
      {"0 0 0 1 LIN1 - C D", "kvWriteState", 0},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.fields);
    WriteFile(Entry("S", c.fields));
    ASSERT_EQ(c.property != 0 ? kvsimFailProperty(c.function, c.property, kRefused, 1)
                              : kvsimFailCall(c.function, kRefused, 1),
              0);
    kvsimLogClear();
    const auto s = OpenKept("S");
    EXPECT_EQ(UseStatus(s.handle), kRefused);
    EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
    EXPECT_EQ(kvsimOpenSessionCount(), 1);  // the error session alone
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
    Close(s.handle);
  }
}

TEST_F(ProjectOpen, FailuresTravelInErrorSessions) {
  const std::string b = Entry("B", "0 0 0 0 CAN1 - C D");
  struct Case {
    const char *what;
    std::optional<std::string> file;  // none: no file at all
    const char *name;
    int32_t expected;
  } cases[] = {
      {"no file", std::nullopt, "B", kvErrSessionFile},
      {"empty file", "", "B", kvErrSessionFile},
      {"name absent", b, "A", kvErrSessionFile},
      {"a name line of 300 characters before the entry",
       Entry(std::string(300, 'x'), "0 0 0 0 CAN1 - C D") + b, "B", kvErrSessionFile},
      {"mode not numeric", Entry("B", "x 0 0 0 CAN1 - C D"), "B", kvErrInternal},
      {"a missing token", "B\n0 0 0 0 CAN1 -\n", "B", kvErrInternal},
      {"a truncated entry", "B\n0 0 0", "B", kvErrInternal},
      {"the driver refuses", Entry("B", "0 0 0 0 CAN9 - C D"), "B", kvsimErrUnknownInterface},
      {"an empty name", b, "", kvErrSessionNameEmpty},
      {"a manual session's name", b, "___kvorSesn#0000abcd", kvErrManualSessionName},
  };
  kvsvtest::cFakeErrorLog log;
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    std::remove((gRoot.Path() + "/var/lib/kvor/kvorSession.txt").c_str());
    if (c.file) WriteFile(*c.file);
    const auto s = OpenKept(c.name);
    EXPECT_EQ(UseStatus(s.handle), c.expected);
    EXPECT_EQ(kvsimOpenSessionCount(), 1);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
    EXPECT_EQ(svsimLiveHandles(), liveHandles_);
    EXPECT_EQ(svsimLivePaths(), 0u);
    Close(s.handle);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
  }
  SvHandle *noName = nullptr;
  uint32_t handle = 0;
  EXPECT_EQ(kvsvSessionOpen(noName, &handle, 0), 0);
  opened_.push_back(handle);
  EXPECT_EQ(UseStatus(handle), kvErrSessionNameEmpty);
}

TEST_F(ProjectOpen, DamagedSiblingFailsTheOpenButKeepsWhatWasMade) {
  kvsvtest::cFakeErrorLog log;
  WriteFile(Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") + Entry("B", "0 x 0 0 CAN1 - - -"));
  const auto a = OpenKept("A");
  EXPECT_EQ(UseStatus(a.handle), kvErrInternal);
  EXPECT_EQ(kvsimOpenSessionCount(), 2);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 1);
  const auto records = log.Records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].value.Line(), 590u);
}

TEST_F(ProjectOpen, NullOutputDoesNothing) {
  WriteFile(Entry("A", "0 0 0 0 CAN1 - C D"));
  SvHandle name = svsimMakeString("A");
  EXPECT_EQ(kvsvSessionOpen(&name, nullptr, 0), 0);
  svDisposeHandle(name);
  EXPECT_EQ(kvsimLogCount(), 0);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

// Records as an earlier open left them.
TEST_F(ProjectOpen, ClaimsOfRecordsLeftByEarlierOpens) {
  WriteFile(Entry("Bad", "0 0 0 0 CAN1 - C D"));
  struct Case {
    const char *what;
    const char *tag;
    int32_t expected;
    bool recordStays;
  } cases[] = {
      {"the last failed sibling takes its record along", "", kRefused, false},
      {"a record of another tag", "other", kvErrInterfaceTagMismatch, true},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    {
      std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
      auto *record = new cSnLifeInterface();
      record->tag = c.tag;
      auto *failed = new cSnLifeSession();
      failed->state = cSnLifeSession::kGone;
      failed->status = kRefused;
      record->sessions["Bad"] = failed;
      gSessionManager.InsertInterface("CAN1", record);
    }
    const auto s = OpenKept("Bad");
    EXPECT_EQ(UseStatus(s.handle), c.expected);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), c.recordStays ? 1 : 0);
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    gSessionManager.EraseInterface("CAN1");
  }
}

}  // namespace
